// Segment kinds read and set by index and by parameter, uniform kinds, and segments appended
// after the last key.
#include <gtest/gtest.h>

#include <zv/std_fcurve.h>

#include "stdedit_util.h"
#include "uid.h"

namespace {

using stdedit::C;
using stdedit::Dump;
using stdedit::KeyParams;
using V = std::vector<double>;

TEST(StdEditSegments, KindsByIndexAndParameter) {
  ZvStdFCurve curve = stdedit::Mixed();
  ZvUByteArray kinds(8);
  ASSERT_EQ(curve.GetSegmentKinds(kinds), 8u);
  const unsigned char expected[] = {3, 3, 3, 3, 2, 1, 2, 1};
  for (unsigned int i = 0; i < 8; ++i)
    EXPECT_EQ(kinds[i], expected[i]) << i;
  EXPECT_EQ(curve.GetSegmentKindAtParameter(-1.0), C::CubicSegment);  // the first kind
  EXPECT_EQ(curve.GetSegmentKindAtParameter(7.5), C::ConstantSegment);
  EXPECT_EQ(curve.GetSegmentKindAtParameter(8.0), C::LinearSegment);  // the key's own segment
  C::FSKind kind;
  EXPECT_EQ(curve.GetSegmentKindAtIndex(8, kind), 0u);

  // A linear segment made cubic gets handles that keep it a function.
  ASSERT_EQ(curve.SetSegmentKindAtParameter(8.5, C::CubicSegment), 1u);
  EXPECT_EQ(curve.GetSegmentKindAtParameter(8.0), C::CubicSegment);
  EXPECT_EQ(curve.IsValid(), 1u);
  ASSERT_EQ(curve.SetSegmentKindAtParameter(-5.0, C::LinearSegment), 1u);
  EXPECT_EQ(curve.GetFirstSegmentKind(), C::LinearSegment);
  ASSERT_EQ(curve.SetSegmentKindAtIndex(0, C::ConstantSegment), 1u);
  EXPECT_EQ(curve.Eval(1.0, 0), 0.0);
  const std::string before = Dump(curve);
  EXPECT_EQ(curve.SetSegmentKindAtIndex(9, C::ConstantSegment), 0u);
  EXPECT_EQ(curve.SetSegmentKindAtIndex(0, C::FSKind(4)), 0u);
  curve.SetReadOnlyConstraint(1);
  EXPECT_EQ(curve.SetSegmentKindAtParameter(2.0, C::LinearSegment), 0u);
  EXPECT_EQ(curve.ConvertToUniformSegmentKind(C::LinearSegment), 0u);
  curve.SetReadOnlyConstraint(0);
  EXPECT_EQ(Dump(curve), before);
}

TEST(StdEditSegments, UniformKinds) {
  ZvStdFCurve curve = stdedit::Mixed();
  C::FSKind kind;
  EXPECT_EQ(curve.HasUniformSegmentKind(kind), 0u);
  ASSERT_EQ(curve.ConvertToUniformSegmentKind(C::LinearSegment), 1u);
  ASSERT_EQ(curve.HasUniformSegmentKind(kind), 1u);
  EXPECT_EQ(kind, C::LinearSegment);
  EXPECT_EQ(curve.GetFirstSegmentKind(), C::LinearSegment);
  EXPECT_DOUBLE_EQ(curve.Eval(0.75, 0), 1.0);
  ASSERT_EQ(curve.ConvertToUniformSegmentKind(C::CubicSegment), 1u);
  EXPECT_EQ(curve.IsValid(), 1u);
  // Already uniform: success even on a read-only curve, as nothing changes.
  curve.SetReadOnlyConstraint(1);
  EXPECT_EQ(curve.ConvertToUniformSegmentKind(C::CubicSegment), 1u);
}

TEST(StdEditSegments, AppendedSegments) {
  ZvStdFCurve curve(0.0, C::CubicSegment);
  EXPECT_EQ(curve.AppendLinearSegment({1.0, 1.0}), 0u);  // needs a key to start from
  curve.CreateKey(0.0, 1.0);
  ASSERT_EQ(curve.AppendConstantSegment({1.0, 3.0}), 1u);
  EXPECT_EQ(curve.Eval(0.99, 0), 1.0);
  EXPECT_EQ(curve.Eval(1.0, 0), 3.0);
  ASSERT_EQ(curve.AppendLinearSegment({2.0, 5.0}), 1u);
  EXPECT_DOUBLE_EQ(curve.Eval(1.5, 0), 4.0);
  EXPECT_EQ(curve.AppendLinearSegment({2.0, 6.0}), 0u);  // not right of the last key
  // Folding handles are refused; valid ones make a cubic with continuity at the old last key.
  EXPECT_EQ(curve.AppendBezierCubicSegment({3.5, 5.0}, {2.5, 5.0}, {3.0, 4.0}), 0u);
  ASSERT_EQ(curve.AppendBezierCubicSegment({2.3, 5.9}, {2.7, 4.0}, {3.0, 4.0}), 1u);
  EXPECT_EQ(curve.IsValid(), 1u);
  EXPECT_EQ(curve.GetNumKeys(), 4u);
  EXPECT_EQ(curve.Eval(3.0, 0), 4.0);
}

TEST(StdEditSegments, ExtendingALineMovesItsLastKey) {
  ZvStdFCurve curve(0.0, C::LinearSegment);
  curve.CreateKey(0.0, 0.0);
  curve.AppendLinearSegment({1.0, 2.0});
  double at = 1.0;
  curve.SetKeyUserData(at, MakeUID(1), TextBytes("k"), 1, 0.0);
  ASSERT_EQ(curve.AppendOrExtendLinearSegment({2.0, 4.05}, 0.1), 1u);
  EXPECT_EQ(KeyParams(curve), (V{0.0, 2.0}));
  EXPECT_EQ(curve.Eval(2.0, 0), 4.0);  // on the line, not at the point
  EXPECT_EQ(curve.HasUserData(2.0), 1u);
  EXPECT_EQ(curve.HasUserData(1.0), 0u);
  // Off the line: a new key.
  ASSERT_EQ(curve.AppendOrExtendLinearSegment({3.0, 0.0}, 0.1), 1u);
  EXPECT_EQ(KeyParams(curve), (V{0.0, 2.0, 3.0}));
  // A parameter-locked last key stays, and that is still a success.
  stdedit::SetFlag(curve, 3.0, C::ParameterLock, 1);
  ASSERT_EQ(curve.AppendOrExtendLinearSegment({4.0, -4.0}, 0.1), 1u);
  EXPECT_EQ(KeyParams(curve), (V{0.0, 2.0, 3.0}));
  EXPECT_EQ(curve.Eval(3.0, 0), -4.0);  // the value moved, the key did not
}

}  // namespace
