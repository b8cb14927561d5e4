// Traced contours fitted with cubics: tangents at the seam and inside a loop, the short pieces,
// and fitted regions that stay within the tolerance of the traced ones.
#include <zv/bezier_fit.h>
#include <zv/path2f.h>
#include <zv/vectorizer.h>

#include "raster/vect_path.h"
#include "trace_support.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {
// The unit steps round the 3x2 box from (0, 0), down first: 10 samples and the first again.
void BoxLoop(ZvPoint2fArray& samples, ZvDoubleArray& parameters) {
  ZvPath2f box;
  box.Moveto({0, 0});
  for (const ZvPoint2<float>& p : {ZvPoint2<float>{0, 2}, {3, 2}, {3, 0}, {0, 0}})
    box.Lineto(p);
  VectStepSamples(box, 0, 4, samples, parameters);
}

// Pixels where the two masks differ that lie further than `reach` pixels (on both axes) from
// any pixel on the other side of the region's boundary.
int FarDifferences(const ZvRaster<unsigned char>& got, const ZvRaster<unsigned char>& want,
                   int reach) {
  int far = 0;
  for (int y = 0; y < want.GetHeight(); ++y)
    for (int x = 0; x < want.GetWidth(); ++x) {
      if (got.GetVal(x, y) == want.GetVal(x, y)) continue;
      bool nearEdge = false;
      for (int dy = -reach; dy <= reach; ++dy)
        for (int dx = -reach; dx <= reach; ++dx) {
          const int nx = x + dx, ny = y + dy;
          if (nx >= 0 && ny >= 0 && nx < want.GetWidth() && ny < want.GetHeight() &&
              want.GetVal(nx, ny) != want.GetVal(x, y))
            nearEdge = true;
        }
      far += !nearEdge;
    }
  return far;
}
}  // namespace

TEST(VectorizeFit, StepSamplesTangentsAndTheShortestPieces) {
  ZvPoint2fArray s;
  ZvDoubleArray parameters;
  BoxLoop(s, parameters);
  ASSERT_EQ(s.size, 11u);
  EXPECT_EQ(parameters[10], 10.0);
  EXPECT_EQ(s[3].x, 1.0f);
  EXPECT_EQ(s[3].y, 2.0f);
  EXPECT_EQ(s[10].x + s[10].y, 0.0f);
  ZvPoint2<double> t;
  // At the seam the wrapped differences cancel: the neighbours of the first sample decide,
  // from (1, 0) before it to (0, 1) after it.
  ComputeTgtVector(s, 0, t);
  EXPECT_NEAR(t.x, -std::sqrt(0.5), 1e-12);
  EXPECT_NEAR(t.y, std::sqrt(0.5), 1e-12);
  // Sample 5, the bottom right corner: differences of samples 2 to 4 steps either way.
  ComputeTgtVector(s, 5, t);
  EXPECT_NEAR(t.x, std::sqrt(0.5), 1e-12);
  EXPECT_NEAR(t.y, -std::sqrt(0.5), 1e-12);
  // One step is a line; two steps a cubic with both handles on the middle sample.
  ZvBezierTool tool;
  ZvPath2f path;
  path.Moveto(s[0]);
  FitSamples(tool, s, parameters, 0, 1, {0, 1}, {0, 1}, 0.5, path);
  FitSamples(tool, s, parameters, 1, 3, {0, 1}, {1, 0}, 0.5, path);
  ASSERT_EQ(path.NumPoints(), 5u);
  EXPECT_EQ(path.GetDegree(1), 1u);
  EXPECT_EQ(path.GetDegree(4), 3u);
  EXPECT_EQ(path.GetPoint(2).y, s[2].y);
  EXPECT_EQ(path.GetPoint(3).x, s[2].x);
  EXPECT_EQ(path.GetPoint(4).x, s[3].x);
}

TEST(VectorizeFit, FittedRegionsKeepTheirShapeWithFewerPoints) {
  ZvRaster<unsigned char> r(120, 90, 0);
  // A disc, a ring and a square: round sides become a few cubics, the square keeps its corners
  // within the tolerance.
  for (int y = 0; y < 90; ++y)
    for (int x = 0; x < 120; ++x) {
      const double d1 = std::hypot(x + 0.5 - 30, y + 0.5 - 30);
      const double d2 = std::hypot(x + 0.5 - 85, y + 0.5 - 45);
      if (d1 <= 25 || (d2 <= 30 && d2 >= 18) || (x >= 10 && x < 40 && y >= 62 && y < 84))
        r.SetVal(x, y, 9);
    }
  ZvVectorizer v(0, 0);
  ZvPath2f exact, fitted;
  ZvGC gc;
  // Fits are checked at equal arc lengths, and a staircase is longer than the curve it follows:
  // a tolerance of one pixel keeps about as many pieces as the staircase has sides.
  gc.flattenTolerance = 2.0;
  v.Vectorize(r, 9, r.GetExtent2f(), exact);
  fitted.Moveto({0, 0});
  const unsigned int nFitted = v.VectorizeAndFit(r, 9, r.GetExtent2f(), gc, fitted);
  EXPECT_EQ(nFitted + 1, fitted.NumPoints());
  EXPECT_EQ(fitted.NumSubpaths(), exact.NumSubpaths() + 1);
  EXPECT_GT(fitted.LargestDegree(), 1u);
  EXPECT_LT(fitted.NumSegments(), exact.NumSegments() / 2);
  ZvPath2fIter it(fitted);
  unsigned int first = 0, last = 0;
  it.GetNextSubPathIndices(first, last);
  while (it.GetNextSubPathIndices(first, last))
    EXPECT_TRUE(fitted.IsSubpathClosed(first));
  ZvPath2f shapes(fitted, 1, fitted.NumPoints() - 1);
  const ZvRaster<unsigned char> want = RegionMask(r, 9);
  const ZvRaster<unsigned char> got = FillEvenOdd(shapes, 120, 90);
  EXPECT_EQ(FarDifferences(got, want, 2), 0);
  EXPECT_LT(CountDifferences(got, want), 200);
}
