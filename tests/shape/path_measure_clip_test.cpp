// Clipped flattening of closed subpaths for the rasterisers.
#include <gtest/gtest.h>
#include <zv/path2f.h>
#include <zv/transfo4.h>

#include <cmath>

#include "tests/shape/path_fixtures.h"

namespace {

using E = ZvExtent2<double>;

ZvPath2f ClosedSquare(float x0, float y0, float x1, float y1) {
  ZvPath2f path;
  path.Moveto(P(x0, y0));
  path.Lineto(P(x1, y0));
  path.Lineto(P(x1, y1));
  path.Lineto(P(x0, y1));
  path.Lineto(P(x0, y0));
  path.Closeto();
  return path;
}

// Signed area of the polygon out[first..first+count) (implicitly closed).
double Area(const ZvPoint2dArray& a, unsigned int first, unsigned int count) {
  double s = 0.0;
  for (unsigned int i = 0; i < count; ++i) {
    const ZvPoint2<double>& p = a[first + i];
    const ZvPoint2<double>& q = a[first + (i + 1) % count];
    s += p.x * q.y - q.x * p.y;
  }
  return 0.5 * s;
}

// Every polygon reads 0, 1, ..., 1, 2 and ends on its first point.
void ExpectWellFormedPolygons(const ZvPoint2dArray& pts, const ZvPointTagArray& tags,
                              unsigned int from) {
  ASSERT_EQ(pts.size, tags.size);
  unsigned int start = from;
  for (unsigned int i = from; i < tags.size; ++i) {
    if (i == start) {
      EXPECT_EQ(tags[i], ZvPointTag_First) << i;
    } else if (tags[i] == ZvPointTag_Last) {
      EXPECT_EQ(pts[i].x, pts[start].x);
      EXPECT_EQ(pts[i].y, pts[start].y);
      start = i + 1;
    } else {
      EXPECT_EQ(tags[i], ZvPointTag_Continue) << i;
    }
  }
  EXPECT_EQ(start, tags.size) << "the last polygon is not terminated";
}

TEST(PathMeasureClip, OutsideGivesNothingAndAroundGivesTheCorners) {
  const ZvTransfo4 id;
  ZvPoint2dArray pts;
  ZvPointTagArray tags;
  EXPECT_EQ(0u, ClosedSquare(20, 20, 30, 30)
                    .TransformFlattenAndClipClosedSubPaths(id, 0.25, E(0, 0, 10, 10), pts, tags));
  EXPECT_EQ(0u, pts.size);
  EXPECT_EQ(0u, tags.size);

  // A counter-clockwise square around the extent: each pass cuts the corner it meets, so the
  // output is exactly the extent's corners, plus the first once more.
  ASSERT_EQ(1u, ClosedSquare(-5, -5, 15, 15)
                    .TransformFlattenAndClipClosedSubPaths(id, 0.25, E(0, 0, 10, 10), pts, tags));
  ASSERT_EQ(5u, pts.size);
  ExpectWellFormedPolygons(pts, tags, 0);
  EXPECT_DOUBLE_EQ(100.0, Area(pts, 0, 4));
  for (unsigned int i = 0; i < 4; ++i) {
    EXPECT_TRUE(pts[i].x == 0.0 || pts[i].x == 10.0);
    EXPECT_TRUE(pts[i].y == 0.0 || pts[i].y == 10.0);
  }
}

TEST(PathMeasureClip, BoundsAreInsideAndPartialOverlapKeepsTheIntersection) {
  const ZvTransfo4 id;
  ZvPoint2dArray pts;
  ZvPointTagArray tags;
  // Exactly on the bounds: nothing is cut, no crossing is inserted.
  ASSERT_EQ(1u, ClosedSquare(0, 0, 10, 10)
                    .TransformFlattenAndClipClosedSubPaths(id, 0.25, E(0, 0, 10, 10), pts, tags));
  ASSERT_EQ(5u, pts.size);
  EXPECT_EQ(0.0, pts[0].x);
  EXPECT_EQ(0.0, pts[0].y);
  EXPECT_EQ(10.0, pts[2].x);
  EXPECT_EQ(10.0, pts[2].y);

  // The square [0,10]^2 against [5,15] x [-5,5]: [5,10] x [0,5] is left.
  ASSERT_EQ(1u, ClosedSquare(0, 0, 10, 10)
                    .TransformFlattenAndClipClosedSubPaths(id, 0.25, E(5, -5, 15, 5), pts, tags));
  ExpectWellFormedPolygons(pts, tags, 0);
  const unsigned int m = pts.size - 5 - 1;
  EXPECT_DOUBLE_EQ(25.0, Area(pts, 5, m));
  for (unsigned int i = 5; i < pts.size; ++i) {
    EXPECT_GE(pts[i].x, 5.0);
    EXPECT_LE(pts[i].x, 10.0);
    EXPECT_GE(pts[i].y, 0.0);
    EXPECT_LE(pts[i].y, 5.0);
  }
}

TEST(PathMeasureClip, OnlyClosedSubpathsOfMoreThanTwoIndicesAreWritten) {
  ZvPath2f path;
  path.Moveto(P(1, 1));  // open triangle: skipped
  path.Lineto(P(8, 1));
  path.Lineto(P(8, 8));
  path.Moveto(P(2, 2));  // closed, e == s + 1: skipped
  path.Lineto(P(2, 2));
  ASSERT_EQ(1, path.Closeto());
  path.Moveto(P(3, 3));  // closed triangle: written
  path.Lineto(P(6, 3));
  path.Lineto(P(3, 6));
  path.Lineto(P(3, 3));
  ASSERT_EQ(1, path.Closeto());
  ZvPoint2dArray pts;
  ZvPointTagArray tags;
  ASSERT_EQ(1u, path.TransformFlattenAndClipClosedSubPaths(ZvTransfo4(), 1.0, E(0, 0, 100, 100),
                                                           pts, tags));
  ASSERT_EQ(4u, pts.size);
  EXPECT_EQ(3.0, pts[0].x);
  EXPECT_EQ(6.0, pts[1].x);
  EXPECT_DOUBLE_EQ(4.5, Area(pts, 0, 3));
}

TEST(PathMeasureClip, AppendsMapsAndHandlesEmptyAndInfiniteExtents) {
  // A circle of radius 10 built from four cubics, scaled by 2 by the transform and cut by the
  // extent's left bound through its centre: half the disc of radius 20 is left.
  ZvPath2f circle;
  const float k = 5.5228475f;
  circle.Moveto(P(10, 0));
  circle.Curveto(P(10, k), P(k, 10), P(0, 10));
  circle.Curveto(P(-k, 10), P(-10, k), P(-10, 0));
  circle.Curveto(P(-10, -k), P(-k, -10), P(0, -10));
  circle.Curveto(P(k, -10), P(10, -k), P(10, 0));
  ASSERT_EQ(1, circle.Closeto());
  ZvTransfo4 scale;
  scale.Scale(2.0, 2.0, 1.0);

  ZvPoint2dArray pts;
  ZvPointTagArray tags;
  pts.Add(-1.0, -1.0);  // caller's content stays
  tags.Add(ZvPointTag_First);
  pts.Add(-2.0, -2.0);
  tags.Add(ZvPointTag_Last);
  ASSERT_EQ(1u, circle.TransformFlattenAndClipClosedSubPaths(scale, 0.05, E(0, -100, 100, 100), pts,
                                                             tags));
  EXPECT_EQ(-1.0, pts[0].x);
  EXPECT_EQ(-2.0, pts[1].y);
  ExpectWellFormedPolygons(pts, tags, 2);
  const unsigned int m = pts.size - 2 - 1;
  const double half = Area(pts, 2, m);
  EXPECT_NEAR(0.5 * M_PI * 400.0, half, 2.0);  // the cubics and the chords fall a little short
  for (unsigned int i = 2; i < pts.size; ++i) {
    EXPECT_GE(pts[i].x, 0.0);
    EXPECT_LE(std::hypot(pts[i].x, pts[i].y), 20.01);
  }

  const unsigned int before = pts.size;
  EXPECT_EQ(0u, circle.TransformFlattenAndClipClosedSubPaths(scale, 0.05, E(), pts, tags));
  EXPECT_EQ(before, pts.size);
  ASSERT_EQ(1u, circle.TransformFlattenAndClipClosedSubPaths(
                    scale, 0.05, E(0, 0, 0, 0, E::Infinite), pts, tags));
  // The cut runs through the centre along a line of symmetry of the flattened circle.
  EXPECT_NEAR(2.0 * half, Area(pts, before, pts.size - before - 1), 1e-6);
  EXPECT_EQ(pts.size, tags.size);
}

}  // namespace
