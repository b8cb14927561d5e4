// ZvRect2f's outline path and the slots that work on it.
#include <zv/rect2f.h>

#include "shape/frame_shape.h"
#include "shape/shape_lock.h"

namespace {
using Shared = ZvFrameShape<ZvRect2f>;
}  // namespace

ZvPath2f::ZvPath2f(const ZvRect2f& rect) : ZvPath2f(8) {
  SetToRectOutline(rect);
}

void ZvRect2f::SetupPathRep(ZvPath2f& path) const {
  const ZvFrame2f f = Shared::Get(*this);
  ZvShapeLock guard(path);
  path.Moveto(f.a);
  path.Lineto(f.b);
  path.Lineto(f.D());
  path.Lineto(f.c);
  path.Lineto(f.a);
  path.Closeto();
}

unsigned int ZvRect2f::IntersectSamplePointsExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                                   ZvPoint2fArray& points, ZvPointTagArray& tags,
                                                   int noQuickReject) const {
  return Shared::OnOutline(*this, [&](const ZvPath2f& path) {
    return path.IntersectSamplePointsExtent(gc, extent, points, tags, noQuickReject);
  });
}
unsigned int ZvRect2f::Flatten(const ZvGC& gc, ZvPoint2fArray& points,
                               ZvPointTagArray& tags) const {
  return Shared::OnOutline(*this,
                           [&](const ZvPath2f& path) { return path.Flatten(gc, points, tags); });
}
unsigned int ZvRect2f::Sample(const ZvGC& gc, ZvPoint2fArray& points, ZvPointTagArray& tags) const {
  return Shared::OnOutline(*this,
                           [&](const ZvPath2f& path) { return path.Sample(gc, points, tags); });
}
int ZvRect2f::AAFill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*callback)(),
                     const IntBbox2l* box) const {
  return Shared::OnOutline(
      *this, [&](const ZvPath2f& path) { return path.AAFill(gc, raster, callback, box); });
}
int ZvRect2f::AAFill(const ZvGC& gc, ZvRaster<float>& raster, int (*callback)(),
                     const IntBbox2l* box) const {
  return Shared::OnOutline(
      *this, [&](const ZvPath2f& path) { return path.AAFill(gc, raster, callback, box); });
}
int ZvRect2f::AAFill(const ZvGC& gc, ZvRaster<short>& raster, int (*callback)(),
                     const IntBbox2l* box) const {
  return Shared::OnOutline(
      *this, [&](const ZvPath2f& path) { return path.AAFill(gc, raster, callback, box); });
}
int ZvRect2f::Stroke(const ZvGC& gc, ZvRaster<unsigned char>& raster) const {
  return Shared::OnOutline(*this, [&](const ZvPath2f& path) { return path.Stroke(gc, raster); });
}

// The soft fill of this shape comes with the soft fill of paths' feathered outlines, later.
int ZvRect2f::SoftFill(const ZvGC&, ZvRaster<unsigned char>&, int (*)()) const {
  return 0;
}
int ZvRect2f::SoftFill(const ZvGC&, ZvRaster<float>&, int (*)()) const {
  return 0;
}
int ZvRect2f::SoftFill(const ZvGC&, ZvRaster<short>&, int (*)()) const {
  return 0;
}
