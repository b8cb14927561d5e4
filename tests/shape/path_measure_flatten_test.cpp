// Flattening of paths into tagged polylines.
#include <gtest/gtest.h>
#include <zv/bezier_fit.h>
#include <zv/bezier_tool.h>
#include <zv/gc.h>
#include <zv/path2f.h>

#include "tests/shape/path_fixtures.h"

namespace {

// Each subpath reads 0, 1, ..., 1, 2 from index `from` on.
template <class Array>
void ExpectWellFormed(const Array& pts, const ZvPointTagArray& tags, unsigned int from,
                      unsigned int subpaths) {
  ASSERT_EQ(pts.size, tags.size);
  unsigned int count = 0;
  bool open = false;
  for (unsigned int i = from; i < tags.size; ++i) {
    if (!open) {
      ASSERT_EQ(ZvPointTag_First, tags[i]) << i;
      open = true;
    } else if (tags[i] == ZvPointTag_Last) {
      open = false;
      ++count;
    } else {
      ASSERT_EQ(ZvPointTag_Continue, tags[i]) << i;
    }
  }
  EXPECT_FALSE(open);
  EXPECT_EQ(subpaths, count);
}

// Three subpaths (an open triangle, a closed loop of two cubics, a lone start) appended after
// the caller's content: counts per segment are those of the flatteners, the closed loop ends on
// its start, and the lone point reads 0, 2.
TEST(PathMeasureFlatten, SubpathsAppendWithExactTags) {
  const ZvPath2f path = ThreeSubpaths();
  ZvPoint2fArray pts;
  ZvPointTagArray tags;
  pts.Add(-7.0, -7.0);
  tags.Add(ZvPointTag_Last);
  const unsigned int n = path.AltFlatten(0.1, pts, tags);
  EXPECT_EQ(n + 1, pts.size);
  EXPECT_EQ(-7.0f, pts[0].x);
  ExpectWellFormed(pts, tags, 1, 3);

  const ZvPoint2fArray& src = PathArrays::Points(path);
  ZvPoint2fArray c1, c2;
  const unsigned int t1 = ZvBezierTool_FlattenCubic2f(src.data + 3, 0.1, &c1, 1);
  const unsigned int t2 = ZvBezierTool_FlattenCubic2f(src.data + 6, 0.1, &c2, 1);
  ASSERT_EQ(3u + (1 + t1 + t2) + 2, n);
  EXPECT_TRUE(pts[3].y == 10.0f && tags[3] == ZvPointTag_Last);  // triangle: 0, 1, 2
  const unsigned int loopEnd = 4 + t1 + t2;
  EXPECT_TRUE(pts[4].x == pts[loopEnd].x && pts[4].y == pts[loopEnd].y);
  EXPECT_EQ(c1[t1 - 1].x, pts[4 + t1].x);
  EXPECT_TRUE(pts[loopEnd + 1].x == 50.0f && pts[loopEnd + 2].x == 50.0f);

  // FlattenSubpath writes the loop alone, with no tags.
  ZvPoint2fArray loop;
  EXPECT_EQ(1 + t1 + t2, path.FlattenSubpath(5, 0.1, loop));
  EXPECT_EQ(pts[4 + t1].y, loop[t1].y);
  EXPECT_EQ(0u, path.FlattenSubpath(99, 0.1, loop));
}

TEST(PathMeasureFlatten, OtherDegreesGoThroughTheGeneralFlattener) {
  ZvPath2f path;
  path.Moveto(P(0, 0));
  const ZvPoint2<float> quartic[4] = {P(10, 20), P(20, -20), P(30, 20), P(40, 0)};
  path.AltCurveto(quartic, 4);
  path.Curveto(P(45, 10), P(50, 0));  // quadratic
  ZvPoint2fArray pts;
  ZvPointTagArray tags;
  const unsigned int n = path.AltFlatten(0.2, pts, tags);
  ZvBezierTool tool;
  ZvPoint2fArray expect;
  expect.Add(P(0, 0));
  tool.Flatten(PathArrays::Points(path), 0, 4, 0.2, &expect, 1);
  tool.Flatten(PathArrays::Points(path), 4, 2, 0.2, &expect, 1);
  ASSERT_EQ(expect.size, n);
  for (unsigned int i = 0; i < n; ++i)
    EXPECT_TRUE(expect[i].x == pts[i].x && expect[i].y == pts[i].y) << i;
  ExpectWellFormed(pts, tags, 0, 1);
}

// The context's transform is applied before flattening; the double forms count subpaths and
// the closed form keeps only the closed ones.
TEST(PathMeasureFlatten, TransformedAndDoubleFormsAgree) {
  const ZvPath2f path = ThreeSubpaths();
  ZvGC gc;
  gc.flattenTolerance = 0.2;
  gc.transform.Translate(100.0, -50.0, 0.0);
  gc.transform.Scale(2.0);
  ZvPoint2fArray pf;
  ZvPointTagArray tf;
  const unsigned int n = path.Flatten(gc, pf, tf);
  ExpectWellFormed(pf, tf, 0, 3);
  EXPECT_EQ(100.0f, pf[0].x);  // (0, 0) -> (100, -50)
  EXPECT_EQ(-30.0f, pf[2].y);  // (10, 0) -> (120, -50), (10, 10) -> (120, -30)
  EXPECT_EQ(0u, ZvPath2f().Flatten(gc, pf, tf));
  EXPECT_EQ(n, pf.size);  // an empty path adds nothing

  ZvPoint2dArray pd;
  ZvPointTagArray td;
  EXPECT_EQ(3u, path.TransformAndFlattenPath(gc.transform, 0.2, pd, td));
  ASSERT_EQ(n, pd.size);
  ExpectWellFormed(pd, td, 0, 3);
  for (unsigned int i = 0; i < n; ++i) {
    EXPECT_NEAR(pd[i].x, pf[i].x, 1e-4);
    EXPECT_NEAR(pd[i].y, pf[i].y, 1e-4);
  }

  ZvPoint2dArray pc;
  ZvPointTagArray tc;
  EXPECT_EQ(1u, path.TransformAndFlattenClosedSubPaths(gc.transform, 0.2, pc, tc));
  ExpectWellFormed(pc, tc, 0, 1);
  // The loop, as in the full output.
  EXPECT_TRUE(pd[3].x == pc[0].x && pd[3 + pc.size - 1].y == pc[pc.size - 1].y);
  EXPECT_EQ(0u, ZvPath2f().TransformAndFlattenPath(gc.transform, 0.2, pc, tc));
}

}  // namespace
