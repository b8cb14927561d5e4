// AddFittedSamplesFromPath: a smoothed copy of a path, resampled and refitted with cubics.
#include <zv/bezier_fit.h>
#include <zv/gc.h>
#include <zv/path2f.h>

#include "shape/path2f_measure.h"
#include "shape/shape_lock.h"

unsigned int ZvPath2f::AddFittedSamplesFromPath(const ZvGC& gc, const ZvPath2f& source) {
  ZvShapeLock guard(*this);
  ZvShapeLock guardSource(source);
  if (&source == this) {
    // The fit appends to this path while reading the source: read from a snapshot.
    const ZvPath2f copy(source);  // NOLINT(performance-unnecessary-copy-initialization)
    return AddFittedSamplesFromPath(gc, copy);
  }
  const unsigned int before = points.size;
  ZvPoint2fArray samples(64);
  ZvPointTagArray tags(64);
  source.Sample(gc, samples, tags);
  ZvBezierTool tool;
  ZvPoint2fArray work(64);
  unsigned int s = 0;  // the source subpath matching the scratch subpath at i
  for (unsigned int i = 0; i < samples.size && s < source.points.size;) {
    unsigned int j = i;
    while (j + 1 < samples.size && tags[j] != ZvPointTag_Last)
      ++j;
    work.Chop(0);
    work.Add(samples, i, j);
    const unsigned int e = source.SubpathEnd(s);
    if (ZvPath2fMeasure::IsClosed(source, e)) {
      work.Add(work[0]);
      tool.ClosedFit(work, gc.fitTolerance, 3, gc.flattenTolerance, 0, this);
    } else {
      // Samples stop short of the true end, which is kept as it is. The fit continues from a
      // Moveto made here, so that every source subpath stays a subpath of its own.
      work.Add(gc.transform.Map(source.points[e]));
      Moveto(work[0]);
      tool.OpenFit(work, gc.fitTolerance, 3, gc.flattenTolerance, 0, this, 1);
    }
    i = j + 1;
    s = e + 1;
  }
  return points.size - before;
}
