// Flattening of the closed subpaths of ZvPath2f, clipped as polygons, for the rasterisers.
//
// The rasterisers must never see coordinates far outside their raster, so each closed subpath
// is clipped to the caller's extent by four Sutherland-Hodgman passes. The output polygon keeps
// the winding of the input and lies inside the extent, bounds included.
#include <zv/path2f.h>

#include "shape/path2f_measure.h"
#include "shape/shape_lock.h"

namespace {

// One half-plane: coordinate `axis` (0 x, 1 y) at least (kMin) or at most `bound`.
template <int axis, bool kMin>
struct HalfPlane {
  double bound;

  static double A(const ZvPoint2<double>& p) { return axis == 0 ? p.x : p.y; }
  static double O(const ZvPoint2<double>& p) { return axis == 0 ? p.y : p.x; }

  bool Inside(const ZvPoint2<double>& p) const { return kMin ? A(p) >= bound : bound >= A(p); }

  // Where edge q-r meets the bound. An edge lying along the bound (its extent on the axis
  // within 1e-15) crosses at its middle.
  ZvPoint2<double> Crossing(const ZvPoint2<double>& q, const ZvPoint2<double>& r) const {
    const double w = A(q) - A(r);
    double o;
    if (w < -1e-15 || w > 1e-15) {
      o = (bound - A(q)) * (O(r) - O(q)) / (A(r) - A(q)) + O(q);
    } else {
      o = (O(q) + O(r)) * 0.5;
    }
    return axis == 0 ? ZvPoint2<double>{bound, o} : ZvPoint2<double>{o, bound};
  }

  // Appends the polygon in[0..n) clipped to the half-plane, starting from its closing edge.
  void Clip(const ZvPoint2<double>* in, unsigned int n, ZvPoint2dArray& out) const {
    ZvPoint2<double> q = in[n - 1];
    bool qInside = Inside(q);
    for (unsigned int i = 0; i < n; ++i) {
      const ZvPoint2<double> r = in[i];
      const bool rInside = Inside(r);
      if (rInside != qInside) out.Add(Crossing(q, r));
      if (rInside) out.Add(r);
      q = r;
      qInside = rInside;
    }
  }
};

}  // namespace

unsigned int ZvPath2f::TransformFlattenAndClipClosedSubPaths(const ZvTransfo4& transform,
                                                             double tolerance,
                                                             const ZvExtent2<double>& extent,
                                                             ZvPoint2dArray& out,
                                                             ZvPointTagArray& tags) const {
  ZvShapeLock guard(*this);
  if (extent.kind == ZvExtent2<double>::Empty) return 0;
  const bool clip = extent.kind != ZvExtent2<double>::Infinite;
  const HalfPlane<0, true> left{extent.xmin};
  const HalfPlane<1, true> bottom{extent.ymin};
  const HalfPlane<0, false> right{extent.xmax};
  const HalfPlane<1, false> top{extent.ymax};

  ZvBezierTool tool;
  ZvPoint2dArray polygon(64), work(64);
  unsigned int written = 0;
  zvForEachSubpath(*this, [&](unsigned int s, unsigned int e) {
    if (e <= s + 1 || !ZvPath2fMeasure::IsClosed(*this, e)) return;
    if (polygon.capacity < e - s + 1) polygon.Resize(e - s + 1);
    polygon.Chop(0);
    ZvPath2fMeasure::FlattenSubpath<ZvFlattenInDouble>(*this, s, e, &transform, tolerance, polygon,
                                                       tool);
    // The end repeats the start: without it the polygon is implicitly closed.
    polygon.Chop(polygon.size - 1);
    if (polygon.size == 0) return;
    const unsigned int before = out.size;
    if (!clip) {
      out.Add(polygon);
    } else {
      work.Chop(0);
      left.Clip(polygon.data, polygon.size, work);
      if (work.size == 0) return;
      polygon.Chop(0);
      bottom.Clip(work.data, work.size, polygon);
      if (polygon.size == 0) return;
      work.Chop(0);
      right.Clip(polygon.data, polygon.size, work);
      if (work.size == 0) return;
      top.Clip(work.data, work.size, out);
    }
    const unsigned int m = out.size - before;
    if (m == 0) return;
    out.Add(out[before]);
    zvAppendSubpathTags(tags, m);
    ++written;
  });
  return written;
}
