// ZvRawFCurve: evaluation and the questions answered from values, and the operations that
// change values or move every key.
#include <zv/raw_fcurve.h>

#include "fcurve/cfc_scale_offset.h"
#include "fcurve/cfc_single_value_curve.h"
#include "fcurve/fcurve_lock.h"
#include "fcurve/raw_fcurve_impl.h"

#include <cmath>

double ZvRawFCurve::Eval(double parameter, int clamped) const {
  ZvFCurveLockGuard guard(*this);
  const double v = CFCEvalSnapped(*m_impl, parameter, false);
  return clamped ? m_impl->Clamp(v) : v;
}

double ZvRawFCurve::GetValueUpperBound(int clamped) const {
  ZvFCurveLockGuard guard(*this);
  const double v = m_impl->GetValueUpperBound();
  return clamped ? m_impl->Clamp(v) : v;
}

double ZvRawFCurve::GetValueLowerBound(int clamped) const {
  ZvFCurveLockGuard guard(*this);
  const double v = m_impl->GetValueLowerBound();
  return clamped ? m_impl->Clamp(v) : v;
}

unsigned int ZvRawFCurve::EvalInverse(double value, double& parameter, int) const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->EvalInverse(value, parameter);
}

unsigned int ZvRawFCurve::IsBijective() const {
  ZvFCurveLockGuard guard(*this);
  return m_impl->IsBijective();
}

// v -> v * scale + offset on every key and on the value without keys.
unsigned int ZvRawFCurve::ScaleAndShiftValues(double scale, double offset) {
  ZvFCurveLockGuard guard(*this);
  ZvRawFCurveImpl& s = *m_impl;
  if (s.readOnly || !std::isfinite(scale) || !std::isfinite(offset)) return 0;
  for (unsigned int i = 0; i < s.keys.size; ++i)
    s.keys[i].value = s.keys[i].value * scale + offset;
  s.valueWhenNoKeys = s.valueWhenNoKeys * scale + offset;
  return 1;
}

unsigned int ZvRawFCurve::ShiftValues(double delta) {
  return ScaleAndShiftValues(1.0, delta);
}

unsigned int ZvRawFCurve::MirrorValues() {
  return ScaleAndShiftValues(-1.0, 0.0);
}

unsigned int ZvRawFCurve::ScaleAndOffsetParameters(double start, double end, double pivot,
                                                   double scale, double offset, int moveHead,
                                                   int moveTail, RegionHandle region) {
  ZvFCurveLockGuard guard(*this);
  return CFCScaleAndOffsetParameters(
      *this, start, end, pivot, scale, offset, moveHead, moveTail, region,
      [](const ZvRawFCurve& work) { return work.m_impl->KeysAreOrdered(); });
}

unsigned int ZvRawFCurve::SmoothSequence(double start, double end, const double* kernel,
                                         unsigned int kernelSize) {
  ZvFCurveLockGuard guard(*this);
  return CFCSingleValueCurve<ZvRawFCurve, ZvRawFCurveImpl>::SmoothSequence(*this, start, end,
                                                                           kernel, kernelSize);
}

unsigned int ZvRawFCurve::ReduceNumKeys(double tolerance) {
  ZvFCurveLockGuard guard(*this);
  if (m_impl->readOnly || std::isnan(tolerance)) return 0;
  m_impl->ReduceNumKeys(tolerance, *this);
  return 1;
}
