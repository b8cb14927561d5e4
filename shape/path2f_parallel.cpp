// Parallel polylines of ZvPath2f: every point moved along the bisector of its two edge normals.
#include <zv/path2f.h>

#include <cmath>

#include "core/vec.h"
#include "shape/shape_lock.h"

namespace {

// Unit bisectors w[k] of the vertices 0..m-1 of the polygon through all points, the vertex
// before 0 being m-1. An edge shorter than the guard has no normal; where the two normals
// (nearly) cancel the sum is left as it is, so such a vertex barely moves.
void Bisectors(const ZvPoint2fArray& p, unsigned int m, ZvPoint2dArray& w) {
  ZvPoint2dArray normals(m);
  for (unsigned int k = 0; k < m; ++k) {
    const unsigned int j = k == 0 ? m - 1 : k - 1;
    const double nx = static_cast<double>(p[j].y) - p[k].y;
    const double ny = static_cast<double>(p[k].x) - p[j].x;
    const double l = zvGuardedLength2(nx, ny);
    normals.Add(l > 0.0 ? ZvPoint2<double>{nx / l, ny / l} : ZvPoint2<double>{0.0, 0.0});
  }
  for (unsigned int k = 0; k < m; ++k) {
    ZvPoint2<double> s = normals[k] + normals[k + 1 < m ? k + 1 : 0];
    if (!(std::fabs(s.x) <= 1e-7 && std::fabs(s.y) <= 1e-7)) {
      const double l2 = s.x * s.x + s.y * s.y;
      if (l2 > 1e-7) s = s / std::sqrt(l2);
    }
    w.Add(s);
  }
}

// Writes p[k] + w[k] * distance to point k of `out` for k below m, then, for a closed polygon,
// out's point 0 again to m. All points are computed first, so that `out` may be the source.
void WriteParallel(const ZvPoint2fArray& p, const ZvPoint2dArray& w, unsigned int m, bool closed,
                   double distance, ZvPath2f& out) {
  ZvPoint2fArray q(m);
  for (unsigned int k = 0; k < m; ++k)
    q.Add(p[k].x + w[k].x * distance, p[k].y + w[k].y * distance);
  for (unsigned int k = 0; k < m; ++k)
    out.ReplacePoint(k, q[k], 1);
  if (closed) out.ReplacePoint(m, out.GetPoint(0), 1);
}

}  // namespace

int ZvPath2f::GetSimilarPath(float offset, int reverse, ZvPath2f& output) const {
  ZvShapeLock guard(*this);
  ZvShapeLock guardOutput(output);
  const unsigned int n = points.size;
  if (n < 2 || output.points.size != n) return 0;
  const float dx = points[n - 1].x - points[0].x, dy = points[n - 1].y - points[0].y;
  const bool closed = dx >= -1e-6f && dx <= 1e-6f && dy >= -1e-6f && dy <= 1e-6f;
  const unsigned int m = closed ? n - 1 : n;
  ZvPoint2dArray w(m);
  Bisectors(points, m, w);
  WriteParallel(points, w, m, closed, reverse ? -offset : offset, output);
  return 1;
}

int ZvPath2f::GetInwardOutwardPaths(float inward, float outward, ZvPath2f& first,
                                    ZvPath2f& second) const {
  ZvShapeLock guard(*this);
  ZvShapeLock guardFirst(first);
  ZvShapeLock guardSecond(second);
  const unsigned int n = points.size;
  if (n < 2 || first.points.size != n || second.points.size != n) return 0;
  const unsigned int m = n - 1;  // a closed polyline is taken for granted
  ZvPoint2dArray w(m);
  Bisectors(points, m, w);
  WriteParallel(points, w, m, true, -static_cast<double>(inward), first);
  WriteParallel(points, w, m, true, outward, second);
  return 1;
}
