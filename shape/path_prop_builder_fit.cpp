// ZvBezierFitPathPropBuilder: pen input with pressure fitted by Bezier segments, the property
// recorded along the fitted arc length.
#include <zv/gc.h>
#include <zv/path2f_prop1d.h>
#include <zv/path_prop_builder.h>
#include <zv/polyline.h>

#include "shape/path_builder_fit_steps.h"
#include "shape/path_builder_steps.h"

ZvBezierFitPathPropBuilder::ZvBezierFitPathPropBuilder(const ZvGC& gc, ZvPath2fProp1d* path,
                                                       double longChordDistance,
                                                       double densifySpacing, double fitError,
                                                       unsigned int fitDegree)
    : ZvBasePathPropBuilder(gc, path),
      longChordDistance(longChordDistance),
      densifySpacing(densifySpacing),
      fitDegree(zvClampFitDegree(fitDegree)),
      fitError(fitError),
      cornerFlags(128),
      flattenedWork(64) {}

void ZvBezierFitPathPropBuilder::ClearSubpath() {
  ZvBasePathPropBuilder::ClearSubpath();
  cornerFlags.Chop(0);
  flattenedWork.Chop(0);
}

void ZvBezierFitPathPropBuilder::AddInputPoint(const ZvPoint2<float>& input, double property,
                                               int force) {
  // Densified points take the property where they lie between the pen events.
  const double previous = inputProperties.size ? inputProperties[inputProperties.size - 1] : 0.0;
  zvAddDensifiedInputPoint(gc, inputPoints, gc.transform.Map(input), force, densifySpacing,
                           longChordDistance, [&](unsigned int index, double t) {
                             const double v = previous * (1.0 - t) + property * t;
                             if (index < inputProperties.size)
                               inputProperties[index] = v;
                             else
                               inputProperties.Add(v);
                           });
}

void ZvBezierFitPathPropBuilder::AddTrailingInputPoints(int close) {
  zvMovetoOnce(path, inputPoints, firstPointPending, firstPathIndex);
  if (inputPoints.size == 0) return;
  if (close) CloseInput();
  zvFitTrailingInputPoints(gc, longChordDistance, fitError, fitDegree, lastProcessedIndex, close,
                           inputPoints, chordLengths, cornerFlags, bezierTool, path);
  // The fit leaves a lone point unmeasured; the property needs its length all the same.
  ZvPoint2fArray_ComputeIncrementalChordLength(inputPoints, lastProcessedIndex,
                                               inputPoints.size - 1, chordLengths);
}

void ZvBezierFitPathPropBuilder::AddPropDataAndComputeTrailingSamplePoints(
    unsigned int firstNewIndex, ZvDoubleArray& values, int final, int close) {
  samples.Chop(0);
  values.Chop(0);
  const unsigned int n = inputPoints.size, i = lastProcessedIndex;
  if (n == 0) return;
  zvFlattenNewSegments(gc, *path, firstNewIndex, firstPathIndex, bezierTool, flattenedWork);
  const int first = firstSamplePending;
  if (first) {
    samples.Add(flattenedWork[0]);
    firstSamplePending = 0;
  }
  const double residual = sampleResidual;
  double length;
  const unsigned int count =
      SampleSubpath(flattenedWork, 0, flattenedWork.size - 1, gc.sampleSpacing, length,
                    sampleResidual, samples, final);
  // The samples lie on the fitted segments, whose length differs from the input's chords: the
  // new input lengths are scaled to agree with the fit, so that the curve is read where the
  // samples are.
  const double c0 = chordLengths[i], c1 = chordLengths[n - 1];
  const double f = c1 != c0 ? length / (c1 - c0) : length;
  for (unsigned int k = i + 1; k < n; ++k)
    chordLengths[k] = c0 + (chordLengths[k] - c0) * f;
  AddPropCurveStretch(inputPoints, chordLengths, inputProperties, i, n - 1, path, firstPathIndex,
                      gc.propertyTolerance, close);
  if (first) values.Add(path->EvalPropCurve(firstPathIndex, 0.0));
  SamplePropCurve(path, firstPathIndex, c0, chordLengths[n - 1], gc.sampleSpacing, residual,
                  gc.propertyTolerance, count, values);
  lastProcessedIndex = n - 1;
}

const ZvPoint2fArray& ZvBezierFitPathPropBuilder::GetTrailingSamples(ZvDoubleArray& values) {
  const int close = endClosed, final = subpathEnded;
  const unsigned int firstNew = path->NumPoints();
  AddTrailingInputPoints(close);
  AddPropDataAndComputeTrailingSamplePoints(firstNew, values, final, close);
  FinishCommit(final);
  return samples;
}
