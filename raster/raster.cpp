// Storage, copying and the raster-onto-raster operations of ZvRaster<T>.
#include <zv/raster.h>

#include "raster/raster_alloc.h"

using zv_raster::AllocatePixels;
using zv_raster::FillPixels;
using zv_raster::PixelCount;

template <class T>
ZvRaster<T>::ZvRaster(int w, int h, T fill)
    : width(w), height(h), pixels(nullptr), ownsBuffer(1), orientation(0) {
  pixels = AllocatePixels<T>(PixelCount(w, h));
  FillPixels(pixels, PixelCount(w, h), fill);
}

template <class T>
ZvRaster<T>::ZvRaster(T* buffer, int w, int h, int owns, T fill)
    : width(w), height(h), pixels(buffer), ownsBuffer(owns), orientation(0) {
  FillPixels(pixels, PixelCount(w, h), fill);
}

template <class T>
ZvRaster<T>::ZvRaster(const ZvRaster& other)
    : width(other.width),
      height(other.height),
      pixels(other.pixels),
      ownsBuffer(other.ownsBuffer),
      orientation(other.orientation) {
  if (!ownsBuffer) return;
  const int count = PixelCount(width, height);
  pixels = AllocatePixels<T>(count);
  if (count > 0) std::memcpy(pixels, other.pixels, static_cast<std::size_t>(count) * sizeof(T));
}

template <class T>
ZvRaster<T>::~ZvRaster() {
  if (ownsBuffer) delete[] pixels;
  pixels = nullptr;
}

template <class T>
void ZvRaster<T>::Reconstruct(int w, int h, T fill) {
  // The new block is in hand before the old one goes, so a failed allocation leaves the raster
  // as it was.
  T* block = AllocatePixels<T>(PixelCount(w, h));
  if (ownsBuffer) delete[] pixels;
  pixels = block;
  ownsBuffer = 1;
  width = w;
  height = h;
  FillPixels(pixels, PixelCount(w, h), fill);
}

template <class T>
ZvRaster<T>& ZvRaster<T>::operator=(const ZvRaster& other) {
  if (this == &other) return *this;
  const int count = PixelCount(other.width, other.height);
  T* block = AllocatePixels<T>(count);
  if (ownsBuffer) delete[] pixels;
  pixels = block;
  width = other.width;
  height = other.height;
  ownsBuffer = other.ownsBuffer;
  orientation = other.orientation;
  if (count > 0) std::memcpy(pixels, other.pixels, static_cast<std::size_t>(count) * sizeof(T));
  return *this;
}

template <class T>
void ZvRaster<T>::MemsetBuffer(T value) {
  FillPixels(pixels, PixelCount(width, height), value);
}

template <class T>
ZvExtent2<float> ZvRaster<T>::GetExtent2f() const {
  const float w = static_cast<float>(width), h = static_cast<float>(height);
  return ZvExtent2<float>(w < 0 ? w : 0.0f, h < 0 ? h : 0.0f, w < 0 ? 0.0f : w, h < 0 ? 0.0f : h);
}

template <class T>
ZvExtent2<double> ZvRaster<T>::GetExtent2d() const {
  const double w = width, h = height;
  return ZvExtent2<double>(w < 0 ? w : 0.0, h < 0 ? h : 0.0, w < 0 ? 0.0 : w, h < 0 ? 0.0 : h);
}

template <class T>
int ZvRaster<T>::AllPixelValuesAre(T v) const {
  const int count = PixelCount(width, height);
  for (int i = 0; i < count; ++i)
    if (!(pixels[i] == v)) return 0;
  return 1;
}

namespace {

// The clipped box shared by CopyRaster and SetValWhenSmaller. y0 is the target row of the
// source's row 0. False when nothing overlaps.
struct ClipBox {
  int xs, xe, ys, ye;
};

bool Clip(int w, int h, int x, int y0, int srcW, int srcH, ClipBox& box) {
  if (w < x || x + srcW < 0 || h < y0 || y0 + srcH < 0) return false;
  box.xs = x > 0 ? x : 0;
  box.xe = x + srcW < w ? x + srcW : w;
  box.ys = y0 > 0 ? y0 : 0;
  box.ye = y0 + srcH < h ? y0 + srcH : h;
  return box.xe - box.xs >= 1 && box.ye - box.ys >= 1;
}

}  // namespace

template <class T>
void ZvRaster<T>::CopyRaster(int x, int y, const ZvRaster& src) {
  ClipBox box;
  if (!Clip(width, height, x, y, src.width, src.height, box)) return;
  const std::size_t run = static_cast<std::size_t>(box.xe - box.xs) * sizeof(T);
  for (int row = box.ys; row < box.ye; ++row)
    std::memcpy(pixels + CalculateOffsetForPos(box.xs, row),
                src.pixels + src.CalculateOffsetForPos(box.xs - x, row - y), run);
}

template <class T>
void ZvRaster<T>::SetValWhenSmaller(int x, int y, const ZvRaster& src) {
  const int y0 = orientation ? height - 1 - y : y;
  ClipBox box;
  if (!Clip(width, height, x, y0, src.width, src.height, box)) return;
  int dstRow = orientation ? height - 1 - box.ys : box.ys;
  const int dstStep = orientation ? -1 : 1;
  // The source's start row comes from this raster's height and flag, its step from its own flag:
  // that pairing is the established rule. Rows it would place outside the source are skipped.
  int srcRow = orientation ? height - 1 - (box.ys - y0) : box.ys - y0;
  const int srcStep = src.orientation ? -1 : 1;
  const int firstCol = box.xs - x, count = box.xe - box.xs;
  for (int r = box.ys; r < box.ye; ++r, dstRow += dstStep, srcRow += srcStep) {
    if (srcRow < 0 || srcRow >= src.height) continue;
    T* d = pixels + CalculateOffsetForPos(box.xs, dstRow);
    const T* s = src.pixels + src.CalculateOffsetForPos(firstCol, srcRow);
    for (int i = 0; i < count; ++i)
      if (d[i] > s[i]) d[i] = s[i];
  }
}

#define ZV_INSTANTIATE(T) template class ZvRaster<T>;
ZV_RASTER_PIXEL_TYPES(ZV_INSTANTIATE)
#undef ZV_INSTANTIATE
