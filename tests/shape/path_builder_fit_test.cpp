// The fitting path builder: densifying, corners, and the quality of its fits on pen strokes,
// fed point by point with samples taken live or only at the end.
#include <zv/bezier_fit.h>
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/path_builder.h>
#include <zv/polyline.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <random>

#include "path_builder_feed.h"
#include "path_fixtures.h"
#include "shape/path_builder_steps.h"
#include "tests/curvemath/bezier_fit_strokes.h"

namespace {
struct FitProbe : ZvBezierFitPathBuilder {
  using ZvBezierFitPathBuilder::ZvBezierFitPathBuilder;
  const ZvPoint2fArray& Input() const { return inputPoints; }
  const ZvBoolArray& Corners() const { return cornerFlags; }
};

// The fits' own closeness test, applied to every segment of the final path against the input
// points between its end nodes (found in order among the builder's input): flattened at half
// the tolerance, each inner input point against the curve point at the same arc length. Returns
// the smallest tolerance every segment passes, to 1e-6.
double WorstSegmentDistance(const ZvPath2f& path, const ZvPoint2fArray& input) {
  ZvDoubleArray chords;
  ZvPoint2fArray_ComputeChordLength(input, 0, input.size - 1, chords);
  ZvBezierTool tool;
  double worst = 0.0;
  unsigned int k = 0;  // the input index of the segment's start node
  for (unsigned int i = 1; i < path.NumPoints();) {
    unsigned int a, b;
    path.GetSegmentIndices(i, a, b);
    const ZvPoint2<float> end = path.GetPoint(b);
    unsigned int k2 = k + 1;
    while (k2 < input.size && (input[k2].x != end.x || input[k2].y != end.y))
      ++k2;
    if (k2 == input.size) {
      ADD_FAILURE() << "node " << b << " is no input point";
      return HUGE_VAL;
    }
    ZvPoint2<float> control[9];
    path.GetPoints(a, b, control);
    ZvPoint2fArray flat;
    ZvDoubleArray flatChords;
    tool.Flatten(control, 0, b - a, 0.5, &flat, 0);
    ZvPoint2fArray_ComputeChordLength(flat, 0, flat.size - 1, flatChords);
    double lo = 0.0, hi = 100.0;
    unsigned int index;
    while (hi - lo > 1e-6) {
      const double mid = 0.5 * (lo + hi);
      const int close = ZvPoint2fArray_PolylinesAreClose(flat, flatChords, 0, flat.size - 1, input,
                                                         chords, k, k2, mid, index);
      (close ? hi : lo) = mid;
    }
    worst = std::max(worst, hi);
    k = k2;
    i = b + 1;
  }
  return worst;
}

// The largest distance of a pen point from the path.
double WorstPenDistance(const ZvPath2f& path, const ZvPoint2fArray& stroke) {
  ZvPoint2fArray fine(2048);
  ZvPointTagArray tags(2048);
  path.AltFlatten(0.02, fine, tags);
  double worst = 0.0;
  for (unsigned int i = 0; i < stroke.size; ++i)
    worst = std::max(worst, Nearest(stroke[i], fine, 0, fine.size));
  return worst;
}
}  // namespace

// 200 strokes as in the fitting benchmark: smooth random curves walked about 3 px a point, with
// 0.3 px of noise, 300 points each; densified to 2 px, fitted within 1 px.
TEST(BezierFitPathBuilder, PenStrokesStayWithinTheFitTolerance) {
  ZvGC gc;
  for (int live = 0; live < 2; ++live) {
    std::mt19937 rng(20261122);
    double worstSegment = 0.0, worstPen = 0.0, segments = 0.0;
    for (int s = 0; s < 200; ++s) {
      const ZvPoint2fArray stroke = PenStroke(rng, 300, 3.0, 0.3);
      ZvPath2f path(1024);
      FitProbe builder(gc, &path, 32.0, 2.0, 1.0, 3);
      Feed(builder, stroke, live != 0);
      ASSERT_FALSE(::testing::Test::HasFailure()) << "stroke " << s;
      EXPECT_LE(path.LargestDegree(), 3u);
      worstSegment = std::max(worstSegment, WorstSegmentDistance(path, builder.Input()));
      worstPen = std::max(worstPen, WorstPenDistance(path, stroke));
      segments += path.NumSegments() - 1;
    }
    // Each segment is within the tolerance of the smoothed input it was made from; the raw
    // pen points, whose noise the smoothing took out, may lie a little farther.
    EXPECT_LE(worstSegment, 1.0);
    EXPECT_LE(worstPen, 2.0);
    std::printf(
        "[ figures  ] %s: %.1f segments per stroke, worst segment %.4f, worst pen point "
        "%.4f\n",
        live ? "samples after every point" : "samples at the end", segments / 200, worstSegment,
        worstPen);
  }
}

TEST(BezierFitPathBuilder, LiveSamplesRunEvenlyAlongThePath) {
  ZvGC gc;
  gc.sampleSpacing = 3;
  gc.flattenTolerance = 0.25;  // samples follow the flattened path: fine enough to paint along
  std::mt19937 rng(5);
  for (int s = 0; s < 10; ++s) {
    ZvPath2f path(1024);
    ZvBezierFitPathBuilder builder(gc, &path, 32.0, 2.0, 1.0, 3);
    ExpectEvenSamples(Feed(builder, PenStroke(rng, 200, 3.0, 0.3), true), path, gc.sampleSpacing,
                      gc.flattenTolerance);
  }
}

TEST(BezierFitPathBuilder, HigherDegreesAndClosedStrokes) {
  ZvGC gc;
  std::mt19937 rng(9);
  for (int close = 0; close < 2; ++close) {
    for (int live = 0; live < 2; ++live) {
      ZvPath2f path(1024);
      FitProbe builder(gc, &path, 32.0, 2.0, 1.0, 5);
      Feed(builder, PenStroke(rng, 200, 3.0, 0.3), live != 0, close);
      EXPECT_LE(path.LargestDegree(), 5u);
      EXPECT_LE(WorstSegmentDistance(path, builder.Input()), 1.0);
      EXPECT_EQ(path.IsSubpathClosed(0), close);
      const ZvPoint2<float> a = path.GetPoint(0), b = path.GetPoint(path.NumPoints() - 1);
      EXPECT_EQ(close != 0, a.x == b.x && a.y == b.y);
    }
  }
}

TEST(BezierFitPathBuilder, DensifiesShortEdgesOnly) {
  ZvGC gc;
  ZvPath2f path;
  FitProbe builder(gc, &path, 20.0, 2.0, 1.0, 3);
  builder.StartSubpath(P(0, 0));
  const unsigned int added = cAddPts;
  builder.AddInputPoint(P(10, 0), 0);  // points at 2, 4, 6, 8
  EXPECT_EQ(cAddPts - added, 4u);
  EXPECT_EQ(builder.Input().size, 6u);
  EXPECT_EQ(builder.Input()[2].x, 4);
  builder.AddInputPoint(P(10, 30), 0);  // 30 is beyond the long chord distance
  EXPECT_EQ(builder.Input().size, 7u);
  // A densified point near the new one gives way to it: 3.2, 6.4 and 9.6, the last replaced.
  FitProbe wide(gc, &path, 20.0, 3.2, 1.0, 3);
  wide.StartSubpath(P(0, 0));
  const unsigned int before = cAddPts;
  wide.AddInputPoint(P(10, 0), 0);
  EXPECT_EQ(cAddPts - before, 2u);
  ASSERT_EQ(wide.Input().size, 4u);
  EXPECT_EQ(wide.Input()[3].x, 10);
}

TEST(BezierFitPathBuilder, TurnsBeyondARightAngleAreCorners) {
  ZvGC gc;
  // A triangle's vertices turn by 120 degrees: corners, kept as path nodes, and with no
  // smoothing passing them.
  const ZvPoint2<float> v[4] = {P(0, 0), P(60, 0), P(30, 51.961525f), P(0, 0)};
  for (int live = 0; live < 2; ++live) {
    ZvPath2f path;
    FitProbe builder(gc, &path, 100.0, 2.0, 1.0, 3);
    builder.StartSubpath(v[0]);
    for (int k = 1; k < 4; ++k) {
      builder.AddInputPoint(v[k], 0);
      if (live) builder.GetTrailingSamples();
    }
    builder.EndSubpath(v[0], 1);
    const ZvPoint2fArray& in = builder.Input();
    for (int k = 1; k < 3; ++k) {
      unsigned int i = 0;
      while (i < in.size && (in[i].x != v[k].x || in[i].y != v[k].y))
        ++i;
      ASSERT_LT(i, in.size) << "vertex " << k << " moved";
      EXPECT_EQ(builder.Corners()[i], 1) << "vertex " << k;
      EXPECT_EQ(builder.Corners()[i + 1], 0);
      unsigned int node = 0;
      ASSERT_TRUE(path.GetClosePointIndex(v[k], &node));
      EXPECT_EQ(path.GetPoint(node).x, v[k].x);
      EXPECT_FALSE(path.IsG1Continuous(node));
    }
  }
  // A turn of exactly 90 degrees has a dot product of 0: no corner.
  ZvPath2f path;
  FitProbe builder(gc, &path, 100.0, 2.0, 1.0, 3);
  builder.StartSubpath(P(0, 0));
  builder.AddInputPoint(P(20, 0), 0);
  builder.AddInputPoint(P(20, 20), 0);
  builder.EndSubpath(P(20, 20), 0);
  for (unsigned int i = 0; i < builder.Corners().size; ++i)
    EXPECT_EQ(builder.Corners()[i], 0) << i;
}
