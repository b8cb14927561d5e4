// Flattening a path for the rasterisers against the free cubic flattener alone.
//
// One closed subpath of 10,000 chained random cubics (each spanning 10 to 1000 px), flattened
// at tolerance 0.25 by the path operations that feed the fills, and the same cubics (the path's
// float points widened to double) by ZvBezierTool_FlattenCubic2d appending to one array. Every
// benchmark flattens the whole path once per iteration into arrays that keep their capacity.
// The table gives nanoseconds per output point and the ratio to the free flattener; the path
// layer's work per point (tags, polygon assembly, clipping) shows there.
//
// On a shared machine the load moves between benchmarks, so the ratios are also measured in
// paired rounds: each round times the free flattener and then every path operation back to
// back on the thread's CPU clock, and the table reports the median over the rounds of each
// round's ratio.
#include <benchmark/benchmark.h>

#include <zv/bezier_tool.h>
#include <zv/path2f.h>
#include <zv/transfo4.h>
#include "median_reporter.h"

#include <algorithm>
#include <cstdio>
#include <ctime>
#include <functional>
#include <map>
#include <random>
#include <string>
#include <vector>

namespace {

using P2 = ZvPoint2<double>;

constexpr int kCubics = 10000;
constexpr double kTolerance = 0.25;

const ZvPath2f& Path() {
  static const ZvPath2f path = [] {
    std::mt19937 rng(20261122);
    std::uniform_real_distribution<double> span(10.0, 1000.0), unit(-0.5, 0.5);
    ZvPath2f p(3 * kCubics + 1);
    ZvPoint2<float> at{0.0f, 0.0f};
    p.Moveto(at);
    for (int i = 0; i < kCubics; ++i) {
      const double s = span(rng);
      auto near = [&](const ZvPoint2<float>& o) {
        return ZvPoint2<float>{static_cast<float>(o.x + s * unit(rng)),
                               static_cast<float>(o.y + s * unit(rng))};
      };
      const ZvPoint2<float> c1 = near(at), c2 = near(at);
      // Drift back toward the origin so that the chain stays in a bounded area; the last
      // cubic closes the subpath.
      ZvPoint2<float> end = i + 1 == kCubics ? ZvPoint2<float>{0.0f, 0.0f} : near(at);
      if (i + 1 < kCubics && (std::abs(end.x) > 5000.0f || std::abs(end.y) > 5000.0f))
        end = ZvPoint2<float>{end.x * 0.5f, end.y * 0.5f};
      p.Curveto(c1, c2, end);
      at = end;
    }
    p.Closeto();
    return p;
  }();
  return path;
}

const std::vector<P2>& Controls() {
  static const std::vector<P2> controls = [] {
    std::vector<P2> v;
    for (unsigned int i = 0; i < Path().NumPoints(); ++i)
      v.push_back(P2{Path().GetPoint(i).x, Path().GetPoint(i).y});
    return v;
  }();
  return controls;
}

ZvExtent2<double> Grown(double margin) {
  ZvExtent2<double> e;
  Path().GetExtent(e);
  return ZvExtent2<double>(e.xmin - margin, e.ymin - margin, e.xmax + margin, e.ymax + margin);
}

struct Method {
  std::string name;
  std::function<size_t(ZvPoint2dArray&, ZvPointTagArray&)> pass;  // returns points written
};

std::vector<Method> Methods() {
  static const ZvTransfo4 identity;
  std::vector<Method> m;
  m.push_back({"free-FlattenCubic2d", [](ZvPoint2dArray& out, ZvPointTagArray&) {
                 const std::vector<P2>& c = Controls();
                 out.Add(c[0]);
                 for (size_t i = 0; i + 3 < c.size(); i += 3)
                   ZvBezierTool_FlattenCubic2d(&c[i], kTolerance, &out, 1);
                 return size_t(out.size);
               }});
  // The reference once more, to show what the order of a round alone does to a ratio.
  m.push_back({"free-FlattenCubic2d-again", m[0].pass});
  m.push_back({"path-TransformAndFlattenPath", [](ZvPoint2dArray& out, ZvPointTagArray& tags) {
                 Path().TransformAndFlattenPath(identity, kTolerance, out, tags);
                 return size_t(out.size);
               }});
  m.push_back({"path-TransformAndFlattenClosed", [](ZvPoint2dArray& out, ZvPointTagArray& tags) {
                 Path().TransformAndFlattenClosedSubPaths(identity, kTolerance, out, tags);
                 return size_t(out.size);
               }});
  m.push_back({"path-FlattenAndClip-inside", [](ZvPoint2dArray& out, ZvPointTagArray& tags) {
                 static const ZvExtent2<double> all = Grown(1.0);
                 Path().TransformFlattenAndClipClosedSubPaths(identity, kTolerance, all, out, tags);
                 return size_t(out.size);
               }});
  m.push_back({"path-FlattenAndClip-half", [](ZvPoint2dArray& out, ZvPointTagArray& tags) {
                 static const ZvExtent2<double> half = [] {
                   ZvExtent2<double> e = Grown(1.0);
                   e.xmax = 0.5 * (e.xmin + e.xmax);
                   return e;
                 }();
                 Path().TransformFlattenAndClipClosedSubPaths(identity, kTolerance, half, out,
                                                              tags);
                 return size_t(out.size);
               }});
  return m;
}

double ThreadSeconds() {
  timespec ts;
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &ts);
  return ts.tv_sec + ts.tv_nsec * 1e-9;
}

double Median(std::vector<double> v) {
  std::sort(v.begin(), v.end());
  const size_t n = v.size();
  return n % 2 ? v[n / 2] : 0.5 * (v[n / 2 - 1] + v[n / 2]);
}

// Median over `rounds` of (ns/point of method) / (ns/point of the free flattener), each round
// timing all methods back to back.
std::vector<double> PairedRatios(const std::vector<Method>& methods, int rounds) {
  ZvPoint2dArray out(1u << 20);
  ZvPointTagArray tags(1u << 20);
  std::vector<std::vector<double>> ratios(methods.size());
  for (int r = 0; r < rounds; ++r) {
    std::vector<double> ns(methods.size());
    for (size_t k = 0; k < methods.size(); ++k) {
      out.Chop(0);
      tags.Chop(0);
      const double t0 = ThreadSeconds();
      const size_t n = methods[k].pass(out, tags);
      ns[k] = (ThreadSeconds() - t0) * 1e9 / static_cast<double>(n);
    }
    for (size_t k = 0; k < methods.size(); ++k)
      ratios[k].push_back(ns[k] / ns[0]);
  }
  std::vector<double> medians;
  for (const std::vector<double>& v : ratios)
    medians.push_back(Median(v));
  return medians;
}

}  // namespace

int main(int argc, char** argv) {
  Controls();
  const std::vector<Method> methods = Methods();
  for (const Method& m : methods) {
    benchmark::RegisterBenchmark(m.name.c_str(), [&m](benchmark::State& state) {
      ZvPoint2dArray out(1u << 20);
      ZvPointTagArray tags(1u << 20);
      size_t n = 0;
      for (auto _ : state) {
        out.Chop(0);
        tags.Chop(0);
        n = m.pass(out, tags);
        benchmark::DoNotOptimize(out.data);
      }
      state.counters["points"] = static_cast<double>(n);
      state.counters["t/point"] =
          benchmark::Counter(static_cast<double>(n), benchmark::Counter::kIsIterationInvariantRate |
                                                         benchmark::Counter::kInvert);
    })->Unit(benchmark::kMillisecond);
  }
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    constexpr int kRounds = 41;
    const std::vector<double> paired = PairedRatios(methods, kRounds);
    std::printf(
        "\nOne closed subpath of %d cubics at tolerance %.2f. ns/point: median CPU time per "
        "output\n"
        "point; ratio: ns/point over that of the free flattener (below 1 is faster); paired: "
        "median\n"
        "ratio over %d rounds that time every method back to back.\n\n",
        kCubics, kTolerance, kRounds);
    std::printf("%-32s %10s %10s %8s %8s\n", "method", "points", "ns/point", "ratio", "paired");
    const std::string ref = methods[0].name;
    const double refNs = reporter.MedianSeconds(ref) * 1e3 * 1e6 / reporter.Counter(ref, "points");
    for (size_t k = 0; k < methods.size(); ++k) {
      const Method& m = methods[k];
      const double ms = reporter.MedianSeconds(m.name) * 1e3;
      if (ms == 0.0) continue;
      const double pts = reporter.Counter(m.name, "points");
      const double ns = ms * 1e6 / pts;
      std::printf("%-32s %10.0f %10.3f %7.2fx %7.3fx\n", m.name.c_str(), pts, ns, ns / refNs,
                  paired[k]);
    }
  });
}
