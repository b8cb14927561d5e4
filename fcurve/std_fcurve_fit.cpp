// Standard curves built through lists of points, and key reduction, which refits runs of cubic
// segments and thins runs of straight ones.
#include <zv/polyline.h>
#include <zv/spline.h>
#include <zv/std_fcurve.h>

#include "fcurve/cfc_linear_fit.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"

#include <cmath>

namespace {

// A key through (x, y) with handles at the given slopes, reaching `left` and `right` in X.
void AddKey(ZvStdFCurveImpl& s, double x, double y, double leftReach, double leftSlope,
            double rightReach, double rightSlope, unsigned int kind) {
  CFCStdKey k{};
  k.parameter = x;
  k.leftValue = k.rightValue = y;
  k.leftTangent = {x - leftReach, y - leftReach * leftSlope};
  k.rightTangent = {x + rightReach, y + rightReach * rightSlope};
  k.segmentKind = static_cast<unsigned char>(kind);
  k.flags = CFCFlag_TangentContinuity;
  s.keys.Add(k);
}

// The reach of a handle: a third of the segment on that side, or of the one on the other side
// for the outer handle of an end key.
double Third(const ZvPoint2dArray& p, unsigned int i, bool leftSide) {
  const unsigned int n = p.size;
  if (leftSide) return i > 0 ? (p[i].x - p[i - 1].x) / 3.0 : (p[1].x - p[0].x) / 3.0;
  return i + 1 < n ? (p[i + 1].x - p[i].x) / 3.0 : (p[n - 1].x - p[n - 2].x) / 3.0;
}

// Cubic keys through every point with the given slope at each.
void AddCubicKeys(ZvStdFCurveImpl& s, const ZvPoint2dArray& p, const double* slopes) {
  for (unsigned int i = 0; i < p.size; ++i) {
    AddKey(s, p[i].x, p[i].y, Third(p, i, true), slopes[i], Third(p, i, false), slopes[i],
           ZvBaseFCurve::CubicSegment);
  }
}

double Slope(const ZvPoint2<double>& d) {
  return d.y / d.x;
}

// Inner slopes along the chord of the neighbours, end slopes along the end edges.
void CatmullRom(ZvStdFCurveImpl& s, const ZvPoint2dArray& p) {
  const unsigned int n = p.size;
  ZvDoubleArray slopes(n);
  slopes.Add(Slope(ZvPoint2dArray_FirstTangent(p)));
  for (unsigned int i = 1; i + 1 < n; ++i)
    slopes.Add(Slope(p[i + 1] - p[i - 1]));
  slopes.Add(Slope(ZvPoint2dArray_LastTangent(p)));
  AddCubicKeys(s, p, slopes.data);
}

// The natural interpolating cubic spline: slopes from the tridiagonal system of C2 continuity
// with zero curvature at both ends.
void CubicC2(ZvStdFCurveImpl& s, const ZvPoint2dArray& p) {
  const unsigned int n = p.size;
  ZvDoubleArray diag(n), upper(n), rhs(n), slopes(n);
  diag.Resize(n);
  upper.Resize(n);
  rhs.Resize(n);
  slopes.Resize(n);
  auto h = [&p](unsigned int i) { return p[i + 1].x - p[i].x; };
  auto d = [&p, &h](unsigned int i) { return (p[i + 1].y - p[i].y) / h(i); };
  // Rows in the slopes m: end rows 2 m0 + m1 = 3 d0 and m(n-2) + 2 m(n-1) = 3 d(n-2); inner rows
  // h(i) m(i-1) + 2 (h(i-1) + h(i)) m(i) + h(i-1) m(i+1) = 3 (h(i) d(i-1) + h(i-1) d(i)).
  diag[0] = 2.0;
  upper[0] = 1.0;
  rhs[0] = 3.0 * d(0);
  for (unsigned int i = 1; i < n; ++i) {
    const bool last = i + 1 == n;
    const double lower = last ? 1.0 : h(i);
    const double di = last ? 2.0 : 2.0 * (h(i - 1) + h(i));
    const double ri = last ? 3.0 * d(n - 2) : 3.0 * (h(i) * d(i - 1) + h(i - 1) * d(i));
    upper[i] = last ? 0.0 : h(i - 1);
    const double w = lower / diag[i - 1];
    diag[i] = di - w * upper[i - 1];
    rhs[i] = ri - w * rhs[i - 1];
  }
  slopes[n - 1] = rhs[n - 1] / diag[n - 1];
  for (unsigned int i = n - 1; i-- > 0;)
    slopes[i] = (rhs[i] - upper[i] * slopes[i + 1]) / diag[i];
  AddCubicKeys(s, p, slopes.data);
}

void LinearFit(ZvStdFCurveImpl& s, const ZvPoint2dArray& p, double tolerance) {
  CFCGreedyLinearFit(p, tolerance, [&s](const ZvPoint2<double>& q) {
    AddKey(s, q.x, q.y, 0.0, 0.0, 0.0, 0.0, ZvBaseFCurve::LinearSegment);
  });
}

// One cubic segment from the first point to the last, handles at the thirds of the chord.
void ChordCubic(ZvStdFCurveImpl& s, const ZvPoint2dArray& p) {
  const ZvPoint2<double>& a = p[0];
  const ZvPoint2<double>& b = p[p.size - 1];
  const double slope = (b.y - a.y) / (b.x - a.x), third = (b.x - a.x) / 3.0;
  AddKey(s, a.x, a.y, third, slope, third, slope, ZvBaseFCurve::CubicSegment);
  AddKey(s, b.x, b.y, third, slope, third, slope, ZvBaseFCurve::CubicSegment);
}

// A Bezier spline fitted within the tolerance; its derivatives give the handles. The stored
// left derivatives point backwards, so the slope arriving at a key is their negation.
void CubicFit(ZvStdFCurveImpl& s, const ZvPoint2dArray& p, double tolerance) {
  ZvDoubleArray x(p.size), y(p.size);
  for (unsigned int i = 0; i < p.size; ++i) {
    x.Add(p[i].x);
    y.Add(p[i].y);
  }
  // A negative tolerance is refused by the fit and so falls back to the one chord cubic; it
  // must not be read as 0, which would put a key on every point.
  ZvSpline1d spline;
  if (p.size < 3 || !spline.OpenFit(x, y, tolerance, ZvSpline::BezierCubicFCurve)) {
    ChordCubic(s, p);
  } else {
    const ZvDoubleArray& t = spline.GetKeyParameters();
    const ZvDoubleArray& v = spline.GetKeyValues();
    const ZvDoubleArray& l = spline.GetLeftDerivatives();
    const ZvDoubleArray& r = spline.GetRightDerivatives();
    const unsigned int n = t.size;
    for (unsigned int i = 0; i < n; ++i) {
      const double hl = (i > 0 ? t[i] - t[i - 1] : t[1] - t[0]) / 3.0;
      const double hr = (i + 1 < n ? t[i + 1] - t[i] : t[n - 1] - t[n - 2]) / 3.0;
      // The outer handles of the end keys continue the inner ones.
      const double in = i > 0 ? -l[i] : r[i], out = i + 1 < n ? r[i] : -l[i];
      AddKey(s, t[i], v[i], hl, in, hr, out, ZvBaseFCurve::CubicSegment);
    }
  }
  for (unsigned int i = 0; i < s.keys.size; ++i)
    s.LockTangentContinuity(i);
}

}  // namespace

ZvStdFCurve::ZvStdFCurve(const ZvPoint2dArray& points, DPMethod method, double tolerance,
                         FSKind firstSegmentKind, FSKind lastSegmentKind)
    : ZvStdFCurve(points.size ? points[0].y : 0.0, firstSegmentKind) {
  ZvStdFCurveImpl& s = *m_impl;
  const unsigned int n = points.size;
  if (n == 0 || !CFCPointsAscend(points) || std::isnan(tolerance)) return;
  if (n == 1) {
    AddKey(s, points[0].x, points[0].y, 0.0, 0.0, 0.0, 0.0,
           method == DPLinearFitC0 ? LinearSegment : CubicSegment);
  } else {
    switch (method) {
      case DPCatmullRom:
        CatmullRom(s, points);
        break;
      case DPCubicC2:
        CubicC2(s, points);
        break;
      case DPLinearFitC0:
        LinearFit(s, points, tolerance);
        break;
      case DPCubicFitG1:
        CubicFit(s, points, tolerance);
        break;
      default:
        return;
    }
  }
  s.keys[s.keys.size - 1].segmentKind = static_cast<unsigned char>(lastSegmentKind);
}

namespace {

// The runs of one segment kind in keys a..b are reduced one after the other; a locked key ends a
// run, so that it stays.
void ReduceRange(ZvStdFCurve& curve, ZvStdFCurveImpl& s, double start, double end,
                 double tolerance) {
  unsigned int a, b;
  s.CreateNonModifyingKey(start, a, curve);
  s.CreateNonModifyingKey(end, b, curve);
  const double endParameter = s.keys[b].parameter;
  const unsigned short locks = CFCFlag_ValueLock | CFCFlag_ParameterLock;
  unsigned int i = a;
  while (i < b) {
    const unsigned int kind = s.keys[i].segmentKind;
    unsigned int j = i + 1;
    while (j < b && s.keys[j].segmentKind == kind && !(s.keys[j].flags & locks))
      ++j;
    const double runStart = s.keys[i].parameter, runEnd = s.keys[j].parameter;
    if (j >= i + 2) {
      if (kind == ZvBaseFCurve::CubicSegment) {
        ZvPoint2dArray points(j - i + 1);
        for (unsigned int k = i; k <= j; ++k)
          points.Add({s.keys[k].parameter, s.keys[k].rightValue});
        const ZvStdFCurve fit(points, ZvStdFCurve::DPCubicFitG1, tolerance,
                              ZvBaseFCurve::CubicSegment,
                              static_cast<ZvBaseFCurve::FSKind>(s.keys[j].segmentKind));
        curve.Paste(fit, runStart, runEnd);
      } else {
        s.ReduceNumKeys(i, j, tolerance, curve);
      }
    }
    // A refit can move the run's end key off its parameter; the walk still moves on, so that
    // it ends.
    int found;
    const unsigned int next = s.LocateParameter(runEnd, found) - 1;
    i = next > i ? next : i + 1;
    b = s.LocateParameter(endParameter, found) - 1;
  }
}

}  // namespace

unsigned int ZvStdFCurve::ReduceNumKeys(double start, double end, double tolerance) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  return s.ReduceOverFoldedRanges(
      start, end, tolerance, [&](double a, double b) { ReduceRange(*this, s, a, b, tolerance); });
}
