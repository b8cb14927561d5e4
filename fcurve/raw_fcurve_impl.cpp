// ZvRawFCurveImpl: the questions and edits that belong to a polyline of single values -
// monotony and inversion, bounds, the fit through samples and the thinning of keys.
#include "fcurve/raw_fcurve_impl.h"

#include "fcurve/cfc_linear_fit.h"

#include <cmath>

bool ZvRawFCurveImpl::KeysAreOrdered() const {
  for (unsigned int i = 0; i < keys.size; ++i) {
    if (std::isnan(keys[i].value) || !std::isfinite(keys[i].parameter)) return false;
    if (i > 0 && !(keys[i].parameter > keys[i - 1].parameter)) return false;
  }
  return true;
}

int ZvRawFCurveImpl::Monotony() const {
  const unsigned int n = keys.size;
  if (n < 2) return 0;
  const double first = keys[1].value - keys[0].value;
  if (!(first != 0.0)) return 0;
  const int way = first > 0.0 ? 1 : -1;
  for (unsigned int i = 2; i < n; ++i) {
    const double d = keys[i].value - keys[i - 1].value;
    if (!(way > 0 ? d > 0.0 : d < 0.0)) return 0;
  }
  return way;
}

// Beyond the values at the ends the end parameter answers; a key within 1e-7 of the value
// answers with its own parameter, before any bracketing pair is interpolated.
int ZvRawFCurveImpl::EvalInverse(double value, double& parameter) const {
  const int way = Monotony();
  if (way == 0 || std::isnan(value)) return 0;
  const unsigned int n = keys.size;
  const double low = way > 0 ? keys[0].value : keys[n - 1].value;
  const double high = way > 0 ? keys[n - 1].value : keys[0].value;
  if (value <= low) {
    parameter = way > 0 ? keys[0].parameter : keys[n - 1].parameter;
    return 1;
  }
  if (value >= high) {
    parameter = way > 0 ? keys[n - 1].parameter : keys[0].parameter;
    return 1;
  }
  for (unsigned int i = 0; i < n; ++i) {
    if (std::fabs(keys[i].value - value) <= 1e-7) {
      parameter = keys[i].parameter;
      return 1;
    }
  }
  for (unsigned int i = 0; i + 1 < n; ++i) {
    const CFCRawKey& a = keys[i];
    const CFCRawKey& b = keys[i + 1];
    if ((a.value < value && value < b.value) || (b.value < value && value < a.value)) {
      parameter =
          a.parameter + (value - a.value) * (b.parameter - a.parameter) / (b.value - a.value);
      return 1;
    }
  }
  return 0;
}

double ZvRawFCurveImpl::GetValueUpperBound() const {
  if (keys.size == 0) return valueWhenNoKeys;
  double v = keys[0].value;
  for (unsigned int i = 1; i < keys.size; ++i)
    if (keys[i].value > v) v = keys[i].value;
  return v;
}

double ZvRawFCurveImpl::GetValueLowerBound() const {
  if (keys.size == 0) return valueWhenNoKeys;
  double v = keys[0].value;
  for (unsigned int i = 1; i < keys.size; ++i)
    if (keys[i].value < v) v = keys[i].value;
  return v;
}

void ZvRawFCurveImpl::SetToApproxLinearFitC0(const ZvPoint2dArray& points, double tolerance) {
  DropAllKeys();
  if (points.size == 0 || !CFCPointsAscend(points) || std::isnan(tolerance)) return;
  CFCGreedyLinearFit(points, tolerance,
                     [this](const ZvPoint2<double>& q) { InsertKey(keys.size, q.x, q.y); });
  valueWhenNoKeys = keys[0].value;
}

unsigned int ZvRawFCurveImpl::ReduceNumKeys(double tolerance, ZvBaseFCurve& curve) {
  if (keys.size < 3) return 0;
  return Engine::ReduceNumKeys(0, keys.size - 1, tolerance, curve);
}
