// ZvBooleanFCurve: a step curve of 0 and 1. A value is 1 when it lies within 1e-15 of 1.
#include <zv/step_fcurve.h>

#include "fcurve/step_fcurve_slots.h"

#include <cmath>

struct ZvBooleanValues {
  static constexpr ZvBaseFCurve::Kind kKind = ZvBaseFCurve::BooleanKind;
  static constexpr bool kMergeNeedsExact = false;
  static bool IsOne(double v) { return std::fabs(v - 1.0) <= 1e-15; }
  static int Nearest(double v) { return IsOne(v) ? 1 : 0; }
  static int Exact(double v, int& out) {
    if (!IsOne(v) && !(std::fabs(v) <= 1e-15)) return 0;
    out = Nearest(v);
    return 1;
  }
};

ZV_STEP_FCURVE_SLOTS(ZvBooleanFCurve, ZvBooleanValues)

ZvBooleanFCurve::ZvBooleanFCurve(double valueWhenNoKeys)
    : m_impl(new ZvStepFCurveImpl(ZvBooleanValues::Nearest(valueWhenNoKeys), 0, 1)) {}

// Values 0 and 1 have nothing to shift or scale into.
unsigned int ZvBooleanFCurve::ShiftValues(double) {
  return 1;
}

unsigned int ZvBooleanFCurve::ScaleAndShiftValues(double, double) {
  return 1;
}

// A weighted sum of truth values is no truth value.
unsigned int ZvBooleanFCurve::SmoothSequence(double, double, const double*, unsigned int) {
  return 0;
}

// Logical negation of every value, the value before the first key and the value without keys.
// A curve without keys stays as it is.
unsigned int ZvBooleanFCurve::MirrorValues() {
  ZvFCurveLockGuard guard(*this);
  ZvStepFCurveImpl& s = *m_impl;
  if (s.readOnly || s.AnyKeyHas(CFCFlag_ValueLock)) return 0;
  if (s.keys.size == 0) return 1;
  s.valueWhenNoKeys = !s.valueWhenNoKeys;
  s.valueBeforeFirstKey = !s.valueBeforeFirstKey;
  for (unsigned int i = 0; i < s.keys.size; ++i)
    s.keys[i].value = !s.keys[i].value;
  return 1;
}
