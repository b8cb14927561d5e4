// Tangent estimates of the path builders: from the input around a point, from a circle through
// a stroke's end, and from what the path already holds.
#include <zv/path2f.h>

#include <cmath>

#include "core/vec.h"
#include "shape/path_builder_steps.h"

template <class T>
ZvPoint2<T> ZvPoint2_TangentToCircumCircle(const ZvPoint2<T>& p0, const ZvPoint2<T>& p1,
                                           const ZvPoint2<T>& p2, unsigned int which) {
  const auto coincide = [](const ZvPoint2<T>& a, const ZvPoint2<T>& b) {
    return std::fabs(a.x - b.x) <= T(1e-7) && std::fabs(a.y - b.y) <= T(1e-7);
  };
  if (coincide(p0, p1)) return which != 1 ? p1 - p0 : p0 - p1;
  if (coincide(p1, p2)) return which == 0 ? p1 - p0 : p0 - p1;
  const auto dot = [](const ZvPoint2<T>& a, const ZvPoint2<T>& b) {
    return double(a.x) * b.x + double(a.y) * b.y;
  };
  // Barycentric weights of the circumcentre from the dot products at p1, p2 and p0.
  const double d0 = dot(p2 - p1, p0 - p1), d1 = dot(p0 - p2, p1 - p2), d2 = dot(p2 - p0, p1 - p0);
  const double c0 = d1 * d2, c1 = d2 * d0, c2 = d0 * d1, sum = c0 + c1 + c2;
  if (std::fabs(sum) < 1e-6) return which <= 1 ? p1 - p0 : p2 - p1;  // collinear
  const T w0 = T(c0 + c1), w1 = T(c1 + c2), w2 = T(c0 + c2), den = T(2.0 * sum);
  const T cx = T(T(T(p0.x * w0) + T(p1.x * w1)) + T(p2.x * w2)) / den;
  const T cy = T(T(T(p0.y * w0) + T(p1.y * w1)) + T(p2.y * w2)) / den;
  const ZvPoint2<T> c{cx, cy};
  const ZvPoint2<T> r0 = p0 - c, r1 = p1 - c, r2 = p2 - c;
  const auto cross = [](const ZvPoint2<T>& a, const ZvPoint2<T>& b) {
    return double(a.x) * b.y - double(b.x) * a.y;
  };
  // The travel turns counter-clockwise when the radii do: the tangent is the radius turned by a
  // quarter the same way.
  const auto perpendicular = [](const ZvPoint2<T>& r, bool ccw) {
    return ccw ? ZvPoint2<T>{-r.y, r.x} : ZvPoint2<T>{r.y, -r.x};
  };
  switch (which) {
    case 0:
      return perpendicular(r0, cross(r0, r1) > 0.0);
    case 1:
      return perpendicular(r1, cross(r1, r2) > 0.0);
    case 2:
      return perpendicular(r2, cross(r1, r2) > 0.0);
    default:
      return ZvPoint2<T>{T(0), T(0)};
  }
}

template ZvPoint2<float> ZvPoint2_TangentToCircumCircle(const ZvPoint2<float>&,
                                                        const ZvPoint2<float>&,
                                                        const ZvPoint2<float>&, unsigned int);

namespace {
// The squared sine of the turn at R, in double; not a number when an edge has no length.
double SquaredSineOfTurn(const ZvPoint2<float>& q, const ZvPoint2<float>& r,
                         const ZvPoint2<float>& s) {
  const double ax = double(r.x) - q.x, ay = double(r.y) - q.y;
  const double bx = double(s.x) - r.x, by = double(s.y) - r.y;
  const double cross = ax * by - ay * bx;
  return cross * cross / ((ax * ax + ay * ay) * (bx * bx + by * by));
}

// A turn this sharp (about 10 degrees) bends the stroke's end enough that the circle through
// three points estimates its direction better than the end edge does.
constexpr double kCircleSine2 = 0.03;
}  // namespace

ZvPoint2<float> EstimateTangentDirection(const ZvPoint2fArray& points, unsigned int i, int atStart,
                                         int atEnd, int noCircle) {
  const unsigned int n = points.size;
  if (i >= n) return ZvPoint2<float>{0.0f, 0.0f};
  const unsigned int before = i > 0 ? i - 1 : 0, after = i + 1 < n ? i + 1 : i;
  ZvPoint2<float> v;
  if (atStart) {
    if (!noCircle && n >= i + 3) {
      const ZvPoint2<float>&q = points[i], &r = points[i + 1], &s = points[i + 2];
      if (!(SquaredSineOfTurn(q, r, s) < kCircleSine2))
        return zvSafeNormalize(ZvPoint2_TangentToCircumCircle(q, r, s, 0));
    }
    v = points[after] - points[i];
  } else if (atEnd) {
    if (!noCircle && i > 1) {
      const ZvPoint2<float>&q = points[i - 2], &r = points[i - 1], &s = points[i];
      if (!(SquaredSineOfTurn(q, r, s) < kCircleSine2))
        return zvSafeNormalize(ZvPoint2_TangentToCircumCircle(q, r, s, 2));
    }
    v = points[i] - points[before];
  } else {
    v = points[after] - points[before];
  }
  return zvSafeNormalize(v);
}

ZvPoint2<double> GetTangentDirectionOnPath(const ZvPoint2fArray& points, const ZvPath2f* path,
                                           int atPathEnd) {
  const unsigned int m = path->NumPoints();
  if (m == 2) return ZvPoint2<double>{0.0, 0.0};
  ZvPoint2<double> v{0.0, 0.0};
  if (m >= 3) {
    const ZvPoint2<float> a = path->GetPoint(atPathEnd ? m - 2 : 0);
    const ZvPoint2<float> b = path->GetPoint(atPathEnd ? m - 1 : 1);
    v = ZvPoint2<double>{double(b.x) - a.x, double(b.y) - a.y};
  } else if (points.size >= 2) {
    // Nothing drawn yet: the input's first edge, or its last one when closing.
    const unsigned int k = atPathEnd ? 0 : points.size - 2;
    v = ZvPoint2<double>{double(points[k + 1].x) - points[k].x,
                         double(points[k + 1].y) - points[k].y};
  }
  if (std::fabs(v.x) <= 1e-9 && std::fabs(v.y) <= 1e-9) return v;
  const double length = zvGuardedLength(v);
  return length > 0.0 ? v * (1.0 / length) : v;
}
