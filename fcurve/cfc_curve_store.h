// The implementation object behind a public curve, for the interactive editing tools, which
// lay keys out in the store itself. A curve class opens itself to it by naming it a friend.
#ifndef ZV_FCURVE_CFC_CURVE_STORE_H
#define ZV_FCURVE_CFC_CURVE_STORE_H

#include <zv/quat_fcurve.h>

#include <vector>

struct CFCCurveStore {
  template <class Curve>
  static auto& Of(Curve& curve) {
    return *curve.m_impl;
  }
  // The rotation keys, which the caller is about to change: the spline is rebuilt from them on
  // the next evaluation.
  static std::vector<ZvQuatKey>& KeysToChange(ZvQuatCurve& curve) {
    curve.Invalidate();
    return curve.keys;
  }
};

#endif
