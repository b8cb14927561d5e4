// The greedy polyline fit through a list of points, shared by the curve kinds that build
// straight segments from samples.
#ifndef ZV_FCURVE_CFC_LINEAR_FIT_H
#define ZV_FCURVE_CFC_LINEAR_FIT_H

#include <zv/arrays.h>

#include <cmath>

// Finite points with strictly ascending parameters: what a curve can be built through.
inline bool CFCPointsAscend(const ZvPoint2dArray& p) {
  for (unsigned int i = 0; i < p.size; ++i) {
    if (!std::isfinite(p[i].x) || !std::isfinite(p[i].y)) return false;
    if (i > 0 && !(p[i].x > p[i - 1].x)) return false;
  }
  return true;
}

// Greedy lines: a line runs from an anchor through the next point while the points after it
// stay within the tolerance vertically; the first one that does not closes the segment at the
// point before it, which anchors the next line. `addPoint` receives the points that become
// keys, in order; one point gives one key. The points must be ascending and not empty.
template <class AddPoint>
void CFCGreedyLinearFit(const ZvPoint2dArray& p, double tolerance, AddPoint addPoint) {
  const unsigned int n = p.size;
  addPoint(p[0]);
  unsigned int anchor = 0;
  for (unsigned int j = anchor + 2; j < n; ++j) {
    const ZvPoint2<double>& a = p[anchor];
    const ZvPoint2<double>& b = p[anchor + 1];
    const double y = a.y + (p[j].x - a.x) * (b.y - a.y) / (b.x - a.x);
    if (std::fabs(y - p[j].y) > tolerance) {
      addPoint(p[j - 1]);
      anchor = j - 1;
    }
  }
  if (n > 1) addPoint(p[n - 1]);
}

#endif
