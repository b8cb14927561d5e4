// Guarded edge lengths shared by the polyline functions.
#ifndef ZV_CORE_POLYLINE_EDGE_H
#define ZV_CORE_POLYLINE_EDGE_H

#include <zv/point.h>

#include "core/vec.h"

// In double throughout; float coordinates are widened before they are subtracted, so that a
// table measured on float points is as exact as one measured on their double images.
inline double zvEdgeLength(const ZvPoint2<float>& p, const ZvPoint2<float>& q) {
  return zvGuardedLength2(double(q.x) - double(p.x), double(q.y) - double(p.y));
}
inline double zvEdgeLength(const ZvPoint2<double>& p, const ZvPoint2<double>& q) {
  return zvGuardedLength(q - p);
}
inline double zvEdgeLength(const ZvPoint3<double>& p, const ZvPoint3<double>& q) {
  return zvGuardedLength(q - p);
}

#endif
