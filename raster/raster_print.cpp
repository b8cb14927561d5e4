// Debug dump of ZvRaster<T> to standard output.
#include <zv/raster.h>

#include <iomanip>
#include <iostream>

#include "raster/raster_alloc.h"

namespace {

// Byte pixels are written as characters, every other type as a number.
template <class T>
void WritePixel(std::ostream& out, T v) {
  out << std::setw(4) << v;
}
void WritePixel(std::ostream& out, unsigned char v) {
  out << std::setw(4) << static_cast<char>(v);
}

}  // namespace

template <class T>
void ZvRaster<T>::Print() const {
  std::cout << "Type raster W x H = " << width << " x " << height << std::endl;
  // Top row first, raw rows: the orientation flag is not consulted.
  for (int y = height - 1; y >= 0; --y) {
    for (int x = 0; x < width; ++x)
      WritePixel(std::cout, pixels[CalculateOffsetForPos(x, y)]);
    std::cout << std::endl;
  }
}

#define ZV_INSTANTIATE(T) template void ZvRaster<T>::Print() const;
ZV_RASTER_PIXEL_TYPES(ZV_INSTANTIATE)
#undef ZV_INSTANTIATE
