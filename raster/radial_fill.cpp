// Radial fills: every pixel of a raster from a profile curve, by its distance from a shape's
// centre measured in the frame where the shape is a disk or a square.
#include <zv/gc.h>
#include <zv/polyline.h>
#include <zv/transfo4.h>

#include <cmath>

#include "raster/oval_scan.h"
#include "raster/scanline_fill.h"

namespace {
// The profile's value as a pixel, rounded for the integer types and clamped to full coverage.
template <class T>
T Scaled(double p) {
  const double full = ZvPixelScale<T>::full;
  return static_cast<T>(std::trunc((p >= 1 ? full : p * full) + 0.5));
}
template <>
float Scaled<float>(double p) {
  return static_cast<float>(p < 1.0 ? p : 1.0);
}
}  // namespace

template <class T>
void ZvRadialFillPixels(const ZvTransfo4& toUnit, const ZvPoint2dArray& profile, double radius,
                        bool round, ZvRaster<T>& raster) {
  const int w = raster.GetWidth(), h = raster.GetHeight();
  const double ax = toUnit.GetMatrixElement(0, 0), ay = toUnit.GetMatrixElement(1, 0);
  const double bx = toUnit.GetMatrixElement(0, 1), by = toUnit.GetMatrixElement(1, 1);
  const double tx = toUnit.GetMatrixElement(0, 3), ty = toUnit.GetMatrixElement(1, 3);
  const double r2 = radius * radius;
  for (int row = 0; row < h; ++row) {
    T* out = raster.GetRaster() + raster.CalculateOffsetForPos(0, raster.ConvertBottomUpY(row));
    const double y = row + 0.5;
    double u = ax * 0.5 + bx * y + tx, v = ay * 0.5 + by * y + ty;
    for (int x = 0; x < w; ++x, u += ax, v += ay) {
      double d;
      if (round) {
        const double d2 = u * u + v * v;
        if (!(d2 <= r2)) {  // non-numbers too
          out[x] = T(0);
          continue;
        }
        d = std::sqrt(d2);
      } else {
        d = std::fabs(u) > std::fabs(v) ? std::fabs(u) : std::fabs(v);
        if (!(d <= radius)) {
          out[x] = T(0);
          continue;
        }
      }
      const double p = ZvPoint2dArray_EvalYInSortedArray(profile, d);
      out[x] = p <= 0 ? T(0) : Scaled<T>(p);
    }
  }
}

template void ZvRadialFillPixels<unsigned char>(const ZvTransfo4&, const ZvPoint2dArray&, double,
                                                bool, ZvRaster<unsigned char>&);
template void ZvRadialFillPixels<short>(const ZvTransfo4&, const ZvPoint2dArray&, double, bool,
                                        ZvRaster<short>&);
template void ZvRadialFillPixels<float>(const ZvTransfo4&, const ZvPoint2dArray&, double, bool,
                                        ZvRaster<float>&);

int ZvRadialFillFrame(const ZvGC& gc, const ZvPoint2<float>& a, const ZvPoint2<float>& b,
                      const ZvPoint2<float>& c, ZvTransfo4& toUnit, ZvPoint2dArray& profile,
                      double& radius) {
  double r = 0;
  if (!gc.featherProfile.GetLargestKeyParameter(r)) return 0;
  ZvPoint2<double> from[3] = {{a.x, a.y}, {b.x, b.y}, {c.x, c.y}};
  for (ZvPoint2<double>& p : from)
    gc.transform.MapInPlace(p);
  // The frame's corners onto the square of side 2r about the origin: the oval inscribed in the
  // frame becomes the circle of radius r, and its outline meets the profile's last key.
  const ZvPoint2<double> to[3] = {{-r, -r}, {r, -r}, {-r, r}};
  ZvTransfo4 t;
  if (!t.SetTo3PointTransformXY(from, to)) return 0;
  ZvPoint2dArray points(64);
  ZvPointTagArray tags(64);
  gc.featherProfile.Flatten(ZvTransfo4(), 0.001, points, tags, 0);
  toUnit = t;
  profile = points;
  radius = r;
  return 1;
}
