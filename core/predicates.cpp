#include <zv/point.h>

#include <cmath>

namespace {

// The closest point of segment a-b to p, over N components in double. A segment whose squared
// length is within the degeneracy bound measures to a; the plane form counts exactly 1e-7 as
// degenerate, the space form does not.
template <int N>
int ClosestPointOnSegment(const double* p, const double* a, const double* b, bool inclusiveBound,
                          double maxDistance2, double& outDistance2, double& outT) {
  double ab[N], l2 = 0.0, dot = 0.0;
  for (int i = 0; i < N; ++i) {
    ab[i] = b[i] - a[i];
    l2 += ab[i] * ab[i];
    dot += (p[i] - a[i]) * ab[i];
  }
  const bool degenerate = inclusiveBound ? std::fabs(l2) <= 1e-7 : std::fabs(l2) < 1e-7;
  double t = 0.0;
  if (!degenerate) {
    t = dot / l2;
    outT = t;  // written even when the distance test then fails
  }
  double d2 = 0.0;
  for (int i = 0; i < N; ++i) {
    const double c = t <= 0.0 ? a[i] : (t >= 1.0 ? b[i] : a[i] + t * ab[i]);
    d2 += (p[i] - c) * (p[i] - c);
  }
  if (d2 > maxDistance2) return 0;
  outDistance2 = d2;
  if (t <= 0.0) {
    outT = 0.0;
  } else if (t >= 1.0) {
    outT = 1.0;
  }
  return 1;
}

}  // namespace

template <class T>
int ZvPoint2_FindClosestPointOnLineSegment(const ZvPoint2<T>& p, const ZvPoint2<T>& a,
                                           const ZvPoint2<T>& b, double maxDistance2,
                                           double& outDistance2, double& outT) {
  const double pp[2] = {double(p.x), double(p.y)}, aa[2] = {double(a.x), double(a.y)},
               bb[2] = {double(b.x), double(b.y)};
  return ClosestPointOnSegment<2>(pp, aa, bb, true, maxDistance2, outDistance2, outT);
}

template <class T>
int ZvPoint3_FindClosestPointOnLineSegment(const ZvPoint3<T>& p, const ZvPoint3<T>& a,
                                           const ZvPoint3<T>& b, double maxDistance2,
                                           double& outDistance2, double& outT) {
  const double pp[3] = {double(p.x), double(p.y), double(p.z)},
               aa[3] = {double(a.x), double(a.y), double(a.z)},
               bb[3] = {double(b.x), double(b.y), double(b.z)};
  return ClosestPointOnSegment<3>(pp, aa, bb, false, maxDistance2, outDistance2, outT);
}

namespace {

double Clamp(double v, double lo, double hi) {
  if (v < lo) return lo;
  if (v > hi) return hi;
  return v;
}

// acos loses precision near the x axis and asin near the y axis: each is used where it is good.
double UnclampedAngleRadian(double x, double y) {
  static const double dblLimit = 0.7071067811865476;
  const double pi = 3.141592653589793;
  const double r = std::sqrt(x * x + y * y);
  const double c = Clamp(x / r, -1.0, 1.0);
  const double s = Clamp(y / r, -1.0, 1.0);
  if (std::fabs(c) <= dblLimit) {
    const double angle = std::acos(c);
    return s > 0.0 ? angle : 2.0 * pi - angle;
  }
  if (c > 0.0) {
    const double angle = std::asin(s);
    return s < 0.0 ? angle + 2.0 * pi : angle;
  }
  return pi - std::asin(s);
}

// A full turn is reported as 0 so that equal directions compare equal.
double ClampToTurn(double angle, double turn) {
  angle = Clamp(angle, 0.0, turn);
  return std::fabs(angle - turn) <= 1e-15 ? 0.0 : angle;
}

double SquaredLength(double dx, double dy) {
  return dx * dx + dy * dy;
}

}  // namespace

double AngleWithFirstAxisRadian(double x, double y) {
  return ClampToTurn(UnclampedAngleRadian(x, y), 2.0 * 3.141592653589793);
}

double AngleWithFirstAxisDegree(double x, double y) {
  return ClampToTurn(UnclampedAngleRadian(x, y) * 57.29577951308232, 360.0);
}

template <class T>
int ZvPoint2_AngleInDegrees(const ZvPoint2<T>& u, const ZvPoint2<T>& v, double& outDegrees) {
  const T eps = static_cast<T>(1e-7);
  if ((std::fabs(u.x) <= eps && std::fabs(u.y) <= eps) ||
      (std::fabs(v.x) <= eps && std::fabs(v.y) <= eps))
    return 0;
  const double a = AngleWithFirstAxisDegree(u.x, u.y);
  const double b = AngleWithFirstAxisDegree(v.x, v.y);
  double sweep = Clamp(b >= a ? b - a : 360.0 + b - a, 0.0, 360.0);
  // A sweep of almost a full turn is rounding noise around equal directions.
  if (std::fabs(sweep - 360.0) <= 1e-9) sweep = 0.0;
  outDegrees = sweep;
  return 1;
}

template <class T>
int ZvPoint2_ParallelProjectionOnLineAB(const ZvPoint2<T>& p, const ZvPoint2<T>& a,
                                        const ZvPoint2<T>& b, const ZvPoint2<T>& direction,
                                        ZvPoint2<T>& outPoint) {
  const double abx = double(b.x) - a.x, aby = double(b.y) - a.y;
  const double l2 = SquaredLength(abx, aby);
  if (l2 <= 1e-7) return 0;
  const T eps = static_cast<T>(1e-7);
  if (std::fabs(direction.x) <= eps && std::fabs(direction.y) <= eps) {
    const double t = ((double(p.x) - a.x) * abx + (double(p.y) - a.y) * aby) / l2;
    const T tt = static_cast<T>(t), ts = static_cast<T>(1.0 - t);
    outPoint = {a.x * ts + b.x * tt, a.y * ts + b.y * tt};
    return 1;
  }
  const T det = (a.y - b.y) * direction.x - (a.x - b.x) * direction.y;
  if (std::fabs(det) < eps) return 0;
  const T k1 = direction.y * p.x - p.y * direction.x;
  const T k2 = (b.y - a.y) * a.x + (a.x - b.x) * a.y;
  outPoint = {((b.x - a.x) * k1 - direction.x * k2) / det,
              ((b.y - a.y) * k1 - direction.y * k2) / det};
  return 1;
}

template <class T>
int ZvPoint2_IsInLineSegment(const ZvPoint2<T>& p, const ZvPoint2<T>& a, const ZvPoint2<T>& b) {
  const double px = p.x, py = p.y, ax = a.x, ay = a.y, bx = b.x, by = b.y;
  const double l2 = SquaredLength(bx - ax, by - ay);
  if (l2 <= 1e-7) return SquaredLength(px - ax, py - ay) <= 1e-7 ? 1 : 0;
  if (px < (ax < bx ? ax : bx) || px > (ax < bx ? bx : ax)) return 0;
  if (py < (ay < by ? ay : by) || py > (ay < by ? by : ay)) return 0;
  const double cross = (py - ay) * (bx - ax) - (px - ax) * (by - ay);
  return cross * cross / l2 <= 1e-7 ? 1 : 0;
}

template <class T>
int ZvPoint2_IsInTriangle(const ZvPoint2<T>& p, const ZvPoint2<T>& a, const ZvPoint2<T>& b,
                          const ZvPoint2<T>& c) {
  // Degenerate triangles and near-boundary points fall back to edge tests. The fallback asks
  // whether a vertex lies on the segment from the next vertex to p; that argument order is kept
  // on purpose, as callers depend on the answers it gives.
  const double eps = 1e-7;
  if (SquaredLength(double(a.x) - b.x, double(a.y) - b.y) <= eps)
    return ZvPoint2_IsInLineSegment(a, c, p);
  if (SquaredLength(double(a.x) - c.x, double(a.y) - c.y) <= eps ||
      SquaredLength(double(b.x) - c.x, double(b.y) - c.y) <= eps)
    return ZvPoint2_IsInLineSegment(a, b, p);
  const T c1 = (p.y - a.y) * (b.x - a.x) - (p.x - a.x) * (b.y - a.y);
  const T c2 = (c.x - b.x) * (p.y - b.y) - (c.y - b.y) * (p.x - b.x);
  if (std::fabs(c1) > eps && std::fabs(c2) > eps) {
    if ((c1 < 0) != (c2 < 0)) return 0;
    const T c3 = (a.x - c.x) * (p.y - c.y) - (a.y - c.y) * (p.x - c.x);
    // Two agreeing signs are taken as inside; the third is deliberately not compared.
    if (std::fabs(c3) > eps) return 1;
  }
  return ZvPoint2_IsInLineSegment(a, b, p) || ZvPoint2_IsInLineSegment(b, c, p) ||
                 ZvPoint2_IsInLineSegment(c, a, p)
             ? 1
             : 0;
}

template ZV_API int ZvPoint2_FindClosestPointOnLineSegment<double>(const ZvPoint2<double>&,
                                                                   const ZvPoint2<double>&,
                                                                   const ZvPoint2<double>&, double,
                                                                   double&, double&);
template ZV_API int ZvPoint3_FindClosestPointOnLineSegment<double>(const ZvPoint3<double>&,
                                                                   const ZvPoint3<double>&,
                                                                   const ZvPoint3<double>&, double,
                                                                   double&, double&);
template ZV_API int ZvPoint2_AngleInDegrees<float>(const ZvPoint2<float>&, const ZvPoint2<float>&,
                                                   double&);
template ZV_API int ZvPoint2_AngleInDegrees<double>(const ZvPoint2<double>&,
                                                    const ZvPoint2<double>&, double&);
template ZV_API int ZvPoint2_ParallelProjectionOnLineAB<float>(const ZvPoint2<float>&,
                                                               const ZvPoint2<float>&,
                                                               const ZvPoint2<float>&,
                                                               const ZvPoint2<float>&,
                                                               ZvPoint2<float>&);
template ZV_API int ZvPoint2_IsInTriangle<float>(const ZvPoint2<float>&, const ZvPoint2<float>&,
                                                 const ZvPoint2<float>&, const ZvPoint2<float>&);
template ZV_API int ZvPoint2_IsInLineSegment<float>(const ZvPoint2<float>&, const ZvPoint2<float>&,
                                                    const ZvPoint2<float>&);
