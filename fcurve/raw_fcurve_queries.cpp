// ZvRawFCurve: questions about keys, and the flags, clamps, constraints and methods of the curve.
#include <zv/raw_fcurve.h>

#include "fcurve/cfc_curve_queries.h"
#include "fcurve/cfc_flatten.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/raw_fcurve_impl.h"

ZV_CFC_KEY_QUERY_SLOTS(ZvRawFCurve)
ZV_CFC_DRAWING_SLOTS(ZvRawFCurve)

// A raw curve has no segment kinds: that request alone is not met.
unsigned int ZvRawFCurve::GetFCurveInfo(FCurveInfo* info) const {
  if (info == nullptr) return 0;
  ZvFCurveLockGuard guard(*this);
  const ZvRawFCurveImpl& s = *m_impl;
  const unsigned int mask = info->mask;
  if (mask & FCurveInfo::KindMask) info->kind = RawKind;
  if (mask & FCurveInfo::NumKeysMask) info->numKeys = s.keys.size;
  if (mask & FCurveInfo::ValueWhenNoKeysMask) info->valueWhenNoKeys = s.valueWhenNoKeys;
  if (mask & FCurveInfo::MinClampMask) info->minClamp = s.minClamp;
  if (mask & FCurveInfo::MaxClampMask) info->maxClamp = s.maxClamp;
  if (mask & FCurveInfo::ExtrapolationMask) info->extrapolation = s.extrapolation;
  if (!(mask & FCurveInfo::FirstSegmentKindMask)) return 1;
  info->mask = mask & ~static_cast<unsigned int>(FCurveInfo::FirstSegmentKindMask);
  info->firstSegmentKind = 0;
  return 0;
}

unsigned int ZvRawFCurve::SetClampingValues(double minValue, double maxValue) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || !(minValue <= maxValue)) return 0;
  m_impl->minClamp = minValue;
  m_impl->maxClamp = maxValue;
  return 1;
}

unsigned int ZvRawFCurve::GetClampingValues(double& minValue, double& maxValue) const {
  ZvFCurveLockGuard guard(*this);
  minValue = m_impl->minClamp;
  maxValue = m_impl->maxClamp;
  return 1;
}

// Raw keys carry no locks. The lock codes are accepted on an existing key so that code written
// for every kind runs unchanged, but nothing is stored.
unsigned int ZvRawFCurve::SetConstraint(double& parameter, KeyConstraint constraints, int,
                                        double tolerance) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || !IsConstraintSupported(constraints)) return 0;
  return CFCQueries::KeyParameterAt(*m_impl, parameter, tolerance);
}

unsigned int ZvRawFCurve::GetConstraint(double& parameter, KeyConstraint constraint, int& on,
                                        double tolerance) const {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || !IsConstraintSupported(constraint)) return 0;
  if (!CFCQueries::KeyParameterAt(*m_impl, parameter, tolerance)) return 0;
  on = 0;
  return 1;
}

unsigned int ZvRawFCurve::IsConstraintSupported(KeyConstraint constraint) const {
  return constraint == ParameterLock || constraint == ValueLock || constraint == WholeKeyLock;
}

unsigned int ZvRawFCurve::AreAnyValuesLockedInInterval(double, double, int, int) const {
  return 0;
}

unsigned int ZvRawFCurve::AreAnyParametersLockedInInterval(double, double, int, int) const {
  return 0;
}

unsigned int ZvRawFCurve::AreAnyKeysLockedInInterval(double, double, int, int) const {
  return 0;
}

unsigned int ZvRawFCurve::SetExtrapolationMethod(ExtrapolationMethod method) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || method < ConstantExtrapolation || method > CycleWithOffsetExtrapolation) {
    return 0;
  }
  m_impl->extrapolation = static_cast<unsigned char>(method);
  return 1;
}

// Stored for the hosts that read it back; a polyline has no handles for it to act on.
unsigned int ZvRawFCurve::SetDefaultBezierTangentConstraint(int on) {
  ZvFCurveLockGuard guard(*this);
  m_impl->defaultBezierTangentConstraint = on ? 1 : 0;
  return 1;
}

unsigned int ZvRawFCurve::ComputeKeyExtent(unsigned int index, ZvExtent2<double>& extent) const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->ComputeKeyExtent(index, extent);
}
