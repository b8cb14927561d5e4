#include "curve_keys.h"

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdlib>
#include <sstream>

namespace {

std::string Where(int line) {
  return "line " + std::to_string(line) + ": ";
}

std::string Text(double v) {
  std::ostringstream out;
  out << v;
  return out.str();
}

// The fields of one line, comment removed; commas count as spaces.
std::vector<std::string> Fields(std::string text) {
  const std::size_t hash = text.find('#');
  if (hash != std::string::npos) text.erase(hash);
  std::replace(text.begin(), text.end(), ',', ' ');
  std::istringstream in(text);
  std::vector<std::string> fields;
  std::string field;
  while (in >> field)
    fields.push_back(field);
  return fields;
}

bool Number(const std::string& text, double& v) {
  char* end = nullptr;
  errno = 0;
  v = std::strtod(text.c_str(), &end);
  return *end == '\0' && errno == 0 && std::isfinite(v);
}

bool Kind(const std::string& text, ZvBaseFCurve::FSKind& kind) {
  if (text == "constant") {
    kind = ZvBaseFCurve::ConstantSegment;
  } else if (text == "linear") {
    kind = ZvBaseFCurve::LinearSegment;
  } else if (text == "cubic") {
    kind = ZvBaseFCurve::CubicSegment;
  } else {
    return false;
  }
  return true;
}

}  // namespace

bool ZvParseCurveKeys(const std::string& text, std::vector<ZvCurveKeyLine>& keys,
                      std::string& error) {
  std::istringstream in(text);
  std::string raw;
  for (int line = 1; std::getline(in, raw); ++line) {
    const std::vector<std::string> fields = Fields(raw);
    if (fields.empty()) continue;
    if (fields.size() > 3 || fields.size() < 2) {
      error = Where(line) + "expected PARAMETER VALUE [KIND], found " +
              std::to_string(fields.size()) + " field" + (fields.size() == 1 ? "" : "s");
      return false;
    }
    ZvCurveKeyLine key{0.0, 0.0, ZvBaseFCurve::CubicSegment, line};
    for (int i = 0; i < 2; ++i) {
      if (!Number(fields[i], i == 0 ? key.parameter : key.value)) {
        error = Where(line) + "'" + fields[i] + "' is not a finite number";
        return false;
      }
    }
    if (fields.size() == 3 && !Kind(fields[2], key.kind)) {
      error = Where(line) + "unknown segment kind '" + fields[2] + "' (constant, linear or cubic)";
      return false;
    }
    keys.push_back(key);
  }
  return true;
}

bool ZvBuildCurveFromKeys(std::vector<ZvCurveKeyLine> keys, ZvStdFCurve& curve,
                          std::string& error) {
  if (keys.empty()) {
    error = "no keys";
    return false;
  }
  std::stable_sort(keys.begin(), keys.end(), [](const ZvCurveKeyLine& a, const ZvCurveKeyLine& b) {
    return a.parameter < b.parameter;
  });
  for (std::size_t i = 1; i < keys.size(); ++i) {
    if (keys[i].parameter == keys[i - 1].parameter) {
      const int first = std::min(keys[i].line, keys[i - 1].line);
      error = Where(std::max(keys[i].line, keys[i - 1].line)) + "parameter " +
              Text(keys[i].parameter) + " repeats the key of line " + std::to_string(first);
      return false;
    }
  }
  ZvStdFCurve built(keys.front().value, ZvBaseFCurve::CubicSegment);
  for (const ZvCurveKeyLine& key : keys)
    built.CreateKey(key.parameter, key.value);
  for (unsigned int i = 0; i < keys.size(); ++i) {
    built.SetSegmentKindAtIndex(i, keys[i].kind);
    built.SetConstraintAtIndex(i, ZvBaseFCurve::AutoTangent, 1);
  }
  curve = built;
  return true;
}
