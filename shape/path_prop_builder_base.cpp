// ZvBasePathPropBuilder: the state both pressure builders keep, the two-step end of a subpath,
// and the final fit of its property curve.
#include <zv/gc.h>
#include <zv/path2f_prop1d.h>
#include <zv/path_prop_builder.h>

#include "shape/path_builder_steps.h"

ZvBasePathPropBuilder::ZvBasePathPropBuilder(const ZvGC& gc, ZvPath2fProp1d* path)
    : gc(gc),
      inputPoints(128),
      lastProcessedIndex(0),
      subpathEnded(0),
      endClosed(0),
      firstSamplePending(1),
      firstPointPending(1),
      sampleResidual(0.0),
      samples(64),
      path(path),
      chordLengths(128),
      inputProperties(128),
      firstPathIndex(0) {}

ZvBasePathPropBuilder::~ZvBasePathPropBuilder() = default;

void ZvBasePathPropBuilder::ClearSubpath() {
  inputPoints.Chop(0);
  inputProperties.Chop(0);
  chordLengths.Chop(0);
  lastProcessedIndex = 0;
  subpathEnded = 0;
  endClosed = 0;
  firstSamplePending = 1;
  firstPointPending = 1;
  sampleResidual = 0.0;
  firstPathIndex = 0;
}

void ZvBasePathPropBuilder::Reset() {
  ClearSubpath();
  samples.Chop(0);
}

void ZvBasePathPropBuilder::EndSubpath(const ZvPoint2<float>& p, double property, int close) {
  if (zvAddUnlessCoincident(inputPoints, gc.transform.Map(p))) inputProperties.Add(property);
  subpathEnded = 1;
  endClosed = close;
}

const ZvPoint2fArray& ZvBasePathPropBuilder::EndSubpathAndGetTrailingSamples(
    const ZvPoint2<float>& p, double property, ZvDoubleArray& values, int close) {
  EndSubpath(p, property, close);
  return GetTrailingSamples(values);
}

void ZvBasePathPropBuilder::CloseInput() {
  const unsigned int n = inputPoints.size;
  if (n < 2 || zvBuilderCoincide(inputPoints[n - 1], inputPoints[0])) return;
  // Copies first: the arrays may move while they grow.
  const ZvPoint2<float> firstPoint = inputPoints[0];
  const double firstProperty = inputProperties[0];
  inputPoints.Add(firstPoint);
  inputProperties.Add(firstProperty);
}

void ZvBasePathPropBuilder::FinishCommit(int final) {
  subpathEnded = 0;
  endClosed = 0;
  if (!final) return;
  // The curve grew piece by piece as the stroke came in; one pass over the whole input thins it
  // as a whole.
  FitPropCurve(chordLengths, inputProperties, gc.propertyTolerance, path, firstPathIndex);
  ClearSubpath();
}
