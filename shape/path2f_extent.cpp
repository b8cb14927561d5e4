// Control-point extents of ZvPath2f.
#include <zv/path2f.h>

#include "shape/shape_lock.h"

namespace {

// Starts Empty with zeros; the first point makes it Regular, then per axis a value below the
// minimum replaces it, else one above the maximum replaces that.
template <class T>
ZvExtent2<T>& ControlPointExtent(const ZvPoint2fArray& points, ZvExtent2<T>& extent) {
  extent = ZvExtent2<T>();
  for (unsigned int i = 0; i < points.size; ++i)
    extent.AddPoint(ZvPoint2<T>{static_cast<T>(points[i].x), static_cast<T>(points[i].y)});
  return extent;
}

}  // namespace

ZvExtent2<float>& ZvPath2f::GetExtent(ZvExtent2<float>& extent) const {
  ZvShapeLock guard(*this);
  return ControlPointExtent(points, extent);
}

ZvExtent2<double>& ZvPath2f::GetExtent(ZvExtent2<double>& extent) const {
  ZvShapeLock guard(*this);
  return ControlPointExtent(points, extent);
}
