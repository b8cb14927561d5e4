// Polygons straight into a fill's tables, bypassing paths and flattening. Vertices are sorted by
// y unless `byLine` asks for the grouping by sample line that the path fills use.
#ifndef ZV_TESTS_RASTER_FILL_POLYGONS_H
#define ZV_TESTS_RASTER_FILL_POLYGONS_H

#include "raster/aa_fill.h"
#include "raster/fill_context.h"
#include "raster/scanline_fill.h"

#include <zv/arrays.h>
#include <zv/gc.h>

#include <vector>

using Ring = std::vector<ZvPoint2<double>>;

// Closed subpaths as the flatteners give them: tag 0, tags 1, then the first point again, tag 2.
inline void ToArrays(const std::vector<Ring>& rings, ZvPoint2dArray& points,
                     ZvPointTagArray& tags) {
  for (const Ring& ring : rings) {
    for (std::size_t i = 0; i < ring.size(); ++i) {
      points.Add(ring[i]);
      tags.Add(i == 0 ? ZvPointTag_First : ZvPointTag_Continue);
    }
    points.Add(ring[0]);
    tags.Add(ZvPointTag_Last);
  }
}

inline ZvFillBox WholeRaster(int w, int h) {
  return ZvFillBox{0, 0, w, h};
}

template <class T>
int FillRings(const std::vector<Ring>& rings, int rule, ZvRaster<T>& raster, const ZvFillBox& box,
              int (*callback)() = nullptr, bool byLine = false) {
  ZvPoint2dArray points;
  ZvPointTagArray tags;
  ToArrays(rings, points, tags);
  CFillContext ctx;
  ctx.takenByLine = byLine;
  const int n = ctx.BuildTables(points, tags, 1.0);
  return ZvScanlineFill(ctx, n, box, rule, raster, callback);
}

template <class T>
int AAFillRings(const std::vector<Ring>& rings, const ZvGC& gc, ZvRaster<T>& raster,
                int (*callback)() = nullptr, bool byLine = false) {
  ZvPoint2dArray points;
  ZvPointTagArray tags;
  ToArrays(rings, points, tags);
  CFillContext ctx;
  ctx.takenByLine = byLine;
  const int n = ctx.BuildTables(points, tags, gc.samplingRate);
  return ZvAntialiasedFill(ctx, n, WholeRaster(raster.GetWidth(), raster.GetHeight()), gc, raster,
                           callback);
}

inline Ring Rect(double x0, double y0, double x1, double y1) {
  return Ring{{x0, y0}, {x1, y0}, {x1, y1}, {x0, y1}};
}

#endif
