// Flattening of the closed subpaths of ZvPath2f, clipped as polygons, for the rasterisers.
//
// The rasterisers must never see coordinates far outside their raster, so each closed subpath
// is clipped to the caller's extent by four Sutherland-Hodgman passes, in the order x >= xmin,
// y >= ymin, x <= xmax, y <= ymax. The output polygon keeps the winding of the input and lies
// inside the extent, bounds included.
//
// A pass over a polygon wholly inside its half-plane gives the polygon back unchanged, and a
// curve lies inside the hull of its control points: so the passes whose bound the mapped
// control points clear are skipped, and a subpath that needs none is flattened straight into
// the caller's array. This is the common case of a shape inside its raster, and it costs no
// more per point than flattening alone.
#include <zv/path2f.h>

#include <algorithm>
#include <cmath>

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

struct Clipper {
  HalfPlane<0, true> left;
  HalfPlane<1, true> bottom;
  HalfPlane<0, false> right;
  HalfPlane<1, false> top;

  void Pass(int which, const ZvPoint2dArray& in, ZvPoint2dArray& out) const {
    switch (which) {
      case 0:
        left.Clip(in.data, in.size, out);
        break;
      case 1:
        bottom.Clip(in.data, in.size, out);
        break;
      case 2:
        right.Clip(in.data, in.size, out);
        break;
      default:
        top.Clip(in.data, in.size, out);
        break;
    }
  }
};

// The passes (bit k for pass k) that may cut the subpath s..e mapped by `transform`: the box
// of its control points, mapped as a box, bounds the curve. The flattened points are computed
// and may stray from the hull by rounding; a box that clears a bound by less than a millionth
// of its coordinates' size keeps that pass.
unsigned int PassesNeeded(const ZvPoint2fArray& pts, unsigned int s, unsigned int e,
                          const ZvTransfo4& transform, const ZvExtent2<double>& extent) {
  // Branch-free bounds; a point that is not finite keeps every pass (x - x is 0 only for a
  // finite x).
  float x0 = pts[s].x, x1 = x0, y0 = pts[s].y, y1 = y0;
  bool finite = true;
  for (unsigned int k = s; k <= e; ++k) {
    const ZvPoint2<float> q = pts[k];
    x0 = std::min(x0, q.x);
    x1 = std::max(x1, q.x);
    y0 = std::min(y0, q.y);
    y1 = std::max(y1, q.y);
    finite &= (q.x - q.x == 0.0f) & (q.y - q.y == 0.0f);
  }
  if (!finite) return 15u;
  ZvExtent2<double> box(x0, y0, x1, y1);
  transform.MapInPlace(box);
  const double size = std::fmax(std::fmax(std::fabs(box.xmin), std::fabs(box.xmax)),
                                std::fmax(std::fabs(box.ymin), std::fabs(box.ymax)));
  const double margin = 1e-6 * (1.0 + size);
  unsigned int needed = 0;
  if (!(box.xmin - margin >= extent.xmin)) needed |= 1u;
  if (!(box.ymin - margin >= extent.ymin)) needed |= 2u;
  if (!(box.xmax + margin <= extent.xmax)) needed |= 4u;
  if (!(box.ymax + margin <= extent.ymax)) needed |= 8u;
  return needed;
}

}  // namespace

unsigned int ZvPath2f::TransformFlattenAndClipClosedSubPaths(const ZvTransfo4& transform,
                                                             double tolerance,
                                                             const ZvExtent2<double>& extent,
                                                             ZvPoint2dArray& out,
                                                             ZvPointTagArray& tags) const {
  ZvShapeLock guard(*this);
  if (extent.kind == ZvExtent2<double>::Empty) return 0;
  const bool clip = extent.kind != ZvExtent2<double>::Infinite;
  const Clipper clipper{{extent.xmin}, {extent.ymin}, {extent.xmax}, {extent.ymax}};

  ZvBezierTool tool;
  ZvPoint2dArray polygon(64), work(64);
  unsigned int written = 0;
  zvForEachSubpath(*this, [&](unsigned int s, unsigned int e) {
    if (e <= s + 1 || !ZvPath2fMeasure::IsClosed(*this, e)) return;
    const unsigned int needed = clip ? PassesNeeded(points, s, e, transform, extent) : 0u;
    const unsigned int before = out.size;
    if (needed == 0) {
      ZvPath2fMeasure::FlattenSubpath<ZvFlattenInDouble>(*this, s, e, &transform, tolerance, out,
                                                         tool);
      out.Chop(out.size - 1);  // the end repeats the start: the polygon closes implicitly
    } else {
      polygon.Chop(0);
      ZvPath2fMeasure::FlattenSubpath<ZvFlattenInDouble>(*this, s, e, &transform, tolerance,
                                                         polygon, tool);
      polygon.Chop(polygon.size - 1);
      ZvPoint2dArray* in = &polygon;
      ZvPoint2dArray* next = &work;
      for (int pass = 0; pass < 4 && in->size > 0; ++pass) {
        if (!(needed & (1u << pass))) continue;
        // The last pass needed writes straight into the caller's array.
        const bool last = (needed >> (pass + 1)) == 0;
        ZvPoint2dArray& dst = last ? out : *next;
        dst.Chop(last ? dst.size : 0);
        clipper.Pass(pass, *in, dst);
        if (last) break;
        ZvPoint2dArray* t = in;
        in = next;
        next = t;
      }
    }
    const unsigned int m = out.size - before;
    if (m == 0) return;
    out.Add(out[before]);
    zvAppendSubpathTags(tags, m);
    ++written;
  });
  return written;
}
