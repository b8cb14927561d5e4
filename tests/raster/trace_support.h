// Shared by the tracing tests, the fuzz target and the benchmark: region rasters of various
// shapes, the even-odd fill of a traced path, and a brute-force count of regions and holes.
#ifndef ZV_TESTS_RASTER_TRACE_SUPPORT_H
#define ZV_TESTS_RASTER_TRACE_SUPPORT_H

#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/raster.h>

#include <algorithm>
#include <random>
#include <vector>

// The region the tracer should find: 255 where the raster holds `value`, else 0.
inline ZvRaster<unsigned char> RegionMask(const ZvRaster<unsigned char>& r, unsigned char value) {
  ZvRaster<unsigned char> m(r.GetWidth(), r.GetHeight(), 0);
  for (int i = 0; i < r.GetSize(); ++i)
    if (r.GetVal(i) == value) m.SetVal(i, 255);
  return m;
}

// The plain fill of `path` under the even-odd rule into a cleared raster.
inline ZvRaster<unsigned char> FillEvenOdd(const ZvPath2f& path, int w, int h) {
  ZvRaster<unsigned char> m(w, h, 0);
  ZvGC gc;
  gc.fillRule = 0;
  path.Fill(gc, m, nullptr, nullptr);
  return m;
}

inline int CountDifferences(const ZvRaster<unsigned char>& a, const ZvRaster<unsigned char>& b) {
  int n = 0;
  for (int i = 0; i < a.GetSize(); ++i)
    n += a.GetVal(i) != b.GetVal(i);
  return n;
}

// Regions of pixels equal to `value` (pixels sharing an edge connect) and holes (the other
// pixels, connected also across corners, that cannot reach the border), by flood fill.
struct RegionCount {
  int regions = 0;
  int holes = 0;
};
inline RegionCount CountRegions(const ZvRaster<unsigned char>& r, unsigned char value) {
  // A frame of outside pixels around the raster lets the outside be one flood.
  const int w = r.GetWidth() + 2, h = r.GetHeight() + 2;
  std::vector<int> in(static_cast<std::size_t>(w) * h, 0), label(in.size(), 0);
  for (int y = 0; y < r.GetHeight(); ++y)
    for (int x = 0; x < r.GetWidth(); ++x)
      in[(y + 1) * w + x + 1] = r.GetVal(x, y) == value;
  RegionCount count;
  int next = 0;
  std::vector<int> stack;
  for (int start = 0; start < w * h; ++start) {
    if (label[start]) continue;
    const int kind = in[start];
    label[start] = ++next;
    stack.assign(1, start);
    while (!stack.empty()) {
      const int i = stack.back();
      stack.pop_back();
      const int x = i % w, y = i / w;
      for (int dy = -1; dy <= 1; ++dy)
        for (int dx = -1; dx <= 1; ++dx) {
          if (!dx && !dy) continue;
          if (kind && dx && dy) continue;
          const int nx = x + dx, ny = y + dy;
          if (nx < 0 || ny < 0 || nx >= w || ny >= h) continue;
          const int j = ny * w + nx;
          if (label[j] || in[j] != kind) continue;
          label[j] = next;
          stack.push_back(j);
        }
    }
    if (kind)
      ++count.regions;
    else if (start != 0)
      ++count.holes;
  }
  return count;
}

// Random shapes painted with 1 on 0: concentric discs of alternating value (a disc, a ring,
// nested rings with a dot), U and n shapes, diagonals of pixels touching at corners, scatters.
inline void PaintShapes(ZvRaster<unsigned char>& r, std::mt19937& rng, int shapes) {
  const int w = r.GetWidth(), h = r.GetHeight();
  auto set = [&](int x, int y, unsigned char v) {
    if (x >= 0 && y >= 0 && x < w && y < h) r.SetVal(x, y, v);
  };
  std::uniform_real_distribution<double> u(0.0, 1.0);
  for (int s = 0; s < shapes; ++s) {
    const double cx = u(rng) * w, cy = u(rng) * h, rad = 1 + u(rng) * std::min(w, h) / 4.0;
    const int x0 = static_cast<int>(cx), y0 = static_cast<int>(cy);
    const int size = 3 + static_cast<int>(u(rng) * 10), kind = static_cast<int>(u(rng) * 4);
    if (kind == 0) {
      const int rings = 1 + static_cast<int>(u(rng) * 5);
      for (int k = 0; k < rings; ++k) {
        const double rk = rad + 2 * (rings - 1 - k);
        for (int y = static_cast<int>(cy - rk) - 1; y <= cy + rk + 1; ++y)
          for (int x = static_cast<int>(cx - rk) - 1; x <= cx + rk + 1; ++x)
            if ((x + 0.5 - cx) * (x + 0.5 - cx) + (y + 0.5 - cy) * (y + 0.5 - cy) <= rk * rk)
              set(x, y, k % 2 ? 0 : 1);
      }
    } else if (kind == 1) {  // U or n: a box hollowed from the top or from the bottom
      const bool n = u(rng) < 0.5;
      for (int y = 0; y < size; ++y)
        for (int x = 0; x < size; ++x) {
          const bool inside = x > 0 && x < size - 1 && (n ? y >= 2 : y < size - 2);
          set(x0 + x, y0 + y, inside ? 0 : 1);
        }
    } else if (kind == 2) {
      for (int k = 0; k < size; ++k)
        set(x0 + k, y0 + k, 1);
    } else {
      for (int k = 0; k < 4 * size; ++k)
        set(x0 + static_cast<int>(u(rng) * size), y0 + static_cast<int>(u(rng) * size), 1);
    }
  }
}

// The fuzz target's input: width and height (each byte taken modulo 32, plus 1), the traced
// value, a perimeter and an area threshold in whole pixels, then the pixels row by row (missing
// ones are 0).
struct TraceInput {
  ZvRaster<unsigned char> raster{1, 1, 0};
  unsigned char value = 0;
  double perimeter = 0;
  double area = 0;
};
inline TraceInput DecodeTraceInput(const unsigned char* data, std::size_t size) {
  TraceInput in;
  auto byte = [&](std::size_t i) { return i < size ? data[i] : 0; };
  in.raster.Reconstruct(byte(0) % 32 + 1, byte(1) % 32 + 1, 0);
  in.value = byte(2);
  in.perimeter = byte(3);
  in.area = byte(4);
  for (int i = 0; i < in.raster.GetSize(); ++i)
    in.raster.SetVal(i, byte(5 + static_cast<std::size_t>(i)));
  return in;
}
inline std::vector<unsigned char> EncodeTraceInput(const ZvRaster<unsigned char>& r,
                                                   unsigned char value, unsigned char perimeter,
                                                   unsigned char area) {
  std::vector<unsigned char> b = {static_cast<unsigned char>(r.GetWidth() - 1),
                                  static_cast<unsigned char>(r.GetHeight() - 1), value, perimeter,
                                  area};
  for (int i = 0; i < r.GetSize(); ++i)
    b.push_back(r.GetVal(i));
  return b;
}

#endif
