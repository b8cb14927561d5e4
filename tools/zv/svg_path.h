// SVG path data (the `d` attribute) into a ZvPath2f.
//
// Accepted: M L H V C S Q T A Z, absolute and relative, with implicit repeats (extra pairs after
// M are lines). Arcs become cubics of at most a quarter turn each. Numbers follow the SVG
// grammar: "1.5.5" is two numbers, "-1-2" too, commas are optional separators, and arc flags
// are single characters ("a1 1 0 0010 10" has flags 0 and 0, then the point 10, 10).
#ifndef ZV_TOOLS_SVG_PATH_H
#define ZV_TOOLS_SVG_PATH_H

#include <zv/path2f.h>

#include <string>

// Appends the drawing of `data` to `path`. On failure answers false with a one-line `error`
// naming the problem and its byte offset; `path` may then hold what was drawn before it.
bool ZvParseSvgPath(const std::string& data, ZvPath2f& path, std::string& error);

#endif
