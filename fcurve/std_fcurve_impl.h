// The implementation object of ZvStdFCurve: the key engine on store C, plus everything that
// needs tangents - evaluated handles, segment evaluation, extrapolation, inversion, integrals,
// bounds, validity - and the key creation that keeps the shape of Bezier segments.
//
// Like the engine it takes no lock; the curve calls it under its own.
#ifndef ZV_FCURVE_STD_FCURVE_IMPL_H
#define ZV_FCURVE_STD_FCURVE_IMPL_H

#include <zv/std_fcurve.h>

#include "fcurve/cfc_base_impl.h"
#include "fcurve/cfc_extrapolation.h"
#include "fcurve/cubic_segment.h"

#include <cstdint>

class ZvStdFCurveImpl : public CFCBaseImpl<double, CFCStdKey, CFCKeyStoreC<double, CFCStdKey>> {
 public:
  using Engine = CFCBaseImpl<double, CFCStdKey, CFCKeyStoreC<double, CFCStdKey>>;

  ZvStdFCurveImpl(double valueWhenNoKeys, unsigned int firstSegmentKind);

  // ---- Evaluated handles (std_fcurve_tangents.cpp) ----

  // A key with none of these flags is evaluated on its stored handles. The test stays inline:
  // most keys have none, and a call per handle was most of the cost of checking a whole curve.
  static constexpr unsigned short kDerivedHandleFlags =
      CFCFlag_CollapsedTangent | CFCFlag_FlatTangent | CFCFlag_FlatAtExtremum |
      CFCFlag_AutoTangent | CFCFlag_ChordTangent;
  ZvPoint2<double> GetEvaluatedLeftTgt(unsigned int i) const {
    const CFCStdKey& k = keys[i];
    return (k.flags & kDerivedHandleFlags) ? DerivedLeftTgt(i) : k.leftTangent;
  }
  ZvPoint2<double> GetEvaluatedRightTgt(unsigned int i) const {
    const CFCStdKey& k = keys[i];
    return (k.flags & kDerivedHandleFlags) ? DerivedRightTgt(i) : k.rightTangent;
  }
  double GetEvaluatedLeftTgtY(unsigned int i) const;
  double GetEvaluatedRightTgtY(unsigned int i) const;
  int IsKeyAnExtremum(unsigned int i) const;
  // The value arriving at key i from the left: the previous right value across a constant
  // segment, else the key's left value.
  double EffectiveLeftValue(unsigned int i) const;
  // The four control points with which a cubic segment from key i is evaluated.
  void GetSegmentControls(unsigned int i, ZvPoint2<double>* p) const;

  // ---- Point evaluation (std_fcurve_eval.cpp, the scheme in cfc_extrapolation.h) ----

  // The segment that starts at key i, for t strictly inside it; with `keep` a cubic segment
  // built anew replaces the one remembered.
  double EvalSegment(double t, unsigned int i, bool keep) const;
  double EvalJustAfterIndex(double t, unsigned int i) const { return EvalSegment(t, i, true); }
  double GetValueBeforeFirstKeyWhenLinear(double t) const;
  double GetValueAfterLastKeyWhenLinear(double t) const;
  double KeyRightValue(unsigned int i) const { return keys[i].rightValue; }
  unsigned int SegmentKind(unsigned int i) const { return keys[i].segmentKind; }
  static constexpr bool kHasCubicSegments = true;
  double KeyArrivingValue(unsigned int i) const { return EffectiveLeftValue(i); }
  // The offset cycle runs from the first right value, its left limits from the first left one.
  double CycleOffset(bool left) const {
    const unsigned int n = keys.size;
    return keys[n - 1].rightValue - (left ? keys[0].leftValue : keys[0].rightValue);
  }
  // Plain evaluation, constant beyond the keys: right-continuous and left limit.
  double EvalRight(double t) const { return CFCEvalPlain(*this, t, false); }
  double EvalLeft(double t) const { return CFCEvalPlain(*this, t, true); }
  double EvalRightUsingExtrapolationMethod(double t) const {
    return CFCEvalRightUsingExtrapolationMethod(*this, t);
  }
  double EvalLeftUsingExtrapolationMethod(double t) const {
    return CFCEvalLeftUsingExtrapolationMethod(*this, t);
  }
  // Snap t to a key within the snap tolerance, then the right-continuous value (or with `left`
  // the left limit) with extrapolation: the whole of the curve's Eval and EvalLeft but the lock
  // and the clamp.
  double EvalSnapped(double t, bool left) const { return CFCEvalSnapped(*this, t, left); }
  double Clamp(double v) const {
    if (v <= minClamp) return minClamp;
    if (v >= maxClamp) return maxClamp;
    return v;
  }

  // ---- Inversion, integrals, bounds, validity (std_fcurve_analysis.cpp) ----

  int IsBijective() const;
  int EvalInverse(double value, double& parameter, int clamped) const;
  double EvalIntegral(double a, double b) const;
  double PartialSegmentIntegral(unsigned int i, double a, double b) const;
  double LeftPieceIntegral(unsigned int i, double b) const;
  double RightPieceIntegral(unsigned int i, double a) const;
  double WholeSegmentsIntegral(unsigned int first, unsigned int last) const;
  double GetValueUpperBound() const;
  double GetValueLowerBound() const;
  int ComputeEvaluatedValueRange(unsigned int i, double& low, double& high) const;
  int ComputeBestMatchTangents(unsigned int i, ZvPoint2<double>& right, ZvPoint2<double>& left,
                               unsigned int mode) const;
  int IsValid() const;
  int HasConstantValue() const;
  int ComputeKeyExtent(unsigned int i, ZvExtent2<double>& extent) const;
  int ComputeNeighboringKeysExtent(double t, ZvExtent2<double>& extent) const;

  // ---- Key creation (std_fcurve_keys.cpp) ----

  int CreateKey(double parameter, double value, unsigned int left, unsigned int right,
                ZvBaseFCurve& curve);
  void SetValOnExistingKey(unsigned int i, double value);
  int RemoveTailAndCreateKeyAfterExistingKey(double parameter, double value, unsigned int left,
                                             unsigned int right, unsigned int k,
                                             ZvBaseFCurve& curve);
  int RemoveHeadAndCreateKeyBeforeExistingKey(double parameter, double value, unsigned int left,
                                              unsigned int right, unsigned int k,
                                              ZvBaseFCurve& curve);
  int RemoveBodyAndCreateKeyBetweenExistingKeys(double parameter, double value, unsigned int left,
                                                unsigned int right, unsigned int a, unsigned int b,
                                                ZvBaseFCurve& curve);
  int RemoveAllKeysAndCreateNewKey(double parameter, double value, unsigned int left,
                                   unsigned int right, ZvBaseFCurve& curve);
  int CreateNonModifyingKey(double parameter, unsigned int& index, ZvBaseFCurve& curve);
  // The evaluated handles of key i become its actual ones, and AutoTangent goes.
  void ResolveAutoTangent(unsigned int i);
  void SetupBezierCubicWhenRemoving(unsigned int a, unsigned int b);
  // Removes the closest key in the tolerance; the segment left in its place takes `kind`, or
  // with 0 the kind of the segment before it.
  int RemoveKey(double parameter, unsigned int kind, double tolerance, ZvBaseFCurve& curve);
  int RemoveHeadBeforeExistingKey(unsigned int kind, unsigned int k, ZvBaseFCurve& curve);
  int RemoveTailAfterExistingKey(unsigned int kind, unsigned int k, ZvBaseFCurve& curve);
  // Joins keys a and b into one cubic of the same shape and removes the keys between.
  int RemoveBodyBetweenExistingKeys(unsigned int kind, unsigned int a, unsigned int b,
                                    ZvBaseFCurve& curve);
  void RemoveKeysBetween(unsigned int a, unsigned int b, ZvBaseFCurve& curve) {
    RemoveBodyBetweenExistingKeys(keys[a].segmentKind, a, b, curve);
  }

  // ---- Splicing of curves (std_fcurve_splice.cpp) ----

  // Resolves AutoTangent on the keys whose segments touch [start, end], so that the shape there
  // survives the removal of neighbours.
  void ResolveAutoTangentsAround(double start, double end);
  // Moves keys first.. by delta, handles along, user data along. Refuses with 0, moving nothing,
  // when one of them is parameter-locked or the move would break the order.
  int MoveTail(unsigned int first, double delta, ZvBaseFCurve& curve);
  // Puts the keys of `piece`, shifted so that its first key lands on key a, after key a: key a
  // takes the right side of the piece's first key. With `joinNext` the piece's last key lands
  // on key a + 1 (which must lie there already) and key a + 1 takes its left side; otherwise
  // the piece's other keys follow key a. The piece's key user data is copied along. Refuses
  // with 0, before any change, when a value-locked key would change its value.
  int SpliceAfter(unsigned int a, const ZvStdFCurveImpl& piece, const ZvBaseFCurve& pieceCurve,
                  bool joinNext, ZvBaseFCurve& curve);

  // ---- Actual handles (std_fcurve_handles.cpp) ----

  void SetActualLeftTgt(unsigned int i, const ZvPoint2<double>& handle);
  void SetActualRightTgt(unsigned int i, const ZvPoint2<double>& handle);
  void RegularizeLeftTgt(unsigned int i, const ZvPoint2<double>& from);
  void RegularizeRightTgt(unsigned int i, const ZvPoint2<double>& to);
  // side: ZvBaseFCurve::LeftSide or anything else for the right handle.
  int SetActualKeyTgtHandle(unsigned int i, int side, const ZvPoint2<double>& relative);
  int ActualTangentsAreUnified(unsigned int i) const;
  // Clears TangentContinuity on every key strictly inside whose handles are not unified, so
  // that the flag claims only what the handles show.
  void ClaimContinuityOnlyWhereUnified();
  int LockTangentContinuity(unsigned int i);
  int UnifyActualRightTangentWithActualLeftTangent(unsigned int i);
  int UnifyActualLeftTangentWithActualRightTangent(unsigned int i);
  void ModifyFSK(unsigned int i, unsigned int kind);

 private:
  // The evaluated handles of a key with one of kDerivedHandleFlags.
  ZvPoint2<double> DerivedLeftTgt(unsigned int i) const;
  ZvPoint2<double> DerivedRightTgt(unsigned int i) const;
  double EvaluatedRightX(unsigned int i) const;
  double EvalCubicSegment(double t, unsigned int i, bool keep) const;

  // The last cubic segment evaluated whose handles are the stored ones, with copies of the
  // key fields it was built from. It is used only while those fields are the same to the bit,
  // so no editing path has to know about it; consecutive parameters mostly fall into one
  // segment, which then skips the setup of its arithmetic.
  struct PlainSegmentMemo {
    PlainSegmentMemo() = default;
    // A copied store starts without: what is kept belongs to the store it was built for.
    PlainSegmentMemo(const PlainSegmentMemo&) {}
    PlainSegmentMemo& operator=(const PlainSegmentMemo&) {
      filled = false;
      return *this;
    }
    bool filled = false;
    std::uint64_t inputs[8];
    ZvCubicFunctionSegment segment;
  };
  mutable PlainSegmentMemo m_plainSegment;
};

#endif
