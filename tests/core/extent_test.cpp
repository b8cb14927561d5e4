#include <zv/point.h>

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace {

using E2d = ZvExtent2<double>;
using P2d = ZvPoint2<double>;

TEST(ExtentUnion, KindsDecideBeforeCoordinates) {
  E2d empty, other_empty;
  empty.Union(other_empty);
  EXPECT_EQ(empty.kind, E2d::Empty);

  E2d inf(0, 0, 0, 0, E2d::Infinite);
  empty.Union(inf);
  EXPECT_EQ(empty.kind, E2d::Infinite);

  E2d a(0, 0, 1, 1);
  a.Union(inf);
  EXPECT_TRUE(a.kind == E2d::Infinite && a.xmax == 1.0);  // coordinates left alone

  E2d b;
  b.Union(E2d(2, 3, 4, 5));
  EXPECT_TRUE(b.kind == E2d::Regular && b.ymin == 3.0);
  b.Union(E2d(-1, 4, 3, 9));
  EXPECT_TRUE(b.xmin == -1 && b.ymin == 3 && b.xmax == 4 && b.ymax == 9);
}

TEST(ExtentAddPoint, GrowsFromEmptyAndIgnoresInfinite) {
  E2d e;
  e.AddPoint(P2d{2, 3});
  EXPECT_TRUE(e.kind == E2d::Regular && e.xmin == 2 && e.xmax == 2);
  e.AddPoint(P2d{-1, 5});
  e.AddPoint(P2d{4, 1});
  EXPECT_TRUE(e.xmin == -1 && e.xmax == 4 && e.ymin == 1 && e.ymax == 5);

  E2d inf(0, 0, 0, 0, E2d::Infinite);
  inf.AddPoint(P2d{10, 10});
  EXPECT_TRUE(inf.kind == E2d::Infinite && inf.xmax == 0.0);
}

TEST(ExtentClip, QuickAcceptLeavesPointsAlone) {
  const E2d box(0, 0, 10, 10);
  P2d p{0, 5}, q{0, 8};  // on the left edge
  EXPECT_EQ(box.ClipLineSegmentWhenRegular(p, q), 1);
  EXPECT_EQ(p.x, 0.0);
  P2d r{-5e-10, 2}, s{10 + 5e-10, 3};  // pokes out by less than 1e-9
  EXPECT_EQ(box.ClipLineSegmentWhenRegular(r, s), 1);
  EXPECT_TRUE(r.x == -5e-10 && s.x == 10 + 5e-10);
}

TEST(ExtentClip, CrossingSegmentsLandExactlyOnTheSides) {
  const E2d box(0, 0, 10, 10);
  P2d p{-10, 5}, q{20, 5};
  ASSERT_EQ(box.ClipLineSegmentWhenRegular(p, q), 1);
  EXPECT_TRUE(p.x == 0.0 && q.x == 10.0);
  EXPECT_DOUBLE_EQ(p.y, 5.0);

  P2d a{-5, -5}, b{15, 15};
  ASSERT_EQ(box.ClipLineSegmentWhenRegular(a, b), 1);
  EXPECT_TRUE(a.x == 0 && a.y == 0 && b.x == 10 && b.y == 10);  // exactly on the sides

  P2d c{5, 5}, d{5, 30};  // only the far end is rewritten
  ASSERT_EQ(box.ClipLineSegmentWhenRegular(c, d), 1);
  EXPECT_TRUE(c.y == 5.0 && d.y == 10.0 && d.x == 5.0);
}

TEST(ExtentClip, MissesAndDegenerateSegments) {
  const E2d box(0, 0, 10, 10);
  P2d p{-5, 20}, q{20, 11};
  EXPECT_EQ(box.ClipLineSegmentWhenRegular(p, q), 0);
  EXPECT_EQ(p.x, -5.0);  // untouched on failure

  P2d z1{20, 20}, z2{20, 20};
  EXPECT_EQ(box.ClipLineSegmentWhenRegular(z1, z2), 0);
  P2d i1{3, 3}, i2{3, 3};
  EXPECT_EQ(box.ClipLineSegmentWhenRegular(i1, i2), 1);
}

TEST(ExtentIntersect, KindsAndUnboundedSides) {
  const ZvPoint2<float> a{-1, 5}, b{11, 5};
  EXPECT_EQ(ZvExtent2<float>().IsIntersecting(a, b), 0);
  EXPECT_EQ(ZvExtent2<float>(0, 0, 0, 0, ZvExtent2<float>::Infinite).IsIntersecting(a, b), 1);
  const ZvExtent2<float> box(0, 0, 10, 10);
  EXPECT_EQ(box.IsIntersecting(a, b), 1);
  EXPECT_EQ(box.IsIntersecting({-1, 11}, {11, 11}), 0);
  const float inf = std::numeric_limits<float>::infinity();
  const ZvExtent2<float> open(-inf, 0, inf, 10);
  EXPECT_EQ(open.IsIntersecting({-inf, 5}, {inf, 5}), 1);
}

}  // namespace
