#include <zv/polyline.h>

#include <gtest/gtest.h>

#include <cmath>
#include <initializer_list>
#include <vector>

namespace {

template <class A, class V>
A Make(std::initializer_list<V> values) {
  A a(1);
  for (const auto& v : values)
    a.Add(v);
  return a;
}

ZvPoint2fArray Poly2f(std::initializer_list<ZvPoint2<float>> p) {
  return Make<ZvPoint2fArray>(p);
}
ZvPoint2dArray Poly2d(std::initializer_list<ZvPoint2<double>> p) {
  return Make<ZvPoint2dArray>(p);
}
ZvPointTagArray Tags(std::initializer_list<int> tags) {
  ZvPointTagArray a(1);
  for (int t : tags)
    a.Add(ZvPointTag(t));
  return a;
}

ZvDoubleArray Chords(const ZvPoint2fArray& a) {
  ZvDoubleArray chords(1);
  ZvPoint2fArraySingleComponent_ComputeChordLength(a, chords);
  return chords;
}

std::vector<double> Values(const ZvDoubleArray& a) {
  return std::vector<double>(a.data, a.data + a.size);
}

std::vector<float> Coordinates(const ZvPoint2fArray& a) {
  std::vector<float> v;
  for (unsigned int i = 0; i < a.size; ++i)
    v.insert(v.end(), {a[i].x, a[i].y});
  return v;
}

TEST(PolylineTests, NeighbourAndOrderTestsUseTheirOwnTolerances) {
  EXPECT_EQ(ZvPoint2fArray_ConsecutivePointsDiffer(ZvPoint2fArray(1)), 1);
  EXPECT_EQ(ZvPoint2fArray_ConsecutivePointsDiffer(Poly2f({{1, 1}, {1, 1.00000005f}})), 0);
  EXPECT_EQ(ZvPoint2fArray_ConsecutivePointsDiffer(Poly2f({{0, 0}, {0, 1e-6f}})), 1);
  EXPECT_EQ(ZvPoint2dArray_ConsecutivePointsDiffer(Poly2d({{0, 0}, {5e-10, 0}})), 0);
  EXPECT_EQ(ZvPoint2dArray_ConsecutivePointsDiffer(Poly2d({{0, 0}, {5e-9, 0}, {0, 0}})), 1);
  EXPECT_EQ(ZvPoint2dArray_IsStrictlyIncreasingX(Poly2d({{0, 5}, {1, -5}, {2, 0}})), 1);
  EXPECT_EQ(ZvPoint2dArray_IsStrictlyIncreasingX(Poly2d({{0, 0}, {1, 0}, {1, 1}})), 0);
  EXPECT_EQ(ZvPoint2dArray_IsStrictlyIncreasingX(Poly2d({{0, 0}, {1e-10, 0}})), 0);
}

TEST(PolylineTests, FilterDropsRepeatsButKeepsPiecesTerminated) {
  // Piece 1 ends on a repeat; piece 2 is a single point; piece 3 repeats inside.
  const ZvPoint2dArray in =
      Poly2d({{0, 0}, {1, 0}, {1, 1e-10}, {5, 5}, {5, 5}, {7, 7}, {7, 7}, {8, 7}, {9, 9}});
  const ZvPointTagArray tags = Tags({0, 1, 2, 0, 2, 0, 1, 1, 2});
  ZvPoint2dArray out(1);
  ZvPointTagArray outTags(1);
  ASSERT_EQ(ZvPoint2dArray_Filter(in, tags, out, outTags), 1);
  std::vector<double> xs;
  std::vector<int> kept;
  for (unsigned int i = 0; i < out.size; ++i) {
    xs.push_back(out[i].x);
    kept.push_back(outTags[i]);
  }
  EXPECT_EQ(xs, (std::vector<double>{0, 1, 5, 5, 7, 8, 9}));
  EXPECT_EQ(kept, (std::vector<int>{0, 2, 0, 2, 0, 1, 2}));
  EXPECT_EQ(ZvPoint2dArray_Filter(in, Tags({0, 1}), out, outTags), 0);
  EXPECT_EQ(out.size, 7u);
}

TEST(PolylineTests, EndTangentsAreUnitUnlessTheEdgeIsNull) {
  const ZvPoint2<double> first = ZvPoint2dArray_FirstTangent(Poly2d({{1, 1}, {4, 5}, {4, 6}}));
  EXPECT_DOUBLE_EQ(first.x, 0.6);
  EXPECT_DOUBLE_EQ(first.y, 0.8);
  const ZvPoint2<double> last =
      ZvPoint2dArray_LastTangent(Poly2d({{1, 1}, {4, 5}, {4, 5 + 1e-10}}));
  EXPECT_NEAR(last.y, 1e-10, 1e-15);
  // 1e-5 long is below the guarded length but still has a direction.
  EXPECT_DOUBLE_EQ(ZvPoint2dArray_LastTangent(Poly2d({{0, 0}, {-1e-5, 0}})).x, -1.0);
}

TEST(PolylineChords, RangeAndTaggedTablesAppendGuardedLengths) {
  const ZvPoint2fArray a = Poly2f({{9, 9}, {0, 0}, {3, 4}, {3, 4.00000762939453125f}, {3, 9}});
  ZvDoubleArray out(1);
  out.Add(-1.0);
  ASSERT_EQ(ZvPoint2fArray_ComputeChordLength(a, 1, 4, out), 1);
  // 2^-17 apart counts as no length at all.
  EXPECT_NEAR(Values(out)[4], 10.0, 1e-5);
  out.Chop(4);
  EXPECT_EQ(Values(out), (std::vector<double>{-1, 0, 5, 5}));
  EXPECT_EQ(ZvPoint2fArray_ComputeChordLength(a, 3, 2, out), 0);
  EXPECT_EQ(ZvPoint2fArray_ComputeChordLength(a, 0, 5, out), 0);
  EXPECT_EQ(out.size, 4u);
  // Pieces: the jump from one to the next adds nothing.
  ZvDoubleArray tagged(1);
  ASSERT_EQ(ZvPoint2fArray_ComputeChordLength(a, Tags({0, 0, 2, 0, 2}), tagged), 1);
  EXPECT_TRUE(Values(tagged)[2] == 5.0 && Values(tagged)[3] == 5.0);
  EXPECT_EQ(ZvPoint2fArraySingleComponent_ComputeLength(Poly2f({{0, 0}, {0, 3}, {4, 6}})), 8.0);
}

TEST(PolylineChords, IncrementalTableFollowsMovedAndAppendedVertices) {
  ZvPoint2fArray a = Poly2f({{0, 0}, {1, 0}, {2, 0}});
  ZvDoubleArray chords(1);
  ASSERT_EQ(ZvPoint2fArray_ComputeIncrementalChordLength(a, 0, 2, chords), 1);
  EXPECT_EQ(Values(chords), (std::vector<double>{0, 1, 2}));
  // Vertex 2 moves and two more arrive: entries from 2 on are measured again.
  a[2] = {1, 3};
  a.Add(ZvPoint2<float>{1, 5});
  a.Add(ZvPoint2<float>{4, 9});
  ASSERT_EQ(ZvPoint2fArray_ComputeIncrementalChordLength(a, 1, 4, chords), 1);
  EXPECT_EQ(Values(chords), (std::vector<double>{0, 1, 4, 6, 11}));
  ZvDoubleArray tooShort(1);
  tooShort.Add(0.0);
  EXPECT_EQ(ZvPoint2fArray_ComputeIncrementalChordLength(a, 2, 4, tooShort), 0);
  EXPECT_EQ(tooShort.size, 1u);
}

TEST(PolylineArcLength, PositionHitsEndsAndVerticesExactly) {
  ZvPoint3dArray a(1);
  a.Add(0.1, 0.2, 0.3);
  a.Add(1.1, 0.2, 0.3);
  a.Add(1.1, 2.2, 0.3);
  ZvDoubleArray chords(1);
  const double total = ZvPoint3dArraySingleComponent_ComputeChordLength(a, chords);
  // The ends and the vertex come out bit for bit; between vertices it interpolates.
  const struct {
    double s;
    ZvPoint3<double> expected;
  } cases[] = {{0.0, a[0]}, {total, a[2]}, {chords[1], a[1]}, {2.0, {1.1, 1.2, 0.3}}};
  ZvPoint3<double> p{};
  for (const auto& c : cases) {
    ASSERT_EQ(ZvPoint3dArraySingleComponent_ComputePosition(a, chords, c.s, p), 1);
    EXPECT_TRUE(p.x == c.expected.x && p.z == c.expected.z) << c.s;
    EXPECT_DOUBLE_EQ(p.y, c.expected.y);
  }
  chords.Chop(2);
  EXPECT_EQ(ZvPoint3dArraySingleComponent_ComputePosition(a, chords, 2.0, p), 0);
}

TEST(PolylineArcLength, EvenSubdivisionSpacesPointsEquallyAlongThePath) {
  const ZvPoint2fArray a = Poly2f({{0, 0}, {3, 0}, {3, 1}, {3, 1}, {3, 5}});  // 8 long
  ZvPoint2fArray out(1);
  ASSERT_EQ(ZvPoint2fArraySingleComponent_EvenSubdivide(a, Chords(a), 8, out), 1);
  ASSERT_EQ(out.size, 9u);
  for (unsigned int k = 0; k < 9; ++k) {
    EXPECT_NEAR(out[k].x, k < 3 ? k : 3, 1e-6) << k;
    EXPECT_NEAR(out[k].y, k < 3 ? 0 : k - 3.0, 1e-6) << k;
  }
  ZvPoint2fArray ends(1);
  ASSERT_EQ(ZvPoint2fArraySingleComponent_EvenSubdivide(a, Chords(a), 1, ends), 1);
  EXPECT_EQ(Coordinates(ends), (std::vector<float>{0, 0, 3, 5}));
  const ZvPoint2fArray dot = Poly2f({{2, 2}, {2, 2.00001f}});
  ZvPoint2fArray copies(1);
  ASSERT_EQ(ZvPoint2fArraySingleComponent_EvenSubdivide(dot, Chords(dot), 2, copies), 1);
  EXPECT_EQ(Coordinates(copies), (std::vector<float>{2, 2, 2, 2, 2, 2}));
  EXPECT_EQ(ZvPoint2fArraySingleComponent_EvenSubdivide(a, Chords(a), 0, copies), 0);
}

TEST(PolylineBlend, LerpToleranceIsLooseAtZeroAndTightAtOne) {
  const ZvPoint2fArray a = Poly2f({{0, 0}, {-1e12f, 1}});
  const ZvPoint2fArray b = Poly2f({{10, 0}, {0, 21}});
  ZvPoint2fArray out = a;
  ASSERT_EQ(ZvPoint2fArraySingleComponent_Lerp(a, b, 1e-10, out), 1);
  EXPECT_EQ(out[1].x, -1e12f);
  ASSERT_EQ(ZvPoint2fArraySingleComponent_Lerp(a, b, 1.0 - 1e-10, out), 1);
  EXPECT_NEAR(out[1].x, -100.0f, 1e-3);
  ASSERT_EQ(ZvPoint2fArraySingleComponent_Lerp(a, b, 0.25, out), 1);
  EXPECT_TRUE(out[0].x == 2.5f && out[1].y == 6.0f);
  ZvPoint2fArray wrongSize(1);
  EXPECT_EQ(ZvPoint2fArraySingleComponent_Lerp(a, b, 0.5, wrongSize), 0);
}

TEST(PolylineBlend, RangedLerpPairsPointsByChordFraction) {
  // a's range: 3 points at 0, 1/4 and 1 of its length; b's range: 5 points up a line 8 long.
  const ZvPoint2fArray a = Poly2f({{-9, -9}, {0, 0}, {1, 0}, {4, 0}});
  ZvPoint2fArray b = Poly2f({{0, 0}, {0, 2}, {0, 4}, {0, 6}, {0, 8}, {5, 5}});
  ZvPoint2fArray out(1);
  ASSERT_EQ(ZvPoint2fArraySingleComponent_Lerp(a, 1, 3, b, 0, 4, 0.5, out), 1);
  EXPECT_EQ(Coordinates(out), (std::vector<float>{0, 0, 0.5f, 1, 2, 4}));
  ASSERT_EQ(ZvPoint2fArraySingleComponent_Lerp(a, 1, 3, b, 0, 4, 1.0, out), 1);
  EXPECT_EQ(Coordinates(out), (std::vector<float>{0, 0, 0, 2, 0, 8}));
  // Equal counts evenly spaced pair vertex with vertex, like the plain form.
  ASSERT_EQ(ZvPoint2fArraySingleComponent_Lerp(b, 0, 2, b, 2, 4, 0.5, out), 1);
  EXPECT_EQ(Coordinates(out), (std::vector<float>{0, 2, 0, 4, 0, 6}));
  EXPECT_EQ(ZvPoint2fArraySingleComponent_Lerp(a, 1, 4, b, 0, 4, 0.5, out), 0);
  EXPECT_EQ(ZvPoint2fArraySingleComponent_Lerp(a, 1, 3, b, 0, 4, 0.5, b), 0);
}

TEST(PolylineBlend, TurtleWalksEqualStepsWithBlendedHeadings) {
  // Blended with itself a polyline keeps its headings, but every step takes the first's length.
  const ZvPoint2fArray a = Poly2f({{1, 1}, {2, 1}, {2, 3}, {5, 3}});
  ZvPoint2fArray out = a;
  ASSERT_EQ(ZvPoint2fArraySingleComponent_TurtleInterp(a, a, 0.5, out), 1);
  const float expected[] = {1, 1, 2, 1, 2, 2, 3, 2};
  for (unsigned int i = 0; i < 8; ++i)
    EXPECT_NEAR(Coordinates(out)[i], expected[i], 1e-6) << i;
  // Headings of 350 and 10 degrees blend to 180, not 0.
  const double r = 3.141592653589793 / 180.0;
  const ZvPoint2fArray b = Poly2f({{0, 0}, {float(std::cos(350 * r)), float(std::sin(350 * r))}});
  const ZvPoint2fArray c = Poly2f({{0, 0}, {float(std::cos(10 * r)), float(std::sin(10 * r))}});
  ZvPoint2fArray turned = b;
  ASSERT_EQ(ZvPoint2fArraySingleComponent_TurtleInterp(b, c, 0.5, turned), 1);
  EXPECT_NEAR(turned[1].x, -1.0f, 1e-6);
  EXPECT_NEAR(turned[1].y, 0.0f, 1e-6);
}

TEST(PolylineClose, ComparesInnerVerticesAtEqualArcLength) {
  const ZvPoint2fArray a = Poly2f({{0, 0}, {10, 0}});
  unsigned int index = 99;
  // A single edge of b compares nothing.
  const ZvPoint2fArray far = Poly2f({{0, 50}, {10, 50}});
  EXPECT_EQ(
      ZvPoint2fArray_PolylinesAreClose(a, Chords(a), 0, 1, far, Chords(far), 0, 1, 0.1, index), 1);
  // The bump at vertex 2 is reported; a looser tolerance accepts it.
  const ZvPoint2fArray b = Poly2f({{0, 0}, {3, 0}, {4, 0.5f}, {6, 0}, {10, 0}});
  EXPECT_EQ(ZvPoint2fArray_PolylinesAreClose(a, Chords(a), 0, 1, b, Chords(b), 0, 4, 0.3, index),
            0);
  EXPECT_EQ(index, 2u);
  EXPECT_EQ(ZvPoint2fArray_PolylinesAreClose(a, Chords(a), 0, 1, b, Chords(b), 0, 4, 0.7, index),
            1);

  // Past a's end, b's vertices are held against a's last vertex.
  const ZvPoint2dArray shortA = Poly2d({{0, 0}, {2, 0}});
  const ZvPoint2dArray longB = Poly2d({{0, 0}, {1, 0}, {2, 0}, {2.05, 0}, {3, 0}, {4, 0}});
  ZvDoubleArray ca(1), cb(1);
  ZvPoint2dArray_ComputeChordLength(shortA, 0, 1, ca);
  ZvPoint2dArray_ComputeChordLength(longB, 0, 5, cb);
  EXPECT_EQ(ZvPoint2dArray_PolylinesAreClose(shortA, ca, 0, 1, longB, cb, 0, 5, 0.1, index), 0);
  EXPECT_EQ(index, 4u);
  index = 99;
  EXPECT_EQ(ZvPoint2dArray_PolylinesAreClose(shortA, ca, 0, 2, longB, cb, 0, 5, 0.1, index), 0);
  EXPECT_EQ(index, 99u);
}

TEST(PolylineProfile, EvalYInterpolatesWithinTheRangeOnly) {
  const ZvPoint2dArray a = Poly2d({{0, 1}, {1, 3}, {2, 2}, {4, 0}});
  std::vector<double> ys;
  for (double x : {0.0, 4.0, 2.0, 0.25, 3.0, -5.0, 9.0})
    ys.push_back(ZvPoint2dArray_EvalYInSortedArray(a, x));
  EXPECT_EQ(ys, (std::vector<double>{1, 0, 2, 1.5, 1, 1, 0}));
  EXPECT_EQ(ZvPoint2dArray_EvalYInSortedArray(ZvPoint2dArray(1), 1.0), 0.0);
}

TEST(PolylineExpand, GrowsWithRoundCornersAtTheDistance) {
  // One point gives a circle.
  ZvPoint2fArray dot = Poly2f({{1, 1}, {1, 1.001f}}), circle(1);
  ASSERT_EQ(ZvExpandConvexPolygon2D(dot, 2.0, 90.0, &circle), 1);
  ASSERT_EQ(circle.size, 4u);
  EXPECT_EQ(circle[0].x, 3.0f);
  EXPECT_NEAR(circle[1].y, 3.0f, 1e-6);
  EXPECT_NEAR(circle[2].x, -1.0f, 1e-6);

  // Counter-clockwise unit square, closed by a repeat of the first point.
  ZvPoint2fArray square = Poly2f({{0, 0}, {1, 0}, {1, 1}, {0, 1}, {0, 0}});
  ZvPoint2fArray out(1);
  ASSERT_EQ(ZvExpandConvexPolygon2D(square, 0.5, 30.0, &out), 1);
  // Per corner: the end of the incoming edge, two arc steps, the start of the outgoing edge.
  ASSERT_EQ(out.size, 16u);
  EXPECT_EQ(out[0].x, -0.5f);
  for (unsigned int i = 0; i < out.size; ++i) {
    const double dx = std::fmax(std::fmax(-out[i].x, out[i].x - 1.0), 0.0);
    const double dy = std::fmax(std::fmax(-out[i].y, out[i].y - 1.0), 0.0);
    EXPECT_NEAR(std::hypot(dx, dy), 0.5, 1e-6) << i;
    const ZvPoint2<float> p = out[i], q = out[(i + 1) % 16], r = out[(i + 2) % 16];
    EXPECT_GT(double(q.x - p.x) * (r.y - p.y) - double(q.y - p.y) * (r.x - p.x), 0.0) << i;
  }
  // No distance: the corners themselves, each once.
  ZvPoint2fArray flat(1);
  ASSERT_EQ(ZvExpandConvexPolygon2D(square, -1.0, 30.0, &flat), 1);
  EXPECT_EQ(flat.size, 4u);
  ZvPoint2fArray none(1), empty(1);
  EXPECT_EQ(ZvExpandConvexPolygon2D(square, 1.0, 0.0, &none), 0);
  EXPECT_TRUE(ZvExpandConvexPolygon2D(empty, 1.0, 10.0, &none) == 0 && none.size == 0);
}

}  // namespace
