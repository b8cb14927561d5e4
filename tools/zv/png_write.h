// 8-bit greyscale PNG output.
#ifndef ZV_TOOLS_PNG_WRITE_H
#define ZV_TOOLS_PNG_WRITE_H

#include <zv/raster.h>

#include <string>

// Writes the raster's rows top to bottom (raw rows). On failure answers false with a one-line
// `error`; a partly written file is removed.
bool ZvWritePng(const std::string& file, const ZvRaster<unsigned char>& raster, std::string& error);

#endif
