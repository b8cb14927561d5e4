// ZvOval2f's outline path of four cubics and the slots that work on it.
#include <zv/oval2f.h>

#include "shape/frame_shape.h"

namespace {
using Shared = ZvFrameShape<ZvOval2f>;
}  // namespace

ZvPath2f::ZvPath2f(const ZvOval2f& oval) : ZvPath2f(16) {
  SetToOvalOutline(oval);
}

void ZvOval2f::SetupPathRep(ZvPath2f& path) const {
  // The same outline as the path built from the oval; GetPoints reads the handles in one lock.
  path.SetToOvalOutline(*this);
}

int ZvOval2f::IsIntersectingExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                   int noQuickReject) const {
  return Shared::OnOutline(*this, [&](const ZvPath2f& path) {
    return path.IsIntersectingExtent(gc, extent, noQuickReject);
  });
}
int ZvOval2f::IsInteriorIntersectingExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                           int noQuickReject) const {
  return Shared::OnOutline(*this, [&](const ZvPath2f& path) {
    return path.IsInteriorIntersectingExtent(gc, extent, noQuickReject);
  });
}

unsigned int ZvOval2f::IntersectSamplePointsExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                                   ZvPoint2fArray& points, ZvPointTagArray& tags,
                                                   int noQuickReject) const {
  return Shared::OnOutline(*this, [&](const ZvPath2f& path) {
    return path.IntersectSamplePointsExtent(gc, extent, points, tags, noQuickReject);
  });
}
unsigned int ZvOval2f::Flatten(const ZvGC& gc, ZvPoint2fArray& points,
                               ZvPointTagArray& tags) const {
  return Shared::OnOutline(*this,
                           [&](const ZvPath2f& path) { return path.Flatten(gc, points, tags); });
}
unsigned int ZvOval2f::Sample(const ZvGC& gc, ZvPoint2fArray& points, ZvPointTagArray& tags) const {
  return Shared::OnOutline(*this,
                           [&](const ZvPath2f& path) { return path.Sample(gc, points, tags); });
}
int ZvOval2f::AAFill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*callback)(),
                     const IntBbox2l* box) const {
  return Shared::OnOutline(
      *this, [&](const ZvPath2f& path) { return path.AAFill(gc, raster, callback, box); });
}
int ZvOval2f::AAFill(const ZvGC& gc, ZvRaster<float>& raster, int (*callback)(),
                     const IntBbox2l* box) const {
  return Shared::OnOutline(
      *this, [&](const ZvPath2f& path) { return path.AAFill(gc, raster, callback, box); });
}
int ZvOval2f::AAFill(const ZvGC& gc, ZvRaster<short>& raster, int (*callback)(),
                     const IntBbox2l* box) const {
  return Shared::OnOutline(
      *this, [&](const ZvPath2f& path) { return path.AAFill(gc, raster, callback, box); });
}
int ZvOval2f::Stroke(const ZvGC& gc, ZvRaster<unsigned char>& raster) const {
  return Shared::OnOutline(*this, [&](const ZvPath2f& path) { return path.Stroke(gc, raster); });
}

// The soft fill of this shape comes with the soft fill of paths' feathered outlines, later.
int ZvOval2f::SoftFill(const ZvGC&, ZvRaster<unsigned char>&, int (*)()) const {
  return 0;
}
int ZvOval2f::SoftFill(const ZvGC&, ZvRaster<float>&, int (*)()) const {
  return 0;
}
int ZvOval2f::SoftFill(const ZvGC&, ZvRaster<short>&, int (*)()) const {
  return 0;
}
