// The callback table that writes traced contours into a ZvPath2f, and the fitting of traced
// polygons with cubics.
#ifndef ZV_RASTER_VECT_PATH_H
#define ZV_RASTER_VECT_PATH_H

#include <zv/arrays.h>
#include <zv/point.h>
#include <zv/vectorizer.h>

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

void VectInit(const ZvExtent2<float>& extent, void* closure);
void VectNewComponent(void* closure);
void VectMoveto(int x, int y, void* closure);
void VectLineto(int x, int y, void* closure);
void VectCloseComponent(void* closure);
void VectClose(void* closure);
// The table of the functions above.
ObCallbackTable VectPathTable();

// Whether p continues the edge between the contour's last two corners in the same direction, so
// that the edge can simply be lengthened. A step back is never merged, so unit edges make no
// spikes.
int ShouldExtendLastSegment(const VectClosure& closure, const ZvPoint2<float>& p);

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
