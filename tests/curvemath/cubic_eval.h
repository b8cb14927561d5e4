// Direct evaluation of cubics, the independent reference the flatten and locate tests compare
// against.
#ifndef ZV_TESTS_CURVEMATH_CUBIC_EVAL_H
#define ZV_TESTS_CURVEMATH_CUBIC_EVAL_H

#include <zv/point.h>

#include <cmath>

// Bernstein form, evaluated afresh at every parameter.
template <class P>
P EvalCubic(const P* p, double t) {
  const double s = 1.0 - t;
  const double b0 = s * s * s, b1 = 3 * s * s * t, b2 = 3 * s * t * t, b3 = t * t * t;
  P r = p[0] * b0;
  r += p[1] * b1;
  r += p[2] * b2;
  r += p[3] * b3;
  return r;
}

template <class P>
double Dist(const P& a, const P& b) {
  const P d = a - b;
  return std::sqrt(ZvDot(d, d));
}

#endif
