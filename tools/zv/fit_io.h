// The text formats of zv fit: pen points in, SVG path data out.
#ifndef ZV_TOOLS_FIT_IO_H
#define ZV_TOOLS_FIT_IO_H

#include <zv/path2f.h>
#include <zv/point.h>

#include <string>
#include <vector>

// Pen points from text: one point a line, "x y" or "x y pressure", numbers separated by blanks
// or one comma. Blank lines and lines starting with '#' are skipped. Either every point has a
// pressure (not negative), and `pressures` receives them, one per point, or none has, and
// `pressures` stays empty. On failure answers false with a one-line `error` that starts with
// "line N:"; `points` and `pressures` then hold what came before that line.
bool ZvReadPenPoints(const std::string& text, std::vector<ZvPoint2<float>>& points,
                     std::vector<double>& pressures, std::string& error);

// SVG path data of `path`: M per subpath, L, Q and C for segments of degree 1, 2 and 3, Z after
// a closed subpath. Numbers are written with up to 9 significant digits, enough to read every
// float back unchanged. Answers false, with `data` holding what was written before, at a segment
// of degree above 3, which SVG cannot express.
bool ZvFormatSvgPath(const ZvPath2f& path, std::string& data);

#endif
