// The built-in scene of `zv demo`: fills under both rules, feathering, opacity and strokes.
#ifndef ZV_TOOLS_DEMO_H
#define ZV_TOOLS_DEMO_H

#include <zv/raster.h>

// Renders the scene into a raster of its own size (640 x 400).
ZvRaster<unsigned char> ZvRenderDemo();

#endif
