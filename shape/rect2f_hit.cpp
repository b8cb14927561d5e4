// Hit tests of ZvRect2f on its corners and edges, with no path.
#include <zv/gc.h>
#include <zv/rect2f.h>

namespace {

struct Corners {
  ZvPoint2<float> a, b, d, c;  // around the outline
};

Corners Mapped(const ZvRect2f& rect, const ZvGC& gc) {
  ZvPoint2<float> a, b, c;
  rect.SetupPointRep(a, b, c);
  Corners k{a, b, b + c - a, c};
  for (ZvPoint2<float>* p : {&k.a, &k.b, &k.d, &k.c})
    gc.transform.MapInPlace(*p);
  return k;
}

bool Inside(const ZvExtent2<float>& e, const ZvPoint2<float>& p) {
  return p.x >= e.xmin && p.x <= e.xmax && p.y >= e.ymin && p.y <= e.ymax;
}

int TouchesOutline(const Corners& k, const ZvExtent2<float>& e) {
  if (e.kind == ZvExtent2<float>::Infinite) return 1;
  if (e.kind != ZvExtent2<float>::Empty &&
      (Inside(e, k.a) || Inside(e, k.b) || Inside(e, k.d) || Inside(e, k.c)))
    return 1;
  return e.IsIntersecting(k.a, k.b) || e.IsIntersecting(k.b, k.d) || e.IsIntersecting(k.d, k.c) ||
         e.IsIntersecting(k.c, k.a);
}

}  // namespace

int ZvRect2f::IsIntersectingExtent(const ZvGC& gc, const ZvExtent2<float>& extent, int) const {
  return TouchesOutline(Mapped(*this, gc), extent);
}

int ZvRect2f::IsInteriorIntersectingExtent(const ZvGC& gc, const ZvExtent2<float>& extent,
                                           int) const {
  const Corners k = Mapped(*this, gc);
  if (TouchesOutline(k, extent)) return 1;
  if (extent.kind != ZvExtent2<float>::Regular) return 0;
  // An extent wholly inside: its middle is in one of the triangles, or, for a rectangle
  // collapsed to a line, on one of the diagonals.
  const ZvPoint2<float> m{(extent.xmin + extent.xmax) * 0.5f, (extent.ymin + extent.ymax) * 0.5f};
  return ZvPoint2_IsInTriangle(m, k.a, k.b, k.c) || ZvPoint2_IsInTriangle(m, k.b, k.d, k.c) ||
         ZvPoint2_IsInTriangle(m, k.a, k.b, k.d) || ZvPoint2_IsInTriangle(m, k.a, k.d, k.c) ||
         ZvPoint2_IsInLineSegment(m, k.a, k.d) || ZvPoint2_IsInLineSegment(m, k.b, k.c);
}
