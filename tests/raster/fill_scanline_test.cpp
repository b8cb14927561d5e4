// The aliased fill against pixel centres: edge inclusions, rules, boxes, orientation, callback,
// and a brute-force point-in-polygon comparison on random polygons.
#include "fill_polygons.h"

#include <gtest/gtest.h>

#include <cmath>
#include <random>

namespace {
std::vector<int> Row(const ZvRaster<unsigned char>& r, int y) {
  std::vector<int> v;
  for (int x = 0; x < r.GetWidth(); ++x)
    v.push_back(r.GetVal(x, y));
  return v;
}

// Crossings of the horizontal ray to the right of p, as winding and as parity, and whether p
// lies within `margin` of an edge.
struct Inside {
  int winding = 0;
  int crossings = 0;
  bool ambiguous = false;
};

Inside Classify(const std::vector<Ring>& rings, double px, double py, double margin) {
  Inside in;
  for (const Ring& ring : rings) {
    for (std::size_t i = 0; i < ring.size(); ++i) {
      const ZvPoint2<double> a = ring[i], b = ring[(i + 1) % ring.size()];
      const double dx = b.x - a.x, dy = b.y - a.y;
      const double len = std::sqrt(dx * dx + dy * dy);
      const double t =
          std::max(0.0, std::min(1.0, ((px - a.x) * dx + (py - a.y) * dy) / (len * len)));
      if (std::hypot(a.x + t * dx - px, a.y + t * dy - py) < margin) in.ambiguous = true;
      if (std::fabs(a.y - py) < margin || std::fabs(b.y - py) < margin) in.ambiguous = true;
      if ((a.y <= py) != (b.y <= py)) {
        const double x = a.x + (py - a.y) / dy * dx;
        if (x > px) {
          ++in.crossings;
          in.winding += dy > 0 ? 1 : -1;
        }
      }
    }
  }
  return in;
}
}  // namespace

TEST(ScanlineFill, RectangleOnPixelCentresPaintsBothEndsAndOnlyTheInside) {
  ZvRaster<unsigned char> r(8, 4, 0);
  // Left and right edges on centres 1.5 and 5.5; top on the centre line of row 1, bottom on
  // that of row 3: the lower end is exclusive.
  FillRings({Rect(1.5, 1.5, 5.5, 3.5)}, 1, r, WholeRaster(8, 4));
  EXPECT_EQ(Row(r, 0), std::vector<int>(8, 0));
  const std::vector<int> painted = {0, 255, 255, 255, 255, 255, 0, 0};
  EXPECT_EQ(Row(r, 1), painted);
  EXPECT_EQ(Row(r, 2), painted);
  EXPECT_EQ(Row(r, 3), std::vector<int>(8, 0));
}

TEST(ScanlineFill, ZeroWidthAndHorizontalEdgesPaintNothing) {
  ZvRaster<unsigned char> r(8, 8, 0);
  FillRings({Ring{{2.5, 0}, {2.5, 8}, {2.5, 4}}}, 0, r, WholeRaster(8, 8));
  FillRings({Rect(0, 3.2, 8, 3.4)}, 1, r, WholeRaster(8, 8));
  EXPECT_TRUE(r.AllPixelValuesAre(0));
}

TEST(ScanlineFill, TriangleWithVertexOnSampleLineHasNoGapOrDoubleRow) {
  ZvRaster<unsigned char> r(16, 16, 0);
  // The right vertex (12, 6.5) lies on the sample line of row 6.
  FillRings({Ring{{2, 1}, {12, 6.5}, {2, 12}}}, 0, r, WholeRaster(16, 16));
  for (int y = 1; y < 12; ++y) {
    const double yc = y + 0.5;
    const double right = yc <= 6.5 ? 2 + (yc - 1) / 5.5 * 10 : 2 + (12 - yc) / 5.5 * 10;
    int count = 0;
    for (int x = 0; x < 16; ++x)
      count += r.GetVal(x, y) == 255;
    EXPECT_EQ(count, static_cast<int>(std::floor(right - 0.5)) - 2 + 1) << "row " << y;
  }
}

TEST(ScanlineFill, InnerSubpathIsAHoleByRuleAndDirection) {
  const Ring outer = Rect(1, 1, 9, 9);
  Ring sameWay = Rect(3, 3, 7, 7);
  Ring reversed(sameWay.rbegin(), sameWay.rend());
  struct Case {
    Ring inner;
    int rule;
    int centre;
  } cases[] = {{sameWay, 0, 0}, {reversed, 0, 0}, {sameWay, 1, 255}, {reversed, 1, 0}};
  for (const Case& c : cases) {
    ZvRaster<unsigned char> r(10, 10, 0);
    FillRings({outer, c.inner}, c.rule, r, WholeRaster(10, 10));
    EXPECT_EQ(r.GetVal(5, 5), c.centre) << "rule " << c.rule;
    EXPECT_EQ(r.GetVal(1, 5), 255);
    EXPECT_EQ(r.GetVal(8, 5), 255);
  }
}

TEST(ScanlineFill, PixelTypesGetTheirFullValueAndOthersStayUntouched) {
  ZvRaster<short> s(4, 4, 7);
  ZvRaster<float> f(4, 4, 0.25f);
  FillRings({Rect(0, 0, 2, 4)}, 1, s, WholeRaster(4, 4));
  FillRings({Rect(0, 0, 2, 4)}, 1, f, WholeRaster(4, 4));
  for (int y = 0; y < 4; ++y) {
    EXPECT_EQ(s.GetVal(1, y), 16384);
    EXPECT_EQ(s.GetVal(2, y), 7);
    EXPECT_EQ(f.GetVal(0, y), 1.0f);
    EXPECT_EQ(f.GetVal(3, y), 0.25f);
  }
}

TEST(ScanlineFill, OrientationFlagFlipsRows) {
  ZvRaster<unsigned char> r(4, 4, 0);
  r.SetOrientationFlag(1);
  FillRings({Rect(0, 0, 4, 1)}, 1, r, WholeRaster(4, 4));
  EXPECT_EQ(r.GetVal(0, 3), 255);
  EXPECT_EQ(r.GetVal(0, 0), 0);
}

TEST(ScanlineFill, BoxLimitsColumnsAndRows) {
  ZvRaster<unsigned char> r(10, 10, 0);
  FillRings({Rect(0, 0, 10, 10)}, 0, r, ZvFillBox{2, 3, 5, 6});
  int painted = 0;
  for (int y = 0; y < 10; ++y)
    for (int x = 0; x < 10; ++x)
      if (r.GetVal(x, y)) {
        ++painted;
        EXPECT_TRUE(x >= 2 && x < 5 && y >= 3 && y < 6);
      }
  EXPECT_EQ(painted, 9);
}

namespace {
int calls = 0;
int StopAtThird() {
  return ++calls == 3;
}
}  // namespace

TEST(ScanlineFill, CallbackStopsBeforeTheRowItAnswersFor) {
  ZvRaster<unsigned char> r(4, 8, 0);
  calls = 0;
  EXPECT_EQ(FillRings({Rect(0, 0, 4, 8)}, 1, r, WholeRaster(4, 8), StopAtThird), 0);
  EXPECT_EQ(calls, 3);
  EXPECT_EQ(r.GetVal(0, 1), 255);
  EXPECT_EQ(r.GetVal(0, 2), 0);
}

TEST(ScanlineFill, RandomPolygonsMatchPointInPolygonUnderBothRules) {
  std::mt19937 rng(12345);
  std::uniform_real_distribution<double> coord(-5.0, 45.0);
  int checked = 0;
  for (int trial = 0; trial < 60; ++trial) {
    std::vector<Ring> rings(1 + trial % 3);
    for (Ring& ring : rings) {
      ring.resize(3 + rng() % 9);
      for (ZvPoint2<double>& p : ring)
        p = {coord(rng), coord(rng)};
    }
    for (int rule = 0; rule < 2; ++rule) {
      ZvRaster<unsigned char> r(40, 40, 0);
      FillRings(rings, rule, r, WholeRaster(40, 40));
      for (int y = 0; y < 40; ++y) {
        for (int x = 0; x < 40; ++x) {
          const Inside in = Classify(rings, x + 0.5, y + 0.5, 1e-6);
          if (in.ambiguous) continue;
          const bool inside = rule ? in.winding != 0 : (in.crossings & 1) != 0;
          ASSERT_EQ(r.GetVal(x, y) == 255, inside)
              << "trial " << trial << " rule " << rule << " at " << x << "," << y;
          ++checked;
        }
      }
    }
  }
  EXPECT_GT(checked, 150000);
}

TEST(ScanlineFill, NonFiniteVertexFillsNothing) {
  ZvPoint2dArray points;
  ZvPointTagArray tags;
  ToArrays({Ring{{1, 1}, {std::nan(""), 5}, {1, 8}}, Rect(0, 0, 4, 4)}, points, tags);
  CFillContext ctx;
  EXPECT_EQ(ctx.BuildTables(points, tags, 1.0), 0);
}
