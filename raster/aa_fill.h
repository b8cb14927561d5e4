// The antialiased fill of a prepared CFillContext (vertices already scaled to sub-samples).
//
// The scanline sweep runs on a grid of N x N sub-samples per pixel (N = 4 when the context's
// sampling rate is 4, else 8), each sample one bit of its pixel's coverage cell. A pixel's value
// is the bit count of its own cell, or, with a feather radius, of the square around it widened
// by the radius in sub-samples on every side, which reaches into the eight neighbouring cells
// and delays the output by one pixel row. Values overwrite the raster; they are never blended.
#ifndef ZV_RASTER_AA_FILL_H
#define ZV_RASTER_AA_FILL_H

#include "raster/fill_context.h"
#include "raster/scanline_fill.h"

#include <zv/gc.h>
#include <zv/raster.h>

// `box` is the pixel box of the fill. Reads the context's sampling rate, feather radius,
// opacity and fill rule. Answers 1 when all rows were swept, 0 when the callback stopped it.
template <class T>
int ZvAntialiasedFill(CFillContext& ctx, int numVertices, const ZvFillBox& box, const ZvGC& gc,
                      ZvRaster<T>& raster, int (*callback)());

#endif
