// Parallel polylines of ZvPath2f, against an offset computed here from angles.
#include <zv/path2f.h>

#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "path_fixtures.h"

namespace {

const double kPi = 3.14159265358979323846;

// Where vertex k must land, found from angles rather than normal vectors: the bisector of the
// left normals of the edges into and out of k (the polygon wrapping around even when open) has
// the mean of their directions, and the vertex moves by exactly `offset` along it. False where
// the two edges fold back on each other and the bisector is not defined.
bool Expected(const ZvPath2f& path, unsigned int m, unsigned int k, double offset, double& x,
              double& y) {
  const ZvPoint2<float> prev = path.GetPoint(k == 0 ? m - 1 : k - 1), at = path.GetPoint(k);
  const ZvPoint2<float> next = path.GetPoint(k + 1 == m ? 0 : k + 1);
  const double in = std::atan2(double(at.y) - prev.y, double(at.x) - prev.x) + kPi / 2;
  const double out = std::atan2(double(next.y) - at.y, double(next.x) - at.x) + kPi / 2;
  double turn = std::remainder(out - in, 2 * kPi);
  if (std::fabs(std::fabs(turn) - kPi) < 0.05) return false;
  const double mid = in + turn / 2;
  x = at.x + offset * std::cos(mid);
  y = at.y + offset * std::sin(mid);
  return true;
}

ZvPath2f RandomPolyline(std::mt19937& g, bool closed) {
  std::uniform_real_distribution<float> coord(-50.0f, 50.0f);
  const int n = 3 + int(g() % 10);
  ZvPath2f path;
  const ZvPoint2<float> first = P(coord(g), coord(g));
  path.Moveto(first);
  for (int i = 1; i < n; ++i)
    path.Lineto(P(coord(g), coord(g)));
  if (closed) {
    path.Lineto(first);
    path.Closeto();
  }
  return path;
}

void ExpectOffset(const ZvPath2f& path, const ZvPath2f& out, bool closed, double offset) {
  const unsigned int n = path.NumPoints(), m = closed ? n - 1 : n;
  for (unsigned int k = 0; k < m; ++k) {
    double x = 0, y = 0;
    if (!Expected(path, m, k, offset, x, y)) continue;
    EXPECT_NEAR(out.GetPoint(k).x, x, 2e-5 * (1 + std::fabs(x))) << k;
    EXPECT_NEAR(out.GetPoint(k).y, y, 2e-5 * (1 + std::fabs(y))) << k;
  }
  if (closed) {
    EXPECT_TRUE(out.GetPoint(m).x == out.GetPoint(0).x && out.GetPoint(m).y == out.GetPoint(0).y);
  }
}

}  // namespace

TEST(PathParallel, EveryVertexMovesByTheOffsetAlongItsBisector) {
  std::mt19937 g(7);
  for (int round = 0; round < 200; ++round) {
    const bool closed = round % 2 == 0;
    const ZvPath2f path = RandomPolyline(g, closed);
    const float offset = float(int(g() % 200) - 100) / 10.0f;
    ZvPath2f left(path), right(path);
    ASSERT_EQ(path.GetSimilarPath(offset, 0, left), 1);
    ASSERT_EQ(path.GetSimilarPath(offset, 1, right), 1);
    ExpectOffset(path, left, closed, offset);
    ExpectOffset(path, right, closed, -offset);
    if (!closed) continue;
    ZvPath2f inner(path), outer(path);
    ASSERT_EQ(path.GetInwardOutwardPaths(2.5f, offset, inner, outer), 1);
    ExpectOffset(path, inner, true, -2.5);
    ExpectOffset(path, outer, true, offset);
  }
}

TEST(PathParallel, SquareCornersMoveAlongTheirBisectorsOnly) {
  // Counter-clockwise, so the left side is inside: each corner moves 1 along its diagonal and
  // lands at (0.707, 0.707) from it, not on the corner (1, 1) of the inset square.
  const ZvPath2f square = ClosedSquare(0, 0, 10, 10);
  ZvPath2f out(square);
  ASSERT_EQ(square.GetSimilarPath(1.0f, 0, out), 1);
  const float h = float(std::sqrt(0.5));
  EXPECT_NEAR(out.GetPoint(0).x, h, 1e-6f);
  EXPECT_NEAR(out.GetPoint(0).y, h, 1e-6f);
  EXPECT_NEAR(out.GetPoint(2).x, 10 - h, 1e-6f);
  EXPECT_NEAR(out.GetPoint(2).y, 10 - h, 1e-6f);
  EXPECT_EQ(Codes(out), Codes(square));

  // An open polyline is wrapped too: a lone line folds back on itself and does not move.
  const ZvPath2f line = Segment(0, 0, 5, 0);
  ZvPath2f same(line);
  ASSERT_EQ(line.GetSimilarPath(3.0f, 0, same), 1);
  EXPECT_TRUE(same.GetPoint(0).x == 0 && same.GetPoint(0).y == 0 && same.GetPoint(1).x == 5);

  // A repeated vertex has a zero-length edge with no normal, and gives no NaN.
  ZvPath2f repeated;
  repeated.Moveto(P(0, 0));
  repeated.Lineto(P(10, 0));
  repeated.Lineto(P(10, 0));
  repeated.Lineto(P(10, 10));
  repeated.Lineto(P(0, 0));
  repeated.Closeto();
  ZvPath2f r(repeated);
  ASSERT_EQ(repeated.GetSimilarPath(1.0f, 0, r), 1);
  for (unsigned int k = 0; k < r.NumPoints(); ++k)
    EXPECT_TRUE(std::isfinite(r.GetPoint(k).x) && std::isfinite(r.GetPoint(k).y)) << k;

  // Outputs of another size are refused and left alone.
  ZvPath2f small = Segment(1, 1, 2, 2), fits(square);
  EXPECT_EQ(square.GetSimilarPath(1.0f, 0, small), 0);
  EXPECT_EQ(square.GetInwardOutwardPaths(1.0f, 1.0f, fits, small), 0);
  EXPECT_TRUE(small.GetPoint(0).x == 1 && fits.GetPoint(1).x == 10 && fits.GetPoint(1).y == 0);
}
