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
    std::vector<CFillSortedVertex> records(n);
    for (int i = 0; i < n; ++i) {
      vertices[i] = {static_cast<double>(i), ys[i]};
      records[i] = {i, i - 1, i + 1, vertices.data()};
    }
    ZvOrderByRisingY(records.data(), n, vertices.data());
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

namespace {
// Blobs of cubics: many vertices over the whole raster, or a few in one corner.
ZvPath2f Blobs(unsigned int seed, int count, float spread, float radius) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<float> u(0.0f, 1.0f);
  ZvPath2f path;
  for (int b = 0; b < count; ++b) {
    const float cx = 2 + u(rng) * spread, cy = 2 + u(rng) * spread, r = radius * (0.5f + u(rng));
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

const ZvPath2f& Large() {
  static const ZvPath2f path = Blobs(1, 60, 80.0f, 9.0f);
  return path;
}
const ZvPath2f& Small() {
  static const ZvPath2f path = Blobs(2, 2, 6.0f, 3.0f);
  return path;
}

using Pixels = std::vector<unsigned char>;

Pixels Render(const ZvPath2f& path, int rate, int (*callback)() = nullptr) {
  ZvGC gc;
  gc.samplingRate = rate;
  gc.featherRadius = rate == 8 ? 3 : 0;
  ZvRaster<unsigned char> r(96, 96, 0);
  if (rate)
    path.AAFill(gc, r, callback, nullptr);
  else
    path.Fill(gc, r, callback, nullptr);
  return Pixels(r.GetRaster(), r.GetRaster() + 96 * 96);
}

// What each fill gives on a thread whose scratch memory is fresh.
struct References {
  Pixels large[3], small[3];  // aliased, 4x4, 8x8
};
const References& Fresh() {
  static const References refs = [] {
    References r;
    std::thread([&r] {
      for (int k = 0; k < 3; ++k) {
        r.large[k] = Render(Large(), 4 * k);
        r.small[k] = Render(Small(), 4 * k);
      }
    }).join();
    return r;
  }();
  return refs;
}

Pixels nestedSmall;
int calls = 0;
int FillSmallOnTenthRow() {
  if (++calls == 10) nestedSmall = Render(Small(), 8);
  return 0;
}
}  // namespace

TEST(AASweep, ScratchMemoryIsReusedWithoutCarryingAnythingOver) {
  const References& fresh = Fresh();
  // A large fill, then small ones and large ones again, aliased and at both rates.
  for (int round = 0; round < 2; ++round) {
    for (int k = 0; k < 3; ++k) {
      EXPECT_EQ(Render(Large(), 4 * k), fresh.large[k]) << round << " " << k;
      EXPECT_EQ(Render(Small(), 4 * k), fresh.small[k]) << round << " " << k;
    }
  }
  // A fill started from another's callback, while that one holds the thread's blocks.
  calls = 0;
  EXPECT_EQ(Render(Large(), 4, FillSmallOnTenthRow), fresh.large[1]);
  EXPECT_EQ(nestedSmall, fresh.small[2]);
  // Threads filling at the same time each with their own blocks.
  std::vector<std::thread> threads;
  std::vector<int> mismatches(4, 0);
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([t, &fresh, &mismatches] {
      for (int i = 0; i < 12; ++i) {
        const int k = (t + i) % 3;
        const bool large = (t + i) % 2 == 0;
        if (Render(large ? Large() : Small(), 4 * k) != (large ? fresh.large[k] : fresh.small[k]))
          ++mismatches[t];
      }
    });
  }
  for (std::thread& th : threads)
    th.join();
  EXPECT_EQ(mismatches, std::vector<int>(4, 0));
}
