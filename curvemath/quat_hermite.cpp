// Hermite interpolation of rotations in log space, with precomputed or raw tangents.
#include <zv/quat.h>

#include "curvemath/quat_ops.h"

ZvQuat PreComputedHermite(const ZvQuat& q0, const ZvQuat& a, const ZvQuat& m, const ZvQuat& b,
                          double u) {
  // Cumulative basis: each factor rotates by its share of the way, so that the three factors
  // together reach the end exactly at u = 1.
  const double v = 1.0 - u;
  const double b1 = 1.0 - v * v * v;
  const double b2 = u * u * (3.0 - 2.0 * u);
  const double b3 = u * u * u;
  return q0 * QuatExp(QuatScaled(a, b1)) * QuatExp(QuatScaled(m, b2)) * QuatExp(QuatScaled(b, b3));
}

ZvQuat Hermite(const ZvQuat& q0, const ZvQuat& q1, const ZvQuat& a, const ZvQuat& b, double u,
               int spins) {
  const ZvQuat a3 = QuatScaled(a, 0.3333333333333333);
  const ZvQuat b3 = QuatScaled(b, 0.3333333333333333);
  ZvQuat m =
      QuatLog(QuatExp(QuatScaled(a3, -1.0)) * QuatInverse(q0) * q1 * QuatExp(QuatScaled(b3, -1.0)));
  QuatAddSpins(m, spins);
  return PreComputedHermite(q0, a3, m, b3, u);
}
