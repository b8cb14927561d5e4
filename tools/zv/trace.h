// `zv trace`: a PNG's dark (or light) regions traced into an SVG path.
#ifndef ZV_TOOLS_TRACE_H
#define ZV_TOOLS_TRACE_H

#include <zv/raster.h>

#include <string>

struct ZvTraceOptions {
  int threshold = 128;   // grey values below it are dark
  bool invert = false;   // trace the light regions instead
  double fit = 0.0;      // fit tolerance in pixels; 0 keeps the exact pixel edges
  double minArea = 0.0;  // contours enclosing less (square pixels) are dropped
};

// An SVG document of the raster's size holding one path of all traced contours, to be filled
// under the even-odd rule. `contours` receives their number.
std::string ZvTraceToSvg(const ZvRaster<unsigned char>& grey, const ZvTraceOptions& options,
                         unsigned int& contours);

// The subcommand, given the arguments after `zv trace`. Answers the process's exit code: 0, 1
// for bad input or output, 2 for a bad command line; every failure is one line on stderr.
int ZvTraceCommand(int argc, char** argv);

#endif
