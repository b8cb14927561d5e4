// Traced contours into a path: one closed polyline per contour, collinear unit edges joined.
#include "raster/vect_path.h"

#include <zv/path2f.h>

#include <cmath>

namespace {
VectClosure& Closure(void* p) {
  return *static_cast<VectClosure*>(p);
}

void Flush(VectClosure& c) {
  if (!c.pending) return;
  c.path->Lineto(c.point);
  c.pending = 0;
}
}  // namespace

int ShouldExtendLastSegment(const VectClosure& closure, const ZvPoint2<float>& p) {
  const ZvPoint2<float>& a = closure.before;
  const ZvPoint2<float>& b = closure.point;
  // Differences of floats are exact in double, so these tests see the exact geometry.
  auto same = [](float u, float v) { return std::fabs(static_cast<double>(u) - v) <= 1e-15; };
  if (b.x > a.x) return same(p.y, b.y) && p.x >= b.x;
  if (b.x < a.x) return same(p.y, b.y) && b.x >= p.x;
  if (b.y > a.y) return same(p.x, b.x) && p.y >= b.y;
  if (b.y < a.y) return same(p.x, b.x) && b.y >= p.y;
  return 0;
}

void VectInit(const ZvExtent2<float>&, void*) {}

void VectNewComponent(void* closure) {
  Closure(closure).newComponent = 1;
}

void VectMoveto(int x, int y, void* closure) {
  VectClosure& c = Closure(closure);
  Flush(c);
  // A component's first contour starts fresh; the others close the contour before them.
  if (c.newComponent)
    c.newComponent = 0;
  else
    c.path->Closeto();
  c.point = {static_cast<float>(x), static_cast<float>(y)};
  c.path->Moveto(c.point);
  ++c.emitted;
  c.contourPoints = 1;
}

void VectLineto(int x, int y, void* closure) {
  VectClosure& c = Closure(closure);
  const ZvPoint2<float> p{static_cast<float>(x), static_cast<float>(y)};
  if (c.contourPoints >= 2 && ShouldExtendLastSegment(c, p)) {
    c.point = p;
    return;
  }
  Flush(c);
  c.before = c.point;
  c.point = p;
  c.pending = 1;
  ++c.emitted;
  ++c.contourPoints;
}

void VectCloseComponent(void* closure) {
  VectClosure& c = Closure(closure);
  Flush(c);
  c.path->Closeto();
}

void VectClose(void*) {}

ObCallbackTable VectPathTable() {
  return {VectInit, VectNewComponent, VectMoveto, VectLineto, VectCloseComponent, VectClose};
}
