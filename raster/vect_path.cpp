// Traced contours into a path: one closed polyline per contour, collinear unit edges joined.
#include "raster/vect_path.h"

#include <zv/path2f.h>

#include <cmath>

namespace {
VectClosure& Closure(void* p) {
  return *static_cast<VectClosure*>(p);
}

// Hands the gathered contour to the path in one call.
void Flush(VectClosure& c, int close) {
  c.path->AddPolyline(c.contour.data, c.contour.size, close);
  c.contour.Chop(0);
}
}  // namespace

int ShouldExtendLastSegment(const VectClosure& closure, const ZvPoint2<float>& p) {
  const ZvPoint2<float>& a = closure.contour[closure.contour.size - 2];
  const ZvPoint2<float>& b = closure.contour[closure.contour.size - 1];
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
  // A component's first contour starts fresh; the others close the contour before them.
  if (c.contour.size) Flush(c, !c.newComponent);
  c.newComponent = 0;
  c.contour.Add(ZvPoint2<float>{static_cast<float>(x), static_cast<float>(y)});
  ++c.emitted;
}

void VectLineto(int x, int y, void* closure) {
  VectClosure& c = Closure(closure);
  const ZvPoint2<float> p{static_cast<float>(x), static_cast<float>(y)};
  if (c.contour.size >= 2 && ShouldExtendLastSegment(c, p)) {
    c.contour[c.contour.size - 1] = p;
    return;
  }
  c.contour.Add(p);
  ++c.emitted;
}

void VectCloseComponent(void* closure) {
  VectClosure& c = Closure(closure);
  if (c.contour.size) Flush(c, 1);
}

void VectClose(void*) {}

ObCallbackTable VectPathTable() {
  return {VectInit, VectNewComponent, VectMoveto, VectLineto, VectCloseComponent, VectClose};
}
