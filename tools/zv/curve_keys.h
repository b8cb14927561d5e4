// The key text of `zv curve`: one key a line, "PARAMETER VALUE [KIND]", fields separated by
// spaces, tabs or commas, KIND the kind of the segment leaving the key: constant, linear or cubic
// (the default). Blank lines are skipped and '#' starts a comment.
#ifndef ZV_TOOLS_CURVE_KEYS_H
#define ZV_TOOLS_CURVE_KEYS_H

#include <zv/std_fcurve.h>

#include <string>
#include <vector>

struct ZvCurveKeyLine {
  double parameter;
  double value;
  ZvBaseFCurve::FSKind kind;
  int line;  // 1-based, for messages
};

// Reads every key of `text`. On failure answers false with a one-line `error` that names the
// line and the problem; `keys` then holds the keys before it.
bool ZvParseCurveKeys(const std::string& text, std::vector<ZvCurveKeyLine>& keys,
                      std::string& error);

// A standard curve through the keys, in parameter order, each key's segment of its kind. The
// keys get automatic tangents, so that cubic segments pass smoothly through their neighbours.
// False with a one-line `error` when there are no keys or two keys share a parameter.
bool ZvBuildCurveFromKeys(std::vector<ZvCurveKeyLine> keys, ZvStdFCurve& curve, std::string& error);

#endif
