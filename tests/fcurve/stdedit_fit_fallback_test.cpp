// A cubic fit that cannot run falls back to one cubic along the chord.
#include <gtest/gtest.h>

#include <zv/std_fcurve.h>

#include "stdedit_util.h"

#include <cmath>

namespace {

using stdedit::C;

// A negative tolerance is refused by the spline fit; it once counted as 0 and put a key on
// every point.
TEST(StdEditFitFallback, NegativeToleranceGivesOneChordCubic) {
  ZvPoint2dArray p(64);
  for (int i = 0; i <= 40; ++i)
    p.Add({i * 0.25, std::sin(i * 0.25) * 3.0});
  const ZvStdFCurve curve(p, ZvStdFCurve::DPCubicFitG1, -0.5, C::CubicSegment, C::LinearSegment);
  ASSERT_EQ(stdedit::KeyParams(curve), (std::vector<double>{0.0, 10.0}));
  const ZvPoint2<double> a = p[0], b = p[p.size - 1];
  ZvPoint2<double> l, r;
  curve.GetActualKeyTgtHandles(a.x, l, r, 0.0);
  EXPECT_NEAR(r.x, (b.x - a.x) / 3.0, 1e-12);
  EXPECT_NEAR(r.y, (b.y - a.y) / 3.0, 1e-12);
  curve.GetActualKeyTgtHandles(b.x, l, r, 0.0);
  EXPECT_NEAR(l.x, -(b.x - a.x) / 3.0, 1e-12);
  EXPECT_NEAR(l.y, -(b.y - a.y) / 3.0, 1e-12);
  for (double t = 0.0; t <= 10.0; t += 0.5)  // handles at the thirds: the chord itself
    EXPECT_NEAR(curve.Eval(t, 0), a.y + (t - a.x) * (b.y - a.y) / (b.x - a.x), 1e-9) << t;
  C::FSKind kind;
  curve.GetSegmentKindAtIndex(1, kind);
  EXPECT_EQ(kind, C::LinearSegment);
  // A tolerance of 0 is a real request: it keeps every point.
  const ZvStdFCurve exact(p, ZvStdFCurve::DPCubicFitG1, 0.0, C::CubicSegment, C::CubicSegment);
  for (unsigned int i = 0; i < p.size; ++i)
    EXPECT_NEAR(exact.Eval(p[i].x, 0), p[i].y, 1e-9) << i;
}

}  // namespace
