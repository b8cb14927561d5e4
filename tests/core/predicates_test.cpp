#include <zv/point.h>
#include <zv/trace.h>

#include <gtest/gtest.h>

#include <string>

namespace {

using P2f = ZvPoint2<float>;
using P2d = ZvPoint2<double>;

TEST(ClosestPoint, ProjectsClampsAndRefuses) {
  const struct {
    P2d p, a, b;
    double limit;
    int found;
    double d2, t;
  } cases[] = {
      {{5, 3}, {0, 0}, {10, 0}, 100, 1, 9, 0.5},
      {{-4, 3}, {0, 0}, {10, 0}, 100, 1, 25, 0},
      {{20, 5}, {0, 0}, {10, 0}, 1, 0, -1, 2},  // too far: d2 kept, the raw t written already
      {{3, 4}, {0, 0}, {0, 0}, 100, 1, 25, 0},  // a = b measures to a with t = 0
  };
  for (const auto& c : cases) {
    double d2 = -1, t = -1;
    EXPECT_EQ(ZvPoint2_FindClosestPointOnLineSegment(c.p, c.a, c.b, c.limit, d2, t), c.found);
    EXPECT_DOUBLE_EQ(d2, c.d2) << c.p.x;
    EXPECT_DOUBLE_EQ(t, c.t) << c.p.x;
  }
  double d2, t;
  ZvPoint3<double> p{1, 1, 1}, a{0, 0, 0}, b{2, 0, 0};
  EXPECT_EQ(ZvPoint3_FindClosestPointOnLineSegment(p, a, b, 10.0, d2, t), 1);
  EXPECT_TRUE(d2 == 2.0 && t == 0.5);
}

TEST(Angles, AxesQuadrantsAndFullTurn) {
  const double axes[][3] = {{1, 0, 0}, {0, 1, 90}, {-1, 0, 180}, {0, -1, 270}};
  for (const auto& c : axes)
    EXPECT_DOUBLE_EQ(AngleWithFirstAxisDegree(c[0], c[1]), c[2]) << c[0] << "," << c[1];
  EXPECT_NEAR(AngleWithFirstAxisDegree(1, -1), 315.0, 1e-12);
  EXPECT_NEAR(AngleWithFirstAxisDegree(-1, 1), 135.0, 1e-12);
  EXPECT_NEAR(AngleWithFirstAxisRadian(-1, -1), 5 * 3.141592653589793 / 4, 1e-12);
  EXPECT_EQ(AngleWithFirstAxisRadian(1, -1e-300), 0.0);  // within 1e-15 of a full turn
  EXPECT_LT(AngleWithFirstAxisDegree(1, -1e-6), 360.0);
}

TEST(Angles, SweepBetweenVectors) {
  // From the first vector counter-clockwise to the second.
  const struct {
    P2d a, b;
    double deg;
  } cases[] = {{{1, 1}, {1, 1}, 0}, {{1, 0}, {0, -1}, 270}, {{0, -1}, {1, 0}, 90}};
  double deg = -1;
  for (const auto& c : cases) {
    EXPECT_EQ(ZvPoint2_AngleInDegrees(c.a, c.b, deg), 1);
    EXPECT_DOUBLE_EQ(deg, c.deg);
  }
  EXPECT_EQ(ZvPoint2_AngleInDegrees(P2f{1, 0}, P2f{1, -1e-3f}, deg), 1);
  EXPECT_TRUE(deg > 359.9 && deg < 360.0) << deg;
  deg = 7;
  EXPECT_EQ(ZvPoint2_AngleInDegrees(P2f{0, 0}, P2f{1, 0}, deg), 0);
  EXPECT_EQ(deg, 7.0);
}

TEST(Projection, AlongDirectionAndOrthogonal) {
  P2f out{};
  EXPECT_EQ(ZvPoint2_ParallelProjectionOnLineAB(P2f{3, 5}, P2f{0, 0}, P2f{10, 0}, P2f{0, 0}, out),
            1);
  EXPECT_TRUE(out.x == 3.0f && out.y == 0.0f);
  EXPECT_EQ(ZvPoint2_ParallelProjectionOnLineAB(P2f{3, 5}, P2f{0, 0}, P2f{10, 0}, P2f{1, 1}, out),
            1);
  EXPECT_TRUE(out.x == -2.0f && out.y == 0.0f);
  // Parallel direction and degenerate line fail and leave the output alone.
  out = {9, 9};
  EXPECT_EQ(ZvPoint2_ParallelProjectionOnLineAB(P2f{3, 5}, P2f{0, 0}, P2f{10, 0}, P2f{1, 0}, out),
            0);
  EXPECT_EQ(ZvPoint2_ParallelProjectionOnLineAB(P2f{3, 5}, P2f{1, 1}, P2f{1, 1}, P2f{0, 0}, out),
            0);
  EXPECT_EQ(out.x, 9.0f);
}

TEST(Containment, SegmentsAndTriangles) {
  EXPECT_EQ(ZvPoint2_IsInLineSegment(P2f{5, 0}, P2f{0, 0}, P2f{10, 0}), 1);
  EXPECT_EQ(ZvPoint2_IsInLineSegment(P2f{11, 0}, P2f{0, 0}, P2f{10, 0}), 0);
  EXPECT_EQ(ZvPoint2_IsInLineSegment(P2f{5, 0.01f}, P2f{0, 0}, P2f{10, 0}), 0);
  EXPECT_EQ(ZvPoint2_IsInLineSegment(P2f{1e-4f, 0}, P2f{0, 0}, P2f{0, 0}), 1);

  const P2f a{0, 0}, b{10, 0}, c{0, 10};
  EXPECT_EQ(ZvPoint2_IsInTriangle(P2f{2, 2}, a, b, c), 1);
  EXPECT_EQ(ZvPoint2_IsInTriangle(P2f{8, 8}, a, b, c), 0);  // beyond edge b-c
  // Beyond the third edge c-a with c1 and c2 agreeing: the third sign is not compared.
  EXPECT_EQ(ZvPoint2_IsInTriangle(P2f{-1, 5}, a, b, c), 1);
  // On the line of a-b, the fallback asks whether a vertex lies between the next vertex and p:
  // the middle of edge a-b is not found, a point beyond a is.
  EXPECT_EQ(ZvPoint2_IsInTriangle(P2f{5, 0}, a, b, c), 0);
  EXPECT_EQ(ZvPoint2_IsInTriangle(P2f{-5, 0}, a, b, c), 1);
  // Degenerate triangle with a = b: is a on segment c-p?
  EXPECT_EQ(ZvPoint2_IsInTriangle(P2f{0, -3}, a, a, c), 1);
}

TEST(Trace, TruncatesAndFormatsTwice) {
  testing::internal::CaptureStdout();
  _zvTRACE("%s", std::string(600, 'x').c_str());
  _zvTRACE("%d%s", 5, "%%");
  fflush(stdout);
  const std::string out = testing::internal::GetCapturedStdout();
  EXPECT_EQ(out, std::string(511, 'x') + "5%");
}

}  // namespace
