// The aliased scanline fill, one template for the three pixel types.
#include "raster/scanline_fill.h"

#include "raster/fill_sweep.h"

namespace {
template <bool NonZero, class T>
int Sweep(CFillContext& ctx, int numVertices, const ZvFillBox& box, ZvRaster<T>& raster,
          int (*callback)()) {
  CFillSweep sweep(ctx, numVertices);
  for (int y = box.yMin; y < box.yMax; ++y) {
    if (callback && callback()) return 0;
    sweep.Advance(y);
    T* row = raster.GetRaster() + raster.CalculateOffsetForPos(0, raster.ConvertBottomUpY(y));
    sweep.Spans<NonZero>(box.xMin, box.xMax, [row](int l, int r) {
      for (int x = l; x <= r; ++x)
        row[x] = ZvPixelScale<T>::full;
    });
  }
  return 1;
}
}  // namespace

template <class T>
int ZvScanlineFill(CFillContext& ctx, int numVertices, const ZvFillBox& box, int fillRule,
                   ZvRaster<T>& raster, int (*callback)()) {
  return fillRule ? Sweep<true>(ctx, numVertices, box, raster, callback)
                  : Sweep<false>(ctx, numVertices, box, raster, callback);
}

template int ZvScanlineFill(CFillContext&, int, const ZvFillBox&, int, ZvRaster<unsigned char>&,
                            int (*)());
template int ZvScanlineFill(CFillContext&, int, const ZvFillBox&, int, ZvRaster<short>&, int (*)());
template int ZvScanlineFill(CFillContext&, int, const ZvFillBox&, int, ZvRaster<float>&, int (*)());
