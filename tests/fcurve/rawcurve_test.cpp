// The raw curve: linear joins and extrapolation, inversion, the constraint slots that store
// nothing, appending, the fit through samples and the thinning of keys.
#include <gtest/gtest.h>

#include <zv/raw_fcurve.h>

#include <cfloat>
#include <cmath>
#include <random>

namespace {

using C = ZvBaseFCurve;

ZvRawFCurve Ramp() {  // (0,0) (1,2) (3,2) (4,0)
  ZvRawFCurve c(0.0, 0.0, 1.0, 2.0);
  c.CreateKey(3.0, 2.0);
  c.CreateKey(4.0, 0.0);
  return c;
}

TEST(RawCurve, InterpolatesLinearlyAndHoldsTheEndsUnderTheConstantMethod) {
  ZvRawFCurve c = Ramp();
  EXPECT_DOUBLE_EQ(c.Eval(0.25, 0), 0.5);
  EXPECT_DOUBLE_EQ(c.Eval(2.0, 0), 2.0);
  EXPECT_DOUBLE_EQ(c.Eval(3.5, 0), 1.0);
  EXPECT_DOUBLE_EQ(c.Eval(-7.0, 0), 0.0);
  EXPECT_DOUBLE_EQ(c.Eval(9.0, 0), 0.0);
  // A parameter within 1e-12 of a key is the key.
  EXPECT_DOUBLE_EQ(c.Eval(1.0 - 5e-13, 0), 2.0);
  EXPECT_EQ(ZvRawFCurve(4.5).Eval(1.0, 0), 4.5);
  ASSERT_TRUE(c.SetClampingValues(0.5, 1.5));
  EXPECT_DOUBLE_EQ(c.Eval(2.0, 1), 1.5);
  EXPECT_DOUBLE_EQ(c.Eval(0.1, 1), 0.5);
  EXPECT_DOUBLE_EQ(c.Eval(2.0, 0), 2.0);
  EXPECT_DOUBLE_EQ(c.GetValueUpperBound(1), 1.5);
  EXPECT_DOUBLE_EQ(c.GetValueLowerBound(0), 0.0);
}

TEST(RawCurve, ExtendsTheEndSlopesOrOneKeysValueUnderTheLinearMethod) {
  ZvRawFCurve c = Ramp();
  ASSERT_TRUE(c.SetExtrapolationMethod(C::LinearExtrapolation));
  EXPECT_DOUBLE_EQ(c.Eval(-1.0, 0), -2.0);
  EXPECT_DOUBLE_EQ(c.Eval(5.0, 0), -2.0);
  ZvRawFCurve one(2.0, 7.0);
  ASSERT_TRUE(one.SetExtrapolationMethod(C::LinearExtrapolation));
  EXPECT_EQ(one.Eval(-100.0, 0), 7.0);
  EXPECT_EQ(one.Eval(100.0, 0), 7.0);
}

TEST(RawCurve, RepeatsPeriodsWithTheOffsetOfLastMinusFirstValue) {
  ZvRawFCurve c(0.0, 1.0, 2.0, 3.0);  // rises by 2 per period of 2
  ASSERT_TRUE(c.SetExtrapolationMethod(C::CycleExtrapolation));
  EXPECT_DOUBLE_EQ(c.Eval(3.0, 0), 2.0);
  EXPECT_DOUBLE_EQ(c.Eval(-1.0, 0), 2.0);
  EXPECT_DOUBLE_EQ(c.Eval(2.0, 0), 1.0);  // the end of a period starts the next
  ASSERT_TRUE(c.SetExtrapolationMethod(C::CycleWithOffsetExtrapolation));
  EXPECT_DOUBLE_EQ(c.Eval(3.0, 0), 4.0);
  EXPECT_DOUBLE_EQ(c.Eval(5.0, 0), 6.0);
  EXPECT_DOUBLE_EQ(c.Eval(-1.0, 0), 0.0);
  EXPECT_DOUBLE_EQ(c.FoldParameter(5.0), 1.0);
}

TEST(RawCurve, InvertsOnlyStrictlyMonotoneValues) {
  ZvRawFCurve rising(0.0, 0.0, 2.0, 4.0);
  rising.CreateKey(3.0, 10.0);
  double t = -1.0;
  EXPECT_TRUE(rising.IsBijective());
  ASSERT_TRUE(rising.EvalInverse(7.0, t, 0));
  EXPECT_DOUBLE_EQ(t, 2.5);
  ASSERT_TRUE(rising.EvalInverse(4.0 + 5e-8, t, 0));
  EXPECT_EQ(t, 2.0);  // a key within 1e-7 answers with its parameter
  ASSERT_TRUE(rising.EvalInverse(-3.0, t, 0));
  EXPECT_EQ(t, 0.0);
  ASSERT_TRUE(rising.EvalInverse(30.0, t, 0));
  EXPECT_EQ(t, 3.0);
  ZvRawFCurve falling(0.0, 4.0, 1.0, 0.0);
  ASSERT_TRUE(falling.EvalInverse(1.0, t, 0));
  EXPECT_DOUBLE_EQ(t, 0.75);
  t = 42.0;
  ZvRawFCurve flat = Ramp();  // two equal values in a row
  EXPECT_FALSE(flat.IsBijective());
  EXPECT_FALSE(flat.EvalInverse(1.0, t, 0));
  EXPECT_FALSE(ZvRawFCurve(0.0, 1.0).IsBijective());
  EXPECT_EQ(t, 42.0);
}

TEST(RawCurve, AcceptsLockCodesButStoresNoLock) {
  ZvRawFCurve c = Ramp();
  double at = 1.0 + 1e-4;
  EXPECT_TRUE(c.SetConstraint(at, C::ValueLock, 1, 1e-3));
  EXPECT_EQ(at, 1.0);
  int on = 1;
  at = 1.0;
  ASSERT_TRUE(c.GetConstraint(at, C::ValueLock, on, 0.0));
  EXPECT_EQ(on, 0);
  EXPECT_FALSE(c.AreAnyValuesLockedInInterval(-10.0, 10.0, 0, 0));
  EXPECT_TRUE(c.SetKeyValue(1.0, C::LeftSide, 5.0, 0.0));  // nothing stops the edit
  double left = 0.0, right = 0.0;
  ASSERT_TRUE(c.GetKeyValues(1.0, left, right, 0.0));
  EXPECT_EQ(left, 5.0);
  EXPECT_EQ(right, 5.0);
  at = 1.0;
  EXPECT_FALSE(c.SetConstraint(at, C::AutoTangent, 1, 0.0));
  EXPECT_FALSE(c.IsConstraintSupported(C::TangentContinuity));
  at = 2.0;
  EXPECT_FALSE(c.SetConstraint(at, C::ValueLock, 1, 0.1));  // no key there
  EXPECT_FALSE(c.SetKeyValue(2.0, C::RightSide, 1.0, 0.1));
}

TEST(RawCurve, AnswersTheRequestsForSegmentKindsAndTangentsWithZero) {
  ZvRawFCurve c = Ramp();
  C::FCurveInfo info{};
  info.mask = C::FCurveInfo::KindMask | C::FCurveInfo::NumKeysMask |
              C::FCurveInfo::FirstSegmentKindMask | C::FCurveInfo::MaxClampMask;
  info.firstSegmentKind = 9;
  EXPECT_EQ(c.GetFCurveInfo(&info), 0u);
  EXPECT_EQ(info.mask, unsigned(C::FCurveInfo::KindMask | C::FCurveInfo::NumKeysMask |
                                C::FCurveInfo::MaxClampMask));
  EXPECT_EQ(info.kind, unsigned(C::RawKind));
  EXPECT_EQ(info.numKeys, 4u);
  EXPECT_EQ(info.firstSegmentKind, 0u);
  EXPECT_EQ(info.maxClamp, DBL_MAX);
  C::KeyInfo key{};
  key.mask = C::KeyInfo::LeftValueMask | C::KeyInfo::RightValueMask;
  ASSERT_EQ(c.GetKeyInfoFromIndex(1, &key), 1u);
  EXPECT_EQ(key.leftValue, 2.0);
  EXPECT_EQ(key.rightValue, 2.0);
  key.mask = C::KeyInfo::ParameterMask | C::KeyInfo::RightTangentYMask;
  key.rightTangentY = 3.0;
  EXPECT_EQ(c.GetKeyInfoFromParameter(3.0, &key), 0u);
  EXPECT_EQ(key.mask, unsigned(C::KeyInfo::ParameterMask));
  EXPECT_EQ(key.parameter, 3.0);
  EXPECT_EQ(key.rightTangentY, 0.0);
  EXPECT_EQ(key.segmentKind, C::ConstantSegment);
}

TEST(RawCurve, AppendsOrExtendsTheLastLine) {
  ZvRawFCurve c(0.0, 0.0);
  EXPECT_TRUE(c.AppendOrExtendLinearSegment({1.0, 0.0}, 10.0));  // one key: always a new key
  EXPECT_EQ(c.GetNumKeys(), 2u);
  EXPECT_TRUE(c.AppendOrExtendLinearSegment({2.0, 0.05}, 0.1));  // on the line: moves the end
  EXPECT_EQ(c.GetNumKeys(), 2u);
  double last = 0.0;
  c.GetLargestKeyParameter(last);
  EXPECT_EQ(last, 2.0);
  EXPECT_EQ(c.Eval(2.0, 0), 0.0);  // moved onto the line, not to the point
  EXPECT_TRUE(c.AppendOrExtendLinearSegment({3.0, 1.0}, 0.1));
  EXPECT_EQ(c.GetNumKeys(), 3u);
  EXPECT_FALSE(c.AppendLinearSegment({3.0, 5.0}));  // not right of the last key
  EXPECT_FALSE(c.AppendOrExtendLinearSegment({1.0, 0.0}, 1.0));
  EXPECT_EQ(c.GetNumKeys(), 3u);
}

// Noisy random walks sampled densely, built into keys and then thinned.
class RawReduction : public ::testing::TestWithParam<int> {};

TEST_P(RawReduction, KeepsEverySampleNearTheThinnedPolyline) {
  std::mt19937 rng(static_cast<unsigned>(GetParam()));
  std::normal_distribution<double> noise(0.0, 0.05);
  std::uniform_real_distribution<double> drift(-0.2, 0.2);
  ZvPoint2dArray samples(2000);
  double y = 0.0, slope = 0.0;
  for (int i = 0; i < 2000; ++i) {
    if (i % 100 == 0) slope = drift(rng);
    y += slope * 0.01;
    samples.Add({i * 0.01, y + noise(rng)});
  }
  const double tolerance = 0.1;
  ZvRawFCurve exact(samples, 0.0);  // every sample a key
  ASSERT_EQ(exact.GetNumKeys(), samples.size);
  ZvRawFCurve thinned(exact);
  ASSERT_TRUE(thinned.ReduceNumKeys(tolerance));
  ZvRawFCurve ranged(exact);
  ASSERT_TRUE(ranged.ReduceNumKeys(-1.0, 30.0, tolerance));
  EXPECT_LT(thinned.GetNumKeys(), samples.size / 2);
  EXPECT_TRUE(ranged.IsSmallestKeyParameter(-1.0));  // the range's ends become keys
  // The thinning tests each dropped key against the line through the key kept before it and
  // that key's successor, so the chord that finally joins two kept keys may stray from that
  // line by the tolerance as well: twice the tolerance is what the rule guarantees.
  double worst = 0.0;
  for (unsigned int i = 0; i < samples.size; ++i) {
    worst = std::fmax(worst, std::fabs(thinned.Eval(samples[i].x, 0) - samples[i].y));
    worst = std::fmax(worst, std::fabs(ranged.Eval(samples[i].x, 0) - samples[i].y));
  }
  EXPECT_LE(worst, 2.0 * tolerance);
  // The greedy fit makes keys under the same rule.
  ZvRawFCurve fitted(samples, tolerance);
  EXPECT_LT(fitted.GetNumKeys(), samples.size / 2);
  for (unsigned int i = 0; i < samples.size; ++i)
    ASSERT_LE(std::fabs(fitted.Eval(samples[i].x, 0) - samples[i].y), 2.0 * tolerance) << i;
}

INSTANTIATE_TEST_SUITE_P(Seeds, RawReduction, ::testing::Values(1, 2, 3, 4, 5, 6, 7, 8));

TEST(RawCurve, ThinsOnlyWhatLiesOnTheLine) {
  ZvRawFCurve c(0.0, 0.0, 1.0, 1.0);
  c.CreateKey(2.0, 2.0);
  c.CreateKey(3.0, 3.05);
  c.CreateKey(4.0, 0.0);
  ASSERT_TRUE(c.ReduceNumKeys(0.1));
  ZvDoubleArray kept;
  c.GetAllKeyParameters(kept);
  ASSERT_EQ(kept.size, 3u);
  EXPECT_EQ(kept[1], 3.0);
  EXPECT_DOUBLE_EQ(c.Eval(3.0, 0), 3.05);
  ZvPoint2dArray disorder;
  disorder.Add({1.0, 0.0});
  disorder.Add({0.0, 1.0});
  EXPECT_EQ(ZvRawFCurve(disorder, 0.1).GetNumKeys(), 0u);
}

}  // namespace
