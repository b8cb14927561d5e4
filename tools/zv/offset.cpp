#include "offset.h"

#include <cmath>

namespace {
// Appends the points of `polyline` to `into` as a subpath of lines, closed where it returns to
// its start.
void AppendPolyline(const ZvPath2f& polyline, ZvPath2f& into) {
  into.Moveto(polyline.GetPoint(0));
  for (unsigned int i = 1; i < polyline.NumPoints(); ++i)
    into.Lineto(polyline.GetPoint(i));
  into.Closeto();  // only takes where the ends meet
}
}  // namespace

ZvPath2f ZvParallelPolylines(const ZvPath2f& path, double distance, double tolerance) {
  ZvPath2f out;
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  while (it.GetNextSubPathIndices(first, last)) {
    ZvPoint2fArray points(64);
    ZvPointTagArray tags(64);
    // A subpath alone, so that each polyline offsets by itself.
    const ZvPath2f subpath(path, first, last);
    subpath.AltFlatten(tolerance, points, tags);
    if (points.size < 2) continue;
    ZvPath2f polyline;
    polyline.Moveto(points[0]);
    for (unsigned int i = 1; i < points.size; ++i)
      polyline.Lineto(points[i]);
    for (int reverse = 0; reverse < 2; ++reverse) {
      ZvPath2f side(polyline);
      if (polyline.GetSimilarPath(static_cast<float>(distance), reverse, side))
        AppendPolyline(side, out);
    }
  }
  return out;
}

void ZvRenderParallelPolylines(const ZvPath2f& path, const ZvRenderOptions& options,
                               double distance, ZvRaster<unsigned char>& raster) {
  ZvRenderOptions strokes = options;
  strokes.fill = false;
  strokes.strokeWidth = 1.0;
  strokes.join = 2;  // round: the polylines' corners are not mitred either
  strokes.cap = 0;
  // A quarter pixel on the raster, in path units.
  const double tolerance = 0.25 / (options.scale != 0.0 ? std::fabs(options.scale) : 1.0);
  ZvRenderPath(ZvParallelPolylines(path, distance, tolerance), strokes, raster);
}
