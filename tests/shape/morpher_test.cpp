// Morphs between property paths: ends that meet the inputs, the turtle's kept length, the pieces
// of unequal subpath counts, sections carried along motion paths, and the blended curves.
#include <gtest/gtest.h>

#include <zv/gc.h>
#include <zv/morpher.h>
#include <zv/path2f_prop1d.h>
#include <zv/polyline.h>
#include <zv/raw_fcurve.h>
#include <zv/transfo4.h>

#include <algorithm>
#include <cmath>
#include <random>

#include "path_fixtures.h"

namespace {

using P2d = ZvPoint2<double>;

// Appends a closed circle of four cubics starting at its rightmost point.
ZvPath2f& AddCircle(ZvPath2f& path, float cx, float cy, float r) {
  const float k = 0.5522847498f * r;
  path.Moveto(P(cx + r, cy));
  path.Curveto(P(cx + r, cy + k), P(cx + k, cy + r), P(cx, cy + r));
  path.Curveto(P(cx - k, cy + r), P(cx - r, cy + k), P(cx - r, cy));
  path.Curveto(P(cx - r, cy - k), P(cx - k, cy - r), P(cx, cy - r));
  path.Curveto(P(cx + k, cy - r), P(cx + r, cy - k), P(cx + r, cy));
  path.Closeto();
  return path;
}

ZvPath2f Circle(float r) {
  ZvPath2f path;
  return AddCircle(path, 0, 0, r);
}

// A closed square of side 40 about the origin, turned by `degrees`, starting at a corner.
ZvPath2f Square(double degrees) {
  ZvPath2f path = ClosedSquare(-20, -20, 20, 20);
  path.Rotate(degrees, P(0, 0));
  return path;
}

// A fine polyline of a path, its pieces tagged.
struct Fine {
  ZvPoint2fArray points;
  ZvPointTagArray tags;
  explicit Fine(const ZvPath2f& path) { path.AltFlatten(0.01, points, tags); }
};

double Length(const ZvPath2f& path) {
  const Fine f(path);
  ZvDoubleArray chords;
  ZvPoint2fArray_ComputeChordLength(f.points, f.tags, chords);
  return chords[chords.size - 1];
}

// Largest distance from a point of one fine polyline to the other, both ways.
double Hausdorff(const ZvPath2f& x, const ZvPath2f& y) {
  const Fine fine[2] = {Fine(x), Fine(y)};
  double worst = 0.0;
  for (int pass = 0; pass < 2; ++pass) {
    const Fine &from = fine[pass], &to = fine[1 - pass];
    for (unsigned int i = 0; i < from.points.size; ++i) {
      const P2d p{from.points[i].x, from.points[i].y};
      double best = 1e300, d2 = 0.0, u = 0.0;
      for (unsigned int j = 0; j + 1 < to.points.size; ++j)
        if (to.tags[j] != ZvPointTag_Last &&
            ZvPoint2_FindClosestPointOnLineSegment(p, P2d{to.points[j].x, to.points[j].y},
                                                   P2d{to.points[j + 1].x, to.points[j + 1].y},
                                                   1e300, d2, u))
          best = std::min(best, d2);
      worst = std::max(worst, std::sqrt(best));
    }
  }
  return worst;
}

unsigned int SubpathStart(const ZvPath2f& path, unsigned int k) {
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  for (unsigned int i = 0; i <= k; ++i)
    it.GetNextSubPathIndices(first, last);
  return first;
}

ZvPath2f SubpathOf(const ZvPath2f& path, unsigned int k) {
  unsigned int first = 0, last = 0;
  path.GetSubpathIndices(SubpathStart(path, k), first, last);
  return ZvPath2f(path, first, last);
}

// The curves of two subpaths agree at the same fraction of their parameter ranges.
void ExpectSameProfile(const ZvPath2fProp1d& out, unsigned int outIndex, const ZvPath2fProp1d& end,
                       unsigned int endIndex, double tolerance) {
  ASSERT_TRUE(out.HasPropCurve(outIndex));
  const double lo = out.GetLargestArcLength(outIndex), le = end.GetLargestArcLength(endIndex);
  for (double f = 0.0; f <= 1.0; f += 0.05)
    EXPECT_NEAR(out.EvalPropCurve(outIndex, f * lo), end.EvalPropCurve(endIndex, f * le), tolerance)
        << "at fraction " << f;
}

// How far a morph result may stray from the shape it should match: one step s for flattening
// the input, one for the refit, whose error bound is s.
double ShapeTolerance(const ZvGC& gc) {
  return 2 * gc.pointMergeDistance;
}

}  // namespace

TEST(Morpher, LinearAndTurtleMorphsMeetTheirEnds) {
  ZvGC gc;
  ZvPath2fProp1d a(Circle(20)), b(Square(0));
  ZvPoint2dArray keys;
  for (double v : {1.0, 4.0, 2.0})
    keys.Add(P2d{keys.size * 60.0, v});
  a.SetPropCurve(0, keys, 1e-6);
  b.SetPropCurve(0, ZvRawFCurve(0.0, 5.0, 160.0, 0.5));
  ZvMorpher morpher(&a, &b, gc);
  for (int turtle = 0; turtle < 2; ++turtle) {
    for (double t : {0.0, 1.0}) {
      SCOPED_TRACE(testing::Message() << (turtle ? "turtle" : "linear") << " at " << t);
      ZvPath2fProp1d out;
      ASSERT_EQ(turtle ? morpher.TurtleMorph(t, out) : morpher.LinearMorph(t, out), 1);
      const ZvPath2fProp1d& end = t == 0.0 ? a : b;
      ASSERT_EQ(out.NumSubpaths(), 1u);
      EXPECT_FALSE(out.IsSiblingOf(end));  // a refit of the end, not the end itself
      EXPECT_LE(Hausdorff(out, end), ShapeTolerance(gc));
      // Both ends are closed: the linear fit closes, the turtle's walk is always open.
      EXPECT_EQ(out.IsSubpathClosed(0), turtle ? 0 : 1);
      ExpectSameProfile(out, 0, end, 0, gc.propertyTolerance);
    }
  }
}

TEST(Morpher, SiblingsBlendControlPointsAndPairedSubpathsKeepTheirOwnCurves) {
  ZvGC gc;
  ZvPath2fProp1d a(Circle(20)), b(Circle(30));
  b.Translate(P(10, 5));
  a.SetPropCurve(0, ZvRawFCurve(0.0, 1.0, 100.0, 3.0));
  b.SetPropCurve(0, ZvRawFCurve(0.0, 3.0, 100.0, 1.0));
  ZvPath2fProp1d blend;
  ASSERT_EQ(ZvMorpher(&a, &b, gc).LinearMorph(0.5, blend), 1);
  ASSERT_TRUE(blend.IsSiblingOf(a));
  EXPECT_TRUE(blend.IsSubpathClosed(0));
  for (unsigned int i = 0; i < a.NumPoints(); ++i) {
    EXPECT_NEAR(blend.GetPoint(i).x, 0.5 * (a.GetPoint(i).x + b.GetPoint(i).x), 1e-5);
    EXPECT_NEAR(blend.GetPoint(i).y, 0.5 * (a.GetPoint(i).y + b.GetPoint(i).y), 1e-5);
  }
  EXPECT_NEAR(blend.EvalPropCurve(0, 50.0), 2.0, gc.propertyTolerance);  // opposite ramps meet

  // Not siblings, two subpaths each. Subpath 0, closed against open, fits open whatever t.
  // Subpath 1, both closed, has a curve on A only, which is copied as it stands, not faded.
  ZvPath2f shapeA = Circle(20), shapeB = Segment(0, 40, 60, 40);
  ZvPath2fProp1d c(AddCircle(shapeA, 100, 0, 10)), d(AddCircle(shapeB, 100, 0, 15));
  const unsigned int secondC = SubpathStart(c, 1);
  c.SetPropCurve(secondC, ZvRawFCurve(0.0, 2.0, 30.0, 7.0));
  ZvMorpher morpher(&c, &d, gc);
  for (double t : {0.0, 0.3, 1.0}) {
    SCOPED_TRACE(t);
    ZvPath2fProp1d out;
    ASSERT_EQ(morpher.LinearMorph(t, out), 1);
    ASSERT_EQ(out.NumSubpaths(), 2u);
    const unsigned int second = SubpathStart(out, 1);
    EXPECT_FALSE(out.IsSubpathClosed(0));
    EXPECT_TRUE(out.IsSubpathClosed(second));
    EXPECT_FALSE(out.HasPropCurve(0));
    ASSERT_TRUE(out.HasPropCurve(second));
    for (double p : {0.0, 10.0, 30.0})
      EXPECT_DOUBLE_EQ(out.EvalPropCurve(second, p), c.EvalPropCurve(secondC, p));
  }
}

TEST(Morpher, TurtleKeepsTheLengthOfATurningShape) {
  ZvGC gc;
  const ZvPath2fProp1d square(Square(0));
  const double length = Length(square);
  std::mt19937 g(21);
  std::uniform_real_distribution<double> turn(0.0, 360.0), ratio(0.05, 0.95);
  for (int trial = 0; trial < 20; ++trial) {
    const double degrees = turn(g), t = ratio(g);
    SCOPED_TRACE(testing::Message() << degrees << " degrees at " << t);
    const ZvPath2fProp1d turned(Square(degrees));
    ZvPath2fProp1d out;
    ASSERT_EQ(ZvMorpher(&square, &turned, gc).TurtleMorph(t, out), 1);
    // The walk is exactly as long as the square; only the fit's rounding of corners may differ.
    EXPECT_NEAR(Length(out), length, ShapeTolerance(gc));
  }
  // A quarter turn: the linear blend pulls every corner halfway to the next one, which shrinks
  // the square by cos 45; the turtle walks sides of the same length in blended directions.
  const ZvPath2fProp1d quarter(Square(90));
  ZvMorpher morpher(&square, &quarter, gc);
  ZvPath2fProp1d linear, turtle;
  ASSERT_EQ(morpher.LinearMorph(0.5, linear), 1);
  ASSERT_EQ(morpher.TurtleMorph(0.5, turtle), 1);
  EXPECT_NEAR(Length(linear), length * std::sqrt(0.5), ShapeTolerance(gc));
  EXPECT_NEAR(Length(turtle), length, ShapeTolerance(gc));
  // Its first side is straight and keeps its length of 40.
  const Fine walk(turtle);
  ZvDoubleArray chords;
  ZvPoint2fArraySingleComponent_ComputeChordLength(walk.points, chords);
  unsigned int corner = 0;
  while (chords[corner] < 40.0 - ShapeTolerance(gc))
    ++corner;
  const ZvPoint2<float> start = walk.points[0], at = walk.points[corner];
  EXPECT_NEAR(std::hypot(double(at.x) - start.x, double(at.y) - start.y), chords[corner],
              gc.pointMergeDistance);
}

TEST(Morpher, UnequalSubpathCountsGiveOnePiecePerFacingStretch) {
  ZvGC gc;
  // Two circles of length c against one of length 2c: each of A's circles faces half of B's.
  ZvPath2f two;
  ZvPath2fProp1d a(AddCircle(AddCircle(two, -30, 0, 10), 30, 0, 10)), b(Circle(20));
  const unsigned int secondA = SubpathStart(a, 1);
  const double c = Length(SubpathOf(a, 0));
  a.SetPropCurve(0, ZvRawFCurve(0.0, 1.0, c, 2.0));
  a.SetPropCurve(secondA, ZvRawFCurve(0.0, 3.0, c, 4.0));
  b.SetPropCurve(0, ZvRawFCurve(0.0, 0.0, 2 * c, 10.0));
  ZvMorpher morpher(&a, &b, gc);

  ZvPath2fProp1d start, end;
  ASSERT_EQ(morpher.LinearMorph(0.0, start), 1);
  ASSERT_EQ(morpher.LinearMorph(1.0, end), 1);
  ASSERT_EQ(start.NumSubpaths(), 2u);
  ASSERT_EQ(end.NumSubpaths(), 2u);
  for (unsigned int k = 0; k < 2; ++k) {
    SCOPED_TRACE(k);
    // At t = 0 each piece is one of A's circles with its own curve.
    const unsigned int piece = SubpathStart(start, k);
    EXPECT_TRUE(start.IsSubpathClosed(piece));
    EXPECT_LE(Hausdorff(SubpathOf(start, k), SubpathOf(a, k)), ShapeTolerance(gc));
    ExpectSameProfile(start, piece, a, SubpathStart(a, k), gc.propertyTolerance);
    // At t = 1 the pieces are the open halves of B, each with its own half of B's ramp.
    const unsigned int half = SubpathStart(end, k);
    EXPECT_FALSE(end.IsSubpathClosed(half));
    EXPECT_NEAR(Length(SubpathOf(end, k)), c, ShapeTolerance(gc));
    EXPECT_NEAR(end.EvalPropCurve(half, 0.0), 5.0 * k, gc.propertyTolerance);
    EXPECT_NEAR(end.EvalPropCurve(half, end.GetLargestArcLength(half)), 5.0 * (k + 1),
                gc.propertyTolerance);
  }
  EXPECT_LE(Hausdorff(end, b), ShapeTolerance(gc));
  // Just past 0 the ends of a piece are apart but within a step: it is closed all the same.
  ZvPath2fProp1d early;
  ASSERT_EQ(morpher.LinearMorph(0.01, early), 1);
  EXPECT_TRUE(early.IsSubpathClosed(0));

  // Single-key curves blend as constants; against a side with no curve, A's are kept unfaded.
  a.SetPropCurve(0, ZvRawFCurve(0.0, 2.0));
  a.SetPropCurve(secondA, ZvRawFCurve(0.0, 4.0));
  b.SetPropCurve(0, ZvRawFCurve(0.0, 6.0));
  const ZvPath2fProp1d bare(Circle(20));
  ZvPath2fProp1d blended, oneSided;
  ASSERT_EQ(morpher.LinearMorph(0.25, blended), 1);
  ASSERT_EQ(ZvMorpher(&a, &bare, gc).LinearMorph(0.25, oneSided), 1);
  ASSERT_EQ(blended.NumSubpaths(), 2u);
  ASSERT_EQ(oneSided.NumSubpaths(), 2u);
  for (unsigned int k = 0; k < 2; ++k) {
    EXPECT_NEAR(blended.EvalPropCurve(SubpathStart(blended, k), 5.0), 0.75 * (2 + 2 * k) + 1.5,
                1e-12);
    EXPECT_NEAR(oneSided.EvalPropCurve(SubpathStart(oneSided, k), 5.0), 2.0 + 2 * k, 1e-12);
  }

  // A side of no length at all shares the steps evenly: each lone point faces half the circle.
  ZvPath2f points;
  points.Moveto(P(-5, 0));
  points.Moveto(P(5, 0));
  const ZvPath2fProp1d dots(points);
  ZvPath2fProp1d out;
  ASSERT_EQ(ZvMorpher(&dots, &b, gc).LinearMorph(1.0, out), 1);
  ASSERT_EQ(out.NumSubpaths(), 2u);
  EXPECT_NEAR(Length(SubpathOf(out, 0)), c, ShapeTolerance(gc));
  EXPECT_NEAR(Length(SubpathOf(out, 1)), c, ShapeTolerance(gc));
}

TEST(Morpher, MotionPathMorphCarriesTheSectionEnds) {
  ZvGC gc;
  // A: an open zigzag; B: the same zigzag scaled up and moved far away.
  ZvPath2f zigzag;
  zigzag.Moveto(P(0, 0));
  for (int i = 1; i <= 4; ++i)
    zigzag.Lineto(P(10.0f * i, i % 2 ? 5.0f : 0.0f));
  ZvPath2f bigger(zigzag);
  bigger.Scale(2.0, 2.0, P(0, 0));
  bigger.Translate(P(100, 0));
  const ZvPath2fProp1d a(zigzag), b(bigger);

  // Without motion paths, t = 0 gives a fit of A's section, moved nowhere.
  ZvMorpher still(&a, &b, gc);
  still.SetMotionPath(1, 1, nullptr);
  still.SetMotionPath(3, 3, nullptr);
  ZvPath2fProp1d out;
  ASSERT_EQ(still.LinearMotionPathMorph(0.0, out), 1);
  EXPECT_LE(Hausdorff(out, ZvPath2f(zigzag, 1, 3)), ShapeTolerance(gc));

  // Along two arches of two equal edges, the section's ends are at the arches' tops halfway.
  // The arches need not end on the shapes: their ends are replaced by the shapes' points.
  ZvPath2f arch0, arch1;
  arch0.Moveto(P(10, 5));
  arch0.Lineto(P(65, 60));
  arch0.Lineto(P(120, 5));
  arch1.Moveto(P(30, 5));
  arch1.Lineto(P(95, 70));
  arch1.Lineto(P(160, 5));
  ZvMorpher carried(&a, &b, gc);
  carried.SetMotionPath(1, 1, &arch0);
  carried.SetMotionPath(3, 3, &arch1);
  ZvPath2fProp1d half;
  ASSERT_EQ(carried.LinearMotionPathMorph(0.5, half), 1);
  ASSERT_EQ(half.NumSubpaths(), 1u);
  const ZvPoint2<float> first = half.GetPoint(0), last = half.GetPoint(half.NumPoints() - 1);
  EXPECT_NEAR(first.x, 65, 1e-3);
  EXPECT_NEAR(first.y, 60, 1e-3);
  EXPECT_NEAR(last.x, 95, 1e-3);
  EXPECT_NEAR(last.y, 70, 1e-3);
  // At t = 1 the ends are B's own points, not the arches' ends.
  ZvPath2fProp1d full;
  ASSERT_EQ(carried.LinearMotionPathMorph(1.0, full), 1);
  EXPECT_EQ(full.GetPoint(0).y, 10.0f);
  EXPECT_EQ(full.GetPoint(full.NumPoints() - 1).y, 10.0f);
}

TEST(Morpher, SimilarityMapsOneSegmentOntoAnother) {
  std::mt19937 g(5);
  std::uniform_real_distribution<double> d(-100.0, 100.0);
  for (int trial = 0; trial < 50; ++trial) {
    const P2d a{d(g), d(g)}, b{d(g), d(g)}, c{d(g), d(g)}, e{d(g), d(g)};
    ZvTransfo4 t;
    ASSERT_EQ(SetToSimilarityXY(t, a, b, c, e), 1);
    const P2d ma = t.Map(a), mc = t.Map(c);
    EXPECT_NEAR(ma.x, b.x, 1e-9);
    EXPECT_NEAR(ma.y, b.y, 1e-9);
    EXPECT_NEAR(mc.x, e.x, 1e-9);
    EXPECT_NEAR(mc.y, e.y, 1e-9);
    // A similarity keeps angles: the unit square's corner stays square.
    const P2d o = t.Map(P2d{0, 0}), x = t.Map(P2d{1, 0}), y = t.Map(P2d{0, 1});
    EXPECT_NEAR((x.x - o.x) * (y.x - o.x) + (x.y - o.y) * (y.y - o.y), 0.0, 1e-9);
  }
  // A segment of no length cannot be mapped: the transform keeps what it held.
  ZvTransfo4 kept;
  kept.Translate(3.0, 4.0, 0.0);
  const ZvTransfo4 before(kept);
  EXPECT_EQ(SetToSimilarityXY(kept, P2d{1, 1}, P2d{0, 0}, P2d{1, 1}, P2d{5, 5}), 0);
  EXPECT_EQ(SetToSimilarityXY(kept, P2d{1, 1}, P2d{0, 0}, P2d{2, 2}, P2d{0, 0}), 0);
  for (unsigned int k = 0; k < 16; ++k)
    EXPECT_EQ(kept.GetMatrixPtr()[k], before.GetMatrixPtr()[k]);
}

TEST(Morpher, UnusableStepsAreRefusedWithoutTouchingOutput) {
  const ZvPath2fProp1d a(Circle(20)), b(Square(0)), huge(Segment(0, 0, 1e30f, 0));
  ZvGC gc;
  ZvPath2fProp1d out(Segment(1, 2, 3, 4));
  for (double step : {0.0, -1.0, std::nan("")}) {
    gc.pointMergeDistance = step;
    ZvMorpher morpher(&a, &b, gc);
    morpher.SetMotionPath(0, 0, nullptr);
    morpher.SetMotionPath(2, 2, nullptr);
    EXPECT_EQ(morpher.LinearMorph(0.5, out), 0);
    EXPECT_EQ(morpher.TurtleMorph(0.5, out), 0);
    EXPECT_EQ(morpher.LinearMotionPathMorph(0.5, out), 0);
  }
  gc.pointMergeDistance = 0.5;
  // More steps than allowed, and a motion path morph with one section end only.
  ZvMorpher tooLong(&a, &huge, gc), lonely(&a, &b, gc);
  lonely.SetMotionPath(0, 0, nullptr);
  EXPECT_EQ(tooLong.LinearMorph(0.5, out), 0);
  EXPECT_EQ(tooLong.TurtleMorph(0.5, out), 0);
  EXPECT_EQ(lonely.LinearMotionPathMorph(0.5, out), 0);
  EXPECT_EQ(out.NumPoints(), 2u);
}
