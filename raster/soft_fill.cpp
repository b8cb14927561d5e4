// The soft fill of a path: its two-valued coverage blurred by a separable filter sampled from
// the context's feather profile, optionally faded inwards by the antialiased coverage.
//
// Both passes go through a table H of the raster plus an R-pixel margin on every side. A run of
// covered cells is convolved through the cumulative filter, two lookups per output cell, so a
// pixel whose whole footprint lies inside costs one store of exactly 1.0, and the filter is
// applied tap by tap only to the partial cells along the edges.
#include "raster/fill_context.h"
#include "raster/fill_sweep.h"
#include "raster/scanline_fill.h"

#include <zv/gc.h>
#include <zv/path2f.h>

#include <algorithm>
#include <cmath>
#include <new>
#include <type_traits>

void CFillContext::BuildFeatheringFilters(int radius, int taps, const ZvGC& gc) {
  delete[] featherFilter;
  featherFilter = nullptr;
  featherFilter = new double[taps];
  delete[] cumulativeFeatherFilter;
  cumulativeFeatherFilter = nullptr;
  cumulativeFeatherFilter = new double[taps + 1];
  double* f = featherFilter;
  f[radius] = gc.featherProfile.Eval(0.0, 0);
  // The far tap stands just short of the profile's end at 1.0.
  const double step = 1.0 / (0.5 + radius);
  double sum = 0.0;
  for (int i = 1; i <= radius; ++i) {
    const double v = gc.featherProfile.Eval(i * step, 0);
    f[radius + i] = f[radius - i] = v;
    sum += v;
  }
  const double scale = 1.0 / (f[radius] + 2.0 * sum);
  for (int k = 0; k < taps; ++k)
    f[k] *= scale;
  // C[k] = f[k] + ... + f[taps - 1], with a zero past the end so that a sum over taps j0..j1
  // is always C[j0] - C[j1 + 1].
  double* c = cumulativeFeatherFilter;
  c[taps] = 0.0;
  c[taps - 1] = f[taps - 1];
  for (int k = taps - 2; k >= 0; --k)
    c[k] = f[k] + c[k + 1];
}

namespace {

// Columns convolved together in the vertical pass: H is read, and the raster written, a band's
// width along each row. Both are walked down their rows, a page or more apart, so a band must
// span several cache lines of each to keep the pass from waiting on memory at every row.
constexpr int kBand = 64;

// The part of the filter that falls on a run of covered cells a..b when centred on cell `at`:
// the taps j with at + j - R inside a..b. A cell whose every tap lies in the run gets exactly 1.
struct RunFilter {
  const double* cumulative;
  int radius;

  void Spread(int a, int b, int size, double* out) const {
    const int last = 2 * radius;
    for (int at = std::max(a - radius, 0); at <= std::min(b + radius, size - 1); ++at) {
      const int j0 = std::max(a - at + radius, 0);
      const int j1 = std::min(b - at + radius, last);
      if (j0 == 0 && j1 == last) {
        out[at] = 1.0;
      } else {
        out[at] += cumulative[j0] - cumulative[j1 + 1];
      }
    }
  }
};

template <class T>
T Quantise(double v) {
  if (std::is_same<T, float>::value) return static_cast<T>(v);
  const double full = ZvPixelScale<T>::full;
  const double q = v * full + 0.5;
  // Inside the pixel range the truncation is the rule; opacities above 1 or a profile that
  // sums to 0 could leave it, and the conversion must stay defined.
  if (!(q >= 0.0)) return 0;
  if (q >= full + 1.0) return ZvPixelScale<T>::full;
  return static_cast<T>(static_cast<int>(q));
}

// Fades the blurred value t by the antialiased coverage m of the shape. The integer rules keep
// their historical roundings: a mask of exactly 1 passes t through.
inline void FadeBy(unsigned char m, unsigned char& t) {
  if (m == 0) {
    t = 0;
  } else if (m != 1) {
    const float p = (m * 0.003921569f) * (t * 0.003921569f);
    t = static_cast<unsigned char>(static_cast<int>(p * 255.0 + 0.5));
  }
}
inline void FadeBy(short m, short& t) {
  if (m == 0) {
    t = 0;
  } else if (m != 1) {
    const double a = std::min(std::max(m * 6.1035156e-05, 0.0), 1.0);
    const double b = std::min(std::max(t * 6.1035156e-05, 0.0), 1.0);
    t = static_cast<short>(static_cast<int>(a * b * 16384.0 + 0.5));
  }
}
inline void FadeBy(float m, float& t) {
  if (m == 0) {
    t = 0;
  } else if (m != 1) {
    t = t * m;
  }
}

// The clip step: the shape's own antialiased coverage at full opacity multiplies the result.
// The context's opacity is lent for the moment and given back on every way out. Outside `reach`
// the result already holds `zero`; when that is a plain 0, fading leaves it so whatever the
// mask, and only the pixels inside are visited.
template <class T>
int ClipToShape(const ZvPath2f& path, const ZvGC& gc, ZvRaster<T>& raster, int (*callback)(),
                ZvFillBox reach, T zero) {
  ZvGC& lent = const_cast<ZvGC&>(gc);
  const double opacity = gc.opacity;
  try {
    ZvRaster<T> mask(raster.GetWidth(), raster.GetHeight(), 0);
    mask.SetOrientationFlag(raster.GetOrientationFlag());
    lent.opacity = 1.0;
    path.AAFill(gc, mask, nullptr, nullptr);
    lent.opacity = opacity;
    if (callback && callback()) return 0;
    // A negative or non-finite opacity leaves -0.0 or NaN in a float raster, which the fade
    // turns into 0: then every pixel is visited.
    if (!(zero == T(0) && !std::signbit(static_cast<double>(zero))))
      reach = ZvFillBox{0, 0, raster.GetWidth(), raster.GetHeight()};
    for (int y = reach.yMin; y < reach.yMax; ++y) {
      const int offset = raster.CalculateOffsetForPos(reach.xMin, raster.ConvertBottomUpY(y));
      T* t = raster.GetRaster() + offset;
      const T* m = mask.GetRaster() + offset;
      for (int i = 0, n = reach.xMax - reach.xMin; i < n; ++i)
        FadeBy(m[i], t[i]);
    }
  } catch (const std::bad_alloc&) {
    // Without a mask the unclipped result stands.
    lent.opacity = opacity;
  }
  return 1;
}

// The filter's radius is counted in an int and its buffers grow with the square of the raster
// widened by it: a wider feather is refused rather than cast out of range.
constexpr double kMaxFeatherWidth = 1048576.0;

template <class T>
int SoftFillPath(const ZvPath2f& path, const ZvGC& gc, ZvRaster<T>& raster, int (*callback)()) {
  if (!(gc.featherInner + gc.featherOuter <= kMaxFeatherWidth)) return 0;
  if (!path.IsRasterExtentIntersecting(gc, raster.GetExtent2f())) return 0;
  CFillContext ctx;
  ZvFillBox box;
  int numVertices = 0;
  if (!path.CalculateFillParameters(gc, raster.GetWidth(), raster.GetHeight(), 1.0, ctx, box.xMin,
                                    box.yMin, box.xMax, box.yMax, numVertices, nullptr))
    return 0;
  const double w = gc.featherInner + gc.featherOuter;
  // Nothing to blur: the antialiased fill is the soft fill of a narrow feather.
  if (!(w >= 1.0)) return path.AAFill(gc, raster, nullptr, nullptr);

  const int radius = std::max(static_cast<int>(std::ceil(w - 0.5)), 1);
  const int taps = 2 * radius + 1;
  ctx.BuildFeatheringFilters(radius, taps, gc);
  const int width = raster.GetWidth(), height = raster.GetHeight();
  const int columns = width + 2 * radius, rows = height + 2 * radius;
  // H and the column buffers live in the context, which frees them on every way out. Only the
  // rows and columns the spans can reach are ever written or read, so only they are cleared.
  const std::size_t cells = static_cast<std::size_t>(columns) * static_cast<std::size_t>(rows);
  ctx.rowBuffer0 = new unsigned char[cells * sizeof(double)];
  const int band = std::min(kBand, width);
  ctx.rowBuffer1 = new unsigned char[static_cast<std::size_t>(rows) * band * sizeof(double)];
  double* h = static_cast<double*>(ctx.rowBuffer0);
  double* buffers = static_cast<double*>(ctx.rowBuffer1);
  const int hTop = box.yMin + radius, hEnd = box.yMax + radius;  // rows of H spans reach
  for (int y = hTop; y < hEnd; ++y)
    std::fill(h + static_cast<std::size_t>(y) * columns + box.xMin,
              h + static_cast<std::size_t>(y) * columns + box.xMax + 2 * radius, 0.0);
  const RunFilter run{ctx.cumulativeFeatherFilter, radius};
  const double* f = ctx.featherFilter;

  // Horizontal pass: each span of row y adds its blur to row y + R of H.
  {
    CFillSweep sweep(ctx, numVertices);
    auto spans = [&](auto nonZero) {
      for (int y = box.yMin; y < box.yMax; ++y) {
        if (callback && callback()) return false;
        sweep.Advance(y);
        double* row = h + static_cast<std::size_t>(y + radius) * columns;
        sweep.template Spans<decltype(nonZero)::value>(box.xMin, box.xMax, [&](int l, int r) {
          run.Spread(l + radius, r + radius, columns, row);
        });
      }
      return true;
    };
    const bool done = gc.fillRule ? spans(std::true_type()) : spans(std::false_type());
    if (!done) return 0;
  }

  // Vertical pass. Each column is convolved on its own, in rows top to bottom, but bands of
  // neighbouring columns are walked together so that H is read along its rows; the callback is
  // still asked before each column. Columns and rows the blur cannot reach are written as 0.
  const int reachFirst = std::max(box.xMin - radius, 0),
            reachEnd = std::min(box.xMax + radius, width);
  const int outFirst = std::max(box.yMin - radius, 0), outEnd = std::min(box.yMax + radius, height);
  const T zero = Quantise<T>(0.0 * gc.opacity);
  T* pixels = raster.GetRaster();
  for (int x0 = 0; x0 < width; x0 += band) {
    int n = 0;
    const int columnsHere = std::min(band, width - x0);
    while (n < columnsHere && !(callback && callback()))
      ++n;
    int runStart[kBand];
    for (int c = 0; c < n; ++c) {
      runStart[c] = -1;
      std::fill(buffers + c * rows + box.yMin, buffers + c * rows + hEnd + radius, 0.0);
    }
    const int c0 = std::max(reachFirst - x0, 0), c1 = std::min(reachEnd - x0, n);
    for (int y = hTop; y < hEnd; ++y) {
      const double* cell = h + static_cast<std::size_t>(y) * columns + x0 + radius;
      for (int c = c0; c < c1; ++c) {
        const double v = cell[c];
        double* column = buffers + c * rows;
        if (v >= 1.0) {
          if (runStart[c] < 0) runStart[c] = y;
          continue;
        }
        if (runStart[c] >= 0) {
          run.Spread(runStart[c], y - 1, rows, column);
          runStart[c] = -1;
        }
        if (v > 0.0) {
          for (int k = 0; k < taps; ++k)
            column[y + k - radius] += v * f[k];
        }
      }
    }
    for (int c = c0; c < c1; ++c)
      if (runStart[c] >= 0) run.Spread(runStart[c], hEnd - 1, rows, buffers + c * rows);
    for (int y = 0; y < height; ++y) {
      T* row = pixels + raster.CalculateOffsetForPos(x0, raster.ConvertBottomUpY(y));
      const bool reached = y >= outFirst && y < outEnd;
      for (int c = 0; c < n; ++c)
        row[c] = reached && c >= c0 && c < c1
                     ? Quantise<T>(buffers[c * rows + y + radius] * gc.opacity)
                     : zero;
    }
    if (n < columnsHere) return 0;
  }

  if (gc.clipToShape == 1)
    return ClipToShape(path, gc, raster, callback,
                       ZvFillBox{reachFirst, outFirst, reachEnd, outEnd}, zero);
  return 1;
}

}  // namespace

int ZvPath2f::SoftFill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*callback)()) const {
  return SoftFillPath(*this, gc, raster, callback);
}
int ZvPath2f::SoftFill(const ZvGC& gc, ZvRaster<float>& raster, int (*callback)()) const {
  return SoftFillPath(*this, gc, raster, callback);
}
int ZvPath2f::SoftFill(const ZvGC& gc, ZvRaster<short>& raster, int (*callback)()) const {
  return SoftFillPath(*this, gc, raster, callback);
}
