// SVG path data (the `d` attribute) into a ZvPath2f.
//
// Accepted: M L H V C S Q T Z, absolute and relative, with implicit repeats (extra pairs after
// M are lines). Arcs (A) are refused. Numbers follow the SVG grammar: "1.5.5" is two numbers,
// "-1-2" too, and commas are optional separators.
#ifndef ZV_TOOLS_SVG_PATH_H
#define ZV_TOOLS_SVG_PATH_H

#include <zv/path2f.h>

#include <string>

// Appends the drawing of `data` to `path`. On failure answers false with a one-line `error`
// naming the problem and its byte offset; `path` may then hold what was drawn before it.
bool ZvParseSvgPath(const std::string& data, ZvPath2f& path, std::string& error);

#endif
