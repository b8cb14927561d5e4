// Evaluation of the standard curve: segments, evaluated handles under each flag, the four
// extrapolation methods, snapping, clamping, and the numerical helpers behind them.
#include <gtest/gtest.h>

#include <zv/std_fcurve.h>

#include "fcurve/std_fcurve_bezier.h"
#include "fcurve/std_fcurve_impl.h"
#include "stdedit_util.h"

#include <cmath>
#include <random>
#include <vector>

namespace {

using stdedit::C;
using stdedit::Polyline;
using V = std::vector<double>;

V XY(const ZvPoint2<double>& p) {
  return {p.x, p.y};
}
V Corners(const ZvExtent2<double>& box) {
  return {box.xmin, box.ymin, box.xmax, box.ymax};
}

// A store with keys placed by hand, for the handle rules.
ZvStdFCurveImpl Keys(std::initializer_list<std::pair<double, double>> points) {
  ZvStdFCurveImpl s(0.0, C::CubicSegment);
  unsigned int i = 0;
  for (const auto& p : points) {
    s.InsertKey(i, p.first, p.second);
    s.keys[i].segmentKind = C::CubicSegment;
    ++i;
  }
  return s;
}

TEST(StdCurveEval, EmptyCurveGivesItsValueUnderEveryMethod) {
  ZvStdFCurve curve(7.0);
  for (int m = 1; m <= 4; ++m) {
    ASSERT_EQ(curve.SetExtrapolationMethod(static_cast<C::ExtrapolationMethod>(m)), 1u);
    EXPECT_EQ(curve.Eval(-3.0, 0), 7.0);
    EXPECT_EQ(curve.EvalLeft(3.0, 0), 7.0);
  }
  curve.SetClampingValues(0.0, 5.0);
  EXPECT_EQ(curve.Eval(1.0, 1), 5.0);
  EXPECT_EQ(curve.SetExtrapolationMethod(static_cast<C::ExtrapolationMethod>(0)), 0u);
  EXPECT_EQ(curve.SetExtrapolationMethod(static_cast<C::ExtrapolationMethod>(5)), 0u);
  EXPECT_EQ(curve.SetClampingValues(2.0, 1.0), 0u);
}

TEST(StdCurveEval, CubicSegmentFollowsItsBezier) {
  const ZvPoint2<double> p[4] = {{0, 0}, {1.5, 3}, {2, -1}, {3, 2}};
  ZvStdFCurve curve(p[0], p[1], p[2], p[3]);
  for (double u = 0.05; u < 1.0; u += 0.05) {
    const ZvPoint2<double> q = zvBezierPoint(p, u);
    EXPECT_NEAR(curve.Eval(q.x, 0), q.y, 1e-9) << u;
  }
  EXPECT_EQ(curve.Eval(0.0, 0), 0.0);
  EXPECT_EQ(curve.Eval(3.0, 0), 2.0);
}

TEST(StdCurveEval, ExtrapolationMethods) {
  ZvStdFCurve curve = Polyline({{0, 0}, {1, 1}, {2, 3}});
  EXPECT_EQ(curve.Eval(-5.0, 0), 0.0);
  EXPECT_EQ(curve.Eval(9.0, 0), 3.0);
  EXPECT_DOUBLE_EQ(curve.Eval(1.5, 0), 2.0);

  curve.SetExtrapolationMethod(C::LinearExtrapolation);
  EXPECT_DOUBLE_EQ(curve.Eval(-1.0, 0), -1.0);
  EXPECT_DOUBLE_EQ(curve.Eval(3.0, 0), 5.0);

  curve.SetExtrapolationMethod(C::CycleExtrapolation);
  EXPECT_EQ(curve.Eval(2.0, 0), 0.0);  // the end of a period is the start of the next
  EXPECT_DOUBLE_EQ(curve.Eval(2.5, 0), 0.5);
  EXPECT_DOUBLE_EQ(curve.Eval(-0.5, 0), 2.0);
  EXPECT_EQ(curve.EvalLeft(0.0, 0), 3.0);  // the start of a period ends the previous one
  EXPECT_EQ(curve.EvalLeft(4.0, 0), 3.0);
  EXPECT_EQ(curve.Eval(2.0 - 4e-13, 0), 0.0);  // snapped onto the key first

  ZvStdFCurve ramp = Polyline({{0, 0}, {1, 1}});
  ramp.SetExtrapolationMethod(C::CycleWithOffsetExtrapolation);
  EXPECT_DOUBLE_EQ(ramp.Eval(2.5, 0), 2.5);
  EXPECT_DOUBLE_EQ(ramp.Eval(-0.5, 0), -0.5);
  EXPECT_DOUBLE_EQ(ramp.Eval(2.0, 0), 2.0);
  EXPECT_DOUBLE_EQ(ramp.EvalLeft(2.0, 0), 2.0);
  EXPECT_DOUBLE_EQ(ramp.EvalLeft(-1.0, 0), -1.0);
  EXPECT_DOUBLE_EQ(ramp.EvalLeft(1.75, 0), 1.75);
}

TEST(StdCurveEval, DiscontinuityAndSnapping) {
  ZvStdFCurve curve = Polyline({{0, 0}, {1, 1}, {2, 2}});
  ASSERT_EQ(curve.SetKeyValue(1.0, C::RightSide, 5.0, 0.0), 1u);
  EXPECT_EQ(curve.Eval(1.0, 0), 5.0);
  EXPECT_EQ(curve.EvalLeft(1.0, 0), 1.0);
  EXPECT_EQ(curve.Eval(1.0 + 5e-13, 0), 5.0);
  EXPECT_EQ(curve.EvalLeft(1.0 - 5e-13, 0), 1.0);
  EXPECT_NEAR(curve.Eval(1.0 - 1e-6, 0), 1.0, 1e-5);
  EXPECT_DOUBLE_EQ(curve.Eval(1.5, 0), 3.5);

  // Across a constant segment the left value arriving at the next key is the step's value.
  ZvStdFCurve steps = Polyline({{0, 1}, {1, 4}}, C::ConstantSegment);
  EXPECT_EQ(steps.Eval(0.5, 0), 1.0);
  EXPECT_EQ(steps.EvalLeft(1.0, 0), 1.0);
  EXPECT_EQ(steps.Eval(1.0, 0), 4.0);
  EXPECT_EQ(steps.Eval(0.5, 1), 1.0);
  steps.SetClampingValues(2.0, 3.0);
  EXPECT_EQ(steps.Eval(0.5, 1), 2.0);
  EXPECT_EQ(steps.Eval(1.0, 1), 3.0);
}

TEST(StdCurveEval, LinearExtrapolationFallsBackFromDegenerateHandles) {
  // First key's left handle on the key: the right handle's line.
  ZvStdFCurve right({0, 0}, {1, 1}, {2, 5}, {3, 6});
  right.SetExtrapolationMethod(C::LinearExtrapolation);
  EXPECT_DOUBLE_EQ(right.Eval(-2.0, 0), -2.0);
  // Both handles on the key: the chord.
  ZvStdFCurve chord({0, 0}, {0, 0}, {3, 6}, {3, 6});
  chord.SetExtrapolationMethod(C::LinearExtrapolation);
  EXPECT_DOUBLE_EQ(chord.Eval(-1.0, 0), -2.0);
  EXPECT_DOUBLE_EQ(chord.Eval(4.0, 0), 8.0);
  // A left handle beyond the last key steers the line there too.
  EXPECT_DOUBLE_EQ(right.Eval(4.0, 0), 7.0);
  // A flat end key extends flat.
  stdedit::SetFlag(right, 3.0, C::FlatTangent, 1);
  EXPECT_EQ(right.Eval(10.0, 0), 6.0);
}

TEST(StdCurveEval, EvaluatedHandlesUnderEachFlag) {
  ZvStdFCurveImpl s = Keys({{0, 0}, {3, 6}, {6, 0}, {9, 3}});
  s.keys[1].leftTangent = {2, 7};
  s.keys[1].rightTangent = {4, 5};

  EXPECT_EQ(s.GetEvaluatedLeftTgt(1).y, 7.0);  // no flag: as stored
  s.keys[1].flags = CFCFlag_FlatTangent;
  EXPECT_EQ(XY(s.GetEvaluatedRightTgt(1)), (V{4.0, 6.0}));
  s.keys[1].flags = CFCFlag_CollapsedTangent;
  EXPECT_EQ(XY(s.GetEvaluatedLeftTgt(1)), (V{3.0, 6.0}));
  s.keys[1].flags = CFCFlag_FlatAtExtremum;  // key 1 is a maximum
  EXPECT_EQ(s.GetEvaluatedRightTgtY(1), 6.0);
  s.keys[2].flags = CFCFlag_FlatAtExtremum;  // key 2 a minimum; key 1 stays flagged
  EXPECT_EQ(s.IsKeyAnExtremum(2), 1);

  // Automatic: the neighbours' chord slope (0 - 0) / 6 and a third of the way in X - the right
  // X only when the next key is automatic too.
  s.keys[1].flags = CFCFlag_AutoTangent;
  s.keys[2].flags = 0;
  EXPECT_EQ(s.GetEvaluatedRightTgt(1).x, 4.0);
  EXPECT_EQ(s.GetEvaluatedLeftTgt(1).x, 2.0);
  EXPECT_EQ(s.GetEvaluatedLeftTgtY(1), 6.0);
  s.keys[2].flags = CFCFlag_AutoTangent;
  EXPECT_EQ(s.GetEvaluatedRightTgt(1).x, 4.0);
  // Key 3 is not automatic: key 2's right X stays where it is stored (on the key), while its
  // left side consults no neighbour's flag.
  EXPECT_EQ(s.GetEvaluatedRightTgt(2).x, 6.0);
  EXPECT_DOUBLE_EQ(s.GetEvaluatedRightTgtY(2), 0.0);
  EXPECT_DOUBLE_EQ(s.GetEvaluatedLeftTgtY(2), 0.0 + (3.0 - 6.0) / 6.0 * (3.0 - 6.0) / 3.0);
  s.keys[3].flags = CFCFlag_AutoTangent;  // an automatic end key is flat
  EXPECT_EQ(s.GetEvaluatedLeftTgtY(3), 3.0);

  // Chord: toward the adjacent key.
  s.keys[1].flags = CFCFlag_ChordTangent;
  s.keys[2].flags = 0;
  EXPECT_DOUBLE_EQ(s.GetEvaluatedRightTgtY(1), 6.0 + (4.0 - 3.0) * (0.0 - 6.0) / 3.0);
  EXPECT_DOUBLE_EQ(s.GetEvaluatedLeftTgtY(1), 6.0 + (6.0 - 0.0) / 3.0 * (2.0 - 3.0));
  EXPECT_EQ(s.GetEvaluatedLeftTgt(1).x, 2.0);
  s.keys[3].flags = CFCFlag_ChordTangent;
  EXPECT_EQ(s.GetEvaluatedRightTgtY(3), 3.0);
}

TEST(StdCurveEval, ExtremaOfKeys) {
  ZvStdFCurveImpl s = Keys({{0, 0}, {1, 2}, {2, 4}, {3, 1}});
  const int expected[] = {1, 0, 1, 1};
  for (unsigned int i = 0; i < 4; ++i)
    EXPECT_EQ(s.IsKeyAnExtremum(i), expected[i]) << i;
  s.keys[1].rightValue = 5;  // a jump over the next value
  EXPECT_EQ(s.IsKeyAnExtremum(1), 1);
}

TEST(StdCurveMath, InvertParamCubic) {
  EXPECT_EQ(InvertParamCubic(-1.0, 0, 1, 2, 3), 0.0);
  EXPECT_EQ(InvertParamCubic(0.0, 0, 1, 2, 3), 0.0);
  EXPECT_EQ(InvertParamCubic(3.0, 0, 1, 2, 3), 1.0);
  EXPECT_EQ(InvertParamCubic(4.0, 0, 1, 2, 3), 1.0);
  std::mt19937 rng(3);
  std::uniform_real_distribution<double> unit(0.0, 1.0);
  for (int i = 0; i < 500; ++i) {
    const double x0 = unit(rng), x3 = x0 + 0.1 + unit(rng);
    ZvPoint2<double> p[4] = {
        {x0, 0}, {x0 + unit(rng) * (x3 - x0), 0}, {x0 + unit(rng) * (x3 - x0), 0}, {x3, 0}};
    if (!ZvStdFCurve_IsCubicSegmentValid(p[0], p[1], p[2], p[3])) continue;
    const double u = unit(rng);
    const double x = zvBezierPoint(p, u).x;
    const double found = InvertParamCubic(x, p[0].x, p[1].x, p[2].x, p[3].x);
    EXPECT_NEAR(zvBezierPoint(p, found).x, x, 1e-8);
  }
}

TEST(StdCurveMath, SegmentValidityAndRepair) {
  using P = ZvPoint2<double>;
  EXPECT_EQ(ZvStdFCurve_IsCubicSegmentValid(P{0, 0}, P{1, 0}, P{2, 0}, P{3, 0}), 1);
  EXPECT_EQ(ZvStdFCurve_IsCubicSegmentValid(P{0, 0}, P{1, 0}, P{2, 0}, P{0, 0}), 0);
  EXPECT_EQ(ZvStdFCurve_IsCubicSegmentValid(P{0, 0}, P{-1, 0}, P{2, 0}, P{3, 0}), 0);
  EXPECT_EQ(ZvStdFCurve_IsCubicSegmentValid(P{0, 0}, P{1, 0}, P{4, 0}, P{3, 0}), 0);
  EXPECT_EQ(ZvStdFCurve_IsCubicSegmentValid(P{0, 0}, P{3, 0}, P{0, 0}, P{2.5, 0}), 0);  // folds
  EXPECT_EQ(ZvStdFCurve_IsCubicSegmentValid(P{0, 0}, P{3, 0}, P{0, 0}, P{3, 0}), 1);    // touches
  EXPECT_EQ(ZvStdFCurve_IsCubicSegmentValid(P{0, 0}, P{0, 5}, P{3, 5}, P{3, 0}), 1);
  EXPECT_EQ(ZvStdFCurve_IsCubicSegmentValid(P{0, 0}, P{0, 0}, P{std::nan(""), 0}, P{3, 0}), 0);

  P folded[4] = {{0, 0}, {3, 3}, {0, 3}, {2.5, 0}};
  BezierCubicRegularize(folded);
  EXPECT_EQ(ZvStdFCurve_IsCubicSegmentValid(folded[0], folded[1], folded[2], folded[3]), 1);
  EXPECT_NEAR(folded[1].y / folded[1].x, 1.0, 1e-12);  // directions kept
  EXPECT_NEAR(folded[2].y / (2.5 - folded[2].x), 1.2, 1e-12);
  P behind[4] = {{0, 0}, {-1, 1}, {4, 1}, {3, 0}};
  BezierCubicRegularize(behind);
  EXPECT_EQ(behind[1].x, 0.0);
  EXPECT_EQ(behind[2].x, 3.0);
}

double Simpson(const ZvStdFCurve& curve, double a, double b) {
  const int n = 2000;
  const double h = (b - a) / n;
  double sum = curve.Eval(a, 0) + curve.Eval(b, 0);
  for (int i = 1; i < n; ++i)
    sum += curve.Eval(a + i * h, 0) * (i % 2 ? 4.0 : 2.0);
  return sum * h / 3.0;
}

TEST(StdCurveAnalysis, IntegralsMatchQuadrature) {
  ZvStdFCurve curve({0, 0}, {0.5, 4}, {2.5, -2}, {3, 1});
  curve.CreateKey(5.0, 2.0, C::LinearSegment, C::ConstantSegment);
  curve.CreateKey(6.0, 0.5);
  EXPECT_NEAR(curve.EvalIntegral(0.2, 2.7), Simpson(curve, 0.2, 2.7), 1e-7);
  EXPECT_NEAR(curve.EvalIntegral(1.0, 5.5), Simpson(curve, 1.0, 3.0) + 2.0 * 1.5 + 0.5 * 2.0, 1e-7);
  EXPECT_NEAR(curve.EvalIntegral(-2.0, 8.0),
              Simpson(curve, 0.0, 3.0) + 1.5 * 2.0 + 2.0 + 2.0 * 0.5 + 0.0, 1e-7);
  EXPECT_NEAR(curve.EvalIntegral(3.0, 5.0), 3.0, 1e-12);  // one whole linear segment
  ZvStdFCurve empty(2.0);
  EXPECT_EQ(empty.EvalIntegral(1.0, 4.0), 6.0);
  const ZvPoint2<double> p[4] = {{0, 0}, {1, 1}, {2, 1}, {3, 0}};
  // X linear: span times the mean of the Bernstein weights, a quarter each.
  EXPECT_NEAR(IntegrateBezierSegment(p, 0.0, 3.0), 3.0 * (0.0 + 1.0 + 1.0 + 0.0) / 4.0, 1e-12);
  EXPECT_NEAR(IntegrateBezierSegment(p, 1.0, 2.0), 13.0 / 18.0, 1e-12);
}

TEST(StdCurveAnalysis, BoundsAreThoseOfTheControlPolygons) {
  ZvStdFCurve curve({0, 0}, {1, 4}, {2, -3}, {3, 1});
  EXPECT_EQ(curve.GetValueUpperBound(0), 4.0);
  EXPECT_EQ(curve.GetValueLowerBound(0), -3.0);
  curve.SetClampingValues(-1.0, 2.0);
  EXPECT_EQ(curve.GetValueUpperBound(1), 2.0);
  double low, high;
  EXPECT_EQ(curve.GetValueRange(0.0, C::RightSide, low, high, 0.0, 0), 1u);
  EXPECT_EQ((V{low, high}), (V{-3.0, 4.0}));
  EXPECT_EQ(curve.GetValueRange(0.0, C::LeftSide, low, high, 0.0, 0), 1u);
  EXPECT_EQ((V{low, high}), (V{0.0, 0.0}));
  EXPECT_EQ(curve.GetValueRange(0.0, static_cast<C::KeySide>(3), low, high, 0.0, 0), 0u);
  EXPECT_EQ(ZvStdFCurve(5.0).GetValueUpperBound(0), 5.0);
}

TEST(StdCurveAnalysis, RedrawBoxesIncludeTheEvaluatedHandles) {
  ZvStdFCurveImpl s = Keys({{0, 0}, {3, 6}, {6, 0}});
  s.keys[1].leftTangent = {2, 9};
  s.keys[1].rightTangent = {4, 3};
  s.keys[0].rightTangent = {1, -2};
  ZvExtent2<double> box;
  ASSERT_EQ(s.ComputeKeyExtent(1, box), 1);
  // Down to the previous key's handle into the segment.
  EXPECT_EQ(Corners(box), (V{0.0, -2.0, 6.0, 9.0}));
  s.keys[1].flags = CFCFlag_CollapsedTangent;
  ASSERT_EQ(s.ComputeKeyExtent(1, box), 1);
  EXPECT_EQ(box.ymax, 6.0);
  ASSERT_EQ(s.ComputeNeighboringKeysExtent(9.0, box), 1);
  EXPECT_EQ(box.xmin, 3.0);
  EXPECT_EQ(s.ComputeKeyExtent(3, box), 0);
}

TEST(StdCurveAnalysis, InversionOfMonotoneCurves) {
  ZvStdFCurve rising({0, 0}, {1, 0.5}, {2, 2.5}, {3, 3});
  rising.CreateKey(4.0, 5.0, C::LinearSegment, C::LinearSegment);
  ASSERT_EQ(rising.IsBijective(), 1u);
  for (double t = 0.1; t < 4.0; t += 0.1) {
    double found = -1.0;
    ASSERT_EQ(rising.EvalInverse(rising.Eval(t, 0), found, 0), 1u);
    EXPECT_NEAR(found, t, 1e-6);
  }
  double below, above, found;
  EXPECT_EQ(rising.EvalInverse(-9.0, below, 0) + rising.EvalInverse(9.0, above, 0), 2u);
  EXPECT_EQ((V{below, above}), (V{0.0, 4.0}));

  ZvStdFCurve falling({0, 3}, {1, 2.5}, {2, 0.5}, {3, 0});
  ASSERT_EQ(falling.IsBijective(), 1u);
  EXPECT_EQ(falling.EvalInverse(falling.Eval(1.3, 0), found, 0), 1u);
  EXPECT_NEAR(found, 1.3, 1e-6);

  EXPECT_EQ(ZvStdFCurve(1.0, 2.0, 2.0, C::CubicSegment, C::CubicSegment).EvalInverse(2.0, found, 0),
            0u);
  EXPECT_EQ(Polyline({{0, 0}, {1, 1}, {2, 1}}).IsBijective(), 0u);
  EXPECT_EQ(Polyline({{0, 0}, {1, 1}}, C::ConstantSegment).IsBijective(), 0u);
  ZvStdFCurve overshoot({0, 0}, {1, 5}, {2, -2}, {3, 3});
  EXPECT_EQ(overshoot.IsBijective(), 0u);
}

TEST(StdCurveAnalysis, ValidityAndConstancy) {
  ZvStdFCurve curve({0, 0}, {1, 1}, {2, 2}, {3, 3});
  EXPECT_EQ(curve.IsValid(), 1u);
  ZvStdFCurveImpl s = Keys({{0, 0}, {1, 1}});
  s.keys[0].rightTangent = {1.5, 0};
  s.keys[1].leftTangent = {-0.5, 0};
  EXPECT_EQ(s.IsValid(), 0);  // folded segment
  s.keys[0].rightTangent = {0.3, 0};
  s.keys[1].leftTangent = {0.6, 0};
  EXPECT_EQ(s.IsValid(), 1);
  s.keys[1].segmentKind = 0;
  EXPECT_EQ(s.IsValid(), 0);
  s.keys[1].segmentKind = C::CubicSegment;
  s.minClamp = std::nan("");
  EXPECT_EQ(s.IsValid(), 0);

  EXPECT_EQ(Polyline({{0, 2}, {1, 2}, {5, 2}}).HasConstantValue(), 1u);
  EXPECT_EQ(Polyline({{0, 2}, {1, 2}, {5, 3}}).HasConstantValue(), 0u);
  EXPECT_EQ(ZvStdFCurve({0, 2}, {1, 3}, {2, 2}, {3, 2}).HasConstantValue(), 0u);
  EXPECT_EQ(ZvStdFCurve().HasConstantValue(), 1u);
}

}  // namespace
