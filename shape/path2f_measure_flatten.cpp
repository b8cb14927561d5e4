// Flattening of ZvPath2f into tagged polylines, in single precision (Flatten, AltFlatten,
// FlattenSubpath) and in double precision through a transform (TransformAndFlatten...).
#include <zv/gc.h>
#include <zv/path2f.h>

#include "shape/path2f_measure.h"
#include "shape/path_codes.h"
#include "shape/shape_lock.h"

bool ZvPath2fMeasure::IsClosed(const ZvPath2f& path, unsigned int end) {
  return zv_path::IsClosedEnd(path.codes[end] & zv_path::kCodeMask);
}

void zvAppendSubpathTags(ZvPointTagArray& tags, unsigned int t) {
  tags.Add(ZvPointTag_First);
  for (unsigned int k = 1; k < t; ++k)
    tags.Add(ZvPointTag_Continue);
  tags.Add(ZvPointTag_Last);
}

namespace {

// Flattens every subpath (or only the closed ones) and tags it. A lone start point has no
// segment to add a point: it is repeated so that its subpath still reads 0, 2.
template <class F>
unsigned int FlattenTagged(const ZvPath2f& path, const ZvTransfo4* transform, double tolerance,
                           bool closedOnly, typename F::Array& points, ZvPointTagArray& tags) {
  ZvBezierTool tool;
  unsigned int subpaths = 0;
  zvForEachSubpath(path, [&](unsigned int s, unsigned int e) {
    if (closedOnly && !ZvPath2fMeasure::IsClosed(path, e)) return;
    const unsigned int start = points.size;
    unsigned int t =
        ZvPath2fMeasure::FlattenSubpath<F>(path, s, e, transform, tolerance, points, tool);
    if (t == 0) {
      points.Add(points[start]);
      t = 1;
    }
    zvAppendSubpathTags(tags, t);
    ++subpaths;
  });
  return subpaths;
}

}  // namespace

unsigned int ZvPath2f::Flatten(const ZvGC& gc, ZvPoint2fArray& out, ZvPointTagArray& tags) const {
  ZvShapeLock guard(*this);
  const unsigned int before = out.size;
  FlattenTagged<ZvFlattenInFloat>(*this, &gc.transform, gc.flattenTolerance, false, out, tags);
  return out.size - before;
}

unsigned int ZvPath2f::AltFlatten(double tolerance, ZvPoint2fArray& out,
                                  ZvPointTagArray& tags) const {
  ZvShapeLock guard(*this);
  const unsigned int before = out.size;
  FlattenTagged<ZvFlattenInFloat>(*this, nullptr, tolerance, false, out, tags);
  return out.size - before;
}

unsigned int ZvPath2f::FlattenSubpath(unsigned int index, double tolerance,
                                      ZvPoint2fArray& out) const {
  ZvShapeLock guard(*this);
  if (index >= points.size) return 0;
  const unsigned int before = out.size;
  ZvBezierTool tool;
  const unsigned int s = SubpathStart(index), e = SubpathEnd(index);
  ZvPath2fMeasure::FlattenSubpath<ZvFlattenInFloat>(*this, s, e, nullptr, tolerance, out, tool);
  return out.size - before;
}

unsigned int ZvPath2f::TransformAndFlattenPath(const ZvTransfo4& transform, double tolerance,
                                               ZvPoint2dArray& out, ZvPointTagArray& tags) const {
  ZvShapeLock guard(*this);
  return FlattenTagged<ZvFlattenInDouble>(*this, &transform, tolerance, false, out, tags);
}

unsigned int ZvPath2f::TransformAndFlattenClosedSubPaths(const ZvTransfo4& transform,
                                                         double tolerance, ZvPoint2dArray& out,
                                                         ZvPointTagArray& tags) const {
  ZvShapeLock guard(*this);
  return FlattenTagged<ZvFlattenInDouble>(*this, &transform, tolerance, true, out, tags);
}
