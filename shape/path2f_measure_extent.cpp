// Tight extents of ZvPath2f (of the curve, not of its control points) and segment extents.
#include <zv/bezier_tool.h>
#include <zv/path2f.h>

#include "shape/path2f_measure.h"
#include "shape/shape_lock.h"

namespace {

void AugmentWithCubic(ZvExtent2<float>& e, const ZvPoint2<float>* p) {
  ZvBezierTool_AugmentExtentWithCubic2fTightExtent(e, p, 1);
}
void AugmentWithCubic(ZvExtent2<double>& e, const ZvPoint2<double>* p) {
  ZvBezierTool_AugmentExtentWithCubic2dTightExtent(e, p, 1);
}

template <class T>
bool Contains(const ZvExtent2<T>& e, const ZvPoint2<T>& p) {
  return p.x >= e.xmin && p.x <= e.xmax && p.y >= e.ymin && p.y <= e.ymax;
}

// Lines add their ends and cubics their quarter-split hulls (skipped when the controls already
// lie inside); other degrees add all their control points, so the result is tight for degrees 1
// and 3 only.
template <class T>
ZvExtent2<T>& TightExtent(const ZvPath2f& path, ZvExtent2<T>& extent) {
  const ZvPoint2fArray& pts = ZvPath2fMeasure::Points(path);
  extent = ZvExtent2<T>();
  auto at = [&](unsigned int i) {
    return ZvPoint2<T>{static_cast<T>(pts[i].x), static_cast<T>(pts[i].y)};
  };
  zvForEachSubpath(path, [&](unsigned int s, unsigned int e) {
    extent.AddPoint(at(s));
    for (unsigned int i = s + 1; i <= e;) {
      const unsigned int a = path.StartOfSegment(i), b = path.EndOfSegment(i);
      if (a < s || b < i || b > e) {
        ++i;
        continue;
      }
      if (b - a == 3) {
        const ZvPoint2<T> p[4] = {at(a), at(a + 1), at(a + 2), at(a + 3)};
        if (!(extent.kind == ZvExtent2<T>::Regular && Contains(extent, p[1]) &&
              Contains(extent, p[2]) && Contains(extent, p[3])))
          AugmentWithCubic(extent, p);
      } else {
        for (unsigned int k = a + 1; k <= b; ++k)
          extent.AddPoint(at(k));
      }
      i = b + 1;
    }
  });
  return extent;
}

}  // namespace

ZvExtent2<float>& ZvPath2f::GetTightExtent(ZvExtent2<float>& extent) const {
  ZvShapeLock guard(*this);
  return TightExtent(*this, extent);
}

ZvExtent2<double>& ZvPath2f::GetTightExtent(ZvExtent2<double>& extent) const {
  ZvShapeLock guard(*this);
  return TightExtent(*this, extent);
}

ZvExtent2<float>& ZvPath2f::GetSegmentExtent(unsigned int index, ZvExtent2<float>& extent) const {
  ZvShapeLock guard(*this);
  extent = ZvExtent2<float>();
  if (index >= points.size) return extent;
  const unsigned int a = StartOfSegment(index), b = EndOfSegment(index);
  for (unsigned int k = a; k <= b; ++k)
    extent.AddPoint(points[k]);
  return extent;
}
