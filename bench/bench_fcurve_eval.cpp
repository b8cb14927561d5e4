// Eval of a 1,000-key curve of cubic segments at sequential and at random parameters, against
// GSL's natural cubic spline (gsl_spline_eval with a gsl_interp_accel) through the same key
// values, in the same run. Reports the median time per evaluation, the ratios, and what one
// lock and unlock of the curve costs on its own.
#include <benchmark/benchmark.h>

#include "eval_bench_data.h"
#include "median_reporter.h"

#include <zv/std_fcurve.h>

#if ZV_HAVE_GSL
#include <gsl/gsl_spline.h>
#endif

#include <cstdio>
#include <vector>

namespace {

constexpr int kKeys = kEvalBenchKeys;

const EvalBenchData& TheData() {
  return TheEvalBenchData();
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
  EvalBenchLoop(state, params, [&curve](double t) { return curve.Eval(t, 0); });
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

void BM_ZvLockUnlock(benchmark::State& state) {
  EvalBenchLockLoop(state, TheCurve());
}

#if ZV_HAVE_GSL
void GslEval(benchmark::State& state, const std::vector<double>& params) {
  const EvalBenchData& d = TheData();
  gsl_interp_accel* accel = gsl_interp_accel_alloc();
  gsl_spline* spline = gsl_spline_alloc(gsl_interp_cspline, kKeys);
  gsl_spline_init(spline, d.x.data(), d.y.data(), kKeys);
  EvalBenchLoop(state, params,
                [spline, accel](double t) { return gsl_spline_eval(spline, t, accel); });
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
  TheCurve();  // built outside the timings
  EvalBenchQuietPeers();
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
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
  });
}
