// Whole-curve operations: cut and paste, append, mirrored parameters, snapshots, key reduction,
// and the scale and offset of parameters, with the user data that follows the keys.
#include <gtest/gtest.h>

#include <zv/std_fcurve.h>

#include "stdedit_util.h"
#include "uid.h"

#include <algorithm>
#include <cmath>
#include <memory>

namespace {

using stdedit::C;
using stdedit::Dump;
using stdedit::ExpectSameShape;
using stdedit::KeyParams;
using stdedit::Polyline;
using stdedit::Sample;
using stdedit::SetFlag;
using V = std::vector<double>;

void Tag(ZvStdFCurve& curve, double t, unsigned int id) {
  curve.SetKeyUserData(t, MakeUID(id), TextBytes("x"), 1, 0.0);
}

TEST(StdEditWhole, CutClosesTheGapAndPasteRestoresIt) {
  ZvStdFCurve curve = stdedit::Mixed();
  Tag(curve, 3.0, 1);
  Tag(curve, 7.0, 2);
  const std::vector<double> before = Sample(curve, -1.0, 10.0, 1100);
  ZvStdFCurve piece;
  ASSERT_EQ(curve.Cut(2.2, 5.2, piece), 1u);
  EXPECT_EQ(curve.IsValid(), 1u);
  EXPECT_EQ(piece.IsValid(), 1u);
  EXPECT_EQ(KeyParams(piece), (V{2.2, 3.0, 4.5, 5.2}));
  EXPECT_EQ(piece.HasUserData(3.0), 1u);  // the cut key's data went with it
  EXPECT_EQ(curve.HasUserData(4.0), 1u);  // the data of 7 moved left with its key
  // The curve after the cut is the old one shifted left by the width.
  for (double t = 5.3; t < 9.0; t += 0.1)
    EXPECT_NEAR(curve.Eval(t - 3.0, 0), before[static_cast<int>(std::lround((t + 1.0) * 100))],
                1e-9)
        << t;
  ASSERT_EQ(curve.Paste(piece, 2.2, 2.2), 1u);
  EXPECT_EQ(curve.IsValid(), 1u);
  ExpectSameShape(before, Sample(curve, -1.0, 10.0, 1100), 1e-9);
  EXPECT_EQ(curve.HasUserData(3.0), 1u);
  EXPECT_EQ(curve.HasUserData(7.0), 1u);
}

TEST(StdEditWhole, RefusedCutsAndPastesChangeNothing) {
  ZvStdFCurve curve = stdedit::Mixed();
  SetFlag(curve, 7.0, C::ParameterLock, 1);
  const std::string before = Dump(curve);
  ZvStdFCurve piece;
  EXPECT_EQ(curve.Cut(6.5, 7.5, piece), 0u);  // a locked key inside
  EXPECT_EQ(curve.Cut(2.0, 3.0, piece), 0u);  // the locked key would have to move left
  EXPECT_EQ(Dump(curve), before);
  ZvStdFCurve cubic({0, 0}, {0.3, 1}, {0.6, 1}, {1, 0});
  EXPECT_EQ(curve.Paste(cubic, 2.0, 2.0), 0u);  // opening a gap moves the locked key too
  EXPECT_EQ(Dump(curve), before);
  curve.SetReadOnlyConstraint(1);
  const std::string frozen = Dump(curve);
  EXPECT_EQ(curve.Paste(cubic, 8.5, 9.5), 0u);
  EXPECT_EQ(curve.Append(cubic), 0u);
  EXPECT_EQ(curve.MirrorParameters(), 0u);
  EXPECT_EQ(curve.ReduceNumKeys(0.0, 9.0, 1.0), 0u);
  EXPECT_EQ(Dump(curve), frozen);
}

TEST(StdEditWhole, PasteReplacesAnInterval) {
  ZvStdFCurve curve = Polyline({{0, 0}, {10, 10}});
  const ZvStdFCurve bump({0, 0}, {1, 3}, {2, 3}, {3, 0});
  ASSERT_EQ(curve.Paste(bump, 2.0, 6.0), 1u);  // 4 units out, 3 in: the tail moves left by 1
  EXPECT_EQ(curve.IsValid(), 1u);
  EXPECT_EQ(KeyParams(curve), (V{0.0, 2.0, 5.0, 9.0}));
  EXPECT_NEAR(curve.Eval(3.5, 0), bump.Eval(1.5, 0), 1e-12);
  EXPECT_EQ(curve.Eval(2.0, 0), 0.0);  // the bump's first key's right side (value 0)
  EXPECT_EQ(curve.EvalLeft(2.0, 0), 2.0);
}

TEST(StdEditWhole, AppendStartsAtTheLastKey) {
  ZvStdFCurve curve = Polyline({{0, 0}, {1, 1}});
  ZvStdFCurve tail = Polyline({{5, 2}, {6, 3}, {8, 0}});
  Tag(tail, 6.0, 3);
  ASSERT_EQ(curve.Append(tail), 1u);
  EXPECT_EQ(KeyParams(curve), (V{0.0, 1.0, 2.0, 4.0}));
  EXPECT_EQ(curve.EvalLeft(1.0, 0), 1.0);
  EXPECT_EQ(curve.Eval(1.0, 0), 2.0);  // the joined key takes the appended right side
  EXPECT_EQ(curve.Eval(2.0, 0), 3.0);
  EXPECT_EQ(curve.HasUserData(2.0), 1u);
  ZvStdFCurve empty;
  ASSERT_EQ(empty.Append(tail), 1u);
  EXPECT_EQ(empty.GetNumKeys(), 3u);
  EXPECT_EQ(curve.Append(ZvStdFCurve()), 1u);
}

TEST(StdEditWhole, MirroredParametersTurnTheCurveAboutItsMiddle) {
  ZvStdFCurve curve = stdedit::Mixed();
  Tag(curve, 1.5, 4);
  const ZvStdFCurve original = curve;
  ASSERT_EQ(curve.MirrorParameters(), 1u);
  EXPECT_EQ(curve.IsValid(), 1u);
  // Away from the keys, where left and right limits agree.
  for (double t = 0.05; t < 9.5; t += 0.1)
    EXPECT_NEAR(curve.Eval(t, 0), original.Eval(9.5 - t, 0), 1e-9) << t;
  EXPECT_EQ(curve.HasUserData(8.0), 1u);
  EXPECT_EQ(curve.GetFirstSegmentKind(), C::ConstantSegment);  // the old last key's kind
  ASSERT_EQ(curve.MirrorParameters(), 1u);
  EXPECT_EQ(Dump(curve), Dump(original));
  ZvStdFCurve empty;
  EXPECT_EQ(empty.MirrorParameters(), 1u);
}

TEST(StdEditWhole, SnapShotMatchesTheCurveOnItsInterval) {
  ZvStdFCurve curve = stdedit::Mixed();
  // Locks guard the source; the snapshot's copies are still put in place.
  SetFlag(curve, 3.0, C::WholeKeyLock, 1);
  for (int m = 1; m <= 4; ++m) {
    curve.SetExtrapolationMethod(static_cast<C::ExtrapolationMethod>(m));
    const double spans[][2] = {{-3.0, 12.0}, {-3.0, -1.0}, {-2.0, 5.0},   {1.0, 6.0},
                               {10.0, 13.0}, {4.0, 14.0},  {-20.0, 31.0}, {2.0, 2.0}};
    for (const auto& span : spans) {
      std::unique_ptr<ZvBaseFCurve> shot(
          curve.SnapShot(span[1], span[0], C::ConstantExtrapolation));
      ASSERT_NE(shot, nullptr) << m << " " << span[0];
      const ZvStdFCurve& s = dynamic_cast<const ZvStdFCurve&>(*shot);
      EXPECT_EQ(s.IsValid(), 1u);
      EXPECT_EQ(s.GetExtrapolationMethod(), C::ConstantExtrapolation);
      double first, last;
      ASSERT_EQ(s.GetSmallestKeyParameter(first), 1u);
      s.GetLargestKeyParameter(last);
      EXPECT_NEAR(first, span[0], 1e-9);
      EXPECT_NEAR(last, span[1], 1e-9);
      const double w = span[1] - span[0];
      // Within one period beyond the keys the offset method deliberately adds no offset; that
      // is checked below.
      const bool onePeriodAway =
          m == 4 && ((span[0] == -3.0 && span[1] == -1.0) || span[0] == 10.0);
      for (int i = 1; i < 200 && !onePeriodAway; ++i) {
        const double t = span[0] + w * (i + 0.37) / 200.0;
        if (t >= span[1]) break;
        EXPECT_NEAR(s.Eval(t, 0), curve.Eval(t, 0), 1e-9)
            << "method " << m << " span " << span[0] << " at " << t;
      }
    }
  }
  std::unique_ptr<ZvBaseFCurve> folded(curve.SnapShot(-3.0, -1.0, C::ConstantExtrapolation));
  for (double t = -2.9; t < -1.0; t += 0.1)
    EXPECT_NEAR(folded->Eval(t, 0), curve.Eval(t + 9.5, 0), 1e-9) << t;  // the keyed values
  ZvStdFCurve empty(2.5);
  std::unique_ptr<ZvBaseFCurve> shot(empty.SnapShot(0.0, 1.0, C::LinearExtrapolation));
  ASSERT_NE(shot, nullptr);
  EXPECT_EQ(shot->GetNumKeys(), 2u);
  EXPECT_EQ(shot->Eval(0.5, 0), 2.5);
}

TEST(StdEditWhole, ReduceThinsLinesAndRefitsCubics) {
  ZvStdFCurve lines = Polyline({{0, 0},
                                {1, 2},
                                {2, 4},
                                {3, 6},
                                {4, 8},
                                {5, 10},
                                {6, 10},
                                {7, 10},
                                {8, 10},
                                {9, 10},
                                {10, 10}});
  ASSERT_EQ(lines.ReduceNumKeys(0.0, 10.0, 0.0), 1u);
  EXPECT_EQ(lines.GetNumKeys(), 3u);  // the corner at 5 stays
  EXPECT_EQ(lines.Eval(2.5, 0), 5.0);

  // A cubic run: many keys on one smooth curve reduce to few, within the tolerance at the keys.
  ZvPoint2dArray points(64);
  for (int i = 0; i <= 60; ++i)
    points.Add({i * 0.1, std::sin(i * 0.1)});
  ZvStdFCurve dense(points, ZvStdFCurve::DPCatmullRom, 0.0, C::CubicSegment, C::CubicSegment);
  // A part of the range first: the keys after it stay exactly where they were.
  ZvStdFCurve part = dense;
  ASSERT_EQ(part.ReduceNumKeys(0.0, 2.95, 1e-3), 1u);
  const V was = KeyParams(dense), now = KeyParams(part);
  ASSERT_LT(now.size(), was.size());
  EXPECT_TRUE(std::equal(was.end() - 31, was.end(), now.end() - 31));
  SetFlag(dense, 3.0, C::ValueLock, 1);
  ASSERT_EQ(dense.ReduceNumKeys(0.0, 6.0, 1e-3), 1u);
  EXPECT_LT(dense.GetNumKeys(), 30u);
  EXPECT_EQ(dense.IsKeyParameter(3.0, 1e-12), 1u);  // a locked key stays
  EXPECT_EQ(dense.IsValid(), 1u);
  for (int i = 0; i <= 60; ++i)
    EXPECT_NEAR(dense.Eval(i * 0.1, 0), std::sin(i * 0.1), 2e-3) << i;
}

TEST(StdEditWhole, ScaleAndOffsetOfAllKeys) {
  ZvStdFCurve curve = stdedit::Mixed();
  const ZvStdFCurve original = curve;
  ASSERT_EQ(curve.ScaleAndOffsetParameters(-1.0, 20.0, 1.0, 2.0, 0.5, 0, 0, C::RightHandle), 1u);
  for (double t = 0.05; t < 9.5; t += 0.1)
    EXPECT_NEAR(curve.Eval((t - 1.0) * 2.0 + 1.0 + 0.5, 0), original.Eval(t, 0), 1e-9) << t;
  curve = original;
  ASSERT_EQ(curve.ScaleAndOffsetParameters(-1.0, 20.0, 1.0, -1.0, 0.0, 0, 0, C::RightHandle), 1u);
  for (double t = 0.05; t < 9.5; t += 0.1)
    EXPECT_NEAR(curve.Eval(2.0 - t, 0), original.Eval(t, 0), 1e-9) << t;
  // Refusals and no-ops leave the curve as it was.
  curve = original;
  const std::string before = Dump(curve);
  EXPECT_EQ(curve.ScaleAndOffsetParameters(0.0, 9.5, 2.0, 0.0, 1.0, 1, 0, C::RightHandle), 0u);
  EXPECT_EQ(curve.ScaleAndOffsetParameters(2.0, 5.0, 2.0, 1.0, 0.0, 1, 0, C::RightHandle), 1u);
  SetFlag(curve, 3.0, C::ParameterLock, 1);
  EXPECT_EQ(curve.ScaleAndOffsetParameters(-1.0, 20.0, 1.0, 2.0, 0.0, 0, 0, C::RightHandle), 0u);
  EXPECT_EQ(curve.ScaleAndOffsetParameters(2.0, 5.0, 2.0, 2.0, 0.0, 0, 0, C::RightHandle), 0u);
  SetFlag(curve, 3.0, C::ParameterLock, 0);
  EXPECT_EQ(Dump(curve), before);
}

}  // namespace
