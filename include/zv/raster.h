// ZvRaster<T>: the one pixel store of the library.
//
// A plain row-major, single-channel grid: `width * height` values of T, row after row, with no
// gap between rows, no stride, no colour and no alpha. The pixel at (x, y) is at index
// y * width + x. Instantiated for unsigned char, short, int, unsigned int, float and double; the
// rasterisers use unsigned char, short and float, whose full coverage values are:
//
//   unsigned char   255
//   short           16384 (2 to the 14th, not 32767)
//   float           1.0
//
// Memory. A raster either owns its pixels (freed with delete[]) or wraps memory it was given.
// A wrapper must not outlive its buffer; Reconstruct and ZvRasterConvert turn a wrapper into an
// owner whenever they have to reallocate.
//
// Orientation. With the flag at 0, row y of the drawing coordinates is stored at row y; with it
// set, at row height - 1 - y. Pixel and span accessors take raw rows and ignore the flag; the
// fills apply it through ConvertBottomUpY, and the operations below say where they consult it.
//
// No accessor checks bounds. Sizes are counted in 32-bit signed arithmetic.
#ifndef ZV_RASTER_H
#define ZV_RASTER_H

#include <zv/api.h>
#include <zv/point.h>

template <class T>
class ZV_API ZvRaster {
 public:
  // --- Construction and storage ----------------------------------------------------------------
  // Allocates w*h pixels, owned, orientation 0, every pixel set to `fill`.
  ZvRaster(int w, int h, T fill);
  // Wraps `buffer` (w*h values); `owns` non-zero hands it over to be freed with delete[].
  // The buffer is overwritten with `fill` at once: a wrapper never keeps what the memory held.
  ZvRaster(T* buffer, int w, int h, int owns, T fill);
  // Deep copy of an owning source; a copy of a wrapper shares its pointer and stays a wrapper.
  ZvRaster(const ZvRaster& other);
  ~ZvRaster();
  // New size, fresh owned buffer filled with `fill` (also when the size did not change). A
  // wrapped buffer is abandoned. The orientation flag stays.
  void Reconstruct(int w, int h, T fill);
  // Always a fresh buffer holding a copy of the source's pixels. The owner flag is taken over
  // from the source as it stands: assigning from a wrapper leaves a buffer this raster will not
  // free, which is the operation's established behaviour.
  ZvRaster& operator=(const ZvRaster& other);

  void MemsetBuffer(T value);
  int GetSize() const { return width * height; }  // pixels, not bytes
  int GetWidth() const { return width; }
  int GetHeight() const { return height; }
  T* GetRaster() const { return pixels; }
  T* GetRasterPtr() const { return pixels; }
  void SetOrientationFlag(int flag) { orientation = flag; }
  int GetOrientationFlag() const { return orientation; }
  // (0, 0) to (width, height), corners ordered by min and max; Regular.
  ZvExtent2<float> GetExtent2f() const;
  ZvExtent2<double> GetExtent2d() const;

  // --- Pixels (raw rows) -----------------------------------------------------------------------
  int CalculateOffsetForPos(int x, int y) const { return y * width + x; }
  int ConvertBottomUpY(int y) const { return orientation ? height - 1 - y : y; }
  T GetVal(int x, int y) const { return pixels[CalculateOffsetForPos(x, y)]; }
  T GetVal(int i) const { return pixels[i]; }
  const T& GetValByConstRef(int x, int y) const { return pixels[CalculateOffsetForPos(x, y)]; }
  const T& GetValByConstRef(int i) const { return pixels[i]; }
  T& GetValByRef(int x, int y) { return pixels[CalculateOffsetForPos(x, y)]; }
  T& GetValByRef(int i) { return pixels[i]; }
  void SetVal(int x, int y, T v) { pixels[CalculateOffsetForPos(x, y)] = v; }
  void SetVal(int i, T v) { pixels[i] = v; }
  // A running minimum: stores v only where the pixel is greater.
  void SetValWhenSmaller(int x, int y, T v) {
    T& p = pixels[CalculateOffsetForPos(x, y)];
    if (p > v) p = v;
  }
  // 1 if every pixel equals v (also for an empty raster). A NaN pixel or NaN v answers 0.
  int AllPixelValuesAre(T v) const;

  // --- Spans: one raw row, x0..x1 inclusive, no clipping ----------------------------------------
  void SetValOnSpan(int x0, int x1, int y, T v) {
    T* p = pixels + CalculateOffsetForPos(0, y);
    for (int x = x0; x <= x1; ++x)
      p[x] = v;
  }
  void SetValOnSpanWhenSmaller(int x0, int x1, int y, T v) {
    T* p = pixels + CalculateOffsetForPos(0, y);
    for (int x = x0; x <= x1; ++x)
      if (p[x] > v) p[x] = v;
  }
  // Last x of the run of pixels equal to v that starts at x; x - 1 when there is none.
  int EndOfSpanEqual(int x, int y, T v) const {
    const T* p = pixels + CalculateOffsetForPos(0, y);
    while (x < width && p[x] == v)
      ++x;
    return x - 1;
  }
  // The same for a run of pixels different from v.
  int EndOfSpanNotEqual(int x, int y, T v) const {
    const T* p = pixels + CalculateOffsetForPos(0, y);
    while (x < width && !(p[x] == v))
      ++x;
    return x - 1;
  }

  // --- Rasters onto rasters --------------------------------------------------------------------
  // Copies src with its (0, 0) at (x, y), clipped to this raster; raw rows on both sides.
  void CopyRaster(int x, int y, const ZvRaster& src);
  // Running minimum of src into this raster, clipped. Orientation-aware: y is converted by this
  // raster's flag, and src is walked bottom-up when its own flag is set.
  void SetValWhenSmaller(int x, int y, const ZvRaster& src);
  // Distance transforms of a label raster of this raster's size: label 1 marks feature pixels,
  // label 2 pixels whose squared distance is negated (Euclidean map only).
  void SetToSquaredEuclideanDistanceMap(const ZvRaster<unsigned char>& src);
  void SetToLInfinityDistanceMap(const ZvRaster<unsigned char>& src);

  // Debug dump to standard output, top row (height - 1) first, whatever the orientation flag.
  void Print() const;

 private:
  int width;
  int height;
  T* pixels;
  int ownsBuffer;
  int orientation;
};

extern template class ZvRaster<unsigned char>;
extern template class ZvRaster<short>;
extern template class ZvRaster<int>;
extern template class ZvRaster<unsigned int>;
extern template class ZvRaster<float>;
extern template class ZvRaster<double>;

// Copies src into dst with the value scales of the rasteriser types, for D and S each one of
// unsigned char, short and float. dst takes src's size when they differ (new zeroed owned
// buffer) but keeps its orientation flag; rows are reversed when the two flags differ.
// The value mappings, in single precision:
//   unsigned char -> float   v * (1/255)
//   unsigned char -> short   (v * 257 + 2) >> 2             255 -> 16384
//   float -> unsigned char   v * 255, truncated, low 8 bits (no rounding, no clamping)
//   float -> short           v * 16384 + 0.5, truncated, low 16 bits (no clamping)
//   short -> unsigned char   (v * 1020 + 32768) >> 16, at most 255; a negative short gives 255
//   short -> float           v * (1/16384), clamped to 0..1
template <class D, class S>
ZV_API void ZvRasterConvert(ZvRaster<D>& dst, const ZvRaster<S>& src);

#endif
