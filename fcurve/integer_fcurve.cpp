// ZvIntegerFCurve: a step curve of 32-bit integers.
#include <zv/step_fcurve.h>

#include "fcurve/step_fcurve_slots.h"

#include <climits>
#include <cmath>
#include <cstdint>

namespace {

// Truncation toward zero that stays defined outside the int range: it saturates.
int Truncate(double v) {
  if (!(v > -2147483649.0)) return INT_MIN;
  if (!(v < 2147483648.0)) return INT_MAX;
  return static_cast<int>(v);
}

// Arithmetic that wraps like the 32-bit integers it works on, without overflowing in C++.
int Wrap(std::int64_t v) {
  return static_cast<int>(static_cast<std::uint32_t>(static_cast<std::uint64_t>(v)));
}

// floor(v + 0.5): the integer a shift or a scale is rounded to.
int Round(double v) {
  return Truncate(std::floor(v + 0.5));
}

}  // namespace

struct ZvIntegerValues {
  static constexpr ZvBaseFCurve::Kind kKind = ZvBaseFCurve::IntegerKind;
  static constexpr bool kMergeNeedsExact = true;
  static int Nearest(double v) { return Truncate(v); }
  // A negative value a hair above a whole number truncates toward zero and would be refused;
  // it is taken one lower first, so that the closeness test sees the whole number below it.
  static int Exact(double v, int& out) {
    if (!(v >= -2147483648.0 && v <= 2147483647.0)) return 0;
    double i = std::trunc(v);
    if (v < 0.0 && !(std::fabs(v - i) < 1e-9)) i = std::trunc(v - 1.0);
    const double d = v - i;
    if (!(d >= -1e-15 && d <= 1e-15)) return 0;
    out = static_cast<int>(i);
    return 1;
  }
};

ZV_STEP_FCURVE_SLOTS(ZvIntegerFCurve, ZvIntegerValues)

ZvIntegerFCurve::ZvIntegerFCurve(double valueWhenNoKeys)
    : m_impl(new ZvStepFCurveImpl(Truncate(valueWhenNoKeys), INT_MIN, INT_MAX)) {}

// The value before the first key is left alone, as the keys' own step is what moves.
unsigned int ZvIntegerFCurve::ShiftValues(double delta) {
  ZvFCurveLockGuard guard(*this);
  ZvStepFCurveImpl& s = *m_impl;
  if (s.readOnly || std::isnan(delta) || s.AnyKeyHas(CFCFlag_ValueLock)) return 0;
  const int d = Round(delta);
  for (unsigned int i = 0; i < s.keys.size; ++i)
    s.keys[i].value = Wrap(std::int64_t{s.keys[i].value} + d);
  s.valueWhenNoKeys = Wrap(std::int64_t{s.valueWhenNoKeys} + d);
  return 1;
}

// Each key takes the new value of the key before it (the first key that of the value before the
// first key), scaled and shifted; the value before the first key itself stays. Stored curves
// have always been edited this way and their hosts expect it.
unsigned int ZvIntegerFCurve::ScaleAndShiftValues(double scale, double offset) {
  ZvFCurveLockGuard guard(*this);
  ZvStepFCurveImpl& s = *m_impl;
  if (!(std::fabs(scale) > 1e-7) || std::isnan(offset) || s.readOnly ||
      s.AnyKeyHas(CFCFlag_ValueLock)) {
    return 0;
  }
  const std::int64_t k = Round(scale), o = Round(offset);
  auto map = [k, o](int v) { return Wrap(v * k + o); };
  s.valueWhenNoKeys = map(s.valueWhenNoKeys);
  const int low = map(s.minClamp), high = map(s.maxClamp);
  s.minClamp = low < high ? low : high;
  s.maxClamp = low < high ? high : low;
  int previous = map(s.valueBeforeFirstKey);
  for (unsigned int i = 0; i < s.keys.size; ++i) {
    s.keys[i].value = previous;
    previous = map(previous);
  }
  return 1;
}

// Arithmetic negation of every value, the value before the first key and the value without keys.
unsigned int ZvIntegerFCurve::MirrorValues() {
  ZvFCurveLockGuard guard(*this);
  ZvStepFCurveImpl& s = *m_impl;
  if (s.readOnly || s.AnyKeyHas(CFCFlag_ValueLock)) return 0;
  s.valueWhenNoKeys = Wrap(-std::int64_t{s.valueWhenNoKeys});
  s.valueBeforeFirstKey = Wrap(-std::int64_t{s.valueBeforeFirstKey});
  for (unsigned int i = 0; i < s.keys.size; ++i)
    s.keys[i].value = Wrap(-std::int64_t{s.keys[i].value});
  return 1;
}

// The convolution runs in double precision; each result is truncated as SetKeyValue stores it.
unsigned int ZvIntegerFCurve::SmoothSequence(double start, double end, const double* kernel,
                                             unsigned int kernelSize) {
  ZvFCurveLockGuard guard(*this);
  return CFCSingleValueCurve<ZvIntegerFCurve, ZvStepFCurveImpl>::SmoothSequence(*this, start, end,
                                                                                kernel, kernelSize);
}
