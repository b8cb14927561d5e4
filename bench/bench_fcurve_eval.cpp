// Eval of a 1,000-key curve of cubic segments at sequential and at random parameters, against
// GSL's natural cubic spline (gsl_spline_eval with a gsl_interp_accel) through the same key
// values, in the same run. Reports the median time per evaluation, the ratios, and what one
// lock and unlock of the curve costs on its own.
#include <benchmark/benchmark.h>

#include "median_reporter.h"

#include <zv/std_fcurve.h>

#if ZV_HAVE_GSL
#include <gsl/gsl_errno.h>
#include <gsl/gsl_spline.h>
#endif

#include <cmath>
#include <cstdio>
#include <map>
#include <random>
#include <string>
#include <vector>

namespace {

constexpr int kKeys = 1000;

struct Data {
  std::vector<double> x, y;
  std::vector<double> sequential;  // a sweep over the keyed range, ten samples per segment
  std::vector<double> random;
  Data() {
    std::mt19937 rng(11);
    std::uniform_real_distribution<double> gap(0.05, 0.15);
    double p = 0.0;
    for (int i = 0; i < kKeys; ++i) {
      x.push_back(p);
      y.push_back(std::sin(i * 0.37) * 3.0 + std::cos(i * 0.11));
      p += gap(rng);
    }
    const double last = x.back();
    const int sweep = 10 * (kKeys - 1);
    for (int i = 0; i < sweep; ++i)
      sequential.push_back(last * i / sweep);
    std::uniform_real_distribution<double> anywhere(0.0, last);
    for (int i = 0; i < 4096; ++i)
      random.push_back(anywhere(rng));
  }
};

const Data& TheData() {
  static const Data data;
  return data;
}

// Keys appended left to right: cubic segments with continued tangents.
ZvStdFCurve& TheCurve() {
  static ZvStdFCurve* curve = [] {
    ZvStdFCurve* c = new ZvStdFCurve(0.0, ZvBaseFCurve::CubicSegment);
    for (int i = 0; i < kKeys; ++i)
      c->CreateKey(TheData().x[i], TheData().y[i]);
    return c;
  }();
  return *curve;
}

void ZvEval(benchmark::State& state, const std::vector<double>& params) {
  const ZvStdFCurve& curve = TheCurve();
  size_t i = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(curve.Eval(params[i], 0));
    if (++i == params.size()) i = 0;
  }
}

void BM_ZvSequential(benchmark::State& state) {
  ZvEval(state, TheData().sequential);
}
void BM_ZvRandom(benchmark::State& state) {
  ZvEval(state, TheData().random);
}

// The same sweep through EvalSequence, which flattens once and reads the polyline; reported per
// sample, at a tolerance of a thousandth of the values' amplitude.
void BM_ZvEvalSequence(benchmark::State& state) {
  const ZvStdFCurve& curve = TheCurve();
  const std::vector<double>& sweep = TheData().sequential;
  const double step = sweep[1] - sweep[0];
  ZvDoubleArray parameters(sweep.size() + 2), values(sweep.size() + 2);
  for (auto _ : state) {
    curve.EvalSequence(sweep.front(), sweep.back(), step, 1e-3, parameters, values, 0);
    benchmark::DoNotOptimize(values.data);
  }
  state.counters["samples"] = values.size;
}

// The lock every public operation takes, alone.
void BM_ZvLockUnlock(benchmark::State& state) {
  const ZvStdFCurve& curve = TheCurve();
  for (auto _ : state) {
    curve.Lock();
    curve.Unlock();
  }
}

#if ZV_HAVE_GSL
void GslEval(benchmark::State& state, const std::vector<double>& params) {
  const Data& d = TheData();
  gsl_interp_accel* accel = gsl_interp_accel_alloc();
  gsl_spline* spline = gsl_spline_alloc(gsl_interp_cspline, kKeys);
  gsl_spline_init(spline, d.x.data(), d.y.data(), kKeys);
  size_t i = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(gsl_spline_eval(spline, params[i], accel));
    if (++i == params.size()) i = 0;
  }
  gsl_spline_free(spline);
  gsl_interp_accel_free(accel);
}

void BM_GslSequential(benchmark::State& state) {
  GslEval(state, TheData().sequential);
}
void BM_GslRandom(benchmark::State& state) {
  GslEval(state, TheData().random);
}
#endif

}  // namespace

BENCHMARK(BM_ZvSequential)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_ZvRandom)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_ZvLockUnlock)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_ZvEvalSequence)->Repetitions(5)->ReportAggregatesOnly(true);
#if ZV_HAVE_GSL
BENCHMARK(BM_GslSequential)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_GslRandom)->Repetitions(5)->ReportAggregatesOnly(true);
#endif

int main(int argc, char** argv) {
  benchmark::Initialize(&argc, argv);
  if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
#if ZV_HAVE_GSL
  gsl_set_error_handler_off();
#endif
  TheCurve();  // built outside the timings
  ZvMedianReporter reporter;
  benchmark::RunSpecifiedBenchmarks(&reporter);
  benchmark::Shutdown();

  auto median = [&](const char* name) { return reporter.FunctionMedianSeconds(name) * 1e9; };
  const double zvSeq = median("BM_ZvSequential"), zvRnd = median("BM_ZvRandom");
  const double lock = median("BM_ZvLockUnlock");
  const double sequence =
      median("BM_ZvEvalSequence") / static_cast<double>(TheData().sequential.size());
  std::printf("\nmedian ns per evaluation, %d keys\n", kKeys);
  std::printf("  zv  Eval sequential %8.1f   random %8.1f\n", zvSeq, zvRnd);
  std::printf("  zv  EvalSequence, the same sweep %8.1f per sample\n", sequence);
  if (zvSeq > 0.0) {
    std::printf("  lock + unlock alone %8.1f   (%.0f%% of a sequential Eval)\n", lock,
                100.0 * lock / zvSeq);
  }
#if ZV_HAVE_GSL
  const double gslSeq = median("BM_GslSequential"), gslRnd = median("BM_GslRandom");
  std::printf("  gsl spline sequential %6.1f   random %8.1f\n", gslSeq, gslRnd);
  if (gslSeq > 0.0 && gslRnd > 0.0) {
    std::printf("  ratio zv / gsl: sequential %.2f (target 2.5), random %.2f (target 3)\n",
                zvSeq / gslSeq, zvRnd / gslRnd);
  }
#else
  std::printf("  GSL not found at configure time: no comparison\n");
#endif
  return 0;
}
