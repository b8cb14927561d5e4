// One Update of a key drag: 100 selected keys of a 10,000-key curve and 1,000 of 100,000, on the
// standard curve (the largest key records) and on the raw curve. The selection is every 100th
// key, spread over the whole curve. Against, in the same run, a copy of the whole curve (Set),
// which is what any edit that touches every key costs at the least. Reports median ms per
// Update, the ratio of the two sizes (10 when the cost grows linearly) and the ratio to the copy.
#include <benchmark/benchmark.h>

#include "median_reporter.h"

#include <zv/fcurve_key_mover.h>
#include <zv/raw_fcurve.h>
#include <zv/std_fcurve.h>

#include <cstdio>
#include <memory>
#include <string>

namespace {

template <class Curve>
std::unique_ptr<Curve> MakeCurve(int keys) {
  auto curve = std::make_unique<Curve>();
  for (int i = 0; i < keys; ++i)
    curve->CreateKey(i, (i * 7919 % 1000) * 0.01);
  return curve;
}

template <class Curve>
void BM_Update(benchmark::State& state) {
  const int keys = static_cast<int>(state.range(0));
  auto curve = MakeCurve<Curve>(keys);
  ZvDoubleArray selected;
  for (int i = 0; i < keys; i += 100)
    selected.Add(i);
  ZvFCurveKeyMover mover(*curve, selected, ZvExtent2<double>(), ZvExtent2<double>());
  ZvDoubleArray now;
  double x = 0.3;
  for (auto _ : state) {
    ZvPoint2<double> move{x, 0.5};
    ZvExtent2<double> modified, box;
    now.Resize(0);
    benchmark::DoNotOptimize(mover.Update(move, now, modified, box, 0, keys));
    x = -x;
  }
  mover.Finalize();
}

template <class Curve>
void BM_Copy(benchmark::State& state) {
  auto curve = MakeCurve<Curve>(static_cast<int>(state.range(0)));
  auto target = MakeCurve<Curve>(1);
  for (auto _ : state)
    benchmark::DoNotOptimize(target->Set(*curve));
}

BENCHMARK_TEMPLATE(BM_Update, ZvStdFCurve)
    ->Arg(10000)
    ->Arg(100000)
    ->Repetitions(5)
    ->ReportAggregatesOnly(true)
    ->Unit(benchmark::kMillisecond);
BENCHMARK_TEMPLATE(BM_Update, ZvRawFCurve)
    ->Arg(10000)
    ->Arg(100000)
    ->Repetitions(5)
    ->ReportAggregatesOnly(true)
    ->Unit(benchmark::kMillisecond);
BENCHMARK_TEMPLATE(BM_Copy, ZvStdFCurve)
    ->Arg(10000)
    ->Arg(100000)
    ->Repetitions(5)
    ->ReportAggregatesOnly(true)
    ->Unit(benchmark::kMillisecond);
BENCHMARK_TEMPLATE(BM_Copy, ZvRawFCurve)
    ->Arg(10000)
    ->Arg(100000)
    ->Repetitions(5)
    ->ReportAggregatesOnly(true)
    ->Unit(benchmark::kMillisecond);

}  // namespace

int main(int argc, char** argv) {
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    auto ms = [&](const std::string& name) { return reporter.MedianSeconds(name) * 1e3; };
    std::printf("\nmedian ms per Update (selection of every 100th key)\n");
    for (const char* kind : {"ZvStdFCurve", "ZvRawFCurve"}) {
      const std::string update = std::string("BM_Update<") + kind + ">/",
                        copy = std::string("BM_Copy<") + kind + ">/";
      const double small = ms(update + "10000/repeats:5"), large = ms(update + "100000/repeats:5");
      const double copySmall = ms(copy + "10000/repeats:5"),
                   copyLarge = ms(copy + "100000/repeats:5");
      std::printf("  %s  10,000 keys %.4f   100,000 keys %.4f   growth x%.1f (linear: x10)\n", kind,
                  small, large, small > 0 ? large / small : 0.0);
      std::printf("  %s  whole-curve copy %.4f / %.4f   Update / copy %.2f / %.2f\n", kind,
                  copySmall, copyLarge, copySmall > 0 ? small / copySmall : 0.0,
                  copyLarge > 0 ? large / copyLarge : 0.0);
    }
  });
}
