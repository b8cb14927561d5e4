// The blended property curves of morph results.
#include <zv/gc.h>
#include <zv/path2f_prop1d.h>
#include <zv/raw_fcurve.h>

#include <algorithm>

#include "shape/morpher_impl.h"

namespace {

// One source of a blend: a subpath's curve read at a walking parameter, or its value at 0 held as
// a constant when the curve has a single key (or none).
struct ZvMorphPropSide {
  const ZvPath2fProp1d* path;
  unsigned int index;
  double weight;
  double at;    // the parameter read next
  double step;  // how far `at` moves per entry
  bool varying;
  double constant;

  ZvMorphPropSide(const ZvPath2fProp1d* path, unsigned int index, double weight, bool varying)
      : path(path),
        index(index),
        weight(weight),
        at(0.0),
        step(0.0),
        varying(varying),
        constant(varying ? 0.0 : path->EvalPropCurve(index, 0.0)) {}
  double Value() const { return weight * (varying ? path->EvalPropCurve(index, at) : constant); }
};

// `count` (position, value) pairs: the position runs from 0 by `positionStep`, the value is the
// weighted sum of the sides, each advanced by its own step. Positions and parameters are running
// sums, so that equal steps give the same parameters on every path.
void WalkPairs(ZvMorphPropSide* sides, unsigned int numSides, unsigned int count,
               double positionStep, ZvPoint2dArray& pairs) {
  double position = 0.0;
  for (unsigned int k = 0; k < count; ++k) {
    double value = 0.0;
    for (unsigned int i = 0; i < numSides; ++i) {
      value += sides[i].Value();
      sides[i].at += sides[i].step;
    }
    pairs.Add(ZvPoint2<double>{position, value});
    position += positionStep;
  }
}

bool HasSeveralKeys(const ZvPath2fProp1d& path, unsigned int index) {
  return path.GetPropCurve(index).GetNumKeys() > 1;
}

}  // namespace

void ZvMorpherImpl::SetThePropertyCurve(double t, ZvPath2fProp1d& output, unsigned int steps,
                                        unsigned int indexA, unsigned int indexB,
                                        unsigned int outputIndex) {
  const int hasA = pathA->HasPropCurve(indexA), hasB = pathB->HasPropCurve(indexB);
  if (hasA != hasB) {
    if (hasA)
      output.SetPropCurve(outputIndex, *pathA, indexA);
    else
      output.SetPropCurve(outputIndex, *pathB, indexB);
    return;
  }
  if (!hasA) return;
  steps = std::max(steps, 1u);
  ZvMorphPropSide sides[2] = {ZvMorphPropSide(pathA, indexA, 1.0 - t, true),
                              ZvMorphPropSide(pathB, indexB, t, true)};
  sides[0].step = pathA->GetLargestArcLength(indexA) / steps;
  sides[1].step = pathB->GetLargestArcLength(indexB) / steps;
  // The longer curve gives the output its parameter scale.
  ZvPoint2dArray pairs(steps + 1);
  WalkPairs(sides, 2, steps + 1, std::max(sides[0].step, sides[1].step), pairs);
  output.SetPropCurve(outputIndex, pairs, gc.propertyTolerance);
}

void ZvMorpherImpl::SetThePropertyCurve(double t, unsigned int indexA, unsigned int startA,
                                        unsigned int stepsA, unsigned int indexB,
                                        unsigned int startB, unsigned int stepsB,
                                        unsigned int count, ZvPath2fProp1d& output,
                                        unsigned int outputIndex) {
  const int hasA = pathA->HasPropCurve(indexA), hasB = pathB->HasPropCurve(indexB);
  if (!hasA && !hasB) return;
  ZvMorphPropSide sides[2] = {
      ZvMorphPropSide(pathA, indexA, 1.0 - t, hasA && HasSeveralKeys(*pathA, indexA)),
      ZvMorphPropSide(pathB, indexB, t, hasB && HasSeveralKeys(*pathB, indexB))};
  ZvMorphPropSide* used = sides;
  unsigned int numUsed = 2;
  if (hasA != hasB) {
    // A curve on one side only is carried over as it stands, not faded by t.
    used = hasA ? &sides[0] : &sides[1];
    used->weight = 1.0;
    numUsed = 1;
  }
  const unsigned int stepsOf[2] = {std::max(stepsA, 1u), std::max(stepsB, 1u)};
  const unsigned int startOf[2] = {startA, startB};
  // Constants are laid out one entry apart; otherwise the varying curves set the scale, the
  // longer step winning.
  double positionStep = 0.0;
  bool anyVarying = false;
  for (unsigned int i = 0; i < numUsed; ++i) {
    ZvMorphPropSide& side = used[i];
    if (!side.varying) continue;
    const unsigned int which = static_cast<unsigned int>(&side - sides);
    side.step = side.path->GetLargestArcLength(side.index) / stepsOf[which];
    side.at = startOf[which] * side.step;
    positionStep = anyVarying ? std::max(positionStep, side.step) : side.step;
    anyVarying = true;
  }
  if (!anyVarying) positionStep = 1.0;
  ZvPoint2dArray pairs(count);
  WalkPairs(used, numUsed, count, positionStep, pairs);
  output.SetPropCurve(outputIndex, pairs, gc.propertyTolerance);
}
