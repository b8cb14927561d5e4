// The walk shared by every measuring operation of ZvPath2f: subpath by subpath, segment by
// segment, each segment's control points taken, mapped when a transform applies and flattened
// by the cubic free functions or, for other degrees, by ZvBezierTool. The callers hold the
// path's lock; the walk reads the arrays directly so that it costs nothing per point.
#ifndef ZV_SHAPE_PATH2F_MEASURE_H
#define ZV_SHAPE_PATH2F_MEASURE_H

#include <zv/bezier_fit.h>
#include <zv/bezier_tool.h>
#include <zv/path2f.h>
#include <zv/transfo4.h>

// The single-precision flatteners, reading the path's float points.
struct ZvFlattenInFloat {
  using Point = ZvPoint2<float>;
  using Array = ZvPoint2fArray;
  static unsigned int Segment(ZvBezierTool& tool, const Point* p, unsigned int degree,
                              double tolerance, Array& out) {
    if (degree == 3) return ZvBezierTool_FlattenCubic2f(p, tolerance, &out, 1);
    return tool.Flatten(p, 0, degree, tolerance, &out, 1);
  }
};

// The double-precision flatteners: points are widened before anything else.
struct ZvFlattenInDouble {
  using Point = ZvPoint2<double>;
  using Array = ZvPoint2dArray;
  static unsigned int Segment(ZvBezierTool& tool, const Point* p, unsigned int degree,
                              double tolerance, Array& out) {
    if (degree == 3) return ZvBezierTool_FlattenCubic2d(p, tolerance, &out, 1);
    return tool.Flatten(p, 0, degree, tolerance, &out, 1);
  }
};

class ZvPath2fMeasure {
 public:
  static const ZvPoint2fArray& Points(const ZvPath2f& path) { return path.points; }
  static unsigned int SubpathEnd(const ZvPath2f& path, unsigned int start) {
    return path.SubpathEnd(start);
  }
  static bool IsClosed(const ZvPath2f& path, unsigned int end);

  // Appends the start point s of the subpath s..e, then the flattened segments, without tags.
  // Returns the count t added by the segments, the start point not included. When `node` lies
  // in s + 1..e, *flatIndex receives the index in `out` of the flattened point that the segment
  // ending on `node` added last. Codes that name no segment are stepped over.
  template <class F>
  static unsigned int FlattenSubpath(const ZvPath2f& path, unsigned int s, unsigned int e,
                                     const ZvTransfo4* transform, double tolerance,
                                     typename F::Array& out, ZvBezierTool& tool,
                                     unsigned int node = 0, unsigned int* flatIndex = nullptr) {
    using Point = typename F::Point;
    const ZvPoint2fArray& pts = path.points;
    Point p[9];
    p[0] = Point{pts[s].x, pts[s].y};
    if (transform) transform->MapInPlace(p[0]);
    out.Add(p[0]);
    unsigned int t = 0;
    for (unsigned int i = s + 1; i <= e;) {
      const unsigned int a = path.StartOfSegment(i), b = path.EndOfSegment(i);
      if (a < s || b < i || b > e) {
        ++i;
        continue;
      }
      const unsigned int degree = b - a;
      for (unsigned int k = 0; k <= degree; ++k)
        p[k] = Point{pts[a + k].x, pts[a + k].y};
      if (transform) transform->MapInPlace(p, degree + 1);
      t += F::Segment(tool, p, degree, tolerance, out);
      if (flatIndex && b == node) *flatIndex = out.size - 1;
      i = b + 1;
    }
    return t;
  }
};

// Calls f(s, e) for each subpath s..e of the path, in order.
template <class F>
void zvForEachSubpath(const ZvPath2f& path, F f) {
  const unsigned int n = ZvPath2fMeasure::Points(path).size;
  for (unsigned int s = 0; s < n;) {
    const unsigned int e = ZvPath2fMeasure::SubpathEnd(path, s);
    f(s, e);
    s = e + 1;
  }
}

// Appends the tags of one flattened subpath whose segments added t points after its start
// point: 0, then t - 1 times 1, then 2.
void zvAppendSubpathTags(ZvPointTagArray& tags, unsigned int t);

#endif
