// Sampling of paths at even spacing and at given relative positions.
#include <gtest/gtest.h>
#include <zv/gc.h>
#include <zv/path2f.h>

#include <cmath>

#include "tests/shape/path_fixtures.h"

namespace {

std::vector<int> Tags(const ZvPointTagArray& tags, unsigned int from = 0) {
  std::vector<int> out;
  for (unsigned int i = from; i < tags.size; ++i)
    out.push_back(tags[i]);
  return out;
}

TEST(PathMeasureSample, EvenSpacingLeavesTheFarEndOut) {
  ZvGC gc;
  gc.sampleSpacing = 3.0;
  ZvPoint2fArray pts;
  ZvPointTagArray tags;
  // Length 10, spacing 3: r = 1 is not above 1.5, so N = 3 and the step is 10 / 3; two
  // interior samples, the second tagged last, and no sample at the far end.
  EXPECT_EQ(3u, Segment(0, 0, 10, 0).Sample(gc, pts, tags));
  EXPECT_EQ((std::vector<int>{0, 1, 2}), Tags(tags));
  EXPECT_EQ(0.0f, pts[0].x);
  EXPECT_FLOAT_EQ(10.0f / 3, pts[1].x);
  EXPECT_FLOAT_EQ(20.0f / 3, pts[2].x);
  // Length 11: r = 2 is above 1.5, N = 4.
  EXPECT_EQ(4u, Segment(0, 0, 11, 0).Sample(gc, pts, tags));
  EXPECT_FLOAT_EQ(8.25f, pts[6].x);
  // Length 2.5, not above the spacing: the two ends.
  EXPECT_EQ(2u, Segment(0, 0, 2.5f, 0).Sample(gc, pts, tags));
  EXPECT_EQ((std::vector<int>{0, 2}), Tags(tags, 7));
  EXPECT_EQ(2.5f, pts[8].x);
  EXPECT_EQ(0u, ZvPath2f().Sample(gc, pts, tags));
  EXPECT_EQ(9u, pts.size);  // nothing added
}

TEST(PathMeasureSample, RequestsWithoutEndAreRefusedWhole) {
  // A spacing that is not positive, a length that is not finite, or more samples than the cap:
  // nothing is appended (not even the subpaths that could be sampled) and the result is 0.
  ZvPath2f two = Segment(0, 0, 10, 0);
  two.Moveto(P(0, 5));
  two.Lineto(P(3e38f, 5));
  ZvPath2f far = Segment(0, 0, 10, 0);
  far.Moveto(P(0, 5));
  far.Lineto(P(2e7f, 5));
  const struct {
    ZvPath2f path;
    double spacing;
  } cases[] = {{Segment(0, 0, 10, 0), 0.0},
               {Segment(0, 0, 10, 0), -1.0},
               {Segment(0, 0, 10, 0), std::nan("")},
               {two, 1.0},
               {far, 1.0}};
  for (const auto& c : cases) {
    ZvGC gc;
    gc.sampleSpacing = c.spacing;
    ZvPoint2fArray pts;
    ZvPointTagArray tags;
    pts.Add(1, 1);
    tags.Add(ZvPointTag_First);
    EXPECT_EQ(0u, c.path.Sample(gc, pts, tags)) << c.spacing;
    EXPECT_EQ(1u, pts.size);
    EXPECT_EQ(1u, tags.size);
  }
  // Just under the cap is sampled.
  ZvGC gc;
  ZvPoint2fArray pts;
  ZvPointTagArray tags;
  EXPECT_EQ(ZvPath2f::kMaxSamples - 1,
            Segment(0, 0, ZvPath2f::kMaxSamples - 1, 0).Sample(gc, pts, tags));
}

TEST(PathMeasureSample, SubpathsAreSampledInTheContextsFrame) {
  ZvPath2f path = ThreeSubpaths();  // open triangle (length 20), closed cubic loop, lone point
  ZvGC gc;
  gc.sampleSpacing = 2.0;
  gc.transform.Scale(0.5);
  ZvPoint2fArray pts;
  ZvPointTagArray tags;
  pts.Add(P(-1, -1));
  tags.Add(ZvPointTag_Last);
  const unsigned int n = path.Sample(gc, pts, tags);
  ASSERT_TRUE(n + 1 == pts.size && pts.size == tags.size);
  // The triangle maps to length 10: 5 steps of 2, four samples, the last at (5, 3).
  const std::vector<int> all = Tags(tags, 1);
  ASSERT_GE(all.size(), 5u);
  EXPECT_EQ((std::vector<int>{0, 1, 1, 1, 2}), std::vector<int>(all.begin(), all.begin() + 5));
  EXPECT_FLOAT_EQ(4.0f, pts[3].x);
  EXPECT_FLOAT_EQ(5.0f, pts[5].x);
  EXPECT_FLOAT_EQ(3.0f, pts[5].y);
  // The closed loop starts at (10, 0) and does not end on its start; the lone point reads 0, 2.
  const unsigned int last = pts.size - 1;
  EXPECT_TRUE(pts[6].x == 10.0f && tags[6] == ZvPointTag_First);
  EXPECT_EQ(ZvPointTag_Last, tags[last - 2]);
  EXPECT_FALSE(pts[last - 2].x == 10.0f && pts[last - 2].y == 0.0f);
  EXPECT_TRUE(pts[last].x == 25.0f && tags[last - 1] == ZvPointTag_First &&
              tags[last] == ZvPointTag_Last);
}

TEST(PathMeasureSample, RelativePositionsRunAcrossSubpaths) {
  ZvPath2f path = Segment(0, 0, 10, 0);
  path.Moveto(P(0, 10));
  path.Lineto(P(30, 10));  // total flat length 40
  ZvGC gc;
  ZvFloatArray positions;
  for (float f : {0.0f, 0.125f, 0.25f, 0.5f, 1.0f})
    positions.Add(f);
  ZvPoint2fArray pts;
  ZvPointTagArray tags;
  EXPECT_EQ(5u, path.Sample(gc, positions, pts, tags));
  EXPECT_EQ((std::vector<int>{0, 1, 2, 0, 2}), Tags(tags));
  const float xs[5] = {0, 5, 10, 10, 30};
  for (int i = 0; i < 5; ++i)
    EXPECT_FLOAT_EQ(xs[i], pts[i].x) << i;
  EXPECT_EQ(10.0f, pts[3].y);  // on the second subpath
  // A position beyond the end ends the walk; nothing after it is placed.
  ZvFloatArray beyond;
  beyond.Add(1.5f);
  beyond.Add(0.1f);
  EXPECT_EQ(0u, path.Sample(gc, beyond, pts, tags));
  EXPECT_EQ(5u, pts.size);
}

}  // namespace
