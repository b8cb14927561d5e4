// Output values of the antialiased fill: a bit count n out of S x S sub-samples, times opacity.
//
//   unsigned char  W = trunc(opacity * 255 / (S * S) * 65536 + 0.5)     (n * W + 32768) >> 16
//   short          W = trunc(opacity * 16384 / (S * S) * 16384 + 0.5)   (n * W + 8192) >> 14
//   float          W = (float)(opacity / (S * S))                        (float)n * W
//
// Integer products are unsigned 32-bit and the value is stored in the low bits: an opacity
// above 1 can wrap, on purpose unclamped. Unity opacity uses the same formulas with opacity 1,
// so a full cell gives exactly 255, 16384 or 1.0.
#ifndef ZV_RASTER_AA_OUTPUT_H
#define ZV_RASTER_AA_OUTPUT_H

#include <cmath>
#include <cstdint>

template <class T>
struct ZvAAPixel;

// Conversion of the rounded weight to its integer type, saturating first: only an absurd
// opacity reaches the bounds, and a cast out of range would be undefined.
inline double ZvClampWeight(double w, double lo, double hi) {
  return w >= lo ? (w <= hi ? w : hi) : lo;  // NaN gives lo
}

template <>
struct ZvAAPixel<unsigned char> {
  using W = unsigned int;
  static W Weight(double opacity, int s) {
    return static_cast<W>(
        ZvClampWeight(std::trunc(opacity * 255.0 / (s * s) * 65536.0 + 0.5), 0.0, 4294967295.0));
  }
  static unsigned char Value(unsigned int n, W w) {
    return static_cast<unsigned char>((n * w + 32768u) >> 16);
  }
};

template <>
struct ZvAAPixel<short> {
  using W = int;
  static W Weight(double opacity, int s) {
    return static_cast<W>(ZvClampWeight(std::trunc(opacity * 16384.0 / (s * s) * 16384.0 + 0.5),
                                        -2147483648.0, 2147483647.0));
  }
  static short Value(unsigned int n, W w) {
    return static_cast<short>(
        static_cast<std::uint16_t>((n * static_cast<unsigned int>(w) + 8192u) >> 14));
  }
};

template <>
struct ZvAAPixel<float> {
  using W = float;
  static W Weight(double opacity, int s) { return static_cast<float>(opacity / (s * s)); }
  static float Value(unsigned int n, W w) { return static_cast<float>(n) * w; }
};

#endif
