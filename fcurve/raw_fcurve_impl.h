// The implementation object of ZvRawFCurve: the key engine on the polyline store, plus what
// the shared evaluation, flattening and query templates ask of a kind.
//
// Like the engine it takes no lock; the curve calls it under its own.
#ifndef ZV_FCURVE_RAW_FCURVE_IMPL_H
#define ZV_FCURVE_RAW_FCURVE_IMPL_H

#include <zv/raw_fcurve.h>

#include "fcurve/cfc_base_impl.h"
#include "fcurve/cfc_extrapolation.h"

using CFCRawKey = CFCSingleValueKey<double>;

class ZvRawFCurveImpl : public CFCBaseImpl<double, CFCRawKey, CFCKeyStoreB<double, CFCRawKey>> {
 public:
  using Engine = CFCBaseImpl<double, CFCRawKey, CFCKeyStoreB<double, CFCRawKey>>;
  using Value = double;

  explicit ZvRawFCurveImpl(double noKeysValue) { valueWhenNoKeys = noKeysValue; }

  // ---- What the shared templates ask of a kind ----

  double KeyRightValue(unsigned int i) const { return keys[i].value; }
  double KeyArrivingValue(unsigned int i) const { return keys[i].value; }
  double EvalSegment(double t, unsigned int i, bool) const { return ValueAfterKey(i, t); }
  unsigned int SegmentKind(unsigned int) const { return ZvBaseFCurve::LinearSegment; }
  static constexpr bool kHasCubicSegments = false;
  static constexpr bool kStepsBetweenKeys = false;
  static double ToStored(double v) { return v; }
  // The ends continue the slope of the two keys at that end; one key stays flat.
  double GetValueBeforeFirstKeyWhenLinear(double t) const {
    return keys.size < 2 ? keys[0].value : ValueAfterKey(0, t);
  }
  double GetValueAfterLastKeyWhenLinear(double t) const {
    const unsigned int n = keys.size;
    return n < 2 ? keys[0].value : ValueAfterKey(n - 2, t);
  }
  double CycleOffset(bool) const { return keys[keys.size - 1].value - keys[0].value; }
  double Clamp(double v) const {
    if (v <= minClamp) return minClamp;
    if (v >= maxClamp) return maxClamp;
    return v;
  }
  double EvalRightUsingExtrapolationMethod(double t) const {
    return CFCEvalRightUsingExtrapolationMethod(*this, t);
  }
  double EvalLeftUsingExtrapolationMethod(double t) const {
    return CFCEvalLeftUsingExtrapolationMethod(*this, t);
  }
  // Sorted ascending parameters without NaN values: what a built or read curve must be.
  bool KeysAreOrdered() const;

  // ---- Raw-curve operations (raw_fcurve_impl.cpp) ----

  // 1 rising, -1 falling, 0 when the values are not strictly monotone (or fewer than two keys).
  int Monotony() const;
  int IsBijective() const { return Monotony() != 0; }
  int EvalInverse(double value, double& parameter) const;
  double GetValueUpperBound() const;
  double GetValueLowerBound() const;
  void AppendLinearSegment(const ZvPoint2<double>& point) {
    InsertKey(keys.size, point.x, point.y);
  }
  // Lines through the points, a key where a point leaves the current line by more than the
  // tolerance; the points must ascend.
  void SetToApproxLinearFitC0(const ZvPoint2dArray& points, double tolerance);
  using Engine::ReduceNumKeys;
  // The store's thinning over all keys.
  unsigned int ReduceNumKeys(double tolerance, ZvBaseFCurve& curve);
};

#endif
