// The tracer's output on small regions whose contours are known: corners, order and sense of
// contours, connectivity, thresholds, and the calls that answer 0.
#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/vectorizer.h>

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

// The table's calls as text: N new component, M x,y move, x,y line, C close component.
struct Recorder {
  std::string calls;
  static void Add(void* u, const std::string& s) { static_cast<Recorder*>(u)->calls += s + " "; }
  static ObCallbackTable Table() {
    return {
        nullptr,
        [](void* u) { Add(u, "N"); },
        [](int x, int y, void* u) { Add(u, "M" + std::to_string(x) + "," + std::to_string(y)); },
        [](int x, int y, void* u) { Add(u, std::to_string(x) + "," + std::to_string(y)); },
        [](void* u) { Add(u, "C"); },
        nullptr};
  }
};

std::string Calls(const ZvRaster<unsigned char>& r) {
  Recorder rec;
  EXPECT_EQ(ZvVectorizer(0, 0).Trace(r, 1, r.GetExtent2f(), Recorder::Table(), &rec), 1);
  return rec.calls;
}

// A path's points, subpath by subpath, "Z" closing the closed ones.
std::string PathText(const ZvPath2f& path) {
  std::string s;
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  while (it.GetNextSubPathIndices(first, last)) {
    for (unsigned int i = first; i <= last; ++i) {
      const ZvPoint2<float> p = path.GetPoint(i);
      s +=
          std::to_string(static_cast<int>(p.x)) + "," + std::to_string(static_cast<int>(p.y)) + " ";
    }
    s += path.IsSubpathClosed(first) ? "Z " : "open ";
  }
  return s;
}

std::string Traced(const ZvRaster<unsigned char>& r, double perimeter = 0, double area = 0) {
  ZvPath2f path;
  const unsigned int n = ZvVectorizer(perimeter, area).Vectorize(r, 1, r.GetExtent2f(), path);
  EXPECT_EQ(n, path.NumPoints());
  return PathText(path);
}
}  // namespace

TEST(Vectorize, LonePixelAndRingComeOutAsPixelEdgesWithHolesTheOtherWayRound) {
  EXPECT_EQ(Calls(Picture({"#."})), "N M0,0 0,1 1,1 1,0 0,0 C ");
  EXPECT_EQ(Traced(Picture({"#."})), "0,0 0,1 1,1 1,0 0,0 Z ");
  // Each corner of the sweep gives the unit edge of its row, so a straight side may show a point
  // in its middle; the path joins such lines. The hole follows its outer contour.
  const ZvRaster<unsigned char> ring = Picture({"####", "#..#", "#..#", "####"});
  EXPECT_EQ(Calls(ring), "N M0,0 0,1 0,3 0,4 4,4 4,3 4,1 4,0 0,0 M1,2 1,1 3,1 3,2 3,3 1,3 1,2 C ");
  EXPECT_EQ(Traced(ring), "0,0 0,4 4,4 4,0 0,0 Z 1,2 1,1 3,1 3,3 1,3 1,2 Z ");
  // A staircase keeps a corner on every step.
  EXPECT_EQ(Traced(Picture({"#...", "##..", "###.", "###."})),
            "0,0 0,4 3,4 3,2 2,2 2,1 1,1 1,0 0,0 Z ");
}

TEST(Vectorize, UAndNShapesAreOneContourAndCornerContactsDoNotConnect) {
  // U: two births merged below. It starts at the topmost, then leftmost corner.
  EXPECT_EQ(Calls(Picture({"#.#", "###"})), "N M0,0 0,1 0,2 3,2 3,1 3,0 2,0 2,1 1,1 1,0 0,0 C ");
  // n: the gap under the arch opens to the outside, so no hole is emitted.
  EXPECT_EQ(Calls(Picture({"###", "#.#"})), "N M0,0 0,1 0,2 1,2 1,1 2,1 2,2 3,2 3,1 3,0 0,0 C ");
  // Pixels touching at corners stay apart, and a ring of them round a pixel makes no hole.
  const std::string diamond = Calls(Picture({".#.", "#.#", ".#."}));
  EXPECT_EQ(std::count(diamond.begin(), diamond.end(), 'N'), 4);
  EXPECT_EQ(std::count(diamond.begin(), diamond.end(), 'M'), 4);
  // Regions come out in the order they end: the short bar on the right first.
  EXPECT_EQ(Traced(Picture({"#.#", "#..", "#.."})), "2,0 2,1 3,1 3,0 2,0 Z 0,0 0,3 1,3 1,0 0,0 Z ");
}

TEST(Vectorize, ThresholdsDropSmallContoursAndOuterOnesTakeTheirHoles) {
  // A 7x7 square with a 1x1 hole and a 3x3 hole.
  const ZvRaster<unsigned char> r =
      Picture({"#######", "#.#####", "#######", "###...#", "###...#", "###...#", "#######"});
  auto contours = [&r](double perimeter, double area) {
    const std::string s = Traced(r, perimeter, area);
    return std::count(s.begin(), s.end(), 'Z');
  };
  EXPECT_EQ(contours(0, 1e-9), 3);
  // Sizes are those of the corner polygons, whose corners stand on the first and last rows and
  // columns of the runs: the small hole encloses 0 and measures 4 round, the big one 8 and 12,
  // the outer square 36 and 24. Negative thresholds count as their size.
  EXPECT_EQ(contours(0, 2), 2);
  EXPECT_EQ(contours(0, -8), 2);
  EXPECT_EQ(contours(0, 9), 1);
  EXPECT_EQ(contours(0, 36), 1);
  EXPECT_EQ(contours(0, 37), 0);
  EXPECT_EQ(contours(5, 0), 2);
  EXPECT_EQ(contours(-12, 0), 2);
  EXPECT_EQ(contours(13, 0), 1);
  EXPECT_EQ(contours(25, 0), 0);
  ZvVectorizer v(0, 0);
  v.SetAreaThreshold(-3);
  v.SetPerimeterThreshold(-1);
  EXPECT_EQ(v.GetAreaThreshold(), 3.0);
  EXPECT_EQ(v.GetPerimeterThreshold(), 1.0);
}

TEST(Vectorize, NothingToTraceAnswersZeroAndLeavesThePathAlone) {
  ZvPath2f path;
  path.Moveto({5, 5});
  const ZvVectorizer v(0, 0);
  const ZvRaster<unsigned char> blank(6, 3, 0), empty(0, 0, 0);
  EXPECT_EQ(v.Vectorize(blank, 1, blank.GetExtent2f(), path), 0u);
  EXPECT_EQ(v.VectorizeAndFit(blank, 1, blank.GetExtent2f(), ZvGC(), path), 0u);
  EXPECT_EQ(v.Vectorize(empty, 0, empty.GetExtent2f(), path), 0u);
  // 16-bit corners: a raster wider than 32767 is refused, even where it matches everywhere.
  const ZvRaster<unsigned char> wide(32768, 1, 1);
  Recorder rec;
  EXPECT_EQ(v.Trace(wide, 1, wide.GetExtent2f(), Recorder::Table(), &rec), 0);
  EXPECT_EQ(rec.calls, "");
  EXPECT_EQ(v.Vectorize(wide, 1, wide.GetExtent2f(), path), 0u);
  EXPECT_EQ(path.NumPoints(), 1u);
  // The widest raster in range traces its full-width run.
  EXPECT_EQ(Traced(ZvRaster<unsigned char>(32767, 1, 1)), "0,0 0,1 32767,1 32767,0 0,0 Z ");
}
