// ZvStdFCurve: evaluation and the questions answered from evaluated values.
#include <zv/std_fcurve.h>

#include "fcurve/fcurve_lock.h"
#include "fcurve/std_fcurve_impl.h"

double ZvStdFCurve::Eval(double parameter, int clamped) const {
  ZvFCurveLockGuard guard(*this);
  const double v = m_impl->EvalSnapped(parameter, false);
  return clamped ? m_impl->Clamp(v) : v;
}

double ZvStdFCurve::EvalLeft(double parameter, int clamped) const {
  ZvFCurveLockGuard guard(*this);
  const double v = m_impl->EvalSnapped(parameter, true);
  return clamped ? m_impl->Clamp(v) : v;
}

double ZvStdFCurve::GetValueUpperBound(int clamped) const {
  ZvFCurveLockGuard guard(*this);
  const double v = m_impl->GetValueUpperBound();
  return clamped ? m_impl->Clamp(v) : v;
}

double ZvStdFCurve::GetValueLowerBound(int clamped) const {
  ZvFCurveLockGuard guard(*this);
  const double v = m_impl->GetValueLowerBound();
  return clamped ? m_impl->Clamp(v) : v;
}

unsigned int ZvStdFCurve::EvalInverse(double value, double& parameter, int clamped) const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->EvalInverse(value, parameter, clamped);
}

unsigned int ZvStdFCurve::IsBijective() const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->IsBijective();
}

double ZvStdFCurve::EvalIntegral(double a, double b) const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->EvalIntegral(a, b);
}

unsigned int ZvStdFCurve::GetValueRange(double parameter, KeySide side, double& low, double& high,
                                        double tolerance, int clamped) const {
  if (side != LeftSide && side != RightSide) return 0;
  ZvFCurveLockGuard guard(*this);
  const ZvStdFCurveImpl& s = *m_impl;
  unsigned int i;
  if (!s.GetClosestKeyIndexInCenteredInterval(parameter, tolerance, i)) return 0;
  const unsigned int n = s.keys.size;
  if (side == LeftSide) {
    if (i == 0) {
      low = high = s.keys[0].leftValue;
    } else {
      s.ComputeEvaluatedValueRange(i - 1, low, high);
    }
  } else if (i + 1 == n) {
    low = high = s.keys[i].rightValue;
  } else {
    s.ComputeEvaluatedValueRange(i, low, high);
  }
  if (clamped) {
    low = s.Clamp(low);
    high = s.Clamp(high);
  }
  return 1;
}

unsigned int ZvStdFCurve::HasConstantValue() const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->HasConstantValue();
}

unsigned int ZvStdFCurve::IsValid() const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->IsValid();
}
