// The path builders' shared steps, and the linear and cubic builders.
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/path_builder.h>

#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "path_builder_feed.h"
#include "path_fixtures.h"
#include "shape/path_builder_steps.h"
#include "tests/curvemath/bezier_fit_strokes.h"

namespace {
ZvPoint2fArray Line(std::initializer_list<ZvPoint2<float>> points) {
  ZvPoint2fArray a;
  for (const ZvPoint2<float>& p : points)
    a.Add(p);
  return a;
}
}  // namespace

TEST(PathBuilderSteps, SamplesCarryTheirRestAcrossBatches) {
  // Length 25 at spacing 10: samples at 10 and 20, and the end, as 5 is left over; 20.5 leaves
  // 0.5, not above a tenth of the spacing: no end sample.
  ZvPoint2fArray samples;
  double length = 0, residual = 0;
  EXPECT_EQ(SampleSubpath(Line({P(0, 0), P(25, 0)}), 0, 1, 10, length, residual, samples, 1), 3u);
  EXPECT_EQ(length, 25);
  EXPECT_EQ(residual, 0);
  EXPECT_EQ(samples[2].x, 25);
  residual = 0;
  EXPECT_EQ(SampleSubpath(Line({P(0, 0), P(0, 20.5f)}), 0, 1, 10, length, residual, samples, 1),
            2u);
  EXPECT_DOUBLE_EQ(residual, 0.5);
  // Batches of 7 and 8 along a bend: one sample at arc length 10, 3 into the second edge, 5
  // carried over; a lone point measures nothing and keeps the rest.
  samples.Chop(0);
  residual = 0;
  const ZvPoint2fArray bend = Line({P(0, 0), P(7, 0), P(7, 8)});
  EXPECT_EQ(SampleSubpath(bend, 0, 1, 10, length, residual, samples, 0), 0u);
  EXPECT_EQ(SampleSubpath(bend, 1, 2, 10, length, residual, samples, 0), 1u);
  EXPECT_EQ(SampleSubpath(bend, 2, 2, 10, length, residual, samples, 0), 0u);
  EXPECT_EQ(residual, 5);
  ASSERT_EQ(samples.size, 1u);
  EXPECT_EQ(samples[0].x, 7);
  EXPECT_EQ(samples[0].y, 3);
}

TEST(PathBuilderSteps, SmoothingKeepsEndsAndDenseRuns) {
  ZvGC gc;
  ZvPoint2fArray zigzag = Line({P(0, 0), P(4, 4), P(8, 0), P(12, 4), P(16, 0)});
  SmoothTrailingInputPoints(gc, 0, 4, zigzag);
  EXPECT_EQ(zigzag[0].y, 0);
  EXPECT_EQ(zigzag[4].y, 0);
  // Each inner point mixes its unsmoothed neighbours: 4/2, then (4 + 4) / 4 + 0, then 2.
  EXPECT_EQ(zigzag[1].y, 2);
  EXPECT_EQ(zigzag[2].y, 2);
  EXPECT_EQ(zigzag[3].y, 2);
  // Points within pointMergeDistance of the smoothed one before stay where they are.
  ZvPoint2fArray dense = Line({P(0, 0), P(0.2f, 0.6f), P(0.4f, 0), P(0.6f, 0.6f)});
  SmoothTrailingInputPoints(gc, 0, 3, dense);
  EXPECT_EQ(dense[1].y, 0.6f);
  EXPECT_EQ(dense[2].y, 0.0f);
}

TEST(PathBuilderSteps, TangentsFollowTheTravel) {
  // On the unit circle: counter-clockwise up at (1, 0), left at (0, 1); clockwise down at (1, 0).
  const ZvPoint2<float> a = P(1, 0), b = P(0, 1), c = P(-1, 0);
  EXPECT_GT(ZvPoint2_TangentToCircumCircle(a, b, c, 0).y, 0);
  EXPECT_LT(ZvPoint2_TangentToCircumCircle(a, b, c, 1).x, 0);
  EXPECT_LT(ZvPoint2_TangentToCircumCircle(c, b, a, 2).y, 0);
  EXPECT_EQ(ZvPoint2_TangentToCircumCircle(P(0, 0), P(1, 0), P(2, 0), 2).x, 1);  // collinear
  // A stroke's start turning sharply takes the circle's tangent, unless told not to.
  const ZvPoint2fArray turn = Line({a, b, c});
  EXPECT_NEAR(EstimateTangentDirection(turn, 0, 1, 0, 0).y, 1, 1e-6);
  EXPECT_NEAR(EstimateTangentDirection(turn, 0, 1, 0, 1).x, -std::sqrt(0.5), 1e-6);
  EXPECT_NEAR(EstimateTangentDirection(turn, 1, 0, 0, 0).x, -1, 1e-6);
  EXPECT_EQ(EstimateTangentDirection(turn, 3, 0, 0, 0).x, 0);
}

TEST(LinearPathBuilder, RunsAlongALineBecomeOneEdge) {
  ZvGC gc;
  ZvPath2f path;
  ZvLinearPathBuilder builder(gc, &path);
  builder.StartSubpath(P(0, 0));
  builder.AddInputPoint(P(3, 0), 0);
  for (int i = 2; i <= 10; ++i)
    builder.AddInputPoint(P(3.0f * i, 0.1f * (i % 2)), 0);  // wobbles well within 0.5
  builder.EndSubpath(P(30, 0), 0);
  ASSERT_EQ(path.NumPoints(), 2u);
  EXPECT_EQ(path.GetPoint(1).x, 30);

  // Doubling back on the line ends the run even though the cross term is 0.
  path.Clear();
  builder.StartSubpath(P(0, 0));
  builder.AddInputPoint(P(10, 0), 0);
  builder.AddInputPoint(P(20, 0), 0);
  builder.AddInputPoint(P(5, 0), 0);
  builder.EndSubpath(P(5, 0), 0);
  ASSERT_EQ(path.NumPoints(), 3u);
  EXPECT_EQ(path.GetPoint(1).x, 11.25f);  // the turning point, smoothed: 20 / 2 + 5 / 4
  EXPECT_EQ(path.GetPoint(2).x, 5);

  // Points within pointMergeDistance are dropped unless forced.
  path.Clear();
  builder.StartSubpath(P(0, 0));
  builder.AddInputPoint(P(0.3f, 0.3f), 0);
  builder.AddInputPoint(P(0.2f, 0.4f), 1);
  builder.EndSubpath(P(0.2f, 0.4f), 0);
  EXPECT_EQ(path.NumPoints(), 2u);
}

TEST(LinearPathBuilder, StartAndEndAtOnePointGiveALoneMoveto) {
  ZvGC gc;
  ZvPath2f path;
  ZvLinearPathBuilder builder(gc, &path);
  for (int close = 0; close < 2; ++close) {
    path.Clear();
    builder.StartSubpath(P(5, 5));
    const ZvPoint2fArray& samples = builder.EndSubpath(P(5, 5), close);
    EXPECT_EQ(path.NumPoints(), 1u);
    EXPECT_EQ(path.NumSegments(), 1u);
    ASSERT_EQ(samples.size, 1u);
    EXPECT_EQ(samples[0].x, 5);
  }
  // A closed triangle gets its closing edge.
  path.Clear();
  builder.StartSubpath(P(0, 0));
  builder.AddInputPoint(P(10, 0), 0);
  builder.AddInputPoint(P(10, 10), 0);
  builder.EndSubpath(P(10, 10), 1);
  EXPECT_EQ(path.NumPoints(), 4u);
  EXPECT_TRUE(path.IsSubpathClosed(0));
}

TEST(LinearPathBuilder, TheTransformMapsTheInput) {
  ZvGC gc;
  gc.transform.Translate(100, 0, 0);
  gc.transform.Scale(2, 2, 1);
  ZvPath2f path;
  ZvLinearPathBuilder builder(gc, &path);
  builder.StartSubpath(P(1, 1));
  builder.EndSubpath(P(1, 5), 0);
  EXPECT_EQ(path.GetPoint(0).x, 102);
  EXPECT_EQ(path.GetPoint(1).y, 10);
}

TEST(CubicPathBuilder, TheLastEdgeWaitsForTheNextPoint) {
  ZvGC gc;
  gc.sampleSpacing = 2;
  gc.pointMergeDistance = 100;  // no smoothing: forced points only
  ZvPath2f path;
  ZvCubicPathBuilder builder(gc, &path);
  builder.StartSubpath(P(0, 0));
  builder.AddInputPoint(P(10, 0), 1);
  builder.AddInputPoint(P(20, 5), 1);
  builder.AddInputPoint(P(30, 0), 1);
  const ZvPoint2fArray& first = builder.GetTrailingSamples();
  // Edges 0-1 and 1-2 are drawn; 2-3 needs the tangent at 3.
  ASSERT_EQ(path.NumPoints(), 7u);
  EXPECT_EQ(path.GetPoint(6).x, 20);
  EXPECT_GT(first.size, 10u);
  // Handles run 0.4 of the chord along the tangents: at the start the circle through the
  // first three points, at point 1 the direction from point 0 to point 2.
  const ZvPoint2<float> h = path.GetPoint(5) - path.GetPoint(6);
  EXPECT_NEAR(std::hypot(h.x, h.y), 0.4 * std::hypot(10, 5), 1e-4);
  const ZvPoint2<float> h1 = path.GetPoint(2) - path.GetPoint(3);
  EXPECT_NEAR(h1.y / h1.x, 0.25, 1e-6);
  // Nothing new: an empty batch, and the path unchanged.
  EXPECT_EQ(builder.GetTrailingSamples().size, 0u);
  EXPECT_EQ(path.NumPoints(), 7u);
  builder.AddInputPoint(P(40, 0), 1);
  builder.GetTrailingSamples();
  EXPECT_EQ(path.NumPoints(), 10u);
  builder.EndSubpath(P(40, 0), 1);
  EXPECT_EQ(path.NumPoints(), 16u);  // the edge into 40 and the one back to the start
  EXPECT_TRUE(path.IsSubpathClosed(0));
}

TEST(PathBuilders, LiveStrokesOnlyGrowThePathAndSampleIt) {
  ZvGC gc;
  gc.sampleSpacing = 4;
  std::mt19937 rng(17);
  for (int kind = 0; kind < 2; ++kind) {
    for (int live = 0; live < 2; ++live) {
      ZvPath2f path;
      ZvLinearPathBuilder linear(gc, &path);
      ZvCubicPathBuilder cubic(gc, &path);
      ZvBasePathBuilder& builder = kind ? static_cast<ZvBasePathBuilder&>(cubic) : linear;
      const std::vector<ZvPoint2<float>> samples =
          Feed(builder, PenStroke(rng, 100, 3.0, 0.3), live != 0);
      SCOPED_TRACE(kind ? "cubic" : "linear");
      ExpectEvenSamples(samples, path, gc.sampleSpacing, gc.flattenTolerance);
    }
  }
}

TEST(PathBuilders, WildInputEndsWithoutHarm) {
  // Not a number and infinities: every builder comes back, and the path starts where the pen
  // did.
  ZvGC gc;
  const float nan = std::nanf(""), inf = HUGE_VALF;
  ZvPoint2fArray stroke;
  for (const ZvPoint2<float>& p :
       {P(0, 0), P(nan, 1), P(2, 2), P(inf, 0), P(3, 3), P(-inf, nan), P(4, 4), P(5, 5)})
    stroke.Add(p);
  for (int kind = 0; kind < 3; ++kind) {
    for (int live = 0; live < 2; ++live) {
      ZvPath2f path;
      ZvLinearPathBuilder linear(gc, &path);
      ZvCubicPathBuilder cubic(gc, &path);
      ZvBezierFitPathBuilder fit(gc, &path, 32.0, 2.0, 1.0, 3);
      ZvBasePathBuilder* builders[3] = {&linear, &cubic, &fit};
      Feed(*builders[kind], stroke, live != 0);
      ASSERT_GE(path.NumPoints(), 1u);
      EXPECT_EQ(path.GetPoint(0).x, 0);
    }
  }
  // A jump to 1e30 asks for more samples than an array holds: the allocation failure.
  ZvPath2f path;
  ZvLinearPathBuilder builder(gc, &path);
  builder.StartSubpath(P(0, 0));
  builder.AddInputPoint(P(1e30f, 0), 0);
  EXPECT_THROW(builder.EndSubpath(P(1e30f, 0), 0), std::bad_alloc);
}
