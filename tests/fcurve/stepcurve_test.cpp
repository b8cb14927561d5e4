// The boolean and integer step curves: which values they take, steps and their left sides,
// extrapolation, the value edits of the integer curve, locks, and the slots a step refuses.
#include <gtest/gtest.h>

#include <zv/step_fcurve.h>
#include <zv/transfo4.h>

#include <cfloat>

namespace {

using C = ZvBaseFCurve;

// 0 before 1, then 3 from 1, -2 from 2, 5 from 4.
ZvIntegerFCurve Steps() {
  ZvIntegerFCurve c;
  c.CreateKey(1.0, 3.0);
  c.CreateKey(2.0, -2.0);
  c.CreateKey(4.0, 5.0);
  c.SetKeyValue(1.0, C::LeftSide, 0.0, 0.0);
  return c;
}

TEST(StepValues, BooleanTakesZeroAndOneOnlyWhereExactnessIsAsked) {
  ZvBooleanFCurve b;
  EXPECT_FALSE(b.CreateKey(0.0, 0.5));
  EXPECT_FALSE(b.CreateKey(0.0, 2.0));
  EXPECT_EQ(b.GetNumKeys(), 0u);
  EXPECT_TRUE(b.CreateKey(0.0, 1.0 + 1e-16));
  EXPECT_TRUE(b.CreateKey(1.0, -1e-16));
  EXPECT_EQ(b.Eval(0.5, 0), 1.0);
  EXPECT_EQ(b.Eval(1.0, 0), 0.0);
  EXPECT_TRUE(b.MergeAndCreateKey(0.9, 1.1, 1.0, 0.7, 0, 0, 0));  // not near 1: 0
  EXPECT_EQ(b.Eval(1.0, 0), 0.0);
  EXPECT_TRUE(b.SetValueWhenNoKeys(1.0));
  EXPECT_EQ(ZvBooleanFCurve(1.0).Eval(3.0, 0), 1.0);
  EXPECT_EQ(ZvBooleanFCurve(0.99).Eval(3.0, 0), 0.0);
}

TEST(StepValues, IntegerTakesWholeNumbersInRange) {
  ZvIntegerFCurve c;
  EXPECT_FALSE(c.CreateKey(0.0, 2.5));
  EXPECT_FALSE(c.CreateKey(0.0, 2147483648.0));
  EXPECT_FALSE(c.CreateKey(0.0, -2147483649.0));
  EXPECT_FALSE(c.MergeAndCreateKey(-1.0, 1.0, 0.0, 0.25, 0, 0, 0));
  EXPECT_EQ(c.GetNumKeys(), 0u);
  EXPECT_TRUE(c.CreateKey(0.0, 3.0000000000000001));
  EXPECT_EQ(c.Eval(0.0, 0), 3.0);
  EXPECT_TRUE(c.CreateKey(1.0, -2.0));
  EXPECT_EQ(c.Eval(1.0, 0), -2.0);
  EXPECT_TRUE(c.CreateKey(2.0, -2147483648.0));
  EXPECT_EQ(c.Eval(2.0, 0), -2147483648.0);
  EXPECT_TRUE(c.SetKeyValue(1.0, C::RightSide, 7.9, 0.0));  // truncated
  EXPECT_EQ(c.Eval(1.5, 0), 7.0);
  EXPECT_EQ(ZvIntegerFCurve(-3.7).Eval(0.0, 0), -3.0);
}

TEST(StepCurve, HoldsEachValueToTheNextKeyAndReadsTheLeftSideBeforeIt) {
  ZvIntegerFCurve c = Steps();
  EXPECT_EQ(c.Eval(0.0, 0), 0.0);
  EXPECT_EQ(c.Eval(1.0, 0), 3.0);
  EXPECT_EQ(c.Eval(2.0 - 1e-13, 0), -2.0);  // snapped onto the key
  EXPECT_EQ(c.Eval(3.99, 0), -2.0);
  EXPECT_EQ(c.Eval(100.0, 0), 5.0);
  double v = 0.0, left = 0.0, right = 0.0;
  ASSERT_TRUE(c.GetKeyValue(2.0, C::LeftSide, v, 0.0));
  EXPECT_EQ(v, 3.0);
  ASSERT_TRUE(c.GetKeyValues(1.0, left, right, 0.0));
  EXPECT_EQ(left, 0.0);
  EXPECT_EQ(right, 3.0);
  // The left side of a key is the previous key's value: changing it changes that step.
  ASSERT_TRUE(c.SetKeyValue(2.0, C::LeftSide, 9.0, 0.0));
  EXPECT_EQ(c.Eval(1.5, 0), 9.0);
  ASSERT_TRUE(c.SetKeyValue(1.0, C::LeftSide, 4.0, 0.0));
  EXPECT_EQ(c.Eval(-5.0, 0), 4.0);
  EXPECT_EQ(c.GetValueBeforeFirstKey(), 4);
  EXPECT_EQ(c.GetValueUpperBound(0), 9.0);
  EXPECT_EQ(c.GetValueLowerBound(1), -2.0);
  // A key put in front takes its own value as the value before it.
  ASSERT_TRUE(c.CreateKey(0.0, 6.0));
  EXPECT_EQ(c.Eval(-1.0, 0), 6.0);
  // Removing the first key leaves its value in front of the new first key.
  ASSERT_TRUE(c.RemoveKey(0.0, 0.0));
  EXPECT_EQ(c.Eval(0.5, 0), 6.0);
  ASSERT_TRUE(c.CreateNonModifyingKey(3.0, 1));
  EXPECT_EQ(c.GetNumKeys(), 4u);
  EXPECT_EQ(c.Eval(3.0, 0), -2.0);
  C::KeyInfo info{};
  info.mask = C::KeyInfo::LeftValueMask | C::KeyInfo::RightValueMask | C::KeyInfo::SegmentKindMask;
  EXPECT_EQ(c.GetKeyInfoFromParameter(4.0, &info), 0u);  // no segment kinds
  EXPECT_EQ(info.leftValue, -2.0);
  EXPECT_EQ(info.rightValue, 5.0);
  EXPECT_EQ(info.segmentKind, C::ConstantSegment);
}

TEST(StepCurve, CyclesWithoutAccumulatingAndRefusesTheLinearMethod) {
  ZvIntegerFCurve c = Steps();  // keys 1..4, period 3
  EXPECT_FALSE(c.SetExtrapolationMethod(C::LinearExtrapolation));
  EXPECT_FALSE(ZvBooleanFCurve().SetExtrapolationMethod(C::LinearExtrapolation));
  EXPECT_EQ(c.GetExtrapolationMethod(), C::ConstantExtrapolation);
  ASSERT_TRUE(c.SetExtrapolationMethod(C::CycleExtrapolation));
  EXPECT_EQ(c.Eval(4.0, 0), 3.0);  // the last key of a period is the first of the next
  EXPECT_EQ(c.Eval(5.5, 0), -2.0);
  EXPECT_EQ(c.Eval(0.5, 0), -2.0);
  ASSERT_TRUE(c.SetExtrapolationMethod(C::CycleWithOffsetExtrapolation));
  EXPECT_EQ(c.Eval(7.0, 0), 3.0);
  EXPECT_EQ(c.Eval(11.5, 0), -2.0);
  EXPECT_EQ(c.Eval(-4.5, 0), 3.0);
}

TEST(StepCurve, AnswersZeroWhereAStepHasNothingToSay) {
  ZvIntegerFCurve c = Steps();
  double lo = 0.0, hi = 0.0, t = 0.0;
  EXPECT_FALSE(c.SetClampingValues(-1.0, 1.0));
  ASSERT_TRUE(c.GetClampingValues(lo, hi));
  EXPECT_EQ(lo, -DBL_MAX);
  EXPECT_EQ(hi, DBL_MAX);
  EXPECT_FALSE(c.EvalInverse(3.0, t, 0));
  EXPECT_FALSE(c.IsBijective());
  C::FCurveInfo info{};
  info.mask =
      C::FCurveInfo::KindMask | C::FCurveInfo::ValueWhenNoKeysMask | C::FCurveInfo::MinClampMask;
  info.minClamp = 5.0;
  EXPECT_EQ(c.GetFCurveInfo(&info), 0u);
  EXPECT_EQ(info.mask, unsigned(C::FCurveInfo::KindMask | C::FCurveInfo::ValueWhenNoKeysMask));
  EXPECT_EQ(info.kind, unsigned(C::IntegerKind));
  EXPECT_EQ(info.minClamp, 0.0);
  EXPECT_EQ(info.firstSegmentKind, unsigned(C::ConstantSegment));
  info.mask = C::FCurveInfo::NumKeysMask;
  EXPECT_EQ(c.GetFCurveInfo(&info), 1u);
  t = 1.0;
  EXPECT_FALSE(c.SetConstraint(t, C::AutoTangent, 1, 0.0));
  EXPECT_FALSE(c.SetConstraint(t, C::KeyConstraint(C::ValueLock | C::FlatTangent), 1, 0.0));
  EXPECT_FALSE(c.IsConstraintSupported(C::TangentContinuity));
  ZvBooleanFCurve b;
  b.CreateKey(0.0, 1.0);
  const double kernel[3] = {0.25, 0.5, 0.25};
  EXPECT_FALSE(b.SmoothSequence(-1.0, 1.0, kernel, 3));
  EXPECT_TRUE(b.ShiftValues(1.0));
  EXPECT_TRUE(b.ScaleAndShiftValues(3.0, 1.0));
  EXPECT_EQ(b.Eval(0.0, 0), 1.0);
  b.SetKeyValue(0.0, C::LeftSide, 0.0, 0.0);
  ASSERT_TRUE(b.MirrorValues());
  EXPECT_EQ(b.Eval(0.0, 0), 0.0);
  EXPECT_EQ(b.Eval(-1.0, 0), 1.0);
}

TEST(StepCurve, IntegerValueEditsRoundTheirArgumentsAndScaleFromTheLeft) {
  ZvIntegerFCurve c = Steps();      // 0 | 3 -2 5
  ASSERT_TRUE(c.ShiftValues(1.5));  // rounds to 2; the value before the first key stays
  EXPECT_EQ(c.Eval(0.0, 0), 0.0);
  EXPECT_EQ(c.Eval(1.0, 0), 5.0);
  EXPECT_EQ(c.Eval(4.0, 0), 7.0);
  // Each key takes its left neighbour's new value, times 2 plus 1: 0 | 1 3 7.
  ASSERT_TRUE(c.ScaleAndShiftValues(2.2, 0.6));
  EXPECT_EQ(c.Eval(0.0, 0), 0.0);
  EXPECT_EQ(c.Eval(1.0, 0), 1.0);
  EXPECT_EQ(c.Eval(2.0, 0), 3.0);
  EXPECT_EQ(c.Eval(4.0, 0), 7.0);
  EXPECT_FALSE(c.ScaleAndShiftValues(1e-8, 0.0));
  ASSERT_TRUE(c.MirrorValues());
  EXPECT_EQ(c.Eval(2.0, 0), -3.0);
  const double kernel[3] = {0.25, 0.5, 0.25};
  // -1 -3 -7, mirrored about each end sample: -2 -3.5 -5, truncated toward zero.
  ASSERT_TRUE(c.SmoothSequence(0.0, 10.0, kernel, 3));
  EXPECT_EQ(c.Eval(1.0, 0), -2.0);
  EXPECT_EQ(c.Eval(2.0, 0), -3.0);
  EXPECT_EQ(c.Eval(4.0, 0), -5.0);
}

TEST(StepCurve, LocksGuardValuesAndParameters) {
  ZvIntegerFCurve c = Steps();
  double at = 2.0;
  ASSERT_TRUE(c.SetConstraint(at, C::ValueLock, 1, 0.0));
  int on = 0;
  ASSERT_TRUE(c.GetConstraint(at, C::ValueLock, on, 0.0));
  EXPECT_EQ(on, 1);
  ASSERT_TRUE(c.GetConstraint(at, C::WholeKeyLock, on, 0.0));
  EXPECT_EQ(on, 0);
  EXPECT_TRUE(c.AreAnyValuesLockedInInterval(1.5, 2.5, 0, 0));
  EXPECT_FALSE(c.AreAnyValuesLockedInInterval(2.0, 3.0, 1, 0));
  EXPECT_FALSE(c.CreateKey(2.0, 1.0));
  EXPECT_FALSE(c.SetKeyValue(2.0, C::RightSide, 1.0, 0.0));
  EXPECT_FALSE(c.MergeAndCreateKey(1.5, 2.5, 2.0, 1.0, 0, 0, 0));
  EXPECT_FALSE(c.RemoveKey(2.0, 0.0));
  EXPECT_FALSE(c.ShiftValues(1.0));
  EXPECT_FALSE(c.MirrorValues());
  EXPECT_EQ(c.Eval(2.0, 0), -2.0);
  at = 4.0;
  ASSERT_TRUE(c.SetConstraint(at, C::ParameterLock, 1, 0.0));
  EXPECT_FALSE(c.ShiftParameters(1.0));
  EXPECT_FALSE(c.AreAnyKeysLockedInInterval(0.0, 5.0, 0, 0));  // no key holds both locks
  at = 2.0;
  ASSERT_TRUE(c.SetConstraint(at, C::ParameterLock, 1, 0.0));
  EXPECT_TRUE(c.AreAnyKeysLockedInInterval(0.0, 5.0, 0, 0));
  ASSERT_TRUE(c.SetReadOnlyConstraint(1));
  EXPECT_FALSE(c.CreateKey(3.0, 1.0));
  EXPECT_FALSE(c.SetValueWhenNoKeys(1.0));
  EXPECT_EQ(c.GetNumKeys(), 3u);
}

TEST(StepCurve, FlattensIntoHorizontalPiecesAndVerticalJumps) {
  ZvIntegerFCurve c = Steps();
  ZvPoint2dArray points;
  ZvPointTagArray tags;
  ASSERT_TRUE(c.Flatten(ZvTransfo4(), 0.01, points, tags, 0));
  // (1,3) (2,3) (2,-2) (4,-2) (4,5): one run.
  ASSERT_EQ(points.size, 5u);
  EXPECT_EQ(points[1].x, 2.0);
  EXPECT_EQ(points[1].y, 3.0);
  EXPECT_EQ(points[2].x, 2.0);
  EXPECT_EQ(points[2].y, -2.0);
  EXPECT_EQ(points[4].y, 5.0);
  EXPECT_EQ(tags[4], ZvPointTag_Last);
  ZvDoubleArray ts, vs;
  ASSERT_EQ(c.EvalSequence(0.0, 5.0, 1.0, 0.01, ts, vs, 0), 6u);
  const double expected[6] = {0.0, 3.0, -2.0, -2.0, 5.0, 5.0};
  for (int i = 0; i < 6; ++i)
    EXPECT_EQ(vs[i], expected[i]) << i;
}

}  // namespace
