// General-degree flattening by ordered forward differencing.
#include <gtest/gtest.h>
#include <zv/bezier_fit.h>
#include <zv/bezier_tool.h>

#include <cmath>
#include <random>
#include <vector>

#include "tests/curvemath/bezier_fit_strokes.h"

namespace {

using P2d = ZvPoint2<double>;

double DistanceToPolyline(const P2d& q, const ZvPoint2dArray& poly) {
  double best = HUGE_VAL;
  for (unsigned int i = 0; i + 1 < poly.size; ++i)
    best = std::fmin(best, DistanceToSegment(q, poly[i], poly[i + 1]));
  return best;
}

// Controls that advance along x, so that the curve does not double back along its chord: the
// step counts measure bending across the chord only, as the flatteners of cubics do.
std::vector<P2d> RandomCurve(std::mt19937& rng, unsigned int degree, double size) {
  std::uniform_real_distribution<double> u(-size, size);
  std::vector<P2d> p(degree + 1);
  for (unsigned int i = 0; i <= degree; ++i)
    p[i] = P2d{size * i + 0.4 * u(rng), u(rng)};
  return p;
}

TEST(BezierFitFlatten, LowDegreesGiveTheirEndsAndBadArgumentsNothing) {
  ZvBezierTool tool;
  EXPECT_EQ(8u, ZvBezierTool::MaxDegreeForThisImplementation());
  const ZvPoint2<float> line[2] = {{1, 2}, {7, 9}};
  ZvPoint2fArray out;
  EXPECT_EQ(2u, tool.Flatten(line, 0, 1, 0.1, &out, 0));
  EXPECT_EQ(1u, tool.Flatten(line, 0, 1, 0.1, &out, 1));
  ASSERT_EQ(3u, out.size);
  EXPECT_TRUE(out[0].x == 1.0f && out[1].x == 7.0f && out[2].y == 9.0f);
  // Degree 0 repeats its point: a lone start point still gives a first and a last vertex.
  EXPECT_EQ(2u, tool.Flatten(line, 1, 0, 0.1, &out, 0));
  EXPECT_EQ(1u, tool.Flatten(line, 1, 0, 0.1, &out, 1));

  ZvPoint2<float> ten[10] = {};
  EXPECT_EQ(0u, tool.Flatten(ten, 0, 9, 0.1, &out, 0));
  EXPECT_EQ(0u, tool.Flatten(static_cast<const ZvPoint2<float>*>(nullptr), 0, 3, 0.1, &out, 0));
  EXPECT_EQ(0u, tool.Flatten(ten, 0, 3, 0.1, static_cast<ZvPoint2fArray*>(nullptr), 0));
  // The array form checks that the curve lies inside the array.
  const ZvPoint2fArray four(ten, 4);
  EXPECT_EQ(0u, tool.Flatten(four, 1, 3, 0.1, &out, 0));
  EXPECT_EQ(0u, tool.Flatten(four, 4, 0, 0.1, &out, 0));
  EXPECT_EQ(6u, out.size);  // refusals add nothing
  EXPECT_EQ(0u, tool.FlatPolylineSizeUpperBound(ten, 0, 9, 0.1));
  EXPECT_EQ(2u, tool.FlatPolylineSizeUpperBound(ten, 0, 1, 0.1));
}

TEST(BezierFitFlatten, CubicsCountAsTheCubicFlattenerAndLandOnItsPoints) {
  std::mt19937 rng(7);
  ZvBezierTool tool;
  for (int trial = 0; trial < 300; ++trial) {
    const double size = trial % 3 == 0 ? 5.0 : 200.0;
    const double tolerance = trial % 2 ? 0.25 : 1.0;
    const std::vector<P2d> p = RandomCurve(rng, 3, size);
    ZvPoint2fArray general, cubic;
    ZvPoint2<float> pf[4];
    for (int i = 0; i < 4; ++i)
      pf[i] = {float(p[i].x), float(p[i].y)};
    const unsigned int n = tool.Flatten(pf, 0, 3, tolerance, &general, 0);
    ASSERT_EQ(ZvBezierTool_FlattenCubic2f(pf, tolerance, &cubic, 0), n) << trial;
    for (unsigned int i = 0; i < n; ++i) {
      EXPECT_NEAR(cubic[i].x, general[i].x, 1e-3) << trial << " " << i;
      EXPECT_NEAR(cubic[i].y, general[i].y, 1e-3) << trial << " " << i;
    }
    EXPECT_TRUE(pf[3].x == general[n - 1].x && pf[3].y == general[n - 1].y) << trial;
  }
}

// Every degree: the points lie on the curve in order of parameter, the polyline follows the
// curve within the tolerance, and the double and float forms count alike.
TEST(BezierFitFlatten, EveryDegreeFollowsItsCurve) {
  std::mt19937 rng(11);
  ZvBezierTool tool;
  for (unsigned int degree = 2; degree <= 8; ++degree) {
    double worst = 0;
    for (int trial = 0; trial < 16; ++trial) {
      const double tolerance = trial % 2 ? 0.1 : 1.0;
      const std::vector<P2d> p = RandomCurve(rng, degree, trial % 4 == 0 ? 10.0 : 150.0);
      ZvPoint2dArray out;
      out.Add(-1.0, -1.0);  // the caller's content stays
      const unsigned int n = tool.Flatten(p.data(), 0, degree, tolerance, &out, 0);
      ASSERT_EQ(n + 1, out.size);
      ZvPoint2dArray poly;
      poly.Add(out, 1, n);
      EXPECT_TRUE(out[0].x == -1.0 && p[0].x == poly[0].x && p[degree].y == poly[n - 1].y);

      // On the curve, with increasing parameters: each point is found on the curve after the
      // previous one's parameter (a coarse scan, then a ternary refinement).
      double t = 0.0;
      for (unsigned int i = 1; i + 1 < n; ++i) {
        auto dist2 = [&](double s) {
          const P2d d = EvalBezier(p.data(), degree, s) - poly[i];
          return ZvDot(d, d);
        };
        const double step = 1.0 / 256;
        double bestT = t;
        for (double s = t; s <= 1.0; s += step)
          if (dist2(s) < dist2(bestT)) bestT = s;
        double lo = std::fmax(t, bestT - step), hi = std::fmin(1.0, bestT + step);
        for (int k = 0; k < 60; ++k) {
          const double a = lo + (hi - lo) / 3, b = hi - (hi - lo) / 3;
          (dist2(a) < dist2(b) ? hi : lo) = (dist2(a) < dist2(b) ? b : a);
        }
        EXPECT_LT(std::sqrt(dist2(lo)), 1e-6 * (1.0 + std::fabs(poly[i].x)))
            << degree << " " << trial;
        t = lo;
      }
      // The step count comes from the deviation across the chord of each piece: an estimate
      // of the distance to the curve, not a strict bound.
      for (int k = 0; k <= 200; ++k) {
        const P2d q = EvalBezier(p.data(), degree, k / 200.0);
        worst = std::fmax(worst, DistanceToPolyline(q, poly) / tolerance);
      }

      std::vector<ZvPoint2<float>> pf(degree + 1);
      for (unsigned int i = 0; i <= degree; ++i)
        pf[i] = ZvPoint2<float>{float(p[i].x), float(p[i].y)};
      ZvPoint2fArray outf;
      const unsigned int nf = tool.Flatten(pf.data(), 0, degree, tolerance, &outf, 1);
      EXPECT_NEAR(double(n - 1), double(nf), 2.0);
    }
    // A quadratic is never subdivided (it has no third differences), and where its controls
    // crowd toward one end its pieces bend more across their own chords than across the whole
    // one: the estimate is looser there.
    EXPECT_LE(worst, degree == 2 ? 2.0 : 1.1) << degree;
  }
}

TEST(BezierFitFlatten, UpperBoundIsTheStepCountOfOneWalk) {
  ZvBezierTool tool;
  // A flat quartic arch: small third differences, so one walk without subdivision.
  const ZvPoint2<float> arch[5] = {{0, 0}, {10, 6}, {20, 8}, {30, 6}, {40, 0}};
  for (double tolerance : {2.0, 0.5, 0.1, 0.01}) {
    ZvPoint2fArray out;
    const unsigned int bound = tool.FlatPolylineSizeUpperBound(arch, 0, 4, tolerance);
    EXPECT_EQ(bound, tool.Flatten(arch, 0, 4, tolerance, &out, 0)) << tolerance;
    EXPECT_EQ(0u, (bound - 1) & (bound - 2)) << "2^levels + 1, got " << bound;
  }
  // A straight quadratic with its middle control on the chord needs no step at all.
  const ZvPoint2<float> straight[3] = {{0, 0}, {5, 5}, {10, 10}};
  EXPECT_EQ(2u, tool.FlatPolylineSizeUpperBound(straight, 0, 2, 0.01));
}

}  // namespace
