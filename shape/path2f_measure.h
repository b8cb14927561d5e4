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

#include "shape/path_codes.h"

// Whether the transform leaves every plane point exactly where it is: the six entries that act
// on (x, y, 0) are those of the identity, so mapping would change no bit.
inline bool zvActsAsIdentity(const ZvTransfo4& t) {
  const double* m = t.GetMatrixPtr();
  return m[0] == 1.0 && m[1] == 0.0 && m[4] == 0.0 && m[5] == 1.0 && m[12] == 0.0 && m[13] == 0.0;
}

// The single-precision flatteners, reading the path's float points.
struct ZvFlattenInFloat {
  using Point = ZvPoint2<float>;
  using Array = ZvPoint2fArray;
  static unsigned int Segment(ZvBezierTool& tool, const Point* p, unsigned int degree,
                              double tolerance, Array& out) {
    if (degree == 3) return ZvBezierTool_FlattenCubic2f(p, tolerance, &out, 1);
    return tool.Flatten(p, 0, degree, tolerance, &out, 1);
  }
  // Points first..first+count-1 as the flatteners read them, mapped when a transform is given.
  // Without one the path's own storage serves.
  static const Point* Take(const ZvPoint2fArray& pts, unsigned int first, unsigned int count,
                           const ZvTransfo4* transform, Point* buffer) {
    if (!transform) return pts.data + first;
    transform->Map(pts.data + first, count, buffer);
    return buffer;
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
  static const Point* Take(const ZvPoint2fArray& pts, unsigned int first, unsigned int count,
                           const ZvTransfo4* transform, Point* buffer) {
    for (unsigned int k = 0; k < count; ++k)
      buffer[k] = Point{pts.data[first + k].x, pts.data[first + k].y};
    if (transform) transform->MapInPlace(buffer, count);
    return buffer;
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
  //
  // The points are taken (widened, mapped) a block at a time into a stack buffer: one mapping
  // call serves many segments, and no allocation grows with the subpath.
  template <class F>
  static unsigned int FlattenSubpath(const ZvPath2f& path, unsigned int s, unsigned int e,
                                     const ZvTransfo4* transform, double tolerance,
                                     typename F::Array& out, ZvBezierTool& tool,
                                     unsigned int node = 0, unsigned int* flatIndex = nullptr) {
    constexpr unsigned int kBlock = 256;  // holds any segment (at most 9 points)
    if (transform && zvActsAsIdentity(*transform)) transform = nullptr;
    typename F::Point buffer[kBlock];
    unsigned int base = s, limit = 0;
    const typename F::Point* p = nullptr;  // p[k] is point base + k, for base..limit
    auto take = [&](unsigned int from) {
      base = from;
      limit = e - from < kBlock ? e : from + kBlock - 1;
      p = F::Take(path.points, base, limit - base + 1, transform, buffer);
    };
    take(s);
    out.Add(p[0]);
    const unsigned char* codes = path.codes.data;
    unsigned int t = 0;
    for (unsigned int i = s + 1; i <= e;) {
      const zv_path::CodeInfo c = zv_path::Decode(codes[i]);
      const unsigned int end = i + c.degree - 1;
      if (c.position != 1 || end > e) {
        ++i;
        continue;
      }
      if (end > limit) take(i - 1);
      t += F::Segment(tool, p + (i - 1 - base), c.degree, tolerance, out);
      if (flatIndex && end == node) *flatIndex = out.size - 1;
      i = end + 1;
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
// point: 0, then t - 1 times 1, then 2. Written in one block: this runs once per output point.
void zvAppendSubpathTags(ZvPointTagArray& tags, unsigned int t);

#endif
