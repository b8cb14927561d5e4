// Flattening of one cubic into a polyline: the 2d, 2f and 3d forms share one algorithm and
// differ only in the policies below.
#include <zv/bezier_tool.h>

#include "curvemath/cubic_steps.h"

namespace {

// Plane curves in double. Forward differencing is capped at 2^10 steps per piece: these
// polylines feed the rasterisers, whose edge tables are sized on that bound.
struct Flat2d {
  using Geom = ZvCubicGeom2;
  using Source = ZvPoint2<double>;
  using Array = ZvPoint2dArray;
  static constexpr unsigned int kMaxLevels = 10;
  static ZvPoint2<double> Widen(const Source& s) { return s; }
  static void Emit(Array& out, const ZvPoint2<double>& q) { out.Add(q); }
};

// Plane curves stored in float: computed in double, each point rounded as it is added.
struct Flat2f {
  using Geom = ZvCubicGeom2;
  using Source = ZvPoint2<float>;
  using Array = ZvPoint2fArray;
  static constexpr unsigned int kMaxLevels = ~0u;
  static ZvPoint2<double> Widen(const Source& s) { return {s.x, s.y}; }
  static void Emit(Array& out, const ZvPoint2<double>& q) { out.Add(q.x, q.y); }
};

struct Flat3d {
  using Geom = ZvCubicGeom3;
  using Source = ZvPoint3<double>;
  using Array = ZvPoint3dArray;
  static constexpr unsigned int kMaxLevels = ~0u;
  static ZvPoint3<double> Widen(const Source& s) { return s; }
  static void Emit(Array& out, const ZvPoint3<double>& q) { out.Add(q); }
};

// Emits the interior points of one piece in 2^levels equal parameter steps.
template <class F>
void CubicForwardDifferencing(const typename F::Geom::Point* p, double factor,
                              typename F::Array& out) {
  const ZvCubicDifferences<typename F::Geom> diff(p, factor);
  const unsigned int levels = diff.levels < F::kMaxLevels ? diff.levels : F::kMaxLevels;
  // A 32-bit shift: huge level counts wrap, as the step count is a 32-bit quantity.
  const unsigned int n = 1u << (levels & 31u);
  if (n <= 1) return;
  ZvForwardStepper<typename F::Geom> walk(p[0], diff, levels);
  for (unsigned int i = 1; i < n; ++i)
    F::Emit(out, walk.Step());
}

// Halves the piece depth times without any flatness test (the depth was fixed from the whole
// curve), emitting the shared midpoints between the walks of the two halves, in increasing t.
template <class F>
void CubicMidpointSubdivision(const typename F::Geom::Point* p, unsigned int depth, double factor,
                              typename F::Array& out) {
  typename F::Geom::Point left[4], right[4];
  zvSplitCubicAtHalf(p, left, right);
  if (depth != 1) {
    CubicMidpointSubdivision<F>(left, depth - 1, factor, out);
    F::Emit(out, left[3]);
    CubicMidpointSubdivision<F>(right, depth - 1, factor, out);
  } else {
    CubicForwardDifferencing<F>(left, factor, out);
    F::Emit(out, left[3]);
    CubicForwardDifferencing<F>(right, factor, out);
  }
}

template <class F>
unsigned int FlattenCubic(const typename F::Source* src, double tolerance, typename F::Array* out,
                          int skipFirst) {
  if (!src || !out) return 0;
  // Local copies: the caller's control points may live in the very array being appended to.
  const typename F::Source first = src[0], last = src[3];
  const typename F::Geom::Point p[4] = {F::Widen(src[0]), F::Widen(src[1]), F::Widen(src[2]),
                                        F::Widen(src[3])};
  const unsigned int before = out->size;
  if (!skipFirst) out->Add(first);
  double factor;
  const unsigned int depth = zvCubicSubdivisionDepth<typename F::Geom>(p, tolerance, factor);
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
