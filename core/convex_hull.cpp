#include "core/convex_hull.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <memory>
#include <new>

#if defined(__i386__) && !defined(__SSE2_MATH__)
#include <fpu_control.h>
#endif

namespace {

struct HullPoint {
  double x, y;
};

bool lexLess(const HullPoint& a, const HullPoint& b) {
  return a.x < b.x || (a.x == b.x && a.y < b.y);
}

bool samePoint(const HullPoint& a, const HullPoint& b) {
  return a.x == b.x && a.y == b.y;
}

// The error-free transformations below need every operation rounded to double. SSE2 arithmetic
// does that; the x87 unit keeps 64-bit significands in its registers unless told otherwise, so
// there it is switched to double rounding while a hull or an orientation is computed.
#if defined(__i386__) && !defined(__SSE2_MATH__)
class DoubleRounding {
 public:
  DoubleRounding() {
    _FPU_GETCW(saved_);
    const fpu_control_t rounding = (saved_ & ~_FPU_EXTENDED) | _FPU_DOUBLE;
    _FPU_SETCW(rounding);
  }
  ~DoubleRounding() { _FPU_SETCW(saved_); }
  DoubleRounding(const DoubleRounding&) = delete;
  DoubleRounding& operator=(const DoubleRounding&) = delete;

 private:
  fpu_control_t saved_;
};
#else
class DoubleRounding {
 public:
  DoubleRounding() {}
};
#endif

// a + b = s + e exactly.
inline void twoSum(double a, double b, double& s, double& e) {
  s = a + b;
  const double bv = s - a;
  const double av = s - bv;
  e = (a - av) + (b - bv);
}

// a = hi + lo exactly, each half with at most 26 significant bits, so that products of halves
// are exact. Separate statements keep a compiler from fusing the scaling into the subtraction.
inline void split(double a, double& hi, double& lo) {
  const double scaled = 134217729.0 * a;  // 2^27 + 1
  const double big = scaled - a;
  hi = scaled - big;
  lo = a - hi;
}

// a * b = p + e exactly (Dekker), without relying on a fused multiply-add of the platform.
inline void twoProduct(double a, double b, double& p, double& e) {
  p = a * b;
  double ahi, alo, bhi, blo;
  split(a, ahi, alo);
  split(b, bhi, blo);
  e = ((ahi * bhi - p) + ahi * blo + alo * bhi) + alo * blo;
}

// Sign of the exact sum of the products p[i] * q[i], i < 6. Each product is split into two
// doubles without error and the twelve parts are gathered in a non-overlapping expansion, whose
// most significant part carries the sign.
int exactSignOfProductSum(const double* p, const double* q) {
  double expansion[12];
  int length = 0;
  for (int i = 0; i < 6; ++i) {
    double parts[2];
    twoProduct(p[i], q[i], parts[1], parts[0]);
    for (double part : parts) {
      double carry = part;
      for (int k = 0; k < length; ++k)
        twoSum(carry, expansion[k], carry, expansion[k]);
      expansion[length++] = carry;
    }
  }
  for (int k = length - 1; k >= 0; --k) {
    if (expansion[k] > 0) return 1;
    if (expansion[k] < 0) return -1;
  }
  return 0;
}

int orientation(const HullPoint& a, const HullPoint& b, const HullPoint& c) {
  const double left = (b.x - a.x) * (c.y - a.y);
  const double right = (b.y - a.y) * (c.x - a.x);
  const double det = left - right;
  // Forward error bound of the expression above: beyond it the rounded sign
  // is certain, which is the case for all but nearly collinear triples.
  const double epsilon = 1.1102230246251565e-16;  // 2^-53
  const double bound = (3.0 + 16.0 * epsilon) * epsilon * (std::fabs(left) + std::fabs(right));
  if (det > bound) return 1;
  if (-det > bound) return -1;
  // det = bx cy - bx ay - ax cy - by cx + by ax + ay cx, taken without rounding.
  const double p[6] = {b.x, -b.x, -a.x, -b.y, b.y, a.y};
  const double q[6] = {c.y, a.y, c.y, c.x, a.x, c.x};
  return exactSignOfProductSum(p, q);
}

// Pops the chain while its last two vertices and p do not turn left, then
// appends p. Popping collinear vertices keeps only corners.
void pushCorner(const HullPoint* sorted, uint32_t* chain, int& length, int floor, uint32_t p) {
  while (length >= floor + 2 &&
         orientation(sorted[chain[length - 2]], sorted[chain[length - 1]], sorted[p]) <= 0)
    --length;
  chain[length++] = p;
}

// Copies to out the points that can be corners, and returns their number. The points extreme
// in eight directions, taken counter-clockwise, span a polygon inside the hull, and a point
// strictly inside it is no corner; on spread-out input this leaves little for the sort. The
// polygon need not even be convex, so rounded sums may pick the extremes: a point left of every
// edge of a closed polygon is wound around by it, hence inside the hull of its vertices.
template <class T>
int copyPossibleCorners(const CQNVector2<T>* points, int count, HullPoint* out) {
  // Directions 0, 45, ..., 315 degrees, as weights of x and y.
  const double wx[8] = {1, 1, 0, -1, -1, -1, 0, 1}, wy[8] = {0, 1, 1, 1, 0, -1, -1, -1};
  int extreme[8] = {0, 0, 0, 0, 0, 0, 0, 0};
  double best[8];
  for (int d = 0; d < 8; ++d)
    best[d] = wx[d] * points[0][0] + wy[d] * points[0][1];
  for (int i = 1; i < count; ++i)
    for (int d = 0; d < 8; ++d) {
      const double v = wx[d] * points[i][0] + wy[d] * points[i][1];
      if (v > best[d]) {
        best[d] = v;
        extreme[d] = i;
      }
    }
  HullPoint polygon[8];
  int corners = 0;
  for (int d = 0; d < 8; ++d) {
    const HullPoint v = {double(points[extreme[d]][0]), double(points[extreme[d]][1])};
    if (corners == 0 || !samePoint(v, polygon[corners - 1])) polygon[corners++] = v;
  }
  while (corners > 1 && samePoint(polygon[corners - 1], polygon[0]))
    --corners;
  int kept = 0;
  for (int i = 0; i < count; ++i) {
    const HullPoint p = {double(points[i][0]), double(points[i][1])};
    bool inside = corners >= 3;
    for (int e = 0; e < corners && inside; ++e)
      inside = orientation(polygon[e], polygon[(e + 1) % corners], p) > 0;
    if (!inside) out[kept++] = p;
  }
  return kept;
}

}  // namespace

int CQNGeometry::Orientation(const CQNVector2<double>& a, const CQNVector2<double>& b,
                             const CQNVector2<double>& c) {
  const DoubleRounding rounding;
  return orientation({a[0], a[1]}, {b[0], b[1]}, {c[0], c[1]});
}

template <class T>
int CQNGeometry::BuildConvexHull(int count, const CQNVector2<T>* points, int& hullCount,
                                 CQNVector2<T>* hull) {
  if (count <= 0 || !points || !hull) return 0;
  for (int i = 0; i < count; ++i)
    if (!std::isfinite(points[i][0]) || !std::isfinite(points[i][1])) return 0;
  const DoubleRounding rounding;
  try {
    // Andrew's monotone chain: sort, then one lower and one upper pass.
    std::unique_ptr<HullPoint[]> sorted(new HullPoint[count]);
    const int candidates = copyPossibleCorners(points, count, sorted.get());
    std::sort(sorted.get(), sorted.get() + candidates, lexLess);
    const int n =
        int(std::unique(sorted.get(), sorted.get() + candidates, samePoint) - sorted.get());
    if (n == 1) {
      hull[0] = CQNVector2<T>(T(sorted[0].x), T(sorted[0].y));
      hullCount = 1;
      return 1;
    }
    // The chain holds the lower hull, then the upper hull back to the
    // first point; its length stays below 2 n.
    std::unique_ptr<uint32_t[]> chain(new uint32_t[2 * size_t(n)]);
    int length = 0;
    for (int i = 0; i < n; ++i)
      pushCorner(sorted.get(), chain.get(), length, 0, uint32_t(i));
    const int lowerLength = length;
    for (int i = n - 2; i >= 0; --i)
      pushCorner(sorted.get(), chain.get(), length, lowerLength - 1, uint32_t(i));
    // The last entry repeats the first vertex.
    const int corners = length - 1;
    for (int i = 0; i < corners; ++i) {
      const HullPoint& v = sorted[chain[i]];
      hull[i] = CQNVector2<T>(T(v.x), T(v.y));
    }
    hullCount = corners;
    return 1;
  } catch (const std::bad_alloc&) {
    return 0;
  }
}

template int CQNGeometry::BuildConvexHull<double>(int, const CQNVector2<double>*, int&,
                                                  CQNVector2<double>*);
