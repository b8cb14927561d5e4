// ZvStdFCurve: construction, assignment, and the key operations. Every public operation takes
// the curve's lock and hands the work to the implementation object.
#include <zv/std_fcurve.h>

#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"

#include <cmath>
#include <new>

ZvStdFCurve::ZvStdFCurve(double valueWhenNoKeys, FSKind firstSegmentKind)
    : m_impl(new ZvStdFCurveImpl(valueWhenNoKeys, firstSegmentKind)) {}

ZvStdFCurve::ZvStdFCurve(double parameter, double leftValue, double rightValue,
                         FSKind firstSegmentKind, FSKind segmentKind)
    : m_impl(new ZvStdFCurveImpl(leftValue, firstSegmentKind)) {
  if (!std::isfinite(parameter) || !std::isfinite(leftValue) || !std::isfinite(rightValue)) return;
  CFCStdKey k{};
  k.parameter = parameter;
  k.leftValue = leftValue;
  k.rightValue = rightValue;
  k.leftTangent = {parameter, leftValue};
  k.rightTangent = {parameter, rightValue};
  k.segmentKind = static_cast<unsigned char>(segmentKind);
  k.flags = CFCFlag_TangentContinuity;
  m_impl->keys.Add(k);
}

ZvStdFCurve::ZvStdFCurve(const ZvPoint2<double>& p0, const ZvPoint2<double>& p1,
                         const ZvPoint2<double>& p2, const ZvPoint2<double>& p3)
    : m_impl(new ZvStdFCurveImpl(p0.y, CubicSegment)) {
  ZvPoint2<double> p[4] = {p0, p1, p2, p3};
  // Not a function segment, or a point beyond the doubles: the curve stays without keys.
  auto finite = [&p]() {
    for (const ZvPoint2<double>& q : p)
      if (!std::isfinite(q.x) || !std::isfinite(q.y)) return false;
    return true;
  };
  if (!(p0.x < p3.x) || !finite()) return;
  BezierCubicRegularize(p);
  if (!finite()) return;
  CFCStdKey a{}, b{};
  a.parameter = p[0].x;
  a.leftValue = a.rightValue = p[0].y;
  a.leftTangent = p[0];
  a.rightTangent = p[1];
  b.parameter = p[3].x;
  b.leftValue = b.rightValue = p[3].y;
  b.leftTangent = p[2];
  b.rightTangent = p[3];
  a.segmentKind = b.segmentKind = CubicSegment;
  a.flags = b.flags = CFCFlag_TangentContinuity;
  m_impl->keys.Add(a);
  m_impl->keys.Add(b);
}

ZvStdFCurve::ZvStdFCurve(double startParameter, double startValue, double endParameter,
                         double endValue)
    : ZvStdFCurve(ZvPoint2<double>{startParameter, startValue},
                  ZvPoint2<double>{startParameter + (endParameter - startParameter) / 3.0,
                                   startValue + (endValue - startValue) / 3.0},
                  ZvPoint2<double>{endParameter - (endParameter - startParameter) / 3.0,
                                   endValue - (endValue - startValue) / 3.0},
                  ZvPoint2<double>{endParameter, endValue}) {}

ZvStdFCurve::ZvStdFCurve(const ZvStdFCurve& other) : ZvStdFCurve(other, ZvFCurveLockGuard(other)) {}

ZvStdFCurve::ZvStdFCurve(const ZvStdFCurve& other, const ZvFCurveLockGuard&)
    : ZvBaseFCurve(other), m_impl(new ZvStdFCurveImpl(*other.m_impl)) {}

ZvStdFCurve::~ZvStdFCurve() {
  delete m_impl;
}

ZvStdFCurve& ZvStdFCurve::operator=(const ZvStdFCurve& other) {
  Set(other);
  return *this;
}

ZvBaseFCurve& ZvStdFCurve::operator=(const ZvBaseFCurve& other) {
  Set(other);
  return *this;
}

unsigned int ZvStdFCurve::Set(const ZvBaseFCurve& curve) {
  const ZvStdFCurve* other = dynamic_cast<const ZvStdFCurve*>(&curve);
  if (other == nullptr) return 0;
  ZvFCurveLockGuard guard(*this);
  if (other == this) return 1;
  ZvBaseFCurve::operator=(*other);
  ZvFCurveLockGuard otherGuard(*other);
  *m_impl = *other->m_impl;
  return 1;
}

ZvBaseFCurve* ZvStdFCurve::QueryFCurveKind(Kind kind) const {
  return kind == StdKind ? const_cast<ZvStdFCurve*>(this) : nullptr;
}

ZvBaseFCurve::Kind ZvStdFCurve::GetKind() const {
  return StdKind;
}

ZvBaseFCurve* ZvStdFCurve::Clone() const {
  try {
    return new ZvStdFCurve(*this);
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}

unsigned int ZvStdFCurve::CreateKey(double parameter, double value) {
  return CreateKey(parameter, value, FSKind(0), FSKind(0));
}

unsigned int ZvStdFCurve::CreateKey(double parameter, double value, FSKind left, FSKind right) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || !std::isfinite(parameter) || !std::isfinite(value) ||
      left > CubicSegment || right > CubicSegment) {
    return 0;
  }
  return m_impl->CreateKey(parameter, value, left, right, *this);
}

unsigned int ZvStdFCurve::MergeAndCreateKey(double start, double end, double parameter,
                                            double value, int excludeStart, int excludeEnd,
                                            int keepAttributes) {
  return MergeAndCreateKey(start, end, parameter, value, FSKind(0), FSKind(0), excludeStart,
                           excludeEnd, keepAttributes);
}

unsigned int ZvStdFCurve::MergeAndCreateKey(double start, double end, double parameter,
                                            double value, FSKind leftKind, FSKind rightKind,
                                            int excludeStart, int excludeEnd, int keepAttributes) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || !std::isfinite(parameter) || !std::isfinite(value) || !std::isfinite(start) ||
      !std::isfinite(end) || leftKind > CubicSegment || rightKind > CubicSegment) {
    return 0;
  }
  if (AreAnyParametersLockedInInterval(start, end, excludeStart, excludeEnd) ||
      AreAnyValuesLockedInInterval(start, end, excludeStart, excludeEnd)) {
    return 0;
  }
  const long n = static_cast<long>(s.keys.size);
  if (n == 0) return s.CreateKey(parameter, value, leftKind, rightKind, *this);
  long left, right;
  s.MergeBounds(start, end, excludeStart, excludeEnd, left, right);
  if ((right - left == 2 && zvIsSameParameter(s.keys[left + 1].parameter, parameter)) ||
      (n == 1 && !zvIsSameParameter(s.keys[0].parameter, parameter))) {
    return s.CreateKey(parameter, value, leftKind, rightKind, *this);
  }
  if (!s.FitsBetweenMergeBounds(left, right, parameter)) return 0;
  const bool inherit = keepAttributes && right - left > 1;
  unsigned short donorFlags = 0;
  CFCUserDataSet donorData;
  bool donorHasData = false;
  if (inherit) {
    const unsigned int donor = s.NearestKeyIndex(parameter);
    donorFlags = s.keys[donor].flags;
    const CFCUserDataSet* set = GetUserDataSet(s.keys[donor].parameter);
    if (set != nullptr) {
      donorData = *set;
      donorHasData = true;
    }
  }
  const unsigned int kind = left >= 0 ? s.keys[left].segmentKind : s.firstSegmentKind;
  const unsigned int lk = leftKind ? static_cast<unsigned int>(leftKind) : kind;
  const unsigned int rk = rightKind ? static_cast<unsigned int>(rightKind) : kind;
  if (left >= 0 && right < n) {
    s.RemoveBodyAndCreateKeyBetweenExistingKeys(parameter, value, lk, rk,
                                                static_cast<unsigned int>(left),
                                                static_cast<unsigned int>(right), *this);
  } else if (left >= 0) {
    s.RemoveTailAndCreateKeyAfterExistingKey(parameter, value, lk, rk,
                                             static_cast<unsigned int>(left), *this);
  } else if (right < n) {
    s.RemoveHeadAndCreateKeyBeforeExistingKey(parameter, value, lk, rk,
                                              static_cast<unsigned int>(right), *this);
  } else {
    s.RemoveAllKeysAndCreateNewKey(parameter, value, lk, rk, *this);
  }
  if (inherit) {
    unsigned int at;
    if (s.GetClosestKeyIndexInCenteredInterval(parameter, 0.0, at)) s.keys[at].flags = donorFlags;
    if (donorHasData) SetUserDataSet(donorData, parameter);
  }
  return 1;
}

unsigned int ZvStdFCurve::CreateNonModifyingKey(double parameter, int noFold) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || !std::isfinite(parameter)) return 0;
  if (!noFold) s.FoldParameter(parameter);
  // Folding by a period past the largest double gives no parameter.
  if (!std::isfinite(parameter)) return 0;
  if (s.keys.size) {
    // Automatic neighbours would change shape once the new key is between them.
    int found;
    const unsigned int at = s.LocateParameter(parameter, found);
    if (at > 0) s.ResolveAutoTangent(at - 1);
    if (at < s.keys.size) s.ResolveAutoTangent(at);
  }
  const double value = Eval(parameter, 0);
  return s.CreateKey(parameter, value, 0, 0, *this);
}

unsigned int ZvStdFCurve::MergeAndCreateNonModifyingKey(double start, double end, double parameter,
                                                        int excludeStart, int excludeEnd,
                                                        int keepAttributes, int noFold) {
  ZvFCurveLockGuard guard(*this);
  if (!noFold) m_impl->FoldParameter(parameter);
  const double value = Eval(parameter, 0);
  return MergeAndCreateKey(start, end, parameter, value, excludeStart, excludeEnd, keepAttributes);
}

unsigned int ZvStdFCurve::RemoveKey(double parameter, double tolerance) {
  return RemoveKey(parameter, FSKind(0), tolerance);
}

unsigned int ZvStdFCurve::RemoveKey(double parameter, FSKind kind, double tolerance) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || kind > CubicSegment) return 0;
  if (s.keys.size == 0) return 1;
  unsigned int i;
  if (!s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
  if (s.keys[i].flags & (CFCFlag_ValueLock | CFCFlag_ParameterLock)) return 0;
  return s.RemoveKey(parameter, kind, tolerance, *this);
}

unsigned int ZvStdFCurve::RemoveKeys(double start, double end, int excludeStart, int excludeEnd) {
  return RemoveKeys(start, end, FSKind(0), excludeStart, excludeEnd);
}

unsigned int ZvStdFCurve::RemoveKeys(double start, double end, FSKind removedKind, int excludeStart,
                                     int excludeEnd) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || !std::isfinite(start) || !std::isfinite(end) || removedKind > CubicSegment) {
    return 0;
  }
  if (zvIsSameParameter(start, end) && excludeStart != excludeEnd) excludeStart = excludeEnd = 0;
  if (AreAnyParametersLockedInInterval(start, end, excludeStart, excludeEnd) ||
      AreAnyValuesLockedInInterval(start, end, excludeStart, excludeEnd)) {
    return 0;
  }
  unsigned int first, last;
  if (!s.GetKeyIndicesInInterval(start, end, first, last, excludeStart, excludeEnd)) return 1;
  const unsigned int n = s.keys.size;
  const bool hasLeft = first > 0, hasRight = last + 1 < n;
  const unsigned int kind = removedKind ? static_cast<unsigned int>(removedKind)
                            : hasLeft   ? s.keys[first - 1].segmentKind
                                        : s.firstSegmentKind;
  if (hasLeft && hasRight) return s.RemoveBodyBetweenExistingKeys(kind, first - 1, last + 1, *this);
  if (hasLeft) return s.RemoveTailAfterExistingKey(kind, first - 1, *this);
  if (hasRight) return s.RemoveHeadBeforeExistingKey(kind, last + 1, *this);
  RemoveAllKeyUserData();
  s.DropAllKeys();
  s.firstSegmentKind = kind;
  return 1;
}

unsigned int ZvStdFCurve::RemoveHead(double parameter) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || !std::isfinite(parameter)) return 0;
  if (s.keys.size == 0 || zvIsSameParameter(parameter, s.keys[0].parameter)) return 1;
  if (AreAnyParametersLockedInInterval(s.keys[0].parameter, parameter, 0, 1) ||
      AreAnyValuesLockedInInterval(s.keys[0].parameter, parameter, 0, 1)) {
    return 0;
  }
  unsigned int index;
  s.CreateNonModifyingKey(parameter, index, *this);
  return s.RemoveHeadBeforeExistingKey(s.firstSegmentKind, index, *this);
}

unsigned int ZvStdFCurve::RemoveTail(double parameter) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  if (s.readOnly || !std::isfinite(parameter)) return 0;
  const unsigned int n = s.keys.size;
  if (n == 0 || zvIsSameParameter(parameter, s.keys[n - 1].parameter)) return 1;
  if (AreAnyParametersLockedInInterval(parameter, s.keys[n - 1].parameter, 1, 0) ||
      AreAnyValuesLockedInInterval(parameter, s.keys[n - 1].parameter, 1, 0)) {
    return 0;
  }
  unsigned int index;
  s.CreateNonModifyingKey(parameter, index, *this);
  return s.RemoveTailAfterExistingKey(s.keys[index].segmentKind, index, *this);
}

unsigned int ZvStdFCurve::SetValueWhenNoKeys(double value) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || !std::isfinite(value)) return 0;
  m_impl->valueWhenNoKeys = value;
  return 1;
}

unsigned int ZvStdFCurve::GetKeyValue(double parameter, KeySide side, double& value,
                                      double tolerance) const {
  ZvFCurveLockGuard guard(*this);
  unsigned int i;
  if (!m_impl->GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
  value = side == LeftSide ? m_impl->EffectiveLeftValue(i) : m_impl->keys[i].rightValue;
  return 1;
}

unsigned int ZvStdFCurve::GetKeyValues(double parameter, double& left, double& right,
                                       double tolerance) const {
  ZvFCurveLockGuard guard(*this);
  unsigned int i;
  if (!m_impl->GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
  left = m_impl->EffectiveLeftValue(i);
  right = m_impl->keys[i].rightValue;
  return 1;
}

// One side of a key takes the value; its handle on that side moves along.
unsigned int ZvStdFCurve::SetKeyValue(double parameter, KeySide side, double value,
                                      double tolerance) {
  ZvFCurveLockGuard guard(*this);
  ZvStdFCurveImpl& s = *m_impl;
  unsigned int i;
  if (s.readOnly || !std::isfinite(value) ||
      !s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) {
    return 0;
  }
  CFCStdKey& k = s.keys[i];
  if (k.flags & CFCFlag_ValueLock) return 0;
  if (side == LeftSide) {
    k.leftTangent.y += value - k.leftValue;
    k.leftValue = value;
  } else {
    k.rightTangent.y += value - k.rightValue;
    k.rightValue = value;
  }
  return 1;
}
