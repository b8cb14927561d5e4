// zv fit: pen points fed one by one to a path builder, as a live pen would, and the path out.
// Points with a pressure go through a property builder, whose samples carry the pressure
// along the stroke.
#include "fit.h"

#include <zv/gc.h>
#include <zv/path2f_prop1d.h>
#include <zv/path_builder.h>
#include <zv/path_prop_builder.h>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iostream>
#include <iterator>
#include <memory>

#include "fit_io.h"
#include "png_write.h"
#include "render.h"

namespace {
const char kFitUsage[] = " (zv help for usage)";

struct FitOptions {
  std::string input, output, png;
  int builder = 2;  // 0 linear, 1 cubic, 2 fit
  int width = 512, height = 512;
  double tolerance = 1.0;
  double strokeWidth = 8.0;  // stroke width at pressure 1, in pixels
  bool close = false;
  bool atEnd = false;  // commit only at the end instead of after every point
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
                            a == "--builder" || a == "--tolerance" || a == "--width";
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
    } else if (a == "--width") {
      if (!ParseNumber(a, argv[++i], o.strokeWidth)) return false;
      if (!(o.strokeWidth > 0.0) || o.strokeWidth > 4096.0)
        return UsageError("option --width expects a number above 0, at most 4096");
    } else if (a == "--close") {
      o.close = true;
    } else if (a == "--at-end") {
      o.atEnd = true;
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

// The same builders for points with a pressure; the cubic kind has none.
std::unique_ptr<ZvBasePathPropBuilder> MakePropBuilder(const FitOptions& o, const ZvGC& gc,
                                                       ZvPath2fProp1d* path) {
  if (o.builder == 0)
    return std::unique_ptr<ZvBasePathPropBuilder>(new ZvLinearPathPropBuilder(gc, path));
  return std::unique_ptr<ZvBasePathPropBuilder>(
      new ZvBezierFitPathPropBuilder(gc, path, 32.0, 2.0, o.tolerance, 3));
}

// What the pressure builder gave: every sample with the pressure there.
struct Stamps {
  std::vector<ZvPoint2<float>> points;
  std::vector<double> pressures;
  void Take(const ZvPoint2fArray& samples, const ZvDoubleArray& values) {
    points.insert(points.end(), samples.data, samples.data + samples.size);
    pressures.insert(pressures.end(), values.data, values.data + values.size);
  }
};

// A disc of radius r as four quarter-circle cubics.
void AddDisc(ZvPath2f& path, const ZvPoint2<float>& c, float r) {
  const float k = 0.5522847498f * r;  // handle length of a quarter circle
  const auto at = [&](float x, float y) { return ZvPoint2<float>{c.x + x, c.y + y}; };
  path.Moveto(at(r, 0));
  path.Curveto(at(r, k), at(k, r), at(0, r));
  path.Curveto(at(-k, r), at(-r, k), at(-r, 0));
  path.Curveto(at(-r, -k), at(-k, -r), at(0, -r));
  path.Curveto(at(k, -r), at(r, -k), at(r, 0));
  path.Closeto();
}

// The input as grey squares of 4 px, or with pressure the stroke as grey discs of the width the
// pressure gives at every sample (the non-zero fill unites them); the path as a white line 1 px
// wide over them, all on black, inverted at the end: dark ink on paper.
ZvRaster<unsigned char> Draw(const std::vector<ZvPoint2<float>>& points, const Stamps& stamps,
                             const ZvPath2f& path, const FitOptions& o) {
  ZvRaster<unsigned char> raster(o.width, o.height, 0);
  ZvPath2f dots(static_cast<unsigned int>(5 * points.size() + 1));
  if (stamps.points.empty()) {
    for (const ZvPoint2<float>& p : points) {
      dots.Moveto(ZvPoint2<float>{p.x - 2.0f, p.y - 2.0f});
      dots.Lineto(ZvPoint2<float>{p.x + 2.0f, p.y - 2.0f});
      dots.Lineto(ZvPoint2<float>{p.x + 2.0f, p.y + 2.0f});
      dots.Lineto(ZvPoint2<float>{p.x - 2.0f, p.y + 2.0f});
      dots.CloseSubpath(dots.NumPoints() - 1);
    }
  } else {
    // A disc much wider than the picture draws nothing more than one as wide as it.
    const double most = double(o.width) + o.height;
    for (std::size_t k = 0; k < stamps.points.size(); ++k) {
      const double r = std::min(0.5 * o.strokeWidth * stamps.pressures[k], most);
      if (r > 0.0) AddDisc(dots, stamps.points[k], static_cast<float>(r));
    }
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
  std::vector<double> pressures;
  std::string error;
  if (!ZvReadPenPoints(text, points, pressures, error)) {
    std::cerr << "zv: " << name << ": " << error << "\n";
    return 1;
  }
  if (points.empty()) {
    std::cerr << "zv: " << name << ": no points\n";
    return 1;
  }
  if (!pressures.empty() && o.builder == 1) {
    std::cerr << "zv: " << name
              << ": the cubic builder takes no pressure; use --builder linear or fit\n";
    return 1;
  }

  // Fed as a live pen would: one point at a time, the trailing samples taken after each (which
  // commits what came in), or with --at-end only once, at the end.
  ZvGC gc;
  // Pressure runs from 0 to 1 about: thinning its curve within a thousandth keeps the drawn
  // width within a thousandth of --width of what the pen gave.
  gc.propertyTolerance = 0.001;
  ZvPath2fProp1d path(static_cast<unsigned int>(points.size()));
  Stamps stamps;
  if (pressures.empty()) {
    std::unique_ptr<ZvBasePathBuilder> builder = MakeBuilder(o, gc, &path);
    builder->StartSubpath(points.front());
    for (std::size_t i = 1; i + 1 < points.size(); ++i) {
      builder->AddInputPoint(points[i], 0);
      if (!o.atEnd) builder->GetTrailingSamples();
    }
    builder->EndSubpath(points.back(), o.close ? 1 : 0);
  } else {
    std::unique_ptr<ZvBasePathPropBuilder> builder = MakePropBuilder(o, gc, &path);
    ZvDoubleArray values;
    for (std::size_t i = 0; i + 1 < points.size(); ++i) {
      builder->AddInputPoint(points[i], pressures[i], 0);
      if (!o.atEnd) stamps.Take(builder->GetTrailingSamples(values), values);
    }
    stamps.Take(builder->EndSubpathAndGetTrailingSamples(points.back(), pressures.back(), values,
                                                         o.close ? 1 : 0),
                values);
  }

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
    if (!ZvWritePng(o.png, Draw(points, stamps, path, o), error)) {
      std::cerr << "zv: " << error << "\n";
      return 1;
    }
  }
  return 0;
}
