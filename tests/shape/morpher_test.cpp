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

const double kPi = 3.14159265358979323846;

// Appends a closed circle of four cubics starting at its rightmost point.
void AddCircle(ZvPath2f& path, float cx, float cy, float r) {
  const float k = 0.5522847498f * r;
  path.Moveto(P(cx + r, cy));
  path.Curveto(P(cx + r, cy + k), P(cx + k, cy + r), P(cx, cy + r));
  path.Curveto(P(cx - k, cy + r), P(cx - r, cy + k), P(cx - r, cy));
  path.Curveto(P(cx - r, cy - k), P(cx - k, cy - r), P(cx, cy - r));
  path.Curveto(P(cx + k, cy - r), P(cx + r, cy - k), P(cx + r, cy));
  path.Closeto();
}

ZvPath2f Circle(float cx, float cy, float r) {
  ZvPath2f path;
  AddCircle(path, cx, cy, r);
  return path;
}

// Two circles of radius 10, 60 apart.
ZvPath2f TwoCircles() {
  ZvPath2f path;
  AddCircle(path, -30, 0, 10);
  AddCircle(path, 30, 0, 10);
  return path;
}

// A closed square of the given side about (cx, cy), turned by `degrees`, starting at a corner.
ZvPath2f Square(float cx, float cy, float side, double degrees) {
  const double a = degrees * kPi / 180.0, h = side / 2.0;
  const double corners[5][2] = {{-h, -h}, {h, -h}, {h, h}, {-h, h}, {-h, -h}};
  ZvPath2f path;
  for (int i = 0; i < 5; ++i) {
    const double x = corners[i][0], y = corners[i][1];
    const ZvPoint2<float> p = P(static_cast<float>(cx + x * std::cos(a) - y * std::sin(a)),
                                static_cast<float>(cy + x * std::sin(a) + y * std::cos(a)));
    if (i == 0)
      path.Moveto(p);
    else
      path.Lineto(i == 4 ? path.GetPoint(0) : p);
  }
  path.Closeto();
  return path;
}

// A fine polyline of a path with its tags, for measuring.
struct Fine {
  ZvPoint2fArray points;
  ZvPointTagArray tags;
  explicit Fine(const ZvPath2f& path) { path.AltFlatten(0.01, points, tags); }
};

double Length(const ZvPath2f& path) {
  Fine f(path);
  double sum = 0.0;
  for (unsigned int i = 0; i + 1 < f.points.size; ++i)
    if (f.tags[i] != ZvPointTag_Last)
      sum += std::hypot(double(f.points[i + 1].x) - f.points[i].x,
                        double(f.points[i + 1].y) - f.points[i].y);
  return sum;
}

double DistanceToSegment(const ZvPoint2<float>& p, const ZvPoint2<float>& a,
                         const ZvPoint2<float>& b) {
  const double dx = double(b.x) - a.x, dy = double(b.y) - a.y;
  const double l2 = dx * dx + dy * dy;
  double u = l2 > 0.0 ? ((double(p.x) - a.x) * dx + (double(p.y) - a.y) * dy) / l2 : 0.0;
  u = std::min(1.0, std::max(0.0, u));
  return std::hypot(a.x + u * dx - p.x, a.y + u * dy - p.y);
}

// Largest distance from a point of one fine polyline to the other, both ways.
double Hausdorff(const ZvPath2f& x, const ZvPath2f& y) {
  const Fine fx(x), fy(y);
  double worst = 0.0;
  for (int pass = 0; pass < 2; ++pass) {
    const Fine& from = pass ? fy : fx;
    const Fine& to = pass ? fx : fy;
    for (unsigned int i = 0; i < from.points.size; ++i) {
      double best = 1e300;
      for (unsigned int j = 0; j + 1 < to.points.size; ++j)
        if (to.tags[j] != ZvPointTag_Last)
          best = std::min(best, DistanceToSegment(from.points[i], to.points[j], to.points[j + 1]));
      worst = std::max(worst, best);
    }
  }
  return worst;
}

// Subpath `k` of a path, as a path of its own.
ZvPath2f SubpathOf(const ZvPath2f& path, unsigned int k) {
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  for (unsigned int i = 0; i <= k; ++i)
    it.GetNextSubPathIndices(first, last);
  return ZvPath2f(path, first, last);
}

unsigned int SubpathStart(const ZvPath2f& path, unsigned int k) {
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  for (unsigned int i = 0; i <= k; ++i)
    it.GetNextSubPathIndices(first, last);
  return first;
}

// A property curve of three keys along the whole length of the subpath holding `index`.
void SetRamp(ZvPath2fProp1d& path, unsigned int index, double v0, double v1, double v2) {
  unsigned int first = 0, last = 0;
  path.GetSubpathIndices(index, first, last);
  const double l = Length(ZvPath2f(path, first, last));
  ZvPoint2dArray keys;
  keys.Add(P2d{0.0, v0});
  keys.Add(P2d{l / 2, v1});
  keys.Add(P2d{l, v2});
  path.SetPropCurve(index, keys, 1e-6);
}

// The curves of two subpaths agree at the same fraction of their parameter ranges.
void ExpectSameProfile(const ZvPath2fProp1d& out, unsigned int outIndex, const ZvPath2fProp1d& end,
                       unsigned int endIndex, double tolerance) {
  ASSERT_TRUE(out.HasPropCurve(outIndex));
  const double lo = out.GetLargestArcLength(outIndex), le = end.GetLargestArcLength(endIndex);
  for (int k = 0; k <= 20; ++k) {
    const double f = k / 20.0;
    EXPECT_NEAR(out.EvalPropCurve(outIndex, f * lo), end.EvalPropCurve(endIndex, f * le), tolerance)
        << "at fraction " << f;
  }
}

// The point halfway along a polyline of two edges.
P2d Halfway(const ZvPath2f& arch) {
  const ZvPoint2<float> p = arch.GetPoint(0), q = arch.GetPoint(1), r = arch.GetPoint(2);
  const double l0 = std::hypot(double(q.x) - p.x, double(q.y) - p.y);
  const double l1 = std::hypot(double(r.x) - q.x, double(r.y) - q.y);
  const double h = (l0 + l1) / 2;
  if (h <= l0) return P2d{p.x + (double(q.x) - p.x) * h / l0, p.y + (double(q.y) - p.y) * h / l0};
  const double f = (h - l0) / l1;
  return P2d{q.x + (double(r.x) - q.x) * f, q.y + (double(r.y) - q.y) * f};
}

// How far a morph result may stray from the shape it should match: one step s for flattening
// the input, one for the refit, whose error bound is s.
double ShapeTolerance(const ZvGC& gc) {
  return 2 * gc.pointMergeDistance;
}

}  // namespace

TEST(Morpher, LinearAndTurtleMorphsMeetTheirEnds) {
  ZvGC gc;
  ZvPath2fProp1d a(Circle(0, 0, 20));
  ZvPath2fProp1d b(Square(60, 0, 30, 0));
  SetRamp(a, 0, 1.0, 4.0, 2.0);
  SetRamp(b, 0, 5.0, 0.5, 3.0);
  ASSERT_FALSE(a.IsSiblingOf(b));
  ZvMorpher morpher(&a, &b, gc);
  for (int turtle = 0; turtle < 2; ++turtle) {
    for (double t : {0.0, 1.0}) {
      SCOPED_TRACE(testing::Message() << (turtle ? "turtle" : "linear") << " at " << t);
      ZvPath2fProp1d out;
      ASSERT_EQ(turtle ? morpher.TurtleMorph(t, out) : morpher.LinearMorph(t, out), 1);
      const ZvPath2fProp1d& end = t == 0.0 ? a : b;
      ASSERT_EQ(out.NumSubpaths(), 1u);
      // A fit of the end, not the end itself.
      EXPECT_FALSE(out.IsSiblingOf(end));
      EXPECT_LE(Hausdorff(out, end), ShapeTolerance(gc));
      // Both ends are closed: the linear fit closes, the turtle's walk is always open.
      EXPECT_EQ(out.IsSubpathClosed(0), turtle ? 0 : 1);
      ExpectSameProfile(out, 0, end, 0, gc.propertyTolerance);
    }
  }
}

TEST(Morpher, LinearMorphOfSiblingsBlendsControlPoints) {
  ZvGC gc;
  ZvPath2fProp1d a(Circle(0, 0, 20)), b(Circle(10, 5, 30));
  SetRamp(a, 0, 1.0, 2.0, 3.0);
  SetRamp(b, 0, 3.0, 2.0, 1.0);
  ZvPath2fProp1d out;
  ASSERT_EQ(ZvMorpher(&a, &b, gc).LinearMorph(0.5, out), 1);
  ASSERT_TRUE(out.IsSiblingOf(a));
  EXPECT_TRUE(out.IsSubpathClosed(0));
  for (unsigned int i = 0; i < a.NumPoints(); ++i) {
    EXPECT_NEAR(out.GetPoint(i).x, 0.5 * (a.GetPoint(i).x + b.GetPoint(i).x), 1e-5);
    EXPECT_NEAR(out.GetPoint(i).y, 0.5 * (a.GetPoint(i).y + b.GetPoint(i).y), 1e-5);
  }
  // Opposite ramps meet in the middle all along.
  EXPECT_NEAR(out.EvalPropCurve(0, 0.0), 2.0, gc.propertyTolerance);
  EXPECT_NEAR(out.EvalPropCurve(0, 0.5 * out.GetLargestArcLength(0)), 2.0, gc.propertyTolerance);
}

TEST(Morpher, EqualCountsPairSubpathsAndCarryOneSidedCurves) {
  ZvGC gc;
  // Subpath 0: closed against open fits open whatever t. Subpath 1: both closed, curve on A only.
  ZvPath2f shapeA = Circle(0, 0, 20), shapeB = Segment(0, 40, 60, 40);
  AddCircle(shapeA, 100, 0, 10);
  AddCircle(shapeB, 100, 0, 15);
  ZvPath2fProp1d a(shapeA), b(shapeB);
  const unsigned int secondA = SubpathStart(a, 1);
  a.SetPropCurve(secondA, ZvRawFCurve(0.0, 2.0, 30.0, 7.0));
  ZvMorpher morpher(&a, &b, gc);
  for (double t : {0.0, 0.3, 1.0}) {
    SCOPED_TRACE(t);
    ZvPath2fProp1d out;
    ASSERT_EQ(morpher.LinearMorph(t, out), 1);
    ASSERT_EQ(out.NumSubpaths(), 2u);
    EXPECT_FALSE(out.IsSubpathClosed(0));
    const unsigned int second = SubpathStart(out, 1);
    EXPECT_TRUE(out.IsSubpathClosed(second));
    EXPECT_FALSE(out.HasPropCurve(0));
    // Only A has a curve there: it is copied as it stands, not faded towards B.
    ASSERT_TRUE(out.HasPropCurve(second));
    for (double p : {0.0, 10.0, 30.0})
      EXPECT_DOUBLE_EQ(out.EvalPropCurve(second, p), a.EvalPropCurve(secondA, p));
  }
}

TEST(Morpher, TurtleKeepsTheLengthOfATurningShape) {
  ZvGC gc;
  const ZvPath2fProp1d square(Square(0, 0, 40, 0));
  const double side = 40.0, length = Length(square);
  std::mt19937 g(21);
  std::uniform_real_distribution<double> turn(0.0, 360.0), ratio(0.05, 0.95);
  for (int trial = 0; trial < 20; ++trial) {
    const double degrees = turn(g), t = ratio(g);
    SCOPED_TRACE(testing::Message() << degrees << " degrees at " << t);
    const ZvPath2fProp1d turned(Square(0, 0, 40, degrees));
    ZvPath2fProp1d out;
    ASSERT_EQ(ZvMorpher(&square, &turned, gc).TurtleMorph(t, out), 1);
    // The walk is exactly as long as the square; only the fit's rounding of corners may differ.
    EXPECT_NEAR(Length(out), length, ShapeTolerance(gc));
  }
  // A quarter turn: the linear blend pulls every corner halfway to the next one, which shrinks
  // the square by cos 45; the turtle walks the same sides in blended directions.
  const ZvPath2fProp1d quarter(Square(0, 0, 40, 90));
  ZvMorpher morpher(&square, &quarter, gc);
  ZvPath2fProp1d linear, turtle;
  ASSERT_EQ(morpher.LinearMorph(0.5, linear), 1);
  ASSERT_EQ(morpher.TurtleMorph(0.5, turtle), 1);
  EXPECT_NEAR(Length(linear), length * std::sqrt(0.5), ShapeTolerance(gc));
  EXPECT_NEAR(Length(turtle), length, ShapeTolerance(gc));
  // The turtle's first side is straight and keeps its length.
  Fine walk(turtle);
  ZvDoubleArray chords;
  ZvPoint2fArraySingleComponent_ComputeChordLength(walk.points, chords);
  unsigned int corner = 0;
  while (chords[corner] < side - 2 * gc.pointMergeDistance)
    ++corner;
  const ZvPoint2<float> start = walk.points[0], at = walk.points[corner];
  EXPECT_NEAR(std::hypot(double(at.x) - start.x, double(at.y) - start.y), chords[corner],
              gc.pointMergeDistance);
}

TEST(Morpher, UnequalSubpathCountsGiveOnePiecePerFacingStretch) {
  ZvGC gc;
  // Two circles of length c against one of length 2c: each of A's circles faces half of B's.
  ZvPath2fProp1d a(TwoCircles()), b(Circle(0, 0, 20));
  const unsigned int secondA = SubpathStart(a, 1);
  a.SetPropCurve(0, ZvRawFCurve(0.0, 2.0));
  a.SetPropCurve(secondA, ZvRawFCurve(0.0, 4.0));
  b.SetPropCurve(0, ZvRawFCurve(0.0, 6.0));
  ZvMorpher morpher(&a, &b, gc);

  ZvPath2fProp1d start;
  ASSERT_EQ(morpher.LinearMorph(0.0, start), 1);
  ASSERT_EQ(start.NumSubpaths(), 2u);
  for (unsigned int k = 0; k < 2; ++k) {
    SCOPED_TRACE(k);
    EXPECT_TRUE(start.IsSubpathClosed(SubpathStart(start, k)));
    EXPECT_LE(Hausdorff(SubpathOf(start, k), SubpathOf(a, k)), ShapeTolerance(gc));
  }

  // At the far end the pieces are the two open halves of B, together B itself.
  ZvPath2fProp1d end;
  ASSERT_EQ(morpher.LinearMorph(1.0, end), 1);
  ASSERT_EQ(end.NumSubpaths(), 2u);
  EXPECT_FALSE(end.IsSubpathClosed(0));
  EXPECT_FALSE(end.IsSubpathClosed(SubpathStart(end, 1)));
  EXPECT_LE(Hausdorff(end, b), ShapeTolerance(gc));
  EXPECT_NEAR(Length(SubpathOf(end, 0)), Length(SubpathOf(end, 1)), ShapeTolerance(gc));

  // Single-key curves blend as constants, each piece with the curve of its own subpath of A.
  ZvPath2fProp1d quarter;
  ASSERT_EQ(morpher.LinearMorph(0.25, quarter), 1);
  ASSERT_EQ(quarter.NumSubpaths(), 2u);
  const unsigned int secondPiece = SubpathStart(quarter, 1);
  for (double p : {0.0, 5.0, 50.0}) {
    EXPECT_NEAR(quarter.EvalPropCurve(0, p), 0.75 * 2.0 + 0.25 * 6.0, 1e-12);
    EXPECT_NEAR(quarter.EvalPropCurve(secondPiece, p), 0.75 * 4.0 + 0.25 * 6.0, 1e-12);
  }
  // Against a side with no curve, A's values are carried over unfaded.
  const ZvPath2fProp1d bare(Circle(0, 0, 20));
  ZvPath2fProp1d oneSided;
  ASSERT_EQ(ZvMorpher(&a, &bare, gc).LinearMorph(0.25, oneSided), 1);
  ASSERT_EQ(oneSided.NumSubpaths(), 2u);
  EXPECT_NEAR(oneSided.EvalPropCurve(0, 5.0), 2.0, 1e-12);
  EXPECT_NEAR(oneSided.EvalPropCurve(SubpathStart(oneSided, 1), 5.0), 4.0, 1e-12);
}

TEST(Morpher, UnequalCountPiecesReadTheirOwnStretchOfTheCurve) {
  ZvGC gc;
  ZvPath2fProp1d a(TwoCircles()), b(Circle(0, 0, 20));
  const double c = Length(SubpathOf(a, 0));
  a.SetPropCurve(0, ZvRawFCurve(0.0, 1.0, c, 2.0));
  a.SetPropCurve(SubpathStart(a, 1), ZvRawFCurve(0.0, 3.0, c, 4.0));
  b.SetPropCurve(0, ZvRawFCurve(0.0, 0.0, 2 * c, 10.0));
  ZvMorpher morpher(&a, &b, gc);
  // At t = 1 the second piece carries the second half of B's ramp, from its middle value on.
  ZvPath2fProp1d end;
  ASSERT_EQ(morpher.LinearMorph(1.0, end), 1);
  ASSERT_EQ(end.NumSubpaths(), 2u);
  const unsigned int secondPiece = SubpathStart(end, 1);
  EXPECT_NEAR(end.EvalPropCurve(0, 0.0), 0.0, gc.propertyTolerance);
  EXPECT_NEAR(end.EvalPropCurve(secondPiece, 0.0), 5.0, gc.propertyTolerance);
  EXPECT_NEAR(end.EvalPropCurve(secondPiece, end.GetLargestArcLength(secondPiece)), 10.0,
              gc.propertyTolerance);
  // At t = 0 each piece is A's own ramp.
  ZvPath2fProp1d start;
  ASSERT_EQ(morpher.LinearMorph(0.0, start), 1);
  ExpectSameProfile(start, 0, a, 0, gc.propertyTolerance);
  ExpectSameProfile(start, SubpathStart(start, 1), a, SubpathStart(a, 1), gc.propertyTolerance);
}

TEST(Morpher, SideWithoutLengthSharesItsStepsEvenly) {
  ZvGC gc;
  ZvPath2f points;
  points.Moveto(P(-5, 0));
  points.Moveto(P(5, 0));
  const ZvPath2fProp1d a(points), b(Circle(0, 0, 20));
  ZvPath2fProp1d out;
  ASSERT_EQ(ZvMorpher(&a, &b, gc).LinearMorph(1.0, out), 1);
  ASSERT_EQ(out.NumSubpaths(), 2u);
  // Each lone point faces half of the circle.
  EXPECT_NEAR(Length(SubpathOf(out, 0)), 20 * kPi, ShapeTolerance(gc));
  EXPECT_NEAR(Length(SubpathOf(out, 1)), 20 * kPi, ShapeTolerance(gc));
}

TEST(Morpher, MotionPathMorphCarriesTheSectionEnds) {
  ZvGC gc;
  // A: an open zigzag; B: the same zigzag moved far away and scaled up.
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

  // Along two arches, the section's ends are at the arches' middles halfway.
  ZvPath2f arch0, arch1;
  arch0.Moveto(P(10, 5));
  arch0.Lineto(P(65, 60));
  arch0.Lineto(P(120, 10));
  arch1.Moveto(P(30, 5));
  arch1.Lineto(P(95, 70));
  arch1.Lineto(P(160, 10));
  ZvMorpher carried(&a, &b, gc);
  carried.SetMotionPath(1, 1, &arch0);
  carried.SetMotionPath(3, 3, &arch1);
  ZvPath2fProp1d half;
  ASSERT_EQ(carried.LinearMotionPathMorph(0.5, half), 1);
  ASSERT_EQ(half.NumSubpaths(), 1u);
  const ZvPoint2<float> first = half.GetPoint(0), last = half.GetPoint(half.NumPoints() - 1);
  const P2d m0 = Halfway(arch0), m1 = Halfway(arch1);
  EXPECT_NEAR(first.x, m0.x, 1e-3);
  EXPECT_NEAR(first.y, m0.y, 1e-3);
  EXPECT_NEAR(last.x, m1.x, 1e-3);
  EXPECT_NEAR(last.y, m1.y, 1e-3);
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
    // A similarity keeps the angles: the unit square's corner stays square.
    const P2d o = t.Map(P2d{0, 0}), x = t.Map(P2d{1, 0}), y = t.Map(P2d{0, 1});
    EXPECT_NEAR((x.x - o.x) * (y.x - o.x) + (x.y - o.y) * (y.y - o.y), 0.0, 1e-9);
  }
  // A segment of no length cannot be mapped: the transform keeps what it held.
  ZvTransfo4 kept;
  kept.Translate(3.0, 4.0, 0.0);
  const ZvTransfo4 before(kept);
  EXPECT_EQ(SetToSimilarityXY(kept, P2d{1, 1}, P2d{0, 0}, P2d{1, 1}, P2d{5, 5}), 0);
  EXPECT_EQ(SetToSimilarityXY(kept, P2d{1, 1}, P2d{0, 0}, P2d{2, 2}, P2d{0, 0}), 0);
  for (unsigned int r = 0; r < 4; ++r)
    for (unsigned int col = 0; col < 4; ++col)
      EXPECT_EQ(kept.GetMatrixElement(r, col), before.GetMatrixElement(r, col));
}

TEST(Morpher, UnusableStepsAreRefusedWithoutTouchingOutput) {
  const ZvPath2fProp1d a(Circle(0, 0, 20)), b(Square(0, 0, 30, 0));
  ZvPath2fProp1d huge(Segment(0, 0, 1e30f, 0));
  ZvGC gc;
  for (double step : {0.0, -1.0, std::nan("")}) {
    gc.pointMergeDistance = step;
    ZvMorpher morpher(&a, &b, gc);
    morpher.SetMotionPath(0, 0, nullptr);
    morpher.SetMotionPath(2, 2, nullptr);
    ZvPath2fProp1d out;
    EXPECT_EQ(morpher.LinearMorph(0.5, out), 0);
    EXPECT_EQ(morpher.TurtleMorph(0.5, out), 0);
    EXPECT_EQ(morpher.LinearMotionPathMorph(0.5, out), 0);
    EXPECT_EQ(out.NumPoints(), 0u);
  }
  // A resampling that would need more steps than allowed.
  gc.pointMergeDistance = 0.5;
  ZvPath2fProp1d out(Segment(1, 2, 3, 4));
  EXPECT_EQ(ZvMorpher(&a, &huge, gc).LinearMorph(0.5, out), 0);
  EXPECT_EQ(ZvMorpher(&a, &huge, gc).TurtleMorph(0.5, out), 0);
  EXPECT_EQ(out.NumPoints(), 2u);
  // Motion path morphs need two section ends.
  ZvMorpher lonely(&a, &b, gc);
  lonely.SetMotionPath(0, 0, nullptr);
  EXPECT_EQ(lonely.LinearMotionPathMorph(0.5, out), 0);
  EXPECT_EQ(out.NumPoints(), 2u);
}
