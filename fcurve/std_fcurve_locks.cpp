// ZvStdFCurve: tangent continuity and length continuity locks, freezing of evaluated handles,
// and constraints addressed by key index.
#include <zv/std_fcurve.h>

#include "core/vec.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"
#include "fcurve/std_tgt_mover_impl.h"

#include <cmath>

namespace {

// The automatic-handle constraints that freezing may clear: FlatTangent, FlatAtExtremum,
// AutoTangent, CollapsedTangent and ChordTangent.
constexpr unsigned int kFreezableCodes = 3008;

// Does a cubic segment start or end at key i? What lies beyond the end keys is no segment.
bool TouchesCubic(const ZvStdFCurveImpl& s, unsigned int i) {
  return (i > 0 && s.keys[i - 1].segmentKind == ZvBaseFCurve::CubicSegment) ||
         (i + 1 < s.keys.size && s.keys[i].segmentKind == ZvBaseFCurve::CubicSegment);
}

bool BetweenCubics(const ZvStdFCurveImpl& s, unsigned int i) {
  return i > 0 && i + 1 < s.keys.size && s.keys[i - 1].segmentKind == ZvBaseFCurve::CubicSegment &&
         s.keys[i].segmentKind == ZvBaseFCurve::CubicSegment;
}

// Do the evaluated handles of key i have the same length on screen, Y counted times aspect?
bool SameVisualLength(const ZvStdFCurveImpl& s, unsigned int i, double aspect) {
  const CFCStdKey& k = s.keys[i];
  const ZvPoint2<double> l = s.GetEvaluatedLeftTgt(i), r = s.GetEvaluatedRightTgt(i);
  const double ll = zvGuardedLength2(l.x - k.parameter, aspect * (l.y - k.leftValue));
  const double rl = zvGuardedLength2(r.x - k.parameter, aspect * (r.y - k.rightValue));
  return std::fabs(ll - rl) <= 1e-7;
}

void SetBits(CFCStdKey& k, unsigned short bits, bool on) {
  k.flags = static_cast<unsigned short>(on ? (k.flags | bits) : (k.flags & ~bits));
}

// The key in the tolerance, with its parameter written back; false on a read-only curve when
// `modifying`.
bool FindKey(const ZvStdFCurveImpl& s, double& parameter, double tolerance, unsigned int& i,
             bool modifying) {
  if (modifying && s.readOnly) return false;
  if (!s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return false;
  parameter = s.keys[i].parameter;
  return true;
}

// Makes the handle opposite `side` answer the one on `side`, as a drag of that handle to where
// it already is does, with the continuities asked for. The drag keeps both segments functions.
bool DragOntoItself(ZvStdFCurve& curve, const ZvStdFCurveImpl& s, unsigned int i,
                    ZvBaseFCurve::KeySide side, int tangentContinuity, int lengthContinuity,
                    double aspect) {
  const ZvPoint2<double> handle =
      side == ZvBaseFCurve::LeftSide ? s.GetEvaluatedLeftTgt(i) : s.GetEvaluatedRightTgt(i);
  ZvStdTgtMoverImpl mover(curve, s.keys[i].parameter, side, 0.0);
  ZvExtent2<double> modified;
  return mover.Update(handle, tangentContinuity, lengthContinuity, aspect, modified) != 0;
}

}  // namespace

unsigned int ZvStdFCurve::LockTangentContinuity(double& parameter, double tolerance) {
  ZvFCurveLockGuard guard(*this);
  unsigned int i;
  if (!FindKey(*m_impl, parameter, tolerance, i, true)) return 0;
  return m_impl->LockTangentContinuity(i);
}

unsigned int ZvStdFCurve::UnlockTangentContinuity(double& parameter, double tolerance) {
  ZvFCurveLockGuard guard(*this);
  unsigned int i;
  if (!FindKey(*m_impl, parameter, tolerance, i, true)) return 0;
  SetBits(m_impl->keys[i], CFCFlag_TangentContinuity, false);
  return 1;
}

unsigned int ZvStdFCurve::IsTangentContinuityLocked(double& parameter, double tolerance) const {
  ZvFCurveLockGuard guard(*this);
  unsigned int i;
  if (!FindKey(*m_impl, parameter, tolerance, i, false)) return 0;
  return (m_impl->keys[i].flags & CFCFlag_TangentContinuity) ? 1 : 0;
}

unsigned int ZvStdFCurve::UnifyAndLockTangentContinuity(double& parameter, KeySide side,
                                                        double tolerance) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  unsigned int i;
  double at = parameter;
  if (!FindKey(s, at, tolerance, i, true)) return 0;
  if (s.keys[i].flags & (CFCFlag_TangentLengthLock | CFCFlag_TangentDirectionLock)) return 0;
  const bool unified = s.ActualTangentsAreUnified(i) != 0;
  if (unified && (s.keys[i].flags & CFCFlag_TangentContinuity)) return 0;  // nothing to do
  if (!unified && TouchesCubic(s, i)) {
    if (!DragOntoItself(*this, s, i, side, 1, s.keys[i].flags & CFCFlag_TangentLengthContinuity,
                        1.0) ||
        !(s.keys[i].flags & CFCFlag_TangentContinuity)) {
      return 0;
    }
  } else if (!s.LockTangentContinuity(i)) {
    return 0;
  }
  parameter = at;
  return 1;
}

unsigned int ZvStdFCurve::LockTangentLengthContinuity(double& parameter, double tolerance,
                                                      double aspect) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  unsigned int i;
  if (!std::isfinite(aspect) || !FindKey(s, parameter, tolerance, i, true)) return 0;
  if (s.keys[i].flags & CFCFlag_TangentLengthContinuity) return 1;
  if (BetweenCubics(s, i) && !SameVisualLength(s, i, aspect)) return 0;
  SetBits(s.keys[i], CFCFlag_TangentLengthContinuity, true);
  return 1;
}

unsigned int ZvStdFCurve::UnlockTangentLengthContinuity(double& parameter, double tolerance) {
  ZvFCurveLockGuard guard(*this);
  unsigned int i;
  if (!FindKey(*m_impl, parameter, tolerance, i, true)) return 0;
  SetBits(m_impl->keys[i], CFCFlag_TangentLengthContinuity, false);
  return 1;
}

unsigned int ZvStdFCurve::IsTangentLengthContinuityLocked(double& parameter,
                                                          double tolerance) const {
  ZvFCurveLockGuard guard(*this);
  unsigned int i;
  if (!FindKey(*m_impl, parameter, tolerance, i, false)) return 0;
  return (m_impl->keys[i].flags & CFCFlag_TangentLengthContinuity) ? 1 : 0;
}

unsigned int ZvStdFCurve::UnifyAndLockTangentLengthContinuity(double& parameter, KeySide side,
                                                              double tolerance, double aspect) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  unsigned int i;
  double at = parameter;
  if (!std::isfinite(aspect) || !FindKey(s, at, tolerance, i, true)) return 0;
  if (s.keys[i].flags & (CFCFlag_TangentLengthLock | CFCFlag_TangentDirectionLock)) return 0;
  const bool same = SameVisualLength(s, i, aspect);
  if (same && (s.keys[i].flags & CFCFlag_TangentLengthContinuity)) return 0;
  if (!same && TouchesCubic(s, i)) {
    if (!DragOntoItself(*this, s, i, side, s.keys[i].flags & CFCFlag_TangentContinuity, 1,
                        aspect) ||
        !(s.keys[i].flags & CFCFlag_TangentLengthContinuity)) {
      return 0;
    }
  } else {
    SetBits(s.keys[i], CFCFlag_TangentLengthContinuity, true);
  }
  parameter = at;
  return 1;
}

unsigned int ZvStdFCurve::AreAnyTgtLengthsLockedInInterval(double start, double end,
                                                           int excludeStart, int excludeEnd) const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->AnyKeyHasFlagsInInterval(start, end, excludeStart, excludeEnd,
                                          CFCFlag_TangentLengthLock);
}

unsigned int ZvStdFCurve::AreAnyTgtDirectionsLockedInInterval(double start, double end,
                                                              int excludeStart,
                                                              int excludeEnd) const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->AnyKeyHasFlagsInInterval(start, end, excludeStart, excludeEnd,
                                          CFCFlag_TangentDirectionLock);
}

unsigned int ZvStdFCurve::FreezeTangentsInInterval(double first, double last, int excludeFirst,
                                                   int excludeLast, KeyConstraint constraints) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || s.keys.size == 0) return 0;
  unsigned int a, b;
  if (!s.GetKeyIndicesInInterval(first, last, a, b, 0, 0)) return 1;
  const bool cutFirst = excludeFirst && zvIsSameParameter(s.keys[a].parameter, first);
  const bool cutLast = excludeLast && zvIsSameParameter(s.keys[b].parameter, last);
  // All evaluated handles are read before any key changes: they depend on the neighbours' flags.
  const unsigned int count = b - a + 1;
  ZvPoint2dArray left(count), right(count);
  for (unsigned int i = a; i <= b; ++i) {
    left.Add(s.GetEvaluatedLeftTgt(i));
    right.Add(s.GetEvaluatedRightTgt(i));
  }
  for (unsigned int i = a; i <= b; ++i) {
    const bool keepLeft = i == a && cutFirst, keepRight = i == b && cutLast;
    if (!keepLeft) s.SetActualLeftTgt(i, left[i - a]);
    if (!keepRight) s.SetActualRightTgt(i, right[i - a]);
  }
  if (constraints & kFreezableCodes) {
    for (unsigned int i = a; i <= b; ++i)
      s.SetConstraint(i, constraints & kFreezableCodes, 0);
  }
  for (unsigned int i : {a, b}) {
    const bool partial = (i == a && cutFirst) || (i == b && cutLast);
    if (partial && !s.ActualTangentsAreUnified(i))
      SetBits(s.keys[i], CFCFlag_TangentContinuity, false);
  }
  return 1;
}

unsigned int ZvStdFCurve::FreezeAllTangents(KeyConstraint constraints) {
  ZvFCurveLockGuard guard(*this);
  const unsigned int n = m_impl->keys.size;
  if (n == 0) return 0;
  return FreezeTangentsInInterval(m_impl->keys[0].parameter, m_impl->keys[n - 1].parameter, 0, 0,
                                  constraints);
}

unsigned int ZvStdFCurve::AdjustAdjacentAutomaticKeysTangents(double parameter) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  unsigned int i;
  if (s.readOnly || !s.GetClosestKeyIndexInCenteredInterval(parameter, kCFCParameterEpsilon, i)) {
    return 0;
  }
  const unsigned int first = i > 0 ? i - 1 : 0, last = i + 1 < s.keys.size ? i + 1 : i;
  // Read before written: each evaluated handle depends on the neighbours.
  ZvPoint2<double> left[3], right[3];
  for (unsigned int k = first; k <= last; ++k) {
    left[k - first] = s.GetEvaluatedLeftTgt(k);
    right[k - first] = s.GetEvaluatedRightTgt(k);
  }
  for (unsigned int k = first; k <= last; ++k) {
    if (!(s.keys[k].flags & CFCFlag_AutoTangent)) continue;
    s.SetActualLeftTgt(k, left[k - first]);
    s.SetActualRightTgt(k, right[k - first]);
  }
  return 1;
}

unsigned int ZvStdFCurve::GetConstraintAtIndex(unsigned int index, KeyConstraint constraint,
                                               int& on) const {
  ZvFCurveLockGuard guard(*this);
  if (index >= m_impl->keys.size) return 0;
  on = m_impl->GetConstraint(index, constraint);
  return 1;
}

unsigned int ZvStdFCurve::SetConstraintAtIndex(unsigned int index, KeyConstraint constraints,
                                               int on) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || index >= m_impl->keys.size) return 0;
  return m_impl->SetConstraint(index, constraints, on);
}
