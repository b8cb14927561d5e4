// The tracer's output on small regions whose contours are known: corners, order and sense of
// contours, connectivity, thresholds, and the calls that answer 0.
#include <zv/path2f.h>
#include <zv/vectorizer.h>

#include "trace_support.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

namespace {
// Pictures: '#' is the traced value 1, anything else 0; rows top first.
ZvRaster<unsigned char> Picture(const std::vector<std::string>& rows) {
  ZvRaster<unsigned char> r(static_cast<int>(rows[0].size()), static_cast<int>(rows.size()), 0);
  for (std::size_t y = 0; y < rows.size(); ++y)
    for (std::size_t x = 0; x < rows[y].size(); ++x)
      if (rows[y][x] == '#') r.SetVal(static_cast<int>(x), static_cast<int>(y), 1);
  return r;
}

// The table's calls as text: N new component, M x y, L x y, C close component.
struct Recorder {
  std::string calls;
  static ObCallbackTable Table() {
    return {nullptr,
            [](void* u) { static_cast<Recorder*>(u)->calls += "N "; },
            [](int x, int y, void* u) {
              static_cast<Recorder*>(u)->calls +=
                  "M" + std::to_string(x) + "," + std::to_string(y) + " ";
            },
            [](int x, int y, void* u) {
              static_cast<Recorder*>(u)->calls += std::to_string(x) + "," + std::to_string(y) + " ";
            },
            [](void* u) { static_cast<Recorder*>(u)->calls += "C "; },
            nullptr};
  }
};

std::string Calls(const ZvRaster<unsigned char>& r, double perimeter = 0, double area = 0) {
  Recorder rec;
  ZvVectorizer v(perimeter, area);
  EXPECT_EQ(v.Trace(r, 1, r.GetExtent2f(), Recorder::Table(), &rec), 1);
  return rec.calls;
}

std::vector<std::vector<ZvPoint2<float>>> Subpaths(const ZvPath2f& path) {
  std::vector<std::vector<ZvPoint2<float>>> out;
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  while (it.GetNextSubPathIndices(first, last)) {
    out.emplace_back();
    for (unsigned int i = first; i <= last; ++i)
      out.back().push_back(path.GetPoint(i));
  }
  return out;
}

double SignedArea(const std::vector<ZvPoint2<float>>& ring) {
  double a = 0;
  for (std::size_t i = 0; i + 1 < ring.size(); ++i)
    a += static_cast<double>(ring[i].x) * ring[i + 1].y -
         static_cast<double>(ring[i + 1].x) * ring[i].y;
  return a / 2;
}

std::vector<float> Flat(const std::vector<ZvPoint2<float>>& ring) {
  std::vector<float> v;
  for (const auto& p : ring) {
    v.push_back(p.x);
    v.push_back(p.y);
  }
  return v;
}
}  // namespace

TEST(Vectorize, LonePixelIsItsUnitSquareDownTheLeftEdgeFirst) {
  const ZvRaster<unsigned char> r = Picture({"#."});
  EXPECT_EQ(Calls(r), "N M0,0 0,1 1,1 1,0 0,0 C ");
  ZvVectorizer v(0, 0);
  ZvPath2f path;
  EXPECT_EQ(v.Vectorize(r, 1, r.GetExtent2f(), path), 5u);
  ASSERT_EQ(Subpaths(path).size(), 1u);
  EXPECT_EQ(Flat(Subpaths(path)[0]), (std::vector<float>{0, 0, 0, 1, 1, 1, 1, 0, 0, 0}));
  EXPECT_TRUE(path.IsSubpathClosed(0));
}

TEST(Vectorize, StraightSidesAreOneLineAndStepsAreCornersOnPixelEdges) {
  // A staircase on the right and a straight left side: every corner is an integer, lines are
  // horizontal or vertical, and no two lines in a row continue each other.
  const ZvRaster<unsigned char> r = Picture({"#...", "##..", "###.", "###."});
  ZvVectorizer v(0, 0);
  ZvPath2f path;
  v.Vectorize(r, 1, r.GetExtent2f(), path);
  const auto rings = Subpaths(path);
  ASSERT_EQ(rings.size(), 1u);
  EXPECT_EQ(Flat(rings[0]),
            (std::vector<float>{0, 0, 0, 4, 3, 4, 3, 2, 2, 2, 2, 1, 1, 1, 1, 0, 0, 0}));
}

TEST(Vectorize, RingHasItsHoleAfterTheOuterContourInTheOppositeSense) {
  const ZvRaster<unsigned char> r = Picture({"####", "#..#", "#..#", "####"});
  // Each corner of the sweep gives the unit edge of its row, so a straight side may show a point
  // in its middle; the path joins such lines.
  EXPECT_EQ(Calls(r), "N M0,0 0,1 0,3 0,4 4,4 4,3 4,1 4,0 0,0 M1,2 1,1 3,1 3,2 3,3 1,3 1,2 C ");
  ZvVectorizer v(0, 0);
  ZvPath2f path;
  v.Vectorize(r, 1, r.GetExtent2f(), path);
  const auto rings = Subpaths(path);
  ASSERT_EQ(rings.size(), 2u);
  EXPECT_EQ(SignedArea(rings[0]), -16.0);
  EXPECT_EQ(SignedArea(rings[1]), 4.0);
  EXPECT_TRUE(path.IsSubpathClosed(0));
  EXPECT_TRUE(path.IsSubpathClosed(rings[0].size()));
}

TEST(Vectorize, UAndNShapesAreOneContourAndCornerContactsDoNotConnect) {
  // U: two births merged below. It starts at the topmost, then leftmost corner.
  EXPECT_EQ(Calls(Picture({"#.#", "###"})), "N M0,0 0,1 0,2 3,2 3,1 3,0 2,0 2,1 1,1 1,0 0,0 C ");
  // n: the gap under the arch opens to the outside, so no hole is emitted.
  EXPECT_EQ(Calls(Picture({"###", "#.#"})), "N M0,0 0,1 0,2 1,2 1,1 2,1 2,2 3,2 3,1 3,0 0,0 C ");
  // A diagonal: three regions, and a ring of corner contacts around a pixel is no hole.
  const ZvRaster<unsigned char> diagonal = Picture({"#..", ".#.", "..#"});
  const std::string calls = Calls(diagonal);
  EXPECT_EQ(std::count(calls.begin(), calls.end(), 'N'), 3);
  const ZvRaster<unsigned char> diamond = Picture({".#.", "#.#", ".#."});
  const std::string diamondCalls = Calls(diamond);
  EXPECT_EQ(std::count(diamondCalls.begin(), diamondCalls.end(), 'N'), 4);
  EXPECT_EQ(std::count(diamondCalls.begin(), diamondCalls.end(), 'M'), 4);
}

TEST(Vectorize, ComponentsComeOutInTheOrderTheyEnd) {
  // The tall bar on the left ends last, so the short one on the right comes out first.
  const std::string calls = Calls(Picture({"#.#", "#..", "#.."}));
  EXPECT_EQ(calls, "N M2,0 2,1 3,1 3,0 2,0 C N M0,0 0,1 0,2 0,3 1,3 1,2 1,1 1,0 0,0 C ");
}

TEST(Vectorize, ThresholdsDropSmallContoursAndOuterOnesTakeTheirHoles) {
  // A 7x7 square with a 1x1 hole and a 3x3 hole.
  const ZvRaster<unsigned char> r =
      Picture({"#######.", "#.#####.", "#######.", "###...#.", "###...#.", "###...#.", "#######."});
  auto contours = [&r](double perimeter, double area) {
    ZvVectorizer v(perimeter, area);
    ZvPath2f path;
    v.Vectorize(r, 1, r.GetExtent2f(), path);
    return Subpaths(path).size();
  };
  EXPECT_EQ(contours(0, 0), 3u);
  // Sizes are those of the corner polygons, whose corners stand on the first and last rows and
  // columns of the runs: the small hole encloses 0 and measures 4 round, the big one 8 and 12,
  // the outer square 36 and 24.
  EXPECT_EQ(contours(0, 1e-9), 3u);
  EXPECT_EQ(contours(0, 2), 2u);
  EXPECT_EQ(contours(0, -8), 2u);
  EXPECT_EQ(contours(0, 9), 1u);
  EXPECT_EQ(contours(0, 36), 1u);
  EXPECT_EQ(contours(0, 37), 0u);
  EXPECT_EQ(contours(5, 0), 2u);
  EXPECT_EQ(contours(-12, 0), 2u);
  EXPECT_EQ(contours(13, 0), 1u);
  EXPECT_EQ(contours(24, 0), 1u);
  EXPECT_EQ(contours(25, 0), 0u);
  ZvVectorizer v(0, 0);
  v.SetAreaThreshold(-3);
  v.SetPerimeterThreshold(-1);
  EXPECT_EQ(v.GetAreaThreshold(), 3.0);
  EXPECT_EQ(v.GetPerimeterThreshold(), 1.0);
}

TEST(Vectorize, NothingToTraceAnswersZeroAndLeavesThePathAlone) {
  ZvPath2f path;
  path.Moveto({5, 5});
  ZvVectorizer v(0, 0);
  const ZvRaster<unsigned char> blank(6, 3, 0);
  ZvGC gc;
  EXPECT_EQ(v.Vectorize(blank, 1, blank.GetExtent2f(), path), 0u);
  EXPECT_EQ(v.VectorizeAndFit(blank, 1, blank.GetExtent2f(), gc, path), 0u);
  const ZvRaster<unsigned char> empty(0, 0, 0);
  EXPECT_EQ(v.Vectorize(empty, 0, empty.GetExtent2f(), path), 0u);
  // 16-bit corners: a raster wider than 32767 is refused, even where it matches everywhere.
  const ZvRaster<unsigned char> wide(32768, 1, 1);
  Recorder rec;
  EXPECT_EQ(v.Trace(wide, 1, wide.GetExtent2f(), Recorder::Table(), &rec), 0);
  EXPECT_EQ(rec.calls, "");
  EXPECT_EQ(v.Vectorize(wide, 1, wide.GetExtent2f(), path), 0u);
  EXPECT_EQ(path.NumPoints(), 1u);
  // The widest raster in range traces its full-width run.
  const ZvRaster<unsigned char> widest(32767, 1, 1);
  ZvPath2f line;
  EXPECT_EQ(v.Vectorize(widest, 1, widest.GetExtent2f(), line), 5u);
  EXPECT_EQ(line.GetPoint(2).x, 32767.0f);
}
