// ZvPath2f::CalculateFillParameters: from a path to the pixel box and edge tables of a fill.
#include "raster/fill_context.h"
#include "raster/fill_scratch.h"

#include <zv/fill.h>
#include <zv/gc.h>
#include <zv/path2f.h>

#include <cmath>
#include <limits>

namespace {
// Floor or ceiling as a 32-bit integer, saturating (a NaN gives the low bound).
int ToInt(double v) {
  if (!(v > -2147483648.0)) return std::numeric_limits<int>::min();
  if (v >= 2147483647.0) return std::numeric_limits<int>::max();
  return static_cast<int>(v);
}

// Unlocks on every way out of the reading steps.
class ShapeLock {
 public:
  explicit ShapeLock(const ZvShape2f& shape) : shape(&shape) { shape.Lock(); }
  ~ShapeLock() { Release(); }
  void Release() {
    if (shape) shape->Unlock();
    shape = nullptr;
  }

 private:
  const ZvShape2f* shape;
};
}  // namespace

int ZvPath2f::CalculateFillParameters(const ZvGC& gc, int rasterWidth, int rasterHeight,
                                      double scale, CFillContext& ctx, int& xMin, int& yMin,
                                      int& xMax, int& yMax, int& numVertices,
                                      const IntBbox2l* box) const {
  ShapeLock lock(*this);
  ZvExtent2<float> extent;
  GetExtent(extent);
  if (extent.kind == ZvExtent2<float>::Empty) return 0;
  const ZvExtent2<float> mapped = gc.transform.Map(extent);
  if (mapped.kind == ZvExtent2<float>::Empty) return 0;
  xMin = ToInt(std::floor(mapped.xmin));
  yMin = ToInt(std::floor(mapped.ymin));
  xMax = ToInt(std::ceil(mapped.xmax));
  yMax = ToInt(std::ceil(mapped.ymax));
  bool clipped = false;
  if (xMin < 0) xMin = 0, clipped = true;
  if (yMin < 0) yMin = 0, clipped = true;
  if (xMax > rasterWidth) xMax = rasterWidth, clipped = true;
  if (yMax > rasterHeight) yMax = rasterHeight, clipped = true;
  if (box) {
    // The box's far bounds become the sweep's exclusive bounds: its last column and row stay
    // unpainted, as hosts of this library have always seen it.
    if (xMin < box->x) xMin = box->x;
    if (yMin < box->y) yMin = box->y;
    const long long right = static_cast<long long>(box->x) + box->width - 1;
    const long long bottom = static_cast<long long>(box->y) + box->height - 1;
    // A box ending before the pixel box empties it (compared in 64 bits: an empty box at the
    // lowest origin ends below the int range).
    if (xMax > right) xMax = right < xMin ? xMin : static_cast<int>(right);
    if (yMax > bottom) yMax = bottom < yMin ? yMin : static_cast<int>(bottom);
  }
  if (xMin >= xMax || yMin >= yMax) return 0;
  const double tolerance = gc.flattenTolerance > 0.25 ? gc.flattenTolerance : 0.25;
  ZvScratchPolygon polygon;
  ZvPoint2dArray& points = polygon.points;
  ZvPointTagArray& tags = polygon.tags;
  unsigned int subpaths;
  if (clipped) {
    const ZvExtent2<double> clip(xMin, yMin, xMax, yMax);
    subpaths = TransformFlattenAndClipClosedSubPaths(gc.transform, tolerance, clip, points, tags);
  } else {
    subpaths = TransformAndFlattenClosedSubPaths(gc.transform, tolerance, points, tags);
  }
  lock.Release();
  if (subpaths == 0) return 0;
  numVertices = ctx.BuildTables(points, tags, scale);
  return numVertices > 0;
}
