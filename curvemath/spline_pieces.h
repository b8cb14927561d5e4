// The polynomials of the spline pieces, shared by the fits and by evaluation.
//
// A fit accepts a sample when the piece it checks stays within the tolerance there; evaluation
// later runs the very same expressions on the same keys, so an accepted sample is reproduced
// to the last bit and not merely approximately.
#ifndef ZV_CURVEMATH_SPLINE_PIECES_H
#define ZV_CURVEMATH_SPLINE_PIECES_H

#include <zv/arrays.h>
#include <zv/point.h>

// Squared length of a value: a square in 1-D, a squared distance in 2-D and 3-D.
inline double zvSplineNorm2(double v) {
  return v * v;
}
inline double zvSplineNorm2(const ZvPoint2<double>& v) {
  return ZvDot(v, v);
}
inline double zvSplineNorm2(const ZvPoint3<double>& v) {
  return ZvDot(v, v);
}

// Non-uniform Catmull-Rom piece from v1 (u = 0) to v2 (u = 1) with neighbours v0 and v3;
// a = h / (t2 - t0) and b = h / (t3 - t1) are the span ratios.
template <class T>
inline T zvCatmullRomInner(double u, double a, double b, const T& v0, const T& v1, const T& v2,
                           const T& v3) {
  const double u2 = u * u, u3 = u2 * u;
  return v0 * (a * (2 * u2 - u3 - u)) + v1 * ((2 - b) * u3 + (b - 3) * u2 + 1) +
         v2 * (a * u + (3 - 2 * a) * u2 + (a - 2) * u3) + v3 * (b * (u3 - u2));
}

// First piece of an open curve, from v0 to v1, with r = (t1 - t0) / (t2 - t0).
template <class T>
inline T zvCatmullRomFirst(double u, double r, const T& v0, const T& v1, const T& v2) {
  const double u2 = u * u, u3 = u2 * u;
  return v0 * ((1 - r) * u3 + (r - 1) * u2 - u + 1) + v1 * (u2 - u3 + u) + v2 * (r * (u3 - u2));
}

// Last piece of an open curve, from v1 to v2, with a = h / (t2 - t0).
template <class T>
inline T zvCatmullRomLast(double u, double a, const T& v0, const T& v1, const T& v2) {
  const double u2 = u * u, u3 = u2 * u;
  return v0 * (a * (2 * u2 - u3 - u)) + v1 * (u3 - 2 * u2 + 1) +
         v2 * (a * u + (2 - 2 * a) * u2 + (a - 1) * u3);
}

// The cubic of a Bezier segment of span h from p0 to p1, with the stored right derivative at p0
// and the (backward-pointing) left derivative at p1, in power form over u in [0, 1].
template <class T>
struct ZvSplineCubic {
  T c0, c1, c2, c3;

  ZvSplineCubic(const T& p0, const T& p1, const T& right, const T& left, double h) {
    const double third = h * 0.3333333333333333;
    const T ctrl1 = p0 + right * third;
    const T ctrl2 = p1 + left * third;
    const T a = (ctrl2 - ctrl1) * 3.0;
    const T b = (ctrl1 - p0) * 3.0;
    c0 = p0;
    c1 = b;
    c2 = a - b;
    c3 = p1 - p0 - a;
  }
  T operator()(double u) const { return ((c3 * u + c2) * u + c1) * u + c0; }
};

// Bisection for the key interval holding t, which lies strictly between the first and the last
// key. Returns the index of its left key; when t equals a key, returns that key with exact set.
inline unsigned int zvSplineLocate(const ZvDoubleArray& keys, double t, bool& exact) {
  unsigned int lo = 0, hi = keys.size - 1;
  exact = false;
  while (hi - lo > 1) {
    const unsigned int mid = (lo + hi) / 2;
    if (t == keys[mid]) {
      exact = true;
      return mid;
    }
    if (t < keys[mid]) {
      hi = mid;
    } else {
      lo = mid;
    }
  }
  return lo;
}

#endif
