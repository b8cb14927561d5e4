// The implementation object of the step curves (boolean and integer): the key engine on the
// integer store, plus what the shared evaluation, flattening and query templates ask of a kind.
//
// Like the engine it takes no lock; the curve calls it under its own.
#ifndef ZV_FCURVE_STEP_FCURVE_IMPL_H
#define ZV_FCURVE_STEP_FCURVE_IMPL_H

#include "fcurve/cfc_base_impl.h"
#include "fcurve/cfc_extrapolation.h"

using CFCStepKey = CFCSingleValueKey<int>;

class ZvStepFCurveImpl : public CFCBaseImpl<int, CFCStepKey, CFCKeyStoreA<int, CFCStepKey>> {
 public:
  using Engine = CFCBaseImpl<int, CFCStepKey, CFCKeyStoreA<int, CFCStepKey>>;
  using Value = int;

  ZvStepFCurveImpl(int noKeysValue, int low, int high) {
    valueWhenNoKeys = noKeysValue;
    minClamp = low;
    maxClamp = high;
  }

  // ---- What the shared templates ask of a kind ----

  double KeyRightValue(unsigned int i) const { return keys[i].value; }
  double KeyArrivingValue(unsigned int i) const {
    return i > 0 ? keys[i - 1].value : valueBeforeFirstKey;
  }
  double EvalSegment(double, unsigned int i, bool) const { return keys[i].value; }
  unsigned int SegmentKind(unsigned int) const { return ZvBaseFCurve::ConstantSegment; }
  static constexpr bool kHasCubicSegments = false;
  static constexpr bool kStepsBetweenKeys = true;
  // A step has no slope to extend: outside the keys the linear method (which only a stored
  // curve can bring) gives 0, deliberately.
  double GetValueBeforeFirstKeyWhenLinear(double) const { return 0.0; }
  double GetValueAfterLastKeyWhenLinear(double) const { return 0.0; }
  // The values repeat from period to period without accumulating.
  double CycleOffset(bool) const { return 0.0; }
  double Clamp(double v) const {
    if (v <= minClamp) return minClamp;
    if (v >= maxClamp) return maxClamp;
    return v;
  }
  // Values the evaluation gave back are whole already.
  static int ToStored(double v) { return static_cast<int>(v); }
  double EvalRightUsingExtrapolationMethod(double t) const {
    return CFCEvalRightUsingExtrapolationMethod(*this, t);
  }
  double EvalLeftUsingExtrapolationMethod(double t) const {
    return CFCEvalLeftUsingExtrapolationMethod(*this, t);
  }

  // The largest (or smallest) value the curve takes: the keys and the value before them, or the
  // value without keys.
  int ValueBound(bool upper) const {
    if (keys.size == 0) return valueWhenNoKeys;
    int v = valueBeforeFirstKey;
    for (unsigned int i = 0; i < keys.size; ++i) {
      const int k = keys[i].value;
      if (upper ? k > v : k < v) v = k;
    }
    return v;
  }

  bool AnyKeyHas(unsigned short bits) const {
    for (unsigned int i = 0; i < keys.size; ++i)
      if (GetKeyFlags(i) & bits) return true;
    return false;
  }
};

#endif
