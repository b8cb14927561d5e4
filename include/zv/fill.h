// Filling and stroking paths into rasters: the host's integer box and the Boolean masks.
//
// The fills themselves are operations of the shapes (ZvPath2f::Fill, AAFill, Stroke); this
// header adds what they share with the host:
//
// IntBbox2l is the host's integer box. A fill given one restricts its pixel box to it, keeping
// one off-by-one on purpose: the last column (x + width - 1) and the last row (y + height - 1)
// of the box stay unpainted, because the fills treat those bounds as exclusive. Rows count in
// drawing coordinates, before the raster's orientation flag is applied.
#ifndef ZV_FILL_H
#define ZV_FILL_H

#include <zv/api.h>
#include <zv/raster.h>

#include <cstdint>

class ZvGC;
class ZvShape2f;

struct IntBbox2l {
  std::int32_t x;  // origin
  std::int32_t y;
  std::int32_t width;
  std::int32_t height;
};

// Boolean masks of two shapes' aliased fills (each filled on its own into a zeroed raster of the
// target's size, with the given context, in unflipped rows: the target's orientation flag is not
// consulted). The target is only ever set to 255, never cleared: clear it first for a pure
// result. Null shapes paint nothing.
ZV_API void ZvShape2f_IntersectionAB(const ZvGC& gc, const ZvShape2f* a, const ZvShape2f* b,
                                     ZvRaster<unsigned char>& target);
ZV_API void ZvShape2f_UnionAB(const ZvGC& gc, const ZvShape2f* a, const ZvShape2f* b,
                              ZvRaster<unsigned char>& target);
ZV_API void ZvShape2f_DifferenceAB(const ZvGC& gc, const ZvShape2f* a, const ZvShape2f* b,
                                   ZvRaster<unsigned char>& target);

#endif
