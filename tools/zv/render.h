// What `zv render` draws: a path's fill and stroke into an 8-bit raster.
#ifndef ZV_TOOLS_RENDER_H
#define ZV_TOOLS_RENDER_H

#include <zv/path2f.h>
#include <zv/raster.h>

struct ZvRenderOptions {
  double scale = 1.0;  // applied first, then the translation
  double translateX = 0.0;
  double translateY = 0.0;
  bool fill = true;
  int fillRule = 1;  // 0 even-odd, 1 non-zero
  int rate = 8;      // 4 or 8 sub-samples per pixel side
  int feather = 0;   // feather radius in sub-samples
  double opacity = 1.0;
  double strokeWidth = 0.0;  // 0: no stroke
  int join = 1;              // 0 bevel, 1 miter, 2 round
  int cap = 2;               // 0 round, 1 square, 2 flat
  double miterLimit = 4.0;
  bool taper = false;
  // Soft fill: the edge blurred over this many pixels with the built-in feather profile, faded
  // inwards (0: the antialiased fill).
  double soft = 0.0;
  // Chord tolerance of the fill's curves, in pixels. The library's fills flatten no finer than
  // 0.25 px, which shaves visible area off curved edges; below that the tool flattens the path
  // itself and fills the polygon.
  double tolerance = 0.05;
};

// Draws the fill (every subpath closed, as SVG fills do) and then the stroke of `path` into
// `raster`, each kept where it is darker than what the raster holds (coverage adds up by
// maximum, so shapes drawn one after the other do not cut into each other's edges).
void ZvRenderPath(const ZvPath2f& path, const ZvRenderOptions& options,
                  ZvRaster<unsigned char>& raster);

#endif
