// The arithmetic of one cubic function segment: inversion of its X cubic and the value of its Y
// cubic, split so that everything that depends on the segment alone can be computed once and
// kept while a caller evaluates the same segment again and again.
//
// InvertParamCubic and the evaluation of the standard curve both run the iteration below, so
// their results agree to the bit. Every intermediate value is formed by the same operations in
// the same order as the plain iteration would form it; only the moment of computing differs.
#ifndef ZV_FCURVE_CUBIC_SEGMENT_H
#define ZV_FCURVE_CUBIC_SEGMENT_H

#include <cmath>

// Solves X(u) = x on [0, 1] for a monotone X given by its four control values.
struct ZvCubicXInverse {
  double x0, x3;
  double a, b, c;  // X(u) = ((a u + b) u + c) u + x0
  // The first round starts at u = 1/2: the polynomial there without its constant, and the
  // slope there.
  double halfway, slope0;

  ZvCubicXInverse() = default;
  ZvCubicXInverse(double p0, double p1, double p2, double p3) {
    x0 = p0;
    x3 = p3;
    a = 3.0 * p1 + p3 - 3.0 * p2 - p0;
    b = 3.0 * (p0 - 2.0 * p1 + p2);
    c = 3.0 * (p1 - p0);
    const double u = 0.5;
    halfway = ((a * u + b) * u + c) * u;
    slope0 = (3.0 * a * u + 2.0 * b) * u + c;
  }

  // Newton steps while they stay inside the bracket, else a halving toward the anchor, the end
  // of the bracket that the root lies toward. At most 100 rounds; stops on a step of at most
  // 1e-9 or a residual of at most 1e-29.
  double Solve(double x) const {
    if (x - x0 < 1e-20) return 0.0;
    if (x3 - x < 1e-20) return 1.0;
    const double d = x0 - x;
    double u = 0.5;
    double f = halfway + d;
    double low = 0.0, high = 1.0;
    double anchor = f < 0.0 ? 1.0 : 0.0;
    const double a3 = 3.0 * a, b2 = 2.0 * b;
    double slope = slope0, lowArm = (low - u) * slope, highArm = (high - u) * slope;
    for (int round = 0;;) {
      // Newton only while its step stays inside the bracket.
      const double step = (lowArm + f) * (highArm + f) < 0.0 ? f / slope : (u - anchor) * 0.5;
      u -= step;
      if (step >= -1e-9 && 1e-9 >= step) break;
      f = ((a * u + b) * u + c) * u + d;
      if (std::fabs(f) <= 1e-29) break;
      if (f >= 0.0) {
        anchor = low;
        high = u;
      } else {
        anchor = high;
        low = u;
      }
      if (++round == 100) break;
      slope = (a3 * u + b2) * u + c;
      lowArm = (low - u) * slope;
      highArm = (high - u) * slope;
    }
    if (u < 0.0) u = 0.0;
    if (u > 1.0) u = 1.0;
    return u;
  }
};

// A cubic segment of a function curve: X inverted as above, Y in Horner form.
struct ZvCubicFunctionSegment {
  ZvCubicXInverse x;
  double y0, cubic, square, linear;  // the Horner coefficients, grouped as evaluated

  ZvCubicFunctionSegment() = default;
  ZvCubicFunctionSegment(double x0, double x1, double x2, double x3, double p0, double p1,
                         double p2, double p3)
      : x(x0, x1, x2, x3),
        y0(p0),
        cubic(p3 - p0 - 3.0 * (p2 - p1)),
        square(3.0 * (p2 - p1)),
        linear(3.0 * (p1 - p0)) {}

  double ValueAt(double u) const { return ((cubic * u + square - linear) * u + linear) * u + y0; }
  double Eval(double t) const { return ValueAt(x.Solve(t)); }
};

#endif
