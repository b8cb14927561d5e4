// ZvLinearPathPropBuilder: pen input with pressure as a polyline, the property recorded along
// the input's arc length.
#include <zv/gc.h>
#include <zv/path2f_prop1d.h>
#include <zv/path_prop_builder.h>
#include <zv/polyline.h>

#include "shape/path_builder_steps.h"

ZvLinearPathPropBuilder::ZvLinearPathPropBuilder(const ZvGC& gc, ZvPath2fProp1d* path)
    : ZvBasePathPropBuilder(gc, path) {}

void ZvLinearPathPropBuilder::AddInputPoint(const ZvPoint2<float>& input, double property,
                                            int force) {
  const ZvPoint2<float> p = gc.transform.Map(input);
  if (!force && inputPoints.size && zvBuilderNear(gc, p, inputPoints[inputPoints.size - 1])) return;
  inputPoints.Add(p);
  inputProperties.Add(property);
}

void ZvLinearPathPropBuilder::AddTrailingInputPoints(int close) {
  zvMovetoOnce(path, inputPoints, firstPointPending, firstPathIndex);
  if (inputPoints.size == 0) return;
  if (close) CloseInput();
  ZvPoint2fArray_ComputeIncrementalChordLength(inputPoints, lastProcessedIndex,
                                               inputPoints.size - 1, chordLengths);
  zvLinetoTrailingInputPoints(path, inputPoints, lastProcessedIndex, close);
}

void ZvLinearPathPropBuilder::ComputeTrailingSamplePoints(ZvDoubleArray& values, int final) {
  samples.Chop(0);
  values.Chop(0);
  const unsigned int n = inputPoints.size;
  if (n == 0) return;
  if (firstSamplePending) {
    samples.Add(inputPoints[0]);
    values.Add(path->EvalPropCurve(firstPathIndex, 0.0));
    firstSamplePending = 0;
  }
  const double residual = sampleResidual;
  double length;
  const unsigned int count = SampleSubpath(inputPoints, lastProcessedIndex, n - 1, gc.sampleSpacing,
                                           length, sampleResidual, samples, final);
  SamplePropCurve(path, firstPathIndex, chordLengths[lastProcessedIndex], chordLengths[n - 1],
                  gc.sampleSpacing, residual, gc.propertyTolerance, count, values);
  lastProcessedIndex = n - 1;
}

const ZvPoint2fArray& ZvLinearPathPropBuilder::GetTrailingSamples(ZvDoubleArray& values) {
  const int close = endClosed, final = subpathEnded;
  const unsigned int n = inputPoints.size;
  if (n) SmoothTrailingInputPoints(gc, lastProcessedIndex, n - 1, inputPoints);
  AddTrailingInputPoints(close);
  if (n)
    AddPropCurveStretch(inputPoints, chordLengths, inputProperties, lastProcessedIndex,
                        inputPoints.size - 1, path, firstPathIndex, gc.propertyTolerance, close);
  ComputeTrailingSamplePoints(values, final);
  FinishCommit(final);
  return samples;
}
