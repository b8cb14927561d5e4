// Point location on cubics, with its squared-against-plain distance comparisons.
#include <gtest/gtest.h>
#include <zv/bezier_tool.h>

#include "cubic_eval.h"

namespace {

using P2 = ZvPoint2<double>;
using P3 = ZvPoint3<double>;

struct Located {
  int found;
  double d2 = -1.0;  // sentinels: untouched on failure
  double t = -2.0;
};

Located Locate2d(const P2* p, double tolerance, const P2& q, double distance) {
  Located r;
  r.found = ZvBezierTool_LocatePoint2d(p, tolerance, q, distance, r.d2, r.t);
  return r;
}

void ExpectUntouched(const Located& r) {
  EXPECT_TRUE(r.found == 0 && r.d2 == -1.0 && r.t == -2.0) << r.found << " " << r.d2 << " " << r.t;
}

TEST(LocatePoint2d, FindsParametersOfPointsOnASubdividedCurve) {
  // |D| is about 4804: depth 4 at tolerance 0.25, so the piece box tests come into play.
  const P2 p[4] = {{0, 0}, {300, 900}, {700, -600}, {1000, 300}};
  for (double t : {0.0, 0.1, 0.37, 0.5, 0.83, 1.0}) {
    SCOPED_TRACE(t);
    const Located r = Locate2d(p, 0.25, EvalCubic(p, t), 1.0);
    EXPECT_EQ(r.found, 1);
    EXPECT_NEAR(r.t, t, 1e-3);
    EXPECT_LE(r.d2, 0.25 * 0.25);
  }
  // Beyond `distance` from the control box: rejected before any search.
  ExpectUntouched(Locate2d(p, 0.25, {-2, 500}, 1.0));
}

// An arch with |D| = 20 and deviation 4: at tolerance 3 it is walked in two steps, so its apex
// (5, 3) is a vertex; the control box reaches y = 4.
const P2 kArch[4] = {{0, 0}, {0, 4}, {10, 4}, {10, 0}};

TEST(LocatePoint2d, ComparesSquaredDistanceWithPlainDistance) {
  // 0.9 from the curve, yet accepted at distance 0.85, because 0.81 <= 0.85.
  const Located near = Locate2d(kArch, 3.0, {5, 3.9}, 0.85);
  EXPECT_EQ(near.found, 1);
  EXPECT_NEAR(near.d2, 0.81, 1e-12);
  EXPECT_DOUBLE_EQ(near.t, 0.5);
  // 1.1 from the curve is rejected at distance 1.15, because 1.21 exceeds it.
  ExpectUntouched(Locate2d(kArch, 3.0, {5, 4.1}, 1.15));
  // And 0.9 is rejected at distance 0.8.
  ExpectUntouched(Locate2d(kArch, 3.0, {5, 3.9}, 0.8));
}

TEST(LocatePoint2d, SubdividedPiecesAreSearchedWithinToleranceSquaredPlusDistance) {
  // At tolerance 0.01 the arch is cut in 8 pieces. The apex pieces top out at y = 3, and grown
  // by 0.0001 + 0.85 their boxes no longer reach (5, 3.9).
  ExpectUntouched(Locate2d(kArch, 0.01, {5, 3.9}, 0.85));
  const Located r = Locate2d(kArch, 0.01, {5, 3.8}, 0.85);
  EXPECT_EQ(r.found, 1);
  EXPECT_NEAR(r.t, 0.5, 1e-9);
}

TEST(LocatePoint2d, EarlierSegmentWinsATie) {
  // x = 36 t (1 - t), walked in 4 steps: out along y = 0 to x = 9 and back. (5, 1) lies exactly
  // 1 from both the first and the last segment; the first one stands.
  const P2 p[4] = {{0, 0}, {12, 0}, {12, 0}, {0, 0}};
  const Located r = Locate2d(p, 1.0, {5, 1}, 1.5);
  EXPECT_EQ(r.found, 1);
  EXPECT_EQ(r.d2, 1.0);
  EXPECT_DOUBLE_EQ(r.t, (5 / 6.75) / 4);
}

TEST(LocatePoint2f, AgreesWithThe2dForm) {
  const ZvPoint2<float> pf[4] = {{0, 0}, {0, 4}, {10, 4}, {10, 0}};
  for (const P2& q : {P2{5, 3.9}, P2{2, 2}, P2{9.5, 1.25}, P2{20, 20}}) {
    double d2 = -1, t = -2;
    const int found = ZvBezierTool_LocatePoint2f(pf, 3.0, {float(q.x), float(q.y)}, 0.85, d2, t);
    const Located r = Locate2d(kArch, 3.0, {double(float(q.x)), double(float(q.y))}, 0.85);
    EXPECT_TRUE(found == r.found && d2 == r.d2 && t == r.t) << q.x << " " << q.y;
  }
}

TEST(LocatePoint3d, GrowsTheFirstBoxByTheSearchLimit) {
  // 0.6 off a straight line: outside the box grown by distance 0.5, inside the one grown by
  // tolerance^2 + distance = 1.5; 0.36 <= 0.5 then accepts it.
  const P3 p3[4] = {{0, 0, 0}, {10, 0, 0}, {20, 0, 0}, {30, 0, 0}};
  double d2 = -1, t = -2;
  EXPECT_EQ(ZvBezierTool_LocatePoint3d(p3, 1.0, {15, 0.6, 0}, 0.5, d2, t), 1);
  EXPECT_NEAR(d2, 0.36, 1e-12);
  EXPECT_DOUBLE_EQ(t, 0.5);

  const P2 p2[4] = {{0, 0}, {10, 0}, {20, 0}, {30, 0}};
  ExpectUntouched(Locate2d(p2, 1.0, {15, 0.6}, 0.5));
}

TEST(LocatePoint3d, FindsParametersOnASpaceCurve) {
  const P3 p[4] = {{0, 0, 0}, {100, 300, -50}, {250, -100, 200}, {400, 200, 100}};
  for (double t : {0.2, 0.66}) {
    double d2 = -1, found = -2;
    EXPECT_EQ(ZvBezierTool_LocatePoint3d(p, 0.1, EvalCubic(p, t), 1.0, d2, found), 1);
    EXPECT_NEAR(found, t, 1e-3);
  }
}

TEST(SplitCubic3d, WritesTheFivePointsBetweenP0AndP3) {
  const P3 p[4] = {{0, 0, 0}, {1, 2, 3}, {4, 5, 6}, {7, 8, 10}};
  const P3 sentinel = {-99, -99, -99};
  P3 buf[7] = {sentinel, {}, {}, {}, {}, {}, sentinel};
  ZvBezierTool_SplitCubic3d(p, buf + 1, 0.3);
  EXPECT_TRUE(buf[0].x == sentinel.x && buf[6].x == sentinel.x);
  EXPECT_EQ(buf[1].y, 0.6);  // A01 = P0 + (P1 - P0) t
  EXPECT_LT(Dist(buf[3], EvalCubic(p, 0.3)), 1e-12);
  // Both halves retrace the curve.
  const P3 left[4] = {p[0], buf[1], buf[2], buf[3]};
  const P3 right[4] = {buf[3], buf[4], buf[5], p[3]};
  for (double s : {0.25, 0.5, 0.9}) {
    EXPECT_LT(Dist(EvalCubic(left, s), EvalCubic(p, 0.3 * s)), 1e-12);
    EXPECT_LT(Dist(EvalCubic(right, s), EvalCubic(p, 0.3 + 0.7 * s)), 1e-12);
  }
}

TEST(TightExtent, BoundsTheCurveByItsQuartersControls) {
  // The control box reaches y = 40; the quarters' controls stop at 29.375, just above the
  // curve's own peak. P0 is the only point below y = 0.
  const P2 p[4] = {{0, -10}, {0, 40}, {100, 40}, {100, 0}};
  ZvExtent2<double> e;
  ZvBezierTool_AugmentExtentWithCubic2dTightExtent(e, p, 0);
  EXPECT_EQ(e.kind, ZvExtent2<double>::Regular);
  EXPECT_TRUE(e.xmin == 0 && e.ymin == -10 && e.xmax == 100 && e.ymax == 29.375);

  ZvExtent2<double> skip;
  ZvBezierTool_AugmentExtentWithCubic2dTightExtent(skip, p, 1);
  EXPECT_EQ(skip.ymin, 0.0);  // P3 is now the lowest

  const ZvPoint2<float> pf[4] = {{0, -10}, {0, 40}, {100, 40}, {100, 0}};
  ZvExtent2<float> ef(50, 50, 60, 60);  // an existing box only grows
  ZvBezierTool_AugmentExtentWithCubic2fTightExtent(ef, pf, 0);
  EXPECT_TRUE(ef.xmin == 0 && ef.ymin == -10 && ef.xmax == 100 && ef.ymax == 60);

  ZvExtent2<double> all(0, 0, 0, 0, ZvExtent2<double>::Infinite);
  ZvBezierTool_AugmentExtentWithCubic2dTightExtent(all, p, 0);
  EXPECT_EQ(all.kind, ZvExtent2<double>::Infinite);
}

}  // namespace
