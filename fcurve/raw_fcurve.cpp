// ZvRawFCurve: construction, assignment and the key operations. Every public operation takes
// the curve's lock and hands the work to the implementation object or to the operations shared
// by the kinds of one value per key.
#include <zv/raw_fcurve.h>

#include "fcurve/cfc_curve_queries.h"
#include "fcurve/cfc_single_value_curve.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/raw_fcurve_impl.h"

#include <cmath>

ZvRawFCurve::ZvRawFCurve(double valueWhenNoKeys) : m_impl(new ZvRawFCurveImpl(valueWhenNoKeys)) {}

// A key that is not finite is not stored: the curve then stays without keys.
ZvRawFCurve::ZvRawFCurve(double parameter, double value) : m_impl(new ZvRawFCurveImpl(value)) {
  try {
    if (std::isfinite(parameter) && std::isfinite(value)) m_impl->InsertKey(0, parameter, value);
  } catch (...) {
    delete m_impl;  // no destructor runs for a constructor that throws
    throw;
  }
}

ZvRawFCurve::ZvRawFCurve(double parameter0, double value0, double parameter1, double value1)
    : m_impl(new ZvRawFCurveImpl(value0)) {
  if (!std::isfinite(parameter0) || !std::isfinite(value0) || !std::isfinite(parameter1) ||
      !std::isfinite(value1)) {
    return;
  }
  try {
    m_impl->InsertKey(0, parameter0, value0);
    if (zvIsSameParameter(parameter0, parameter1)) return;
    m_impl->InsertKey(parameter1 > parameter0 ? 1 : 0, parameter1, value1);
  } catch (...) {
    delete m_impl;
    throw;
  }
  m_impl->valueWhenNoKeys = m_impl->keys[0].value;
}

ZvRawFCurve::ZvRawFCurve(const ZvPoint2dArray& points, double tolerance)
    : m_impl(new ZvRawFCurveImpl(points.size ? points[0].y : 0.0)) {
  try {
    m_impl->SetToApproxLinearFitC0(points, tolerance);
  } catch (...) {
    delete m_impl;
    throw;
  }
}

ZV_CFC_SINGLE_VALUE_SLOTS(ZvRawFCurve, ZvRawFCurveImpl)

ZvBaseFCurve::Kind ZvRawFCurve::GetKind() const {
  return RawKind;
}

unsigned int ZvRawFCurve::CreateKey(double parameter, double value) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || !std::isfinite(parameter) || !std::isfinite(value)) return 0;
  return m_impl->CreateKey(parameter, value, *this);
}

unsigned int ZvRawFCurve::MergeAndCreateKey(double start, double end, double parameter,
                                            double value, int excludeStart, int excludeEnd,
                                            int keepAttributes) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || !std::isfinite(parameter) || !std::isfinite(value) || std::isnan(start) ||
      std::isnan(end)) {
    return 0;
  }
  return m_impl->MergeAndCreateKey(start, end, parameter, value, *this, excludeStart, excludeEnd,
                                   keepAttributes);
}

unsigned int ZvRawFCurve::SetValueWhenNoKeys(double value) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || !std::isfinite(value)) return 0;
  m_impl->valueWhenNoKeys = value;
  return 1;
}

// A key has one value; the side does not matter.
unsigned int ZvRawFCurve::SetKeyValue(double parameter, KeySide, double value, double tolerance) {
  ZvFCurveLockGuard guard(*this);
  ZvRawFCurveImpl& s = *m_impl;
  unsigned int i;
  if (s.readOnly || !std::isfinite(value) ||
      !s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) {
    return 0;
  }
  s.keys[i].value = value;
  return 1;
}

unsigned int ZvRawFCurve::AppendLinearSegment(const ZvPoint2<double>& point) {
  ZvFCurveLockGuard guard(*this);
  ZvRawFCurveImpl& s = *m_impl;
  const unsigned int n = s.keys.size;
  if (s.readOnly || !std::isfinite(point.x) || !std::isfinite(point.y) ||
      (n && !(point.x > s.keys[n - 1].parameter))) {
    return 0;
  }
  if (n == 0) s.valueWhenNoKeys = point.y;
  s.AppendLinearSegment(point);
  return 1;
}

unsigned int ZvRawFCurve::AppendOrExtendLinearSegment(const ZvPoint2<double>& point,
                                                      double tolerance) {
  ZvFCurveLockGuard guard(*this);
  ZvRawFCurveImpl& s = *m_impl;
  const unsigned int n = s.keys.size;
  if (n < 2) return AppendLinearSegment(point);
  if (s.readOnly || !std::isfinite(point.x) || !std::isfinite(point.y) ||
      !(point.x > s.keys[n - 1].parameter)) {
    return 0;
  }
  const double y = s.ValueAfterKey(n - 2, point.x);
  if (std::fabs(y - point.y) <= tolerance) {
    // The key's user data moves with it.
    const double old = s.keys[n - 1].parameter;
    const CFCUserDataSet* set = GetUserDataSet(old);
    if (set != nullptr) {
      const CFCUserDataSet moved(*set);
      RemoveKeyUserData(old);
      SetUserDataSet(moved, point.x);
    }
    s.keys[n - 1].parameter = point.x;
    s.keys[n - 1].value = y;
    return 1;
  }
  s.AppendLinearSegment(point);
  return 1;
}
