// Reading pen streams for the builder fuzz targets, and the check that a builder only ever
// appends to its path.
#ifndef ZV_FUZZ_PEN_STREAM_H
#define ZV_FUZZ_PEN_STREAM_H

#include <zv/path2f.h>

#include <cstdint>

// A little-endian 16-bit coordinate in eighths of a pixel: a pen's range and resolution.
inline float PenCoordinate(const uint8_t* p) {
  return static_cast<float>(static_cast<int16_t>(p[0] | (p[1] << 8))) / 8.0f;
}

// Every point of `before` is still in `path`, unchanged.
inline bool KeepsPrefix(const ZvPath2f& path, const ZvPath2f& before) {
  if (path.NumPoints() < before.NumPoints()) return false;
  for (unsigned int i = 0; i < before.NumPoints(); ++i) {
    const ZvPoint2<float> a = path.GetPoint(i), b = before.GetPoint(i);
    if (a.x != b.x || a.y != b.y) return false;
  }
  return true;
}

#endif
