// AddFittedSamplesFromPath: resampled and refitted copies of paths.
#include <gtest/gtest.h>
#include <zv/gc.h>
#include <zv/path2f.h>

#include <cmath>

#include "tests/shape/path_fixtures.h"

namespace {

// Distance from q to the nearest point of the path's flattened outline.
double DistanceToOutline(const ZvPath2f& path, const ZvPoint2<float>& q) {
  ZvPoint2fArray pts;
  ZvPointTagArray tags;
  path.AltFlatten(0.01, pts, tags);
  double best = HUGE_VAL;
  for (unsigned int i = 0; i + 1 < pts.size; ++i) {
    if (tags[i] == ZvPointTag_Last) continue;
    const double ax = pts[i].x, ay = pts[i].y, bx = pts[i + 1].x - ax, by = pts[i + 1].y - ay;
    const double l2 = bx * bx + by * by;
    double t = l2 > 0 ? ((q.x - ax) * bx + (q.y - ay) * by) / l2 : 0.0;
    t = t < 0 ? 0 : (t > 1 ? 1 : t);
    best = std::fmin(best, std::hypot(ax + t * bx - q.x, ay + t * by - q.y));
  }
  return best;
}

TEST(PathMeasureFit, FittedCopiesKeepSubpathsEndsAndShape) {
  // A wavy open polyline and a closed polygonal circle.
  ZvPath2f source;
  source.Moveto(P(0, 0));
  for (int k = 1; k <= 40; ++k)
    source.Lineto(P(5.0f * k, 20.0f * std::sin(k * 0.2f)));
  source.Moveto(P(340, 100));
  for (int k = 1; k < 48; ++k)
    source.Lineto(P(300 + 40 * std::cos(k * M_PI / 24), 100 + 40 * std::sin(k * M_PI / 24)));
  source.Lineto(P(340, 100));
  ASSERT_EQ(1, source.Closeto());

  ZvGC gc;
  gc.sampleSpacing = 4.0;
  gc.flattenTolerance = 0.5;
  ZvPath2f fitted;
  fitted.Moveto(P(-50, -50));  // existing content stays
  const unsigned int added = fitted.AddFittedSamplesFromPath(gc, source);
  EXPECT_TRUE(fitted.NumPoints() - 1 == added && fitted.NumSubpaths() == 3);
  EXPECT_EQ(-50.0f, fitted.GetPoint(0).x);
  EXPECT_TRUE(PathInvariantHolds(fitted));
  // Far fewer points than the source's 90; the open copy ends on the source's last point and
  // the closed copy is closed.
  EXPECT_LT(added, 60u);
  unsigned int s, e;
  ASSERT_EQ(1, fitted.GetSubpathIndices(1, s, e));
  EXPECT_TRUE(fitted.GetPoint(s).x == 0.0f && fitted.GetPoint(e).x == 200.0f);
  EXPECT_TRUE(fitted.IsSubpathClosed(1) == 0 && fitted.IsSubpathClosed(e + 1) == 1);
  // Every source vertex lies near the copy: the sampling cuts corners of at most a few tenths
  // on these gentle curves, and the fit adds at most its tolerance.
  for (unsigned int i = 0; i < source.NumPoints(); ++i)
    EXPECT_LT(DistanceToOutline(fitted, source.GetPoint(i)), 1.5) << i;

  // A path fitted from itself sees the state before the call.
  const unsigned int before = fitted.NumPoints();
  fitted.AddFittedSamplesFromPath(gc, fitted);
  EXPECT_TRUE(fitted.NumSubpaths() == 6 && fitted.NumPoints() > before);
}

}  // namespace
