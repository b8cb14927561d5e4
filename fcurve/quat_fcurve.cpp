// The rotation view: construction and sharing, kind, settings, the record queries, and the slots
// a rotation angle has no use for.
#include <zv/quat_fcurve.h>

#include "fcurve/fcurve_lock.h"

#include <cfloat>

ZvQuatFCurve::ZvQuatFCurve(unsigned int component)
    : m_curve(new ZvQuatCurve), m_component(component) {
  m_curve->Ref();
}

ZvQuatFCurve::ZvQuatFCurve(ZvQuatCurve* curve, unsigned int component)
    : m_curve(curve), m_component(component) {
  m_curve->Ref();
}

// The base part is built fresh: a copy of a view starts without user data.
// NOLINTNEXTLINE(bugprone-copy-constructor-init): the user data stay with the original view.
ZvQuatFCurve::ZvQuatFCurve(const ZvQuatFCurve& other) : ZvBaseFCurve(), m_curve(nullptr) {
  ZvFCurveLockGuard hold(other);
  m_curve = new ZvQuatCurve(*other.m_curve);
  m_curve->Ref();
  m_component = other.m_component;
}

ZvQuatFCurve::~ZvQuatFCurve() {
  m_curve->UnRef();
}

ZvQuatFCurve& ZvQuatFCurve::operator=(const ZvQuatFCurve& other) {
  Set(other);
  return *this;
}

ZvBaseFCurve& ZvQuatFCurve::operator=(const ZvBaseFCurve& other) {
  Set(other);
  return *this;
}

unsigned int ZvQuatFCurve::Set(const ZvBaseFCurve& curve) {
  ZvFCurveLockGuard hold(*this);
  if (&curve == this) return 1;
  if (curve.GetKind() != QuatKind) return 0;
  const ZvQuatFCurve& other = static_cast<const ZvQuatFCurve&>(curve);
  ZvFCurveLockGuard holdOther(other);
  ZvQuatCurve* copy = new ZvQuatCurve(*other.m_curve);
  copy->Ref();
  m_curve->UnRef();
  m_curve = copy;
  m_component = other.m_component;
  return 1;
}

ZvBaseFCurve* ZvQuatFCurve::QueryFCurveKind(Kind kind) const {
  return kind == QuatKind ? const_cast<ZvQuatFCurve*>(this) : nullptr;
}

ZvBaseFCurve::Kind ZvQuatFCurve::GetKind() const {
  return QuatKind;
}

ZvBaseFCurve* ZvQuatFCurve::Clone() const {
  ZvFCurveLockGuard hold(*this);
  return new ZvQuatFCurve(*this);
}

unsigned int ZvQuatFCurve::SetReadOnlyConstraint(int on) {
  ZvFCurveLockGuard hold(*this);
  m_curve->SetReadOnlyConstraint(on);
  return 1;
}

unsigned int ZvQuatFCurve::IsReadOnly() const {
  ZvFCurveLockGuard hold(*this);
  return m_curve->IsReadOnly() ? 1 : 0;
}

unsigned int ZvQuatFCurve::SetExtrapolationMethod(ExtrapolationMethod method) {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->IsReadOnly()) return 0;
  return m_curve->SetExtrapolationMethod(static_cast<unsigned int>(method)) ? 1 : 0;
}

ZvBaseFCurve::ExtrapolationMethod ZvQuatFCurve::GetExtrapolationMethod() const {
  ZvFCurveLockGuard hold(*this);
  return static_cast<ExtrapolationMethod>(m_curve->GetExtrapolationMethod());
}

unsigned int ZvQuatFCurve::GetFCurveInfo(FCurveInfo* info) const {
  if (info == nullptr) return 0;
  ZvFCurveLockGuard hold(*this);
  unsigned int result = 1;
  if (info->mask & FCurveInfo::KindMask) info->kind = QuatKind;
  if (info->mask & FCurveInfo::NumKeysMask) info->numKeys = m_curve->GetNumKeys();
  if (info->mask & FCurveInfo::ValueWhenNoKeysMask) {
    info->valueWhenNoKeys = m_curve->GetValueWhenNoKeys(m_component);
  }
  if (info->mask & FCurveInfo::FirstSegmentKindMask) {
    // A rotation has no segment kinds: the request cannot be met.
    info->mask &= ~static_cast<unsigned int>(FCurveInfo::FirstSegmentKindMask);
    info->firstSegmentKind = 0;
    result = 0;
  }
  if (info->mask & FCurveInfo::MinClampMask) info->minClamp = -DBL_MAX;
  if (info->mask & FCurveInfo::MaxClampMask) info->maxClamp = DBL_MAX;
  if (info->mask & FCurveInfo::ExtrapolationMask) {
    info->extrapolation = m_curve->GetExtrapolationMethod();
  }
  return result;
}

unsigned int ZvQuatFCurve::GetKeyInfoFromIndex(unsigned int index, KeyInfo* info) const {
  if (info == nullptr) return 0;
  ZvFCurveLockGuard hold(*this);
  if (index >= m_curve->GetNumKeys()) {
    info->mask = 0;
    return 0;
  }
  const double value = m_curve->GetKeyValue(index, m_component);
  if (info->mask & KeyInfo::IndexMask) info->index = index;
  if (info->mask & KeyInfo::ParameterMask) info->parameter = m_curve->GetKeyTime(index);
  if (info->mask & KeyInfo::LeftValueMask) info->leftValue = value;
  if (info->mask & KeyInfo::RightValueMask) info->rightValue = value;
  const unsigned int handleBits = KeyInfo::LeftTangentXMask | KeyInfo::LeftTangentYMask |
                                  KeyInfo::RightTangentXMask | KeyInfo::RightTangentYMask |
                                  KeyInfo::SegmentKindMask;
  if ((info->mask & handleBits) == 0) return 1;
  info->mask &= ~handleBits;
  info->leftTangentX = info->leftTangentY = info->rightTangentX = info->rightTangentY = 0.0;
  info->segmentKind = ConstantSegment;
  return 0;
}

unsigned int ZvQuatFCurve::GetKeyInfoFromParameter(double parameter, KeyInfo* info) const {
  if (info == nullptr) return 0;
  ZvFCurveLockGuard hold(*this);
  const unsigned int index = m_curve->FindKey(parameter, 0.0);
  if (index == ZvQuatCurve::NoKey) {
    info->mask = 0;
    return 0;
  }
  return GetKeyInfoFromIndex(index, info);
}

// ---- Slots without meaning for a rotation angle ----

unsigned int ZvQuatFCurve::SetClampingValues(double, double) {
  return 0;
}

unsigned int ZvQuatFCurve::GetClampingValues(double& minValue, double& maxValue) const {
  minValue = -DBL_MAX;
  maxValue = DBL_MAX;
  return 1;
}

unsigned int ZvQuatFCurve::SetAsTimeFCurve(int) {
  return 1;
}
unsigned int ZvQuatFCurve::IsTimeFCurve() const {
  return 1;
}
unsigned int ZvQuatFCurve::SetDefaultBezierTangentConstraint(int) {
  return 0;
}
unsigned int ZvQuatFCurve::IsDefautlBezierTangentConstraintOn() const {
  return 0;
}
unsigned int ZvQuatFCurve::ReduceNumKeys(double, double, double) {
  return 0;
}
unsigned int ZvQuatFCurve::SmoothSequence(double, double, const double*, unsigned int) {
  return 0;
}
unsigned int ZvQuatFCurve::IsBijective() const {
  return 0;
}

unsigned int ZvQuatFCurve::EvalInverse(double, double& parameter, int) const {
  parameter = 3.4028234663852886e38;
  return 0;
}

unsigned int ZvQuatFCurve::MirrorParameters() {
  return 0;
}
