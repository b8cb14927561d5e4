// ZvLinearPathBuilder: pen input as a polyline, a run of input along one line kept as one edge.
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/path_builder.h>

#include <cmath>

#include "shape/path_builder_steps.h"

ZvLinearPathBuilder::ZvLinearPathBuilder(const ZvGC& gc, ZvPath2f* path)
    : ZvBasePathBuilder(gc, path),
      direction{0.0f, 0.0f},
      pendingPoint{0.0f, 0.0f},
      hasPendingPoint(0) {}

void ZvLinearPathBuilder::Reset() {
  ZvBasePathBuilder::Reset();
  direction = ZvPoint2<float>{0.0f, 0.0f};
  pendingPoint = ZvPoint2<float>{0.0f, 0.0f};
  hasPendingPoint = 0;
}

void ZvLinearPathBuilder::AddInputPoint(const ZvPoint2<float>& input, int force) {
  const ZvPoint2<float> p = MapInput(input);
  if (force || inputPoints.size == 0) {
    inputPoints.Add(p);
    return;
  }
  const ZvPoint2<float> last = inputPoints[inputPoints.size - 1];
  if (hasPendingPoint && !zvBuilderNear(gc, p, pendingPoint)) {
    const ZvPoint2<float> w = p - last;
    // Still on the run's line (within half the flatten tolerance) and still going forward: the
    // run grows. Doubling back ends it even on the line.
    if (std::fabs(w.y * direction.x - w.x * direction.y) < gc.flattenTolerance * 0.5 &&
        ZvDot(p - pendingPoint, direction) > 0.0f) {
      pendingPoint = p;
      return;
    }
    inputPoints.Add(pendingPoint);
    pendingPoint = p;
    direction = zvSafeNormalize(p - inputPoints[inputPoints.size - 1]);
    return;
  }
  if (zvBuilderNear(gc, p, last)) return;
  pendingPoint = p;
  direction = zvSafeNormalize(p - last);
  hasPendingPoint = 1;
}

void ZvLinearPathBuilder::FlushPendingPoint() {
  if (!hasPendingPoint) return;
  inputPoints.Add(pendingPoint);
  hasPendingPoint = 0;
}

void ZvLinearPathBuilder::AddTrailingInputPoints(int close) {
  zvMovetoOnce(path, inputPoints, firstPointPending, firstPathIndex);
  zvLinetoTrailingInputPoints(path, inputPoints, lastProcessedIndex, close);
}

void ZvLinearPathBuilder::ComputeTrailingSamplePoints(int final) {
  samples.Chop(0);
  if (inputPoints.size == 0) return;
  if (firstSamplePending) {
    samples.Add(inputPoints[0]);
    firstSamplePending = 0;
  }
  const unsigned int last = inputPoints.size - 1;
  double length;
  SampleSubpath(inputPoints, lastProcessedIndex, last, gc.sampleSpacing, length, sampleResidual,
                samples, final);
  lastProcessedIndex = last;
}

const ZvPoint2fArray& ZvLinearPathBuilder::GetTrailingSamples() {
  FlushPendingPoint();
  if (inputPoints.size)
    SmoothTrailingInputPoints(gc, lastProcessedIndex, inputPoints.size - 1, inputPoints);
  AddTrailingInputPoints(0);
  ComputeTrailingSamplePoints(0);
  return samples;
}

const ZvPoint2fArray& ZvLinearPathBuilder::EndSubpath(const ZvPoint2<float>& p, int close) {
  FlushPendingPoint();
  AddEndPoint(p);
  SmoothTrailingInputPoints(gc, lastProcessedIndex, inputPoints.size - 1, inputPoints);
  AddTrailingInputPoints(close);
  ComputeTrailingSamplePoints(1);
  return samples;
}
