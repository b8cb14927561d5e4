#include "fit.h"

#include <zv/gc.h>
#include <zv/path_builder.h>

#include <cerrno>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iostream>
#include <iterator>
#include <memory>

#include "png_write.h"
#include "render.h"

bool ZvReadPenPoints(const std::string& text, std::vector<ZvPoint2<float>>& points,
                     std::string& error) {
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
    points.push_back(ZvPoint2<float>{static_cast<float>(v[0]), static_cast<float>(v[1])});
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

namespace {
const char kFitUsage[] = " (zv help for usage)";

struct FitOptions {
  std::string input, output, png;
  int builder = 2;  // 0 linear, 1 cubic, 2 fit
  int width = 512, height = 512;
  double tolerance = 1.0;
  bool close = false;
};

bool UsageError(const std::string& message) {
  std::cerr << "zv: " << message << kFitUsage << "\n";
  return false;
}

bool ParseNumber(const std::string& option, const char* text, double& v) {
  char* end = nullptr;
  errno = 0;
  v = std::strtod(text, &end);
  if (!*text || *end || errno || !std::isfinite(v))
    return UsageError("option " + option + " expects a number, not '" + text + "'");
  return true;
}

bool ParseOptions(int argc, char** argv, FitOptions& o) {
  for (int i = 2; i < argc; ++i) {
    const std::string a = argv[i];
    const bool takesValue = a == "-o" || a == "--output" || a == "--png" || a == "--size" ||
                            a == "--builder" || a == "--tolerance";
    if (takesValue && i + 1 >= argc) return UsageError("option " + a + " needs a value");
    if (a == "-o" || a == "--output") {
      o.output = argv[++i];
    } else if (a == "--png") {
      o.png = argv[++i];
    } else if (a == "--size") {
      const std::string v = argv[++i];
      int w = 0, h = 0, used = 0;
      if (std::sscanf(v.c_str(), "%dx%d%n", &w, &h, &used) != 2 || used != int(v.size()) || w < 1 ||
          h < 1 || w > 16384 || h > 16384)
        return UsageError("option --size expects WxH (1 to 16384), not '" + v + "'");
      o.width = w;
      o.height = h;
    } else if (a == "--builder") {
      const std::string v = argv[++i];
      if (v == "linear")
        o.builder = 0;
      else if (v == "cubic")
        o.builder = 1;
      else if (v == "fit")
        o.builder = 2;
      else
        return UsageError("option --builder does not know '" + v + "'");
    } else if (a == "--tolerance") {
      if (!ParseNumber(a, argv[++i], o.tolerance)) return false;
      if (!(o.tolerance > 0.0)) return UsageError("option --tolerance expects a positive number");
    } else if (a == "--close") {
      o.close = true;
    } else if (a.size() > 1 && a[0] == '-') {
      return UsageError("unknown option '" + a + "'");
    } else if (o.input.empty()) {
      o.input = a;
    } else {
      return UsageError("only one input file, not also '" + a + "'");
    }
  }
  return true;
}

std::unique_ptr<ZvBasePathBuilder> MakeBuilder(const FitOptions& o, const ZvGC& gc,
                                               ZvPath2f* path) {
  if (o.builder == 0) return std::unique_ptr<ZvBasePathBuilder>(new ZvLinearPathBuilder(gc, path));
  if (o.builder == 1) return std::unique_ptr<ZvBasePathBuilder>(new ZvCubicPathBuilder(gc, path));
  // Pen events a few pixels apart are densified to 2 px for the fits; edges of 32 px and more
  // (a fast flick) are drawn as they come.
  return std::unique_ptr<ZvBasePathBuilder>(
      new ZvBezierFitPathBuilder(gc, path, 32.0, 2.0, o.tolerance, 3));
}

// The input as grey squares of 4 px, the path as a white line 1 px wide over them, both on
// black, inverted at the end: dark ink on paper.
ZvRaster<unsigned char> Draw(const std::vector<ZvPoint2<float>>& points, const ZvPath2f& path,
                             const FitOptions& o) {
  ZvRaster<unsigned char> raster(o.width, o.height, 0);
  ZvPath2f dots(static_cast<unsigned int>(5 * points.size() + 1));
  for (const ZvPoint2<float>& p : points) {
    dots.Moveto(ZvPoint2<float>{p.x - 2.0f, p.y - 2.0f});
    dots.Lineto(ZvPoint2<float>{p.x + 2.0f, p.y - 2.0f});
    dots.Lineto(ZvPoint2<float>{p.x + 2.0f, p.y + 2.0f});
    dots.Lineto(ZvPoint2<float>{p.x - 2.0f, p.y + 2.0f});
    dots.CloseSubpath(dots.NumPoints() - 1);
  }
  ZvRenderOptions grey;
  grey.opacity = 0.4;
  ZvRenderPath(dots, grey, raster);
  ZvRenderOptions line;
  line.fill = false;
  line.strokeWidth = 1.0;
  line.join = 2;
  line.cap = 0;
  ZvRenderPath(path, line, raster);
  for (int i = 0; i < raster.GetSize(); ++i)
    raster.SetVal(i, static_cast<unsigned char>(255 - raster.GetVal(i)));
  return raster;
}
}  // namespace

int ZvFitCommand(int argc, char** argv) {
  FitOptions o;
  if (!ParseOptions(argc, argv, o)) return 2;
  const bool fromStdin = o.input.empty() || o.input == "-";
  const std::string name = fromStdin ? std::string("<stdin>") : o.input;
  std::string text;
  if (fromStdin) {
    text.assign(std::istreambuf_iterator<char>(std::cin), std::istreambuf_iterator<char>());
  } else {
    std::ifstream in(o.input, std::ios::binary);
    if (!in) {
      std::cerr << "zv: cannot read '" << o.input << "': " << std::strerror(errno) << "\n";
      return 1;
    }
    text.assign(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
  }
  std::vector<ZvPoint2<float>> points;
  std::string error;
  if (!ZvReadPenPoints(text, points, error)) {
    std::cerr << "zv: " << name << ": " << error << "\n";
    return 1;
  }
  if (points.empty()) {
    std::cerr << "zv: " << name << ": no points\n";
    return 1;
  }

  // Fed as a live pen would: one point at a time, the trailing samples taken after each.
  ZvGC gc;
  ZvPath2f path(static_cast<unsigned int>(points.size()));
  std::unique_ptr<ZvBasePathBuilder> builder = MakeBuilder(o, gc, &path);
  builder->StartSubpath(points.front());
  for (std::size_t i = 1; i + 1 < points.size(); ++i) {
    builder->AddInputPoint(points[i], 0);
    builder->GetTrailingSamples();
  }
  builder->EndSubpath(points.back(), o.close ? 1 : 0);

  std::string data;
  ZvFormatSvgPath(path, data);  // the builders above make segments of degree 3 at most
  data += '\n';
  if (o.output.empty() || o.output == "-") {
    std::cout << data;
  } else {
    std::ofstream out(o.output, std::ios::binary);
    if (!(out << data) || !out.flush()) {
      std::cerr << "zv: cannot write '" << o.output << "'\n";
      return 1;
    }
  }
  if (!o.png.empty()) {
    if (!ZvWritePng(o.png, Draw(points, path, o), error)) {
      std::cerr << "zv: " << error << "\n";
      return 1;
    }
  }
  return 0;
}
