// PNG input of any colour type as 8-bit grey.
#ifndef ZV_TOOLS_PNG_READ_H
#define ZV_TOOLS_PNG_READ_H

#include <zv/raster.h>

#include <string>

// Reads `file` into `raster` (rows top to bottom, raw rows): palette and low bit depths are
// expanded, 16-bit samples cut to 8, colour turned to grey by the image's own weights (or the
// standard ones), and transparency laid over white. On failure answers false with a one-line
// `error` and leaves `raster` alone.
bool ZvReadPng(const std::string& file, ZvRaster<unsigned char>& raster, std::string& error);

#endif
