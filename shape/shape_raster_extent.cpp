// ZvShape2f::IsRasterExtentIntersecting: the quick test of a shape's extent against a raster's.
#include <zv/gc.h>
#include <zv/shape.h>

#include "shape/shape_lock.h"

int ZvShape2f::IsRasterExtentIntersecting(const ZvGC& gc, const ZvExtent2<float>& extent) const {
  ZvShapeLock guard(*this);
  ZvExtent2<float> own;
  GetExtent(own);
  const ZvExtent2<float> mapped = gc.transform.Map(own);
  if (mapped.kind == ZvExtent2<float>::Empty) return 0;
  if (mapped.kind == ZvExtent2<float>::Regular && extent.kind == ZvExtent2<float>::Regular) {
    // Touching counts as overlapping.
    return mapped.xmax >= extent.xmin && mapped.xmin <= extent.xmax && mapped.ymax >= extent.ymin &&
                   mapped.ymin <= extent.ymax
               ? 1
               : 0;
  }
  if (extent.kind == ZvExtent2<float>::Infinite) return 1;
  if (mapped.kind == ZvExtent2<float>::Infinite) return extent.kind != ZvExtent2<float>::Empty;
  return 0;
}
