// TurtleMorph: blending headings and step lengths, so that a turning shape keeps its length.
#include <zv/bezier_fit.h>
#include <zv/gc.h>
#include <zv/morpher.h>
#include <zv/path2f_prop1d.h>
#include <zv/polyline.h>

#include <algorithm>

#include "shape/morpher_impl.h"

int ZvMorpherImpl::TurtleMorph(double t, ZvPath2fProp1d& output) {
  if (!UsableStep()) return 0;
  const double s = gc.pointMergeDistance;
  // All subpaths run into one polyline: the turtle walks from one subpath's end straight to the
  // next one's start, so the jumps count as steps too.
  ZvPoint2fArray flatA, flatB;
  ZvPointTagArray tags;
  pathA->AltFlatten(s, flatA, tags);
  pathB->AltFlatten(s, flatB, tags);
  ZvDoubleArray chordsA, chordsB;
  const double lengthA = ZvPoint2fArraySingleComponent_ComputeChordLength(flatA, chordsA);
  const double lengthB = ZvPoint2fArraySingleComponent_ComputeChordLength(flatB, chordsB);
  const unsigned int n = StepsFor(std::max(lengthA, lengthB));
  ZvPoint2fArray evenA, evenB;
  // An empty shape gives no walk to blend.
  if (!n || !ZvPoint2fArraySingleComponent_EvenSubdivide(flatA, chordsA, n, evenA) ||
      !ZvPoint2fArraySingleComponent_EvenSubdivide(flatB, chordsB, n, evenB))
    return 0;
  ZvPoint2fArray walk(evenA);
  ZvPoint2fArraySingleComponent_TurtleInterp(evenA, evenB, t, walk);
  ZvBezierTool tool;
  unsigned int outputIndex = 0;
  // Blended turning need not come back to the start, so the walk is fitted open even when both
  // shapes are closed.
  if (Fit(tool, walk, 0, output, outputIndex)) SetThePropertyCurve(t, output, n, 0, 0, outputIndex);
  return 1;
}
