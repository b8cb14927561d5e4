// ZvRasterConvert between the three rasteriser pixel types and their value scales.
#include <zv/raster.h>

#include "raster/raster_alloc.h"

namespace {

// Truncation towards zero of a single-precision value, keeping the low bits of the integer.
// Values with no 64-bit integer (and NaN) give 0.
long long TruncateFloat(float v) {
  if (!(v > -9.2e18f && v < 9.2e18f)) return 0;
  return static_cast<long long>(v);
}

// One pixel value from type S to type D. The asymmetries are deliberate and long-standing:
// float to bytes truncates without rounding or clamping, float to short rounds without
// clamping, and only the conversions from short clamp.
template <class D, class S>
struct Scale;

template <class T>
struct Scale<T, T> {
  static T Map(T v) { return v; }
};
template <>
struct Scale<float, unsigned char> {
  static float Map(unsigned char v) { return static_cast<float>(v) * 0.003921569f; }  // 1/255
};
template <>
struct Scale<short, unsigned char> {
  // 255 -> 16384, 128 -> 8224.
  static short Map(unsigned char v) { return static_cast<short>((v * 257 + 2) >> 2); }
};
template <>
struct Scale<unsigned char, float> {
  static unsigned char Map(float v) {
    return static_cast<unsigned char>(static_cast<unsigned long long>(TruncateFloat(v * 255.0f)));
  }
};
template <>
struct Scale<short, float> {
  static short Map(float v) {
    return static_cast<short>(static_cast<unsigned long long>(TruncateFloat(v * 16384.0f + 0.5f)));
  }
};
template <>
struct Scale<unsigned char, short> {
  // The 32-bit product is taken as unsigned before a carry-keeping addition, so any negative
  // short lands far above 255 and saturates.
  static unsigned char Map(short v) {
    const unsigned long long t =
        (static_cast<unsigned long long>(static_cast<unsigned int>(v * 1020)) + 32768u) >> 16;
    return t >= 255 ? 255 : static_cast<unsigned char>(t);
  }
};
template <>
struct Scale<float, short> {
  static float Map(short v) {
    const float f = static_cast<float>(v) * 6.1035156e-05f;  // 1/16384
    return f < 0.0f ? 0.0f : (f > 1.0f ? 1.0f : f);
  }
};

}  // namespace

template <class D, class S>
void ZvRasterConvert(ZvRaster<D>& dst, const ZvRaster<S>& src) {
  const int w = src.GetWidth(), h = src.GetHeight();
  if (dst.GetWidth() != w || dst.GetHeight() != h) dst.Reconstruct(w, h, D(0));
  // Flags compared as integers: 1 and 2 differ.
  const bool reverse = dst.GetOrientationFlag() != src.GetOrientationFlag();
  const S* in = src.GetRaster();
  D* out = dst.GetRaster();
  for (int r = 0; r < h; ++r) {
    const S* s = in + src.CalculateOffsetForPos(0, reverse ? h - 1 - r : r);
    D* d = out + dst.CalculateOffsetForPos(0, r);
    for (int x = 0; x < w; ++x)
      d[x] = Scale<D, S>::Map(s[x]);
  }
}

#define ZV_CONVERT(D, S) template ZV_API void ZvRasterConvert(ZvRaster<D>&, const ZvRaster<S>&);
#define ZV_CONVERT_FROM(S) ZV_CONVERT(unsigned char, S) ZV_CONVERT(short, S) ZV_CONVERT(float, S)
ZV_CONVERT_FROM(unsigned char)
ZV_CONVERT_FROM(short)
ZV_CONVERT_FROM(float)
#undef ZV_CONVERT_FROM
#undef ZV_CONVERT
