// Distance transforms of ZvRaster<T>: a four-point sequential vector transform that carries, for
// every pixel, the offset (dx, dy) to its nearest feature pixel found so far.
#include <zv/raster.h>

#include <memory>

#include "raster/raster_alloc.h"

namespace {

// How the offset pairs compare. Candidates replace a pair only when the present measure is
// strictly greater, so earlier sweeps win ties.
struct SquaredEuclidean {
  static double Measure(double dx, double dy) { return dx * dx + dy * dy; }
};
struct LInfinity {
  static double Measure(double dx, double dy) { return dx > dy ? dx : dy; }
};

template <class Metric>
class VectorSweep {
 public:
  VectorSweep(double* dx, double* dy, int w) : dx_(dx), dy_(dy), w_(w) {}

  // One row: the candidate from the neighbouring row (offset `from` in pixels), then left to
  // right, then right to left.
  void Row(int y, int from) {
    const int base = y * w_;
    for (int x = 0; x < w_; ++x)
      Offer(base + x, dx_[base + from + x], dy_[base + from + x] + 1.0);
    for (int x = 1; x < w_; ++x)
      Offer(base + x, dx_[base + x - 1] + 1.0, dy_[base + x - 1]);
    for (int x = w_ - 2; x >= 0; --x)
      Offer(base + x, dx_[base + x + 1] + 1.0, dy_[base + x + 1]);
  }

 private:
  void Offer(int i, double cx, double cy) {
    if (Metric::Measure(dx_[i], dy_[i]) > Metric::Measure(cx, cy)) {
      dx_[i] = cx;
      dy_[i] = cy;
    }
  }
  double* dx_;
  double* dy_;
  int w_;
};

// Runs the six sweeps over a label raster and hands each pixel's (dx, dy) and label to `emit`.
template <class Metric, class Emit>
void DistanceMap(int w, int h, const unsigned char* labels, Emit emit) {
  const int count = zv_raster::PixelCount(w, h);
  if (w <= 0 || h <= 0) return;
  // Both work arrays or neither: the first is released if the second cannot be had.
  std::unique_ptr<double[]> dx(zv_raster::AllocatePixels<double>(count));
  std::unique_ptr<double[]> dy(zv_raster::AllocatePixels<double>(count));
  const double far = static_cast<double>(w > h ? w : h) + 1.0;
  for (int i = 0; i < count; ++i)
    dx[i] = dy[i] = labels[i] == 1 ? 0.0 : far;
  VectorSweep<Metric> sweep(dx.get(), dy.get(), w);
  for (int y = 1; y < h; ++y)
    sweep.Row(y, -w);
  for (int y = h - 2; y >= 0; --y)
    sweep.Row(y, w);
  for (int i = 0; i < count; ++i)
    emit(i, dx[i], dy[i], labels[i]);
}

}  // namespace

template <class T>
void ZvRaster<T>::SetToSquaredEuclideanDistanceMap(const ZvRaster<unsigned char>& src) {
  T* out = pixels;
  DistanceMap<SquaredEuclidean>(width, height, src.GetRaster(),
                                [out](int i, double dx, double dy, unsigned char label) {
                                  T v = zv_raster::FromDouble<T>(dx * dx + dy * dy);
                                  // Negated after conversion: wraps for the unsigned types.
                                  if (label == 2) v = static_cast<T>(-v);
                                  out[i] = v;
                                });
}

template <class T>
void ZvRaster<T>::SetToLInfinityDistanceMap(const ZvRaster<unsigned char>& src) {
  T* out = pixels;
  // Label 2 carries no sign here, unlike the Euclidean map.
  DistanceMap<LInfinity>(width, height, src.GetRaster(),
                         [out](int i, double dx, double dy, unsigned char) {
                           out[i] = zv_raster::FromDouble<T>(dx > dy ? dx : dy);
                         });
}

#define ZV_INSTANTIATE(T)                                                                      \
  template void ZvRaster<T>::SetToSquaredEuclideanDistanceMap(const ZvRaster<unsigned char>&); \
  template void ZvRaster<T>::SetToLInfinityDistanceMap(const ZvRaster<unsigned char>&);
ZV_RASTER_PIXEL_TYPES(ZV_INSTANTIATE)
#undef ZV_INSTANTIATE
