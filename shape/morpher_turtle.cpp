// TurtleMorph: blending headings and step lengths, so that a turning shape keeps its length.
#include <zv/gc.h>
#include <zv/morpher.h>
#include <zv/path2f_prop1d.h>
#include <zv/polyline.h>

#include "shape/morpher_impl.h"

int ZvMorpherImpl::TurtleMorph(double t, ZvPath2fProp1d& output) {
  if (!UsableStep()) return 0;
  const double s = gc.pointMergeDistance;
  // All subpaths run into one polyline: the turtle walks from one subpath's end straight to the
  // next one's start, so the jumps count as steps too.
  ZvMorphFlat a, b;
  ZvPointTagArray tags;
  pathA->AltFlatten(s, a.points, tags);
  pathB->AltFlatten(s, b.points, tags);
  a.length = ZvPoint2fArraySingleComponent_ComputeChordLength(a.points, a.chords);
  b.length = ZvPoint2fArraySingleComponent_ComputeChordLength(b.points, b.chords);
  // An empty shape gives no walk to blend. Blended turning need not come back to the start, so
  // the walk is fitted open even when both shapes are closed.
  return BlendOpen(t, a, b, &ZvPoint2fArraySingleComponent_TurtleInterp, output);
}
