// Flattening of one cubic into a polyline: the 2d, 2f and 3d forms share one algorithm and
// differ only in the policies below: the point type they compute in, the array they fill and
// how a point is stored in it, and the cap on forward-differencing levels.
#include <zv/bezier_tool.h>

#include "curvemath/cubic_steps.h"

#include <cmath>

namespace {

// Plane curves in double. This form alone caps forward differencing at 2^10 steps per piece;
// the float and space forms and the locators walk as many steps as the deviation asks for.
struct Flat2d {
  using Geom = ZvCubicGeom2;
  using Source = ZvPoint2<double>;
  using Array = ZvPoint2dArray;
  static constexpr unsigned int kMaxLevels = 10;
  static ZvPoint2<double> Widen(const Source& s) { return s; }
  static void Emit(Array& out, const ZvPoint2<double>& q) { out.Add(q.x, q.y); }
  static void Put(ZvPoint2<double>& d, const ZvPoint2<double>& q) { d.x = q.x, d.y = q.y; }
};

// Plane curves stored in float: computed in double, each point rounded as it is added.
struct Flat2f {
  using Geom = ZvCubicGeom2;
  using Source = ZvPoint2<float>;
  using Array = ZvPoint2fArray;
  static constexpr unsigned int kMaxLevels = ~0u;
  static ZvPoint2<double> Widen(const Source& s) { return {s.x, s.y}; }
  static void Emit(Array& out, const ZvPoint2<double>& q) { out.Add(q.x, q.y); }
  static void Put(ZvPoint2<float>& d, const ZvPoint2<double>& q) {
    d.x = static_cast<float>(q.x), d.y = static_cast<float>(q.y);
  }
};

struct Flat3d {
  using Geom = ZvCubicGeom3;
  using Source = ZvPoint3<double>;
  using Array = ZvPoint3dArray;
  static constexpr unsigned int kMaxLevels = ~0u;
  static ZvPoint3<double> Widen(const Source& s) { return s; }
  static void Emit(Array& out, const ZvPoint3<double>& q) { out.Add(q.x, q.y, q.z); }
  static void Put(ZvPoint3<double>& d, const ZvPoint3<double>& q) {
    d.x = q.x, d.y = q.y, d.z = q.z;
  }
};

// Emits the interior points of one piece in 2^levels equal parameter steps; levels comes
// uncapped from zvCubicLevels.
template <class F>
void WalkPiece(const typename F::Geom::Point* p, unsigned int levels, typename F::Array& out) {
  if (levels > F::kMaxLevels) levels = F::kMaxLevels;
  // Nearly every piece takes one or three steps. Three are written unconditionally into the
  // array's spare room (slots past size are free storage) and only the real ones are counted:
  // that spares a loop exit the branch predictor cannot guess, and as no Add runs, the
  // capacity is what one Add per point would have left.
  if (levels <= 2 && out.capacity - out.size >= 3) {
    ZvForwardStepper<typename F::Geom> walk(p, levels);
    auto* dst = out.data + out.size;
    for (int i = 0; i < 3; ++i)
      F::Put(dst[i], walk.Step());
    out.size += (1u << levels) - 1;
    return;
  }
  // A 32-bit shift: huge level counts wrap, as the step count is a 32-bit quantity.
  const unsigned int n = 1u << (levels & 31u);
  if (n <= 1) return;
  ZvForwardStepper<typename F::Geom> walk(p, levels);
  for (unsigned int i = 1; i < n; ++i)
    F::Emit(out, walk.Step());
}

template <class F>
void CubicForwardDifferencing(const typename F::Geom::Point* p, double factor,
                              typename F::Array& out) {
  WalkPiece<F>(p, zvCubicLevels<typename F::Geom>(p, factor), out);
}

// Up to this depth the pieces are cut all at once into a stack buffer (2 KB for plane curves).
constexpr unsigned int kBatchDepth = 5;

// Halves the curve depth times without any flatness test (the depth was fixed from the whole
// curve) and walks every piece, emitting the shared midpoints between the walks, in increasing
// t. The last kBatchDepth halvings are done breadth first into a buffer, so that the step
// counts of all pieces are computed in one pass without branches to mispredict, which keeps
// the square roots and divisions of consecutive pieces overlapping. The values are exactly
// those of halving each piece recursively.
template <class F>
void CubicMidpointSubdivision(const typename F::Geom::Point* p, unsigned int depth, double factor,
                              typename F::Array& out) {
  using Point = typename F::Geom::Point;
  if (depth > kBatchDepth) {
    Point left[4], right[4];
    zvSplitCubicAtHalf(p, left, right);
    CubicMidpointSubdivision<F>(left, depth - 1, factor, out);
    F::Emit(out, left[3]);
    CubicMidpointSubdivision<F>(right, depth - 1, factor, out);
    return;
  }
  Point pieces[4 << kBatchDepth];
  for (int i = 0; i < 4; ++i)
    pieces[i] = p[i];
  // Piece i splits into 2i and 2i + 1; going downwards never overwrites a piece not yet split.
  for (unsigned int count = 1; count < (1u << depth); count <<= 1) {
    for (unsigned int i = count; i-- > 0;) {
      zvSplitCubicAtHalf(pieces + 4 * i, pieces + 8 * i, pieces + 8 * i + 4);
    }
  }
  const unsigned int count = 1u << depth;
  unsigned int levels[1u << kBatchDepth];
  for (unsigned int i = 0; i < count; ++i) {
    levels[i] = zvCubicLevels<typename F::Geom>(pieces + 4 * i, factor);
  }
  for (unsigned int i = 0; i < count; ++i) {
    if (i > 0) F::Emit(out, pieces[4 * i]);
    WalkPiece<F>(pieces + 4 * i, levels[i], out);
  }
}

inline double zvManhattanLength(const ZvPoint2<double>& v) {
  return std::fabs(v.x) + std::fabs(v.y);
}
inline double zvManhattanLength(const ZvPoint3<double>& v) {
  return std::fabs(v.x) + std::fabs(v.y) + std::fabs(v.z);
}

// The interior points a flatten adds, without adding them: the same halvings and step counts.
template <class F>
unsigned long long CountInterior(const typename F::Geom::Point* p, unsigned int depth,
                                 double factor) {
  if (depth == 0) {
    unsigned int levels = zvCubicLevels<typename F::Geom>(p, factor);
    if (levels > F::kMaxLevels) levels = F::kMaxLevels;
    return (1u << (levels & 31u)) - 1;
  }
  typename F::Geom::Point left[4], right[4];
  zvSplitCubicAtHalf(p, left, right);
  return CountInterior<F>(left, depth - 1, factor) + 1 + CountInterior<F>(right, depth - 1, factor);
}

// Fails before anything is added when the flatten would pass the cap. A piece's step count
// grows with its deviation, which its control polygon bounds, so a curve short against the
// tolerance needs at most 2^11 steps in each of at most 2^10 pieces; only longer curves, or
// arrays already near the cap, are counted exactly.
template <class F>
void CheckRoom(const typename F::Geom::Point* p, unsigned int depth, double factor,
               unsigned int size) {
  // Lengths taken coordinate by coordinate: never shorter, and no square roots on the way.
  double reach = 0.0;
  for (int i = 0; i < 3; ++i)
    reach += zvManhattanLength(p[i + 1] - p[i]);
  reach *= factor;
  constexpr unsigned long long kShortBound = (1ull << 21) + (1ull << 10) + 2;
  if (reach < 1048576.0 && kShortBound <= kZvMaxFlattenPoints - size) return;
  const unsigned long long need = CountInterior<F>(p, depth, factor) + 2;
  if (size > kZvMaxFlattenPoints || need > kZvMaxFlattenPoints - size) throw std::bad_alloc();
}

template <class F>
unsigned int FlattenCubic(const typename F::Source* src, double tolerance, typename F::Array* out,
                          int skipFirst) {
  if (!src || !out) return 0;
  // Local copies: the caller's control points may live in the very array being appended to.
  const typename F::Source first = src[0], last = src[3];
  const typename F::Geom::Point p[4] = {F::Widen(src[0]), F::Widen(src[1]), F::Widen(src[2]),
                                        F::Widen(src[3])};
  double factor;
  const unsigned int depth = zvCubicSubdivisionDepth<typename F::Geom>(p, tolerance, factor);
  CheckRoom<F>(p, depth, factor, out->size);
  const unsigned int before = out->size;
  if (!skipFirst) out->Add(first);
  if (depth > 0) {
    CubicMidpointSubdivision<F>(p, depth, factor, *out);
  } else {
    CubicForwardDifferencing<F>(p, factor, *out);
  }
  out->Add(last);
  return out->size - before;
}

}  // namespace

unsigned int ZvBezierTool_FlattenCubic2d(const ZvPoint2<double>* p, double tolerance,
                                         ZvPoint2dArray* out, int skipFirst) {
  return FlattenCubic<Flat2d>(p, tolerance, out, skipFirst);
}

unsigned int ZvBezierTool_FlattenCubic2f(const ZvPoint2<float>* p, double tolerance,
                                         ZvPoint2fArray* out, int skipFirst) {
  return FlattenCubic<Flat2f>(p, tolerance, out, skipFirst);
}

unsigned int ZvBezierTool_FlattenCubic3d(const ZvPoint3<double>* p, double tolerance,
                                         ZvPoint3dArray* out, int skipFirst) {
  return FlattenCubic<Flat3d>(p, tolerance, out, skipFirst);
}
