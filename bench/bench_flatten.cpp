// Flattening of 10,000 random cubics by ZvBezierTool_FlattenCubic2d, AGG's curve4_div and
// Cairo's cairo_copy_path_flat at the same tolerances, in one run.
//
// Each benchmark flattens the whole set once per iteration; the counters give the time and the
// number of points per cubic. The accuracy of every polyline (its largest distance from the true
// curve, found by dense sampling) is measured once, outside the timed loops, and printed with
// the medians and the time ratios after the run.
//
// AGG's flatness test bounds the sum of the two inner control points' distances from the chord
// by its distance tolerance 0.5 / approximation_scale, and a cubic strays from its chord by at
// most 4/9 of that sum. Asking it for a distance tolerance of 9/4 * tol therefore bounds its
// error by tol, the tolerance the other two receive: that is the comparable setting ("agg").
// The literal mapping, distance tolerance = tol, is measured as well ("agg-literal") to show
// what the stricter reading costs. Cairo takes the tolerance as it is.
#include <benchmark/benchmark.h>

#include <zv/bezier_tool.h>
#include "median_reporter.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <functional>
#include <map>
#include <random>
#include <string>
#include <vector>

#if ZV_HAVE_AGG
#include <agg_curves.h>
#endif
#if ZV_HAVE_CAIRO
#include <cairo.h>
#endif

namespace {

using P2 = ZvPoint2<double>;

struct Cubic {
  P2 p[4];
};

constexpr int kCubicCount = 10000;
const double kTolerances[] = {0.1, 0.25, 1.0};

// Control points spread over a random square of side 10 to 1000 px, fixed seed.
const std::vector<Cubic>& Cubics() {
  static const std::vector<Cubic> cubics = [] {
    std::mt19937 rng(20261122);
    std::uniform_real_distribution<double> span(10.0, 1000.0), unit(0.0, 1.0), origin(0, 1000);
    std::vector<Cubic> v(kCubicCount);
    for (Cubic& c : v) {
      const double s = span(rng), ox = origin(rng), oy = origin(rng);
      for (P2& q : c.p)
        q = {ox + s * unit(rng), oy + s * unit(rng)};
    }
    return v;
  }();
  return cubics;
}

// A flattener appends the polyline of one cubic to `out` (cleared by the caller) and returns
// the number of points.
using Flattener = std::function<size_t(const Cubic&, std::vector<P2>& out)>;

struct Method {
  std::string name;
  // Builds the per-tolerance state and returns a flattener bound to it.
  std::function<Flattener(double tolerance)> make;
  // Runs one timed pass over all cubics; returns the number of points produced.
  std::function<size_t(double tolerance)> timedPass;
};

size_t ZvPass(double tolerance) {
  static ZvPoint2dArray out(4096);
  size_t points = 0;
  for (const Cubic& c : Cubics()) {
    out.Chop(0);
    points += ZvBezierTool_FlattenCubic2d(c.p, tolerance, &out, 0);
    benchmark::DoNotOptimize(out.data);
  }
  return points;
}

Flattener ZvFlattener(double tolerance) {
  return [tolerance](const Cubic& c, std::vector<P2>& out) {
    ZvPoint2dArray line(64);
    ZvBezierTool_FlattenCubic2d(c.p, tolerance, &line, 0);
    out.assign(line.data, line.data + line.size);
    return out.size();
  };
}

#if ZV_HAVE_AGG
// AGG keeps its points inside the curve object; reading them out through vertex() is how its
// converter pipelines consume them.
size_t AggPass(double scale) {
  static agg::curve4_div curve;
  curve.approximation_scale(scale);
  size_t points = 0;
  double x, y;
  for (const Cubic& c : Cubics()) {
    curve.init(c.p[0].x, c.p[0].y, c.p[1].x, c.p[1].y, c.p[2].x, c.p[2].y, c.p[3].x, c.p[3].y);
    curve.rewind(0);
    while (!agg::is_stop(curve.vertex(&x, &y))) {
      // Materialise each point without chaining the points through a sum.
      benchmark::DoNotOptimize(x);
      benchmark::DoNotOptimize(y);
      ++points;
    }
  }
  return points;
}

Flattener AggFlattener(double scale) {
  return [scale](const Cubic& c, std::vector<P2>& out) {
    agg::curve4_div curve;
    curve.approximation_scale(scale);
    curve.init(c.p[0].x, c.p[0].y, c.p[1].x, c.p[1].y, c.p[2].x, c.p[2].y, c.p[3].x, c.p[3].y);
    curve.rewind(0);
    double x, y;
    while (!agg::is_stop(curve.vertex(&x, &y)))
      out.push_back({x, y});
    return out.size();
  };
}

double AggScaleBounded(double tolerance) {
  return 0.5 / (2.25 * tolerance);
}
double AggScaleLiteral(double tolerance) {
  return 0.5 / tolerance;
}
#endif

#if ZV_HAVE_CAIRO
struct CairoContext {
  cairo_surface_t* surface = cairo_image_surface_create(CAIRO_FORMAT_A8, 16, 16);
  cairo_t* cr = cairo_create(surface);
  ~CairoContext() {
    cairo_destroy(cr);
    cairo_surface_destroy(surface);
  }
};

cairo_t* CairoFor(double tolerance) {
  static CairoContext context;
  cairo_set_tolerance(context.cr, tolerance);
  return context.cr;
}

template <class Sink>
size_t CairoFlatten(cairo_t* cr, const Cubic& c, Sink&& sink) {
  cairo_new_path(cr);
  cairo_move_to(cr, c.p[0].x, c.p[0].y);
  cairo_curve_to(cr, c.p[1].x, c.p[1].y, c.p[2].x, c.p[2].y, c.p[3].x, c.p[3].y);
  cairo_path_t* path = cairo_copy_path_flat(cr);
  size_t points = 0;
  for (int i = 0; i < path->num_data; i += path->data[i].header.length) {
    const cairo_path_data_t* d = &path->data[i];
    if (d->header.type == CAIRO_PATH_MOVE_TO || d->header.type == CAIRO_PATH_LINE_TO) {
      sink(d[1].point.x, d[1].point.y);
      ++points;
    }
  }
  cairo_path_destroy(path);
  return points;
}

size_t CairoPass(double tolerance) {
  cairo_t* cr = CairoFor(tolerance);
  size_t points = 0;
  for (const Cubic& c : Cubics()) {
    points += CairoFlatten(cr, c, [](double x, double y) {
      benchmark::DoNotOptimize(x);
      benchmark::DoNotOptimize(y);
    });
  }
  return points;
}

Flattener CairoFlattener(double tolerance) {
  return [tolerance](const Cubic& c, std::vector<P2>& out) {
    return CairoFlatten(CairoFor(tolerance), c, [&](double x, double y) { out.push_back({x, y}); });
  };
}
#endif

std::vector<Method> Methods() {
  std::vector<Method> m;
  m.push_back({"zv", ZvFlattener, ZvPass});
#if ZV_HAVE_AGG
  m.push_back({"agg", [](double t) { return AggFlattener(AggScaleBounded(t)); },
               [](double t) { return AggPass(AggScaleBounded(t)); }});
  m.push_back({"agg-literal", [](double t) { return AggFlattener(AggScaleLiteral(t)); },
               [](double t) { return AggPass(AggScaleLiteral(t)); }});
#endif
#if ZV_HAVE_CAIRO
  m.push_back({"cairo", CairoFlattener, CairoPass});
#endif
  return m;
}

// ---- Accuracy, measured once per method and tolerance ----

double SegmentDistance2(const P2& q, const P2& a, const P2& b) {
  const double dx = b.x - a.x, dy = b.y - a.y;
  const double l2 = dx * dx + dy * dy;
  double t = l2 > 0 ? ((q.x - a.x) * dx + (q.y - a.y) * dy) / l2 : 0.0;
  t = std::min(1.0, std::max(0.0, t));
  const double ex = a.x + t * dx - q.x, ey = a.y + t * dy - q.y;
  return ex * ex + ey * ey;
}

P2 Eval(const P2* p, double t) {
  const double s = 1 - t;
  const double b0 = s * s * s, b1 = 3 * s * s * t, b2 = 3 * s * t * t, b3 = t * t * t;
  return {b0 * p[0].x + b1 * p[1].x + b2 * p[2].x + b3 * p[3].x,
          b0 * p[0].y + b1 * p[1].y + b2 * p[2].y + b3 * p[3].y};
}

// Largest distance from the curve to the polyline: 16 samples per polyline segment, each
// measured against the segments near the previous best (the polylines run in curve order),
// with a full scan whenever the near ones are not close enough to be sure.
double MaxDistance(const Cubic& c, const std::vector<P2>& line, double tolerance) {
  const size_t segments = line.size() - 1;
  const int samples = static_cast<int>(16 * segments + 64);
  size_t cursor = 0;
  double worst2 = 0;
  for (int i = 0; i <= samples; ++i) {
    const P2 q = Eval(c.p, static_cast<double>(i) / samples);
    const size_t lo = cursor > 2 ? cursor - 2 : 0, hi = std::min(segments, cursor + 8);
    double best2 = 1e300;
    size_t arg = cursor;
    for (size_t j = lo; j < hi; ++j) {
      const double d2 = SegmentDistance2(q, line[j], line[j + 1]);
      if (d2 < best2) best2 = d2, arg = j;
    }
    if (best2 > 0.25 * tolerance * tolerance) {
      for (size_t j = 0; j < segments; ++j) {
        const double d2 = SegmentDistance2(q, line[j], line[j + 1]);
        if (d2 < best2) best2 = d2, arg = j;
      }
    }
    cursor = arg;
    worst2 = std::max(worst2, best2);
  }
  return std::sqrt(worst2);
}

struct Accuracy {
  double pointsPerCubic = 0, meanMax = 0, p99Max = 0, maxMax = 0, overTolerance = 0;
};

Accuracy Measure(const Flattener& flatten, double tolerance) {
  std::vector<double> maxima;
  std::vector<P2> line;
  size_t points = 0;
  for (const Cubic& c : Cubics()) {
    line.clear();
    points += flatten(c, line);
    maxima.push_back(MaxDistance(c, line, tolerance));
  }
  std::sort(maxima.begin(), maxima.end());
  Accuracy a;
  a.pointsPerCubic = static_cast<double>(points) / maxima.size();
  for (double m : maxima)
    a.meanMax += m / maxima.size();
  for (double m : maxima)
    a.overTolerance += m > tolerance ? 100.0 / maxima.size() : 0.0;
  a.p99Max = maxima[maxima.size() * 99 / 100];
  a.maxMax = maxima.back();
  return a;
}

std::string Key(const std::string& method, double tolerance) {
  char buf[64];
  std::snprintf(buf, sizeof buf, "%s/tol:%g", method.c_str(), tolerance);
  return buf;
}

}  // namespace

int main(int argc, char** argv) {
  Cubics();
  const std::vector<Method> methods = Methods();
  // Tolerance-major, so that the methods compared with each other run next to each other.
  for (double tol : kTolerances) {
    for (const Method& m : methods) {
      benchmark::RegisterBenchmark(Key(m.name, tol).c_str(), [&m, tol](benchmark::State& state) {
        size_t points = 0;
        for (auto _ : state)
          points = m.timedPass(tol);
        // Seconds per cubic, as an inverted rate.
        state.counters["t/cubic"] =
            benchmark::Counter(kCubicCount, benchmark::Counter::kIsIterationInvariantRate |
                                                benchmark::Counter::kInvert);
        state.counters["pts/cubic"] = static_cast<double>(points) / kCubicCount;
      })->Unit(benchmark::kMillisecond);
    }
  }
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    std::printf(
        "\nPer cubic over %d random cubics (spans 10-1000 px). ns/cubic: median CPU time of the\n"
        "runs above (on a shared machine the wall clock also counts other processes). Distances:\n"
        "largest distance of each polyline from its true curve, as mean, 99th percentile and\n"
        "maximum over the cubics, and the share of cubics straying beyond the tolerance.\n"
        "ratio: time / time of zv.\n\n",
        kCubicCount);
    std::printf("%-12s %5s %10s %9s %10s %10s %10s %7s %12s\n", "method", "tol", "ns/cubic",
                "pts/cubic", "mean max", "p99 max", "max max", ">tol %", "ratio");
    for (double tol : kTolerances) {
      const double zv = reporter.MedianSeconds(Key("zv", tol)) / kCubicCount * 1e9;
      for (const Method& m : methods) {
        const double ns = reporter.MedianSeconds(Key(m.name, tol)) / kCubicCount * 1e9;
        if (ns == 0.0) continue;
        const Accuracy a = Measure(m.make(tol), tol);
        std::printf("%-12s %5.2f %10.1f %9.2f %10.4f %10.4f %10.4f %7.2f %11.2fx\n", m.name.c_str(),
                    tol, ns, a.pointsPerCubic, a.meanMax, a.p99Max, a.maxMax, a.overTolerance,
                    zv > 0.0 ? ns / zv : 0.0);
      }
    }
  });
}
