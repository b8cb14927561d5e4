// Clipped flattening of closed subpaths for the rasterisers.
#include <gtest/gtest.h>
#include <zv/path2f.h>
#include <zv/transfo4.h>

#include <cmath>
#include <random>
#include <vector>

#include "tests/shape/path_fixtures.h"

namespace {

using E = ZvExtent2<double>;

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
      EXPECT_TRUE(pts[i].x == pts[start].x && pts[i].y == pts[start].y) << i;
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
  EXPECT_TRUE(pts.size == 0 && tags.size == 0);

  // A counter-clockwise square around the extent: each pass cuts the corner it meets, so the
  // output is exactly the extent's corners, plus the first once more.
  ASSERT_EQ(1u, ClosedSquare(-5, -5, 15, 15)
                    .TransformFlattenAndClipClosedSubPaths(id, 0.25, E(0, 0, 10, 10), pts, tags));
  ASSERT_EQ(5u, pts.size);
  ExpectWellFormedPolygons(pts, tags, 0);
  EXPECT_DOUBLE_EQ(100.0, Area(pts, 0, 4));
  for (unsigned int i = 0; i < 4; ++i)
    EXPECT_TRUE((pts[i].x == 0.0 || pts[i].x == 10.0) && (pts[i].y == 0.0 || pts[i].y == 10.0));

  // Exactly on the bounds is inside: nothing is cut, no crossing is inserted.
  ZvPoint2dArray on;
  ASSERT_EQ(1u, ClosedSquare(0, 0, 10, 10)
                    .TransformFlattenAndClipClosedSubPaths(id, 0.25, E(0, 0, 10, 10), on, tags));
  ASSERT_EQ(5u, on.size);
  EXPECT_TRUE(on[0].x == 0.0 && on[2].x == 10.0 && on[2].y == 10.0);
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
  EXPECT_TRUE(pts[0].x == 3.0 && pts[1].x == 6.0);
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
  EXPECT_TRUE(pts[0].x == -1.0 && pts[1].y == -2.0);
  ExpectWellFormedPolygons(pts, tags, 2);
  const unsigned int m = pts.size - 2 - 1;
  const double half = Area(pts, 2, m);
  EXPECT_NEAR(0.5 * M_PI * 400.0, half, 2.0);  // the cubics and the chords fall a little short
  for (unsigned int i = 2; i < pts.size; ++i)
    EXPECT_TRUE(pts[i].x >= 0.0 && std::hypot(pts[i].x, pts[i].y) <= 20.01) << i;

  const unsigned int before = pts.size;
  EXPECT_EQ(0u, circle.TransformFlattenAndClipClosedSubPaths(scale, 0.05, E(), pts, tags));
  EXPECT_EQ(before, pts.size);
  ASSERT_EQ(1u, circle.TransformFlattenAndClipClosedSubPaths(
                    scale, 0.05, E(0, 0, 0, 0, E::Infinite), pts, tags));
  // The cut runs through the centre along a line of symmetry of the flattened circle.
  EXPECT_NEAR(2.0 * half, Area(pts, before, pts.size - before - 1), 1e-6);
  EXPECT_EQ(pts.size, tags.size);
}

// Plain four-pass clipping of a polygon, every pass run: the reference for the clipper, which
// skips the passes a subpath's control points clear and flattens straight into the output.
std::vector<ZvPoint2<double>> ClipAllPasses(std::vector<ZvPoint2<double>> poly, const E& e) {
  for (int pass = 0; pass < 4 && !poly.empty(); ++pass) {
    const int axis = pass % 2;
    const bool isMin = pass < 2;
    const double b = pass == 0 ? e.xmin : pass == 1 ? e.ymin : pass == 2 ? e.xmax : e.ymax;
    auto a = [&](const ZvPoint2<double>& p) { return axis == 0 ? p.x : p.y; };
    auto o = [&](const ZvPoint2<double>& p) { return axis == 0 ? p.y : p.x; };
    auto inside = [&](const ZvPoint2<double>& p) { return isMin ? a(p) >= b : b >= a(p); };
    std::vector<ZvPoint2<double>> next;
    ZvPoint2<double> q = poly.back();
    for (const ZvPoint2<double>& r : poly) {
      if (inside(r) != inside(q)) {
        const double w = a(q) - a(r);
        const double c = (w < -1e-15 || w > 1e-15)
                             ? (b - a(q)) * (o(r) - o(q)) / (a(r) - a(q)) + o(q)
                             : (o(q) + o(r)) * 0.5;
        next.push_back(axis == 0 ? ZvPoint2<double>{b, c} : ZvPoint2<double>{c, b});
      }
      if (inside(r)) next.push_back(r);
      q = r;
    }
    poly = next;
  }
  return poly;
}

TEST(PathMeasureClip, SkippingPassesChangesNothing) {
  std::mt19937 rng(5);
  std::uniform_real_distribution<double> u(0.0, 100.0);
  for (int trial = 0; trial < 60; ++trial) {
    ZvPath2f path;
    for (int sub = 0; sub < 2; ++sub) {
      const ZvPoint2<float> start = P(float(u(rng)), float(u(rng)));
      path.Moveto(start);
      for (int k = 0; k < 5; ++k)
        path.Curveto(P(float(u(rng)), float(u(rng))), P(float(u(rng)), float(u(rng))),
                     k == 4 ? start : P(float(u(rng)), float(u(rng))));
      path.Closeto();
    }
    ZvTransfo4 t;
    t.Translate(u(rng) - 50.0, u(rng) - 50.0, 0.0);
    t.Scale(0.5 + u(rng) / 50.0);
    // Extents that hold everything, cut one side, or cut several.
    const double lo = trial % 3 == 0 ? -1000.0 : u(rng) - 20.0;
    const E extent(lo, trial % 2 ? -1000.0 : u(rng) - 20.0, trial % 5 ? 1000.0 : lo + u(rng),
                   1000.0);

    ZvPoint2dArray got, flat;
    ZvPointTagArray gotTags, flatTags;
    path.TransformFlattenAndClipClosedSubPaths(t, 0.2, extent, got, gotTags);
    path.TransformAndFlattenClosedSubPaths(t, 0.2, flat, flatTags);
    std::vector<ZvPoint2<double>> expect, poly;
    for (unsigned int i = 0; i < flat.size; ++i) {
      if (flatTags[i] != ZvPointTag_Last) {
        poly.push_back(flat[i]);
        continue;
      }
      const std::vector<ZvPoint2<double>> clipped = ClipAllPasses(poly, extent);
      expect.insert(expect.end(), clipped.begin(), clipped.end());
      if (!clipped.empty()) expect.push_back(clipped.front());
      poly.clear();
    }
    ASSERT_EQ(expect.size(), got.size) << trial;
    for (unsigned int i = 0; i < got.size; ++i)
      EXPECT_TRUE(expect[i].x == got[i].x && expect[i].y == got[i].y) << trial << " " << i;
  }
}

}  // namespace
