// Location of the curve parameter nearest to a point, along the polyline a flatten would
// produce. The 2d and 3d forms share one algorithm over the geometry policies.
#include <zv/bezier_tool.h>

#include "curvemath/cubic_steps.h"

namespace {

// Walks all 2^levels segments of the piece [t0, t1], the last one ending on the computed point
// rather than on P3, and keeps the first segment reaching a strictly smaller squared distance.
// Unlike the plane flatten, the levels are not capped here.
template <class G>
bool CubicForwardDifferencingForPointLocation(const typename G::Point* p, double factor,
                                              const typename G::Point& point, double limit,
                                              double& best, double& bestT, double t0, double t1) {
  const unsigned int levels = zvCubicLevels<G>(p, factor);
  const unsigned int n = 1u << (levels & 31u);
  ZvForwardStepper<G> walk(p, levels);
  bool improved = false;
  for (unsigned int i = 0; i < n; ++i) {
    const typename G::Point start = walk.q;
    const typename G::Point end = walk.Step();
    double d2, s;
    if (G::FindClosestPointOnLineSegment(point, start, end, limit, d2, s) && d2 < best) {
      best = d2;
      bestT = (s + i) * (t1 - t0) / n + t0;
      improved = true;
    }
  }
  return improved;
}

// Halves the piece depth times, skipping every sub-piece whose control box (grown by limit)
// misses the point. The whole curve was already tested by the caller, hence testBox 0 first.
template <class G>
bool CubicMidpointSubdivisionForPointLocation(const typename G::Point* p, unsigned int depth,
                                              double factor, const typename G::Point& point,
                                              double limit, double& best, double& bestT, double t0,
                                              double t1, int testBox) {
  if (testBox && G::IsOutsideGrownControlBox(p, point, limit)) return false;
  typename G::Point left[4], right[4];
  zvSplitCubicAtHalf(p, left, right);
  const double tm = t0 + (t1 - t0) / 2;
  bool foundLeft, foundRight;
  if (depth == 1) {
    foundLeft = CubicForwardDifferencingForPointLocation<G>(left, factor, point, limit, best, bestT,
                                                            t0, tm);
    foundRight = CubicForwardDifferencingForPointLocation<G>(right, factor, point, limit, best,
                                                             bestT, tm, t1);
  } else {
    foundLeft = CubicMidpointSubdivisionForPointLocation<G>(left, depth - 1, factor, point, limit,
                                                            best, bestT, t0, tm, 1);
    foundRight = CubicMidpointSubdivisionForPointLocation<G>(right, depth - 1, factor, point, limit,
                                                             best, bestT, tm, t1, 1);
  }
  return foundLeft || foundRight;
}

// boxByLimit: the space form grows the first box test by the search limit, the plane form by
// the caller's distance.
template <class G>
int LocatePoint(const typename G::Point* p, double tolerance, const typename G::Point& point,
                double distance, bool boxByLimit, double& outDistance2, double& outT) {
  if (!p) return 0;
  // A squared tolerance plus a plain distance: the mix is part of the behaviour, not a slip.
  const double limit = tolerance * tolerance + distance;
  if (G::IsOutsideGrownControlBox(p, point, boxByLimit ? limit : distance)) return 0;
  double factor;
  const unsigned int depth = zvCubicSubdivisionDepth<G>(p, tolerance, factor);

  const double savedDistance2 = outDistance2, savedT = outT;
  outDistance2 = 2 * limit;
  const bool found = depth > 0
                         ? CubicMidpointSubdivisionForPointLocation<G>(
                               p, depth, factor, point, limit, outDistance2, outT, 0.0, 1.0, 0)
                         : CubicForwardDifferencingForPointLocation<G>(
                               p, factor, point, limit, outDistance2, outT, 0.0, 1.0);
  // A squared distance against a plain one, on purpose (see the header).
  if (found && outDistance2 <= distance) return 1;
  outDistance2 = savedDistance2;
  outT = savedT;
  return 0;
}

}  // namespace

int ZvBezierTool_LocatePoint2d(const ZvPoint2<double>* p, double tolerance,
                               const ZvPoint2<double>& point, double distance, double& outDistance2,
                               double& outT) {
  return LocatePoint<ZvCubicGeom2>(p, tolerance, point, distance, false, outDistance2, outT);
}

int ZvBezierTool_LocatePoint2f(const ZvPoint2<float>* p, double tolerance,
                               const ZvPoint2<float>& point, double distance, double& outDistance2,
                               double& outT) {
  if (!p) return 0;
  const ZvPoint2<double> c[4] = {
      {p[0].x, p[0].y}, {p[1].x, p[1].y}, {p[2].x, p[2].y}, {p[3].x, p[3].y}};
  const ZvPoint2<double> q = {point.x, point.y};
  return ZvBezierTool_LocatePoint2d(c, tolerance, q, distance, outDistance2, outT);
}

int ZvBezierTool_LocatePoint3d(const ZvPoint3<double>* p, double tolerance,
                               const ZvPoint3<double>& point, double distance, double& outDistance2,
                               double& outT) {
  return LocatePoint<ZvCubicGeom3>(p, tolerance, point, distance, true, outDistance2, outT);
}
