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
  EXPECT_EQ(a.kind, E2d::Infinite);
  EXPECT_EQ(a.xmax, 1.0);  // coordinates left alone

  E2d b;
  b.Union(E2d(2, 3, 4, 5));
  EXPECT_EQ(b.kind, E2d::Regular);
  EXPECT_EQ(b.ymin, 3.0);

  b.Union(E2d(-1, 4, 3, 9));
  EXPECT_EQ(b.xmin, -1.0);
  EXPECT_EQ(b.ymin, 3.0);
  EXPECT_EQ(b.xmax, 4.0);
  EXPECT_EQ(b.ymax, 9.0);
}

TEST(ExtentAddPoint, GrowsFromEmptyAndIgnoresInfinite) {
  E2d e;
  e.AddPoint(P2d{2, 3});
  EXPECT_EQ(e.kind, E2d::Regular);
  EXPECT_EQ(e.xmin, 2.0);
  EXPECT_EQ(e.xmax, 2.0);
  e.AddPoint(P2d{-1, 5});
  e.AddPoint(P2d{4, 1});
  EXPECT_EQ(e.xmin, -1.0);
  EXPECT_EQ(e.xmax, 4.0);
  EXPECT_EQ(e.ymin, 1.0);
  EXPECT_EQ(e.ymax, 5.0);

  E2d inf(0, 0, 0, 0, E2d::Infinite);
  inf.AddPoint(P2d{10, 10});
  EXPECT_EQ(inf.kind, E2d::Infinite);
  EXPECT_EQ(inf.xmax, 0.0);
}

TEST(ExtentClip, QuickAcceptLeavesPointsAlone) {
  const E2d box(0, 0, 10, 10);
  P2d p{0, 5}, q{0, 8};  // on the left edge
  EXPECT_EQ(box.ClipLineSegmentWhenRegular(p, q), 1);
  EXPECT_EQ(p.x, 0.0);
  P2d r{-5e-10, 2}, s{10 + 5e-10, 3};  // pokes out by less than 1e-9
  EXPECT_EQ(box.ClipLineSegmentWhenRegular(r, s), 1);
  EXPECT_EQ(r.x, -5e-10);
  EXPECT_EQ(s.x, 10 + 5e-10);
}

TEST(ExtentClip, CrossingSegmentsLandExactlyOnTheSides) {
  const E2d box(0, 0, 10, 10);
  P2d p{-10, 5}, q{20, 5};
  ASSERT_EQ(box.ClipLineSegmentWhenRegular(p, q), 1);
  EXPECT_EQ(p.x, 0.0);
  EXPECT_EQ(q.x, 10.0);
  EXPECT_DOUBLE_EQ(p.y, 5.0);

  P2d a{-5, -5}, b{15, 15};
  ASSERT_EQ(box.ClipLineSegmentWhenRegular(a, b), 1);
  EXPECT_DOUBLE_EQ(a.x, 0.0);
  EXPECT_DOUBLE_EQ(a.y, 0.0);
  EXPECT_DOUBLE_EQ(b.x, 10.0);
  EXPECT_DOUBLE_EQ(b.y, 10.0);

  P2d c{5, 5}, d{5, 30};  // only the far end is rewritten
  ASSERT_EQ(box.ClipLineSegmentWhenRegular(c, d), 1);
  EXPECT_EQ(c.y, 5.0);
  EXPECT_EQ(d.y, 10.0);
  EXPECT_EQ(d.x, 5.0);
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
