// The rotation view's queries: key parameters, values in degrees, bounds, evaluation, folding.
#include <zv/quat_fcurve.h>

#include "fcurve/fcurve_lock.h"
#include "fcurve/quat_key_interval.h"

#include <cfloat>
#include <cmath>

unsigned int ZvQuatFCurve::GetNumKeys() const {
  ZvFCurveLockGuard hold(*this);
  return m_curve->GetNumKeys();
}

unsigned int ZvQuatFCurve::GetKeyParameter(unsigned int index, double& parameter) const {
  ZvFCurveLockGuard hold(*this);
  if (index >= m_curve->GetNumKeys()) return 0;
  parameter = m_curve->GetKeyTime(index);
  return 1;
}

unsigned int ZvQuatFCurve::GetKeyIndex(double parameter, unsigned int& index) const {
  ZvFCurveLockGuard hold(*this);
  const unsigned int i = m_curve->FindKey(parameter, 0.0);
  if (i == ZvQuatCurve::NoKey) return 0;
  index = i;
  return 1;
}

unsigned int ZvQuatFCurve::GetKeyParameters(double start, double end, ZvDoubleArray& parameters,
                                            int excludeStart, int excludeEnd) const {
  ZvFCurveLockGuard hold(*this);
  // Equal ends with one exclusion would name no key at all; the caller means the key there.
  if (zvIsSameParameter(start, end) && (excludeStart != 0) != (excludeEnd != 0)) {
    excludeStart = excludeEnd = 0;
  }
  unsigned int first, last;
  const std::vector<ZvQuatKey>& keys = m_curve->GetKeys();
  if (!QuatKeyIndicesInInterval(keys, start, end, first, last, excludeStart, excludeEnd)) return 0;
  for (unsigned int i = first; i <= last; ++i)
    parameters.Add(keys[i].time);
  return last - first + 1;
}

unsigned int ZvQuatFCurve::IsKeyParameter(double parameter, double tolerance) const {
  ZvFCurveLockGuard hold(*this);
  return m_curve->FindKey(parameter, tolerance) != ZvQuatCurve::NoKey ? 1 : 0;
}

unsigned int ZvQuatFCurve::GetAllKeyParameters(ZvDoubleArray& parameters) const {
  ZvFCurveLockGuard hold(*this);
  for (const ZvQuatKey& k : m_curve->GetKeys())
    parameters.Add(k.time);
  return m_curve->GetNumKeys();
}

unsigned int ZvQuatFCurve::GetNextKeyParameter(double parameter, double& next,
                                               int inclusive) const {
  ZvFCurveLockGuard hold(*this);
  for (const ZvQuatKey& k : m_curve->GetKeys()) {
    if (inclusive ? k.time - parameter >= -1e-15 : k.time - parameter > 1e-15) {
      next = k.time;
      return 1;
    }
  }
  return 0;
}

unsigned int ZvQuatFCurve::GetPrevKeyParameter(double parameter, double& prev,
                                               int inclusive) const {
  ZvFCurveLockGuard hold(*this);
  const std::vector<ZvQuatKey>& keys = m_curve->GetKeys();
  for (auto k = keys.rbegin(); k != keys.rend(); ++k) {
    if (inclusive ? parameter - k->time >= -1e-15 : parameter - k->time > 1e-15) {
      prev = k->time;
      return 1;
    }
  }
  return 0;
}

unsigned int ZvQuatFCurve::GetNearestKeyParameter(double parameter, double& nearest) const {
  ZvFCurveLockGuard hold(*this);
  const std::vector<ZvQuatKey>& keys = m_curve->GetKeys();
  if (keys.empty() || std::isnan(parameter)) return 0;  // a NaN is near no key
  double best = keys[0].time;
  for (const ZvQuatKey& k : keys) {
    // `<=` so that of two equally near keys the later wins.
    if (std::fabs(k.time - parameter) <= std::fabs(best - parameter)) best = k.time;
  }
  nearest = best;
  return 1;
}

unsigned int ZvQuatFCurve::GetNearestKeyParameterInCenteredInterval(double& parameter,
                                                                    double tolerance) const {
  ZvFCurveLockGuard hold(*this);
  const unsigned int i = m_curve->FindKey(parameter, tolerance);
  if (i == ZvQuatCurve::NoKey) return 0;
  parameter = m_curve->GetKeyTime(i);
  return 1;
}

unsigned int ZvQuatFCurve::GetSmallestKeyParameter(double& parameter) const {
  ZvFCurveLockGuard hold(*this);
  if (m_curve->GetNumKeys() == 0) return 0;
  parameter = m_curve->GetKeyTime(0);
  return 1;
}

unsigned int ZvQuatFCurve::IsSmallestKeyParameter(double parameter) const {
  ZvFCurveLockGuard hold(*this);
  return m_curve->GetNumKeys() && zvIsSameParameter(parameter, m_curve->GetKeyTime(0)) ? 1 : 0;
}

unsigned int ZvQuatFCurve::GetLargestKeyParameter(double& parameter) const {
  ZvFCurveLockGuard hold(*this);
  const unsigned int n = m_curve->GetNumKeys();
  if (n == 0) return 0;
  parameter = m_curve->GetKeyTime(n - 1);
  return 1;
}

unsigned int ZvQuatFCurve::IsLargestKeyParameter(double parameter) const {
  ZvFCurveLockGuard hold(*this);
  const unsigned int n = m_curve->GetNumKeys();
  return n && zvIsSameParameter(parameter, m_curve->GetKeyTime(n - 1)) ? 1 : 0;
}

double ZvQuatFCurve::GetMinusInfinityVal() const {
  ZvFCurveLockGuard hold(*this);
  return m_curve->GetNumKeys() ? m_curve->GetKeyValue(0, m_component)
                               : m_curve->GetValueWhenNoKeys(m_component);
}

double ZvQuatFCurve::GetPlusInfinityVal() const {
  ZvFCurveLockGuard hold(*this);
  const unsigned int n = m_curve->GetNumKeys();
  return n ? m_curve->GetKeyValue(n - 1, m_component) : m_curve->GetValueWhenNoKeys(m_component);
}

double ZvQuatFCurve::GetValueUpperBound(int) const {
  ZvFCurveLockGuard hold(*this);
  const unsigned int n = m_curve->GetNumKeys();
  if (n == 0) return m_curve->GetValueWhenNoKeys(m_component);
  double high = -DBL_MAX;
  for (unsigned int i = 0; i < n; ++i)
    high = std::fmax(high, m_curve->GetKeyValue(i, m_component));
  return high;
}

double ZvQuatFCurve::GetValueLowerBound(int) const {
  ZvFCurveLockGuard hold(*this);
  const unsigned int n = m_curve->GetNumKeys();
  if (n == 0) return m_curve->GetValueWhenNoKeys(m_component);
  double low = DBL_MAX;
  for (unsigned int i = 0; i < n; ++i)
    low = std::fmin(low, m_curve->GetKeyValue(i, m_component));
  return low;
}

unsigned int ZvQuatFCurve::GetValueBoundsBetween(double start, double end, double& low,
                                                 double& high) const {
  ZvFCurveLockGuard hold(*this);
  low = DBL_MAX;
  high = -DBL_MAX;
  const unsigned int n = m_curve->GetNumKeys();
  if (n == 0) return 0;
  const auto count = [&](double v) {
    low = std::fmin(low, v);
    high = std::fmax(high, v);
  };
  for (unsigned int i = 0; i < n; ++i) {
    const double t = m_curve->GetKeyTime(i);
    if (t >= start && t <= end) count(m_curve->GetKeyValue(i, m_component));
  }
  count(m_curve->Eval(start, m_component));
  count(m_curve->Eval(end, m_component));
  return 1;
}

unsigned int ZvQuatFCurve::GetKeyValue(double parameter, KeySide, double& value,
                                       double tolerance) const {
  ZvFCurveLockGuard hold(*this);
  const unsigned int i = m_curve->FindKey(parameter, tolerance);
  if (i == ZvQuatCurve::NoKey) return 0;
  value = m_curve->GetKeyValue(i, m_component);
  return 1;
}

unsigned int ZvQuatFCurve::GetKeyValues(double parameter, double& left, double& right,
                                        double tolerance) const {
  ZvFCurveLockGuard hold(*this);
  const unsigned int i = m_curve->FindKey(parameter, tolerance);
  if (i == ZvQuatCurve::NoKey) return 0;
  left = right = m_curve->GetKeyValue(i, m_component);
  return 1;
}

unsigned int ZvQuatFCurve::GetKeys(ZvDoubleArray& parameters, ZvDoubleArray& leftValues,
                                   ZvDoubleArray& rightValues, int) const {
  ZvFCurveLockGuard hold(*this);
  const unsigned int n = m_curve->GetNumKeys();
  for (unsigned int i = 0; i < n; ++i) {
    const double v = m_curve->GetKeyValue(i, m_component);
    parameters.Add(m_curve->GetKeyTime(i));
    leftValues.Add(v);
    rightValues.Add(v);
  }
  return n;
}

double ZvQuatFCurve::Eval(double parameter, int) const {
  ZvFCurveLockGuard hold(*this);
  return m_curve->Eval(parameter, m_component);
}

unsigned int ZvQuatFCurve::EvalSequence(double start, double end, double step, double,
                                        ZvDoubleArray& parameters, ZvDoubleArray& values,
                                        int) const {
  if (!(step > 0.0) || !std::isfinite(start) || !std::isfinite(end)) return 0;
  // Samples counted, not summed, so that a step lost in the rounding of t cannot stall the walk.
  // Each is a spline evaluation of about a microsecond: 2^20 of them take about a second, and
  // more are refused before the arrays are touched.
  const double count = std::ceil((end - start) / step);
  if (!(count <= 1048576.0)) return 0;
  ZvFCurveLockGuard hold(*this);
  parameters.Resize(0);
  values.Resize(0);
  for (long i = 0; i < count; ++i) {
    const double t = start + static_cast<double>(i) * step;
    parameters.Add(t);
    values.Add(m_curve->Eval(t, m_component));
  }
  parameters.Add(end);
  values.Add(m_curve->Eval(end, m_component));
  return parameters.size;
}

double ZvQuatFCurve::FoldParameter(double t) const {
  ZvFCurveLockGuard hold(*this);
  const unsigned int n = m_curve->GetNumKeys();
  const unsigned int method = m_curve->GetExtrapolationMethod();
  if ((method != 3 && method != 4) || n < 2) return t;
  const double first = m_curve->GetKeyTime(0), last = m_curve->GetKeyTime(n - 1);
  const double period = last - first;
  if (t > last) {
    t = first + std::fmod(t - first, period);
  } else if (t < first) {
    t = last - std::fmod(first - t, period);
  }
  return t < first ? first : (t > last ? last : t);
}

unsigned int ZvQuatFCurve::IsConstraintSupported(KeyConstraint constraint) const {
  return constraint == ParameterLock || constraint == ValueLock || constraint == WholeKeyLock ? 1
                                                                                              : 0;
}

unsigned int ZvQuatFCurve::AreAnyValuesLockedInInterval(double start, double end, int excludeStart,
                                                        int excludeEnd) const {
  ZvFCurveLockGuard hold(*this);
  return QuatKeysHaveFlagsInInterval(m_curve->GetKeys(), start, end, excludeStart, excludeEnd,
                                     ZvQuatKey::ValueLockFlag);
}

unsigned int ZvQuatFCurve::AreAnyParametersLockedInInterval(double start, double end,
                                                            int excludeStart,
                                                            int excludeEnd) const {
  ZvFCurveLockGuard hold(*this);
  return QuatKeysHaveFlagsInInterval(m_curve->GetKeys(), start, end, excludeStart, excludeEnd,
                                     ZvQuatKey::ParamLockFlag);
}

unsigned int ZvQuatFCurve::AreAnyKeysLockedInInterval(double start, double end, int excludeStart,
                                                      int excludeEnd) const {
  ZvFCurveLockGuard hold(*this);
  return QuatKeysHaveFlagsInInterval(m_curve->GetKeys(), start, end, excludeStart, excludeEnd,
                                     ZvQuatKey::ParamLockFlag | ZvQuatKey::ValueLockFlag);
}

unsigned int ZvQuatFCurve::GetConstraint(double& parameter, KeyConstraint constraint, int& on,
                                         double tolerance) const {
  if (!IsConstraintSupported(constraint)) return 0;
  ZvFCurveLockGuard hold(*this);
  const unsigned int i = m_curve->FindKey(parameter, tolerance);
  if (i == ZvQuatCurve::NoKey) return 0;
  const unsigned int data = m_curve->GetConstraintData(i);
  const unsigned int bits = constraint == ParameterLock ? 4u : constraint == ValueLock ? 2u : 6u;
  on = (data & bits) == bits ? 1 : 0;
  parameter = m_curve->GetKeyTime(i);
  return 1;
}
