// The antialiased fill: one sweep told once over the cell layout, the pixel type, the fill rule
// and whether opacity is unity; the compiler makes the specialised loops.
#include "raster/aa_fill.h"

#include "raster/aa_cells.h"
#include "raster/aa_output.h"
#include "raster/fill_sweep.h"

#include <algorithm>
#include <cmath>
#include <type_traits>

namespace {

template <class C, class T, bool NonZero, bool Unity>
class AASweep {
 public:
  using Word = typename C::Word;
  using Pixel = ZvAAPixel<T>;
  static constexpr int N = C::N;

  AASweep(CFillContext& ctx, int numVertices, int radius, double opacity, ZvRaster<T>& raster)
      : ctx(ctx),
        sweep(ctx, numVertices),
        radius(radius),
        weight(Pixel::Weight(Unity ? 1.0 : opacity, N + 2 * radius)),
        masks(radius > 0 ? radius : 1),
        raster(raster) {}

  int Run(const ZvFillBox& box, int (*callback)()) {
    const int e = (radius + N - 1) / N;  // margin in whole pixels: 0 or 1
    xLo = std::max(box.xMin - e, 0);
    xHi = std::min(box.xMax + e, raster.GetWidth());
    const int yLo = std::max(box.yMin - e, 0);
    const int yHi = std::min(box.yMax + e, raster.GetHeight());
    if (xLo >= xHi || yLo >= yHi) return 1;
    first = xLo - e;
    end = xHi + e;
    C::Allocate(ctx, first, end, radius > 0);
    Word*(&rows)[3] = C::Rows(ctx);
    // 4x4 even-odd asks the callback once per pixel row, the others once per sub-sample row.
    const bool perSubRow = N == 8 || NonZero;
    int rowMin[3] = {end, end, end};  // touched cells of the rows, oldest first
    int rowMax[3] = {first - 1, first - 1, first - 1};
    for (int py = yLo - e; py < yHi + e; ++py) {
      if (!perSubRow && callback && callback()) return 0;
      Word* cells = rows[radius > 0 ? 2 : 0];
      Word* runs = C::Runs(ctx);
      int minCell = end, maxCell = -1;
      for (int r = 0; r < N; ++r) {
        if (perSubRow && callback && callback()) return 0;
        sweep.Advance(py * N + r);
        sweep.template Spans<NonZero>(first * N, end * N, [&](int x0, int x1) {
          ZvMarkCells<C>(cells, runs, r, x0, x1, minCell, maxCell);
        });
      }
      if (radius == 0) {
        OutputOwnCells(cells, runs, minCell, maxCell, Row(py));
        continue;
      }
      ResolveRuns(cells, runs, minCell, maxCell);
      rowMin[2] = minCell;
      rowMax[2] = maxCell;
      if (py >= yLo + 1) {
        const int lo = std::max(std::min({rowMin[0], rowMin[1], rowMin[2]}) - 1, xLo);
        const int hi = std::min(std::max({rowMax[0], rowMax[1], rowMax[2]}) + 1, xHi - 1);
        if (lo <= hi) OutputFeathered(rows, lo, hi, Row(py - 1));
      }
      // The oldest row becomes the newest, cleared where it was touched.
      Word* oldest = rows[0];
      Clear(oldest, rowMin[0], rowMax[0]);
      rows[0] = rows[1];
      rows[1] = rows[2];
      rows[2] = oldest;
      rowMin[0] = rowMin[1];
      rowMax[0] = rowMax[1];
      rowMin[1] = rowMin[2];
      rowMax[1] = rowMax[2];
    }
    return 1;
  }

 private:
  T* Row(int y) const {
    return raster.GetRaster() + raster.CalculateOffsetForPos(0, raster.ConvertBottomUpY(y));
  }

  void Clear(Word* cells, int lo, int hi) const {
    for (int x = std::max(lo, first); x <= hi; ++x)
      cells[x] = 0;
  }

  T CellValue(Word w) const {
    if (Unity && N == 4 && std::is_same<T, unsigned char>::value)
      return static_cast<T>(gc_oABTable[w & 0xFFFFu]);  // the table holds the value
    return Pixel::Value(C::Count(w), weight);
  }

  // Writes the values of the touched cells and clears them and the runs for the next row.
  // A cell that no span ends in is known by the runs alone, and so is every cell after it up to
  // the next flip or end: inside a shape, outside it and along its horizontal edges such a
  // stretch takes one value and is written as a block. The last touched cell holds an end, so
  // the stretch stops there at the latest.
  void OutputOwnCells(Word* cells, Word* runs, int lo, int hi, T* out) const {
    Word whole = 0;
    for (int x = lo; x <= hi;) {
      whole ^= runs[x];
      runs[x] = 0;
      if (!cells[x]) {
        const int stop = ZvNextMarkedCell(cells, runs, x + 1);
        std::fill(out + x, out + stop, CellValue(whole));
        x = stop;
        continue;
      }
      out[x] = CellValue(cells[x] | whole);
      cells[x] = 0;
      ++x;
    }
  }

  // The runs into the cells, for the feathered output that reads three rows of cells.
  static void ResolveRuns(Word* cells, Word* runs, int lo, int hi) {
    Word whole = 0;
    for (int x = lo; x <= hi; ++x) {
      whole ^= runs[x];
      runs[x] = 0;
      cells[x] |= whole;
    }
  }

  void OutputFeathered(Word* const (&rows)[3], int lo, int hi, T* out) const {
    for (int x = lo; x <= hi; ++x) {
      unsigned int n = 0;
      for (int dy = 0; dy < 3; ++dy) {
        const Word* row = rows[dy] + x - 1;
        n += C::Count(row[0] & masks.m[dy][0]) + C::Count(row[1] & masks.m[dy][1]) +
             C::Count(row[2] & masks.m[dy][2]);
      }
      out[x] = Pixel::Value(n, weight);
    }
  }

  CFillContext& ctx;
  CFillSweep sweep;
  const int radius;
  const typename Pixel::W weight;
  const ZvFeatherMasks<C> masks;
  ZvRaster<T>& raster;
  int xLo = 0, xHi = 0, first = 0, end = 0;
};

template <class C, class T, bool NonZero, bool Unity>
int Sweep(CFillContext& ctx, int numVertices, const ZvFillBox& box, int radius, double opacity,
          ZvRaster<T>& raster, int (*callback)()) {
  AASweep<C, T, NonZero, Unity> sweep(ctx, numVertices, radius, opacity, raster);
  return sweep.Run(box, callback);
}

template <class C, class T>
int ByRuleAndOpacity(CFillContext& ctx, int numVertices, const ZvFillBox& box, const ZvGC& gc,
                     ZvRaster<T>& raster, int (*callback)()) {
  const int radius = std::min(std::max(gc.featherRadius, 0), C::N);
  const bool unity = std::fabs(gc.opacity - 1.0) <= 1e-07;
  if (gc.fillRule)
    return unity ? Sweep<C, T, true, true>(ctx, numVertices, box, radius, 1.0, raster, callback)
                 : Sweep<C, T, true, false>(ctx, numVertices, box, radius, gc.opacity, raster,
                                            callback);
  return unity ? Sweep<C, T, false, true>(ctx, numVertices, box, radius, 1.0, raster, callback)
               : Sweep<C, T, false, false>(ctx, numVertices, box, radius, gc.opacity, raster,
                                           callback);
}

}  // namespace

template <class T>
int ZvAntialiasedFill(CFillContext& ctx, int numVertices, const ZvFillBox& box, const ZvGC& gc,
                      ZvRaster<T>& raster, int (*callback)()) {
  if (gc.samplingRate == 4)
    return ByRuleAndOpacity<ZvCells4x4>(ctx, numVertices, box, gc, raster, callback);
  return ByRuleAndOpacity<ZvCells8x8>(ctx, numVertices, box, gc, raster, callback);
}

template int ZvAntialiasedFill(CFillContext&, int, const ZvFillBox&, const ZvGC&,
                               ZvRaster<unsigned char>&, int (*)());
template int ZvAntialiasedFill(CFillContext&, int, const ZvFillBox&, const ZvGC&, ZvRaster<short>&,
                               int (*)());
template int ZvAntialiasedFill(CFillContext&, int, const ZvFillBox&, const ZvGC&, ZvRaster<float>&,
                               int (*)());
