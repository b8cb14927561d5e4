// Antialiased fills and strokes of five scenes: AAFill at 4x4 and 8x8 against the peers'
// rasterisers (an A8 surface, a gray8 scanline renderer, an exact-area outline renderer), each
// filling the whole scene as one path under the non-zero rule into a cleared 8-bit raster.
// Run with --benchmark_repetitions=N --benchmark_report_aggregates_only=true to read medians.
// The outline renderer's cases also report "mad8": the mean absolute difference (0..255) of
// AAFill's 8x8 output from its exact-area coverage.
#include <zv/gc.h>
#include <zv/path2f.h>

#include <benchmark/benchmark.h>

#include <cmath>
#include <cstring>
#include <random>
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

void BM_ZvAAFill(benchmark::State& state) {
  const Scene& s = GetScene(static_cast<int>(state.range(0)));
  const ZvPath2f path = ToPath(s);
  ZvRaster<unsigned char> r(s.size, s.size, 0);
  for (auto _ : state) {
    ZvRender(path, static_cast<int>(state.range(1)), r);
    benchmark::ClobberMemory();
  }
  state.SetLabel(kSceneNames[state.range(0)]);
}

void BM_ZvStroke(benchmark::State& state) {
  const Scene& s = GetScene(3);
  ZvPath2f path = ToPath(s);
  path.OpenSubpath(0);
  ZvRaster<unsigned char> r(s.size, s.size, 0);
  for (auto _ : state) {
    r.MemsetBuffer(0);
    path.Stroke(Context(8), r);
    benchmark::ClobberMemory();
  }
  state.SetLabel("d_scribble stroke 4 round (aliased)");
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

void BM_CairoFill(benchmark::State& state) {
  const Scene& s = GetScene(static_cast<int>(state.range(0)));
  const bool stroke = state.range(1) != 0;
  cairo_surface_t* surface = cairo_image_surface_create(CAIRO_FORMAT_A8, s.size, s.size);
  cairo_t* cr = cairo_create(surface);
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
  state.SetLabel(stroke ? "d_scribble stroke 4 round" : kSceneNames[state.range(0)]);
}
#endif

#if ZV_HAVE_AGG
void BM_AggFill(benchmark::State& state) {
  const Scene& s = GetScene(static_cast<int>(state.range(0)));
  const bool stroke = state.range(1) != 0;
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
  state.SetLabel(stroke ? "d_scribble stroke 4 round" : kSceneNames[state.range(0)]);
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

// Answers the renderer's error, 0 on success (a very complex outline can overflow its pool).
int FtRender(FT_Library library, FtOutlines& o, std::vector<unsigned char>& pixels, int size) {
  std::memset(pixels.data(), 0, pixels.size());
  FT_Bitmap bitmap{};
  bitmap.rows = static_cast<unsigned int>(size);
  bitmap.width = static_cast<unsigned int>(size);
  bitmap.pitch = size;
  bitmap.buffer = pixels.data();
  bitmap.num_grays = 256;
  bitmap.pixel_mode = FT_PIXEL_MODE_GRAY;
  int error = 0;
  for (FtOutlines::Piece& p : o.pieces)
    if (const int e = FT_Outline_Get_Bitmap(library, &p.outline, &bitmap)) error = e;
  return error;
}

void BM_FreeTypeFill(benchmark::State& state) {
  const Scene& s = GetScene(static_cast<int>(state.range(0)));
  FT_Library library;
  FT_Init_FreeType(&library);
  FtOutlines o(s);
  std::vector<unsigned char> pixels(static_cast<std::size_t>(s.size) * s.size);
  int error = 0;
  for (auto _ : state) {
    error = FtRender(library, o, pixels, s.size);
    benchmark::ClobberMemory();
  }
  // Our 8x8 output against the exact area coverage.
  ZvRaster<unsigned char> ours(s.size, s.size, 0);
  ZvRender(ToPath(s), 8, ours);
  double sum = 0;
  for (std::size_t i = 0; i < pixels.size(); ++i)
    sum +=
        std::abs(static_cast<int>(pixels[i]) - static_cast<int>(ours.GetVal(static_cast<int>(i))));
  state.counters["mad8"] = sum / static_cast<double>(pixels.size());
  FT_Done_FreeType(library);
  state.counters["error"] = error;  // non-zero: the reference is incomplete
  state.SetLabel(kSceneNames[state.range(0)]);
}
#endif

void Scenes(benchmark::internal::Benchmark* b) {
  for (int scene = 0; scene < 5; ++scene)
    b->Args({scene, 0});
}
}  // namespace

BENCHMARK(BM_ZvAAFill)->ArgsProduct({{0, 1, 2, 3, 4}, {4, 8}})->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ZvStroke)->Unit(benchmark::kMillisecond);
#if ZV_HAVE_CAIRO
BENCHMARK(BM_CairoFill)->Apply(Scenes)->Args({3, 1})->Unit(benchmark::kMillisecond);
#endif
#if ZV_HAVE_AGG
BENCHMARK(BM_AggFill)->Apply(Scenes)->Args({3, 1})->Unit(benchmark::kMillisecond);
#endif
#if ZV_HAVE_FREETYPE
BENCHMARK(BM_FreeTypeFill)->Apply(Scenes)->Unit(benchmark::kMillisecond);
#endif

BENCHMARK_MAIN();
