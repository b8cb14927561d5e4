// The zv tool's reader of SVG path data. The tool's sources are not part of the library, so the
// reader is compiled into this test.
#include "tools/zv/svg_path.cpp"

#include <gtest/gtest.h>

#include <vector>

namespace {
std::vector<float> Coordinates(const ZvPath2f& path) {
  std::vector<float> v;
  for (unsigned int i = 0; i < path.NumPoints(); ++i) {
    const ZvPoint2<float> p = path.GetPoint(i);
    v.push_back(p.x);
    v.push_back(p.y);
  }
  return v;
}

ZvPath2f Parse(const std::string& d) {
  ZvPath2f path;
  std::string error;
  EXPECT_TRUE(ZvParseSvgPath(d, path, error)) << d << ": " << error;
  return path;
}

std::string Error(const std::string& d) {
  ZvPath2f path;
  std::string error;
  EXPECT_FALSE(ZvParseSvgPath(d, path, error)) << d;
  return error;
}
}  // namespace

TEST(SvgPath, AbsoluteAndRelativeLinesWithImplicitRepeats) {
  const std::vector<float> expected = {1, 2, 4, 2, 4, 6, 1, 6};
  EXPECT_EQ(Coordinates(Parse("M1 2 L4 2 4 6 H1")), expected);
  EXPECT_EQ(Coordinates(Parse("m1,2 3,0 v4 h-3")), expected);
  EXPECT_EQ(Coordinates(Parse("M1-2-3.5.5")), (std::vector<float>{1, -2, -3.5f, 0.5f}));
  EXPECT_EQ(Coordinates(Parse("M1e1 2E-1")), (std::vector<float>{10, 0.2f}));
}

TEST(SvgPath, SmoothCurvesReflectTheLastControlPoint) {
  const ZvPath2f c = Parse("M0 0 C0 1 2 1 2 0 S4 -1 4 0");
  EXPECT_EQ(c.NumPoints(), 7u);
  EXPECT_EQ(c.GetPoint(4).x, 2);
  EXPECT_EQ(c.GetPoint(4).y, -1);  // (2, 0) * 2 - (2, 1)
  const ZvPath2f q = Parse("M0 0 Q1 1 2 0 t2 0");
  EXPECT_EQ(Coordinates(q), (std::vector<float>{0, 0, 1, 1, 2, 0, 3, -1, 4, 0}));
  // S after a line starts at the current point.
  EXPECT_EQ(Parse("M0 0 L1 0 S2 1 3 0").GetPoint(2).x, 1);
}

TEST(SvgPath, CloseReturnsToTheStartAndRelativeMovesFollowIt) {
  const ZvPath2f p = Parse("M1 1 l2 0 0 2 z m1 1 l1 0 1 1 Z");
  EXPECT_EQ(p.NumSubpaths(), 2u);
  EXPECT_TRUE(p.IsSubpathClosed(0));
  EXPECT_TRUE(p.IsSubpathClosed(p.NumPoints() - 1));
  unsigned int first = 0, last = 0;
  ASSERT_TRUE(p.GetSubpathIndices(p.NumPoints() - 1, first, last));
  EXPECT_EQ(p.GetPoint(first).x, 2);
  EXPECT_EQ(p.GetPoint(first).y, 2);
}

TEST(SvgPath, MalformedDataNamesTheProblemAndItsOffset) {
  EXPECT_EQ(Error(""), "path data is empty at offset 0");
  EXPECT_EQ(Error("L1 1"), "path data must start with M or m at offset 0");
  EXPECT_EQ(Error("M1 1 L2"), "path data ends in the middle of a command at offset 7");
  EXPECT_EQ(Error("M1 1 L2 x"), "path data expects a number, not 'x' at offset 8");
  EXPECT_EQ(Error("M0 0 A1 1 0 0 1 2 2"),
            "path data has an arc (A), which zv does not draw at offset 5");
  EXPECT_EQ(Error("M0 0 K1 1"), "path data has an unknown command 'K' at offset 5");
  EXPECT_EQ(Error("M0 0 L1 1 Z 3"), "path data has an unexpected '3' at offset 12");
  EXPECT_EQ(Error("M1e999 0"), "path data has a number out of range at offset 1");
}
