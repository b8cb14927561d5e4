// Eval of a 1,000-key raw curve at sequential and at random parameters, against GSL's linear
// interpolation (gsl_interp_linear evaluated with a gsl_interp_accel) on the same samples, in the
// same run. Reports the median time per evaluation, the ratios, and the share of one lock and
// unlock of the curve in an evaluation.
#include <benchmark/benchmark.h>

#include "eval_bench_data.h"
#include "median_reporter.h"

#include <zv/raw_fcurve.h>

#if ZV_HAVE_GSL
#include <gsl/gsl_interp.h>
#endif

#include <cstdio>
#include <vector>

namespace {

ZvRawFCurve& TheCurve() {
  static ZvRawFCurve* curve = [] {
    const EvalBenchData& d = TheEvalBenchData();
    ZvRawFCurve* c = new ZvRawFCurve(0.0);
    for (int i = 0; i < kEvalBenchKeys; ++i)
      c->AppendLinearSegment({d.x[i], d.y[i]});
    return c;
  }();
  return *curve;
}

void ZvEval(benchmark::State& state, const std::vector<double>& params) {
  const ZvRawFCurve& curve = TheCurve();
  EvalBenchLoop(state, params, [&curve](double t) { return curve.Eval(t, 0); });
}

void BM_RawSequential(benchmark::State& state) {
  ZvEval(state, TheEvalBenchData().sequential);
}
void BM_RawRandom(benchmark::State& state) {
  ZvEval(state, TheEvalBenchData().random);
}

void BM_RawLockUnlock(benchmark::State& state) {
  EvalBenchLockLoop(state, TheCurve());
}

#if ZV_HAVE_GSL
void GslEval(benchmark::State& state, const std::vector<double>& params) {
  const EvalBenchData& d = TheEvalBenchData();
  gsl_interp_accel* accel = gsl_interp_accel_alloc();
  gsl_interp* interp = gsl_interp_alloc(gsl_interp_linear, kEvalBenchKeys);
  gsl_interp_init(interp, d.x.data(), d.y.data(), kEvalBenchKeys);
  const double* x = d.x.data();
  const double* y = d.y.data();
  EvalBenchLoop(state, params, [interp, x, y, accel](double t) {
    return gsl_interp_eval(interp, x, y, t, accel);
  });
  gsl_interp_free(interp);
  gsl_interp_accel_free(accel);
}

void BM_GslLinearSequential(benchmark::State& state) {
  GslEval(state, TheEvalBenchData().sequential);
}
void BM_GslLinearRandom(benchmark::State& state) {
  GslEval(state, TheEvalBenchData().random);
}
#endif

}  // namespace

BENCHMARK(BM_RawSequential)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_RawRandom)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_RawLockUnlock)->Repetitions(5)->ReportAggregatesOnly(true);
#if ZV_HAVE_GSL
BENCHMARK(BM_GslLinearSequential)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_GslLinearRandom)->Repetitions(5)->ReportAggregatesOnly(true);
#endif

int main(int argc, char** argv) {
  TheCurve();  // built outside the timings
  EvalBenchQuietPeers();
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    auto median = [&](const char* name) { return reporter.FunctionMedianSeconds(name) * 1e9; };
    const double zvSeq = median("BM_RawSequential"), zvRnd = median("BM_RawRandom");
    const double lock = median("BM_RawLockUnlock");
    std::printf("\nmedian ns per evaluation, raw curve of %d keys\n", kEvalBenchKeys);
    std::printf("  zv  Eval sequential %8.1f   random %8.1f\n", zvSeq, zvRnd);
    if (zvSeq > 0.0 && zvRnd > 0.0) {
      std::printf(
          "  lock + unlock alone %8.1f   (%.0f%% of a sequential Eval, %.0f%% of a random)\n", lock,
          100.0 * lock / zvSeq, 100.0 * lock / zvRnd);
    }
#if ZV_HAVE_GSL
    const double gslSeq = median("BM_GslLinearSequential"), gslRnd = median("BM_GslLinearRandom");
    std::printf("  gsl linear sequential %6.1f   random %8.1f\n", gslSeq, gslRnd);
    if (gslSeq > 0.0 && gslRnd > 0.0) {
      std::printf("  ratio zv / gsl: sequential %.2f, random %.2f (target 2.5)\n", zvSeq / gslSeq,
                  zvRnd / gslRnd);
    }
#else
    std::printf("  GSL not found at configure time: no comparison\n");
#endif
  });
}
