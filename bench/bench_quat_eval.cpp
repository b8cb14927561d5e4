// Eval of one angle of a 100-key rotation curve at sequential times, at random times and at one
// repeated time (the cache), against Eigen's Quaterniond::slerp between the two neighbouring
// keys followed by toRotationMatrix().eulerAngles(0, 1, 2), in the same run. Reports the median
// time per evaluation, the ratios, and what one lock and unlock of the curve costs on its own.
#include <benchmark/benchmark.h>

#include "median_reporter.h"

#include <zv/quat_fcurve.h>

#if ZV_HAVE_EIGEN
#include <Eigen/Geometry>
#endif

#include <algorithm>
#include <cstdio>
#include <random>
#include <vector>

namespace {

constexpr int kKeys = 100;

struct Data {
  std::vector<ZvQuatKey> keys;
  std::vector<double> times;
  std::vector<double> sequential;  // a sweep over the keyed range, ten samples per segment
  std::vector<double> random;
  Data() {
    std::mt19937 rng(13);
    std::uniform_real_distribution<double> gap(0.5, 1.5), angle(-3.0, 3.0);
    std::uniform_real_distribution<float> tcb(-0.5f, 0.5f);
    double t = 0.0;
    for (int i = 0; i < kKeys; ++i) {
      keys.emplace_back(t, ZvPoint3<double>{angle(rng), angle(rng) * 0.4, angle(rng)}, tcb(rng),
                        tcb(rng), tcb(rng), 0);
      times.push_back(t);
      t += gap(rng);
    }
    const double last = times.back();
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

// The x channel of the rotation; its spline is built by a first evaluation outside the timings.
ZvQuatFCurve& TheCurve() {
  static ZvQuatFCurve* curve = [] {
    ZvQuatFCurve* c = new ZvQuatFCurve(0);
    for (const ZvQuatKey& k : TheData().keys)
      c->GetQuatCurve()->SetKey(k, 0.0);
    c->Eval(0.5, 0);
    return c;
  }();
  return *curve;
}

void ZvEval(benchmark::State& state, const std::vector<double>& times) {
  const ZvQuatFCurve& curve = TheCurve();
  size_t i = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(curve.Eval(times[i], 0));
    if (++i == times.size()) i = 0;
  }
}

void BM_ZvSequential(benchmark::State& state) {
  ZvEval(state, TheData().sequential);
}
void BM_ZvRandom(benchmark::State& state) {
  ZvEval(state, TheData().random);
}
void BM_ZvRepeated(benchmark::State& state) {
  const std::vector<double> one(1, TheData().random[0]);
  ZvEval(state, one);
}

// The lock every public operation takes, alone.
void BM_ZvLockUnlock(benchmark::State& state) {
  const ZvQuatFCurve& curve = TheCurve();
  for (auto _ : state) {
    curve.Lock();
    curve.Unlock();
  }
}

#if ZV_HAVE_EIGEN
void EigenEval(benchmark::State& state, const std::vector<double>& times) {
  const Data& d = TheData();
  std::vector<Eigen::Quaterniond> q;
  for (const ZvQuatKey& k : d.keys) {
    const ZvQuat z(k.angles);
    q.emplace_back(z.w, z.x, z.y, z.z);
  }
  size_t i = 0;
  for (auto _ : state) {
    const double t = times[i];
    const size_t b = std::min<size_t>(
        std::max<size_t>(std::upper_bound(d.times.begin(), d.times.end(), t) - d.times.begin(), 1),
        d.times.size() - 1);
    const double u = (t - d.times[b - 1]) / (d.times[b] - d.times[b - 1]);
    const Eigen::Vector3d e = q[b - 1].slerp(u, q[b]).toRotationMatrix().eulerAngles(0, 1, 2);
    benchmark::DoNotOptimize(e[0]);
    if (++i == times.size()) i = 0;
  }
}

void BM_EigenSequential(benchmark::State& state) {
  EigenEval(state, TheData().sequential);
}
void BM_EigenRandom(benchmark::State& state) {
  EigenEval(state, TheData().random);
}
#endif

}  // namespace

BENCHMARK(BM_ZvSequential)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_ZvRandom)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_ZvRepeated)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_ZvLockUnlock)->Repetitions(5)->ReportAggregatesOnly(true);
#if ZV_HAVE_EIGEN
BENCHMARK(BM_EigenSequential)->Repetitions(5)->ReportAggregatesOnly(true);
BENCHMARK(BM_EigenRandom)->Repetitions(5)->ReportAggregatesOnly(true);
#endif

int main(int argc, char** argv) {
  TheCurve();  // built outside the timings
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    auto median = [&](const char* name) { return reporter.FunctionMedianSeconds(name) * 1e9; };
    const double zvSeq = median("BM_ZvSequential"), zvRnd = median("BM_ZvRandom");
    const double zvRep = median("BM_ZvRepeated"), lock = median("BM_ZvLockUnlock");
    std::printf("\nmedian ns per evaluation, %d keys\n", kKeys);
    std::printf("  zv  Eval sequential %8.1f   random %8.1f   repeated time %8.1f\n", zvSeq, zvRnd,
                zvRep);
    if (zvSeq > 0.0) {
      std::printf("  lock + unlock alone %8.1f   (%.0f%% of a sequential Eval)\n", lock,
                  100.0 * lock / zvSeq);
    }
#if ZV_HAVE_EIGEN
    const double eSeq = median("BM_EigenSequential"), eRnd = median("BM_EigenRandom");
    std::printf("  eigen slerp + eulerAngles sequential %8.1f   random %8.1f\n", eSeq, eRnd);
    if (eSeq > 0.0 && eRnd > 0.0) {
      std::printf("  ratio zv / eigen: sequential %.2f (target 3), random %.2f\n", zvSeq / eSeq,
                  zvRnd / eRnd);
    }
#else
    std::printf("  Eigen not found at configure time: no comparison\n");
#endif
  });
}
