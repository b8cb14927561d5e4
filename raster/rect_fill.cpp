// The plain and radial fills of rectangles, converted directly without a path.
#include <zv/gc.h>
#include <zv/rect2f.h>

#include "raster/oval_scan.h"
#include "raster/scanline_fill.h"

namespace {

template <class T>
int FillRect(const ZvRect2f& rect, const ZvGC& gc, ZvRaster<T>& raster) {
  if (!rect.IsRasterExtentIntersecting(gc, raster.GetExtent2f())) return 0;
  ZvPoint2<float> p[3];
  rect.SetupPointRep(p[0], p[1], p[2]);
  for (ZvPoint2<float>& q : p)
    gc.transform.MapInPlace(q);
  ZvRaster<float> distance(1, 1, 0.0f);  // the plain fill stamps no disks
  ScanConvert(p[0], p[1], p[2], 0.5, raster, ZvPixelScale<T>::full, distance, RectFillPlain);
  return 1;
}

template <class T>
int RadialFillRect(const ZvRect2f& rect, const ZvGC& gc, ZvRaster<T>& raster) {
  if (!rect.IsRasterExtentIntersecting(gc, raster.GetExtent2f())) return 0;
  ZvPoint2<float> a, b, c;
  rect.SetupPointRep(a, b, c);
  ZvTransfo4 toUnit;
  ZvPoint2dArray profile;
  double radius = 0;
  if (!ZvRadialFillFrame(gc, a, b, c, toUnit, profile, radius)) return 0;
  // Measured by the larger axis distance in the rectangle's own frame, the outline is at the
  // radius all round, corners included.
  ZvRadialFillPixels(toUnit, profile, radius, false, raster);
  return 1;
}

}  // namespace

int ZvRect2f::Fill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*)(),
                   const IntBbox2l*) const {
  return FillRect(*this, gc, raster);
}
int ZvRect2f::Fill(const ZvGC& gc, ZvRaster<float>& raster, int (*)(), const IntBbox2l*) const {
  return FillRect(*this, gc, raster);
}
int ZvRect2f::Fill(const ZvGC& gc, ZvRaster<short>& raster, int (*)(), const IntBbox2l*) const {
  return FillRect(*this, gc, raster);
}
int ZvRect2f::RadialFill(const ZvGC& gc, ZvRaster<unsigned char>& raster) const {
  return RadialFillRect(*this, gc, raster);
}
int ZvRect2f::RadialFill(const ZvGC& gc, ZvRaster<float>& raster) const {
  return RadialFillRect(*this, gc, raster);
}
int ZvRect2f::RadialFill(const ZvGC& gc, ZvRaster<short>& raster) const {
  return RadialFillRect(*this, gc, raster);
}
