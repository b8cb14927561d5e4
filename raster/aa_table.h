// gc_oABTable: bit counts and 4x4 cell values, built once when the library is loaded.
//
//   entry 65536 + m   number of one bits of the 16-bit value m
//   entry m           trunc(popcount(m) * 255 * 0.0625 + 0.5): the 8-bit value of a 4x4 cell
//
// The one piece of static mutable state of the rasterisers; read-only once built.
#ifndef ZV_RASTER_AA_TABLE_H
#define ZV_RASTER_AA_TABLE_H

#include <cstdint>

extern unsigned char gc_oABTable[131072];

inline unsigned int ZvCountBits16(std::uint32_t m) {
  return gc_oABTable[65536 + (m & 0xFFFFu)];
}

#endif
