// LinearMorph of two property paths of 1,000 cubic segments: siblings, which blend control points
// and resample their property curves, against non-siblings of the same size, which are flattened,
// resampled every pointMergeDistance, blended and refitted.
//
// Both pairs share shape A, a closed wavy ring of 1,000 cubics (radius about 500, so some 6,600
// resampling steps at the default step of 0.5) with a property ramp along it. Shape B is the ring
// moved and distorted, with another ramp; it is a sibling of A. Shape B' has B's points and
// curve but is left open, which changes one segment code and nothing else: the same size and
// geometry, yet not a sibling, so the morph takes the general road. No peer library blends
// property paths, so the comparison is between the two roads in the same run.
#include <benchmark/benchmark.h>

#include <zv/gc.h>
#include <zv/morpher.h>
#include <zv/path2f_prop1d.h>
#include <zv/raw_fcurve.h>
#include "median_reporter.h"

#include <cmath>
#include <cstdio>

namespace {

using P2 = ZvPoint2<float>;

constexpr unsigned int kSegments = 1000;
const double kPi = 3.14159265358979323846;

// A ring of cubics whose radius wobbles; `close` decides whether the last node closes it.
ZvPath2fProp1d Ring(double cx, double cy, double radius, double wobble, bool close) {
  auto at = [&](double u) {
    const double a = 2 * kPi * u / kSegments, r = radius + wobble * std::sin(7 * a);
    return P2{static_cast<float>(cx + r * std::cos(a)), static_cast<float>(cy + r * std::sin(a))};
  };
  ZvPath2f path(3 * kSegments + 1);
  path.Moveto(at(0));
  for (unsigned int k = 0; k < kSegments; ++k) {
    const P2 end = k + 1 == kSegments ? path.GetPoint(0) : at(k + 1);
    path.Curveto(at(k + 1.0 / 3), at(k + 2.0 / 3), end);
  }
  if (close) path.Closeto();
  ZvPath2fProp1d prop(path);
  const double length = 2 * kPi * radius;
  prop.SetPropCurve(0, ZvRawFCurve(0.0, 1.0, length, 3.0));
  return prop;
}

void BM_LinearMorph(benchmark::State& state, bool siblings) {
  ZvGC gc;
  const ZvPath2fProp1d a = Ring(0, 0, 500, 20, true);
  const ZvPath2fProp1d b = Ring(40, -30, 450, 35, siblings);
  ZvMorpher morpher(&a, &b, gc);
  unsigned int points = 0;
  for (auto _ : state) {
    ZvPath2fProp1d out;
    if (!morpher.LinearMorph(0.5, out)) state.SkipWithError("morph refused");
    points = out.NumPoints();
    benchmark::DoNotOptimize(points);
  }
  state.counters["out points"] = points;
  state.counters["siblings"] = a.IsSiblingOf(b);
}

}  // namespace

int main(int argc, char** argv) {
  benchmark::RegisterBenchmark("LinearMorph/siblings", BM_LinearMorph, true)
      ->Unit(benchmark::kMicrosecond);
  benchmark::RegisterBenchmark("LinearMorph/non-siblings", BM_LinearMorph, false)
      ->Unit(benchmark::kMicrosecond);
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    const double sibling = reporter.MedianSeconds("LinearMorph/siblings") * 1e6;
    const double general = reporter.MedianSeconds("LinearMorph/non-siblings") * 1e6;
    std::printf("\nMedian CPU time per morph of two paths of %u cubics (us)\n\n", kSegments);
    std::printf("%-14s %12s %12s\n", "pair", "us/morph", "out points");
    std::printf("%-14s %12.1f %12.0f\n", "siblings", sibling,
                reporter.Counter("LinearMorph/siblings", "out points"));
    std::printf("%-14s %12.1f %12.0f\n", "non-siblings", general,
                reporter.Counter("LinearMorph/non-siblings", "out points"));
    if (sibling > 0.0)
      std::printf("\nnon-siblings / siblings: %.1fx (target: at least 5x)\n", general / sibling);
  });
}
