// Hit tests of ZvPath2f against an extent: the outline, the filled inside, and samples.
//
// Each starts with the cheap test of the mapped control-point extent, so that a pick far from
// a path flattens nothing; the int argument skips that test when the caller has made it.
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/raster.h>

#include "shape/path2f_measure.h"
#include "shape/path_codes.h"
#include "shape/shape_lock.h"

int ZvPath2f::IsIntersectingExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                   int noQuickReject) const {
  ZvShapeLock guard(*this);
  if (!noQuickReject && !IsRasterExtentIntersecting(gc, extent)) return 0;
  if (extent.kind == ZvExtent2<float>::Empty) return 0;
  const bool infinite = extent.kind == ZvExtent2<float>::Infinite;
  for (unsigned int i = 0; i < points.size; ++i) {
    if (!zv_path::IsNode(codes[i])) continue;
    const ZvPoint2<float> q = gc.transform.Map(points[i]);
    if (infinite ||
        (q.x >= extent.xmin && q.x <= extent.xmax && q.y >= extent.ymin && q.y <= extent.ymax))
      return 1;
  }
  ZvPoint2fArray flat(64);
  ZvPointTagArray tags(64);
  Flatten(gc, flat, tags);
  for (unsigned int i = 0; i + 1 < flat.size; ++i) {
    if (tags[i] == ZvPointTag_Last) continue;
    if (extent.IsIntersecting(flat[i], flat[i + 1])) return 1;
  }
  return 0;
}

int ZvPath2f::IsInteriorIntersectingExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                           int noQuickReject) const {
  ZvShapeLock guard(*this);
  if (!noQuickReject && !IsRasterExtentIntersecting(gc, extent)) return 0;
  if (IsIntersectingExtent(gc, extent, 1)) return 1;
  if (extent.kind != ZvExtent2<float>::Regular) return 0;
  // The outline misses the extent, so the extent lies wholly inside or wholly outside: one
  // pixel at its corner tells which.
  ZvGC shifted(gc);
  ZvTransfo4 toCorner;
  toCorner.Translate(-double(extent.xmin), -double(extent.ymin), 0.0);
  shifted.transform.PreMultiply(toCorner);
  ZvRaster<unsigned char> pixel(1, 1, 0);
  Fill(shifted, pixel, nullptr, nullptr);
  return pixel.GetVal(0) > 254 ? 1 : 0;
}

unsigned int ZvPath2f::IntersectSamplePointsExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                                   ZvPoint2fArray& out, ZvPointTagArray& tags,
                                                   int noQuickReject) const {
  ZvShapeLock guard(*this);
  if (!noQuickReject && !IsRasterExtentIntersecting(gc, extent)) return 0;
  if (extent.kind == ZvExtent2<float>::Empty) return 0;
  const bool infinite = extent.kind == ZvExtent2<float>::Infinite;
  ZvPoint2fArray samples(64);
  ZvPointTagArray sampleTags(64);
  Sample(gc, samples, sampleTags);
  const unsigned int before = out.size;
  for (unsigned int i = 0; i < samples.size; ++i) {
    const ZvPoint2<float>& q = samples[i];
    if (infinite ||
        (q.x >= extent.xmin && q.x <= extent.xmax && q.y >= extent.ymin && q.y <= extent.ymax)) {
      out.Add(q);
      tags.Add(sampleTags[i]);
    }
  }
  return out.size - before;
}
