// Private Bezier helpers of the standard curve.
#ifndef ZV_FCURVE_STD_FCURVE_BEZIER_H
#define ZV_FCURVE_STD_FCURVE_BEZIER_H

#include <zv/point.h>

// The integral of a cubic function segment over its whole span: the same degree-6 polynomial
// as IntegrateBezierSegment, taken from u = 0 to u = 1 without inverting X.
double zvWholeBezierSegmentIntegral(const ZvPoint2<double>* p);

// The point of a cubic at u, by de Casteljau.
inline ZvPoint2<double> zvBezierPoint(const ZvPoint2<double>* p, double u) {
  const double v = 1.0 - u;
  const ZvPoint2<double> a = p[0] * v + p[1] * u, b = p[1] * v + p[2] * u, c = p[2] * v + p[3] * u;
  const ZvPoint2<double> d = a * v + b * u, e = b * v + c * u;
  return d * v + e * u;
}

#endif
