// The steps the path builders share: point tests, tangent estimates, sampling, smoothing and
// the three ways of turning a run of input points into segments. Builders of paths that carry a
// property along them reuse them.
#ifndef ZV_SHAPE_PATH_BUILDER_STEPS_H
#define ZV_SHAPE_PATH_BUILDER_STEPS_H

#include <zv/arrays.h>
#include <zv/bezier_fit.h>
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/point.h>

#include <cmath>

// Statistics, never read by the library: points added by densifying, points handed to
// FitBezierCurve. Unguarded.
extern unsigned int cAddPts;
extern unsigned int cFitPts;

// Grows an array's capacity to `count` elements, keeping its contents. Chop never gives
// capacity back, so the room stays across strokes.
template <class Array>
void zvReserve(Array& a, unsigned int count) {
  if (a.capacity >= count) return;
  const unsigned int size = a.size;
  a.Resize(count);
  a.Chop(size);
}

// Points coincide within 1e-7 per axis, in single precision.
inline bool zvBuilderCoincide(const ZvPoint2<float>& a, const ZvPoint2<float>& b) {
  const float dx = a.x - b.x, dy = a.y - b.y;
  return dx >= -1e-7f && dx <= 1e-7f && dy >= -1e-7f && dy <= 1e-7f;
}

// Points are near when both axis differences are at most gc.pointMergeDistance.
inline bool zvBuilderNear(const ZvGC& gc, const ZvPoint2<float>& a, const ZvPoint2<float>& b) {
  return std::fabs(double(a.x) - double(b.x)) <= gc.pointMergeDistance &&
         std::fabs(double(a.y) - double(b.y)) <= gc.pointMergeDistance;
}

// The cheap distance of the builders: no square root, within 6% of the Euclidean one.
inline double zvOctagonalDistance(const ZvPoint2<float>& a, const ZvPoint2<float>& b) {
  const double dx = std::fabs(double(a.x) - double(b.x));
  const double dy = std::fabs(double(a.y) - double(b.y));
  return dx > dy ? dx + 0.3334 * dy : 0.3334 * dx + dy;
}

// Unit vector, or the vector itself when it is too short to have a direction (within 1e-7 on
// both axes, or a squared length at most 1e-7), so that noise never becomes a huge tangent.
inline ZvPoint2<float> zvSafeNormalize(const ZvPoint2<float>& v) {
  if (std::fabs(v.x) <= 1e-7f && std::fabs(v.y) <= 1e-7f) return v;
  const double l2 = double(v.x) * v.x + double(v.y) * v.y;
  if (l2 <= 1e-7) return v;
  const float inv = static_cast<float>(1.0 / std::sqrt(l2));
  return ZvPoint2<float>{v.x * inv, v.y * inv};
}

// Tangent at point `which` (0, 1, 2) of the circle through p0, p1, p2, pointing along the
// travel p0, p1, p2; not normalised. Coinciding or collinear points give a chord direction.
template <class T>
ZvPoint2<T> ZvPoint2_TangentToCircumCircle(const ZvPoint2<T>& p0, const ZvPoint2<T>& p1,
                                           const ZvPoint2<T>& p2, unsigned int which);

// Unit tangent of the polyline at point i: the central difference, or at a stroke end
// (atStart, atEnd) the tangent of the circle through the end and its next two points when they
// turn enough (squared sine 0.03 or more) and noCircle is 0, else the end edge. Neighbours past
// the array count as the point itself; (0, 0) for an i past the array.
ZvPoint2<float> EstimateTangentDirection(const ZvPoint2fArray& points, unsigned int index,
                                         int atStart, int atEnd, int noCircle);

// Unit direction of what the path already holds: at its end (atPathEnd), or at its start for
// closing; from the input when the path has fewer than two points, (0, 0) with exactly two.
ZvPoint2<double> GetTangentDirectionOnPath(const ZvPoint2fArray& points, const ZvPath2f* path,
                                           int atPathEnd);

// Appends to `samples` the points spacing apart along points[first..last], the first one at
// spacing - residual from points[first], and carries the rest over in `residual`; `length`
// receives the polyline's length. With `final`, a rest above a tenth of the spacing gets the
// array's last point as a sample of its own. Result: samples appended. A spacing that is not
// positive gives no samples; more samples than an array can hold raise std::bad_alloc.
unsigned int SampleSubpath(const ZvPoint2fArray& points, unsigned int first, unsigned int last,
                           double spacing, double& length, double& residual,
                           ZvPoint2fArray& samples, int final);

// Smooths points first+1..last-1 in place (1/4, 1/2, 1/4 of the unsmoothed neighbours), keeping
// a point where its smoothed value would fall near its smoothed predecessor.
void SmoothTrailingInputPoints(const ZvGC& gc, unsigned int first, unsigned int last,
                               ZvPoint2fArray& points);

// The 1/4, 1/2, 1/4 filter over v[first+1..last-1], in place, each value mixed from its
// neighbours as they were before the pass; the ends never move. `accept(s, j)` decides whether
// the smoothed s replaces v[j] (v[j - 1] already holds its own result). Nothing for fewer than
// three values. Scalar is the arithmetic of the values (float for points, double for
// properties).
template <class Scalar, class Array, class Accept>
void zvSmoothRun(Array& v, unsigned int first, unsigned int last, Accept accept) {
  if (last < first + 2) return;
  auto previous = v[first];  // unsmoothed
  for (unsigned int j = first + 1; j < last; ++j) {
    const auto original = v[j];
    const auto s = (previous + v[j + 1]) * Scalar(0.25) + original * Scalar(0.5);
    if (accept(s, j)) v[j] = s;
    previous = original;
  }
}

// Appends q to the input unless the input already ends on it (within 1e-7 per axis): answers
// whether it did.
inline bool zvAddUnlessCoincident(ZvPoint2fArray& input, const ZvPoint2<float>& q) {
  if (input.size && zvBuilderCoincide(q, input[input.size - 1])) return false;
  input.Add(q);
  return true;
}

// The subpath's Moveto, at the first commit that has an input point: the path index of the
// start goes to firstPathIndex and firstPointPending is cleared.
inline void zvMovetoOnce(ZvPath2f* path, const ZvPoint2fArray& input, int& firstPointPending,
                         unsigned int& firstPathIndex) {
  if (!firstPointPending || input.size == 0) return;
  path->Moveto(input[0]);
  firstPathIndex = path->NumPoints() - 1;
  firstPointPending = 0;
}

// Lines to input points from+1..n-1; with `close`, a line back to the first point when the
// ends are apart and the subpath's closing.
void zvLinetoTrailingInputPoints(ZvPath2f* path, const ZvPoint2fArray& input, unsigned int from,
                                 int close);

// Flattens the path's segments from firstNewIndex on into `work` (emptied first), starting at
// the node before them, or at firstNewIndex itself when that is the subpath's start: what the
// last commit drew, as one polyline for sampling.
void zvFlattenNewSegments(const ZvGC& gc, const ZvPath2f& path, unsigned int firstNewIndex,
                          unsigned int firstPathIndex, ZvBezierTool& tool, ZvPoint2fArray& work);

// One curve of `degree` fitted over points[first..last] within e, continuing the path's
// direction unless a corner or the subpath's start says otherwise, or, when it does not fit,
// the two halves recursively.
void FitBezierCurve(const ZvPoint2fArray& points, const ZvDoubleArray& lengths, double e,
                    unsigned int degree, unsigned int first, int startCorner, unsigned int last,
                    int endCorner, int close, ZvBezierTool& tool, ZvPath2f* path);

// One curve whose control polygon is the input points themselves, end handles set along the
// tangents.
void FindBezierCurve(const ZvPoint2fArray& points, unsigned int degree, unsigned int first,
                     int startCorner, unsigned int last, int endCorner, int close, ZvPath2f* path);

// One cubic per input edge, with handles shortened where the tangents stray from the chord.
void CubicInterpolation(const ZvPoint2fArray& points, const ZvDoubleArray& lengths, double e,
                        unsigned int first, int startCorner, unsigned int last, int endCorner,
                        int close, ZvPath2f* path);

#endif
