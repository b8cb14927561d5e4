#include "render.h"

#include <zv/gc.h>
#include <zv/transfo4.h>

#include <algorithm>
#include <vector>

namespace {
// A copy of the path with each open subpath closed by a line back to its start.
ZvPath2f ClosedCopy(const ZvPath2f& path) {
  ZvPath2f closed(path);
  std::vector<unsigned int> lasts;
  ZvPath2fIter it(closed);
  unsigned int first = 0, last = 0;
  while (it.GetNextSubPathIndices(first, last))
    if (last > first && !closed.IsSubpathClosed(first)) lasts.push_back(last);
  // From the end, so that the indices still to come do not move.
  for (auto i = lasts.rbegin(); i != lasts.rend(); ++i)
    closed.CloseSubpath(*i);
  return closed;
}

// The fills' own flattening goes no finer than this many pixels.
constexpr double kFillTolerance = 0.25;

// The path mapped by `transform` and flattened at `tolerance` into a polygon per subpath.
ZvPath2f FlattenedCopy(const ZvPath2f& path, const ZvTransfo4& transform, double tolerance) {
  ZvPoint2dArray points;
  ZvPointTagArray tags;
  path.TransformAndFlattenPath(transform, tolerance, points, tags);
  ZvPath2f polygon;
  for (unsigned int i = 0; i < points.size; ++i) {
    const ZvPoint2<float> p{static_cast<float>(points[i].x), static_cast<float>(points[i].y)};
    if (tags[i] == ZvPointTag_First)
      polygon.Moveto(p);
    else
      polygon.Lineto(p);
    if (tags[i] == ZvPointTag_Last) polygon.CloseSubpath(polygon.NumPoints() - 1);
  }
  return polygon;
}

void KeepMaximum(ZvRaster<unsigned char>& into, const ZvRaster<unsigned char>& layer) {
  unsigned char* dst = into.GetRaster();
  const unsigned char* src = layer.GetRaster();
  for (int i = 0; i < into.GetSize(); ++i)
    dst[i] = std::max(dst[i], src[i]);
}
}  // namespace

void ZvRenderPath(const ZvPath2f& path, const ZvRenderOptions& options,
                  ZvRaster<unsigned char>& raster) {
  ZvGC gc;
  gc.transform.Translate(options.translateX, options.translateY, 0.0);
  gc.transform.Scale(options.scale, options.scale, 1.0);
  gc.fillRule = options.fillRule;
  gc.samplingRate = options.rate;
  gc.featherRadius = options.feather;
  gc.opacity = options.opacity;
  gc.lineWidth = options.strokeWidth;
  gc.joinStyle = options.join;
  gc.capStyle = options.cap;
  gc.miterLimit = options.miterLimit;
  gc.taper = options.taper ? 1 : 0;
  gc.flattenTolerance = 0.25;
  ZvRaster<unsigned char> layer(raster.GetWidth(), raster.GetHeight(), 0);
  if (options.fill) {
    gc.featherInner = options.soft;
    // Below the fills' own flattening the tool flattens the path itself, in pixels.
    const bool fine = options.tolerance < kFillTolerance;
    ZvGC device(gc);
    if (fine) device.transform = ZvTransfo4();
    const ZvPath2f closed =
        fine ? FlattenedCopy(ClosedCopy(path), gc.transform, options.tolerance) : ClosedCopy(path);
    if (options.soft > 0)
      closed.SoftFill(device, layer, nullptr);
    else
      closed.AAFill(device, layer, nullptr, nullptr);
    KeepMaximum(raster, layer);
  }
  if (options.strokeWidth > 0) {
    layer.MemsetBuffer(0);
    path.Stroke(gc, layer);
    KeepMaximum(raster, layer);
  }
}
