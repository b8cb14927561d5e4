// Tangent continuity and length locks, unification without the tangent mover, freezing of
// evaluated handles, and constraints by index.
#include <gtest/gtest.h>

#include <zv/std_fcurve.h>

#include "stdedit_util.h"

namespace {

using stdedit::C;
using stdedit::Dump;
using stdedit::HasFlag;
using stdedit::SetFlag;

// Three cubic keys; the middle one has a kink.
ZvStdFCurve Kinked() {
  ZvStdFCurve curve;
  curve.CreateKey(0.0, 0.0);
  curve.CreateKey(3.0, 3.0);
  curve.CreateKey(6.0, 0.0);
  double at = 3.0;
  curve.UnlockTangentContinuity(at, 0.0);
  curve.SetKeyTgtHandles(3.0, {-1.0, -1.0}, {1.0, -0.5}, 0.0);
  return curve;
}

TEST(StdEditTangents, ContinuityNeedsCollinearHandlesBetweenCubics) {
  ZvStdFCurve curve = Kinked();
  double at = 3.0 + 1e-4;
  EXPECT_EQ(curve.IsTangentContinuityLocked(at, 1e-3), 0u);
  EXPECT_EQ(at, 3.0);  // the key's parameter is written back
  EXPECT_EQ(curve.LockTangentContinuity(at, 0.0), 0u);
  curve.SetKeyTgtHandle(3.0, C::RightSide, {1.0, 1.0}, 0.0);
  EXPECT_EQ(curve.UnifyAndLockTangentContinuity(at, C::LeftSide, 0.0), 1u);
  EXPECT_EQ(curve.IsTangentContinuityLocked(at, 0.0), 1u);
  EXPECT_EQ(curve.UnifyAndLockTangentContinuity(at, C::LeftSide, 0.0), 0u);  // nothing to do
  EXPECT_EQ(curve.LockTangentContinuity(at, 0.0), 1u);                       // already set

  // Between two linear segments any handles may be locked together.
  ZvStdFCurve lines = Kinked();
  lines.ConvertToUniformSegmentKind(C::LinearSegment);
  at = 3.0;
  lines.UnlockTangentContinuity(at, 0.0);
  EXPECT_EQ(lines.LockTangentContinuity(at, 0.0), 1u);

  // Locked tangents and read-only curves refuse.
  ZvStdFCurve locked = Kinked();
  SetFlag(locked, 3.0, C::TangentDirectionLock, 1);
  EXPECT_EQ(locked.UnifyAndLockTangentContinuity(at, C::LeftSide, 0.0), 0u);
  locked.SetReadOnlyConstraint(1);
  const std::string before = Dump(locked);
  EXPECT_EQ(locked.LockTangentContinuity(at, 0.0), 0u);
  EXPECT_EQ(locked.UnlockTangentContinuity(at, 0.0), 0u);
  EXPECT_EQ(locked.LockTangentLengthContinuity(at, 0.0, 1.0), 0u);
  EXPECT_EQ(locked.FreezeAllTangents(C::AutoTangent), 0u);
  EXPECT_EQ(Dump(locked), before);
}

TEST(StdEditTangents, LengthContinuityComparesVisualLengths) {
  ZvStdFCurve curve = Kinked();  // handles (-1,-1) and (1,-0.5)
  double at = 3.0;
  EXPECT_EQ(curve.LockTangentLengthContinuity(at, 0.0, 1.0), 0u);
  // Mirror-image handles have the same length whatever the aspect.
  curve.SetKeyTgtHandle(3.0, C::RightSide, {1.0, -1.0}, 0.0);
  EXPECT_EQ(curve.LockTangentLengthContinuity(at, 0.0, 3.0), 1u);
  EXPECT_EQ(curve.IsTangentLengthContinuityLocked(at, 0.0), 1u);
  EXPECT_EQ(curve.UnlockTangentLengthContinuity(at, 0.0), 1u);
  curve.SetKeyTgtHandle(3.0, C::RightSide, {1.0, 1.0}, 0.0);
  EXPECT_EQ(curve.UnifyAndLockTangentLengthContinuity(at, C::LeftSide, 0.0, 1.0), 1u);
  curve.SetConstraint(at, C::TangentLengthLock, 1, 0.0);
  EXPECT_EQ(curve.AreAnyTgtLengthsLockedInInterval(2.0, 4.0, 0, 0), 1u);
  EXPECT_EQ(curve.AreAnyTgtLengthsLockedInInterval(3.0, 4.0, 1, 0), 0u);
  EXPECT_EQ(curve.AreAnyTgtDirectionsLockedInInterval(0.0, 6.0, 0, 0), 0u);
}

TEST(StdEditTangents, FreezingKeepsTheShapeAndDropsAutomaticHandles) {
  ZvStdFCurve curve = stdedit::Mixed();
  for (double t : {1.5, 3.0, 4.5})
    SetFlag(curve, t, C::AutoTangent, 1);
  SetFlag(curve, 6.0, C::FlatTangent, 1);
  const std::vector<double> before = stdedit::Sample(curve, -1.0, 10.0, 500);
  ASSERT_EQ(curve.FreezeTangentsInInterval(1.5, 4.5, 0, 0, C::AutoTangent), 1u);
  stdedit::ExpectSameShape(before, stdedit::Sample(curve, -1.0, 10.0, 500), 1e-12);
  for (double t : {1.5, 3.0, 4.5})
    EXPECT_EQ(HasFlag(curve, t, C::AutoTangent), 0) << t;
  // Freezing the flat key without clearing its flag keeps the flag; then clearing it through
  // FreezeAll keeps the shape too.
  ASSERT_EQ(curve.FreezeAllTangents(C::FlatTangent), 1u);
  stdedit::ExpectSameShape(before, stdedit::Sample(curve, -1.0, 10.0, 500), 1e-12);
  EXPECT_EQ(HasFlag(curve, 6.0, C::FlatTangent), 0);
  ZvStdFCurve empty;
  EXPECT_EQ(empty.FreezeAllTangents(C::AutoTangent), 0u);
}

TEST(StdEditTangents, ExcludedEndsFreezeOnlyTheInwardHandle) {
  ZvStdFCurve curve = stdedit::Mixed();
  SetFlag(curve, 3.0, C::AutoTangent, 1);
  ZvPoint2<double> leftBefore, rightBefore, left, right;
  curve.GetActualKeyTgtHandles(3.0, leftBefore, rightBefore, 0.0);
  ZvPoint2<double> evalLeft, evalRight;
  curve.GetEvaluatedKeyTgtHandles(3.0, evalLeft, evalRight, 0.0);
  ASSERT_EQ(curve.FreezeTangentsInInterval(3.0, 6.0, 1, 0, C::KeyConstraint(0)), 1u);
  curve.GetActualKeyTgtHandles(3.0, left, right, 0.0);
  EXPECT_EQ(left.x, leftBefore.x);
  EXPECT_EQ(left.y, leftBefore.y);
  EXPECT_NEAR(right.x, evalRight.x, 1e-15);
  EXPECT_NEAR(right.y, evalRight.y, 1e-15);
}

TEST(StdEditTangents, AdjustingAutomaticNeighboursKeepsTheirShape) {
  ZvStdFCurve curve = stdedit::Mixed();
  for (double t : {1.5, 3.0, 4.5})
    SetFlag(curve, t, C::AutoTangent, 1);
  const std::vector<double> before = stdedit::Sample(curve, 0.0, 6.0, 300);
  ASSERT_EQ(curve.AdjustAdjacentAutomaticKeysTangents(3.0), 1u);
  ZvPoint2<double> actualL, actualR, evalL, evalR;
  for (double t : {1.5, 3.0, 4.5}) {
    curve.GetActualKeyTgtHandles(t, actualL, actualR, 0.0);
    curve.GetEvaluatedKeyTgtHandles(t, evalL, evalR, 0.0);
    EXPECT_NEAR(actualR.y, evalR.y, 1e-12) << t;
    EXPECT_EQ(HasFlag(curve, t, C::AutoTangent), 1) << t;
    SetFlag(curve, t, C::AutoTangent, 0);
  }
  // With the flags gone the shape stays.
  stdedit::ExpectSameShape(before, stdedit::Sample(curve, 0.0, 6.0, 300), 1e-12);
  EXPECT_EQ(curve.AdjustAdjacentAutomaticKeysTangents(3.3), 0u);
}

}  // namespace
