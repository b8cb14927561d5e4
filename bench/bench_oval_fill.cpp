// Plain (aliased) fills of 400 random ovals on a 1024 x 1024 8-bit raster, half of them axis-
// aligned and half rotated: the direct oval conversion (ZvOval2f::Fill) against zv's polygon
// fill of the same ovals as paths (each its own path, as a host holding 400 shapes fills them,
// and all in one path), an 8-bit gray scanline renderer with binary scanlines and an A8 surface
// with antialiasing off. Every contender draws the same outlines (the four cubics of
// ZvPath2f(oval)) into a cleared raster per iteration; the peers get the whole scene in one
// path, which is their fastest way.
//
// Run with --benchmark_repetitions=5 (or more, odd, on a shared machine): the summary gives the
// median CPU time of each, its ratio to the direct conversion, and how many pixels the direct
// conversion paints differently from the path fill (rows at the outline may differ: the direct
// conversion snaps the centre of an axis-aligned oval to a pixel corner).
#include <zv/gc.h>
#include <zv/oval2f.h>
#include <zv/path2f.h>

#include <benchmark/benchmark.h>

#include "median_reporter.h"

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
#include <agg_path_storage.h>
#include <agg_pixfmt_gray.h>
#include <agg_rasterizer_scanline_aa.h>
#include <agg_renderer_base.h>
#include <agg_renderer_scanline.h>
#include <agg_scanline_bin.h>
#endif

namespace {
const int kSize = 1024;

const std::vector<ZvOval2f>& Ovals() {
  static const std::vector<ZvOval2f> ovals = [] {
    std::vector<ZvOval2f> v;
    std::mt19937 rng(22);
    std::uniform_real_distribution<float> u(0.0f, 1.0f);
    for (int i = 0; i < 400; ++i) {
      const ZvPoint2<float> c{u(rng) * kSize, u(rng) * kSize};
      ZvOval2f o(c, 10 + 110 * u(rng), 10 + 110 * u(rng));
      if (i % 2) o.Rotate(360.0 * u(rng), c);
      v.push_back(o);
    }
    return v;
  }();
  return ovals;
}

const std::vector<ZvPath2f>& Paths() {
  static const std::vector<ZvPath2f> paths = [] {
    std::vector<ZvPath2f> v;
    for (const ZvOval2f& o : Ovals())
      v.emplace_back(o);
    return v;
  }();
  return paths;
}

const ZvPath2f& OnePath() {
  static const ZvPath2f path = [] {
    ZvPath2f all(400 * 13);
    for (const ZvOval2f& o : Ovals())
      o.SetupPathRep(all);
    return all;
  }();
  return path;
}

ZvGC Context() {
  ZvGC gc;
  gc.flattenTolerance = 0.25;
  gc.fillRule = 1;
  return gc;
}

void Direct(benchmark::State& state) {
  const ZvGC gc = Context();
  ZvRaster<unsigned char> r(kSize, kSize, 0);
  for (auto _ : state) {
    r.MemsetBuffer(0);
    for (const ZvOval2f& o : Ovals())
      o.Fill(gc, r, nullptr, nullptr);
    benchmark::ClobberMemory();
  }
}

void PathEach(benchmark::State& state) {
  const ZvGC gc = Context();
  ZvRaster<unsigned char> r(kSize, kSize, 0);
  for (auto _ : state) {
    r.MemsetBuffer(0);
    for (const ZvPath2f& p : Paths())
      p.Fill(gc, r, nullptr, nullptr);
    benchmark::ClobberMemory();
  }
}

void PathOne(benchmark::State& state) {
  const ZvGC gc = Context();
  ZvRaster<unsigned char> r(kSize, kSize, 0);
  for (auto _ : state) {
    r.MemsetBuffer(0);
    OnePath().Fill(gc, r, nullptr, nullptr);
    benchmark::ClobberMemory();
  }
}

// The cubics of every oval's outline, for the peers.
template <class Move, class Cubic>
void Outlines(Move move, Cubic cubic) {
  for (const ZvPath2f& p : Paths()) {
    move(p.GetPoint(0));
    for (unsigned int i = 1; i + 2 < p.NumPoints(); i += 3)
      cubic(p.GetPoint(i), p.GetPoint(i + 1), p.GetPoint(i + 2));
  }
}

#if ZV_HAVE_AGG
void Agg(benchmark::State& state) {
  std::vector<unsigned char> pixels(static_cast<std::size_t>(kSize) * kSize);
  agg::rendering_buffer buffer(pixels.data(), kSize, kSize, kSize);
  agg::pixfmt_gray8 format(buffer);
  agg::renderer_base<agg::pixfmt_gray8> base(format);
  agg::rasterizer_scanline_aa<> ras;
  agg::scanline_bin sl;
  agg::path_storage path;
  Outlines(
      [&](const ZvPoint2<float>& p) {
        path.close_polygon();
        path.move_to(p.x, p.y);
      },
      [&](const ZvPoint2<float>& a, const ZvPoint2<float>& b, const ZvPoint2<float>& c) {
        path.curve4(a.x, a.y, b.x, b.y, c.x, c.y);
      });
  path.close_polygon();
  agg::conv_curve<agg::path_storage> curves(path);
  ras.filling_rule(agg::fill_non_zero);
  for (auto _ : state) {
    base.clear(agg::gray8(0));
    ras.reset();
    ras.add_path(curves);
    agg::render_scanlines_bin_solid(ras, sl, base, agg::gray8(255));
    benchmark::ClobberMemory();
  }
}
#endif

#if ZV_HAVE_CAIRO
void Cairo(benchmark::State& state) {
  cairo_surface_t* surface = cairo_image_surface_create(CAIRO_FORMAT_A8, kSize, kSize);
  cairo_t* cr = cairo_create(surface);
  cairo_set_antialias(cr, CAIRO_ANTIALIAS_NONE);
  cairo_set_fill_rule(cr, CAIRO_FILL_RULE_WINDING);
  Outlines(
      [&](const ZvPoint2<float>& p) {
        cairo_close_path(cr);
        cairo_move_to(cr, p.x, p.y);
      },
      [&](const ZvPoint2<float>& a, const ZvPoint2<float>& b, const ZvPoint2<float>& c) {
        cairo_curve_to(cr, a.x, a.y, b.x, b.y, c.x, c.y);
      });
  cairo_close_path(cr);
  cairo_path_t* path = cairo_copy_path(cr);
  cairo_new_path(cr);
  for (auto _ : state) {
    cairo_surface_flush(surface);
    std::memset(cairo_image_surface_get_data(surface), 0,
                static_cast<std::size_t>(cairo_image_surface_get_stride(surface)) * kSize);
    cairo_surface_mark_dirty(surface);
    cairo_append_path(cr, path);
    cairo_fill(cr);
    cairo_surface_flush(surface);
  }
  cairo_path_destroy(path);
  cairo_destroy(cr);
  cairo_surface_destroy(surface);
}
#endif

// Pixels painted by one of the two zv fills and not the other.
int Differences() {
  const ZvGC gc = Context();
  ZvRaster<unsigned char> direct(kSize, kSize, 0), path(kSize, kSize, 0);
  for (const ZvOval2f& o : Ovals())
    o.Fill(gc, direct, nullptr, nullptr);
  for (const ZvPath2f& p : Paths())
    p.Fill(gc, path, nullptr, nullptr);
  int n = 0;
  for (int i = 0; i < kSize * kSize; ++i)
    n += direct.GetVal(i) != path.GetVal(i);
  return n;
}

const char* const kNames[] = {"oval/direct", "oval/zv_path_each", "oval/zv_path_one", "oval/agg",
                              "oval/cairo"};
}  // namespace

int main(int argc, char** argv) {
  Paths();
  OnePath();
  benchmark::RegisterBenchmark(kNames[0], Direct)->Unit(benchmark::kMillisecond);
  benchmark::RegisterBenchmark(kNames[1], PathEach)->Unit(benchmark::kMillisecond);
  benchmark::RegisterBenchmark(kNames[2], PathOne)->Unit(benchmark::kMillisecond);
#if ZV_HAVE_AGG
  benchmark::RegisterBenchmark(kNames[3], Agg)->Unit(benchmark::kMillisecond);
#endif
#if ZV_HAVE_CAIRO
  benchmark::RegisterBenchmark(kNames[4], Cairo)->Unit(benchmark::kMillisecond);
#endif
  return ZvRunBenchmarks(argc, argv, [&](const ZvMedianReporter& reporter) {
    const double direct = reporter.MedianSeconds(kNames[0]) * 1e3;
    std::printf(
        "\nMedian CPU ms per scene (400 ovals, 1024x1024, aliased); ratio: time / direct.\n");
    std::printf("Targets: path fill at least 2 times the direct time, both peers above it.\n\n");
    std::printf("%-20s %10s %8s\n", "contender", "median ms", "ratio");
    for (const char* name : kNames) {
      const double ms = reporter.MedianSeconds(name) * 1e3;
      if (ms <= 0.0) continue;
      std::printf("%-20s %10.3f %8.2f\n", name, ms, direct > 0.0 ? ms / direct : 0.0);
    }
    std::printf("\npixels differing between the direct fill and the path fill: %d of %d\n",
                Differences(), kSize * kSize);
  });
}
