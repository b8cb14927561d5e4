// A live pen: ZvBezierFitPathBuilder fed the pen strokes point by point, the trailing samples
// taken after every point, against lib2geom's bezier_fit_cubic_r fitting each whole stroke once,
// in one run.
//
// The strokes are those of bench_bezier_fit (200 strokes of 300 points, 0.3 px of noise). The
// builder densifies edges to 2 px, draws edges of 32 px and more as they come, and fits cubics
// within 1 px; the context's defaults sample every 1 px along the path flattened at 1 px, as a
// brush engine painting the stroke would ask. For comparison the same builder also runs with
// the samples taken only at the end (one fit of the whole stroke). lib2geom receives 1.0 as its
// squared error bound.
//
// Besides the medians, a separate pass clocks every AddInputPoint plus GetTrailingSamples call
// of the live builder on its own and reports the median, the 99.9th percentile and the worst, in
// wall time and in the thread's CPU time (on a shared machine the worst wall time is the
// scheduler's): a pen at 240 Hz leaves 4 ms per event.
#include <benchmark/benchmark.h>

#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/path_builder.h>
#include "median_reporter.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <ctime>
#include <functional>
#include <string>
#include <vector>

#include "bench/pen_strokes.h"

namespace {

constexpr double kTolerance = 1.0;

struct Method {
  std::string name;
  // Runs every stroke once; returns the number of segments made.
  std::function<size_t()> pass;
};

// Feeds one stroke; with `live`, the samples are taken after every point.
size_t BuildStroke(const ZvGC& gc, const ZvPoint2fArray& s, bool live) {
  ZvPath2f path(1024);
  ZvBezierFitPathBuilder builder(gc, &path, 32.0, 2.0, kTolerance, 3);
  builder.StartSubpath(s[0]);
  for (unsigned int i = 1; i + 1 < s.size; ++i) {
    builder.AddInputPoint(s[i], 0);
    if (live) benchmark::DoNotOptimize(builder.GetTrailingSamples().size);
  }
  benchmark::DoNotOptimize(builder.EndSubpath(s[s.size - 1], 0).size);
  return path.NumSegments() - 1;
}

Method BuilderMethod(bool live) {
  return Method{live ? "zv-builder-live" : "zv-builder-at-end", [live] {
                  static const ZvGC gc;
                  size_t segments = 0;
                  for (const ZvPoint2fArray& s : Strokes())
                    segments += BuildStroke(gc, s, live);
                  return segments;
                }};
}

#if ZV_HAVE_2GEOM
Method GeomMethod() {
  return Method{"2geom-cubic_r", [] {
                  static std::vector<Geom::Point> out(4 * 1000);
                  size_t segments = 0;
                  for (const std::vector<Geom::Point>& s : GeomStrokes()) {
                    const int n =
                        Geom::bezier_fit_cubic_r(out.data(), s.data(), static_cast<int>(s.size()),
                                                 kTolerance * kTolerance, 1000);
                    segments += n > 0 ? n : 0;
                    benchmark::DoNotOptimize(out.data());
                  }
                  return segments;
                }};
}
#endif

// Microseconds of this thread's CPU time, which a descheduled thread does not spend.
double ThreadMicroseconds() {
  timespec t;
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &t);
  return t.tv_sec * 1e6 + t.tv_nsec * 1e-3;
}

// Every AddInputPoint + GetTrailingSamples of the live builder, each clocked on its own (wall
// time and thread CPU time), over `passes` runs of all strokes. Both lists come back sorted.
void CallLatencies(int passes, std::vector<double>& wall, std::vector<double>& cpu) {
  const ZvGC gc;
  for (int pass = 0; pass < passes; ++pass) {
    for (const ZvPoint2fArray& s : Strokes()) {
      ZvPath2f path(1024);
      ZvBezierFitPathBuilder builder(gc, &path, 32.0, 2.0, kTolerance, 3);
      builder.StartSubpath(s[0]);
      for (unsigned int i = 1; i + 1 < s.size; ++i) {
        const double c0 = ThreadMicroseconds();
        const auto t0 = std::chrono::steady_clock::now();
        builder.AddInputPoint(s[i], 0);
        benchmark::DoNotOptimize(builder.GetTrailingSamples().size);
        const auto t1 = std::chrono::steady_clock::now();
        cpu.push_back(ThreadMicroseconds() - c0);
        wall.push_back(std::chrono::duration<double, std::micro>(t1 - t0).count());
      }
      builder.EndSubpath(s[s.size - 1], 0);
    }
  }
  std::sort(wall.begin(), wall.end());
  std::sort(cpu.begin(), cpu.end());
}

}  // namespace

int main(int argc, char** argv) {
  Strokes();
  std::vector<Method> methods = {BuilderMethod(true), BuilderMethod(false)};
#if ZV_HAVE_2GEOM
  GeomStrokes();
  methods.push_back(GeomMethod());
#endif
  for (const Method& m : methods) {
    benchmark::RegisterBenchmark(m.name.c_str(), [&m](benchmark::State& state) {
      size_t segments = 0;
      for (auto _ : state)
        segments = m.pass();
      state.counters["seg/stroke"] = static_cast<double>(segments) / kStrokes;
    })->Unit(benchmark::kMillisecond);
  }
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    std::printf("\n%d pen strokes of %u points. us/stroke: median CPU time per stroke.%s\n\n",
                kStrokes, kPointsPerStroke,
                ZV_HAVE_2GEOM ? " Ratios against 2geom-cubic_r." : " (lib2geom not built in.)");
    std::printf("%-18s %10s %10s %8s\n", "method", "us/stroke", "seg/stroke", "ratio");
    const double reference = reporter.MedianSeconds(methods.back().name) / kStrokes * 1e6;
    for (const Method& m : methods) {
      const double us = reporter.MedianSeconds(m.name) / kStrokes * 1e6;
      if (us == 0.0) continue;
      std::printf("%-18s %10.1f %10.2f %7.2fx\n", m.name.c_str(), us,
                  reporter.Counter(m.name, "seg/stroke"), reference > 0 ? us / reference : 0.0);
    }
    std::vector<double> wall, cpu;
    CallLatencies(3, wall, cpu);
    std::printf("\nzv-builder-live, one AddInputPoint + GetTrailingSamples, %zu calls:\n",
                wall.size());
    for (const std::vector<double>* v : {&wall, &cpu})
      std::printf("  %-11s median %.2f us, 99.9%% %.2f us, worst %.2f us\n",
                  v == &wall ? "wall time" : "thread CPU", (*v)[v->size() / 2],
                  (*v)[v->size() * 999 / 1000], v->back());
  });
}
