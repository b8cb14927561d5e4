// What `zv render --offset D` adds: the parallel polylines of the input, on both sides.
#ifndef ZV_TOOLS_OFFSET_H
#define ZV_TOOLS_OFFSET_H

#include "render.h"

// Every subpath of `path` flattened at `tolerance` (path units), then offset by `distance` to
// its left and to its right by ZvPath2f::GetSimilarPath: one path holding two polylines per
// subpath, closed where the subpath is.
ZvPath2f ZvParallelPolylines(const ZvPath2f& path, double distance, double tolerance);

// Strokes those polylines one pixel wide over what `raster` holds, under the same scale and
// translation as the path itself.
void ZvRenderParallelPolylines(const ZvPath2f& path, const ZvRenderOptions& options,
                               double distance, ZvRaster<unsigned char>& raster);

#endif
