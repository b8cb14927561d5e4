// The tracer's memory follows the corners, not the raster: a 16384 x 16384 raster holding a few
// large shapes is traced with a peak of heap far below the raster's own size. A global
// allocator that keeps the live and the peak byte counts measures it.
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/vectorizer.h>

#include <gtest/gtest.h>

#include <malloc.h>

#include <cstdio>
#include <cstdlib>
#include <new>

namespace {
std::size_t g_live = 0;
std::size_t g_peak = 0;

void* Allocate(std::size_t n) {
  void* p = std::malloc(n ? n : 1);
  if (!p) throw std::bad_alloc();
  g_live += malloc_usable_size(p);
  if (g_live > g_peak) g_peak = g_live;
  return p;
}
void Release(void* p) {
  if (!p) return;
  g_live -= malloc_usable_size(p);
  std::free(p);
}
}  // namespace

// This file replaces the global allocator with malloc and free; g++ cannot see that the pair
// matches once the replacement is inlined.
#if defined(__GNUC__) && !defined(__clang__)
#pragma GCC diagnostic ignored "-Wmismatched-new-delete"
#endif

void* operator new(std::size_t n) {
  return Allocate(n);
}
void* operator new[](std::size_t n) {
  return Allocate(n);
}
void operator delete(void* p) noexcept {
  Release(p);
}
void operator delete[](void* p) noexcept {
  Release(p);
}
void operator delete(void* p, std::size_t) noexcept {
  Release(p);
}
void operator delete[](void* p, std::size_t) noexcept {
  Release(p);
}

namespace {
void Circle(ZvPath2f& path, float cx, float cy, float r) {
  const float k = 0.5522847f * r;
  path.Moveto({cx + r, cy});
  path.Curveto({cx + r, cy + k}, {cx + k, cy + r}, {cx, cy + r});
  path.Curveto({cx - k, cy + r}, {cx - r, cy + k}, {cx - r, cy});
  path.Curveto({cx - r, cy - k}, {cx - k, cy - r}, {cx, cy - r});
  path.Curveto({cx + k, cy - r}, {cx + r, cy - k}, {cx + r, cy});
  path.Closeto();
}
}  // namespace

TEST(VectorizeMemory, PeakHeapFollowsTheCornersNotTheRaster) {
  const int side = 16384;
  ZvRaster<unsigned char> raster(side, side, 0);
  // A disc, a ring (two circles under the even-odd rule), a rectangle and a triangle.
  ZvPath2f shapes;
  Circle(shapes, 4000, 4000, 3000);
  Circle(shapes, 12000, 5000, 3500);
  Circle(shapes, 12000, 5000, 2000);
  shapes.Moveto({1000, 9000});
  shapes.Lineto({7000, 9000});
  shapes.Lineto({7000, 15000});
  shapes.Lineto({1000, 15000});
  shapes.CloseSubpath(shapes.NumPoints() - 1);
  shapes.Moveto({9000, 15500});
  shapes.Lineto({15500, 15500});
  shapes.Lineto({12000, 9500});
  shapes.CloseSubpath(shapes.NumPoints() - 1);
  ZvGC gc;
  gc.fillRule = 0;
  shapes.Fill(gc, raster, nullptr, nullptr);

  ZvVectorizer v(0, 0);
  // The sweep alone, its corners going nowhere.
  struct Count {
    unsigned int corners = 0;
  } count;
  const ObCallbackTable table = {
      nullptr, nullptr, nullptr, [](int, int, void* u) { ++static_cast<Count*>(u)->corners; },
      nullptr, nullptr};
  const std::size_t beforeSweep = g_live;
  g_peak = g_live;
  v.Trace(raster, 255, raster.GetExtent2f(), table, &count);
  const std::size_t sweepPeak = g_peak - beforeSweep;
  EXPECT_GT(count.corners, 0u);

  ZvPath2f traced;
  const std::size_t before = g_live;
  g_peak = g_live;
  const unsigned int points = v.Vectorize(raster, 255, raster.GetExtent2f(), traced);
  const std::size_t tracePeak = g_peak - before;
  EXPECT_EQ(traced.NumSubpaths(), 5u);

  const double rasterBytes = static_cast<double>(side) * side;
  std::printf(
      "16384^2 raster, %u traced points; peak heap of the sweep alone %.0f KiB "
      "(%.4f%% of the raster), of Vectorize %.0f KiB (%.4f%%)\n",
      points, sweepPeak / 1024.0, 100.0 * sweepPeak / rasterBytes, tracePeak / 1024.0,
      100.0 * tracePeak / rasterBytes);
  // The sweep holds three rows of runs and the corners; Vectorize adds the path of the traced
  // points. Both stay far below one percent of the raster.
  EXPECT_LT(sweepPeak, rasterBytes / 100);
  EXPECT_LT(tracePeak, rasterBytes / 100);
}
