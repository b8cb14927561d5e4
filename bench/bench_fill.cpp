// Antialiased fills and strokes of five scenes: AAFill at 4x4 and 8x8 against the peers'
// rasterisers (an A8 surface at its default and at its fastest antialiasing, a gray8 scanline
// renderer, an exact-area outline renderer), each filling the whole scene as one path under the
// non-zero rule into a cleared 8-bit raster, and the strokes of the scribble at width 4 with
// round joins and caps. The contenders of a scene run one after the other, so that the machine's
// load varies little between them.
//
// Run with --benchmark_repetitions=N (N odd, 5 or more on a shared machine): the summary at the
// end gives the median CPU time of each, its ratio to the fastest peer, and the mean absolute
// difference (0..255) of AAFill's output from the outline renderer's exact-area coverage.
#include <zv/gc.h>
#include <zv/path2f.h>

#include <benchmark/benchmark.h>

#include "median_reporter.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <random>
#include <string>
#include <vector>

#if ZV_HAVE_CAIRO
#include <cairo.h>
#endif
#if ZV_HAVE_AGG
#include <agg_conv_curve.h>
#include <agg_conv_stroke.h>
#include <agg_path_storage.h>
#include <agg_pixfmt_gray.h>
#include <agg_rasterizer_scanline_aa.h>
#include <agg_renderer_base.h>
#include <agg_renderer_scanline.h>
#include <agg_scanline_u.h>
#endif
#if ZV_HAVE_FREETYPE
#include <ft2build.h>
#include FT_FREETYPE_H
#include FT_OUTLINE_H
#endif

namespace {
const double kPi = 3.14159265358979323846;

// A scene: subpaths of lines and cubics, closed, in pixels.
struct Segment {
  enum Kind { Move, Line, Cubic } kind;
  double p[6];
};
struct Scene {
  std::vector<Segment> segments;
  int size = 1024;
  void Move(double x, double y) { segments.push_back({Segment::Move, {x, y}}); }
  void Line(double x, double y) { segments.push_back({Segment::Line, {x, y}}); }
  void Cubic(double a, double b, double c, double d, double x, double y) {
    segments.push_back({Segment::Cubic, {a, b, c, d, x, y}});
  }
};

void AddCircle(Scene& s, double cx, double cy, double r) {
  const double k = 0.5522847498307935 * r;
  s.Move(cx + r, cy);
  s.Cubic(cx + r, cy + k, cx + k, cy + r, cx, cy + r);
  s.Cubic(cx - k, cy + r, cx - r, cy + k, cx - r, cy);
  s.Cubic(cx - r, cy - k, cx - k, cy - r, cx, cy - r);
  s.Cubic(cx + k, cy - r, cx + r, cy - k, cx + r, cy);
}

Scene Star() {
  Scene s;
  for (int i = 0; i < 400; ++i) {
    const double a = i * kPi / 200, r = i % 2 ? 250 : 500;
    if (i)
      s.Line(512 + r * std::cos(a), 512 + r * std::sin(a));
    else
      s.Move(512 + r, 512);
  }
  s.Line(512 + 500, 512);
  return s;
}

Scene Circles(double scale, int size) {
  Scene s;
  s.size = size;
  std::mt19937 rng(7);
  std::uniform_real_distribution<double> u(0, 1);
  for (int i = 0; i < 400; ++i)
    AddCircle(s, u(rng) * 1024 * scale, u(rng) * 1024 * scale, (5 + 55 * u(rng)) * scale);
  return s;
}

// Blobs of 8 cubics around a centre with wobbling radii: glyph-sized closed curves.
Scene Glyphs() {
  Scene s;
  std::mt19937 rng(11);
  std::uniform_real_distribution<double> u(0, 1);
  for (int g = 0; g < 2000; ++g) {
    const double cx = 12 + u(rng) * 1000, cy = 12 + u(rng) * 1000, size = 10 + 14 * u(rng);
    double r[9];
    for (int i = 0; i < 8; ++i)
      r[i] = size * (0.3 + 0.2 * u(rng));
    r[8] = r[0];
    auto at = [&](int i, double rad, double da) {
      const double a = i * kPi / 4 + da;
      return std::make_pair(cx + rad * std::cos(a), cy + rad * std::sin(a));
    };
    s.Move(at(0, r[0], 0).first, at(0, r[0], 0).second);
    for (int i = 0; i < 8; ++i) {
      const auto c1 = at(i, r[i] * 1.1, 0.25), c2 = at(i + 1, r[i + 1] * 1.1, -0.25),
                 e = at(i + 1, r[i + 1], 0);
      s.Cubic(c1.first, c1.second, c2.first, c2.second, e.first, e.second);
    }
  }
  return s;
}

Scene Scribble() {
  Scene s;
  std::mt19937 rng(3);
  std::uniform_real_distribution<double> u(8, 1016);
  const double x0 = u(rng), y0 = u(rng);
  s.Move(x0, y0);
  for (int i = 0; i < 2000; ++i) {
    const bool last = i == 1999;
    const double a = u(rng), b = u(rng), c = u(rng), d = u(rng);
    s.Cubic(a, b, c, d, last ? x0 : u(rng), last ? y0 : u(rng));
  }
  return s;
}

const Scene& GetScene(int which) {
  static const Scene scenes[] = {Star(), Circles(1.0, 1024), Glyphs(), Scribble(),
                                 Circles(0.25, 256)};
  return scenes[which];
}

const char* kSceneNames[] = {"a_star", "b_circles", "c_glyphs", "d_scribble", "e_circles256"};

ZvPath2f ToPath(const Scene& s) {
  ZvPath2f path(static_cast<unsigned int>(s.segments.size() * 3));
  auto f = [](double v) { return static_cast<float>(v); };
  ZvPoint2<float> start{0, 0};
  bool open = false;
  for (const Segment& g : s.segments) {
    if (g.kind == Segment::Move) {
      if (open) path.CloseSubpath(path.NumPoints() - 1);
      start = {f(g.p[0]), f(g.p[1])};
      path.Moveto(start);
      open = true;
    } else if (g.kind == Segment::Line) {
      path.Lineto({f(g.p[0]), f(g.p[1])});
    } else {
      path.Curveto({f(g.p[0]), f(g.p[1])}, {f(g.p[2]), f(g.p[3])}, {f(g.p[4]), f(g.p[5])});
    }
  }
  if (open) path.CloseSubpath(path.NumPoints() - 1);
  return path;
}

ZvGC Context(int rate) {
  ZvGC gc;
  gc.samplingRate = rate;
  gc.fillRule = 1;
  gc.flattenTolerance = 0.25;
  gc.lineWidth = 4;
  gc.joinStyle = 2;
  gc.capStyle = 0;
  return gc;
}

void ZvRender(const ZvPath2f& path, int rate, ZvRaster<unsigned char>& r) {
  r.MemsetBuffer(0);
  path.AAFill(Context(rate), r, nullptr, nullptr);
}

void ZvFill(benchmark::State& state, int scene, int rate) {
  const Scene& s = GetScene(scene);
  const ZvPath2f path = ToPath(s);
  ZvRaster<unsigned char> r(s.size, s.size, 0);
  for (auto _ : state) {
    ZvRender(path, rate, r);
    benchmark::ClobberMemory();
  }
}

// Stroke fills the outline aliased, through Fill under the non-zero rule.
void ZvStroke(benchmark::State& state) {
  const Scene& s = GetScene(3);
  ZvPath2f path = ToPath(s);
  path.OpenSubpath(0);
  ZvRaster<unsigned char> r(s.size, s.size, 0);
  for (auto _ : state) {
    r.MemsetBuffer(0);
    path.Stroke(Context(8), r);
    benchmark::ClobberMemory();
  }
}

#if ZV_HAVE_CAIRO
void CairoPath(cairo_t* cr, const Scene& s, bool close) {
  for (const Segment& g : s.segments) {
    if (g.kind == Segment::Move) {
      if (close) cairo_close_path(cr);
      cairo_move_to(cr, g.p[0], g.p[1]);
    } else if (g.kind == Segment::Line) {
      cairo_line_to(cr, g.p[0], g.p[1]);
    } else {
      cairo_curve_to(cr, g.p[0], g.p[1], g.p[2], g.p[3], g.p[4], g.p[5]);
    }
  }
  if (close) cairo_close_path(cr);
}

// `fast` asks for the peer's quickest antialiasing, the one a fill-rate contest is run against.
void CairoFill(benchmark::State& state, int scene, bool stroke, bool fast = false) {
  const Scene& s = GetScene(scene);
  cairo_surface_t* surface = cairo_image_surface_create(CAIRO_FORMAT_A8, s.size, s.size);
  cairo_t* cr = cairo_create(surface);
  if (fast) cairo_set_antialias(cr, CAIRO_ANTIALIAS_FAST);
  cairo_set_fill_rule(cr, CAIRO_FILL_RULE_WINDING);
  cairo_set_line_width(cr, 4);
  cairo_set_line_join(cr, CAIRO_LINE_JOIN_ROUND);
  cairo_set_line_cap(cr, CAIRO_LINE_CAP_ROUND);
  CairoPath(cr, s, !stroke);
  cairo_path_t* path = cairo_copy_path(cr);
  cairo_new_path(cr);
  for (auto _ : state) {
    cairo_surface_flush(surface);
    std::memset(cairo_image_surface_get_data(surface), 0,
                static_cast<std::size_t>(cairo_image_surface_get_stride(surface)) * s.size);
    cairo_surface_mark_dirty(surface);
    cairo_append_path(cr, path);
    if (stroke)
      cairo_stroke(cr);
    else
      cairo_fill(cr);
    cairo_surface_flush(surface);
  }
  cairo_path_destroy(path);
  cairo_destroy(cr);
  cairo_surface_destroy(surface);
}
#endif

#if ZV_HAVE_AGG
void AggFill(benchmark::State& state, int scene, bool stroke) {
  const Scene& s = GetScene(scene);
  std::vector<unsigned char> pixels(static_cast<std::size_t>(s.size) * s.size);
  agg::rendering_buffer buffer(pixels.data(), s.size, s.size, s.size);
  agg::pixfmt_gray8 format(buffer);
  agg::renderer_base<agg::pixfmt_gray8> base(format);
  agg::rasterizer_scanline_aa<> ras;
  agg::scanline_u8 sl;
  agg::path_storage path;
  for (const Segment& g : s.segments) {
    if (g.kind == Segment::Move) {
      if (!stroke) path.close_polygon();
      path.move_to(g.p[0], g.p[1]);
    } else if (g.kind == Segment::Line) {
      path.line_to(g.p[0], g.p[1]);
    } else {
      path.curve4(g.p[0], g.p[1], g.p[2], g.p[3], g.p[4], g.p[5]);
    }
  }
  if (!stroke) path.close_polygon();
  agg::conv_curve<agg::path_storage> curves(path);
  agg::conv_stroke<agg::conv_curve<agg::path_storage>> outline(curves);
  outline.width(4);
  outline.line_join(agg::round_join);
  outline.line_cap(agg::round_cap);
  ras.filling_rule(agg::fill_non_zero);
  for (auto _ : state) {
    base.clear(agg::gray8(0));
    ras.reset();
    if (stroke)
      ras.add_path(outline);
    else
      ras.add_path(curves);
    agg::render_scanlines_aa_solid(ras, sl, base, agg::gray8(255));
    benchmark::ClobberMemory();
  }
}
#endif

#if ZV_HAVE_FREETYPE
// The scene as outlines in 26.6 fixed point, rows flipped (outlines have y upwards). An outline
// counts its points in 16 bits, so a large scene is cut into several at contour boundaries;
// they are rendered one after the other (a few overlapping contours of different pieces then
// overwrite rather than add up).
struct FtOutlines {
  struct Piece {
    std::vector<FT_Vector> points;
    std::vector<char> tags;
    std::vector<short> contours;
    FT_Outline outline{};
  };
  std::vector<Piece> pieces;
  explicit FtOutlines(const Scene& s) {
    pieces.emplace_back();
    auto add = [&](double x, double y, char tag) {
      Piece& p = pieces.back();
      p.points.push_back({static_cast<FT_Pos>(std::lround(x * 64)),
                          static_cast<FT_Pos>(std::lround((s.size - y) * 64))});
      p.tags.push_back(tag);
    };
    for (const Segment& g : s.segments) {
      if (g.kind == Segment::Move && !pieces.back().points.empty()) {
        pieces.back().contours.push_back(static_cast<short>(pieces.back().points.size() - 1));
        if (pieces.back().points.size() > 30000) pieces.emplace_back();
      }
      if (g.kind == Segment::Cubic) {
        add(g.p[0], g.p[1], FT_CURVE_TAG_CUBIC);
        add(g.p[2], g.p[3], FT_CURVE_TAG_CUBIC);
        add(g.p[4], g.p[5], FT_CURVE_TAG_ON);
      } else {
        add(g.p[0], g.p[1], FT_CURVE_TAG_ON);
      }
    }
    pieces.back().contours.push_back(static_cast<short>(pieces.back().points.size() - 1));
    for (Piece& p : pieces) {
      p.outline.n_points = static_cast<short>(p.points.size());
      p.outline.n_contours = static_cast<short>(p.contours.size());
      p.outline.points = p.points.data();
      p.outline.tags = p.tags.data();
      p.outline.contours = p.contours.data();
      p.outline.flags = FT_OUTLINE_NONE;
    }
  }
};

// Renders the pieces in vertical strips of `strip` columns (a bitmap window into the whole, the
// outline shifted by whole pixels, so every strip is exact) and answers the renderer's error, 0
// on success. The renderer keeps the cells of a band of rows in a fixed pool and halves the band
// when the pool overflows; a row crossed by thousands of edges overflows it even one row high,
// but a narrower strip holds fewer cells per row.
int FtRender(FT_Library library, FtOutlines& o, std::vector<unsigned char>& pixels, int size,
             int strip) {
  std::memset(pixels.data(), 0, pixels.size());
  int error = 0;
  for (int x0 = 0; x0 < size; x0 += strip) {
    FT_Bitmap bitmap{};
    bitmap.rows = static_cast<unsigned int>(size);
    bitmap.width = static_cast<unsigned int>(std::min(strip, size - x0));
    bitmap.pitch = size;
    bitmap.buffer = pixels.data() + x0;
    bitmap.num_grays = 256;
    bitmap.pixel_mode = FT_PIXEL_MODE_GRAY;
    for (FtOutlines::Piece& p : o.pieces) {
      FT_Outline_Translate(&p.outline, -64 * x0, 0);
      if (const int e = FT_Outline_Get_Bitmap(library, &p.outline, &bitmap)) error = e;
      FT_Outline_Translate(&p.outline, 64 * x0, 0);
    }
  }
  return error;
}

// The strip width, among the whole raster and its halves down to 8 columns, with which the
// renderer finishes a scene fastest: each overflow costs it another pass over the whole outline,
// so the narrowest strip that finishes is not always the quickest. Found once per scene.
int FtStrip(FT_Library library, FtOutlines& o, int scene) {
  static int chosen[5] = {};
  if (chosen[scene]) return chosen[scene];
  const int size = GetScene(scene).size;
  std::vector<unsigned char> pixels(static_cast<std::size_t>(size) * size);
  int best = size;
  double bestSeconds = -1.0;
  for (int strip = size; strip >= 8; strip /= 2) {
    // The quickest of three renders, or of one when a render takes long: noise must not make
    // a needlessly narrow strip win.
    double seconds = -1.0;
    for (int run = 0; run < 3 && (run == 0 || seconds < 0.2); ++run) {
      const auto start = std::chrono::steady_clock::now();
      const int error = FtRender(library, o, pixels, size, strip);
      const std::chrono::duration<double> took = std::chrono::steady_clock::now() - start;
      if (error != 0) break;
      if (seconds < 0.0 || took.count() < seconds) seconds = took.count();
    }
    if (seconds >= 0.0 && (bestSeconds < 0.0 || seconds < bestSeconds)) {
      best = strip;
      bestSeconds = seconds;
    }
  }
  return chosen[scene] = best;
}

void FreeTypeFill(benchmark::State& state, int scene) {
  const Scene& s = GetScene(scene);
  FT_Library library;
  FT_Init_FreeType(&library);
  FtOutlines o(s);
  const int strip = FtStrip(library, o, scene);
  std::vector<unsigned char> pixels(static_cast<std::size_t>(s.size) * s.size);
  int error = 0;
  for (auto _ : state) {
    error = FtRender(library, o, pixels, s.size, strip);
    benchmark::ClobberMemory();
  }
  FT_Done_FreeType(library);
  state.counters["strip"] = strip;
  state.counters["error"] = error;  // non-zero: the reference is incomplete
}

// Mean absolute difference (0..255) of AAFill's output at `rate` from the exact-area coverage.
double MeanDifference(int scene, int rate) {
  const Scene& s = GetScene(scene);
  FT_Library library;
  FT_Init_FreeType(&library);
  FtOutlines o(s);
  std::vector<unsigned char> pixels(static_cast<std::size_t>(s.size) * s.size);
  FtRender(library, o, pixels, s.size, FtStrip(library, o, scene));
  FT_Done_FreeType(library);
  ZvRaster<unsigned char> ours(s.size, s.size, 0);
  ZvRender(ToPath(s), rate, ours);
  double sum = 0;
  for (std::size_t i = 0; i < pixels.size(); ++i)
    sum +=
        std::abs(static_cast<int>(pixels[i]) - static_cast<int>(ours.GetVal(static_cast<int>(i))));
  return sum / static_cast<double>(pixels.size());
}
#endif

const char* const kContenders[] = {"zv4x4", "zv8x8", "cairo", "cairo_fast", "agg", "freetype"};
const int kNumContenders = 6;
const bool kHavePeer[] = {ZV_HAVE_CAIRO != 0, ZV_HAVE_CAIRO != 0, ZV_HAVE_AGG != 0,
                          ZV_HAVE_FREETYPE != 0};

std::string Key(int scene, const char* contender) {
  return std::string(kSceneNames[scene]) + "/" + contender;
}

void Register() {
  for (int scene = 0; scene < 5; ++scene) {
    auto add = [scene](const char* who, void (*f)(benchmark::State&, int, int), int arg) {
      benchmark::RegisterBenchmark(Key(scene, who).c_str(), f, scene, arg)
          ->Unit(benchmark::kMillisecond);
    };
    add("zv4x4", ZvFill, 4);
    add("zv8x8", ZvFill, 8);
#if ZV_HAVE_CAIRO
    add(
        "cairo", [](benchmark::State& st, int sc, int) { CairoFill(st, sc, false); }, 0);
    add(
        "cairo_fast", [](benchmark::State& st, int sc, int) { CairoFill(st, sc, false, true); }, 0);
#endif
#if ZV_HAVE_AGG
    add(
        "agg", [](benchmark::State& st, int sc, int) { AggFill(st, sc, false); }, 0);
#endif
#if ZV_HAVE_FREETYPE
    add(
        "freetype", [](benchmark::State& st, int sc, int) { FreeTypeFill(st, sc); }, 0);
#endif
  }
  benchmark::RegisterBenchmark("stroke/zv", ZvStroke)->Unit(benchmark::kMillisecond);
#if ZV_HAVE_CAIRO
  benchmark::RegisterBenchmark("stroke/cairo", [](benchmark::State& st) {
    CairoFill(st, 3, true);
  })->Unit(benchmark::kMillisecond);
#endif
#if ZV_HAVE_AGG
  benchmark::RegisterBenchmark("stroke/agg", [](benchmark::State& st) {
    AggFill(st, 3, true);
  })->Unit(benchmark::kMillisecond);
#endif
}

void PrintSummary(const ZvMedianReporter& reporter) {
  auto ms = [&](const std::string& key) { return reporter.MedianSeconds(key) * 1e3; };
  std::printf(
      "\nMedian CPU ms per fill at %dx%d (e_circles256: 256x256); ratio: time / fastest peer's.\n"
      "Targets: zv 4x4 at most 0.6, zv 8x8 at most 0.9.\n\n",
      1024, 1024);
  std::printf("%-13s %8s %8s %8s %10s %8s %8s %9s %9s %8s %8s\n", "scene", "zv4x4", "zv8x8",
              "cairo", "cairo_fast", "agg", "freetype", "4x4/best", "8x8/best", "ft strip", "mad8");
  for (int scene = 0; scene < 5; ++scene) {
    double t[kNumContenders];
    double best = 0.0;
    for (int c = 0; c < kNumContenders; ++c) {
      t[c] = ms(Key(scene, kContenders[c]));
      if (c >= 2 && t[c] > 0.0 && (best == 0.0 || t[c] < best)) best = t[c];
    }
    if (t[0] == 0.0 && t[1] == 0.0) continue;  // filtered out
    std::printf("%-13s", kSceneNames[scene]);
    for (int c = 0; c < kNumContenders; ++c) {
      const int width = c == 3 ? 10 : 8;
      if (c >= 2 && !kHavePeer[c - 2])
        std::printf(" %*s", width, "-");
      else
        std::printf(" %*.3f", width, t[c]);
    }
    if (best > 0.0)
      std::printf(" %8.2f%s %8.2f%s", t[0] / best, t[0] <= 0.6 * best ? " " : "!", t[1] / best,
                  t[1] <= 0.9 * best ? " " : "!");
    else
      std::printf(" %9s %9s", "-", "-");
#if ZV_HAVE_FREETYPE
    std::printf(" %8.0f %8.3f", reporter.Counter(Key(scene, "freetype"), "strip"),
                MeanDifference(scene, 8));
#endif
    std::printf("\n");
  }
  const double zv = ms("stroke/zv"), cairo = ms("stroke/cairo"), agg = ms("stroke/agg");
  if (zv > 0.0) {
    std::printf(
        "\nd_scribble stroke, width 4, round joins and caps (zv aliased, peers antialiased)\n");
    std::printf("  zv %8.3f ms   cairo %8.3f ms (ratio %.2f)   agg %8.3f ms (ratio %.2f)\n", zv,
                cairo, cairo > 0.0 ? zv / cairo : 0.0, agg, agg > 0.0 ? zv / agg : 0.0);
  }
  std::printf(
      "\n'!' marks a ratio that misses its target. ft strip: columns per strip the\n"
      "outline renderer needed to finish; mad8: mean absolute difference (0..255) of zv\n"
      "8x8 from its exact-area coverage.\n");
}
}  // namespace

int main(int argc, char** argv) {
  for (int scene = 0; scene < 5; ++scene)
    GetScene(scene);  // built outside the timings
  Register();
  return ZvRunBenchmarks(argc, argv,
                         [&](const ZvMedianReporter& reporter) { PrintSummary(reporter); });
}
