// Tracing rasters into paths: Vectorize (exact pixel-edge contours) and VectorizeAndFit (the
// same fitted with cubics at gc.flattenTolerance 1 pixel) against the peer bitmap tracer's full
// trace (its default parameters, except that it keeps every dot, as zv does). Scenes: glyph
// shapes filled by zv's aliased fill at 1024x1024 and, the same page at four times the
// resolution, 4096x4096; and 50% noise at 512x512. Each contender traces the dark pixels of a
// raster prepared outside the timing, in the form it takes (8-bit pixels for zv, a packed
// bitmap for the peer), and builds its whole result every iteration.
//
// The sweep alone, writing no path, and the fitting recursion alone run as two more cases.
//
// Run with --benchmark_repetitions=N (N odd, 5 or more on a shared machine): the summary gives
// median CPU times, the ratios to the peer (targets: Vectorize at most 0.1, VectorizeAndFit at
// most 0.5), paths and segments of each result, and the growth from 1024^2 to 4096^2.
#include <zv/bezier_fit.h>
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/vectorizer.h>

#include <benchmark/benchmark.h>

#include "median_reporter.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <random>
#include <string>
#include <vector>

#if ZV_HAVE_POTRACE
#include <potracelib.h>
#endif

namespace {
const double kPi = 3.14159265358979323846;

// A closed blob of 8 cubics round (cx, cy) with wobbling radii.
void Blob(ZvPath2f& path, double cx, double cy, const double* r, double scale) {
  auto at = [&](int i, double rad, double da) {
    const double a = i * kPi / 4 + da;
    return ZvPoint2<float>{static_cast<float>((cx + rad * std::cos(a)) * scale),
                           static_cast<float>((cy + rad * std::sin(a)) * scale)};
  };
  path.Moveto(at(0, r[0], 0));
  for (int i = 0; i < 8; ++i)
    path.Curveto(at(i, r[i] * 1.1, 0.25), at(i + 1, r[i + 1] * 1.1, -0.25), at(i + 1, r[i + 1], 0));
  path.CloseSubpath(path.NumPoints() - 1);
}

void Bar(ZvPath2f& path, double x0, double y0, double x1, double y1, double scale) {
  auto p = [scale](double x, double y) {
    return ZvPoint2<float>{static_cast<float>(x * scale), static_cast<float>(y * scale)};
  };
  path.Moveto(p(x0, y0));
  path.Lineto(p(x1, y0));
  path.Lineto(p(x1, y1));
  path.Lineto(p(x0, y1));
  path.CloseSubpath(path.NumPoints() - 1);
}

// A page of glyph-like shapes on a 1024-unit grid of 32-unit cells, drawn at `size` pixels:
// bowls with counters (holes), bars, and bowls with stems, filled under the even-odd rule.
ZvRaster<unsigned char> GlyphPage(int size) {
  const double scale = size / 1024.0;
  std::mt19937 rng(11);
  std::uniform_real_distribution<double> u(0, 1);
  ZvPath2f page;
  for (int row = 0; row < 32; ++row)
    for (int col = 0; col < 32; ++col) {
      const double cx = 16 + 32 * col, cy = 16 + 32 * row;
      double outer[9], inner[9];
      for (int i = 0; i < 8; ++i) {
        outer[i] = 9 + 4 * u(rng);
        inner[i] = outer[i] * (0.45 + 0.15 * u(rng));
      }
      outer[8] = outer[0];
      inner[8] = inner[0];
      const int kind = static_cast<int>(u(rng) * 3);
      if (kind != 1) {
        Blob(page, cx, cy, outer, scale);
        Blob(page, cx, cy, inner, scale);
      }
      if (kind == 1) Bar(page, cx - 3, cy - 13, cx + 3, cy + 13, scale);
      if (kind == 2) Bar(page, cx + 8, cy - 14, cx + 13, cy + 9, scale);
    }
  ZvRaster<unsigned char> r(size, size, 255);
  ZvGC gc;
  gc.fillRule = 0;
  gc.flattenTolerance = 0.25;
  ZvRaster<unsigned char> ink(size, size, 0);
  page.Fill(gc, ink, nullptr, nullptr);
  // Dark ink on white paper.
  for (int i = 0; i < r.GetSize(); ++i)
    r.SetVal(i, static_cast<unsigned char>(255 - ink.GetVal(i)));
  return r;
}

ZvRaster<unsigned char> Noise(int size) {
  std::mt19937 rng(5);
  ZvRaster<unsigned char> r(size, size, 255);
  for (int i = 0; i < r.GetSize(); ++i)
    r.SetVal(i, rng() & 1 ? 0 : 255);
  return r;
}

const char* const kScenes[] = {"glyphs1024", "glyphs4096", "noise512"};

const ZvRaster<unsigned char>& GetScene(int which) {
  static const ZvRaster<unsigned char> scenes[] = {GlyphPage(1024), GlyphPage(4096), Noise(512)};
  return scenes[which];
}

void Count(benchmark::State& state, const ZvPath2f& path) {
  state.counters["paths"] = path.NumSubpaths();
  state.counters["segments"] = path.NumSegments();
}

void ZvVectorize(benchmark::State& state, int scene) {
  const ZvRaster<unsigned char>& r = GetScene(scene);
  const ZvVectorizer v(0, 0);
  ZvPath2f path;
  for (auto _ : state) {
    path.Clear();
    v.Vectorize(r, 0, r.GetExtent2f(), path);
    benchmark::DoNotOptimize(path.NumPoints());
  }
  Count(state, path);
}

// The sweep alone, its corners counted instead of written into a path: how much of Vectorize
// is the tracing and how much the path it builds.
void ZvSweep(benchmark::State& state, int scene) {
  const ZvRaster<unsigned char>& r = GetScene(scene);
  const ZvVectorizer v(0, 0);
  long corners = 0;
  const ObCallbackTable table = {nullptr,
                                 nullptr,
                                 [](int, int, void* u) { ++*static_cast<long*>(u); },
                                 [](int, int, void* u) { ++*static_cast<long*>(u); },
                                 nullptr,
                                 nullptr};
  for (auto _ : state) {
    corners = 0;
    v.Trace(r, 0, r.GetExtent2f(), table, &corners);
    benchmark::DoNotOptimize(corners);
  }
  state.counters["corners"] = static_cast<double>(corners);
}

void ZvVectorizeAndFit(benchmark::State& state, int scene) {
  const ZvRaster<unsigned char>& r = GetScene(scene);
  const ZvVectorizer v(0, 0);
  const ZvGC gc;  // flatten tolerance 1 pixel
  ZvPath2f path;
  for (auto _ : state) {
    path.Clear();
    v.VectorizeAndFit(r, 0, r.GetExtent2f(), gc, path);
    benchmark::DoNotOptimize(path.NumPoints());
  }
  Count(state, path);
}

// The fitting recursion alone, on the contours Vectorize traced: every contour resampled at its
// pixel steps outside the timing, then fitted by the same recursion VectorizeAndFit runs (single
// G1 cubic fits, split where a fit strays, tangents from samples 2 to 4 steps either side). Its
// output is checked against VectorizeAndFit's before timing; the timed runs write no path, so
// the figure is what the fits cost on their own.
struct FitInput {
  std::vector<ZvPoint2fArray> samples;
  ZvDoubleArray steps{1};
};

FitInput Resampled(const ZvPath2f& polygons) {
  FitInput in;
  ZvPath2fIter it(polygons);
  unsigned int first = 0, last = 0;
  while (it.GetNextSubPathIndices(first, last)) {
    in.samples.emplace_back(64);
    ZvPoint2fArray& s = in.samples.back();
    int x = static_cast<int>(polygons.GetPoint(first).x),
        y = static_cast<int>(polygons.GetPoint(first).y);
    s.Add(x, y);
    for (unsigned int i = first + 1; i <= last; ++i) {
      const int tx = static_cast<int>(polygons.GetPoint(i).x),
                ty = static_cast<int>(polygons.GetPoint(i).y);
      while (x != tx || y != ty) {
        if (x != tx)
          x += x < tx ? 1 : -1;
        else
          y += y < ty ? 1 : -1;
        s.Add(x, y);
      }
    }
    while (in.steps.size < s.size)
      in.steps.Add(static_cast<double>(in.steps.size));
  }
  return in;
}

ZvPoint2<double> Tangent(const ZvPoint2fArray& s, unsigned int i) {
  const unsigned int n = s.size - 1;
  auto at = [&s](unsigned int k) { return ZvPoint2<double>{s[k].x, s[k].y}; };
  ZvPoint2<double> v{0.0, 0.0};
  for (unsigned int k = 2; k <= 4; ++k)
    v += i >= 4 && i + 4 <= n ? at(i + k) - at(i - k) : at((i + k) % n) - at((n - i + k) % n);
  if (std::fabs(static_cast<float>(v.x)) <= 1e-07f && std::fabs(static_cast<float>(v.y)) <= 1e-07f)
    v = (i == 0 || i >= n) ? at(1) - at(n - 1) : at(i + 1) - at(i - 1);
  const double len2 = v.x * v.x + v.y * v.y;
  if ((std::fabs(v.x) <= 1e-09 && std::fabs(v.y) <= 1e-09) || len2 <= 1e-09) return v;
  return {v.x / std::sqrt(len2), v.y / std::sqrt(len2)};
}

// Fits every contour; appends to `path` when given. Counts the single-curve fits and the samples
// they covered.
void FitRecursion(ZvBezierTool& tool, const FitInput& in, double tolerance, ZvPath2f* path,
                  double& fits, double& covered) {
  struct Range {
    unsigned int first, last;
    ZvPoint2<double> t0, t1;
  };
  std::vector<Range> todo;
  for (const ZvPoint2fArray& s : in.samples) {
    const ZvPoint2<double> t = Tangent(s, 0);
    if (path) path->Moveto(s[0]);
    todo.push_back({0, s.size - 1, t, t});
    while (!todo.empty()) {
      const Range r = todo.back();
      todo.pop_back();
      if (r.first + 2 >= r.last) {
        if (path && r.first + 1 == r.last) path->Lineto(s[r.last]);
        if (path && r.first + 2 == r.last) path->Curveto(s[r.first + 1], s[r.first + 1], s[r.last]);
        continue;
      }
      ZvPoint2<float> control[4];
      unsigned int split = (r.first + r.last) / 2;
      ++fits;
      covered += r.last - r.first + 1;
      if (tool.SingleCurveFitG1G1(s, in.steps, r.first, r.last, r.t0, r.t1, tolerance, 3, control,
                                  split)) {
        if (path) path->AltCurveto(control + 1, 3);
        continue;
      }
      if (split <= r.first || split >= r.last) split = (r.first + r.last) / 2;
      const ZvPoint2<double> ts = Tangent(s, split);
      todo.push_back({split, r.last, ts, r.t1});
      todo.push_back({r.first, split, r.t0, ts});
    }
    if (path) path->Closeto();
  }
}

void ZvFitAlone(benchmark::State& state, int scene) {
  const ZvRaster<unsigned char>& r = GetScene(scene);
  const ZvVectorizer v(0, 0);
  const ZvGC gc;
  ZvPath2f polygons, fitted, replayed;
  v.Vectorize(r, 0, r.GetExtent2f(), polygons);
  v.VectorizeAndFit(r, 0, r.GetExtent2f(), gc, fitted);
  const FitInput in = Resampled(polygons);
  ZvBezierTool tool;
  double fits = 0, covered = 0;
  FitRecursion(tool, in, gc.flattenTolerance, &replayed, fits, covered);
  std::vector<unsigned char> a(fitted.GetBufferSize()), b(replayed.GetBufferSize());
  fitted.WriteToBuffer(a.data());
  replayed.WriteToBuffer(b.data());
  if (a != b) {
    state.SkipWithError("the replayed recursion differs from VectorizeAndFit");
    return;
  }
  std::size_t samples = 0;
  for (const ZvPoint2fArray& s : in.samples)
    samples += s.size;
  for (auto _ : state) {
    fits = covered = 0;
    FitRecursion(tool, in, gc.flattenTolerance, nullptr, fits, covered);
  }
  state.counters["fits"] = fits;
  state.counters["samples"] = static_cast<double>(samples);
  state.counters["covered"] = covered;
}

#if ZV_HAVE_POTRACE
// The dark pixels packed one bit each, leftmost pixel in the highest bit of a word.
struct Bitmap {
  std::vector<potrace_word> words;
  potrace_bitmap_t bm;
  explicit Bitmap(const ZvRaster<unsigned char>& r) {
    const int bits = static_cast<int>(8 * sizeof(potrace_word));
    bm.w = r.GetWidth();
    bm.h = r.GetHeight();
    bm.dy = (bm.w + bits - 1) / bits;
    words.assign(static_cast<std::size_t>(bm.dy) * bm.h, 0);
    for (int y = 0; y < bm.h; ++y)
      for (int x = 0; x < bm.w; ++x)
        if (r.GetVal(x, y) == 0)
          words[static_cast<std::size_t>(y) * bm.dy + x / bits] |= potrace_word(1)
                                                                   << (bits - 1 - x % bits);
    bm.map = words.data();
  }
};

void Potrace(benchmark::State& state, int scene) {
  const Bitmap bitmap(GetScene(scene));
  potrace_param_t* param = potrace_param_default();
  param->turdsize = 0;
  double paths = 0, segments = 0;
  for (auto _ : state) {
    potrace_state_t* st = potrace_trace(param, &bitmap.bm);
    paths = segments = 0;
    for (const potrace_path_t* p = st && st->status == POTRACE_STATUS_OK ? st->plist : nullptr; p;
         p = p->next) {
      ++paths;
      segments += p->curve.n;
    }
    potrace_state_free(st);
  }
  potrace_param_free(param);
  state.counters["paths"] = paths;
  state.counters["segments"] = segments;
}
#endif

const char* const kContenders[] = {"vectorize", "vectorize_fit", "potrace", "sweep", "fit_alone"};

std::string Key(int scene, const char* contender) {
  return std::string(kScenes[scene]) + "/" + contender;
}

void Register() {
  for (int scene = 0; scene < 3; ++scene) {
    benchmark::RegisterBenchmark(Key(scene, kContenders[0]).c_str(), ZvVectorize, scene)
        ->Unit(benchmark::kMillisecond);
    benchmark::RegisterBenchmark(Key(scene, kContenders[1]).c_str(), ZvVectorizeAndFit, scene)
        ->Unit(benchmark::kMillisecond);
#if ZV_HAVE_POTRACE
    benchmark::RegisterBenchmark(Key(scene, kContenders[2]).c_str(), Potrace, scene)
        ->Unit(benchmark::kMillisecond);
#endif
    benchmark::RegisterBenchmark(Key(scene, kContenders[3]).c_str(), ZvSweep, scene)
        ->Unit(benchmark::kMillisecond);
    benchmark::RegisterBenchmark(Key(scene, kContenders[4]).c_str(), ZvFitAlone, scene)
        ->Unit(benchmark::kMillisecond);
  }
}

void PrintSummary(const ZvMedianReporter& reporter) {
  auto ms = [&](int scene, int c) {
    return reporter.MedianSeconds(Key(scene, kContenders[c])) * 1e3;
  };
  auto counter = [&](int scene, int c, const char* name) {
    return reporter.Counter(Key(scene, kContenders[c]), name);
  };
  std::printf(
      "\nMedian CPU ms per trace; ratio: time / peer's full trace. Targets: vectorize at "
      "most 0.10, vectorize_fit at most 0.50.\n\n");
  std::printf("%-11s %10s %10s %10s %7s %7s   %-26s %s\n", "scene", "vectorize", "fit", "potrace",
              "V/p", "F/p", "paths (V, fit, potrace)", "segments (V, fit, potrace)");
  for (int scene = 0; scene < 3; ++scene) {
    const double v = ms(scene, 0), f = ms(scene, 1), p = ms(scene, 2);
    if (v == 0.0 && f == 0.0) continue;  // filtered out
    std::printf("%-11s %10.3f %10.3f %10.3f", kScenes[scene], v, f, p);
    if (p > 0.0)
      std::printf(" %6.3f%s %6.3f%s", v / p, v <= 0.1 * p ? " " : "!", f / p,
                  f <= 0.5 * p ? " " : "!");
    else
      std::printf(" %7s %7s", "-", "-");
    std::printf("   %7.0f %7.0f %7.0f      %8.0f %8.0f %8.0f\n", counter(scene, 0, "paths"),
                counter(scene, 1, "paths"), counter(scene, 2, "paths"),
                counter(scene, 0, "segments"), counter(scene, 1, "segments"),
                counter(scene, 2, "segments"));
  }
  std::printf("\nThe sweep alone (corners counted, no path written):\n");
  for (int scene = 0; scene < 3; ++scene) {
    const double sw = ms(scene, 3), p = ms(scene, 2);
    if (sw > 0.0)
      std::printf("  %-11s %8.3f ms, %.3f of the peer, %.0f corner calls\n", kScenes[scene], sw,
                  p > 0.0 ? sw / p : 0.0, counter(scene, 3, "corners"));
  }
  std::printf("\nThe fitting recursion alone (same contours, no tracing, no path written):\n");
  for (int scene = 0; scene < 3; ++scene) {
    const double fit = ms(scene, 4), p = ms(scene, 2);
    if (fit > 0.0)
      std::printf(
          "  %-11s %8.3f ms, %.3f of the peer; %.0f fits over %.0f samples (%.1f per sample)\n",
          kScenes[scene], fit, p > 0.0 ? fit / p : 0.0, counter(scene, 4, "fits"),
          counter(scene, 4, "samples"),
          counter(scene, 4, "covered") / std::max(counter(scene, 4, "samples"), 1.0));
  }
  std::printf("\nGrowth from glyphs1024 to glyphs4096 (16 times the pixels; target at most 16):\n");
  for (int c = 0; c < 5; ++c) {
    const double small = ms(0, c), large = ms(1, c);
    if (small > 0.0 && large > 0.0)
      std::printf("  %-14s %6.2f%s\n", kContenders[c], large / small,
                  large <= 16 * small ? "" : " !");
  }
  std::printf("\n'!' marks a figure that misses its target.\n");
}
}  // namespace

int main(int argc, char** argv) {
  for (int scene = 0; scene < 3; ++scene)
    GetScene(scene);  // built outside the timings
  Register();
  return ZvRunBenchmarks(argc, argv,
                         [&](const ZvMedianReporter& reporter) { PrintSummary(reporter); });
}
