// The slots of the contract that the boolean and the integer curve answer alike. They differ
// only in how a double becomes a stored integer, which `Values` tells:
//
//   Values::kKind                  the curve's kind;
//   Values::Exact(v, out)          1 with out when v is a value of the kind, else 0;
//   Values::Nearest(v)             the stored value for any v, for the operations that do not
//                                  refuse;
//   Values::kMergeNeedsExact       whether MergeAndCreateKey refuses what Exact refuses.
//
// ZV_STEP_FCURVE_SLOTS(Class, Values) defines them in one source of each kind.
#ifndef ZV_FCURVE_STEP_FCURVE_SLOTS_H
#define ZV_FCURVE_STEP_FCURVE_SLOTS_H

#include <zv/step_fcurve.h>

#include "fcurve/cfc_curve_queries.h"
#include "fcurve/cfc_flatten.h"
#include "fcurve/cfc_scale_offset.h"
#include "fcurve/cfc_single_value_curve.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/step_fcurve_impl.h"

#include <cfloat>
#include <cmath>

// The constraint codes a step key knows: the two locks and both together.
constexpr unsigned int kStepConstraintCodes =
    ZvBaseFCurve::ParameterLock | ZvBaseFCurve::ValueLock | ZvBaseFCurve::WholeKeyLock;

inline bool zvIsStepConstraint(unsigned int code) {
  return code == ZvBaseFCurve::ParameterLock || code == ZvBaseFCurve::ValueLock ||
         code == ZvBaseFCurve::WholeKeyLock;
}

#define ZV_STEP_FCURVE_SLOTS(Class, Values)                                                        \
  ZV_CFC_KEY_QUERY_SLOTS(Class)                                                                    \
  ZV_CFC_DRAWING_SLOTS(Class)                                                                      \
  ZV_CFC_SINGLE_VALUE_SLOTS(Class, ZvStepFCurveImpl)                                               \
  ZvBaseFCurve::Kind Class::GetKind() const {                                                      \
    return Values::kKind;                                                                          \
  }                                                                                                \
  int Class::GetValueBeforeFirstKey() const {                                                      \
    ZvFCurveLockGuard guard(*this);                                                                \
    return m_impl->valueBeforeFirstKey;                                                            \
  }                                                                                                \
  unsigned int Class::CreateKey(double parameter, double value) {                                  \
    ZvFCurveLockGuard guard(*this);                                                                \
    int stored;                                                                                    \
    if (m_impl->readOnly || !std::isfinite(parameter) || !Values::Exact(value, stored)) {          \
      return 0;                                                                                    \
    }                                                                                              \
    return m_impl->CreateKey(parameter, stored, *this);                                            \
  }                                                                                                \
  unsigned int Class::MergeAndCreateKey(double start, double end, double parameter, double value,  \
                                        int excludeStart, int excludeEnd, int keepAttributes) {    \
    ZvFCurveLockGuard guard(*this);                                                                \
    int stored = Values::Nearest(value);                                                           \
    if (m_impl->readOnly || !std::isfinite(parameter) || std::isnan(start) || std::isnan(end) ||   \
        (Values::kMergeNeedsExact && !Values::Exact(value, stored))) {                             \
      return 0;                                                                                    \
    }                                                                                              \
    if (AreAnyValuesLockedInInterval(start, end, excludeStart, excludeEnd) ||                      \
        AreAnyParametersLockedInInterval(start, end, excludeStart, excludeEnd)) {                  \
      return 0;                                                                                    \
    }                                                                                              \
    return m_impl->MergeAndCreateKey(start, end, parameter, stored, *this, excludeStart,           \
                                     excludeEnd, keepAttributes);                                  \
  }                                                                                                \
  unsigned int Class::SetValueWhenNoKeys(double value) {                                           \
    ZvFCurveLockGuard guard(*this);                                                                \
    if (m_impl->readOnly || std::isnan(value)) return 0;                                           \
    m_impl->valueWhenNoKeys = Values::Nearest(value);                                              \
    return 1;                                                                                      \
  }                                                                                                \
  /* LeftSide changes the value in force before the key: the previous key's, or the value   */     \
  /* before the first key.                                                                   */    \
  unsigned int Class::SetKeyValue(double parameter, KeySide side, double value,                    \
                                  double tolerance) {                                              \
    ZvFCurveLockGuard guard(*this);                                                                \
    ZvStepFCurveImpl& s = *m_impl;                                                                 \
    unsigned int i;                                                                                \
    if (s.readOnly || std::isnan(value) ||                                                         \
        !s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i) ||                        \
        (s.GetKeyFlags(i) & CFCFlag_ValueLock)) {                                                  \
      return 0;                                                                                    \
    }                                                                                              \
    const int v = Values::Nearest(value);                                                          \
    if (side != LeftSide) {                                                                        \
      s.SetValue(i, v);                                                                            \
    } else if (i == 0) {                                                                           \
      s.valueBeforeFirstKey = v;                                                                   \
    } else {                                                                                       \
      if ((s.GetKeyFlags(i - 1) & CFCFlag_ValueLock) && s.GetValue(i - 1) != v) return 0;          \
      s.SetValue(i - 1, v);                                                                        \
    }                                                                                              \
    return 1;                                                                                      \
  }                                                                                                \
  /* No segment kinds, and clamps that are not reported: those requests are not met. */            \
  unsigned int Class::GetFCurveInfo(FCurveInfo* info) const {                                      \
    if (info == nullptr) return 0;                                                                 \
    ZvFCurveLockGuard guard(*this);                                                                \
    const ZvStepFCurveImpl& s = *m_impl;                                                           \
    const unsigned int mask = info->mask;                                                          \
    if (mask & FCurveInfo::KindMask) info->kind = Values::kKind;                                   \
    if (mask & FCurveInfo::NumKeysMask) info->numKeys = s.keys.size;                               \
    if (mask & FCurveInfo::ValueWhenNoKeysMask) info->valueWhenNoKeys = s.valueWhenNoKeys;         \
    if (mask & FCurveInfo::ExtrapolationMask) info->extrapolation = s.extrapolation;               \
    const unsigned int unmet =                                                                     \
        FCurveInfo::FirstSegmentKindMask | FCurveInfo::MinClampMask | FCurveInfo::MaxClampMask;    \
    if ((mask & unmet) == 0) return 1;                                                             \
    info->mask = mask & ~unmet;                                                                    \
    info->firstSegmentKind = ConstantSegment;                                                      \
    info->minClamp = info->maxClamp = 0.0;                                                         \
    return 0;                                                                                      \
  }                                                                                                \
  unsigned int Class::SetClampingValues(double, double) {                                          \
    return 0;                                                                                      \
  }                                                                                                \
  /* The stored clamps are not reported, deliberately. */                                          \
  unsigned int Class::GetClampingValues(double& minValue, double& maxValue) const {                \
    minValue = -DBL_MAX;                                                                           \
    maxValue = DBL_MAX;                                                                            \
    return 1;                                                                                      \
  }                                                                                                \
  unsigned int Class::SetConstraint(double& parameter, KeyConstraint constraints, int on,          \
                                    double tolerance) {                                            \
    ZvFCurveLockGuard guard(*this);                                                                \
    const unsigned int codes = static_cast<unsigned int>(constraints);                             \
    if (m_impl->readOnly || codes == 0 || (codes & ~kStepConstraintCodes) != 0) return 0;          \
    unsigned int i;                                                                                \
    if (!m_impl->GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;          \
    parameter = m_impl->keys[i].parameter;                                                         \
    return m_impl->SetConstraint(i, codes, on);                                                    \
  }                                                                                                \
  unsigned int Class::GetConstraint(double& parameter, KeyConstraint constraint, int& on,          \
                                    double tolerance) const {                                      \
    ZvFCurveLockGuard guard(*this);                                                                \
    unsigned int i;                                                                                \
    if (!zvIsStepConstraint(constraint) ||                                                         \
        !m_impl->GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) {                  \
      return 0;                                                                                    \
    }                                                                                              \
    parameter = m_impl->keys[i].parameter;                                                         \
    on = m_impl->GetConstraint(i, constraint);                                                     \
    return 1;                                                                                      \
  }                                                                                                \
  unsigned int Class::IsConstraintSupported(KeyConstraint constraint) const {                      \
    return zvIsStepConstraint(constraint);                                                         \
  }                                                                                                \
  unsigned int Class::AreAnyValuesLockedInInterval(double start, double end, int excludeStart,     \
                                                   int excludeEnd) const {                         \
    ZvFCurveLockGuard guard(*this);                                                                \
    return m_impl->AnyKeyHasFlagsInInterval(start, end, excludeStart, excludeEnd,                  \
                                            CFCFlag_ValueLock);                                    \
  }                                                                                                \
  unsigned int Class::AreAnyParametersLockedInInterval(double start, double end, int excludeStart, \
                                                       int excludeEnd) const {                     \
    ZvFCurveLockGuard guard(*this);                                                                \
    return m_impl->AnyKeyHasFlagsInInterval(start, end, excludeStart, excludeEnd,                  \
                                            CFCFlag_ParameterLock);                                \
  }                                                                                                \
  unsigned int Class::AreAnyKeysLockedInInterval(double start, double end, int excludeStart,       \
                                                 int excludeEnd) const {                           \
    ZvFCurveLockGuard guard(*this);                                                                \
    return m_impl->AnyKeyHasFlagsInInterval(start, end, excludeStart, excludeEnd,                  \
                                            CFCFlag_ParameterLock | CFCFlag_ValueLock);            \
  }                                                                                                \
  /* A step has no slope to extend, so the linear method is refused. */                            \
  unsigned int Class::SetExtrapolationMethod(ExtrapolationMethod method) {                         \
    ZvFCurveLockGuard guard(*this);                                                                \
    if (m_impl->readOnly || (method != ConstantExtrapolation && method != CycleExtrapolation &&    \
                             method != CycleWithOffsetExtrapolation)) {                            \
      return 0;                                                                                    \
    }                                                                                              \
    m_impl->extrapolation = static_cast<unsigned char>(method);                                    \
    return 1;                                                                                      \
  }                                                                                                \
  /* Stored for the hosts that read it back; steps have no handles for it to act on. */            \
  unsigned int Class::SetDefaultBezierTangentConstraint(int on) {                                  \
    ZvFCurveLockGuard guard(*this);                                                                \
    m_impl->defaultBezierTangentConstraint = on ? 1 : 0;                                           \
    return 1;                                                                                      \
  }                                                                                                \
  double Class::Eval(double parameter, int) const {                                                \
    ZvFCurveLockGuard guard(*this);                                                                \
    return CFCEvalSnapped(*m_impl, parameter, false);                                              \
  }                                                                                                \
  double Class::GetValueUpperBound(int) const {                                                    \
    ZvFCurveLockGuard guard(*this);                                                                \
    return m_impl->ValueBound(true);                                                               \
  }                                                                                                \
  double Class::GetValueLowerBound(int) const {                                                    \
    ZvFCurveLockGuard guard(*this);                                                                \
    return m_impl->ValueBound(false);                                                              \
  }                                                                                                \
  unsigned int Class::EvalInverse(double, double&, int) const {                                    \
    return 0;                                                                                      \
  }                                                                                                \
  unsigned int Class::IsBijective() const {                                                        \
    return 0;                                                                                      \
  }                                                                                                \
  unsigned int Class::ScaleAndOffsetParameters(double start, double end, double pivot,             \
                                               double scale, double offset, int moveHead,          \
                                               int moveTail, RegionHandle region) {                \
    ZvFCurveLockGuard guard(*this);                                                                \
    return CFCScaleAndOffsetParameters(*this, start, end, pivot, scale, offset, moveHead,          \
                                       moveTail, region,                                           \
                                       [](const Class& w) { return w.m_impl->KeysAreOrdered(); }); \
  }

#endif
