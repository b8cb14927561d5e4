// Step-count arithmetic shared by the cubic flatteners and the point locators.
//
// Both walk a cubic the same way: a fixed number of midpoint subdivisions chosen from the third
// difference, then forward differencing in 2^levels steps per piece. Keeping the arithmetic in
// one place is what makes a located parameter agree with the flattened polyline a user sees.
#ifndef ZV_CURVEMATH_CUBIC_STEPS_H
#define ZV_CURVEMATH_CUBIC_STEPS_H

#include <zv/point.h>

#include <cmath>
#include <cstdint>
#include <cstring>
#include <new>

#include "core/vec.h"

// The most points a flatten grows its output array to. 2^24 points resolve any curve a raster
// can show; a flatten asked for more (coordinates near the float range, a tolerance near 0)
// would otherwise take all the memory there is before failing. Past the cap a flatten fails
// the way an allocation does, before allocating.
constexpr unsigned int kZvMaxFlattenPoints = 1u << 24;

// Is q outside the range of four control coordinates grown by grow on both sides?
inline bool zvIsOutsideGrownRange(double c0, double c1, double c2, double c3, double q,
                                  double grow) {
  const double lo = std::fmin(std::fmin(c0, c1), std::fmin(c2, c3));
  const double hi = std::fmax(std::fmax(c0, c1), std::fmax(c2, c3));
  return q < lo - grow || q > hi + grow;
}

// Truncation to an unsigned 32-bit count. Out of range (a zero tolerance, an overflowing
// curve) the count means nothing; it saturates so that the conversion stays defined.
inline unsigned int zvTruncateToCount(double v) {
  if (v >= 0.0 && v < 4294967296.0) return static_cast<unsigned int>(v);
  return v >= 4294967296.0 ? 0xFFFFFFFFu : 0u;
}

// Number of significant bits of n, 0 for n = 0.
inline unsigned int zvBitLength(unsigned int n) {
  return n ? 32u - __builtin_clz(n) : 0u;
}

// floor(log8(n)): the number of base-8 digits of n minus one, 0 for n = 0. At most 10.
inline unsigned int zvSubdivisionDepth(unsigned int n) {
  return n ? (zvBitLength(n) - 1) / 3 : 0;
}

// The number of times a piece is halved by forward differencing, from its deviation e. Each
// level divides the second differences by four, hence base-4 digits. Beyond the 31-bit range
// the digits are counted on the double itself.
inline unsigned int zvForwardDifferencingLevels(double e, double factor) {
  if (!(e > 0.0)) return 0;
  double v = e * factor;
  if (v < 2147483647.0) {
    // Base-4 digits of m = trunc(v + 0.5): half its bit length, rounded up; m is 0 below 0.5.
    return v >= 0.5 ? (zvBitLength(static_cast<unsigned int>(v + 0.5)) + 1) / 2 : 0;
  }
  unsigned int levels = 0;
  if (!std::isinf(v)) {
    // An infinite v (zero tolerance) would never fall to 1; it gets no interior points.
    for (; v > 1.0; v *= 0.25)
      ++levels;
  }
  return levels;
}

// zvForwardDifferencingLevels(num / sqrt(l2), factor), for a plane piece whose deviation is
// num / chord with chord = sqrt(l2) > 0, mostly without the square root and the division that
// dominate the cost of a piece. With x = num * factor, the piece takes one more level at each
// v = x / chord reaching 4^j - 0.5, that is at each x^2 reaching (4^j - 0.5)^2 l2. For the
// usual levels 0 to 3, x^2 is compared with those bounds directly; a value within 1e-12 of a
// bound (the rounding of either route stays below 1e-15) or past the fourth goes the exact way.
inline unsigned int zvLevelsOfQuotient(double num, double l2, double factor) {
  const double x = num * factor;
  const double q = x * x;
  const double b0 = 0.25 * l2, b1 = 12.25 * l2, b2 = 240.25 * l2, b3 = 4032.25 * l2;
  const bool clear = num > 0.0 && factor > 0.0 && l2 < 1e280 && q < b3 * (1.0 - 1e-12) &&
                     std::fabs(q - b0) > 1e-12 * b0 && std::fabs(q - b1) > 1e-12 * b1 &&
                     std::fabs(q - b2) > 1e-12 * b2;
  if (clear) return (q >= b0) + (q >= b1) + (q >= b2);
  return zvForwardDifferencingLevels(num / std::sqrt(l2), factor);
}

// What differs between plane and space curves: how the third difference is measured, how the
// straying of the second differences from the chord becomes levels, and the search primitives
// of point location.
struct ZvCubicGeom2 {
  using Point = ZvPoint2<double>;

  static double ThirdDifferenceLength(const Point& d) { return zvGuardedLength(d); }

  // Levels from the distance of the second differences from the chord line, by the 2-D cross
  // product. False when the chord is null (guarded length 0). Rounded division by the same
  // chord is monotone, so the larger cross product alone decides.
  static bool ChordLevels(const Point& a1, const Point& a2, const Point& k, double factor,
                          unsigned int& levels) {
    const double l2 = k.x * k.x + k.y * k.y;
    if (l2 <= 1e-9) return false;
    const double c1 = std::fabs(a1.x * k.y - a1.y * k.x);
    const double c2 = std::fabs(a2.x * k.y - a2.y * k.x);
    levels = zvLevelsOfQuotient(c1 > c2 ? c1 : c2, l2, factor);
    return true;
  }

  static bool IsOutsideGrownControlBox(const Point* p, const Point& q, double grow) {
    return zvIsOutsideGrownRange(p[0].x, p[1].x, p[2].x, p[3].x, q.x, grow) ||
           zvIsOutsideGrownRange(p[0].y, p[1].y, p[2].y, p[3].y, q.y, grow);
  }

  static int FindClosestPointOnLineSegment(const Point& q, const Point& a, const Point& b,
                                           double maxDistance2, double& d2, double& t) {
    return ZvPoint2_FindClosestPointOnLineSegment<double>(q, a, b, maxDistance2, d2, t);
  }
};

struct ZvCubicGeom3 {
  using Point = ZvPoint3<double>;

  // Space curves measure the third difference without the length guard.
  static double ThirdDifferenceLength(const Point& d) { return std::sqrt(ZvDot(d, d)); }

  // Levels from the distance of each second difference from its projection on the chord.
  // False when the chord is null.
  static bool ChordLevels(const Point& a1, const Point& a2, const Point& k, double factor,
                          unsigned int& levels) {
    const double chord = zvGuardedLength(k);
    if (std::fabs(chord) <= 1e-15) return false;
    levels = zvForwardDifferencingLevels(Deviation(a1, a2, k, chord), factor);
    return true;
  }

  static double Deviation(const Point& a1, const Point& a2, const Point& k, double chord) {
    const double chord2 = chord * chord;
    const Point r1 = k * (ZvDot(a1, k) / chord2) - a1;
    const Point r2 = k * (ZvDot(a2, k) / chord2) - a2;
    const double l1 = ZvDot(r1, r1), l2 = ZvDot(r2, r2);
    return std::sqrt(l1 > l2 ? l1 : l2);  // sqrt is monotone: one root serves
  }

  static bool IsOutsideGrownControlBox(const Point* p, const Point& q, double grow) {
    return zvIsOutsideGrownRange(p[0].x, p[1].x, p[2].x, p[3].x, q.x, grow) ||
           zvIsOutsideGrownRange(p[0].y, p[1].y, p[2].y, p[3].y, q.y, grow) ||
           zvIsOutsideGrownRange(p[0].z, p[1].z, p[2].z, p[3].z, q.z, grow);
  }

  static int FindClosestPointOnLineSegment(const Point& q, const Point& a, const Point& b,
                                           double maxDistance2, double& d2, double& t) {
    return ZvPoint3_FindClosestPointOnLineSegment<double>(q, a, b, maxDistance2, d2, t);
  }
};

// Forward-differencing levels of one piece, before any cap; factor is 0.75 / tolerance.
template <class G>
inline unsigned int zvCubicLevels(const typename G::Point* p, double factor) {
  using Point = typename G::Point;
  const Point d0 = p[1] - p[0], d1 = p[2] - p[1], d2 = p[3] - p[2];
  unsigned int levels;
  if (G::ChordLevels(d1 - d0, d2 - d1, p[3] - p[0], factor, levels)) return levels;
  // Closed or nearly closed piece: the chord gives no direction, so the spread of the controls
  // around P0 stands in for the deviation.
  const double l1 = zvGuardedLength(d0);
  const double l2 = zvGuardedLength(p[2] - p[0]);
  return zvForwardDifferencingLevels(l1 > l2 ? l1 : l2, factor);
}

inline ZvPoint2<double> zvLdexp(const ZvPoint2<double>& v, int e) {
  return {std::ldexp(v.x, e), std::ldexp(v.y, e)};
}
inline ZvPoint3<double> zvLdexp(const ZvPoint3<double>& v, int e) {
  return {std::ldexp(v.x, e), std::ldexp(v.y, e), std::ldexp(v.z, e)};
}

// v * 2^e, rounded exactly as ldexp rounds it: while 2^e is a normal double the product is the
// same correctly rounded value, and it costs a multiplication instead of a library call.
template <class P>
inline P zvScaleByPowerOfTwo(const P& v, int e) {
  if (e < -1022 || e > 1023) return zvLdexp(v, e);
  const std::uint64_t bits = static_cast<std::uint64_t>(e + 1023) << 52;
  double scale;
  std::memcpy(&scale, &bits, sizeof scale);
  return v * scale;
}

// 2^-k for the level counts that occur in practice (up to the plane cap of 10), so that the
// common scalings are a table load rather than a constructed power.
constexpr unsigned int kZvTabledLevels = 10;
struct ZvNegativePowersOfTwo {
  double v[3 * kZvTabledLevels + 1];
  constexpr ZvNegativePowersOfTwo() : v() {
    double p = 1.0;
    for (double& x : v) {
      x = p;
      p *= 0.5;
    }
  }
};
inline constexpr ZvNegativePowersOfTwo kZvNegativePowersOfTwo{};

// Forward differences of a cubic sampled at 2^levels equal steps. Scaling by powers of two
// keeps every difference exact, so the walk only accumulates the rounding of its additions.
template <class G>
struct ZvForwardStepper {
  using Point = typename G::Point;

  Point q;  // current point
  Point s;  // first difference
  Point t;  // second difference
  Point b;  // third difference (constant)

  ZvForwardStepper(const Point* p, unsigned int levels) {
    const Point d0 = p[1] - p[0], d1 = p[2] - p[1], d2 = p[3] - p[2];
    const Point a1 = d1 - d0, a2 = d2 - d1;
    const int l = static_cast<int>(levels);
    Point a, f;
    if (levels <= kZvTabledLevels) {
      a = a1 * 3.0 * kZvNegativePowersOfTwo.v[2 * l];
      b = (a2 - a1) * 6.0 * kZvNegativePowersOfTwo.v[3 * l];
      f = d0 * 3.0 * kZvNegativePowersOfTwo.v[l];
    } else {
      a = zvScaleByPowerOfTwo(a1 * 3.0, -2 * l);
      b = zvScaleByPowerOfTwo((a2 - a1) * 6.0, -3 * l);
      f = zvScaleByPowerOfTwo(d0 * 3.0, -l);
    }
    s = b * 0.16666666666666666 + f + a;
    t = a * 2.0;
    q = p[0];
  }

  Point Step() {
    q += s;
    t += b;
    s += t;
    return q;
  }
};

// De Casteljau at t = 1/2 with factors of 0.5; the halves share left[3] == right[0]. Everything
// is read before anything is written, so left may be p itself.
template <class P>
inline void zvSplitCubicAtHalf(const P* p, P* left, P* right) {
  using T = decltype(p->x + p->x);
  const T h = static_cast<T>(0.5);
  const P p0 = p[0], p3 = p[3];
  const P p01 = (p0 + p[1]) * h;
  const P p12 = (p[1] + p[2]) * h;
  const P p23 = (p[2] + p3) * h;
  const P p012 = (p01 + p12) * h;
  const P p123 = (p12 + p23) * h;
  const P m = (p012 + p123) * h;
  left[0] = p0;
  left[1] = p01;
  left[2] = p012;
  left[3] = m;
  right[0] = m;
  right[1] = p123;
  right[2] = p23;
  right[3] = p3;
}

// Depth of the up-front midpoint subdivision, from the whole curve. Returns the depth and
// writes the factor that turns a deviation into a step count.
template <class G>
inline unsigned int zvCubicSubdivisionDepth(const typename G::Point* p, double tolerance,
                                            double& factor) {
  using Point = typename G::Point;
  // Repeated first differences, not the closed formula: the rounding is part of the count.
  const Point d0 = p[1] - p[0], d1 = p[2] - p[1], d2 = p[3] - p[2];
  const Point a1 = d1 - d0, a2 = d2 - d1;
  const double inv = 1.0 / tolerance;
  factor = 0.75 * inv;
  return zvSubdivisionDepth(zvTruncateToCount(G::ThirdDifferenceLength(a2 - a1) * inv + 0.5));
}

#endif
