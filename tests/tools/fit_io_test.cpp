// The text formats of zv fit. The tool's sources are not part of the library, so its reader
// and writer are compiled into this test; the SVG reader comes with svg_path_test.cpp.
#include "tools/zv/fit_io.cpp"

#include <gtest/gtest.h>

#include "tools/zv/svg_path.h"

namespace {
std::vector<ZvPoint2<float>> Read(const std::string& text,
                                  std::vector<double>* pressuresOut = nullptr) {
  std::vector<ZvPoint2<float>> points;
  std::vector<double> pressures;
  std::string error;
  EXPECT_TRUE(ZvReadPenPoints(text, points, pressures, error)) << error;
  if (pressuresOut) *pressuresOut = pressures;
  return points;
}

std::string Error(const std::string& text) {
  std::vector<ZvPoint2<float>> points;
  std::vector<double> pressures;
  std::string error;
  EXPECT_FALSE(ZvReadPenPoints(text, points, pressures, error)) << text;
  return error;
}
}  // namespace

TEST(FitPoints, PairsWithOrWithoutPressure) {
  std::vector<double> pressures{9.0};
  const std::vector<ZvPoint2<float>> p =
      Read("# pen\n1 2\n\n  3.5\t-4\r\n5,6\n1e1 2E-1", &pressures);
  ASSERT_EQ(p.size(), 4u);
  EXPECT_EQ(p[1].x, 3.5f);
  EXPECT_EQ(p[1].y, -4.0f);
  EXPECT_EQ(p[3].y, 0.2f);
  EXPECT_TRUE(pressures.empty());
  const std::vector<ZvPoint2<float>> q = Read("1 2 0.7\n# c\n7, 8, 0\n", &pressures);
  ASSERT_EQ(q.size(), 2u);
  EXPECT_EQ(q[1].x, 7.0f);
  EXPECT_EQ(pressures, (std::vector<double>{0.7, 0.0}));
  EXPECT_TRUE(Read("").empty());
}

TEST(FitPoints, BadLinesAreNamedByNumber) {
  EXPECT_EQ(Error("1 2\n3\n"), "line 2: expected 'x y' or 'x y pressure', not '3'");
  EXPECT_EQ(Error("1 2\n\n# c\n1 2 3 4\n").substr(0, 7), "line 4:");
  // A word, a glued suffix, a trailing comma, no number, no float.
  for (const char* bad : {"x 1", "1 2x", "1 2,", "1 nan", "1 1e39", "1e999 0"})
    EXPECT_EQ(Error(bad).substr(0, 7), "line 1:") << bad;
  // Pressure on every point or on none, and never below 0.
  EXPECT_EQ(Error("1 2\n3 4 1\n"), "line 2: a pressure, but the lines before have none");
  EXPECT_EQ(Error("1 2 1\n3 4\n"), "line 2: no pressure, but the lines before have one");
  EXPECT_EQ(Error("1 2 -0.5").substr(0, 7), "line 1:");
}

TEST(FitPoints, PathDataReadsBackExactly) {
  ZvPath2f path;
  path.Moveto(ZvPoint2<float>{0.1f, 1.0f / 3});
  path.Lineto(ZvPoint2<float>{2, 3});
  path.Curveto(ZvPoint2<float>{4, 5}, ZvPoint2<float>{6, 7});
  path.Curveto(ZvPoint2<float>{8, 9}, ZvPoint2<float>{10, -11.25f},
               ZvPoint2<float>{0.1f, 1.0f / 3});
  path.Closeto();
  path.Moveto(ZvPoint2<float>{1e-7f, 123456.7f});
  std::string data;
  ASSERT_TRUE(ZvFormatSvgPath(path, data));
  ZvPath2f back;
  std::string error;
  ASSERT_TRUE(ZvParseSvgPath(data, back, error)) << data << ": " << error;
  ASSERT_EQ(back.NumPoints(), path.NumPoints());
  for (unsigned int i = 0; i < path.NumPoints(); ++i) {
    EXPECT_EQ(back.GetPoint(i).x, path.GetPoint(i).x);
    EXPECT_EQ(back.GetPoint(i).y, path.GetPoint(i).y);
    EXPECT_EQ(back.GetDegree(i), path.GetDegree(i));
  }
  EXPECT_TRUE(back.IsSubpathClosed(0));
  // SVG has no quartics.
  ZvPath2f quartic;
  quartic.Moveto(ZvPoint2<float>{0, 0});
  const ZvPoint2<float> q[4] = {{1, 1}, {2, 1}, {3, 1}, {4, 0}};
  quartic.AltCurveto(q, 4);
  data.clear();
  EXPECT_FALSE(ZvFormatSvgPath(quartic, data));
}
