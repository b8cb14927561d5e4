// ZvBasePathBuilder: the state every builder keeps, the subpath start, and the sampling of what
// was committed.
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/path_builder.h>
#include <zv/polyline.h>

#include <cmath>
#include <new>

#include "shape/path_builder_steps.h"

ZvBasePathBuilder::ZvBasePathBuilder(const ZvGC& gc, ZvPath2f* path)
    : gc(gc),
      path(path),
      inputPoints(128),
      lastProcessedIndex(0),
      firstPathIndex(0),
      firstSamplePending(1),
      firstPointPending(1),
      sampleResidual(0.0),
      samples(64) {}

ZvBasePathBuilder::~ZvBasePathBuilder() = default;

void ZvBasePathBuilder::Reset() {
  inputPoints.Chop(0);
  lastProcessedIndex = 0;
  firstPathIndex = 0;
  firstSamplePending = 1;
  firstPointPending = 1;
  sampleResidual = 0.0;
  samples.Chop(0);
}

void ZvBasePathBuilder::StartSubpath(const ZvPoint2<float>& p) {
  Reset();
  inputPoints.Add(MapInput(p));
}

void ZvBasePathBuilder::StartSubpath(const ZvPoint2<float>& p, ZvPath2f* target) {
  Reset();
  path = target;
  inputPoints.Add(MapInput(p));
}

void ZvBasePathBuilder::ReserveInput(unsigned int count) {
  zvReserve(inputPoints, count);
}

ZvPoint2<float> ZvBasePathBuilder::MapInput(const ZvPoint2<float>& p) const {
  return gc.transform.Map(p);
}

void ZvBasePathBuilder::AddEndPoint(const ZvPoint2<float>& p) {
  zvAddUnlessCoincident(inputPoints, MapInput(p));
}

void ZvBasePathBuilder::ComputeTrailingSamplePoints(unsigned int firstNewIndex, int final,
                                                    ZvBezierTool& tool, ZvPoint2fArray& work) {
  samples.Chop(0);
  const unsigned int n = inputPoints.size;
  if (lastProcessedIndex >= n) return;
  zvFlattenNewSegments(gc, *path, firstNewIndex, firstPathIndex, tool, work);
  if (firstSamplePending) {
    samples.Add(work[0]);
    firstSamplePending = 0;
  }
  double length;
  SampleSubpath(work, 0, work.size - 1, gc.sampleSpacing, length, sampleResidual, samples, final);
  lastProcessedIndex = n - 1;
}

void zvFlattenNewSegments(const ZvGC& gc, const ZvPath2f& path, unsigned int firstNewIndex,
                          unsigned int firstPathIndex, ZvBezierTool& tool, ZvPoint2fArray& work) {
  const unsigned int m = path.NumPoints();
  work.Chop(0);
  // New segments start on the node before them, unless the subpath itself is new.
  const unsigned int start = firstNewIndex == firstPathIndex ? firstNewIndex : firstNewIndex - 1;
  work.Add(path.GetPoint(start));
  ZvPoint2<float> control[9];
  for (unsigned int i = start + 1; i < m;) {
    unsigned int a, b;
    if (!path.GetSegmentIndices(i, a, b)) break;
    path.GetPoints(a, b, control);
    tool.Flatten(control, 0, b - a, gc.flattenTolerance, &work, 1);
    i = b + 1;
  }
}

void zvLinetoTrailingInputPoints(ZvPath2f* path, const ZvPoint2fArray& input, unsigned int from,
                                 int close) {
  const unsigned int n = input.size;
  if (n == 0) return;
  for (unsigned int k = from + 1; k < n; ++k)
    path->Lineto(input[k]);
  if (!close) return;
  if (!zvBuilderCoincide(input[n - 1], input[0])) path->Lineto(input[0]);
  path->Closeto();
}

unsigned int SampleSubpath(const ZvPoint2fArray& points, unsigned int first, unsigned int last,
                           double spacing, double& length, double& residual,
                           ZvPoint2fArray& samples, int final) {
  unsigned int count = 0;
  if (first >= last || !(spacing > 0.0)) {
    length = 0.0;
  } else {
    ZvDoubleArray d(last - first + 1);
    ZvPoint2fArray_ComputeChordLength(points, first, last, d);
    length = d[d.size - 1];
    const double total = length + residual;
    if (total >= spacing) {
      // More samples than an array can hold (a wild point) fail as the array itself would.
      const double steps = std::floor(total / spacing);
      if (steps > double(0x80000000u - samples.size)) throw std::bad_alloc();
      count = static_cast<unsigned int>(steps);
      double s = spacing - residual;
      unsigned int i = 1;
      for (unsigned int k = 0; k < count; ++k, s += spacing) {
        // Rounding may carry the last position a hair past the end: it stays on the last edge.
        while (i + 1 < d.size && d[i] < s)
          ++i;
        const double span = d[i] - d[i - 1];
        const double t = span > 0.0 ? (s - d[i - 1]) / span : 1.0;
        const ZvPoint2<float>& a = points[first + i - 1];
        const ZvPoint2<float>& b = points[first + i];
        samples.Add(a.x + (double(b.x) - a.x) * t, a.y + (double(b.y) - a.y) * t);
      }
      residual = total - count * spacing;
    } else {
      residual = total;
    }
  }
  // The end gets a sample of its own only when it lies well past the last one.
  if (!final || residual <= spacing * 0.1) return count;
  samples.Add(points[points.size - 1]);
  residual = 0.0;
  return count + 1;
}

void SmoothTrailingInputPoints(const ZvGC& gc, unsigned int first, unsigned int last,
                               ZvPoint2fArray& points) {
  // In a dense run smoothing would only pile points onto each other: leave it alone.
  zvSmoothRun<float>(points, first, last, [&](const ZvPoint2<float>& s, unsigned int j) {
    return !zvBuilderNear(gc, s, points[j - 1]);
  });
}
