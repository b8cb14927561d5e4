// Private vector helpers shared by every family of the library.
#ifndef ZV_CORE_VEC_H
#define ZV_CORE_VEC_H

#include <zv/point.h>

#include <cmath>

// The library-wide guarded length: a vector whose squared length is at most 1e-9 has length 0,
// so near-degenerate directions never produce huge normalised vectors.
inline double zvGuardedLength2(double dx, double dy) {
  const double l2 = dx * dx + dy * dy;
  return l2 <= 1e-9 ? 0.0 : std::sqrt(l2);
}

inline double zvGuardedLength(const ZvPoint2<double>& v) {
  return zvGuardedLength2(v.x, v.y);
}

// A vector lying in the plane falls back to the 2-D guard; otherwise the 3-D squared length is
// guarded strictly below 1e-9.
inline double zvGuardedLength(const ZvPoint3<double>& v) {
  if (std::fabs(v.z) <= 1e-9) return zvGuardedLength2(v.x, v.y);
  const double l2 = std::fabs(v.x * v.x + v.y * v.y + v.z * v.z);
  return l2 < 1e-9 ? 0.0 : std::sqrt(l2);
}

#endif
