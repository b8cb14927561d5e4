// The antialiased fill's fast loops against a plain one kept here: one bool per sub-sample, spans
// set sample by sample, and each value counted sample by sample over its (widened) cell. Both
// take their spans from the same sweep, so the comparison isolates what the fast loops do with
// them: setting cells, counting, feathering, the written range and the output formulas. The
// checksum of every output pins the values themselves, so that a change shared by both loops
// is caught too.
#include "fill_polygons.h"

#include "raster/aa_output.h"
#include "raster/fill_sweep.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

namespace {

struct FillCase {
  int rate, rule, radius;
  double opacity;
};

// The plain loop: sweeps the same rows and columns as the fill, keeps every sample, and writes
// the cells the fill writes, row by row.
template <class T>
void ReferenceFill(const std::vector<Ring>& rings, const FillCase& c, ZvRaster<T>& raster) {
  ZvPoint2dArray points;
  ZvPointTagArray tags;
  ToArrays(rings, points, tags);
  CFillContext ctx;
  const int numVertices = ctx.BuildTables(points, tags, c.rate);
  const int n = c.rate == 4 ? 4 : 8;
  const int radius = std::min(std::max(c.radius, 0), n);
  const bool unity = std::fabs(c.opacity - 1.0) <= 1e-07;
  const auto weight = ZvAAPixel<T>::Weight(unity ? 1.0 : c.opacity, n + 2 * radius);
  const int w = raster.GetWidth(), h = raster.GetHeight();
  const int e = radius > 0 ? 1 : 0;
  const int cols = (w + 2 * e) * n;  // samples of cells -e..w+e-1
  const int rows = (h + 2 * e) * n;
  std::vector<char> inside(static_cast<std::size_t>(cols) * rows, 0);
  std::vector<int> touchedMin(h + 2 * e, w + e), touchedMax(h + 2 * e, -e - 1);
  CFillSweep sweep(ctx, numVertices);
  for (int sy = 0; sy < rows; ++sy) {
    const int py = sy / n;  // swept pixel row, from -e
    sweep.Advance((py - e) * n + sy % n);
    auto span = [&](int x0, int x1) {
      for (int x = x0; x <= x1; ++x)
        inside[static_cast<std::size_t>(sy) * cols + (x + e * n)] = 1;
      touchedMin[py] = std::min(touchedMin[py], (x0 + e * n) / n - e);
      touchedMax[py] = std::max(touchedMax[py], (x1 + e * n) / n - e);
    };
    if (c.rule)
      sweep.Spans<true>(-e * n, (w + e) * n, span);
    else
      sweep.Spans<false>(-e * n, (w + e) * n, span);
  }
  for (int y = 0; y < h; ++y) {
    // The written cells: those touched in the row, or, feathered, the cells next to those touched
    // in the row or either neighbour (the untouched ones between get a zero count).
    int lo = touchedMin[y + e], hi = touchedMax[y + e];
    if (e) {
      for (int d : {-1, 1}) {
        lo = std::min(lo, touchedMin[y + e + d]);
        hi = std::max(hi, touchedMax[y + e + d]);
      }
      lo = std::max(lo - 1, 0);
      hi = std::min(hi + 1, w - 1);
    }
    for (int x = lo; x <= hi; ++x) {
      unsigned int count = 0;
      for (int sy = (y + e) * n - radius; sy < (y + e + 1) * n + radius; ++sy)
        for (int sx = (x + e) * n - radius; sx < (x + e + 1) * n + radius; ++sx)
          count += inside[static_cast<std::size_t>(sy) * cols + sx];
      raster.SetVal(x, raster.ConvertBottomUpY(y), ZvAAPixel<T>::Value(count, weight));
    }
  }
}

// Deterministic draws, the same with every standard library: the distributions' algorithms are
// not fixed, the engine's output is.
struct Draw {
  std::mt19937 engine{20240601u};
  double Unit() { return (engine() >> 5) * (1.0 / 134217728.0); }  // 27 bits, exact
  int Int(int lo, int hi) { return lo + static_cast<int>(engine() % (hi - lo + 1)); }
  // Mostly free coordinates; some on the 1/16 grid, which puts vertices and edges on sample
  // lines and sample columns of both rates.
  double Coord(double lo, double hi) {
    const double v = lo + Unit() * (hi - lo);
    return Int(0, 3) == 0 ? std::round(v * 16.0) / 16.0 : v;
  }
};

std::vector<Ring> RandomRings(Draw& d, int w, int h) {
  std::vector<Ring> rings(d.Int(1, 3));
  for (Ring& ring : rings) {
    const int count = d.Int(3, 10);
    const bool far = d.Int(0, 40) == 0;  // a vertex far outside, clipped in double precision
    for (int i = 0; i < count; ++i)
      ring.push_back({d.Coord(-3.0, w + 3.0), d.Coord(-3.0, h + 3.0)});
    if (far) ring[0].x = d.Int(0, 1) ? 1e7 : -1e7;
  }
  return rings;
}

std::uint32_t Crc32(std::uint32_t crc, const unsigned char* p, std::size_t n) {
  crc = ~crc;
  while (n--) {
    crc ^= *p++;
    for (int k = 0; k < 8; ++k)
      crc = (crc >> 1) ^ (0xEDB88320u & (0u - (crc & 1u)));
  }
  return ~crc;
}

// The little-endian bytes of a value: the checksum is the same whatever the host's order.
std::uint32_t AddValue(std::uint32_t crc, unsigned char v) {
  return Crc32(crc, &v, 1);
}
std::uint32_t AddValue(std::uint32_t crc, short v) {
  const auto u = static_cast<std::uint16_t>(v);
  const unsigned char b[2] = {static_cast<unsigned char>(u), static_cast<unsigned char>(u >> 8)};
  return Crc32(crc, b, 2);
}
std::uint32_t AddValue(std::uint32_t crc, float v) {
  std::uint32_t u;
  std::memcpy(&u, &v, 4);
  const unsigned char b[4] = {static_cast<unsigned char>(u), static_cast<unsigned char>(u >> 8),
                              static_cast<unsigned char>(u >> 16),
                              static_cast<unsigned char>(u >> 24)};
  return Crc32(crc, b, 4);
}

// Fills with both loops over a background that shows which cells were written; answers the
// number of differing pixels and adds the fill's output to the checksum.
template <class T>
int Compare(const std::vector<Ring>& rings, const FillCase& c, int w, int h, T background,
            std::uint32_t& crc) {
  ZvRaster<T> fast(w, h, background), plain(w, h, background);
  ZvGC gc;
  gc.samplingRate = c.rate;
  gc.fillRule = c.rule;
  gc.featherRadius = c.radius;
  gc.opacity = c.opacity;
  AAFillRings(rings, gc, fast);
  ReferenceFill(rings, c, plain);
  int differing = 0;
  for (int i = 0; i < w * h; ++i) {
    differing += std::memcmp(&fast.GetValByConstRef(i), &plain.GetValByConstRef(i), sizeof(T)) != 0;
    crc = AddValue(crc, fast.GetVal(i));
  }
  return differing;
}

}  // namespace

TEST(AAFillReference, FastLoopsMatchThePlainLoopOnRandomPaths) {
  Draw d;
  std::uint32_t crc = 0;
  int failures = 0;
  const double opacities[] = {1.0, 1.0 - 5e-8, 0.5, 0.37, 1.6};
  for (int i = 0; i < 10000; ++i) {
    const int w = d.Int(1, 40), h = d.Int(1, 40);
    const std::vector<Ring> rings = RandomRings(d, w, h);
    const int rate = d.Int(0, 1) ? 8 : 4;
    FillCase c{rate, d.Int(0, 1), d.Int(0, 2) ? 0 : d.Int(-1, rate + 1), opacities[d.Int(0, 4)]};
    const int diff = Compare<unsigned char>(rings, c, w, h, 7, crc) +
                     Compare<short>(rings, c, w, h, -5, crc) +
                     Compare<float>(rings, c, w, h, 0.25f, crc);
    if (diff && ++failures <= 5)
      ADD_FAILURE() << "path " << i << ": rate " << c.rate << " rule " << c.rule << " radius "
                    << c.radius << " opacity " << c.opacity << ", " << diff << " pixels differ";
  }
  EXPECT_EQ(failures, 0);
#if !defined(__i386__) || defined(__SSE2_MATH__)
  // The checksum of the outputs as they were before the loops were made fast. x87 arithmetic
  // rounds the sweep's crossings differently, so it is only pinned where doubles are doubles.
  EXPECT_EQ(crc, 0x6E3A80C0u);
#endif
}
