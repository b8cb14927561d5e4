#include <zv/point.h>
#include <zv/trace.h>

#include <gtest/gtest.h>

#include <string>

namespace {

using P2f = ZvPoint2<float>;
using P2d = ZvPoint2<double>;

TEST(ClosestPoint, ProjectsClampsAndRefuses) {
  double d2 = -1, t = -1;
  EXPECT_EQ(ZvPoint2_FindClosestPointOnLineSegment(P2d{5, 3}, P2d{0, 0}, P2d{10, 0}, 100.0, d2, t),
            1);
  EXPECT_DOUBLE_EQ(d2, 9.0);
  EXPECT_DOUBLE_EQ(t, 0.5);

  EXPECT_EQ(ZvPoint2_FindClosestPointOnLineSegment(P2d{-4, 3}, P2d{0, 0}, P2d{10, 0}, 100.0, d2, t),
            1);
  EXPECT_DOUBLE_EQ(d2, 25.0);
  EXPECT_EQ(t, 0.0);

  // Too far: the distance is kept, but the raw parameter has been written already.
  d2 = -1;
  EXPECT_EQ(ZvPoint2_FindClosestPointOnLineSegment(P2d{20, 5}, P2d{0, 0}, P2d{10, 0}, 1.0, d2, t),
            0);
  EXPECT_EQ(d2, -1.0);
  EXPECT_DOUBLE_EQ(t, 2.0);

  // a = b measures to a with t = 0.
  t = -1;
  EXPECT_EQ(ZvPoint2_FindClosestPointOnLineSegment(P2d{3, 4}, P2d{0, 0}, P2d{0, 0}, 100.0, d2, t),
            1);
  EXPECT_DOUBLE_EQ(d2, 25.0);
  EXPECT_EQ(t, 0.0);

  ZvPoint3<double> p{1, 1, 1}, a{0, 0, 0}, b{2, 0, 0};
  EXPECT_EQ(ZvPoint3_FindClosestPointOnLineSegment(p, a, b, 10.0, d2, t), 1);
  EXPECT_DOUBLE_EQ(d2, 2.0);
  EXPECT_DOUBLE_EQ(t, 0.5);
}

TEST(Angles, AxesQuadrantsAndFullTurn) {
  EXPECT_EQ(AngleWithFirstAxisDegree(1, 0), 0.0);
  EXPECT_DOUBLE_EQ(AngleWithFirstAxisDegree(0, 1), 90.0);
  EXPECT_DOUBLE_EQ(AngleWithFirstAxisDegree(-1, 0), 180.0);
  EXPECT_DOUBLE_EQ(AngleWithFirstAxisDegree(0, -1), 270.0);
  EXPECT_NEAR(AngleWithFirstAxisDegree(1, -1), 315.0, 1e-12);
  EXPECT_NEAR(AngleWithFirstAxisDegree(-1, 1), 135.0, 1e-12);
  EXPECT_NEAR(AngleWithFirstAxisRadian(-1, -1), 5 * 3.141592653589793 / 4, 1e-12);
  EXPECT_EQ(AngleWithFirstAxisRadian(1, -1e-300), 0.0);  // within 1e-15 of a full turn
  EXPECT_LT(AngleWithFirstAxisDegree(1, -1e-6), 360.0);
}

TEST(Angles, SweepBetweenVectors) {
  double deg = -1;
  EXPECT_EQ(ZvPoint2_AngleInDegrees(P2d{1, 1}, P2d{1, 1}, deg), 1);
  EXPECT_EQ(deg, 0.0);
  EXPECT_EQ(ZvPoint2_AngleInDegrees(P2d{1, 0}, P2d{0, -1}, deg), 1);
  EXPECT_DOUBLE_EQ(deg, 270.0);
  EXPECT_EQ(ZvPoint2_AngleInDegrees(P2d{0, -1}, P2d{1, 0}, deg), 1);
  EXPECT_DOUBLE_EQ(deg, 90.0);
  EXPECT_EQ(ZvPoint2_AngleInDegrees(P2f{1, 0}, P2f{1, -1e-3f}, deg), 1);
  EXPECT_LT(deg, 360.0);
  EXPECT_GT(deg, 359.9);
  deg = 7;
  EXPECT_EQ(ZvPoint2_AngleInDegrees(P2f{0, 0}, P2f{1, 0}, deg), 0);
  EXPECT_EQ(deg, 7.0);
}

TEST(Projection, AlongDirectionAndOrthogonal) {
  P2f out{};
  EXPECT_EQ(ZvPoint2_ParallelProjectionOnLineAB(P2f{3, 5}, P2f{0, 0}, P2f{10, 0}, P2f{0, 0}, out),
            1);
  EXPECT_FLOAT_EQ(out.x, 3.0f);
  EXPECT_FLOAT_EQ(out.y, 0.0f);
  EXPECT_EQ(ZvPoint2_ParallelProjectionOnLineAB(P2f{3, 5}, P2f{0, 0}, P2f{10, 0}, P2f{1, 1}, out),
            1);
  EXPECT_FLOAT_EQ(out.x, -2.0f);
  EXPECT_FLOAT_EQ(out.y, 0.0f);
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
