// Point counts, order and positions of cubic and gamma flattening.
#include <gtest/gtest.h>

#include <zv/bezier_tool.h>

#include <new>

#include <cstring>
#include <random>

#include "cubic_eval.h"

namespace {

using P2 = ZvPoint2<double>;
using P3 = ZvPoint3<double>;

// The walk must land on the curve at k / n for every k, to within rounding of the additions.
template <class A, class P>
void ExpectUniformSamples(const A& out, const P* p, unsigned int n, double scale) {
  ASSERT_EQ(out.size, n + 1);
  for (unsigned int k = 0; k <= n; ++k) {
    EXPECT_LT(Dist(out[k], EvalCubic(p, static_cast<double>(k) / n)), 1e-9 * scale)
        << "k=" << k << " of " << n;
  }
}

unsigned int Flatten(const P2* p, double tolerance, ZvPoint2dArray& out, int skipFirst = 0) {
  return ZvBezierTool_FlattenCubic2d(p, tolerance, &out, skipFirst);
}

bool BitEqual(const P2& a, const P2& b) {
  return std::memcmp(&a, &b, sizeof a) == 0;
}

// Largest distance from densely sampled points of the curve to the polyline.
double MaxDeviation(const P2* p, const ZvPoint2dArray& line) {
  double worst = 0;
  for (int i = 0; i <= 1000; ++i) {
    const P2 c = EvalCubic(p, i / 1000.0);
    double best = 1e300;
    for (unsigned int j = 1; j < line.size; ++j) {
      double d2, t;
      if (ZvPoint2_FindClosestPointOnLineSegment<double>(c, line[j - 1], line[j], 1e300, d2, t))
        best = std::fmin(best, d2);
    }
    worst = std::fmax(worst, std::sqrt(best));
  }
  return worst;
}

TEST(FlattenCubic2d, StraightLineWithEvenControlsGivesEndPointsOnly) {
  const P2 p[4] = {{0, 0}, {1, 2}, {2, 4}, {3, 6}};
  ZvPoint2dArray out(1);
  EXPECT_EQ(Flatten(p, 0.001, out), 2u);
  EXPECT_TRUE(BitEqual(out[0], p[0]) && BitEqual(out[1], p[3]));

  // skipFirst: the array already ends at P0; only P3 is appended and counted.
  EXPECT_EQ(Flatten(p, 0.001, out, 1), 1u);
  ASSERT_EQ(out.size, 3u);
  EXPECT_TRUE(BitEqual(out[2], p[3]));
}

// Collinear controls have no deviation, so every interior point comes from the up-front
// subdivision: 2^depth - 1 of them, with depth = floor(log8(|D| / tolerance + 0.5)).
TEST(FlattenCubic2d, DepthIsBase8DigitsOfThirdDifference) {
  struct Case {
    double d;
    unsigned int pieces;
  } cases[] = {{7.0, 1},   {7.5, 2},   {63.4, 2},      {64.0, 4},
               {511.4, 4}, {512.0, 8}, {262144.0, 64}, {2097152.0, 128}};
  for (const Case& c : cases) {
    // D = P3 - 3 P2 + 3 P1 - P0 = (c.d, 0).
    const P2 p[4] = {{0, 0}, {0, 0}, {0, 0}, {c.d, 0}};
    ZvPoint2dArray out(1);
    Flatten(p, 1.0, out);
    SCOPED_TRACE(c.d);
    ExpectUniformSamples(out, p, c.pieces, c.d);
    for (unsigned int i = 0; i < out.size; ++i)
      EXPECT_EQ(out[i].y, 0.0);
  }
}

// An arch with |D| = 20 stays at depth 0 for tolerance 3; its deviation is h, so m =
// trunc(h / 4 + 0.5) and the walk takes 2^(base-4 digits of m) steps.
TEST(FlattenCubic2d, LevelsAreBase4DigitsOfScaledDeviation) {
  struct Case {
    double h;
    unsigned int steps;
  } cases[] = {{1.9, 1}, {2.0, 2}, {10.0, 2}, {14.0, 4}, {60.0, 4}, {62.0, 8}, {254.0, 16}};
  for (const Case& c : cases) {
    const P2 p[4] = {{0, 0}, {0, c.h}, {10, c.h}, {10, 0}};
    ZvPoint2dArray out(1);
    SCOPED_TRACE(c.h);
    EXPECT_EQ(Flatten(p, 3.0, out), c.steps + 1);
    ExpectUniformSamples(out, p, c.steps, 100);
  }
}

// Deep subdivision of a curved cubic: every point must be the curve at a parameter on the
// grid of 2^-(depth + levels), in increasing order. Depth 6 here, so the pieces come from
// several rounds of halving before each is walked at its own level.
TEST(FlattenCubic2d, DeepSubdivisionLandsOnTheCurveInOrder) {
  const P2 p[4] = {{0, 0}, {0, 30000}, {30000, 30000}, {30000, 0}};  // |D| = 60000
  ZvPoint2dArray out(1);
  const unsigned int n = Flatten(p, 0.1, out);  // n = 600000: depth 6
  ASSERT_GT(n, 64u);
  const unsigned int grid = 1u << 16;  // depth 6 plus at most 10 levels
  unsigned int j = 0;
  for (unsigned int i = 0; i < out.size; ++i) {
    while (j <= grid && Dist(EvalCubic(p, static_cast<double>(j) / grid), out[i]) > 1e-6)
      ++j;
    ASSERT_LE(j, grid) << "point " << i << " is not on the curve after the previous one";
  }
}

TEST(FlattenCubic2d, ClosedCurveUsesControlSpreadAsDeviation) {
  // P0 = P3: no chord. e = |P1 - P0| = 100.005, m = 75, four base-4 digits: 16 steps.
  const P2 p[4] = {{0, 0}, {1, 100}, {-1, 100}, {0, 0}};
  ZvPoint2dArray out(1);
  EXPECT_EQ(Flatten(p, 1.0, out), 17u);
  ExpectUniformSamples(out, p, 16, 100);
  EXPECT_GT(out[3].x, 0.0);   // out along one side of the loop
  EXPECT_LT(out[13].x, 0.0);  // and back along the other
}

// A parabola written as a cubic has D = 0 and deviation 2048; at tolerance 0.001 it asks for
// 11 levels, which only the 2d form cuts to 10.
const P2 kParabola[4] = {{0, 0}, {1024, 2048}, {2048, 2048}, {3072, 0}};

TEST(FlattenCubic, Only2dCapsForwardDifferencingAndThe3dDeviationIsSpatial) {
  ZvPoint2dArray out2d(1);
  EXPECT_EQ(Flatten(kParabola, 0.001, out2d), 1025u);
  ExpectUniformSamples(out2d, kParabola, 1024, 3072);

  P3 p3[4];
  for (int i = 0; i < 4; ++i)
    p3[i] = {kParabola[i].x, kParabola[i].y, 0.0};
  ZvPoint3dArray out3d(1);
  EXPECT_EQ(ZvBezierTool_FlattenCubic3d(p3, 0.001, &out3d, 0), 2049u);
  ExpectUniformSamples(out3d, p3, 2048, 3072);

  ZvPoint2<float> pf[4];
  for (int i = 0; i < 4; ++i)
    pf[i] = {float(kParabola[i].x), float(kParabola[i].y)};
  ZvPoint2fArray outf(1);
  EXPECT_EQ(ZvBezierTool_FlattenCubic2f(pf, 0.001, &outf, 0), 2049u);

  // The level arch of the 2d test standing in the xz plane: same deviation out of the plane.
  const P3 arch[4] = {{0, 0, 0}, {0, 0, 14}, {10, 0, 14}, {10, 0, 0}};
  ZvPoint3dArray outArch(1);
  EXPECT_EQ(ZvBezierTool_FlattenCubic3d(arch, 3.0, &outArch, 0), 5u);
  ExpectUniformSamples(outArch, arch, 4, 100);
}

TEST(FlattenCubic, ThirdDifferenceIsGuardedIn2dButPlainIn3d) {
  // |D| = 1e-5: the 2-D guard makes it 0 (depth 0), the plain 3-D length gives n = 10 (depth 1).
  const P2 p2[4] = {{0, 0}, {0, 0}, {0, 0}, {1e-5, 0}};
  const P3 p3[4] = {{0, 0, 0}, {0, 0, 0}, {0, 0, 0}, {1e-5, 0, 0}};
  ZvPoint2dArray out2(1);
  ZvPoint3dArray out3(1);
  EXPECT_EQ(Flatten(p2, 1e-6, out2), 2u);
  EXPECT_EQ(ZvBezierTool_FlattenCubic3d(p3, 1e-6, &out3, 0), 3u);
  EXPECT_DOUBLE_EQ(out3[1].x, 1e-5 / 8);
}

TEST(FlattenCubic2f, IsThe2dPolylineRoundedToFloat) {
  const ZvPoint2<float> pf[4] = {{0.5f, 0.25f}, {120.75f, 300.5f}, {400.125f, -50.25f}, {500, 200}};
  const P2 pd[4] = {{0.5, 0.25}, {120.75, 300.5}, {400.125, -50.25}, {500, 200}};
  ZvPoint2fArray outf(1);
  ZvPoint2dArray outd(1);
  const unsigned int n = ZvBezierTool_FlattenCubic2f(pf, 0.25, &outf, 0);
  ASSERT_EQ(n, Flatten(pd, 0.25, outd));
  ASSERT_GT(n, 20u);
  for (unsigned int i = 0; i < n; ++i)
    EXPECT_TRUE(outf[i].x == float(outd[i].x) && outf[i].y == float(outd[i].y)) << i;
}

// The deviation measure looks only across each chord, so tight turns can exceed the tolerance
// (by up to about 4x on this sample, far more on rare curves); lost or misplaced pieces would
// show as deviations of the curve's own size.
TEST(FlattenCubic2d, RandomCubicsFollowTheCurveAndEndExactlyOnP3) {
  std::mt19937 rng(7);
  std::uniform_real_distribution<double> coord(-300.0, 300.0);
  for (double tolerance : {0.1, 0.25, 1.0}) {
    for (int i = 0; i < 40; ++i) {
      P2 p[4];
      for (P2& q : p)
        q = {coord(rng), coord(rng)};
      ZvPoint2dArray out(1);
      Flatten(p, tolerance, out);
      ASSERT_GE(out.size, 2u);
      EXPECT_TRUE(BitEqual(out[0], p[0]) && BitEqual(out[out.size - 1], p[3]));
      EXPECT_LE(MaxDeviation(p, out), 5 * tolerance);
    }
  }
}

TEST(FlattenCubic2d, ControlPointsMayLiveInTheOutputArray) {
  const P2 p[4] = {{0, 0}, {100, 300}, {300, -100}, {400, 200}};
  ZvPoint2dArray expected(1);
  Flatten(p, 0.5, expected);

  ZvPoint2dArray out(p, 4);  // full: the first Add moves the block the curve is read from
  const unsigned int n = Flatten(out.data, 0.5, out);
  ASSERT_EQ(n, expected.size);
  for (unsigned int i = 0; i < n; ++i)
    EXPECT_TRUE(BitEqual(out[4 + i], expected[i])) << i;
}

// The array must end up exactly as if every point had been appended by its own Add.
TEST(FlattenCubic2d, ArrayGrowsAsByOneAddPerPoint) {
  const P2 p[4] = {{0, 0}, {100, 300}, {300, -100}, {400, 200}};
  ZvPoint2dArray points(1);
  Flatten(p, 0.5, points);
  for (unsigned int capacity = 1; capacity <= 9; ++capacity) {
    for (unsigned int filled = 0; filled <= capacity; ++filled) {
      ZvPoint2dArray out(capacity), reference(capacity);
      for (unsigned int i = 0; i < filled; ++i) {
        out.Add(P2{-1, -1});
        reference.Add(P2{-1, -1});
      }
      Flatten(p, 0.5, out);
      for (unsigned int i = 0; i < points.size; ++i)
        reference.Add(points[i]);
      ASSERT_EQ(out.size, reference.size);
      EXPECT_EQ(out.capacity, reference.capacity) << capacity << " " << filled;
      for (unsigned int i = 0; i < out.size; ++i)
        EXPECT_TRUE(BitEqual(out[i], reference[i]));
    }
  }
}

TEST(FlattenCubic, BadInputEndsWithABoundedPolylineOrNothing) {
  const P2 p[4] = {{0, 0}, {100, 300}, {300, -100}, {400, 200}};
  ZvPoint2dArray out(1);
  // A zero tolerance saturates the subdivision (2^10 pieces) and adds no walk of its own.
  EXPECT_EQ(Flatten(p, 0.0, out), 1025u);
  EXPECT_EQ(Flatten(p, -1.0, out), 2u);
  EXPECT_EQ(ZvBezierTool_FlattenCubic2d(nullptr, 1.0, &out, 0), 0u);
  EXPECT_EQ(ZvBezierTool_FlattenCubic2d(p, 1.0, nullptr, 0), 0u);
  // A cubic near the float range asks for billions of points: refused before anything is added,
  // as a failed allocation would be, in every form.
  const ZvPoint2<float> huge[4] = {{0, 0}, {3e37f, 3e38f}, {-3e38f, 1e37f}, {3e38f, -3e38f}};
  ZvPoint2fArray floats(1);
  floats.Add(1, 2);
  EXPECT_THROW(ZvBezierTool_FlattenCubic2f(huge, 0.5, &floats, 1), std::bad_alloc);
  EXPECT_EQ(floats.size, 1u);
  const P3 huge3[4] = {{0, 0, 0}, {3e37, 3e38, 1}, {-3e38, 1e37, 2}, {3e38, -3e38, 3}};
  ZvPoint3dArray spatial(1);
  EXPECT_THROW(ZvBezierTool_FlattenCubic3d(huge3, 0.5, &spatial, 0), std::bad_alloc);
  // A corrupt gamma piece with an almost empty x range walks at most one unit of u.
  const P2 g[4] = {{0, 1}, {1e-300, -0.5}, {1e-290, 0.5}, {1e-305, 0}};
  EXPECT_LE(ZvBezierTool_FlattenGamma(g, 0.1, &out, 0), 154u);
}

// Gamma pieces: P0 = (0, 1) and P3 = (1, 0) make x = u and y = 1 - u^gamma.
struct GammaCase {
  double gamma, u1, u2;
  unsigned int interior;
};

TEST(FlattenGamma, WalksFromP1ToP2InStepsSetByGamma) {
  const GammaCase cases[] = {
      {2.0, 0.25, 0.71, 27},   // 60 steps per unit
      {0.5, 0.25, 0.71, 27},   // 30 / gamma, also 60
      {0.1, 0.25, 0.705, 68},  // 300 asked, 150 allowed
      {2.0, 0.0, 0.71, 42},    // P1 at u = 0: gamma is taken from P2
  };
  for (const GammaCase& c : cases) {
    SCOPED_TRACE(c.gamma);
    const P2 p[4] = {
        {0, 1}, {c.u1, 1 - std::pow(c.u1, c.gamma)}, {c.u2, 1 - std::pow(c.u2, c.gamma)}, {1, 0}};
    ZvPoint2dArray out(1);
    EXPECT_EQ(ZvBezierTool_FlattenGamma(p, 123.0, &out, 0), c.interior + 2);
    ASSERT_EQ(out.size, c.interior + 2);
    EXPECT_TRUE(BitEqual(out[0], p[0]) && BitEqual(out[out.size - 1], p[2]));
    for (unsigned int k = 1; k <= c.interior; ++k) {
      const double u = out[k].x;
      EXPECT_NEAR(u, c.u1 + k * (c.gamma < 0.2 ? 1 / 150.0 : 1 / 60.0), 1e-6);
      EXPECT_NEAR(out[k].y, 1 - std::pow(u, c.gamma), 1e-6);
      EXPECT_TRUE(out[k].x == float(out[k].x) && out[k].y == float(out[k].y));  // float-rounded
    }
  }
}

TEST(FlattenGamma, NearlyLinearPieceIsItsChord) {
  const P2 p[4] = {{0, 1}, {0.25, 0.75}, {0.71, 0.29}, {1, 0}};
  ZvPoint2dArray out(1);
  EXPECT_EQ(ZvBezierTool_FlattenGamma(p, 0.1, &out, 0), 2u);
  EXPECT_EQ(ZvBezierTool_FlattenGamma(p, 0.1, &out, 1), 1u);
  ASSERT_EQ(out.size, 3u);
  EXPECT_TRUE(BitEqual(out[1], p[2]) && BitEqual(out[2], p[2]));
}

}  // namespace
