// What the oval and rectangle converters share: clipped span output through the orientation
// flag, the outline disks of mode 1, and the painting of a shape collapsed to a segment.
#ifndef ZV_RASTER_OVAL_SPAN_H
#define ZV_RASTER_OVAL_SPAN_H

#include "raster/oval_scan.h"

#include <cmath>
#include <utility>

namespace zv_oval {

// The largest coordinate the converters take to whole pixels: far beyond any raster, and well
// inside int, so that clamped values can be converted without overflow.
constexpr double kCoordinateLimit = 1.0e9;

// Clamps a pixel index to -1..width, the two values standing for "somewhere off that side":
// spans are kept in this form so that the rules between rows still see off-raster spans.
inline int ClampIndex(double v, int width) {
  if (!(v >= -1.0)) return -1;  // NaN too
  if (v > width) return width;
  return static_cast<int>(v);
}

// The offsets k >= 0 for which c + k or c - k - 1 (the two mirror images about the pixel corner
// c) is an index of 0..n-1: lo..hi, with lo > hi when there are none.
inline void MirroredRange(long long c, int n, long long& lo, long long& hi) {
  lo = 0x7fffffffffffffffLL;
  hi = -1;
  if (c <= n - 1) {
    lo = c < 0 ? -c : 0;
    hi = n - 1 - c;
  }
  if (c >= 1) {
    const long long l = c - n > 0 ? c - n : 0;
    if (l < lo) lo = l;
    if (c - 1 > hi) hi = c - 1;
  }
}

template <class T>
class SpanWriter {
 public:
  SpanWriter(ZvRaster<T>& raster, T value, ZvRaster<float>& distance, int radius, bool disks)
      : raster_(raster),
        value_(value),
        distance_(distance),
        radius_(radius < 0 ? 0 : radius),
        disk_(disks ? 2 * radius_ + 1 : 1, disks ? 2 * radius_ + 1 : 1, 3.4028235e+38f),
        disks_(disks) {
    if (disks_) DiskRasterSetup(disk_, radius_);
  }

  int Width() const { return raster_.GetWidth(); }
  int Height() const { return raster_.GetHeight(); }
  bool HasRow(int row) const { return row >= 0 && row < raster_.GetHeight(); }
  bool Disks() const { return disks_; }

  // Columns x0..x1 of drawing row `row`, clipped.
  void Span(int row, int x0, int x1) {
    if (!HasRow(row)) return;
    if (x0 < 0) x0 = 0;
    if (x1 >= raster_.GetWidth()) x1 = raster_.GetWidth() - 1;
    if (x0 <= x1) raster_.SetValOnSpan(x0, x1, raster_.ConvertBottomUpY(row), value_);
  }

  // The disk centred on pixel (x, row), when it can reach the distance raster.
  void Disk(int x, int row) {
    if (!disks_) return;
    StampDisk(disk_, radius_, x, row, distance_);
  }
  // The four mirror images of (dx, dy) about the pixel corner (cx, cy).
  void Disks(int dx, int dy, int cx, int cy) {
    if (disks_) FillDisks(dx, dy, cx, cy, radius_, disk_, distance_);
  }

  // A shape collapsed to the segment p-q: in each row the segment crosses, the pixels under
  // its part within the row, so that it stays one connected trail.
  void Segment(double px, double py, double qx, double qy) {
    if (py > qy) {
      std::swap(px, qx);
      std::swap(py, qy);
    }
    const int h = raster_.GetHeight();
    const double top = py < 0.0 ? 0.0 : py, bottom = qy > h ? h : qy;
    if (top > bottom || !(std::fabs(px) < kCoordinateLimit && std::fabs(qx) < kCoordinateLimit))
      return;
    const double dxdy = qy - py > 1e-12 ? (qx - px) / (qy - py) : 0.0;
    for (int row = static_cast<int>(std::floor(top)); row <= std::floor(bottom) && row < h; ++row) {
      const double y0 = row > py ? row : py, y1 = row + 1 < qy ? row + 1 : qy;
      double x0 = qy - py > 1e-12 ? px + (y0 - py) * dxdy : px;
      double x1 = qy - py > 1e-12 ? px + (y1 - py) * dxdy : qx;
      if (x0 > x1) std::swap(x0, x1);
      Span(row, ClampIndex(std::floor(x0), Width()), ClampIndex(std::floor(x1), Width()));
    }
  }

 private:
  ZvRaster<T>& raster_;
  T value_;
  ZvRaster<float>& distance_;
  int radius_;
  ZvRaster<float> disk_;
  bool disks_;
};

}  // namespace zv_oval

#endif
