// Fitting polylines with Bezier segments: the small cases, corners, degrees and the single
// segment forms.
#include <gtest/gtest.h>
#include <zv/bezier_fit.h>
#include <zv/path2f.h>
#include <zv/polyline.h>

#include <cmath>
#include <vector>

#include "cubic_eval.h"

namespace {

using P2f = ZvPoint2<float>;
using P2d = ZvPoint2<double>;

ZvPoint2fArray Polyline(std::initializer_list<P2f> pts) {
  ZvPoint2fArray a;
  for (const P2f& p : pts)
    a.Add(p);
  return a;
}

// Samples of a cubic at n + 1 even parameters.
ZvPoint2fArray SampleCubic(const P2d* p, unsigned int n) {
  ZvPoint2fArray a;
  for (unsigned int k = 0; k <= n; ++k) {
    const P2d q = EvalCubic(p, double(k) / n);
    a.Add(q.x, q.y);
  }
  return a;
}

bool Is(const P2f& p, float x, float y) {
  return p.x == x && p.y == y;
}

std::vector<unsigned int> Degrees(const ZvPath2f& path) {
  std::vector<unsigned int> out;
  for (unsigned int i = 1; i < path.NumPoints();) {
    unsigned int a, b;
    path.GetSegmentIndices(i, a, b);
    out.push_back(b - a);
    i = b + 1;
  }
  return out;
}

TEST(BezierFitFit, TinyInputs) {
  ZvBezierTool tool;
  ZvPath2f path;
  // Two equal points clean up to one: a Moveto alone, or nothing when continuing.
  EXPECT_EQ(1u, tool.OpenFit(Polyline({{3, 4}, {3, 4}}), 0.5, 3, 1.0, 0, &path, 0));
  EXPECT_EQ(1u, path.NumPoints());
  EXPECT_EQ(0u, tool.OpenFit(Polyline({{3, 4}, {3, 4}}), 0.5, 3, 1.0, 0, &path, 1));
  EXPECT_EQ(1u, path.NumPoints());
  // Two points: a line.
  EXPECT_EQ(1u, tool.OpenFit(Polyline({{0, 0}, {5, 0}}), 0.5, 3, 1.0, 0, &path, 0));
  EXPECT_TRUE(path.NumPoints() == 3 && path.GetDegree(2) == 1);
  // Three points: one cubic with both handles on the middle vertex.
  ZvPath2f three;
  EXPECT_EQ(1u, tool.OpenFit(Polyline({{0, 0}, {5, 3}, {10, 0}}), 0.5, 5, 1.0, 0, &three, 0));
  ASSERT_EQ(4u, three.NumPoints());
  EXPECT_EQ(3u, three.GetDegree(3));
  EXPECT_TRUE(Is(three.GetPoint(1), 5, 3) && Is(three.GetPoint(2), 5, 3));

  // Refused: degrees outside 3..8, no tolerance, no path.
  const ZvPoint2fArray line = Polyline({{0, 0}, {1, 0}, {2, 0}, {3, 0}});
  EXPECT_EQ(0u, tool.OpenFit(line, 0.5, 2, 1.0, 0, &three, 0));
  EXPECT_EQ(0u, tool.OpenFit(line, 0.5, 9, 1.0, 0, &three, 0));
  EXPECT_EQ(0u, tool.OpenFit(line, 0.5, 3, 0.0, 0, &three, 0));
  EXPECT_EQ(0u, tool.OpenFit(line, 0.5, 3, 1.0, 0, nullptr, 0));
  EXPECT_EQ(0u, tool.OpenFit(ZvPoint2fArray(), 0.5, 3, 1.0, 0, &three, 0));
  EXPECT_EQ(4u, three.NumPoints());

  // Closed: one point gives Moveto and Closeto, two a closed there-and-back.
  ZvPath2f closed;
  EXPECT_EQ(1u, tool.ClosedFit(Polyline({{1, 1}}), 0.5, 3, 1.0, 0, &closed));
  EXPECT_EQ(2u, tool.ClosedFit(Polyline({{0, 0}, {4, 0}}), 0.5, 3, 1.0, 0, &closed));
  EXPECT_TRUE(closed.NumPoints() == 4 && closed.IsSubpathClosed(3));
  EXPECT_EQ(0.0f, closed.GetPoint(3).x);
}

// The fit parameterises by chord length; a cubic whose own parameter runs at a nearly even
// speed is reproduced within the tolerance.
TEST(BezierFitFit, SamplesOfACubicGiveOneSegment) {
  const P2d cubic[4] = {{0, 0}, {40, 10}, {80, 10}, {120, 0}};
  const ZvPoint2fArray samples = SampleCubic(cubic, 40);
  ZvBezierTool tool;
  for (unsigned int degree = 3; degree <= 6; ++degree) {
    ZvPath2f path;
    EXPECT_EQ(1u, tool.OpenFit(samples, 0.5, degree, 1.0, 0, &path, 0)) << degree;
    ASSERT_EQ(degree + 1, path.NumPoints());
    EXPECT_EQ(degree, path.GetDegree(degree));
    // The end handles lie along the polyline's end edges.
    const P2f p0 = path.GetPoint(0), p1 = path.GetPoint(1);
    const P2f s1 = samples[1];
    EXPECT_NEAR(0.0, (p1.x - p0.x) * (s1.y - p0.y) - (p1.y - p0.y) * (s1.x - p0.x), 1e-2);
  }
}

TEST(BezierFitFit, CornersSplitOnlyBeyondARightAngle) {
  ZvBezierTool tool;
  // A sharp V: the apex turns back by about 160 degrees.
  ZvPoint2fArray v;
  for (int k = 0; k <= 10; ++k)
    v.Add(3.0 * k, 10.0 * k);
  for (int k = 1; k <= 10; ++k)
    v.Add(30.0 + 3.0 * k, 100.0 - 10.0 * k);
  ZvPath2f path;
  EXPECT_EQ(2u, tool.OpenFit(v, 0.5, 3, 0.5, 0, &path, 0));
  EXPECT_EQ((std::vector<unsigned int>{3, 3}), Degrees(path));
  EXPECT_TRUE(Is(path.GetPoint(3), 30, 100));  // the apex is a node
  // The apex turns with a squared cosine of 0.697: a cornerCos2 above that sees no corner, and
  // the two sides are no longer fitted apart (the first node is elsewhere).
  ZvPath2f smooth;
  tool.OpenFit(v, 0.75, 3, 0.5, 0, &smooth, 0);
  EXPECT_FALSE(Is(smooth.GetPoint(3), 30, 100));

  // Two legs of 8 edges meeting at (40, 0). At exactly a right angle c = 0: not a corner, even
  // with cornerCos2 0, so the fit halves at the apex with a tangent across it and the two
  // halves meet G1. One degree sharper, the apex is a corner: two straight cubics and a cusp.
  for (double angle : {90.0, 89.0}) {
    ZvPoint2fArray l;
    for (int k = 0; k <= 8; ++k)
      l.Add(5.0 * k, 0.0);
    const double r = angle * M_PI / 180.0;
    for (int k = 1; k <= 8; ++k)
      l.Add(40.0 - 5.0 * k * std::cos(r), 5.0 * k * std::sin(r));
    ZvPath2f path;
    EXPECT_EQ(2u, tool.OpenFit(l, 0.0, 3, 2.0, 0, &path, 0)) << angle;
    ASSERT_EQ(7u, path.NumPoints());
    EXPECT_TRUE(Is(path.GetPoint(3), 40, 0));
    const P2f a = path.GetPoint(2), b = path.GetPoint(3), c = path.GetPoint(4);
    const double cross = (b.x - a.x) * (c.y - b.y) - (b.y - a.y) * (c.x - b.x);
    if (angle == 90.0) {
      EXPECT_NEAR(0.0, cross, 1e-3);
    } else {
      EXPECT_EQ(0.0f, a.y);  // the handles lie along the legs
      EXPECT_GT(std::fabs(cross), 100.0);
    }
  }
}

TEST(BezierFitFit, ClosedFitEndsOnItsStartAndContinuingAppends) {
  ZvPoint2fArray circle;
  for (int k = 0; k < 64; ++k)
    circle.Add(50 + 40 * std::cos(k * M_PI / 32), 50 + 40 * std::sin(k * M_PI / 32));
  circle.Add(circle[0]);
  ZvBezierTool tool;
  ZvPath2f path;
  const unsigned int n = tool.ClosedFit(circle, 0.5, 3, 0.25, 0, &path);
  EXPECT_GE(n, 2u);
  EXPECT_EQ(n, Degrees(path).size());
  EXPECT_TRUE(path.IsSubpathClosed(0) && path.NumSubpaths() == 1);

  // Continuing: no Moveto, the segments go on from the path's current point.
  ZvPath2f joined;
  joined.Moveto(P2f{0, 0});
  joined.Lineto(circle[0]);
  const unsigned int m = tool.OpenFit(circle, 0.5, 3, 0.25, 0, &joined, 1);
  EXPECT_EQ(1u, joined.NumSubpaths());
  EXPECT_EQ(m + 1, Degrees(joined).size());
}

// The single-segment forms keep their end conditions and report where a failed fit strays.
TEST(BezierFitFit, SingleSegmentFormsHoldTheirEndConditions) {
  const P2d cubic[4] = {{0, 0}, {40, 10}, {80, 10}, {120, 0}};
  const ZvPoint2fArray samples = SampleCubic(cubic, 30);
  ZvDoubleArray chords;
  ZvPoint2fArray_ComputeChordLength(samples, 0, samples.size - 1, chords);
  const P2d t0{4.0 / std::sqrt(17.0), 1.0 / std::sqrt(17.0)};   // true start direction
  const P2d t1{4.0 / std::sqrt(17.0), -1.0 / std::sqrt(17.0)};  // true end direction
  ZvBezierTool tool;
  unsigned int split = 12345;
  P2f cp[9];
  // Cross products of the end handles with the true end directions.
  const auto offStart = [&] { return cp[1].x * t0.y - cp[1].y * t0.x; };
  const auto offEnd = [&](unsigned int d) {
    return (cp[d - 1].x - 120.0) * t1.y - cp[d - 1].y * t1.x;
  };
  for (unsigned int d = 3; d <= 5; ++d) {
    EXPECT_EQ(1, tool.SingleCurveFitC0C0(samples, chords, 0, 30, 0.5, d, cp, split)) << d;
    EXPECT_TRUE(cp[0].x == 0.0f && cp[d].x == 120.0f);
    EXPECT_EQ(1, tool.SingleCurveFitG1C0(samples, chords, 0, 30, t0, 0.5, d, cp, split)) << d;
    EXPECT_NEAR(0.0, offStart(), 1e-4);
    EXPECT_EQ(1, tool.SingleCurveFitC0G1(samples, chords, 0, 30, t1, 0.5, d, cp, split)) << d;
    EXPECT_NEAR(0.0, offEnd(d), 1e-4);
    EXPECT_EQ(1, tool.SingleCurveFitG1G1(samples, chords, 0, 30, t0, t1, 0.5, d, cp, split)) << d;
    EXPECT_NEAR(0.0, offStart(), 1e-4);
    EXPECT_NEAR(0.0, offEnd(d), 1e-4);
  }
  EXPECT_EQ(12345u, split);

  // A zigzag no single cubic follows: 0, with the failing index inside the range.
  ZvPoint2fArray zig;
  for (int k = 0; k <= 20; ++k)
    zig.Add(5.0 * k, k % 4 < 2 ? 0.0 : 8.0);
  ZvDoubleArray zigChords;
  ZvPoint2fArray_ComputeChordLength(zig, 0, 20, zigChords);
  EXPECT_EQ(0, tool.SingleCurveFitC0C0(zig, zigChords, 0, 20, 0.5, 3, cp, split));
  EXPECT_TRUE(split > 0 && split < 20) << split;

  // Refused with outputs untouched: degrees the conditions cannot hold, bad ranges.
  split = 777;
  cp[0] = P2f{-1, -1};
  EXPECT_EQ(0, tool.SingleCurveFitG1G1(samples, chords, 0, 30, t0, t1, 0.5, 2, cp, split));
  EXPECT_EQ(0, tool.SingleCurveFitG1C0(samples, chords, 0, 30, t0, 0.5, 1, cp, split));
  EXPECT_EQ(0, tool.SingleCurveFitC0C0(samples, chords, 0, 30, 0.5, 9, cp, split));
  EXPECT_EQ(0, tool.SingleCurveFitC0C0(samples, chords, 5, 5, 0.5, 3, cp, split));
  EXPECT_EQ(0, tool.SingleCurveFitC0C0(samples, chords, 0, 31, 0.5, 3, cp, split));
  EXPECT_TRUE(split == 777 && cp[0].x == -1.0f);

  // The double cubic form fits as the float one does, and checks its range too.
  ZvPoint2dArray wide;
  for (unsigned int i = 0; i < samples.size; ++i)
    wide.Add(samples[i].x, samples[i].y);
  ZvDoubleArray wideChords;
  ZvPoint2dArray_ComputeChordLength(wide, 0, 30, wideChords);
  P2d cd[4];
  ASSERT_EQ(1, tool.SingleCurveFitG1C0(samples, chords, 3, 27, t0, 0.5, 3, cp, split));
  ASSERT_EQ(1, tool.SingleCubicFitG1C0(wide, wideChords, 3, 27, t0, 0.5, cd, split));
  for (int j = 0; j < 4; ++j) {
    EXPECT_NEAR(cp[j].x, cd[j].x, 1e-3);
    EXPECT_NEAR(cp[j].y, cd[j].y, 1e-3);
  }
  EXPECT_EQ(0, tool.SingleCubicFitG1C0(wide, wideChords, 3, 40, t0, 0.5, cd, split));
}

// Points that are not numbers make no fit, but the recursion still ends on short stretches and
// the path stays well formed, one segment per count.
TEST(BezierFitFit, NonFiniteInputStillEnds) {
  ZvPoint2fArray wild;
  for (int k = 0; k < 40; ++k)
    wild.Add(k * 3.0, k == 17 ? std::nan("") : std::sin(k * 0.3) * 10.0);
  ZvBezierTool tool;
  for (unsigned int degree : {3u, 6u}) {
    ZvPath2f path;
    const unsigned int made = tool.OpenFit(wild, 0.5, degree, 0.5, 0, &path, 0);
    EXPECT_EQ(made, Degrees(path).size());
    EXPECT_EQ(39.0f * 3.0f, path.GetCurrentPoint().x);
  }
}

}  // namespace
