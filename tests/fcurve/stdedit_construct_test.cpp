// Curves built through point lists by the four methods, and copies of a part of a curve.
#include <gtest/gtest.h>

#include <zv/std_fcurve.h>

#include "stdedit_util.h"
#include "uid.h"

#include <cmath>

namespace {

using stdedit::C;

ZvPoint2dArray Points(std::initializer_list<ZvPoint2<double>> list) {
  ZvPoint2dArray a(8);
  for (const auto& p : list)
    a.Add(p);
  return a;
}

TEST(StdEditConstruct, CatmullRomPassesThroughEveryPoint) {
  const ZvPoint2dArray p = Points({{0, 0}, {1, 2}, {3, 1}, {4, 4}});
  ZvStdFCurve curve(p, ZvStdFCurve::DPCatmullRom, 0.0, C::CubicSegment, C::LinearSegment);
  ASSERT_EQ(curve.GetNumKeys(), 4u);
  EXPECT_EQ(curve.IsValid(), 1u);
  for (unsigned int i = 0; i < p.size; ++i)
    EXPECT_EQ(curve.Eval(p[i].x, 0), p[i].y);
  // Inner handles along the neighbours' chord, a third of the adjacent segment long in X.
  ZvPoint2<double> left, right;
  curve.GetActualKeyTgtHandles(1.0, left, right, 0.0);
  EXPECT_DOUBLE_EQ(left.x, -1.0 / 3.0);
  EXPECT_DOUBLE_EQ(right.x, 2.0 / 3.0);
  EXPECT_DOUBLE_EQ(right.y / right.x, (1.0 - 0.0) / 3.0);
  EXPECT_DOUBLE_EQ(left.y / left.x, right.y / right.x);
  // End handles along the end edges.
  curve.GetActualKeyTgtHandles(0.0, left, right, 0.0);
  EXPECT_DOUBLE_EQ(right.y / right.x, 2.0);
  C::FSKind kind;
  curve.GetSegmentKindAtIndex(3, kind);
  EXPECT_EQ(kind, C::LinearSegment);
}

TEST(StdEditConstruct, CubicC2IsTheNaturalSpline) {
  // Points on a cubic through zero curvature at both ends would be exact only for lines; for a
  // sampled smooth function the natural spline is close and C2 inside.
  ZvPoint2dArray p(32);
  for (int i = 0; i <= 20; ++i)
    p.Add({i * 0.3, std::sin(i * 0.3)});
  ZvStdFCurve curve(p, ZvStdFCurve::DPCubicC2, 0.0, C::CubicSegment, C::CubicSegment);
  ASSERT_EQ(curve.GetNumKeys(), 21u);
  EXPECT_EQ(curve.IsValid(), 1u);
  for (double t = 0.6; t < 5.4; t += 0.05)
    EXPECT_NEAR(curve.Eval(t, 0), std::sin(t), 2e-3) << t;
  // Second derivative continuous at an inner key: compare one-sided second differences.
  const double h = 1e-3, x = 2.7;
  const double before = curve.Eval(x - 2 * h, 0) - 2 * curve.Eval(x - h, 0) + curve.Eval(x, 0);
  const double after = curve.Eval(x, 0) - 2 * curve.Eval(x + h, 0) + curve.Eval(x + 2 * h, 0);
  EXPECT_NEAR(before / (h * h), after / (h * h), 0.05);
  // A line stays a line.
  ZvStdFCurve line(Points({{0, 1}, {1, 3}, {3, 7}}), ZvStdFCurve::DPCubicC2, 0.0, C::CubicSegment,
                   C::CubicSegment);
  EXPECT_NEAR(line.Eval(2.2, 0), 5.4, 1e-12);
}

TEST(StdEditConstruct, LinearFitKeepsPointsWithinTheTolerance) {
  ZvPoint2dArray p(64);
  for (int i = 0; i <= 40; ++i)
    p.Add({i * 0.25, std::fabs(i * 0.25 - 5.0) + 0.01 * std::sin(i * 1.0)});
  ZvStdFCurve curve(p, ZvStdFCurve::DPLinearFitC0, 0.05, C::LinearSegment, C::LinearSegment);
  EXPECT_LT(curve.GetNumKeys(), 8u);
  EXPECT_GE(curve.GetNumKeys(), 3u);
  for (unsigned int i = 0; i < p.size; ++i)
    EXPECT_NEAR(curve.Eval(p[i].x, 0), p[i].y, 0.1) << i;
  ZvStdFCurve one(Points({{2, 3}}), ZvStdFCurve::DPLinearFitC0, 0.1, C::LinearSegment,
                  C::ConstantSegment);
  EXPECT_EQ(one.GetNumKeys(), 1u);
  ZvStdFCurve two(Points({{2, 3}, {4, 5}}), ZvStdFCurve::DPLinearFitC0, 0.1, C::LinearSegment,
                  C::ConstantSegment);
  EXPECT_EQ(two.GetNumKeys(), 2u);
  EXPECT_EQ(two.Eval(3.0, 0), 4.0);
}

TEST(StdEditConstruct, CubicFitIsSmoothAndWithinTheTolerance) {
  ZvPoint2dArray p(128);
  for (int i = 0; i <= 100; ++i)
    p.Add({i * 0.1, std::sin(i * 0.1) * 2.0});
  ZvStdFCurve curve(p, ZvStdFCurve::DPCubicFitG1, 0.01, C::CubicSegment, C::CubicSegment);
  EXPECT_LT(curve.GetNumKeys(), 30u);
  EXPECT_EQ(curve.IsValid(), 1u);
  for (unsigned int i = 0; i < p.size; ++i)
    EXPECT_NEAR(curve.Eval(p[i].x, 0), p[i].y, 0.011) << i;
  // G1 at every inner key: the evaluated handles line up, and continuity is locked.
  ZvDoubleArray keys(32);
  curve.GetAllKeyParameters(keys);
  for (unsigned int i = 1; i + 1 < keys.size; ++i) {
    double at = keys[i];
    EXPECT_EQ(curve.IsTangentContinuityLocked(at, 0.0), 1u) << at;
    ZvPoint2<double> l, r;
    curve.GetEvaluatedKeyTgtHandles(keys[i], l, r, 0.0);
    EXPECT_NEAR(l.y / l.x, r.y / r.x, 1e-9) << at;
  }
  // Two points, or a fit that cannot run: one cubic at the thirds of the chord.
  ZvStdFCurve two(Points({{0, 0}, {3, 3}}), ZvStdFCurve::DPCubicFitG1, 0.01, C::CubicSegment,
                  C::CubicSegment);
  ASSERT_EQ(two.GetNumKeys(), 2u);
  EXPECT_NEAR(two.Eval(1.0, 0), 1.0, 1e-12);
  ZvStdFCurve bad(Points({{0, 0}, {3, 3}, {2, 1}}), ZvStdFCurve::DPCubicFitG1, 0.01,
                  C::CubicSegment, C::CubicSegment);
  EXPECT_EQ(bad.GetNumKeys(), 0u);  // points out of order
}

TEST(StdEditConstruct, PartOfACurve) {
  ZvStdFCurve curve = stdedit::Mixed();
  for (double t : {1.5, 3.0})
    stdedit::SetFlag(curve, t, C::AutoTangent, 1);
  stdedit::SetFlag(curve, 0.0, C::WholeKeyLock, 1);
  double at = 4.5;
  curve.SetKeyUserData(at, MakeUID(2), TextBytes("d"), 1, 0.0);
  curve.SetReadOnlyConstraint(1);
  const ZvStdFCurve part(curve, 2.0, 7.5);
  EXPECT_EQ(part.IsValid(), 1u);
  EXPECT_EQ(part.IsReadOnly(), 1u);
  EXPECT_EQ(stdedit::KeyParams(part), (std::vector<double>{2.0, 3.0, 4.5, 6.0, 7.0, 7.5}));
  for (double t = 2.0; t < 7.5; t += 0.01)
    EXPECT_NEAR(part.Eval(t, 0), curve.Eval(t, 0), 1e-9) << t;
  EXPECT_EQ(part.HasUserData(4.5), 1u);
  // Beyond the keys a part reaches as far as asked, and without keys it is a copy.
  const ZvStdFCurve wide(curve, -5.0, 20.0);
  EXPECT_EQ(wide.GetNumKeys(), curve.GetNumKeys());
  const ZvStdFCurve none(ZvStdFCurve(4.0), 0.0, 1.0);
  EXPECT_EQ(none.GetNumKeys(), 0u);
  EXPECT_EQ(none.Eval(0.5, 0), 4.0);
}

TEST(StdEditConstruct, SingleKeyAndSingleSegment) {
  const ZvStdFCurve key(2.0, 1.0, 3.0, C::LinearSegment, C::ConstantSegment);
  EXPECT_EQ(key.GetNumKeys(), 1u);
  EXPECT_EQ(key.EvalLeft(2.0, 0), 1.0);
  EXPECT_EQ(key.Eval(2.0, 0), 3.0);
  EXPECT_EQ(key.GetFirstSegmentKind(), C::LinearSegment);
  // Handles folding the segment are shortened until it is a function.
  const ZvStdFCurve segment({0, 0}, {2.5, 1}, {-0.5, 1}, {1, 0});
  EXPECT_EQ(segment.GetNumKeys(), 2u);
  EXPECT_EQ(segment.IsValid(), 1u);
  // Four numbers: a straight cubic.
  const ZvStdFCurve straight(1.0, 2.0, 4.0, 8.0);
  ASSERT_EQ(straight.GetNumKeys(), 2u);
  EXPECT_NEAR(straight.Eval(2.5, 0), 5.0, 1e-12);
  const ZvStdFCurve reversed(4.0, 2.0, 1.0, 8.0);
  EXPECT_EQ(reversed.GetNumKeys(), 0u);
}

}  // namespace
