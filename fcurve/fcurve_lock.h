// Holds a curve's lock for a scope through Lock/Unlock, so that the curve's
// lock count stays right on every exit.
#ifndef ZV_FCURVE_FCURVE_LOCK_H
#define ZV_FCURVE_FCURVE_LOCK_H

#include <zv/fcurve.h>

class ZvFCurveLockGuard {
 public:
  explicit ZvFCurveLockGuard(const ZvBaseFCurve& curve) : m_curve(curve) { m_curve.Lock(); }
  ~ZvFCurveLockGuard() { m_curve.Unlock(); }
  ZvFCurveLockGuard(const ZvFCurveLockGuard&) = delete;
  ZvFCurveLockGuard& operator=(const ZvFCurveLockGuard&) = delete;

 private:
  const ZvBaseFCurve& m_curve;
};

#endif
