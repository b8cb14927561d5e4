// The samples on which curve evaluation is measured against its peers: 1,000 keys at uneven
// gaps, a sweep over the keyed range with ten parameters per segment, and 4,096 parameters
// drawn at random in the range. Every curve benchmark evaluates the same ones.
#ifndef ZV_BENCH_EVAL_BENCH_DATA_H
#define ZV_BENCH_EVAL_BENCH_DATA_H

#include <benchmark/benchmark.h>

#include "median_reporter.h"

#if ZV_HAVE_GSL
#include <gsl/gsl_errno.h>
#endif

#include <cmath>
#include <random>
#include <vector>

constexpr int kEvalBenchKeys = 1000;

struct EvalBenchData {
  std::vector<double> x, y;
  std::vector<double> sequential;
  std::vector<double> random;
  EvalBenchData() {
    std::mt19937 rng(11);
    std::uniform_real_distribution<double> gap(0.05, 0.15);
    double p = 0.0;
    for (int i = 0; i < kEvalBenchKeys; ++i) {
      x.push_back(p);
      y.push_back(std::sin(i * 0.37) * 3.0 + std::cos(i * 0.11));
      p += gap(rng);
    }
    const double last = x.back();
    const int sweep = 10 * (kEvalBenchKeys - 1);
    for (int i = 0; i < sweep; ++i)
      sequential.push_back(last * i / sweep);
    std::uniform_real_distribution<double> anywhere(0.0, last);
    for (int i = 0; i < 4096; ++i)
      random.push_back(anywhere(rng));
  }
};

inline const EvalBenchData& TheEvalBenchData() {
  static const EvalBenchData data;
  return data;
}

// Evaluates `eval` at the parameters in turn, round and round.
template <class Eval>
void EvalBenchLoop(benchmark::State& state, const std::vector<double>& params, Eval eval) {
  size_t i = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(eval(params[i]));
    if (++i == params.size()) i = 0;
  }
}

// The lock every public operation of the curve takes, alone.
template <class Curve>
void EvalBenchLockLoop(benchmark::State& state, const Curve& curve) {
  for (auto _ : state) {
    curve.Lock();
    curve.Unlock();
  }
}

// Before the run: an error of a peer must not abort it.
inline void EvalBenchQuietPeers() {
#if ZV_HAVE_GSL
  gsl_set_error_handler_off();
#endif
}

#endif
