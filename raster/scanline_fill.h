// The aliased fill of a prepared CFillContext: full value on every pixel whose centre is inside.
#ifndef ZV_RASTER_SCANLINE_FILL_H
#define ZV_RASTER_SCANLINE_FILL_H

#include "raster/fill_context.h"

#include <zv/raster.h>

// The full-coverage value of each rasteriser pixel type.
template <class T>
struct ZvPixelScale;
template <>
struct ZvPixelScale<unsigned char> {
  static constexpr unsigned char full = 255;
};
template <>
struct ZvPixelScale<short> {
  static constexpr short full = 16384;
};
template <>
struct ZvPixelScale<float> {
  static constexpr float full = 1.0f;
};

// The pixel box of a fill: columns xMin..xMax-1, rows yMin..yMax-1 (drawing rows).
struct ZvFillBox {
  int xMin;
  int yMin;
  int xMax;
  int yMax;
};

// Sweeps rows box.yMin..box.yMax-1 under the even-odd (fillRule 0) or non-zero winding rule,
// writing the full value of T over the spans; the raster is never read. The callback is asked
// before each row; a non-zero answer stops the fill (what is painted stays). Answers 1 when all
// rows were swept, 0 when the callback stopped it.
template <class T>
int ZvScanlineFill(CFillContext& ctx, int numVertices, const ZvFillBox& box, int fillRule,
                   ZvRaster<T>& raster, int (*callback)());

#endif
