// Spline fits on a smooth noisy signal of 10^4, 10^5 and 10^6 samples.
//
// The signal is sampled at a fixed step with noise well below the tolerance, so the density of
// keys does not depend on the sample count: a fit that is linear in the samples shows the same
// time per sample (the ns_per_sample counter) at every size. The peer, when present, is GSL's
// natural cubic spline through every sample (a tridiagonal solve): not the same task, but the
// cost of a linear-time pass that builds a cubic spline over the same data.
#include <zv/spline.h>

#include <benchmark/benchmark.h>

#include <cmath>
#include <map>
#include <random>

#if ZV_HAVE_GSL
#include <gsl/gsl_errno.h>
#include <gsl/gsl_spline.h>
#endif

namespace {

const double kTolerance = 1e-3;

struct Signal {
  ZvDoubleArray t{1};
  ZvDoubleArray v{1};
};

const Signal& SignalOf(unsigned int n) {
  static std::map<unsigned int, Signal> made;
  auto found = made.find(n);
  if (found != made.end()) return found->second;
  Signal& s = made[n];
  std::mt19937 rng(42);
  std::uniform_real_distribution<double> noise(-2e-4, 2e-4);
  for (unsigned int k = 0; k < n; ++k) {
    const double t = 0.01 * k;
    s.t.Add(t);
    s.v.Add(std::sin(t) + 0.3 * std::sin(2.7 * t + 1) + noise(rng));
  }
  return s;
}

// CPU seconds per sample (printed with an SI prefix, e.g. 80n); CPU time rather than wall time
// because the benchmark machine may be shared.
void ReportPerSample(benchmark::State& state, unsigned int n) {
  state.counters["per_sample"] = benchmark::Counter(
      n, benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
}

void BM_OpenFit(benchmark::State& state, ZvSpline::Kind kind) {
  const unsigned int n = static_cast<unsigned int>(state.range(0));
  const Signal& s = SignalOf(n);
  ZvSpline1d spline;
  for (auto _ : state) {
    benchmark::DoNotOptimize(spline.OpenFit(s.t, s.v, kTolerance, kind));
  }
  ReportPerSample(state, n);
  state.counters["keys"] = spline.GetNumKeys();
}

#if ZV_HAVE_GSL
void BM_GslCubicSplineInit(benchmark::State& state) {
  const unsigned int n = static_cast<unsigned int>(state.range(0));
  const Signal& s = SignalOf(n);
  gsl_set_error_handler_off();
  gsl_spline* spline = gsl_spline_alloc(gsl_interp_cspline, n);
  for (auto _ : state) {
    benchmark::DoNotOptimize(gsl_spline_init(spline, s.t.data, s.v.data, n));
  }
  gsl_spline_free(spline);
  ReportPerSample(state, n);
}
#endif

void Sizes(benchmark::internal::Benchmark* b) {
  b->Arg(10000)->Arg(100000)->Arg(1000000);
  b->Unit(benchmark::kMillisecond)->Repetitions(5)->ReportAggregatesOnly(true);
}

}  // namespace

BENCHMARK_CAPTURE(BM_OpenFit, CatmullRom, ZvSpline::CatmullRom)->Apply(Sizes);
BENCHMARK_CAPTURE(BM_OpenFit, BezierCubicFCurve, ZvSpline::BezierCubicFCurve)->Apply(Sizes);
#if ZV_HAVE_GSL
BENCHMARK(BM_GslCubicSplineInit)->Apply(Sizes);
#endif

BENCHMARK_MAIN();
