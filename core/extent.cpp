#include <zv/point.h>

#include <cmath>

namespace {

// Quick accept of a point against the box with a tolerance. The float form of the intersection
// test skips a comparison when both operands are non-finite, so that an unbounded box edge does
// not reject everything.
template <class T, bool SkipNonFinite>
bool WithinSide(T lo, T c, T tol) {
  if (SkipNonFinite && !std::isfinite(lo) && !std::isfinite(c)) return true;
  return lo - c <= tol;
}

template <class T, bool SkipNonFinite>
bool QuickAccept(const ZvExtent2<T>& e, const ZvPoint2<T>& p, T tol) {
  return WithinSide<T, SkipNonFinite>(e.xmin, p.x, tol) &&
         WithinSide<T, SkipNonFinite>(p.x, e.xmax, tol) &&
         WithinSide<T, SkipNonFinite>(e.ymin, p.y, tol) &&
         WithinSide<T, SkipNonFinite>(p.y, e.ymax, tol);
}

// Liang-Barsky with the parameters kept as fractions a/b (entering) and c/d (leaving), so that
// no division happens until the end points are rewritten.
template <class T>
struct ClipState {
  T a = 0, b = 1, c = 1, d = 1;
  int enter = -1, leave = -1;
};

template <class T>
bool ClipParameters(const ZvExtent2<T>& e, const ZvPoint2<T>& p, const ZvPoint2<T>& q,
                    ClipState<T>& s) {
  const T dx = q.x - p.x, dy = q.y - p.y;
  const T num[4] = {e.xmin - p.x, p.x - e.xmax, e.ymin - p.y, p.y - e.ymax};
  const T den[4] = {dx, -dx, dy, -dy};
  for (int side = 0; side < 4; ++side) {
    const T n = num[side], en = den[side];
    if (en == 0) {
      if (n > 0) return false;
    } else if (en > 0) {
      if (n * s.d > en * s.c) return false;
      if (n * s.b > en * s.a) {
        s.a = n;
        s.b = en;
        s.enter = side;
      }
    } else {
      if (n * s.b > en * s.a) return false;
      if (n * s.d > en * s.c) {
        s.c = -n;
        s.d = -en;
        s.leave = side;
      }
    }
  }
  return true;
}

// Moves `out` onto the given side exactly, the other coordinate interpolated from `from`.
template <class T>
void PlaceOnSide(const ZvExtent2<T>& e, int side, const ZvPoint2<T>& from, T dx, T dy, T t,
                 ZvPoint2<T>& out) {
  switch (side) {
    case 0:
      out = {e.xmin, from.y + t * dy};
      break;
    case 1:
      out = {e.xmax, from.y + t * dy};
      break;
    case 2:
      out = {from.x + t * dx, e.ymin};
      break;
    default:
      out = {from.x + t * dx, e.ymax};
      break;
  }
}

}  // namespace

template <class T>
int ZvExtent2<T>::ClipLineSegmentWhenRegular(ZvPoint2<T>& p, ZvPoint2<T>& q) const {
  const T tol = static_cast<T>(1e-9);
  if (QuickAccept<T, false>(*this, p, tol) && QuickAccept<T, false>(*this, q, tol)) return 1;
  ClipState<T> s;
  if (!ClipParameters(*this, p, q, s)) return 0;
  const ZvPoint2<T> p0 = p;
  const T dx = q.x - p.x, dy = q.y - p.y;
  if (s.d > s.c) PlaceOnSide(*this, s.leave, p0, dx, dy, s.c / s.d, q);
  if (s.a > 0) PlaceOnSide(*this, s.enter, p0, dx, dy, s.a / s.b, p);
  return 1;
}

template <class T>
int ZvExtent2<T>::IsIntersecting(const ZvPoint2<T>& a, const ZvPoint2<T>& b) const {
  if (kind == Empty) return 0;
  if (kind == Infinite) return 1;
  const T tol = static_cast<T>(1e-7);
  if (QuickAccept<T, true>(*this, a, tol) && QuickAccept<T, true>(*this, b, tol)) return 1;
  ClipState<T> s;
  return ClipParameters(*this, a, b, s) ? 1 : 0;
}

template struct ZvExtent2<float>;
template struct ZvExtent2<double>;
