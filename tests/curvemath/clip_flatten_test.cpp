// Tags and flags of clipped flattening against Empty, Infinite and Regular extents.
#include <gtest/gtest.h>
#include <zv/bezier_tool.h>

#include <cmath>
#include <random>
#include <utility>

namespace {

using P2 = ZvPoint2<double>;
using Extent = ZvExtent2<double>;

struct Tagged {
  ZvPoint2dArray points{1};
  ZvPointTagArray tags{1};
  ZvBoolArray flags{1};

  void Add(const P2& q, ZvPointTag tag, int flag) {
    points.Add(q);
    tags.Add(tag);
    flags.Add(flag);
  }
  void ClipAndFlatten(const P2* p, const Extent& e) {
    ZvBezierTool_ClipAndFlattenCubic2d(p, 0.25, e, &points, &tags, &flags);
  }
  int ClipAndAdd(P2 a, P2 b, const Extent& e) {
    return ClipAndAddLineSegment(a, b, e, points, tags, flags);
  }
};

const P2 kCurve[4] = {{0, 0}, {0, 40}, {100, 40}, {100, 0}};  // arch up to y = 30
const Extent kInfinite(0, 0, 0, 0, Extent::Infinite);

void ExpectSame(const P2& a, const P2& b) {
  EXPECT_TRUE(a.x == b.x && a.y == b.y) << a.x << "," << a.y << " vs " << b.x << "," << b.y;
}

TEST(ClipAndAddLineSegment, StartsContinuesOrBreaksPieces) {
  const Extent box(0, 0, 10, 10);
  Tagged t;
  EXPECT_EQ(t.ClipAndAdd({1, 1}, {2, 2}, box), 1);          // first piece: a and b
  EXPECT_EQ(t.ClipAndAdd({2, 2 + 1e-10}, {3, 2}, box), 1);  // joins at the last point
  EXPECT_EQ(t.ClipAndAdd({-5, 5}, {5, 5}, box), 1);         // a new piece, clipped at x = 0
  EXPECT_EQ(t.ClipAndAdd({20, 20}, {30, 30}, box), 0);      // nothing left, nothing added
  ASSERT_EQ(t.points.size, 5u);
  const ZvPointTag tags[] = {ZvPointTag_First, ZvPointTag_Continue, ZvPointTag_Last,
                             ZvPointTag_First, ZvPointTag_Continue};
  for (unsigned int i = 0; i < 5; ++i) {
    EXPECT_EQ(t.tags[i], tags[i]) << i;
    EXPECT_EQ(t.flags[i], 1) << i;  // the broken piece keeps flag 1 on its last vertex
  }
  ExpectSame(t.points[3], {0, 5});
}

TEST(ClipAndFlattenCubic2d, EmptyExtentLeavesAllArraysAlone) {
  Tagged t;
  t.Add({7, 7}, ZvPointTag_First, 1);
  t.ClipAndFlatten(kCurve, Extent());
  EXPECT_TRUE(t.points.size == 1 && t.tags.size == 1 && t.flags.size == 1);
  EXPECT_EQ(t.tags[0], ZvPointTag_First);
}

TEST(ClipAndFlattenCubic2d, UnclippedPathIsThePlainFlattenTagged) {
  ZvPoint2dArray plain(1);
  const unsigned int n = ZvBezierTool_FlattenCubic2d(kCurve, 0.25, &plain, 0);
  for (const Extent& e : {kInfinite, Extent(0, 0, 100, 40)}) {  // control box inside: inclusive
    Tagged t;
    t.ClipAndFlatten(kCurve, e);
    ASSERT_EQ(t.points.size, n);
    for (unsigned int i = 0; i < n; ++i) {
      ExpectSame(t.points[i], plain[i]);
      EXPECT_EQ(t.tags[i], i == 0 ? ZvPointTag_First : ZvPointTag_Continue);
      EXPECT_EQ(t.flags[i], 1);
    }
  }
}

TEST(ClipAndFlattenCubic2d, UnclippedPathJoinsOrBreaksWithFlagZero) {
  Tagged t;
  t.ClipAndFlatten(kCurve, kInfinite);
  const unsigned int n = t.points.size;
  // Starts where the first ended: no repeated vertex, no new piece.
  const P2 next[4] = {{100, 0}, {110, -10}, {120, -10}, {130, 0}};
  t.ClipAndFlatten(next, kInfinite);
  EXPECT_EQ(t.tags[n], ZvPointTag_Continue);
  ExpectSame(t.points[n - 1], {100, 0});
  EXPECT_NE(t.points[n].x, 100.0);
  // Starts elsewhere: the previous piece ends with tag Last and flag 0.
  const unsigned int m = t.points.size;
  const P2 apart[4] = {{500, 0}, {510, 0}, {520, 0}, {530, 0}};
  t.ClipAndFlatten(apart, kInfinite);
  EXPECT_TRUE(t.tags[m - 1] == ZvPointTag_Last && t.flags[m - 1] == 0);
  EXPECT_TRUE(t.tags[m] == ZvPointTag_First && t.flags[m] == 1);
  ExpectSame(t.points[m], apart[0]);
}

TEST(ClipAndFlattenCubic2d, CurveLeavingTheExtentSplitsIntoClippedPieces) {
  const Extent box(-10, -10, 110, 20);  // the arch rises through y = 20 and comes back
  Tagged t;
  t.ClipAndFlatten(kCurve, box);
  ASSERT_GT(t.points.size, 4u);
  unsigned int firsts = 0, lasts = 0, onTop = 0;
  for (unsigned int i = 0; i < t.points.size; ++i) {
    const P2& q = t.points[i];
    EXPECT_TRUE(q.x >= box.xmin && q.x <= box.xmax && q.y >= box.ymin && q.y <= box.ymax) << i;
    EXPECT_EQ(t.flags[i], 1);
    firsts += t.tags[i] == ZvPointTag_First;
    lasts += t.tags[i] == ZvPointTag_Last;
    onTop += q.y == 20.0;  // clip points land exactly on the side
  }
  EXPECT_TRUE(firsts == 2 && lasts == 1 && onTop == 2) << firsts << lasts << onTop;
  ExpectSame(t.points[0], kCurve[0]);
  ExpectSame(t.points[t.points.size - 1], kCurve[3]);

  Tagged outside;
  outside.ClipAndFlatten(kCurve, Extent(200, 200, 300, 300));
  EXPECT_EQ(outside.points.size, 0u);
}

// A curve wholly beyond one side of the extent is not flattened at all; the result must be the
// plain one (every chord of the whole flattening clipped in turn) also for curves that end a
// hair's breadth from the side, at any scale.
TEST(ClipAndFlattenCubic2d, SkippingCurvesBeyondASideChangesNothing) {
  std::mt19937 rng(11);
  std::uniform_real_distribution<double> u(-1.0, 1.0);
  for (int round = 0; round < 4000; ++round) {
    const double scale = std::pow(10.0, round % 13 - 6);
    const Extent box(-scale, -scale, scale, scale);
    // Control points around a side, some exactly on it or one rounding step beyond.
    P2 c[4];
    for (P2& q : c) {
      q = {u(rng) * scale, scale + u(rng) * scale * (round % 3 == 0 ? 1e-9 : 0.5)};
      if (round % 7 == 0) q.y = std::nextafter(scale, 2 * scale);
    }
    if (round % 2) std::swap(c[0].x, c[0].y);
    Tagged fast, plain;
    fast.ClipAndFlatten(c, box);
    ZvPoint2dArray line(32);
    ZvBezierTool_FlattenCubic2d(c, 0.25, &line, 0);
    for (unsigned int i = 1; i < line.size; ++i)
      plain.ClipAndAdd(line[i - 1], line[i], box);
    ASSERT_EQ(fast.points.size, plain.points.size) << round;
    for (unsigned int i = 0; i < fast.points.size; ++i) {
      ExpectSame(fast.points[i], plain.points[i]);
      EXPECT_EQ(fast.tags[i], plain.tags[i]);
    }
  }
}

// Gamma piece y = 1 - x^2 over [0, 1], visible from x = 0.25 to x = 0.71.
const P2 kGamma[4] = {{0, 1}, {0.25, 0.9375}, {0.71, 1 - 0.71 * 0.71}, {1, 0}};

TEST(ClipAndFlattenGamma, WellFormedPieceIsWalkedFromP1) {
  ZvPoint2dArray plain(1);
  ZvBezierTool_FlattenGamma(kGamma, 0.01, &plain, 0);
  Tagged t;
  // The walk is taken even though the extent cuts it: a well-formed piece is not clipped.
  ZvBezierTool_ClipAndFlattenGamma(kGamma, 0.01, Extent(0, 0, 0.5, 1), &t.points, &t.tags,
                                   &t.flags);
  // The same walk, with P1 in place of P0 at its head.
  ASSERT_EQ(t.points.size, plain.size);
  ExpectSame(t.points[0], kGamma[1]);
  EXPECT_EQ(t.tags[0], ZvPointTag_First);
  for (unsigned int i = 1; i < t.points.size; ++i) {
    ExpectSame(t.points[i], plain[i]);
    EXPECT_EQ(t.tags[i], ZvPointTag_Continue);
  }
}

TEST(ClipAndFlattenGamma, IllFormedPieceAddsItsClippedChord) {
  // P2.x - P1.x = 0.46 is below the tolerance 0.5.
  Tagged t;
  ZvBezierTool_ClipAndFlattenGamma(kGamma, 0.5, Extent(0, 0, 0.5, 1), &t.points, &t.tags, &t.flags);
  ASSERT_EQ(t.points.size, 2u);
  ExpectSame(t.points[0], kGamma[1]);
  EXPECT_EQ(t.points[1].x, 0.5);

  Tagged infinite;  // an Infinite extent walks it regardless
  ZvBezierTool_ClipAndFlattenGamma(kGamma, 0.5, kInfinite, &infinite.points, &infinite.tags,
                                   &infinite.flags);
  EXPECT_GT(infinite.points.size, 2u);

  Tagged empty;
  ZvBezierTool_ClipAndFlattenGamma(kGamma, 0.5, Extent(), &empty.points, &empty.tags, &empty.flags);
  EXPECT_EQ(empty.points.size, 0u);
}

}  // namespace
