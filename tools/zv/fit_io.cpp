// The text formats of zv fit: pen points in, SVG path data out.
#include "fit_io.h"

#include <cerrno>
#include <cmath>
#include <cstdio>
#include <cstdlib>

bool ZvReadPenPoints(const std::string& text, std::vector<ZvPoint2<float>>& points,
                     std::vector<double>& pressures, std::string& error) {
  std::size_t begin = 0;
  for (unsigned int line = 1; begin < text.size(); ++line) {
    std::size_t end = text.find('\n', begin);
    if (end == std::string::npos) end = text.size();
    std::string row = text.substr(begin, end - begin);
    begin = end + 1;
    if (!row.empty() && row.back() == '\r') row.pop_back();
    const std::size_t lead = row.find_first_not_of(" \t");
    if (lead == std::string::npos || row[lead] == '#') continue;
    double v[3];
    int count = 0;
    const char* p = row.c_str() + lead;
    bool bad = false;
    while (*p && !bad) {
      if (count == 3) {
        bad = true;
        break;
      }
      char* stop = nullptr;
      errno = 0;
      v[count] = std::strtod(p, &stop);
      if (stop == p || errno == ERANGE || !std::isfinite(v[count])) {
        bad = true;
        break;
      }
      ++count;
      p = stop;
      while (*p == ' ' || *p == '\t')
        ++p;
      if (*p == ',') {
        ++p;
        while (*p == ' ' || *p == '\t')
          ++p;
        if (!*p) bad = true;  // a trailing comma promises a number that never comes
      }
    }
    // Coordinates must also survive the narrowing to the path's single precision.
    if (bad || count < 2 || std::fabs(v[0]) > 3.0e38 || std::fabs(v[1]) > 3.0e38) {
      error = "line " + std::to_string(line) + ": expected 'x y' or 'x y pressure', not '" +
              row.substr(lead) + "'";
      return false;
    }
    // A stroke with pressure on some points only has no width at the others.
    if (!points.empty() && (count == 3) != !pressures.empty()) {
      error = "line " + std::to_string(line) +
              (count == 3 ? ": a pressure, but the lines before have none"
                          : ": no pressure, but the lines before have one");
      return false;
    }
    if (count == 3 && v[2] < 0.0) {
      error = "line " + std::to_string(line) + ": the pressure must not be negative, not '" +
              row.substr(lead) + "'";
      return false;
    }
    points.push_back(ZvPoint2<float>{static_cast<float>(v[0]), static_cast<float>(v[1])});
    if (count == 3) pressures.push_back(v[2]);
  }
  return true;
}

bool ZvFormatSvgPath(const ZvPath2f& path, std::string& data) {
  static const char kCommand[] = {'M', 'L', 'Q', 'C'};
  char number[64];
  const auto put = [&](const ZvPoint2<float>& p) {
    std::snprintf(number, sizeof number, " %.9g %.9g", p.x, p.y);
    data += number;
  };
  ZvPath2fIter it(path);
  unsigned int first, last;
  while (it.GetNextSubPathIndices(first, last)) {
    if (!data.empty()) data += ' ';
    data += 'M';
    put(path.GetPoint(first));
    for (unsigned int i = first + 1; i <= last;) {
      unsigned int a, b;
      path.GetSegmentIndices(i, a, b);
      if (b - a > 3) return false;
      data += ' ';
      data += kCommand[b - a];
      for (unsigned int k = a + 1; k <= b; ++k)
        put(path.GetPoint(k));
      i = b + 1;
    }
    if (path.IsSubpathClosed(first)) data += " Z";
  }
  return true;
}
