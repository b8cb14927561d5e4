// zv: the command-line face of libzv's fills and strokes.
//
//   zv render [options] [FILE]   SVG path data from FILE (or standard input) to a PNG
//   zv demo [-o FILE]            the built-in scene
//   zv fit [options] [FILE]      pen points through a path builder, out as SVG path data
//   zv trace [options] PNG       a PNG's dark regions traced into an SVG path
//   zv curve [options] [KEYS]    a function curve sampled to CSV, plotted, saved as a block
//
// Every failure is one line on standard error and a non-zero exit: 1 for bad input or output,
// 2 for a bad command line.
#include "curve.h"
#include "demo.h"
#include "fit.h"
#include "offset.h"
#include "png_write.h"
#include "render.h"
#include "svg_path.h"
#include "trace.h"

#include <cerrno>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iostream>
#include <iterator>
#include <sstream>
#include <string>

namespace {
const char kUsage[] =
    "usage: zv render [options] [FILE]   render SVG path data (FILE or standard input)\n"
    "       zv demo [-o FILE]            render the built-in scene (default zv-demo.png)\n"
    "       zv trace [options] PNG       trace a PNG's dark regions into an SVG path\n"
    "render options:\n"
    "  -o, --output FILE        PNG to write (required)\n"
    "  --size WxH               raster size in pixels (default 256x256)\n"
    "  --scale S                scale the path by S (default 1)\n"
    "  --translate X,Y          then move it by X,Y pixels (default 0,0)\n"
    "  --no-fill                stroke only\n"
    "  --fill-rule nonzero|evenodd\n"
    "  --rate 4|8               antialiasing sub-samples per pixel side (default 8)\n"
    "  --feather R              feather radius in sub-samples, 0..rate (default 0)\n"
    "  --opacity A              fill opacity (default 1)\n"
    "  --soft W                 soft fill: the edge blurred inwards over W pixels (default 0)\n"
    "  --stroke W               stroke with line width W pixels (default 0: no stroke)\n"
    "  --join miter|round|bevel --cap flat|round|square --miter-limit M --taper\n"
    "  --tolerance T            fill curves to within T pixels (default 0.05); below 0.25 the\n"
    "                           tool flattens curves itself: about 15% more time on a 64 px\n"
    "                           icon, 1% at 1024 px\n"
    "  --offset D               also draw the parallel polylines D units to each side\n"
    "  --invert                 dark shapes on white\n"
    "usage: zv fit [options] [FILE]      pen points ('x y' or 'x y pressure' a line; FILE or\n"
    "                                    standard input) fed one by one to a path builder, out\n"
    "                                    as SVG path data; with pressure on every point the\n"
    "                                    builder also records it along the path\n"
    "fit options:\n"
    "  -o, --output FILE        path data to write (default standard output)\n"
    "  --builder linear|cubic|fit  the builder (default fit: least-squares cubics; cubic takes no\n"
    "                           pressure)\n"
    "  --tolerance E            fit error in pixels (default 1)\n"
    "  --close                  close the subpath\n"
    "  --at-end                 commit once at the end, not after every point (fewer segments)\n"
    "  --png FILE --size WxH    also draw the points and the path (default 512x512); with\n"
    "                           pressure, the stroke as wide as --width times the pressure\n"
    "  --width W                stroke width at pressure 1, in pixels (default 8)\n"
    "trace options:\n"
    "  -o, --output FILE        SVG to write (default: standard output)\n"
    "  --threshold N            grey values below N are dark (default 128)\n"
    "  --invert                 trace the light regions instead\n"
    "  --fit TOL                fit cubics within TOL pixels (default: exact pixel edges)\n"
    "  --min-area A             drop contours enclosing less than A square pixels\n";

struct UsageError {
  std::string message;
};

class Args {
 public:
  Args(int argc, char** argv) : argc(argc), argv(argv) {}
  bool More() const { return next < argc; }
  std::string Next() { return argv[next++]; }
  std::string Value(const std::string& option) {
    if (next >= argc) throw UsageError{"option " + option + " needs a value"};
    return argv[next++];
  }

 private:
  int argc;
  char** argv;
  int next = 2;
};

double Number(const std::string& option, const std::string& text) {
  char* end = nullptr;
  errno = 0;
  const double v = std::strtod(text.c_str(), &end);
  if (text.empty() || *end || errno || !std::isfinite(v))
    throw UsageError{"option " + option + " expects a number, not '" + text + "'"};
  return v;
}

int Integer(const std::string& option, const std::string& text, int lo, int hi) {
  const double v = Number(option, text);
  if (v != std::floor(v) || v < lo || v > hi)
    throw UsageError{"option " + option + " expects a whole number from " + std::to_string(lo) +
                     " to " + std::to_string(hi) + ", not '" + text + "'"};
  return static_cast<int>(v);
}

int Choice(const std::string& option, const std::string& text,
           std::initializer_list<const char*> names) {
  int i = 0;
  for (const char* name : names) {
    if (text == name) return i;
    ++i;
  }
  throw UsageError{"option " + option + " does not know '" + text + "'"};
}

void Size(const std::string& text, int& w, int& h) {
  const std::size_t x = text.find('x');
  if (x == std::string::npos) throw UsageError{"option --size expects WxH, not '" + text + "'"};
  w = Integer("--size", text.substr(0, x), 1, 16384);
  h = Integer("--size", text.substr(x + 1), 1, 16384);
}

bool Write(const std::string& file, const ZvRaster<unsigned char>& raster) {
  std::string error;
  if (!ZvWritePng(file, raster, error)) {
    std::cerr << "zv: " << error << "\n";
    return false;
  }
  std::cout << "zv: wrote " << file << " (" << raster.GetWidth() << "x" << raster.GetHeight()
            << ")\n";
  return true;
}

int Demo(Args& args) {
  std::string output = "zv-demo.png";
  while (args.More()) {
    const std::string a = args.Next();
    if (a == "-o" || a == "--output")
      output = args.Value(a);
    else
      throw UsageError{"demo does not take '" + a + "'"};
  }
  return Write(output, ZvRenderDemo()) ? 0 : 1;
}

int Render(Args& args) {
  ZvRenderOptions o;
  std::string input, output;
  int width = 256, height = 256;
  bool invert = false;
  double offset = 0.0;
  while (args.More()) {
    const std::string a = args.Next();
    if (a == "-o" || a == "--output") {
      output = args.Value(a);
    } else if (a == "--size") {
      Size(args.Value(a), width, height);
    } else if (a == "--scale") {
      o.scale = Number(a, args.Value(a));
    } else if (a == "--translate") {
      const std::string v = args.Value(a);
      const std::size_t comma = v.find(',');
      if (comma == std::string::npos)
        throw UsageError{"option --translate expects X,Y, not '" + v + "'"};
      o.translateX = Number(a, v.substr(0, comma));
      o.translateY = Number(a, v.substr(comma + 1));
    } else if (a == "--no-fill") {
      o.fill = false;
    } else if (a == "--fill-rule") {
      o.fillRule = Choice(a, args.Value(a), {"evenodd", "nonzero"});
    } else if (a == "--rate") {
      o.rate = Integer(a, args.Value(a), 4, 8);
      if (o.rate != 4 && o.rate != 8) throw UsageError{"option --rate expects 4 or 8"};
    } else if (a == "--feather") {
      o.feather = Integer(a, args.Value(a), 0, 8);
    } else if (a == "--opacity") {
      o.opacity = Number(a, args.Value(a));
    } else if (a == "--soft") {
      o.soft = Number(a, args.Value(a));
      if (o.soft < 0 || o.soft > 256) throw UsageError{"option --soft expects 0 to 256 pixels"};
    } else if (a == "--stroke") {
      o.strokeWidth = Number(a, args.Value(a));
    } else if (a == "--join") {
      o.join = Choice(a, args.Value(a), {"bevel", "miter", "round"});
    } else if (a == "--cap") {
      o.cap = Choice(a, args.Value(a), {"round", "square", "flat"});
    } else if (a == "--miter-limit") {
      o.miterLimit = Number(a, args.Value(a));
    } else if (a == "--taper") {
      o.taper = true;
    } else if (a == "--tolerance") {
      o.tolerance = Number(a, args.Value(a));
      if (o.tolerance < 0.001) throw UsageError{"option --tolerance expects at least 0.001"};
    } else if (a == "--invert") {
      invert = true;
    } else if (a == "--offset") {
      offset = Number(a, args.Value(a));
    } else if (a.size() > 1 && a[0] == '-') {
      throw UsageError{"unknown option '" + a + "'"};
    } else if (input.empty()) {
      input = a;
    } else {
      throw UsageError{"only one input file, not also '" + a + "'"};
    }
  }
  if (output.empty()) throw UsageError{"render needs an output file (-o FILE)"};

  std::string data;
  if (input.empty() || input == "-") {
    data.assign(std::istreambuf_iterator<char>(std::cin), std::istreambuf_iterator<char>());
  } else {
    std::ifstream in(input, std::ios::binary);
    if (!in) {
      std::cerr << "zv: cannot read '" << input << "': " << std::strerror(errno) << "\n";
      return 1;
    }
    data.assign(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
  }
  ZvPath2f path;
  std::string error;
  if (!ZvParseSvgPath(data, path, error)) {
    std::cerr << "zv: " << (input.empty() ? std::string("<stdin>") : input) << ": " << error
              << "\n";
    return 1;
  }
  ZvRaster<unsigned char> raster(width, height, 0);
  ZvRenderPath(path, o, raster);
  if (offset != 0.0) ZvRenderParallelPolylines(path, o, offset, raster);
  if (invert)
    for (int i = 0; i < raster.GetSize(); ++i)
      raster.SetVal(i, static_cast<unsigned char>(255 - raster.GetVal(i)));
  return Write(output, raster) ? 0 : 1;
}
}  // namespace

int main(int argc, char** argv) {
  const std::string command = argc > 1 ? argv[1] : "";
  Args args(argc, argv);
  try {
    if (command == "render") return Render(args);
    if (command == "demo") return Demo(args);
    if (command == "fit") return ZvFitCommand(argc, argv);
    if (command == "trace") return ZvTraceCommand(argc - 2, argv + 2);
    if (command == "curve") return ZvCurveCommand(argc, argv);
    if (command == "help" || command == "--help" || command == "-h") {
      std::cout << kUsage << kZvCurveUsage;
      return 0;
    }
    throw UsageError{command.empty() ? "no command given" : "unknown command '" + command + "'"};
  } catch (const UsageError& e) {
    std::cerr << "zv: " << e.message << " (zv help for usage)\n";
    return 2;
  } catch (const std::bad_alloc&) {
    std::cerr << "zv: out of memory\n";
    return 1;
  }
}
