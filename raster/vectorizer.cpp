// ZvVectorizer: the thresholds, and the entry points that run the sweep.
#include <zv/path2f.h>
#include <zv/vectorizer.h>

#include "raster/ob_context.h"
#include "raster/vect_path.h"
#include "shape/shape_lock.h"

#include <cmath>

struct ZvVectorizer::Thresholds {
  double perimeter;
  double area;
};

ZvVectorizer::ZvVectorizer(double perimeterThreshold, double areaThreshold)
    : thresholds(new Thresholds{std::fabs(perimeterThreshold), std::fabs(areaThreshold)}) {}

ZvVectorizer::~ZvVectorizer() {
  delete thresholds;
}

void ZvVectorizer::SetPerimeterThreshold(double threshold) {
  thresholds->perimeter = std::fabs(threshold);
}
void ZvVectorizer::SetAreaThreshold(double threshold) {
  thresholds->area = std::fabs(threshold);
}
double ZvVectorizer::GetPerimeterThreshold() const {
  return thresholds->perimeter;
}
double ZvVectorizer::GetAreaThreshold() const {
  return thresholds->area;
}

namespace {
// The sweep over `raster` with the given consumer. Result: 0 for a raster out of range, else 1.
int Sweep(double perimeter, double area, const ZvRaster<unsigned char>& raster, unsigned char value,
          const ZvExtent2<float>& extent, const ObCallbackTable& table, void* userData,
          ObEmitter emit) {
  // Corners are 16-bit, offset by 2 and one flush row past the end.
  const int kMaxSide = 32767;
  if (raster.GetWidth() > kMaxSide || raster.GetHeight() > kMaxSide) return 0;
  ObContext ctx{};
  ctx.table = table;
  ctx.emit = emit;
  ctx.userData = userData;
  ctx.perimeterThreshold = perimeter;
  ctx.areaThreshold = area;
  if (raster.GetWidth() > 0 && raster.GetHeight() > 0) ObVectorize(ctx, raster, value, extent);
  return 1;
}
}  // namespace

int ZvVectorizer::Trace(const ZvRaster<unsigned char>& raster, unsigned char value,
                        const ZvExtent2<float>& extent, const ObCallbackTable& table,
                        void* userData) const {
  return Sweep(thresholds->perimeter, thresholds->area, raster, value, extent, table, userData,
               ObEmitComponent);
}

unsigned int ZvVectorizer::Vectorize(const ZvRaster<unsigned char>& raster, unsigned char value,
                                     const ZvExtent2<float>& extent, ZvPath2f& path) const {
  VectClosure closure(path);
  // One hold for the whole trace: the appends below then take the recursive lock without a
  // round trip to the other threads, and no reader sees half a component.
  ZvShapeLock guard(path);
  Sweep(thresholds->perimeter, thresholds->area, raster, value, extent, VectPathTable(), &closure,
        ObEmitComponentToPath);
  return closure.emitted;
}

unsigned int ZvVectorizer::VectorizeAndFit(const ZvRaster<unsigned char>& raster,
                                           unsigned char value, const ZvExtent2<float>& extent,
                                           const ZvGC& gc, ZvPath2f& path) const {
  ZvPath2f polygons(1);
  if (!Vectorize(raster, value, extent, polygons)) return 0;
  ZvShapeLock guard(path);
  return VectFitPolygons(polygons, gc, path);
}
