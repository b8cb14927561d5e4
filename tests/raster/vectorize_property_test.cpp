// Tracing against brute force on random rasters: the traced path, filled under the even-odd
// rule, gives back the region pixel for pixel, and it has one outer contour per region and one
// contour per hole, as a flood fill counts them.
#include <zv/path2f.h>
#include <zv/vectorizer.h>

#include "raster/vect_path.h"
#include "trace_support.h"

#include <gtest/gtest.h>

#include <vector>

namespace {
struct Counts {
  int components = 0;
  int contours = 0;
};

Counts CountCalls(const ZvRaster<unsigned char>& r, unsigned char value) {
  Counts c;
  const ObCallbackTable table = {nullptr,
                                 [](void* u) { ++static_cast<Counts*>(u)->components; },
                                 [](int, int, void* u) { ++static_cast<Counts*>(u)->contours; },
                                 nullptr,
                                 nullptr,
                                 nullptr};
  ZvVectorizer(0, 0).Trace(r, value, r.GetExtent2f(), table, &c);
  return c;
}

void ExpectExact(const ZvRaster<unsigned char>& r, unsigned char value, const char* what) {
  ZvVectorizer v(0, 0);
  ZvPath2f path;
  const unsigned int n = v.Vectorize(r, value, r.GetExtent2f(), path);
  EXPECT_EQ(n, path.NumPoints()) << what;
  const ZvRaster<unsigned char> want = RegionMask(r, value);
  EXPECT_EQ(CountDifferences(FillEvenOdd(path, r.GetWidth(), r.GetHeight()), want), 0) << what;
  // Every subpath is a closed polyline of horizontal and vertical lines on integer corners.
  EXPECT_TRUE(n == 0 || path.IsPolyline()) << what;
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  while (it.GetNextSubPathIndices(first, last)) {
    EXPECT_TRUE(path.IsSubpathClosed(first)) << what;
    for (unsigned int i = first; i < last; ++i) {
      const ZvPoint2<float> a = path.GetPoint(i), b = path.GetPoint(i + 1);
      EXPECT_TRUE((a.x == b.x) != (a.y == b.y)) << what << " at " << i;
      EXPECT_EQ(a.x, static_cast<float>(static_cast<int>(a.x))) << what;
    }
  }
  // Vectorize joins lines on integer corners; the path table's callbacks, which test the float
  // points, must give the same path.
  ZvPath2f viaTable;
  VectClosure closure(viaTable);
  v.Trace(r, value, r.GetExtent2f(), VectPathTable(), &closure);
  EXPECT_EQ(closure.emitted, n) << what;
  std::vector<unsigned char> a(path.GetBufferSize()), b(viaTable.GetBufferSize());
  path.WriteToBuffer(a.data());
  viaTable.WriteToBuffer(b.data());
  EXPECT_EQ(a, b) << what;
  const RegionCount brute = CountRegions(r, value);
  const Counts calls = CountCalls(r, value);
  EXPECT_EQ(calls.components, brute.regions) << what;
  EXPECT_EQ(calls.contours, brute.regions + brute.holes) << what;
}
}  // namespace

TEST(VectorizeProperty, ShapesOfEveryKindAreTracedExactly) {
  std::mt19937 rng(1234);
  for (int trial = 0; trial < 200; ++trial) {
    const int w = 1 + static_cast<int>(rng() % 70), h = 1 + static_cast<int>(rng() % 70);
    ZvRaster<unsigned char> r(w, h, 0);
    PaintShapes(r, rng, 1 + static_cast<int>(rng() % 12));
    const std::string what = "shapes trial " + std::to_string(trial);
    // The shapes, and the background around them, whose holes are the shapes.
    ExpectExact(r, 1, what.c_str());
    ExpectExact(r, 0, what.c_str());
  }
}

TEST(VectorizeProperty, NoiseOfEveryDensityIsTracedExactly) {
  // Noise makes every event meet every other: merges of many components in one row, holes
  // joining the outside, holes joining holes, regions inside holes of others.
  std::mt19937 rng(99);
  for (int trial = 0; trial < 300; ++trial) {
    const int w = 1 + static_cast<int>(rng() % 40), h = 1 + static_cast<int>(rng() % 40);
    const unsigned int density = 1 + rng() % 99;
    ZvRaster<unsigned char> r(w, h, 0);
    for (int i = 0; i < r.GetSize(); ++i)
      r.SetVal(i, static_cast<unsigned char>(rng() % 100 < density ? 7 : rng() % 3));
    const std::string what = "noise trial " + std::to_string(trial);
    ExpectExact(r, 7, what.c_str());
    ExpectExact(r, 1, what.c_str());
  }
}
