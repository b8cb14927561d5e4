// Flattening of the standard curve for display, clamping of the polyline, and the sampling that
// reads the flattened polyline.
#include <gtest/gtest.h>

#include <zv/std_fcurve.h>
#include <zv/transfo4.h>

#include "stdedit_util.h"

#include <cfloat>
#include <cmath>
#include <vector>

namespace {

using stdedit::C;
using V = std::vector<double>;

struct Polyline {
  ZvPoint2dArray points{16};
  ZvPointTagArray tags{16};
  ZvBoolArray flags{16};
};

// Every point within the box widened by `slack` (the rounding a clip may leave).
void ExpectInside(const ZvPoint2dArray& p, const ZvExtent2<double>& box, double slack) {
  for (unsigned int i = 0; i < p.size; ++i) {
    EXPECT_TRUE(p[i].x >= box.xmin - slack && p[i].x <= box.xmax + slack) << i << ": " << p[i].x;
    EXPECT_TRUE(p[i].y >= box.ymin - slack && p[i].y <= box.ymax + slack) << i << ": " << p[i].y;
  }
}

// Every edge of every run lies on the curve: slanted edges within `tol` of the curve at their
// middle, vertical edges only at keys or period boundaries where the curve jumps.
void ExpectOnCurve(const ZvStdFCurve& curve, const ZvPoint2dArray& p, const ZvPointTagArray& tags,
                   double tol, double period = 0.0, double origin = 0.0) {
  ASSERT_GT(p.size, 1u);
  EXPECT_EQ(tags[0], ZvPointTag_First);
  EXPECT_EQ(tags[tags.size - 1], ZvPointTag_Last);
  for (unsigned int i = 0; i + 1 < p.size; ++i) {
    if (tags[i] == ZvPointTag_Last) {
      EXPECT_EQ(tags[i + 1], ZvPointTag_First) << i;
      continue;
    }
    if (i > 0) {
      EXPECT_NE(tags[i], ZvPointTag_First) << i;
    }
    if (p[i].x == p[i + 1].x) {
      const double x = p[i].x;
      double folded = period > 0.0 ? x - period * std::floor((x - origin) / period + 1e-9) : x;
      EXPECT_EQ(curve.IsKeyParameter(folded, 1e-9), 1u) << "vertical edge away from a key at " << x;
      continue;
    }
    ASSERT_LT(p[i].x, p[i + 1].x) << i;
    const double mx = 0.5 * (p[i].x + p[i + 1].x);
    EXPECT_NEAR(0.5 * (p[i].y + p[i + 1].y), curve.Eval(mx, 0), tol) << "edge " << i;
  }
}

TEST(StdEditFlatten, WholeCurveFollowsEverySegmentKind) {
  const ZvStdFCurve curve = stdedit::Mixed();
  Polyline out;
  ASSERT_EQ(curve.Flatten(ZvTransfo4(), 0.001, out.points, out.tags, 0), 1u);
  ExpectOnCurve(curve, out.points, out.tags, 0.002);
  EXPECT_EQ(out.points[0].x, 0.0);
  EXPECT_EQ(out.points[out.points.size - 1].x, 9.5);
  // The step from 7 holds 4 up to 8, where the key's right value 0.5 takes over.
  bool stepFound = false, jumpFound = false;
  for (unsigned int i = 0; i + 1 < out.points.size; ++i) {
    if (out.points[i].x == 8.0 && out.points[i + 1].x == 8.0) {
      if (out.points[i].y == 4.0 && out.points[i + 1].y == 0.5) stepFound = true;
      jumpFound = true;
    }
  }
  EXPECT_TRUE(jumpFound);
  EXPECT_TRUE(stepFound) << "the step's value carries to the next key and jumps once there";
}

TEST(StdEditFlatten, TransformedPointsMapBackOntoTheCurve) {
  const ZvStdFCurve curve = stdedit::Mixed();
  ZvTransfo4 view;
  view.Translate(5.0, 300.0, 0.0).Scale(40.0, -25.0, 1.0);  // screen: Y grows downward
  Polyline out;
  ASSERT_EQ(curve.Flatten(view, 0.25, out.points, out.tags, 0), 1u);
  ZvTransfo4 back;
  ASSERT_EQ(view.Inverse(back), 1);
  back.MapInPlace(out.points.data, out.points.size);
  // 0.25 pixels at 25 pixels per unit.
  ExpectOnCurve(curve, out.points, out.tags, 0.25 / 25.0 * 2.0);
}

TEST(StdEditFlatten, EmptyCurveIsAHorizontalPieceAndOneKeyItsStep) {
  const ZvStdFCurve curves[] = {ZvStdFCurve(2.0, 1.0, 3.0, C::CubicSegment, C::CubicSegment),
                                ZvStdFCurve(3.5)};
  const V expected[] = {{1.0, 3.0}, {3.5, 3.5}};
  for (int i = 0; i < 2; ++i) {
    Polyline out;
    ASSERT_EQ(curves[i].Flatten(ZvTransfo4(), 0.1, out.points, out.tags, 0), 1u);
    ASSERT_EQ(out.points.size, 2u);
    EXPECT_EQ((V{out.points[0].y, out.points[1].y}), expected[i]) << i;
    EXPECT_EQ(out.tags[1], ZvPointTag_Last);
  }
}

TEST(StdEditFlatten, ClampingCutsRunsAtTheLimits) {
  ZvStdFCurve curve = stdedit::Mixed();
  ASSERT_EQ(curve.SetClampingValues(-0.5, 2.5), 1u);
  Polyline out;
  ASSERT_EQ(curve.Flatten(ZvTransfo4(), 0.001, out.points, out.tags, 1), 1u);
  int runs = 0, atLimit = 0;
  ExpectInside(out.points, ZvExtent2<double>(-1e300, -0.5, 1e300, 2.5), 0.0);
  for (unsigned int i = 0; i < out.points.size; ++i) {
    if (out.points[i].y == -0.5 || out.points[i].y == 2.5) ++atLimit;
    if (out.tags[i] == ZvPointTag_First) ++runs;
  }
  EXPECT_GT(runs, 2);  // the curve leaves the band several times
  EXPECT_GE(atLimit, 2 * (runs - 1));
  EXPECT_EQ(out.tags[out.tags.size - 1], ZvPointTag_Last);

  // A transform that flips Y swaps the mapped limits, and the clip still keeps the band.
  ZvTransfo4 flip;
  flip.Scale(1.0, -2.0, 1.0);
  Polyline flipped;
  ASSERT_EQ(curve.Flatten(flip, 0.001, flipped.points, flipped.tags, 1), 1u);
  ExpectInside(flipped.points, ZvExtent2<double>(-1e300, -5.0, 1e300, 1.0), 0.0);
}

TEST(StdEditFlatten, BoxClipsAndExtrapolates) {
  ZvStdFCurve curve = stdedit::Mixed();
  const ZvExtent2<double> box(-4.0, -1.5, 14.0, 3.5);
  for (int m = 1; m <= 4; ++m) {
    curve.SetExtrapolationMethod(static_cast<C::ExtrapolationMethod>(m));
    Polyline out;
    ASSERT_EQ(curve.FlattenFromTo(box, ZvTransfo4(), 0.001, out.points, out.tags, out.flags, 0),
              1u);
    ASSERT_EQ(out.flags.size, out.points.size);
    ExpectInside(out.points, box, 1e-9);
    // Edges wholly inside the box follow the extrapolated curve.
    const bool cycles = m >= 3;
    for (unsigned int i = 0; i + 1 < out.points.size; ++i) {
      if (out.tags[i] == ZvPointTag_Last || out.points[i].x == out.points[i + 1].x) continue;
      const double mx = 0.5 * (out.points[i].x + out.points[i + 1].x);
      const double y = curve.Eval(mx, 0);
      if (y < -1.5 || y > 3.5) continue;
      EXPECT_NEAR(0.5 * (out.points[i].y + out.points[i + 1].y), y, 0.01)
          << "method " << m << " at " << mx;
    }
    EXPECT_LE(out.points[0].x, -3.0) << "method " << m;
    EXPECT_GE(out.points[out.points.size - 1].x, cycles ? 13.0 : 13.99) << "method " << m;
  }
}

TEST(StdEditFlatten, BoxInViewSpaceSelectsTheParameters) {
  const ZvStdFCurve curve = stdedit::Mixed();
  ZvTransfo4 view;
  view.Scale(100.0, 10.0, 1.0);
  Polyline out;
  const ZvExtent2<double> box(200.0, -100.0, 500.0, 100.0);  // parameters 2 to 5
  ASSERT_EQ(curve.FlattenFromTo(box, view, 0.25, out.points, out.tags, out.flags, 0), 1u);
  EXPECT_DOUBLE_EQ(out.points[0].x, 200.0);
  EXPECT_DOUBLE_EQ(out.points[out.points.size - 1].x, 500.0);
  EXPECT_NEAR(out.points[0].y, 10.0 * curve.Eval(2.0, 0), 1e-9);

  ZvExtent2<double> empty;
  Polyline none;
  EXPECT_EQ(curve.FlattenFromTo(empty, view, 0.25, none.points, none.tags, none.flags, 0), 1u);
  EXPECT_EQ(none.points.size, 0u);
  ZvTransfo4 singular;
  singular.Scale(0.0, 1.0, 1.0);
  EXPECT_EQ(curve.FlattenFromTo(box, singular, 0.25, none.points, none.tags, none.flags, 0), 0u);
  // Far more periods than a view can show are refused rather than drawn.
  ZvStdFCurve cyc = stdedit::Mixed();
  cyc.SetExtrapolationMethod(C::CycleExtrapolation);
  const ZvExtent2<double> huge(-1e12, -10.0, 1e12, 10.0);
  EXPECT_EQ(cyc.FlattenFromTo(huge, ZvTransfo4(), 0.25, none.points, none.tags, none.flags, 0), 0u);
  EXPECT_EQ(none.points.size, 0u);
}

TEST(StdEditFlatten, ARotatedViewShowsTheParametersUnderItsBox) {
  const ZvStdFCurve curve = stdedit::Mixed();
  ZvTransfo4 view;
  view.Rotate(30.0, 0.0, 0.0, 1.0);
  const ZvExtent2<double> box(-3.0, -3.0, 3.0, 3.0);
  Polyline out;
  ASSERT_EQ(curve.FlattenFromTo(box, view, 0.01, out.points, out.tags, out.flags, 0), 1u);
  ASSERT_GT(out.points.size, 10u);
  ZvTransfo4 back;
  ASSERT_EQ(view.Inverse(back), 1);
  double lowest = 1e9, highest = -1e9;
  ExpectInside(out.points, box, 1e-9);
  for (unsigned int i = 0; i < out.points.size; ++i) {
    const ZvPoint2<double> q = back.Map(out.points[i]);
    lowest = q.x < lowest ? q.x : lowest;
    highest = q.x > highest ? q.x : highest;
  }
  // The box's corners reach parameters beyond 0 on the left; the curve is drawn there too.
  EXPECT_LT(lowest, -0.5);
  EXPECT_GT(highest, 1.0);
}

TEST(StdEditFlatten, SequenceMatchesEvalUnderEveryMethod) {
  ZvStdFCurve curve = stdedit::Mixed();
  for (int m = 1; m <= 4; ++m) {
    curve.SetExtrapolationMethod(static_cast<C::ExtrapolationMethod>(m));
    ZvDoubleArray t(8), v(8);
    // A step exact in binary lands on the keys and on the period boundaries.
    const unsigned int n = curve.EvalSequence(-12.0, 25.0, 0.125, 0.0005, t, v, 0);
    ASSERT_EQ(n, t.size);
    ASSERT_EQ(n, v.size);
    EXPECT_EQ(n, 297u);
    EXPECT_EQ(t[n - 1], 25.0);
    for (unsigned int i = 0; i < n; ++i)
      EXPECT_NEAR(v[i], curve.Eval(t[i], 0), 2e-3) << "method " << m << " at " << t[i];
    // Parameters a hair off the keys read the key, as Eval snaps them.
    ASSERT_GT(curve.EvalSequence(-9.5 + 3e-14, 8.0 - 4e-14, 0.1, 0.0005, t, v, 0), 2u);
    EXPECT_NEAR(v[0], curve.Eval(-9.5, 0), 1e-9) << "method " << m;
  }
}

TEST(StdEditFlatten, LongSequencesStreamThroughTheFlattening) {
  // Far more polyline points than one buffer holds, with jumps among the cubics.
  ZvStdFCurve curve;
  for (int i = 0; i < 300; ++i)
    curve.CreateKey(i * 0.5, std::sin(i * 0.7) * 4.0);
  for (int i = 10; i < 300; i += 37)
    curve.SetKeyValue(i * 0.5, C::RightSide, 9.0, 0.0);
  ZvDoubleArray t(8), v(8);
  const unsigned int n = curve.EvalSequence(0.0, 149.5, 0.0625, 1e-4, t, v, 0);
  ASSERT_EQ(n, 2393u);
  for (unsigned int i = 0; i < n; ++i)
    EXPECT_NEAR(v[i], curve.Eval(t[i], 0), 5e-4) << t[i];
}

TEST(StdEditFlatten, SequenceIsRightContinuousAtJumpsAndClamps) {
  ZvStdFCurve curve = stdedit::Mixed();
  ZvDoubleArray t(8), v(8);
  ASSERT_EQ(curve.EvalSequence(7.0, 9.0, 0.5, 0.01, t, v, 0), 5u);
  EXPECT_EQ(v[0], 4.0);  // on the step's key
  EXPECT_EQ(v[2], 0.5);  // at 8: the right value, after both jumps
  curve.SetClampingValues(0.0, 1.0);
  ASSERT_EQ(curve.EvalSequence(7.0, 9.0, 0.5, 0.01, t, v, 1), 5u);
  EXPECT_EQ(v[0], 1.0);
  EXPECT_EQ(v[2], 0.5);
  // One sample when the ends meet; a step that never advances is refused.
  ASSERT_EQ(curve.EvalSequence(3.0, 3.0, 0.5, 0.01, t, v, 0), 1u);
  EXPECT_DOUBLE_EQ(v[0], curve.Eval(3.0, 0));
  EXPECT_EQ(curve.EvalSequence(0.0, 1.0, 0.0, 0.01, t, v, 0), 0u);
  EXPECT_EQ(curve.EvalSequence(0.0, 1.0, -1.0, 0.01, t, v, 0), 0u);
  EXPECT_EQ(curve.EvalSequence(0.0, NAN, 0.1, 0.01, t, v, 0), 0u);
}

}  // namespace
