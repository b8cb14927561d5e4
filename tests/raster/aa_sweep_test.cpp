// The antialiased sweep on crowded polygons against sub-sample counts computed line by line, the
// y order of vertex tables, and fills that share a thread's scratch memory: nested in a
// callback, one after another at different sizes, and on several threads at once.
#include "fill_polygons.h"

#include "raster/aa_output.h"
#include "raster/fill_vertex_order.h"

#include <zv/path2f.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <thread>

namespace {
// Inside (1), outside (0) or too close to an edge or a vertex's line to tell (-1), for each
// sample (sx + 0.5) / n, (sy + 0.5) / n of cells -1..size, from the crossings of each sample line
// with every edge, found afresh line by line.
struct Samples {
  int n, size;
  std::vector<int> state;
  int At(int sx, int sy) const {  // sample indices from the left and top of cell -1
    return state[static_cast<std::size_t>(sy) * (size + 2) * n + sx];
  }
};

Samples Sample(const std::vector<Ring>& rings, int rule, int n, int size) {
  Samples s{n, size, {}};
  const int count = (size + 2) * n;
  s.state.resize(static_cast<std::size_t>(count) * count);
  for (int sy = 0; sy < count; ++sy) {
    const double py = (sy + 0.5) / n - 1.0;
    std::vector<std::pair<double, int>> crossings;
    bool lineAmbiguous = false;
    for (const Ring& ring : rings) {
      for (std::size_t i = 0; i < ring.size(); ++i) {
        const ZvPoint2<double> a = ring[i], b = ring[(i + 1) % ring.size()];
        if (std::fabs(a.y - py) < 1e-7) lineAmbiguous = true;
        if ((a.y <= py) != (b.y <= py))
          crossings.push_back({a.x + (py - a.y) / (b.y - a.y) * (b.x - a.x), b.y > a.y ? 1 : -1});
      }
    }
    for (int sx = 0; sx < count; ++sx) {
      const double px = (sx + 0.5) / n - 1.0;
      int winding = 0, parity = 0, state = 0;
      for (const auto& c : crossings) {
        if (std::fabs(c.first - px) < 1e-7) state = -1;
        if (c.first > px) winding += c.second, parity ^= 1;
      }
      if (state == 0) state = (rule ? winding != 0 : parity != 0) ? 1 : 0;
      s.state[static_cast<std::size_t>(sy) * count + sx] = lineAmbiguous ? -1 : state;
    }
  }
  return s;
}

// The count of inside samples in the pixel's cell widened by `radius` samples, or -1 when one
// of them is ambiguous.
int Count(const Samples& s, int x, int y, int radius) {
  int inside = 0;
  for (int sy = (y + 1) * s.n - radius; sy < (y + 2) * s.n + radius; ++sy)
    for (int sx = (x + 1) * s.n - radius; sx < (x + 2) * s.n + radius; ++sx) {
      const int v = s.At(sx, sy);
      if (v < 0) return -1;
      inside += v;
    }
  return inside;
}

std::vector<Ring> CrowdedRings(std::mt19937& rng, int size) {
  std::uniform_real_distribution<double> coord(-4.0, size + 4.0);
  std::vector<Ring> rings(1 + rng() % 3);
  for (Ring& ring : rings) {
    ring.resize(5 + rng() % 40);
    for (ZvPoint2<double>& p : ring)
      p = {coord(rng), coord(rng)};
  }
  return rings;
}
}  // namespace

TEST(AASweep, CrowdedPolygonsMatchSampleCountsAtBothRatesRulesAndRadii) {
  std::mt19937 rng(2024);
  const int size = 24;
  long checked = 0;
  for (int trial = 0; trial < 8; ++trial) {
    const std::vector<Ring> rings = CrowdedRings(rng, size);
    for (int rate : {4, 8}) {
      for (int rule : {0, 1}) {
        const Samples samples = Sample(rings, rule, rate, size);
        for (int radius : {0, 1 + trial % rate}) {
          ZvGC gc;
          gc.samplingRate = rate;
          gc.fillRule = rule;
          gc.featherRadius = radius;
          ZvRaster<unsigned char> r(size, size, 0);
          AAFillRings(rings, gc, r);
          const int s = rate + 2 * radius;
          const unsigned int w = ZvAAPixel<unsigned char>::Weight(1.0, s);
          for (int y = 0; y < size; ++y) {
            for (int x = 0; x < size; ++x) {
              const int n = Count(samples, x, y, radius);
              if (n < 0) continue;
              ASSERT_EQ(r.GetVal(x, y), ZvAAPixel<unsigned char>::Value(n, w))
                  << "trial " << trial << " rate " << rate << " rule " << rule << " radius "
                  << radius << " at " << x << "," << y;
              ++checked;
            }
          }
        }
      }
    }
  }
  EXPECT_GT(checked, 30000);  // nearly every pixel: ambiguous samples are rare
}

TEST(AASweep, VertexOrderRisesOnTiesSkewAndExtremeRanges) {
  std::mt19937 rng(5);
  std::uniform_real_distribution<double> u(0.0, 1.0);
  std::vector<std::vector<double>> cases = {
      {3.0, 1.0, 2.0}, {-1e308, 1e308, 0.0, 5.0}, std::vector<double>(300, 7.5)};
  std::vector<double> spread, ties, skewed, wide;
  for (int i = 0; i < 2000; ++i) {
    spread.push_back(u(rng) * 1000.0);
    ties.push_back(static_cast<double>(rng() % 5));
    skewed.push_back(i == 77 ? 1e6 : u(rng) * 1e-9);  // one bucket takes all but one
    wide.push_back((u(rng) - 0.5) * 1e300);
  }
  cases.insert(cases.end(), {spread, ties, skewed, wide});
  for (const std::vector<double>& ys : cases) {
    const int n = static_cast<int>(ys.size());
    std::vector<CFillVertex> vertices(n);
    std::vector<CFillSortedVertex> unsorted(n), records(n);
    for (int i = 0; i < n; ++i) {
      vertices[i] = {static_cast<double>(i), ys[i]};
      unsorted[i] = {i, i - 1, i + 1, vertices.data()};
    }
    ZvOrderByRisingY(unsorted.data(), records.data(), n, vertices.data());
    std::vector<int> seen(n, 0);
    for (int i = 0; i < n; ++i) {
      ++seen[records[i].index];
      EXPECT_EQ(records[i].prev, records[i].index - 1);  // records move whole
      if (i > 0) {
        ASSERT_LE(ys[records[i - 1].index], ys[records[i].index]) << n << " at " << i;
      }
    }
    EXPECT_EQ(std::count(seen.begin(), seen.end(), 1), n);
  }
}

// Vertices grouped by sample line, in vertex order within a line, give the fills the same
// pixels as vertices in y order. Coordinates on coarse grids make many vertices share a line,
// a y or an x, and edges coincide or cross exactly at sample points.
TEST(AASweep, VerticesGroupedBySampleLineFillAsInYOrder) {
  std::mt19937 rng(23);
  for (int round = 0; round < 300; ++round) {
    const int w = 8 + static_cast<int>(rng() % 40), h = 8 + static_cast<int>(rng() % 40);
    const double grid = round % 3 == 0 ? 1.0 : round % 3 == 1 ? 0.125 : 0.0;
    auto coord = [&](double size) {
      const double v = std::uniform_real_distribution<double>(-2.0, size + 2.0)(rng);
      return grid > 0 ? std::round(v / grid) * grid : v;
    };
    std::vector<Ring> rings(1 + rng() % 6);
    for (Ring& ring : rings) {
      ring.resize(3 + rng() % 40);
      for (auto& q : ring)
        q = {coord(w), coord(h)};
    }
    rings.push_back(Rect(1, 1, w / 2, h / 2));  // shares its edges with the next one
    rings.push_back(Rect(w / 2, 1, w - 1, h / 2));
    ZvGC gc;
    gc.samplingRate = round % 2 ? 8 : 4;
    gc.fillRule = (round / 2) % 2;
    gc.featherRadius = round % 5 == 0 ? 2 : 0;
    gc.opacity = round % 7 == 0 ? 0.37 : 1.0;
    auto same = [&](auto zero) {
      using T = decltype(zero);
      ZvRaster<T> byY(w, h, zero), byLine(w, h, zero), plainY(w, h, zero), plainLine(w, h, zero);
      AAFillRings(rings, gc, byY);
      AAFillRings(rings, gc, byLine, nullptr, true);
      FillRings(rings, gc.fillRule, plainY, WholeRaster(w, h));
      FillRings(rings, gc.fillRule, plainLine, WholeRaster(w, h), nullptr, true);
      for (int i = 0; i < w * h; ++i) {
        if (byY.GetVal(i) != byLine.GetVal(i) || plainY.GetVal(i) != plainLine.GetVal(i))
          return false;
      }
      return true;
    };
    EXPECT_TRUE(same(static_cast<unsigned char>(0))) << round;
    EXPECT_TRUE(same(static_cast<short>(0))) << round;
    EXPECT_TRUE(same(0.0f)) << round;
  }
}

namespace {
// Circles of cubics: a path of many vertices over the raster (seed 1) or a couple in a corner.
ZvPath2f Circles(unsigned int seed) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<float> u(0.0f, 1.0f);
  const int count = seed == 1 ? 60 : 2;
  const float spread = seed == 1 ? 80.0f : 6.0f, size = seed == 1 ? 9.0f : 3.0f;
  ZvPath2f path;
  for (int b = 0; b < count; ++b) {
    const float cx = 2 + u(rng) * spread, cy = 2 + u(rng) * spread, r = size * (0.5f + u(rng));
    const float k = 0.5523f * r;
    path.Moveto({cx + r, cy});
    path.Curveto({cx + r, cy + k}, {cx + k, cy + r}, {cx, cy + r});
    path.Curveto({cx - k, cy + r}, {cx - r, cy + k}, {cx - r, cy});
    path.Curveto({cx - r, cy - k}, {cx - k, cy - r}, {cx, cy - r});
    path.Curveto({cx + k, cy - r}, {cx + r, cy - k}, {cx + r, cy});
    path.CloseSubpath(path.NumPoints() - 1);
  }
  return path;
}

using Pixels = std::vector<unsigned char>;

// Fill k of a path: aliased (0), 4x4 (1) or 8x8 with a radius (2).
Pixels Render(const ZvPath2f& path, int k, int (*callback)() = nullptr) {
  ZvGC gc;
  gc.samplingRate = 4 * k;
  gc.featherRadius = k == 2 ? 3 : 0;
  ZvRaster<unsigned char> r(96, 96, 0);
  if (k)
    path.AAFill(gc, r, callback, nullptr);
  else
    path.Fill(gc, r, callback, nullptr);
  return Pixels(r.GetRaster(), r.GetRaster() + 96 * 96);
}

const ZvPath2f large = Circles(1), small = Circles(2);
Pixels nested;
int calls = 0;
int FillSmallOnTenthRow() {
  if (++calls == 10) nested = Render(small, 2);
  return 0;
}
}  // namespace

TEST(AASweep, ScratchMemoryIsReusedWithoutCarryingAnythingOver) {
  // What each fill gives on a thread whose scratch memory is fresh.
  Pixels fresh[2][3];
  std::thread([&fresh] {
    for (int k = 0; k < 3; ++k)
      fresh[0][k] = Render(large, k), fresh[1][k] = Render(small, k);
  }).join();
  // Large and small fills one after the other, twice over.
  for (int i = 0; i < 12; ++i)
    EXPECT_EQ(Render(i % 2 ? small : large, i % 3), fresh[i % 2][i % 3]) << i;
  // A fill started from another's callback, while that one holds the thread's blocks.
  calls = 0;
  EXPECT_EQ(Render(large, 1, FillSmallOnTenthRow), fresh[0][1]);
  EXPECT_EQ(nested, fresh[1][2]);
  // Threads filling at the same time, each with its own blocks.
  std::vector<std::thread> threads;
  std::vector<int> mismatches(4, 0);
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([t, &fresh, &mismatches] {
      for (int i = t; i < t + 12; ++i)
        mismatches[t] += Render(i % 2 ? small : large, i % 3) != fresh[i % 2][i % 3];
    });
  }
  for (std::thread& th : threads)
    th.join();
  EXPECT_EQ(mismatches, std::vector<int>(4, 0));
}
