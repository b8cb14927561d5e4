// Building and editing standard curves: key creation that keeps the shape, removal, handles,
// segment kinds, copies, and the key queries of the contract.
#include <gtest/gtest.h>

#include <zv/std_fcurve.h>

#include "stdedit_util.h"
#include "test_fcurve.h"

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

namespace {

using stdedit::C;
using stdedit::ExpectSameShape;
using stdedit::HasFlag;
using stdedit::KeyParams;
using stdedit::Polyline;
using stdedit::Sample;
using stdedit::SetFlag;

// Keys appended left to right: cubic segments with continued tangents.
ZvStdFCurve Wave() {
  ZvStdFCurve curve;
  const double values[] = {0.0, 2.0, -1.0, 3.0, 1.0, 1.5};
  for (int i = 0; i < 6; ++i)
    curve.CreateKey(i * 1.5, values[i]);
  return curve;
}

TEST(StdCurveKeys, AppendedKeysMakeContinuousFunctionSegments) {
  ZvStdFCurve curve = Wave();
  ASSERT_EQ(curve.GetNumKeys(), 6u);
  EXPECT_EQ(curve.IsValid(), 1u);
  ZvPoint2<double> left, right;
  ASSERT_EQ(curve.GetActualKeyTgtHandles(3.0, left, right, 0.0), 1u);
  EXPECT_NEAR(left.x, -0.5, 1e-12);  // a third of the way back
  EXPECT_NEAR(left.x * right.y - left.y * right.x, 0.0, 1e-12);
  EXPECT_NEAR(curve.Eval(1.5, 0), 2.0, 0.0);
  // Continuous across keys.
  EXPECT_NEAR(curve.Eval(3.0 - 1e-7, 0), curve.Eval(3.0 + 1e-7, 0), 1e-5);
}

TEST(StdCurveKeys, KeysInsideSegmentsKeepTheShape) {
  ZvStdFCurve curve = Wave();
  const std::vector<double> before = Sample(curve, -1.0, 8.5, 400);
  for (double t : {0.4, 2.2, 2.9, 5.05, 7.0}) {
    ASSERT_EQ(curve.CreateNonModifyingKey(t, 1), 1u);
  }
  EXPECT_EQ(curve.GetNumKeys(), 11u);
  EXPECT_EQ(curve.IsValid(), 1u);
  ExpectSameShape(before, Sample(curve, -1.0, 8.5, 400), 1e-9);
  // Removing them again joins the halves back into the original cubics.
  for (double t : {0.4, 2.2, 2.9, 5.05, 7.0})
    ASSERT_EQ(curve.RemoveKey(t, 1e-9), 1u);
  EXPECT_EQ(curve.GetNumKeys(), 6u);
  ExpectSameShape(before, Sample(curve, -1.0, 8.5, 400), 1e-9);
}

TEST(StdCurveKeys, NonModifyingKeysFreezeAutomaticNeighbours) {
  ZvStdFCurve curve = Wave();
  for (double t : {1.5, 3.0, 4.5})
    SetFlag(curve, t, C::AutoTangent, 1);
  const std::vector<double> before = Sample(curve, 0.0, 7.5, 300);
  ASSERT_EQ(curve.CreateNonModifyingKey(3.7, 1), 1u);
  ExpectSameShape(before, Sample(curve, 0.0, 7.5, 300), 1e-9);
  EXPECT_EQ(HasFlag(curve, 3.0, C::AutoTangent), 0);
}

TEST(StdCurveKeys, KeysBeforeTheFirstTakeOverTheValueLeftOfTheCurve) {
  ZvStdFCurve head(0.0, C::LinearSegment);
  head.CreateKey(2.0, 4.0);
  head.CreateKey(0.0, 1.0, C::ConstantSegment, C::LinearSegment);
  EXPECT_EQ(head.GetFirstSegmentKind(), C::ConstantSegment);
  EXPECT_DOUBLE_EQ(head.Eval(1.0, 0), 2.5);
  EXPECT_EQ(head.Eval(-1.0, 0), 1.0);
}

TEST(StdCurveKeys, RemovalKeepsKindsAndValues) {
  ZvStdFCurve curve = Polyline({{0, 0}, {1, 1}, {2, 4}, {3, 9}});
  EXPECT_EQ(curve.RemoveKey(1.0, 0.0), 1u);
  EXPECT_DOUBLE_EQ(curve.Eval(1.0, 0), 2.0);  // the line from 0 to 4 at 1
  EXPECT_EQ(curve.RemoveKey(0.2, 0.1), 0u);
  SetFlag(curve, 2.0, C::ParameterLock, 1);
  EXPECT_EQ(curve.RemoveKey(2.0, 0.0), 0u);
  EXPECT_EQ(curve.RemoveKeys(0.0, 3.0, 0, 0), 0u);
  EXPECT_EQ(curve.RemoveKeys(2.5, 3.5, 0, 0), 1u);
  EXPECT_EQ(curve.GetNumKeys(), 2u);
  SetFlag(curve, 2.0, C::ParameterLock, 0);
  EXPECT_EQ(curve.RemoveKeys(-1.0, 5.0, 0, 0), 1u);
  EXPECT_EQ(curve.GetNumKeys(), 0u);
  EXPECT_EQ(curve.GetFirstSegmentKind(), C::LinearSegment);
  EXPECT_EQ(curve.RemoveKey(0.0, 1.0), 1u);  // nothing to remove is no failure

  ZvStdFCurve jump = Polyline({{0, 0}, {1, 1}, {2, 5}});
  jump.SetKeyValue(1.0, C::RightSide, 3.0, 0.0);
  EXPECT_EQ(jump.RemoveHead(1.0), 1u);  // the head goes; the jump closes on the right value
  EXPECT_EQ(jump.GetNumKeys(), 2u);
  EXPECT_EQ(jump.EvalLeft(1.0, 0), 3.0);
  EXPECT_EQ(jump.RemoveTail(1.5), 1u);
  EXPECT_EQ(jump.GetNumKeys(), 2u);
  EXPECT_DOUBLE_EQ(jump.Eval(1.5, 0), 4.0);
}

TEST(StdCurveKeys, MergeReplacesAnIntervalAndKeepsTheNearestFlags) {
  ZvStdFCurve curve = Polyline({{0, 0}, {1, 1}, {2, 2}, {3, 3}, {4, 4}});
  SetFlag(curve, 2.0, C::FlatTangent, 1);
  EXPECT_EQ(curve.MergeAndCreateKey(1.5, 3.5, 2.2, 10.0, 0, 0, 1), 1u);
  EXPECT_EQ(KeyParams(curve), (std::vector<double>{0.0, 1.0, 2.2, 4.0}));
  EXPECT_EQ(curve.Eval(2.2, 0), 10.0);
  EXPECT_EQ(HasFlag(curve, 2.2, C::FlatTangent), 1);
}

TEST(StdCurveKeys, HandlesAndSegmentKinds) {
  ZvStdFCurve curve = Wave();
  EXPECT_EQ(curve.SetKeyTgtHandle(3.0, C::RightSide, {0.4, 1.0}, 0.0), 1u);
  ZvPoint2<double> left, right;
  curve.GetActualKeyTgtHandles(3.0, left, right, 0.0);
  EXPECT_DOUBLE_EQ(right.x, 0.4);
  EXPECT_DOUBLE_EQ(right.y, 1.0);
  // A handle folding the segment back is refused and changes nothing.
  EXPECT_EQ(curve.SetKeyTgtHandle(3.0, C::RightSide, {-0.5, 0.0}, 0.0), 0u);
  EXPECT_EQ(curve.SetKeyTgtHandle(3.0, C::RightSide, {4.0, 0.0}, 0.0), 0u);
  curve.GetActualKeyTgtHandles(3.0, left, right, 0.0);
  EXPECT_DOUBLE_EQ(right.x, 0.4);
  SetFlag(curve, 3.0, C::TangentDirectionLock, 1);
  EXPECT_EQ(curve.SetKeyTgtHandle(3.0, C::RightSide, {0.3, 1.0}, 0.0), 0u);
  SetFlag(curve, 3.0, C::TangentDirectionLock, 0);
  // Handles set together that no longer line up drop the continuity flag.
  EXPECT_EQ(curve.SetKeyTgtHandles(3.0, {-0.5, 1.0}, {0.5, 1.0}, 0.0), 1u);
  EXPECT_EQ(HasFlag(curve, 3.0, C::TangentContinuity), 0);
  EXPECT_EQ(curve.IsValid(), 1u);

  // A linear segment turned cubic keeps stored handles that make a function: here flat ones
  // a third of the way in, as appending the keys left them.
  ZvStdFCurve line = Polyline({{0, 0}, {3, 3}});
  EXPECT_EQ(line.SetSegmentKind(0.0, C::RightSide, C::CubicSegment, 0.0), 1u);
  EXPECT_EQ(line.IsValid(), 1u);
  C::FSKind kind;
  EXPECT_EQ(line.GetSegmentKind(3.0, C::LeftSide, kind, 0.0), 1u);
  EXPECT_EQ(kind, C::CubicSegment);
  EXPECT_NEAR(line.Eval(1.0, 0), 7.0 / 9.0, 1e-12);
  EXPECT_EQ(line.SetSegmentKind(0.0, C::RightSide, static_cast<C::FSKind>(0), 0.0), 0u);
  EXPECT_EQ(line.SetSegmentKind(0.0, C::LeftSide, C::ConstantSegment, 0.0), 1u);
  EXPECT_EQ(line.GetFirstSegmentKind(), C::ConstantSegment);
}

TEST(StdCurveKeys, BadInputIsRefusedAndChangesNothing) {
  ZvStdFCurve curve = Wave();
  const std::string before = stdedit::Dump(curve);
  const double nan = std::nan(""), inf = HUGE_VAL;
  EXPECT_EQ(curve.CreateKey(1.0, nan), 0u);
  EXPECT_EQ(curve.CreateKey(inf, 1.0), 0u);
  EXPECT_EQ(curve.CreateKey(1.0, 1.0, static_cast<C::FSKind>(7), C::LinearSegment), 0u);
  EXPECT_EQ(curve.MergeAndCreateKey(nan, 3.0, 1.0, 1.0, 0, 0, 0), 0u);
  EXPECT_EQ(curve.RemoveKeys(nan, nan, 0, 0), 0u);
  EXPECT_EQ(curve.SetKeyValue(1.5, C::RightSide, inf, 0.0), 0u);
  EXPECT_EQ(curve.SetKeyTgtHandle(0.0, C::LeftSide, {nan, 1.0}, 0.0), 0u);
  EXPECT_EQ(curve.SetValueWhenNoKeys(nan), 0u);
  EXPECT_EQ(curve.ShiftValues(nan), 0u);
  EXPECT_EQ(curve.ScaleAndShiftValues(1.0, inf), 0u);
  EXPECT_EQ(curve.ShiftParameters(inf), 0u);
  EXPECT_EQ(curve.ResampleSequence(0.0, 7.5, 0.0, 0, 0), 0u);
  EXPECT_EQ(curve.SmoothSequence(0.0, 7.5, nullptr, 3), 0u);
  EXPECT_EQ(curve.SetClampingValues(nan, 1.0), 0u);
  double found;
  EXPECT_EQ(curve.EvalInverse(nan, found, 0), 0u);
  EXPECT_EQ(curve.GetFCurveInfo(nullptr), 0u);
  EXPECT_EQ(stdedit::Dump(curve), before);
}

TEST(StdCurveKeys, RandomEditsKeepTheCurveValid) {
  std::mt19937 rng(5);
  std::uniform_real_distribution<double> where(-2.0, 12.0), value(-5.0, 5.0), unit(-1.0, 1.0);
  ZvStdFCurve curve;
  unsigned int mostKeys = 0;
  for (int step = 0; step < 3000; ++step) {
    const double t = std::round(where(rng) * 8.0) / 8.0 + (rng() % 4 == 0 ? 1e-13 : 0.0);
    const C::FSKind kind = static_cast<C::FSKind>(rng() % 4);
    switch (rng() % 8) {
      case 0:
      case 1:
        curve.CreateKey(t, value(rng), kind, static_cast<C::FSKind>(rng() % 4));
        break;
      case 2:
        curve.CreateNonModifyingKey(t, 1);
        break;
      case 3:
        curve.RemoveKey(t, 0.3);
        break;
      case 4:
        curve.MergeAndCreateKey(t - 1.0, t + 1.0, t, value(rng), rng() % 2, rng() % 2, rng() % 2);
        break;
      case 5:
        curve.SetKeyTgtHandle(t, rng() % 2 ? C::LeftSide : C::RightSide,
                              {unit(rng), 3.0 * unit(rng)}, 0.2);
        break;
      case 6:
        curve.SetSegmentKind(t, C::RightSide, kind, 0.2);
        break;
      default: {
        double at = t;
        curve.SetConstraint(at, static_cast<C::KeyConstraint>(64u << (rng() % 6)), rng() % 2, 0.2);
        break;
      }
    }
    ASSERT_EQ(curve.IsValid(), 1u) << "after step " << step;
    const std::vector<double> params = KeyParams(curve);
    ASSERT_TRUE(std::is_sorted(params.begin(), params.end()));
    ASSERT_EQ(std::adjacent_find(params.begin(), params.end()), params.end());
    if (params.size() > mostKeys) mostKeys = static_cast<unsigned int>(params.size());
    const double v = curve.Eval(where(rng), 0);
    ASSERT_TRUE(std::isfinite(v)) << "after step " << step;
  }
  EXPECT_GT(mostKeys, 20u);  // the edits did build a curve
}

TEST(StdCurveKeys, CopiesAreIndependent) {
  ZvStdFCurve curve = Wave();
  ZvBaseFCurve* clone = curve.Clone();
  ASSERT_NE(clone, nullptr);
  ASSERT_EQ(clone->QueryFCurveKind(C::StdKind), clone);
  EXPECT_EQ(clone->QueryFCurveKind(C::RawKind), nullptr);
  curve.CreateKey(2.0, 50.0);
  EXPECT_NE(clone->Eval(2.0, 0), 50.0);
  ZvStdFCurve assigned;
  EXPECT_EQ(assigned.Set(*clone), 1u);
  EXPECT_EQ(assigned.GetNumKeys(), 6u);
  delete clone;

  // Another class, even one claiming the same kind, is refused.
  TestFCurve other({1.0, 2.0});
  EXPECT_EQ(assigned.Set(other), 0u);
  EXPECT_EQ(assigned.GetNumKeys(), 6u);
}

TEST(StdCurveKeys, KeyQueries) {
  ZvStdFCurve curve = Polyline({{0, 0}, {1, 10}, {2, 20}, {3, 30}});
  double p = -1;
  EXPECT_EQ(curve.GetNearestKeyParameter(1.5, p), 1u);
  EXPECT_EQ(p, 2.0);  // midway: the later key
  EXPECT_EQ(curve.GetNextKeyParameter(1.0, p, 0), 1u);
  EXPECT_EQ(p, 2.0);
  EXPECT_EQ(curve.GetNextKeyParameter(1.0, p, 1), 1u);
  EXPECT_EQ(p, 1.0);
  EXPECT_EQ(curve.GetPrevKeyParameter(1.0, p, 0), 1u);
  EXPECT_EQ(p, 0.0);
  EXPECT_EQ(curve.GetPrevKeyParameter(0.0, p, 0), 0u);
  EXPECT_EQ(curve.GetNextKeyParameter(3.0, p, 0), 0u);
  p = 2.05;
  EXPECT_EQ(curve.GetNearestKeyParameterInCenteredInterval(p, 0.1), 1u);
  EXPECT_EQ(p, 2.0);

  ZvDoubleArray params;
  EXPECT_EQ(curve.GetKeyParameters(1.0, 1.0, params, 1, 1), 0u);
  EXPECT_EQ(curve.GetKeyParameters(1.0, 1.0, params, 1, 0), 1u);  // one flag: both ignored
  EXPECT_EQ(curve.GetKeyParameters(0.5, 3.0, params, 0, 1), 2u);
  EXPECT_EQ(params.size, 3u);

  C::KeyInfo info{};
  info.mask = 0x1ff;
  EXPECT_EQ(curve.GetKeyInfoFromIndex(4, &info), 0u);
  EXPECT_EQ(info.mask, 0u);
  info.mask = 0x1ff;
  EXPECT_EQ(curve.GetKeyInfoFromParameter(2.0, &info), 1u);
  EXPECT_EQ(info.index, 2u);
  EXPECT_EQ(info.leftValue, 20.0);
  EXPECT_EQ(info.segmentKind, C::LinearSegment);

  ZvDoubleArray ps, ls, rs;
  curve.SetClampingValues(5.0, 25.0);
  EXPECT_EQ(curve.GetKeys(ps, ls, rs, 1), 4u);
  EXPECT_EQ(ls[0], 5.0);
  EXPECT_EQ(rs[3], 25.0);
  EXPECT_EQ(curve.GetMinusInfinityVal(), 0.0);
  EXPECT_EQ(curve.GetPlusInfinityVal(), 30.0);
  EXPECT_EQ(curve.IsLargestKeyParameter(3.0), 1u);
  EXPECT_EQ(curve.SetAsTimeFCurve(1), 0u);
  EXPECT_EQ(curve.SetAsTimeFCurve(0), 1u);
}

TEST(StdCurveKeys, WholeCurveMoves) {
  ZvStdFCurve curve = Wave();
  const std::vector<double> before = Sample(curve, 0.0, 7.5, 100);
  ASSERT_EQ(curve.ShiftParameters(2.0), 1u);
  ExpectSameShape(before, Sample(curve, 2.0, 9.5, 100), 1e-12);
  ASSERT_EQ(curve.ScaleParameterAxis(2.0), 1u);
  ExpectSameShape(before, Sample(curve, 4.0, 19.0, 100), 1e-9);
  ASSERT_EQ(curve.ScaleAndShiftValues(2.0, 1.0), 1u);
  EXPECT_NEAR(curve.Eval(7.0, 0), 2.0 * 2.0 + 1.0, 1e-12);
  ASSERT_EQ(curve.MirrorValues(), 1u);
  EXPECT_NEAR(curve.Eval(7.0, 0), -5.0, 1e-12);
  EXPECT_EQ(curve.ScaleParameterAxis(0.0), 0u);
  SetFlag(curve, 7.0, C::ParameterLock, 1);
  EXPECT_EQ(curve.ShiftParameters(1.0), 0u);

  ZvStdFCurve grid = Wave();
  const std::vector<double> shape = Sample(grid, 0.0, 7.5, 60);
  ASSERT_EQ(grid.ResampleSequence(0.0, 7.5, 0.5, 1, 0), 1u);
  EXPECT_EQ(grid.GetNumKeys(), 16u);
  ExpectSameShape(shape, Sample(grid, 0.0, 7.5, 60), 1e-9);
  ASSERT_EQ(grid.ResampleSequence(0.0, 7.5, 2.5, 0, 0), 1u);
  EXPECT_EQ(grid.GetNumKeys(), 4u);

  // Under a cycle method the interval is folded into the keys first.
  ZvStdFCurve cycled = Wave();
  cycled.SetExtrapolationMethod(C::CycleExtrapolation);
  ASSERT_EQ(cycled.ResampleSequence(9.0, 10.5, 0.5, 1, 0), 1u);
  EXPECT_EQ(cycled.GetNumKeys(), 8u);
  EXPECT_EQ(cycled.IsKeyParameter(2.5, 1e-12), 1u);
  ASSERT_EQ(cycled.ResampleSequence(6.5, 8.5, 0.5, 1, 0), 1u);  // across a period boundary
  EXPECT_EQ(cycled.GetNumKeys(), 12u);
  EXPECT_EQ(cycled.IsKeyParameter(0.5, 1e-12), 1u);
  EXPECT_EQ(cycled.IsKeyParameter(7.0, 1e-12), 1u);
  cycled.SetExtrapolationMethod(C::ConstantExtrapolation);
  ExpectSameShape(shape, Sample(cycled, 0.0, 7.5, 60), 1e-9);
}

}  // namespace
