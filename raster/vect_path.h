// The callback table that writes traced contours into a ZvPath2f, and the fitting of traced
// polygons with cubics.
#ifndef ZV_RASTER_VECT_PATH_H
#define ZV_RASTER_VECT_PATH_H

#include <zv/arrays.h>
#include <zv/point.h>
#include <zv/vectorizer.h>

#include <cmath>

class ZvBezierTool;
class ZvGC;
class ZvPath2f;

// The path callbacks' user data. A contour's corners gather in `contour` and reach the path in
// one append when the contour ends, so a trace takes the path's lock and grows its arrays once a
// contour rather than once a corner; the buffer is reused from contour to contour.
struct VectClosure {
  explicit VectClosure(ZvPath2f& target)
      : path(&target), contour(256), emitted(0), newComponent(0) {}
  ZvPath2f* path;
  ZvPoint2fArray contour;  // corners of the present contour, not in the path yet
  unsigned int emitted;    // points counted for the whole call
  int newComponent;        // set until the first contour of a component starts
};

// Hands the gathered contour to the path in one call, closed or not, and empties the buffer.
void VectFlush(VectClosure& closure, int close);

// Whether p continues the edge between the contour's last two corners in the same direction, so
// that the edge can simply be lengthened. A step back is never merged, so unit edges make no
// spikes.
inline int ShouldExtendLastSegment(const VectClosure& closure, const ZvPoint2<float>& p) {
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

// The callbacks. They are defined here so that the sweep's own emitter, which calls them for
// every corner, can inline them; the table below holds their addresses for everything else.
inline void VectInit(const ZvExtent2<float>&, void*) {}

inline void VectNewComponent(void* closure) {
  static_cast<VectClosure*>(closure)->newComponent = 1;
}

inline void VectMoveto(int x, int y, void* closure) {
  VectClosure& c = *static_cast<VectClosure*>(closure);
  // A component's first contour starts fresh; the others close the contour before them.
  if (c.contour.size) VectFlush(c, !c.newComponent);
  c.newComponent = 0;
  c.contour.Add(ZvPoint2<float>{static_cast<float>(x), static_cast<float>(y)});
  ++c.emitted;
}

inline void VectLineto(int x, int y, void* closure) {
  VectClosure& c = *static_cast<VectClosure*>(closure);
  const ZvPoint2<float> p{static_cast<float>(x), static_cast<float>(y)};
  if (c.contour.size >= 2 && ShouldExtendLastSegment(c, p)) {
    c.contour[c.contour.size - 1] = p;
    return;
  }
  c.contour.Add(p);
  ++c.emitted;
}

inline void VectCloseComponent(void* closure) {
  VectClosure& c = *static_cast<VectClosure*>(closure);
  if (c.contour.size) VectFlush(c, 1);
}

inline void VectClose(void*) {}

// The table of the functions above.
ObCallbackTable VectPathTable();

// The unit tangent at sample `index` of a closed loop of samples whose last repeats the first.
void ComputeTgtVector(const ZvPoint2fArray& samples, unsigned int index, ZvPoint2<double>& tangent);

// Fits samples[first..last] with cubics that leave along t0 and arrive along t1, appending them
// to `path`, which ends at samples[first]. A failed fit splits where it strayed, both halves
// sharing the tangent there.
void FitSamples(ZvBezierTool& tool, const ZvPoint2fArray& samples, const ZvDoubleArray& parameters,
                unsigned int first, unsigned int last, const ZvPoint2<double>& t0,
                const ZvPoint2<double>& t1, double tolerance, ZvPath2f& path);

// Every integer pixel step along the polygon polygons[first..last], whose corners are integers
// joined by horizontal and vertical lines: the first corner, then one sample per unit step. The
// parameters are the running step counts 0, 1, 2...
void VectStepSamples(const ZvPath2f& polygons, unsigned int first, unsigned int last,
                     ZvPoint2fArray& samples, ZvDoubleArray& parameters);

// Each closed polygon of `polygons` resampled and fitted at gc.flattenTolerance into `path`, one
// closed subpath each. Result: points added to `path`.
unsigned int VectFitPolygons(const ZvPath2f& polygons, const ZvGC& gc, ZvPath2f& path);

#endif
