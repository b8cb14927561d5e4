// ZvMorpher: the public face, the shared step count and the fit every morph ends with.
#include <zv/bezier_fit.h>
#include <zv/gc.h>
#include <zv/morpher.h>
#include <zv/path2f_prop1d.h>
#include <zv/polyline.h>

#include <algorithm>
#include <cmath>

#include "shape/morpher_impl.h"

ZvMorpher::ZvMorpher(const ZvPath2fProp1d* a, const ZvPath2fProp1d* b, const ZvGC& gc)
    : impl(new ZvMorpherImpl(a, b, gc)) {}

ZvMorpher::~ZvMorpher() {
  delete impl;
}

int ZvMorpher::LinearMorph(double t, ZvPath2fProp1d& output) {
  return impl->LinearMorph(t, output);
}

int ZvMorpher::TurtleMorph(double t, ZvPath2fProp1d& output) {
  return impl->TurtleMorph(t, output);
}

int ZvMorpher::LinearMotionPathMorph(double t, ZvPath2fProp1d& output) {
  return impl->LinearMotionPathMorph(t, output);
}

int ZvMorpher::SetMotionPath(unsigned int indexA, unsigned int indexB, const ZvPath2f* path) {
  return impl->SetMotionPath(indexA, indexB, path);
}

ZvMorpherImpl::ZvMorpherImpl(const ZvPath2fProp1d* a, const ZvPath2fProp1d* b, const ZvGC& gc)
    : pathA(a), pathB(b), gc(gc), motionPaths(1) {}

int ZvMorpherImpl::SetMotionPath(unsigned int indexA, unsigned int indexB, const ZvPath2f* path) {
  motionPaths.Add(MPathData{indexA, indexB, path});
  return 1;
}

int ZvMorpherImpl::UsableStep() const {
  const double s = gc.pointMergeDistance;
  return s > 0.0 && std::isfinite(s);
}

unsigned int ZvMorpherImpl::StepsFor(double length) const {
  const double steps = std::ceil(length / gc.pointMergeDistance);
  // The negated test also refuses a NaN length, which no count can cover.
  if (!(steps <= ZvMorpher::kMaxSteps)) return 0;
  return steps < 1.0 ? 1 : static_cast<unsigned int>(steps);
}

unsigned int ZvMorpherImpl::FlattenSubpath(const ZvPath2f& path, unsigned int start,
                                           ZvMorphFlat& flat) const {
  flat.start = start;
  flat.closed = path.IsSubpathClosed(start);
  path.FlattenSubpath(start, gc.pointMergeDistance, flat.points);
  flat.length = ZvPoint2fArraySingleComponent_ComputeChordLength(flat.points, flat.chords);
  return flat.points.size;
}

int ZvMorpherImpl::Fit(ZvBezierTool& tool, const ZvPoint2fArray& points, int closed,
                       ZvPath2fProp1d& output, unsigned int& outputIndex) const {
  outputIndex = output.NumPoints();
  // The context's fit tolerance goes in as the corner threshold and the resampling step as the
  // error bound: the refit need not be finer than the samples it is made from.
  if (closed)
    tool.ClosedFit(points, gc.fitTolerance, 3, gc.pointMergeDistance, 0, &output);
  else
    tool.OpenFit(points, gc.fitTolerance, 3, gc.pointMergeDistance, 0, &output, 0);
  return output.NumPoints() > outputIndex;
}

int ZvMorpherImpl::BlendOpen(double t, const ZvMorphFlat& a, const ZvMorphFlat& b, Blend blend,
                             ZvPath2fProp1d& output) {
  const unsigned int n = StepsFor(std::max(a.length, b.length));
  ZvPoint2fArray evenA, evenB;
  if (!n || !ZvPoint2fArraySingleComponent_EvenSubdivide(a.points, a.chords, n, evenA) ||
      !ZvPoint2fArraySingleComponent_EvenSubdivide(b.points, b.chords, n, evenB))
    return 0;
  ZvPoint2fArray work(evenA);
  blend(evenA, evenB, t, work);
  ZvBezierTool tool;
  unsigned int outputIndex = 0;
  if (Fit(tool, work, 0, output, outputIndex)) SetThePropertyCurve(t, output, n, 0, 0, outputIndex);
  return 1;
}
