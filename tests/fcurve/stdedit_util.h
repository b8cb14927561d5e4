// Helpers of the standard-curve editing tests: a full dump of a curve's keys and settings, so
// that a refused edit can be checked to have changed nothing, and dense sampling for
// shape-keeping edits.
#ifndef ZV_TESTS_FCURVE_STDEDIT_UTIL_H
#define ZV_TESTS_FCURVE_STDEDIT_UTIL_H

#include <gtest/gtest.h>

#include <zv/std_fcurve.h>

#include <cstdio>
#include <initializer_list>
#include <string>
#include <utility>
#include <vector>

namespace stdedit {

using C = ZvBaseFCurve;

// Every stored number of every key, the flags and the curve-wide values, in full precision.
inline std::string Dump(const ZvStdFCurve& curve) {
  std::string out;
  char line[512];
  C::FCurveInfo info{};
  info.mask = 127;
  curve.GetFCurveInfo(&info);
  double lo = 0, hi = 0;
  curve.GetClampingValues(lo, hi);
  std::snprintf(line, sizeof line, "n=%u v=%.17g first=%u ext=%u clamp=%.17g,%.17g ro=%u\n",
                info.numKeys, info.valueWhenNoKeys, info.firstSegmentKind, info.extrapolation, lo,
                hi, curve.IsReadOnly());
  out += line;
  for (unsigned int i = 0; i < curve.GetNumKeys(); ++i) {
    C::KeyInfo k{};
    k.mask = 511;
    curve.GetKeyInfoFromIndex(i, &k);
    ZvPoint2<double> l, r;
    curve.GetActualKeyTgtHandles(k.parameter, l, r, 0.0);
    unsigned int flags = 0;
    for (unsigned int bit = 1; bit <= 4096; bit <<= 1) {
      if (bit == C::WholeKeyLock) continue;  // a combination, not a bit of its own
      double at = k.parameter;
      int on = 0;
      curve.GetConstraint(at, static_cast<C::KeyConstraint>(bit), on, 0.0);
      if (on) flags |= bit;
    }
    std::snprintf(line, sizeof line,
                  "%.17g %.17g %.17g L(%.17g,%.17g) R(%.17g,%.17g) kind=%u flags=%u\n", k.parameter,
                  k.leftValue, k.rightValue, l.x, l.y, r.x, r.y,
                  static_cast<unsigned int>(k.segmentKind), flags);
    out += line;
  }
  return out;
}

inline std::vector<double> Sample(const ZvStdFCurve& curve, double a, double b, int count) {
  std::vector<double> values;
  for (int i = 0; i <= count; ++i)
    values.push_back(curve.Eval(a + (b - a) * i / count, 0));
  return values;
}

inline void ExpectSameShape(const std::vector<double>& a, const std::vector<double>& b,
                            double tol) {
  ASSERT_EQ(a.size(), b.size());
  for (size_t i = 0; i < a.size(); ++i)
    EXPECT_NEAR(a[i], b[i], tol) << "sample " << i;
}

// Keys through the points, every segment of one kind.
inline ZvStdFCurve Polyline(std::initializer_list<std::pair<double, double>> points,
                            C::FSKind kind = C::LinearSegment) {
  ZvStdFCurve curve(0.0, kind);
  for (const auto& p : points)
    curve.CreateKey(p.first, p.second);
  return curve;
}

// The key parameters in order, for comparing with a list at once.
inline std::vector<double> KeyParams(const ZvBaseFCurve& curve) {
  ZvDoubleArray params;
  curve.GetAllKeyParameters(params);
  return std::vector<double>(params.data, params.data + params.size);
}

// Whether a constraint is on at the key at exactly t.
inline int HasFlag(const ZvBaseFCurve& curve, double t, C::KeyConstraint constraint) {
  int on = 0;
  curve.GetConstraint(t, constraint, on, 0.0);
  return on;
}

// Sets a constraint on the key at exactly t.
inline unsigned int SetFlag(ZvBaseFCurve& curve, double t, C::KeyConstraint constraint, int on) {
  return curve.SetConstraint(t, constraint, on, 0.0);
}

// Keys of mixed kinds: a cubic run with continued tangents, a step, a line and a jump.
inline ZvStdFCurve Mixed() {
  ZvStdFCurve curve;
  const double values[] = {0.0, 2.0, -1.0, 3.0, 1.0};
  for (int i = 0; i < 5; ++i)
    curve.CreateKey(i * 1.5, values[i]);
  curve.CreateKey(7.0, 4.0, C::LinearSegment, C::ConstantSegment);
  curve.CreateKey(8.0, -2.0);
  curve.SetKeyValue(8.0, C::RightSide, 0.5, 0.0);
  curve.CreateKey(9.5, 1.0);
  curve.SetSegmentKind(8.0, C::RightSide, C::LinearSegment, 0.0);
  return curve;
}

}  // namespace stdedit

#endif
