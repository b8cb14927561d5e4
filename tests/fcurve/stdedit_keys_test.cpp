// Key creation with segment kinds, merging, and removal with a kind for the segment left behind;
// refusals leave the curve exactly as it was.
#include <gtest/gtest.h>

#include <zv/std_fcurve.h>

#include "stdedit_util.h"
#include "uid.h"

namespace {

using stdedit::C;
using stdedit::Dump;

TEST(StdEditKeys, KindsGivenAtCreationAndInherited) {
  ZvStdFCurve curve(0.0, C::CubicSegment);
  ASSERT_EQ(curve.CreateKey(1.0, 5.0, C::LinearSegment, C::ConstantSegment), 1u);
  EXPECT_EQ(curve.GetFirstSegmentKind(), C::LinearSegment);
  C::FCurveInfo info{};
  info.mask = C::FCurveInfo::ValueWhenNoKeysMask;
  curve.GetFCurveInfo(&info);
  EXPECT_EQ(info.valueWhenNoKeys, 5.0);
  ASSERT_EQ(curve.CreateKey(3.0, 1.0), 1u);  // after the last key: its kind
  C::FSKind kind;
  ASSERT_EQ(curve.GetSegmentKindAtIndex(1, kind), 1u);
  EXPECT_EQ(kind, C::ConstantSegment);
  ASSERT_EQ(curve.CreateKey(2.0, 7.0, C::LinearSegment, C::CubicSegment), 1u);  // between
  curve.GetSegmentKindAtIndex(0, kind);
  EXPECT_EQ(kind, C::LinearSegment);
  curve.GetSegmentKindAtIndex(1, kind);
  EXPECT_EQ(kind, C::CubicSegment);
  EXPECT_EQ(curve.IsValid(), 1u);
  EXPECT_DOUBLE_EQ(curve.Eval(1.5, 0), 6.0);  // the new linear segment
}

TEST(StdEditKeys, LockedOrReadOnlyCurvesRefuseAndStayAsTheyWere) {
  ZvStdFCurve curve = stdedit::Mixed();
  ASSERT_EQ(stdedit::SetFlag(curve, 3.0, C::ValueLock, 1), 1u);
  const std::string before = Dump(curve);
  EXPECT_EQ(curve.CreateKey(3.0, 9.0, C::FSKind(0), C::FSKind(0)), 0u);
  EXPECT_EQ(
      curve.MergeAndCreateKey(2.0, 4.0, 3.2, 1.0, C::LinearSegment, C::LinearSegment, 0, 0, 0), 0u);
  EXPECT_EQ(curve.RemoveKey(3.0, C::LinearSegment, 1e-9), 0u);
  EXPECT_EQ(curve.RemoveKeys(2.5, 5.0, C::LinearSegment, 0, 0), 0u);
  EXPECT_EQ(Dump(curve), before);

  ZvStdFCurve frozen = stdedit::Mixed();
  frozen.SetReadOnlyConstraint(1);
  const std::string frozenBefore = Dump(frozen);
  EXPECT_EQ(frozen.CreateKey(0.7, 1.0, C::LinearSegment, C::LinearSegment), 0u);
  EXPECT_EQ(frozen.RemoveKey(1.5, C::LinearSegment, 0.0), 0u);
  EXPECT_EQ(frozen.RemoveKeys(0.0, 9.0, C::ConstantSegment, 0, 0), 0u);
  EXPECT_EQ(frozen.MergeAndCreateKey(0.0, 2.0, 1.0, 1.0, C::CubicSegment, C::CubicSegment, 0, 0, 0),
            0u);
  EXPECT_EQ(Dump(frozen), frozenBefore);
}

TEST(StdEditKeys, MergeReplacesTheIntervalWithTheKindsAsked) {
  ZvStdFCurve curve = stdedit::Mixed();
  double at = 3.0;
  curve.SetKeyUserData(at, MakeUID(7), TextBytes("abc"), 3, 0.0);
  ASSERT_EQ(
      curve.MergeAndCreateKey(2.0, 5.0, 3.2, 1.0, C::LinearSegment, C::ConstantSegment, 0, 0, 1),
      1u);
  // 3.0 and 4.5 went, 3.2 came.
  EXPECT_EQ(stdedit::KeyParams(curve), (std::vector<double>{0.0, 1.5, 3.2, 6.0, 7.0, 8.0, 9.5}));
  C::FSKind kind;
  curve.GetSegmentKindAtIndex(1, kind);
  EXPECT_EQ(kind, C::LinearSegment);
  curve.GetSegmentKindAtIndex(2, kind);
  EXPECT_EQ(kind, C::ConstantSegment);
  EXPECT_DOUBLE_EQ(curve.Eval(2.4, 0), (2.4 - 1.5) / (3.2 - 1.5) * (1.0 - 2.0) + 2.0);
  // The nearest removed key handed over its lock flags and its user data.
  EXPECT_EQ(curve.HasUserData(3.2), 1u);
  EXPECT_EQ(curve.HasUserData(3.0), 0u);
}

TEST(StdEditKeys, RemovalLeavesTheKindAskedFor) {
  ZvStdFCurve curve = stdedit::Mixed();
  ASSERT_EQ(curve.RemoveKey(8.0, C::CubicSegment, 1e-9), 1u);
  C::FSKind kind;
  curve.GetSegmentKind(7.0, C::RightSide, kind, 0.0);
  EXPECT_EQ(kind, C::CubicSegment);
  EXPECT_EQ(curve.IsValid(), 1u);
  ASSERT_EQ(curve.RemoveKeys(0.5, 5.0, C::LinearSegment, 0, 0), 1u);
  curve.GetSegmentKindAtIndex(0, kind);
  EXPECT_EQ(kind, C::LinearSegment);
  EXPECT_DOUBLE_EQ(curve.Eval(3.0, 0), 0.0 + 3.0 / 6.0 * (1.0 - 0.0));

  // The only key gone, the curve keeps the kind passed as its first kind.
  ZvStdFCurve single(0.0, C::CubicSegment);
  single.CreateKey(1.0, 2.0);
  ASSERT_EQ(single.RemoveKey(1.0, C::ConstantSegment, 0.0), 1u);
  EXPECT_EQ(single.GetNumKeys(), 0u);
  EXPECT_EQ(single.GetFirstSegmentKind(), C::ConstantSegment);
}

}  // namespace
