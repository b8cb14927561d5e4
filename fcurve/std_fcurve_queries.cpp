// ZvStdFCurve: questions about keys, and the flags, clamps and methods of the curve.
#include <zv/std_fcurve.h>

#include "fcurve/cfc_curve_queries.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"

unsigned int ZvStdFCurve::GetFCurveInfo(FCurveInfo* info) const {
  if (info == nullptr) return 0;
  ZvFCurveLockGuard guard(*this);
  const ZvStdFCurveImpl& s = *m_impl;
  const unsigned int mask = info->mask;
  if (mask & FCurveInfo::KindMask) info->kind = StdKind;
  if (mask & FCurveInfo::NumKeysMask) info->numKeys = s.keys.size;
  if (mask & FCurveInfo::ValueWhenNoKeysMask) info->valueWhenNoKeys = s.valueWhenNoKeys;
  if (mask & FCurveInfo::FirstSegmentKindMask) info->firstSegmentKind = s.firstSegmentKind;
  if (mask & FCurveInfo::MinClampMask) info->minClamp = s.minClamp;
  if (mask & FCurveInfo::MaxClampMask) info->maxClamp = s.maxClamp;
  if (mask & FCurveInfo::ExtrapolationMask) info->extrapolation = s.extrapolation;
  return 1;
}

unsigned int ZvStdFCurve::GetKeyInfoFromIndex(unsigned int index, KeyInfo* info) const {
  if (info == nullptr) return 0;
  ZvFCurveLockGuard guard(*this);
  const ZvStdFCurveImpl& s = *m_impl;
  if (index >= s.keys.size) {
    info->mask = 0;
    return 0;
  }
  const CFCStdKey& k = s.keys[index];
  const unsigned int mask = info->mask;
  if (mask & KeyInfo::IndexMask) info->index = index;
  if (mask & KeyInfo::ParameterMask) info->parameter = k.parameter;
  if (mask & KeyInfo::LeftValueMask) info->leftValue = s.EffectiveLeftValue(index);
  if (mask & KeyInfo::RightValueMask) info->rightValue = k.rightValue;
  if (mask & (KeyInfo::LeftTangentXMask | KeyInfo::LeftTangentYMask)) {
    const ZvPoint2<double> h = s.GetEvaluatedLeftTgt(index);
    if (mask & KeyInfo::LeftTangentXMask) info->leftTangentX = h.x - k.parameter;
    if (mask & KeyInfo::LeftTangentYMask) info->leftTangentY = h.y - k.leftValue;
  }
  if (mask & (KeyInfo::RightTangentXMask | KeyInfo::RightTangentYMask)) {
    const ZvPoint2<double> h = s.GetEvaluatedRightTgt(index);
    if (mask & KeyInfo::RightTangentXMask) info->rightTangentX = h.x - k.parameter;
    if (mask & KeyInfo::RightTangentYMask) info->rightTangentY = h.y - k.rightValue;
  }
  if (mask & KeyInfo::SegmentKindMask) info->segmentKind = k.segmentKind;
  return 1;
}

unsigned int ZvStdFCurve::GetKeyInfoFromParameter(double parameter, KeyInfo* info) const {
  if (info == nullptr) return 0;
  ZvFCurveLockGuard guard(*this);
  unsigned int i;
  if (!m_impl->GetClosestKeyIndexInCenteredInterval(parameter, 0.0, i)) {
    info->mask = 0;
    return 0;
  }
  return GetKeyInfoFromIndex(i, info);
}

unsigned int ZvStdFCurve::SetClampingValues(double minValue, double maxValue) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || !(minValue <= maxValue)) return 0;
  m_impl->minClamp = minValue;
  m_impl->maxClamp = maxValue;
  return 1;
}

unsigned int ZvStdFCurve::GetClampingValues(double& minValue, double& maxValue) const {
  ZvFCurveLockGuard guard(*this);
  minValue = m_impl->minClamp;
  maxValue = m_impl->maxClamp;
  return 1;
}

unsigned int ZvStdFCurve::SetConstraint(double& parameter, KeyConstraint constraints, int on,
                                        double tolerance) {
  ZvFCurveLockGuard guard(*this);
  unsigned int i;
  if (m_impl->readOnly || !m_impl->GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) {
    return 0;
  }
  parameter = m_impl->keys[i].parameter;
  return m_impl->SetConstraint(i, constraints, on);
}

unsigned int ZvStdFCurve::GetConstraint(double& parameter, KeyConstraint constraint, int& on,
                                        double tolerance) const {
  ZvFCurveLockGuard guard(*this);
  unsigned int i;
  if (!m_impl->GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
  parameter = m_impl->keys[i].parameter;
  on = m_impl->GetConstraint(i, constraint);
  return 1;
}

unsigned int ZvStdFCurve::IsConstraintSupported(KeyConstraint) const {
  return 1;
}

// These may run without the lock as far as the flags go, but the search behind them moves the
// hint, so they take it like every other query.
unsigned int ZvStdFCurve::AreAnyValuesLockedInInterval(double start, double end, int excludeStart,
                                                       int excludeEnd) const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->AnyKeyHasFlagsInInterval(start, end, excludeStart, excludeEnd, CFCFlag_ValueLock);
}

unsigned int ZvStdFCurve::AreAnyParametersLockedInInterval(double start, double end,
                                                           int excludeStart, int excludeEnd) const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->AnyKeyHasFlagsInInterval(start, end, excludeStart, excludeEnd,
                                          CFCFlag_ParameterLock);
}

unsigned int ZvStdFCurve::AreAnyKeysLockedInInterval(double start, double end, int excludeStart,
                                                     int excludeEnd) const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->AnyKeyHasFlagsInInterval(start, end, excludeStart, excludeEnd,
                                          CFCFlag_WholeKeyLock);
}

unsigned int ZvStdFCurve::SetExtrapolationMethod(ExtrapolationMethod method) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || method < ConstantExtrapolation || method > CycleWithOffsetExtrapolation) {
    return 0;
  }
  m_impl->extrapolation = static_cast<unsigned char>(method);
  return 1;
}

// Not stopped by the read-only flag. Re-setting every handle lets the constraint take hold at
// once.
unsigned int ZvStdFCurve::SetDefaultBezierTangentConstraint(int on) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  s.defaultBezierTangentConstraint = on ? 1 : 0;
  for (unsigned int i = 0; i < s.keys.size; ++i) {
    const ZvPoint2<double> l = s.keys[i].leftTangent, r = s.keys[i].rightTangent;
    s.SetActualLeftTgt(i, l);
    s.SetActualRightTgt(i, r);
  }
  return 1;
}

ZV_CFC_KEY_QUERY_SLOTS(ZvStdFCurve)
