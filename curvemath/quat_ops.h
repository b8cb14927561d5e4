// Inline quaternion arithmetic shared by the conversions and the spline: sums, scaling, the
// inverse, and the exponential and logarithm of pure quaternions (rotations in log space).
#ifndef ZV_CURVEMATH_QUAT_OPS_H
#define ZV_CURVEMATH_QUAT_OPS_H

#include <zv/quat.h>

#include <cmath>

inline ZvQuat QuatScaled(const ZvQuat& q, double s) {
  return ZvQuat(q.w * s, q.x * s, q.y * s, q.z * s);
}
inline ZvQuat QuatSum(const ZvQuat& a, const ZvQuat& b) {
  return ZvQuat(a.w + b.w, a.x + b.x, a.y + b.y, a.z + b.z);
}
inline double QuatDot(const ZvQuat& a, const ZvQuat& b) {
  return a.w * b.w + a.x * b.x + a.y * b.y + a.z * b.z;
}
// The true inverse, so that it also undoes the slightly off-unit results of the spline.
inline ZvQuat QuatInverse(const ZvQuat& q) {
  const double n = QuatDot(q, q);
  return ZvQuat(q.w / n, -q.x / n, -q.y / n, -q.z / n);
}

// exp of the pure quaternion (0, v). Below a squared length of 1e-9 the angle counts as 0 and
// the first-order form (1, v) is used; the caller's normalisation absorbs the difference.
inline ZvQuat QuatExp(const ZvQuat& v) {
  const double l2 = v.x * v.x + v.y * v.y + v.z * v.z;
  const double theta = l2 < 1e-9 ? 0.0 : std::sqrt(l2);
  const double c = std::cos(theta), s = std::sin(theta);
  if (std::fabs(s) >= 1e-12) {
    const double k = s / theta;
    return ZvQuat(c, v.x * k, v.y * k, v.z * k);
  }
  return ZvQuat(c, v.x, v.y, v.z);
}

// log of a unit quaternion as the pure quaternion (0, axis * half angle). At |w| >= 1 (no
// rotation, or rounding past it) the vector is kept as it is.
inline ZvQuat QuatLog(const ZvQuat& q) {
  ZvQuat r(0.0, q.x, q.y, q.z);
  if (std::fabs(q.w) < 1.0) {
    const double theta = std::acos(q.w);
    const double s = std::sin(theta);
    if (std::fabs(s) >= 1e-12) {
      const double k = theta / s;
      r.x *= k;
      r.y *= k;
      r.z *= k;
    }
  }
  return r;
}

// Adds `spins` half-angle turns of pi along the direction of the pure quaternion m: the end of
// the segment stays the same rotation while the path between turns that much further. A null m
// has no direction and takes no spins.
inline void QuatAddSpins(ZvQuat& m, int spins) {
  if (spins == 0) return;
  ZvQuat axis(0.0, m.x, m.y, m.z);
  axis.Normalize();
  const double k = spins * 3.141592653589793;
  m.x += k * axis.x;
  m.y += k * axis.y;
  m.z += k * axis.z;
}

#endif
