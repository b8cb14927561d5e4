// Random small rasters through the tracer. Traced with no thresholds, the contours filled under
// the even-odd rule must give back the region pixel for pixel; with the input's thresholds they
// may only be fewer. The fitted contours must be as many, closed, finite, and stay near the
// raster.
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/vectorizer.h>

#include "tests/raster/trace_support.h"

#include <cmath>
#include <cstdint>
#include <cstdlib>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const TraceInput in = DecodeTraceInput(data, size);
  const ZvRaster<unsigned char>& r = in.raster;
  const int w = r.GetWidth(), h = r.GetHeight();

  ZvVectorizer exact(0, 0);
  ZvPath2f path;
  const unsigned int n = exact.Vectorize(r, in.value, r.GetExtent2f(), path);
  if (n != path.NumPoints()) std::abort();
  if (CountDifferences(FillEvenOdd(path, w, h), RegionMask(r, in.value)) != 0) std::abort();

  ZvVectorizer small(in.perimeter, in.area);
  ZvPath2f kept;
  small.Vectorize(r, in.value, r.GetExtent2f(), kept);
  if (kept.NumSubpaths() > path.NumSubpaths()) std::abort();

  ZvGC gc;
  gc.flattenTolerance = 0.5 + (size ? data[size - 1] % 4 : 0);
  ZvPath2f fitted;
  const unsigned int m = exact.VectorizeAndFit(r, in.value, r.GetExtent2f(), gc, fitted);
  if (m != fitted.NumPoints() || (m == 0) != (n == 0)) std::abort();
  if (fitted.NumSubpaths() != path.NumSubpaths()) std::abort();
  ZvPath2fIter it(fitted);
  unsigned int first = 0, last = 0;
  while (it.GetNextSubPathIndices(first, last))
    if (!fitted.IsSubpathClosed(first)) std::abort();
  ZvPoint2fArray points;
  ZvPointTagArray tags;
  fitted.AltFlatten(0.25, points, tags);
  const double margin = 2 * gc.flattenTolerance + 2;
  for (unsigned int i = 0; i < points.size; ++i) {
    const ZvPoint2<float> p = points[i];
    if (!std::isfinite(p.x) || !std::isfinite(p.y)) std::abort();
    if (p.x < -margin || p.y < -margin || p.x > w + margin || p.y > h + margin) std::abort();
  }
  return 0;
}
