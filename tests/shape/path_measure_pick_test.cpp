// Extents, picks, node arc positions and hit tests of paths.
#include <gtest/gtest.h>
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/raster.h>

#include <cmath>

#include "tests/shape/path_fixtures.h"

namespace {

using EF = ZvExtent2<float>;

ZvPath2f Arch(unsigned int degree) {
  ZvPath2f path;
  path.Moveto(P(0, 0));
  if (degree == 3) {
    path.Curveto(P(0, 10), P(10, 10), P(10, 0));
  } else {  // the same curve raised to degree 4
    const ZvPoint2<float> q[4] = {P(0, 7.5f), P(5, 10), P(10, 7.5f), P(10, 0)};
    path.AltCurveto(q, 4);
  }
  return path;
}

TEST(PathMeasurePick, TightExtentsHugTheCurveForLinesAndCubicsOnly) {
  EF box, tight;
  Arch(3).GetExtent(box);
  Arch(3).GetTightExtent(tight);
  EXPECT_EQ(10.0f, box.ymax);
  EXPECT_TRUE(tight.ymax >= 7.5f && tight.ymax < 8.0f) << tight.ymax;  // the arch peaks at 7.5
  EXPECT_TRUE(tight.xmin == 0.0f && tight.xmax == 10.0f);
  // The quartic gets its control points: as loose as the control-point extent.
  Arch(4).GetExtent(box);
  Arch(4).GetTightExtent(tight);
  EXPECT_EQ(box.ymax, tight.ymax);
  ZvExtent2<double> wide;
  Arch(3).GetTightExtent(wide);
  EXPECT_TRUE(wide.ymax >= 7.5 && wide.ymax < 8.0) << wide.ymax;
  ZvPath2f().GetTightExtent(tight);
  EXPECT_TRUE(tight.kind == EF::Empty && tight.xmax == 0.0f);

  const ZvPath2f three = ThreeSubpaths();
  three.GetSegmentExtent(4, tight);  // a control point of the first cubic
  EXPECT_TRUE(tight.xmin == 20.0f && tight.xmax == 35.0f && tight.ymin == -5.0f);
  three.GetSegmentExtent(99, tight);
  EXPECT_EQ(EF::Empty, tight.kind);
}

TEST(PathMeasurePick, ClosePointsAndPointsInABox) {
  ZvPath2f path;
  path.Moveto(P(0, 0));
  path.Lineto(P(4, 0));
  path.Lineto(P(1, 0));
  path.Lineto(P(1, 0));
  unsigned int index = 99;
  // The box of side 2.2 around (2, 0) holds 1, 2, 3: the first in index order wins.
  EXPECT_EQ(1, path.GetClosePointIndex(P(2, 0), 2.2, &index));
  EXPECT_EQ(2u, index);  // (4,0) is at distance 2: outside; (1,0) at index 2 is first
  // Size 0 finds only the very coordinates.
  EXPECT_EQ(0, path.GetClosePointIndex(P(1.0001f, 0), 0.0, &index));
  EXPECT_EQ(1, path.GetClosePointIndex(P(4, 0), 0.0, &index));
  EXPECT_EQ(1u, index);
  // Nearest in the octagonal metric; the lower index wins the tie between 2 and 3.
  EXPECT_EQ(1, path.GetClosePointIndex(P(1.2f, 0.5f), &index));
  EXPECT_EQ(2u, index);
  EXPECT_EQ(1, path.GetClosePointIndex(P(3, 3), &index));
  EXPECT_EQ(1u, index);  // |1|+0.3334*3 = 2.0 beats 3+0.3334*2 = 3.67
  EXPECT_EQ(0, ZvPath2f().GetClosePointIndex(P(0, 0), &index));

  ZvULongArray indices;
  indices.Add(77u);
  EXPECT_EQ(3u, path.GetPointsInExtentIndices(EF(0.5f, -1, 4, 1), &indices));
  EXPECT_EQ(0u, path.GetPointsInExtentIndices(EF(), &indices));
  EXPECT_EQ(4u, path.GetPointsInExtentIndices(EF(0, 0, 0, 0, EF::Infinite), &indices));
  ASSERT_EQ(8u, indices.size);
  EXPECT_TRUE(indices[0] == 77 && indices[1] == 1 && indices[3] == 3);
}

TEST(PathMeasurePick, NodeArcPositions) {
  ZvPath2f path;
  path.Moveto(P(0, 0));
  path.Lineto(P(10, 0));
  path.Lineto(P(10, 30));
  path.Curveto(P(20, 40), P(30, 30), P(30, 20));
  // Start and end answer without flattening, whatever the tolerance.
  EXPECT_EQ(0.0, path.GetNodeNormalizedArcLength(0, 0.0));
  EXPECT_EQ(1.0, path.GetNodeNormalizedArcLength(5, std::nan("")));
  const double total = path.GetNodeNormalizedArcLength(2, 0.01);
  ZvPath2f lines;
  lines.Moveto(P(0, 0));
  lines.Lineto(P(10, 0));
  lines.Lineto(P(10, 30));
  lines.Lineto(P(40, 30));
  EXPECT_DOUBLE_EQ(1.0 / 7.0, lines.GetNodeNormalizedArcLength(1, 1.0));
  EXPECT_DOUBLE_EQ(4.0 / 7.0, lines.GetNodeNormalizedArcLength(2, 1.0));
  EXPECT_TRUE(total > 0.55 && total < 0.7) << total;  // 40 of about 40 + 24 along the curve
  // A control point counts as the end of its segment.
  EXPECT_EQ(path.GetNodeNormalizedArcLength(5, 0.01), path.GetNodeNormalizedArcLength(3, 0.01));
}

TEST(PathMeasurePick, OutlineAndInteriorHits) {
  const ZvPath2f square = ClosedSquare(0, 0, 100, 100);
  ZvGC gc;
  EXPECT_EQ(1, square.IsIntersectingExtent(gc, EF(-5, -5, 5, 5), 0));    // holds a node
  EXPECT_EQ(1, square.IsIntersectingExtent(gc, EF(40, -5, 60, 5), 0));   // crosses an edge
  EXPECT_EQ(0, square.IsIntersectingExtent(gc, EF(40, 40, 60, 60), 0));  // deep inside
  EXPECT_EQ(0, square.IsIntersectingExtent(gc, EF(200, 0, 300, 9), 0));  // outside
  EXPECT_EQ(0, square.IsIntersectingExtent(gc, EF(), 1));
  EXPECT_EQ(1, square.IsIntersectingExtent(gc, EF(0, 0, 0, 0, EF::Infinite), 0));
  gc.transform.Translate(1000.0, 0.0, 0.0);
  EXPECT_EQ(1, square.IsIntersectingExtent(gc, EF(1040, -5, 1060, 5), 0));
  EXPECT_EQ(0, square.IsIntersectingExtent(gc, EF(40, -5, 60, 5), 0));

  ZvGC plain;
  EXPECT_EQ(1, square.IsInteriorIntersectingExtent(plain, EF(40, -5, 60, 5), 0));
  EXPECT_EQ(0, square.IsInteriorIntersectingExtent(plain, EF(200, 0, 300, 9), 0));
  // Deep inside, the answer comes from a one-pixel fill.
  ZvRaster<unsigned char> probe(1, 1, 0);
  square.Fill(plain, probe, nullptr, nullptr);
  if (probe.GetVal(0) == 0) GTEST_SKIP() << "no scanline fill on this build";
  EXPECT_EQ(1, square.IsInteriorIntersectingExtent(plain, EF(40, 40, 60, 60), 0));
  EXPECT_EQ(0,
            ClosedSquare(0, 0, 10, 10).IsInteriorIntersectingExtent(plain, EF(40, 40, 60, 60), 1));
}

TEST(PathMeasurePick, SamplesInsideAnExtentKeepTheirTags) {
  ZvPath2f line = Segment(0, 0, 10, 0);
  ZvGC gc;
  gc.sampleSpacing = 1.0;  // samples at 0, 1, ..., 9
  ZvPoint2fArray pts;
  ZvPointTagArray tags;
  EXPECT_EQ(3u, line.IntersectSamplePointsExtent(gc, EF(6.5f, -1, 20, 1), pts, tags, 0));
  ASSERT_EQ(3u, pts.size);
  EXPECT_TRUE(pts[0].x == 7.0f && tags[0] == ZvPointTag_Continue && tags[2] == ZvPointTag_Last);
  EXPECT_EQ(0u, line.IntersectSamplePointsExtent(gc, EF(20, 20, 30, 30), pts, tags, 0));
  EXPECT_EQ(10u, line.IntersectSamplePointsExtent(gc, EF(0, 0, 0, 0, EF::Infinite), pts, tags, 0));
  EXPECT_EQ(13u, tags.size);
}

}  // namespace
