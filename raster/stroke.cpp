// ZvPath2f::Stroke: the outline of the flattened path, filled under the non-zero winding rule.
#include "raster/stroke_outline.h"

#include <zv/polyline.h>

#include <memory>

template <class T>
int ZvPath2f::StrokeImp(const ZvGC& gc, ZvRaster<T>& raster) const {
  ZvPoint2dArray flat;
  ZvPointTagArray flatTags;
  const double tolerance = gc.flattenTolerance > 0.25 ? gc.flattenTolerance : 0.25;
  Lock();
  unsigned int subpaths;
  try {
    subpaths = TransformAndFlattenPath(gc.transform, tolerance, flat, flatTags);
  } catch (...) {
    Unlock();
    throw;
  }
  Unlock();
  if (subpaths == 0) return 0;
  ZvPoint2dArray points;
  ZvPointTagArray tags;
  ZvPoint2dArray_Filter(flat, flatTags, points, tags);
  ZvPath2f outline(1);
  ZvGC device(gc);
  device.transform = ZvTransfo4();
  device.fillRule = 1;
  {
    std::unique_ptr<double[]> weights(new double[points.size ? points.size : 1]);
    ZvStrokeWeights(points, tags, gc.taper, weights.get());
    ComputeStrokeOutline(device, points, tags, subpaths, weights.get(), outline);
  }
  return outline.Fill(device, raster, nullptr, nullptr);
}

int ZvPath2f::Stroke(const ZvGC& gc, ZvRaster<unsigned char>& raster) const {
  return StrokeImp(gc, raster);
}
int ZvPath2f::Stroke(const ZvGC& gc, ZvRaster<short>& raster) const {
  return StrokeImp(gc, raster);
}
int ZvPath2f::Stroke(const ZvGC& gc, ZvRaster<float>& raster) const {
  return StrokeImp(gc, raster);
}
