// Free numerical helpers of the Bezier function segments: inversion of the X cubic, the
// monotony test, repair of a non-monotone segment and the exact integral of a segment.
#include <zv/std_fcurve.h>

#include "core/vec.h"
#include "fcurve/cubic_segment.h"
#include "fcurve/std_fcurve_bezier.h"

#include <cmath>

double InvertParamCubic(double x, double x0, double x1, double x2, double x3) {
  return ZvCubicXInverse(x0, x1, x2, x3).Solve(x);
}

namespace {

// The three ways a segment whose handles stay on their sides is known to have a monotone X.
bool HasMonotoneX(double x0, double x1, double x2, double x3) {
  if (x1 - x2 <= 1e-9) return true;
  const double d0 = x1 - x0, d3 = x2 - x3;
  if (d0 >= -1e-15 && 1e-15 >= d0 && d3 >= -1e-15 && 1e-15 >= d3) return true;
  return x1 * x1 + x2 * x2 - ((x0 + x1) * x2 + x3 * (x1 - x0)) <= 1e-9;
}

void ClampHandlesToSides(ZvPoint2<double>* p) {
  if (p[0].x > p[1].x) p[1].x = p[0].x;
  if (p[2].x > p[3].x) p[2].x = p[3].x;
}

// The unit direction of a handle; tiny handles keep their raw direction.
ZvPoint2<double> HandleDirection(const ZvPoint2<double>& v) {
  if (v.x >= -1e-9 && 1e-9 >= v.x && v.y >= -1e-9 && 1e-9 >= v.y) return v;
  const double length = zvGuardedLength(v);
  return length > 0.0 ? v / length : v;
}

}  // namespace

int ZvStdFCurve_IsCubicSegmentValid(const ZvPoint2<double>& p0, const ZvPoint2<double>& p1,
                                    const ZvPoint2<double>& p2, const ZvPoint2<double>& p3) {
  if (p0.x >= p3.x || p0.x > p1.x || p2.x > p3.x) return 0;
  return HasMonotoneX(p0.x, p1.x, p2.x, p3.x) ? 1 : 0;
}

void BezierCubicRegularize(ZvPoint2<double>* p) {
  ClampHandlesToSides(p);
  if (HasMonotoneX(p[0].x, p[1].x, p[2].x, p[3].x)) return;
  // Shorten both handles toward their anchors, keeping their directions.
  const ZvPoint2<double> right = p[1] - p[0], left = p[2] - p[3];
  double s = 0.9;
  ZvPoint2<double> c1 = p[1], c2 = p[2];
  int round = 0;
  for (; round < 20; ++round) {
    c1 = p[0] + right * s;
    c2 = p[3] + left * s;
    if (HasMonotoneX(p[0].x, c1.x, c2.x, p[3].x)) break;
    s *= 0.9;
  }
  p[1] = c1;
  p[2] = c2;
  if (round == 20) {
    // Still folded: fall back to handles of a third of the span along their directions.
    const double third = (p[3].x - p[0].x) / 3.0;
    p[1] = p[0] + HandleDirection(right) * third;
    p[2] = p[3] + HandleDirection(left) * third;
  }
  ClampHandlesToSides(p);
}

namespace {

// Antiderivative of Y(u) X'(u) at u, the coefficients of the product given lowest first.
double ProductAntiderivative(const double* c, double u) {
  double sum = 0.0;
  for (int k = 5; k >= 0; --k)
    sum = (sum + c[k] / (k + 1)) * u;
  return sum;
}

void ProductCoefficients(const ZvPoint2<double>* p, double* c) {
  const double a = 3.0 * (p[1].x - p[0].x);
  const double b = 6.0 * (p[0].x - 2.0 * p[1].x + p[2].x);
  const double cc = 3.0 * (p[3].x - 3.0 * p[2].x + 3.0 * p[1].x - p[0].x);
  const double y0 = p[0].y;
  const double d = 3.0 * (p[1].y - p[0].y);
  const double e = 3.0 * (p[0].y - 2.0 * p[1].y + p[2].y);
  const double f = p[3].y - 3.0 * p[2].y + 3.0 * p[1].y - p[0].y;
  c[0] = y0 * a;
  c[1] = y0 * b + d * a;
  c[2] = y0 * cc + d * b + e * a;
  c[3] = d * cc + e * b + f * a;
  c[4] = e * cc + f * b;
  c[5] = f * cc;
}

}  // namespace

double IntegrateBezierSegment(const ZvPoint2<double>* p, double a, double b) {
  const double ua = InvertParamCubic(a, p[0].x, p[1].x, p[2].x, p[3].x);
  const double ub = InvertParamCubic(b, p[0].x, p[1].x, p[2].x, p[3].x);
  double c[6];
  ProductCoefficients(p, c);
  return ProductAntiderivative(c, ub) - ProductAntiderivative(c, ua);
}

double zvWholeBezierSegmentIntegral(const ZvPoint2<double>* p) {
  double c[6];
  ProductCoefficients(p, c);
  return ProductAntiderivative(c, 1.0);
}
