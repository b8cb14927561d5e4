// The plain and radial fills of ovals, converted directly without a path.
#include <zv/gc.h>
#include <zv/oval2f.h>

#include <cmath>

#include "raster/oval_scan.h"
#include "raster/scanline_fill.h"

namespace {

// The octagonal size of a vector: the larger component plus a third of the smaller.
double Size(double x, double y) {
  x = std::fabs(x);
  y = std::fabs(y);
  return x > y ? x + 0.3334 * y : y + 0.3334 * x;
}

// A sliver wider than tall, converted with x and y exchanged so that its one-pixel rows and
// widening run across its length (one pixel per column at least), and copied back. Only the oval's
// box (and two pixels of margin for what the rows add) is exchanged, not the whole raster.
template <class T>
void FillTransposed(const ZvPoint2<float> (&p)[3], ZvRaster<T>& raster, ZvRaster<float>& distance) {
  const double ex = 0.5 * (std::fabs(double(p[1].x) - p[0].x) + std::fabs(double(p[2].x) - p[0].x));
  const double ey = 0.5 * (std::fabs(double(p[1].y) - p[0].y) + std::fabs(double(p[2].y) - p[0].y));
  const double mx = 0.5 * (double(p[1].x) + p[2].x), my = 0.5 * (double(p[1].y) + p[2].y);
  const auto clip = [](double v, int n) { return !(v > 0) ? 0 : v > n ? n : static_cast<int>(v); };
  const int x0 = clip(std::floor(mx - ex) - 2, raster.GetWidth());
  const int x1 = clip(std::ceil(mx + ex) + 2, raster.GetWidth());
  const int y0 = clip(std::floor(my - ey) - 2, raster.GetHeight());
  const int y1 = clip(std::ceil(my + ey) + 2, raster.GetHeight());
  if (x0 >= x1 || y0 >= y1) return;
  ZvRaster<T> t(y1 - y0, x1 - x0, T(0));
  ZvPoint2<float> q[3];
  for (int i = 0; i < 3; ++i)
    q[i] = {p[i].y - static_cast<float>(y0), p[i].x - static_cast<float>(x0)};
  const T full = ZvPixelScale<T>::full;
  ScanConvert(q[0], q[1], q[2], 0.5, t, full, distance, 0, OvalFillPlain);
  for (int x = x0; x < x1; ++x)
    for (int y = y0; y < y1; ++y)
      if (t.GetVal(y - y0, x - x0) == full) raster.SetVal(x, raster.ConvertBottomUpY(y), full);
}

template <class T>
int FillOval(const ZvOval2f& oval, const ZvGC& gc, ZvRaster<T>& raster) {
  if (!oval.IsRasterExtentIntersecting(gc, raster.GetExtent2f())) return 0;
  ZvPoint2<float> p[3];
  oval.SetupPointRep(p[0], p[1], p[2]);
  for (ZvPoint2<float>& q : p)
    gc.transform.MapInPlace(q);
  ZvRaster<float> distance(1, 1, 0.0f);  // the plain fill stamps no disks
  const T full = ZvPixelScale<T>::full;
  const double ux = double(p[1].x) - p[0].x, uy = double(p[1].y) - p[0].y;
  const double vx = double(p[2].x) - p[0].x, vy = double(p[2].y) - p[0].y;
  const double tol = 9.9999997e-05;
  const bool aligned = (std::fabs(uy) <= tol && std::fabs(vx) <= tol) ||
                       (std::fabs(ux) <= tol && std::fabs(vy) <= tol);
  // Small axis-aligned ovals take the general form too: its one-pixel rows keep them whole.
  if (aligned && Size(std::hypot(ux, uy), std::hypot(vx, vy)) > 20.0) {
    ScanConvertIsothetic(p[0], p[1], p[2], 0.5, raster, full, distance, 0, OvalFillPlain);
  } else if ((Size(ux, uy) <= 1.5 || Size(vx, vy) <= 1.5) &&
             ux * ux + vx * vx > uy * uy + vy * vy) {
    // Along the rows a sliver could fall between the row centres and vanish; across them the
    // one-pixel rows keep it whole. A sliver taller than wide is already taken across.
    FillTransposed(p, raster, distance);
  } else {
    ScanConvert(p[0], p[1], p[2], 0.5, raster, full, distance, 0, OvalFillPlain);
  }
  return 1;
}

template <class T>
int RadialFillOval(const ZvOval2f& oval, const ZvGC& gc, ZvRaster<T>& raster) {
  if (!oval.IsRasterExtentIntersecting(gc, raster.GetExtent2f())) return 0;
  ZvTransfo4 toUnit;
  ZvPoint2dArray profile;
  double radius = 0;
  if (!oval.CalculateRadialFillParameters(gc, toUnit, profile, radius)) return 0;
  ZvRadialFillPixels(toUnit, profile, radius, true, raster);
  return 1;
}

}  // namespace

int ZvOval2f::Fill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*)(),
                   const IntBbox2l*) const {
  return FillOval(*this, gc, raster);
}
int ZvOval2f::Fill(const ZvGC& gc, ZvRaster<float>& raster, int (*)(), const IntBbox2l*) const {
  return FillOval(*this, gc, raster);
}
int ZvOval2f::Fill(const ZvGC& gc, ZvRaster<short>& raster, int (*)(), const IntBbox2l*) const {
  return FillOval(*this, gc, raster);
}

int ZvOval2f::CalculateRadialFillParameters(const ZvGC& gc, ZvTransfo4& toUnit,
                                            ZvPoint2dArray& profile, double& radius) const {
  ZvPoint2<float> a, b, c;
  SetupPointRep(a, b, c);
  return ZvRadialFillFrame(gc, a, b, c, toUnit, profile, radius);
}
int ZvOval2f::RadialFill(const ZvGC& gc, ZvRaster<unsigned char>& raster) const {
  return RadialFillOval(*this, gc, raster);
}
int ZvOval2f::RadialFill(const ZvGC& gc, ZvRaster<float>& raster) const {
  return RadialFillOval(*this, gc, raster);
}
int ZvOval2f::RadialFill(const ZvGC& gc, ZvRaster<short>& raster) const {
  return RadialFillOval(*this, gc, raster);
}
