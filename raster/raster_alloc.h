// Pixel blocks of the raster template: allocation by a 32-bit signed count and bulk filling.
#ifndef ZV_RASTER_RASTER_ALLOC_H
#define ZV_RASTER_RASTER_ALLOC_H

#include <cstddef>
#include <cstring>
#include <type_traits>

// Applies X to each pixel type the raster template is instantiated for.
#define ZV_RASTER_PIXEL_TYPES(X) X(unsigned char) X(short) X(int) X(unsigned int) X(float) X(double)

namespace zv_raster {

// width * height in 32-bit signed arithmetic, wrapping like the machine does rather than
// overflowing into undefined behaviour.
inline int PixelCount(int w, int h) {
  return static_cast<int>(static_cast<unsigned int>(w) * static_cast<unsigned int>(h));
}

// The count is widened only after the product: a negative count becomes a huge element count,
// whose byte size the allocator refuses with std::bad_alloc.
template <class T>
T* AllocatePixels(int count) {
  return new T[static_cast<std::size_t>(static_cast<std::ptrdiff_t>(count))];
}

// Zero clears bytes (a float -0.0 compares equal and clears to +0.0), bytes use a byte fill,
// anything else a loop.
template <class T>
void FillPixels(T* p, int count, T value) {
  if (count <= 0) return;
  const std::size_t n = static_cast<std::size_t>(count);
  if (value == T(0)) {
    std::memset(static_cast<void*>(p), 0, n * sizeof(T));
  } else if (sizeof(T) == 1) {
    std::memset(static_cast<void*>(p), static_cast<unsigned char>(value), n);
  } else {
    for (std::size_t i = 0; i < n; ++i)
      p[i] = value;
  }
}

// A double converted to a pixel type. Integer types truncate towards zero and keep the low bits
// of the 64-bit result, so an out-of-range value wraps instead of being undefined.
template <class T>
T FromDouble(double v) {
  if constexpr (std::is_floating_point<T>::value) {
    return static_cast<T>(v);
  } else {
    // Beyond 2^63 (and for NaN) there is no integer to truncate to; 0 stands for it.
    if (!(v > -9.2e18 && v < 9.2e18)) return T(0);
    return static_cast<T>(static_cast<unsigned long long>(static_cast<long long>(v)));
  }
}

}  // namespace zv_raster

#endif
