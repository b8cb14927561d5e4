// The aliased and antialiased fills of a path.
#include "raster/aa_fill.h"
#include "raster/fill_context.h"
#include "raster/scanline_fill.h"

#include <zv/fill.h>
#include <zv/gc.h>
#include <zv/path2f.h>

namespace {
enum class FillKind { Aliased, Antialiased };

template <FillKind K, class T>
int FillPath(const ZvPath2f& path, const ZvGC& gc, ZvRaster<T>& raster, int (*callback)(),
             const IntBbox2l* box) {
  if (!path.IsRasterExtentIntersecting(gc, raster.GetExtent2f())) return 0;
  CFillContext ctx;
  // Both write each span's pixels or coverage bits outright: a sample line's vertices may come in
  // any order.
  ctx.takenByLine = true;
  ZvFillBox pixels;
  int numVertices = 0;
  const double scale = K == FillKind::Aliased ? 1.0 : gc.samplingRate;
  if (!path.CalculateFillParameters(gc, raster.GetWidth(), raster.GetHeight(), scale, ctx,
                                    pixels.xMin, pixels.yMin, pixels.xMax, pixels.yMax, numVertices,
                                    box))
    return 0;
  if (K == FillKind::Aliased)
    return ZvScanlineFill(ctx, numVertices, pixels, gc.fillRule, raster, callback);
  return ZvAntialiasedFill(ctx, numVertices, pixels, gc, raster, callback);
}
}  // namespace

int ZvPath2f::Fill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*callback)(),
                   const IntBbox2l* box) const {
  return FillPath<FillKind::Aliased>(*this, gc, raster, callback, box);
}
int ZvPath2f::Fill(const ZvGC& gc, ZvRaster<float>& raster, int (*callback)(),
                   const IntBbox2l* box) const {
  return FillPath<FillKind::Aliased>(*this, gc, raster, callback, box);
}
int ZvPath2f::Fill(const ZvGC& gc, ZvRaster<short>& raster, int (*callback)(),
                   const IntBbox2l* box) const {
  return FillPath<FillKind::Aliased>(*this, gc, raster, callback, box);
}
int ZvPath2f::AAFill(const ZvGC& gc, ZvRaster<unsigned char>& raster, int (*callback)(),
                     const IntBbox2l* box) const {
  return FillPath<FillKind::Antialiased>(*this, gc, raster, callback, box);
}
int ZvPath2f::AAFill(const ZvGC& gc, ZvRaster<float>& raster, int (*callback)(),
                     const IntBbox2l* box) const {
  return FillPath<FillKind::Antialiased>(*this, gc, raster, callback, box);
}
int ZvPath2f::AAFill(const ZvGC& gc, ZvRaster<short>& raster, int (*callback)(),
                     const IntBbox2l* box) const {
  return FillPath<FillKind::Antialiased>(*this, gc, raster, callback, box);
}
