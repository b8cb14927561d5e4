// Fitting cubic Bezier chains to pen strokes: ZvBezierTool::OpenFit against lib2geom's
// bezier_fit_cubic_r on the same strokes, in one run.
//
// 200 strokes of 300 points each: smooth random curves (curvature a sum of three random waves,
// the pen speed varying by half around 3 px a point) plus Gaussian noise of 0.3 px on x and y,
// from a fixed seed. Every benchmark fits all strokes once per iteration. OpenFit runs at
// tolerance 1.0 with cubics, and for comparison with quartics and quintics; lib2geom receives
// the same bound as its squared error, 1.0 (its argument is the square of a distance).
//
// The criteria differ: lib2geom accepts a segment when every point lies within the bound of the
// curve point at that point's (Newton-refined) parameter; OpenFit when every point lies within
// the bound of the point of the segment's flattened polyline at the same arc length. So the
// accuracy of both outputs is measured the same way, once and outside the timed loops: for each
// input point its distance to the nearest point of the fitted chain (each segment evaluated
// densely), and per stroke the largest. The table gives segments per stroke, the mean and the
// maximum of the per-stroke largest distances, and time ratios against OpenFit with cubics.
#include <benchmark/benchmark.h>

#include <zv/bezier_fit.h>
#include <zv/path2f.h>
#include "median_reporter.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <functional>
#include <map>
#include <random>
#include <string>
#include <vector>

#include "bench/pen_strokes.h"

namespace {

using P2 = ZvPoint2<double>;

constexpr double kTolerance = 1.0;
constexpr double kCornerCos2 = 0.5;

// A fitted stroke as a list of segments, each its control points.
using Chain = std::vector<std::vector<P2>>;

struct Method {
  std::string name;
  // Fits every stroke once; returns the number of segments.
  std::function<size_t()> timedPass;
  // Fits one stroke for the accuracy measure.
  std::function<Chain(const ZvPoint2fArray&)> fit;
};

Chain ChainOf(const ZvPath2f& path) {
  Chain chain;
  for (unsigned int i = 1; i < path.NumPoints();) {
    unsigned int a, b;
    path.GetSegmentIndices(i, a, b);
    std::vector<P2> c;
    for (unsigned int k = a; k <= b; ++k)
      c.push_back(P2{path.GetPoint(k).x, path.GetPoint(k).y});
    chain.push_back(c);
    i = b + 1;
  }
  return chain;
}

Method ZvMethod(unsigned int degree) {
  Method m;
  m.name = "zv-OpenFit-d" + std::to_string(degree);
  m.timedPass = [degree] {
    ZvBezierTool tool;
    size_t segments = 0;
    for (const ZvPoint2fArray& s : Strokes()) {
      ZvPath2f path(64);
      segments += tool.OpenFit(s, kCornerCos2, degree, kTolerance, 0, &path, 0);
      benchmark::DoNotOptimize(path.NumPoints());
    }
    return segments;
  };
  m.fit = [degree](const ZvPoint2fArray& s) {
    ZvBezierTool tool;
    ZvPath2f path;
    tool.OpenFit(s, kCornerCos2, degree, kTolerance, 0, &path, 0);
    return ChainOf(path);
  };
  return m;
}

#if ZV_HAVE_2GEOM
constexpr unsigned int kMaxBeziers = 1000;

Method GeomMethod() {
  Method m;
  m.name = "2geom-cubic_r";
  m.timedPass = [] {
    static std::vector<Geom::Point> out(4 * kMaxBeziers);
    size_t segments = 0;
    for (const std::vector<Geom::Point>& s : GeomStrokes()) {
      const int n = Geom::bezier_fit_cubic_r(out.data(), s.data(), static_cast<int>(s.size()),
                                             kTolerance * kTolerance, kMaxBeziers);
      segments += n > 0 ? n : 0;
      benchmark::DoNotOptimize(out.data());
    }
    return segments;
  };
  m.fit = [](const ZvPoint2fArray& s) {
    std::vector<Geom::Point> in, out(4 * kMaxBeziers);
    for (unsigned int i = 0; i < s.size; ++i)
      in.emplace_back(s[i].x, s[i].y);
    const int n = Geom::bezier_fit_cubic_r(out.data(), in.data(), static_cast<int>(in.size()),
                                           kTolerance * kTolerance, kMaxBeziers);
    Chain chain;
    for (int k = 0; k < n; ++k) {
      std::vector<P2> c;
      for (int j = 0; j < 4; ++j)
        c.push_back(P2{out[4 * k + j][0], out[4 * k + j][1]});
      chain.push_back(c);
    }
    return chain;
  };
  return m;
}
#endif

struct Accuracy {
  double segmentsPerStroke = 0, meanMax = 0, maxMax = 0, overTolerance = 0;
};

Accuracy Measure(const Method& m) {
  Accuracy acc;
  for (const ZvPoint2fArray& s : Strokes()) {
    const Chain chain = m.fit(s);
    acc.segmentsPerStroke += chain.size();
    std::vector<P2> dense;
    for (const std::vector<P2>& c : chain)
      for (int k = 0; k <= 128; ++k)
        dense.push_back(EvalBezier(c.data(), static_cast<unsigned int>(c.size()) - 1, k / 128.0));
    double worst = 0.0;
    for (unsigned int i = 0; i < s.size; ++i) {
      const P2 q{s[i].x, s[i].y};
      double best = HUGE_VAL;
      for (size_t k = 0; k + 1 < dense.size(); ++k)
        best = std::min(best, DistanceToSegment(q, dense[k], dense[k + 1]));
      worst = std::max(worst, best);
    }
    acc.meanMax += worst;
    acc.maxMax = std::max(acc.maxMax, worst);
    if (worst > kTolerance) acc.overTolerance += 1.0;
  }
  acc.segmentsPerStroke /= kStrokes;
  acc.meanMax /= kStrokes;
  acc.overTolerance *= 100.0 / kStrokes;
  return acc;
}

}  // namespace

int main(int argc, char** argv) {
  Strokes();
  std::vector<Method> methods = {ZvMethod(3), ZvMethod(4), ZvMethod(5)};
#if ZV_HAVE_2GEOM
  methods.push_back(GeomMethod());
#endif
  for (const Method& m : methods) {
    benchmark::RegisterBenchmark(m.name.c_str(), [&m](benchmark::State& state) {
      size_t segments = 0;
      for (auto _ : state)
        segments = m.timedPass();
      state.counters["t/stroke"] = benchmark::Counter(
          kStrokes, benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
      state.counters["seg/stroke"] = static_cast<double>(segments) / kStrokes;
    })->Unit(benchmark::kMillisecond);
  }
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    std::printf(
        "\n%d pen strokes of %u points, tolerance %.1f (2geom: squared error %.1f).\n"
        "us/stroke: median CPU time of the runs above. max dist: the largest distance of an input\n"
        "point from its fitted chain, per stroke; mean and maximum over the strokes, and the "
        "share\n"
        "of strokes beyond the tolerance. Ratios against zv-OpenFit-d3.\n\n",
        kStrokes, kPointsPerStroke, kTolerance, kTolerance * kTolerance);
    std::printf("%-16s %10s %10s %10s %10s %8s %10s %10s\n", "method", "us/stroke", "seg/stroke",
                "mean max", "max max", ">tol %", "time", "segments");
    const double zvTime = reporter.MedianSeconds(methods[0].name) / kStrokes * 1e6;
    const Accuracy zv = Measure(methods[0]);
    for (const Method& m : methods) {
      const double us = reporter.MedianSeconds(m.name) / kStrokes * 1e6;
      if (us == 0.0) continue;
      const Accuracy a = &m == &methods[0] ? zv : Measure(m);
      std::printf("%-16s %10.1f %10.2f %10.3f %10.3f %8.1f %9.2fx %9.2fx\n", m.name.c_str(), us,
                  a.segmentsPerStroke, a.meanMax, a.maxMax, a.overTolerance,
                  zvTime > 0 ? us / zvTime : 0.0, a.segmentsPerStroke / zv.segmentsPerStroke);
    }
  });
}
