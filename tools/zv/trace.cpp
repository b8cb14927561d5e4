// `zv trace [options] PNG`: the command line around ZvTraceToSvg.
#include "trace.h"

#include "png_read.h"

#include <cerrno>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iostream>

namespace {
struct BadArgument {
  std::string message;
};

// A number within lo..hi; `range` says so in the error message.
double Number(const std::string& option, const char* text, double lo, double hi,
              const char* range) {
  char* end = nullptr;
  errno = 0;
  const double v = std::strtod(text, &end);
  if (!*text || *end || errno || !std::isfinite(v) || v < lo || v > hi)
    throw BadArgument{"option " + option + " expects " + range + ", not '" + text + "'"};
  return v;
}
}  // namespace

int ZvTraceCommand(int argc, char** argv) {
  ZvTraceOptions options;
  std::string input, output;
  try {
    for (int i = 0; i < argc; ++i) {
      const std::string a = argv[i];
      auto value = [&]() -> const char* {
        if (i + 1 >= argc) throw BadArgument{"option " + a + " needs a value"};
        return argv[++i];
      };
      if (a == "-o" || a == "--output") {
        output = value();
      } else if (a == "--threshold") {
        const char* text = value();
        const double t = Number(a, text, 0, 256, "a whole number from 0 to 256");
        if (t != std::floor(t))
          throw BadArgument{"option --threshold expects a whole number from 0 to 256, not '" +
                            std::string(text) + "'"};
        options.threshold = static_cast<int>(t);
      } else if (a == "--invert") {
        options.invert = true;
      } else if (a == "--fit") {
        options.fit = Number(a, value(), 0.01, 1000, "a tolerance from 0.01 to 1000 pixels");
      } else if (a == "--min-area") {
        options.minArea = Number(a, value(), 0, 1e12, "an area of 0 or more square pixels");
      } else if (a.size() > 1 && a[0] == '-') {
        throw BadArgument{"unknown option '" + a + "'"};
      } else if (input.empty()) {
        input = a;
      } else {
        throw BadArgument{"only one input file, not also '" + a + "'"};
      }
    }
    if (input.empty()) throw BadArgument{"trace needs a PNG file"};
  } catch (const BadArgument& e) {
    std::cerr << "zv: " << e.message << " (zv help for usage)\n";
    return 2;
  }

  ZvRaster<unsigned char> grey(1, 1, 0);
  std::string error;
  if (!ZvReadPng(input, grey, error)) {
    std::cerr << "zv: " << error << "\n";
    return 1;
  }
  unsigned int contours = 0;
  const std::string svg = ZvTraceToSvg(grey, options, contours);
  if (output.empty() || output == "-") {
    std::cout << svg;
    return std::cout.good() ? 0 : 1;
  }
  std::ofstream out(output, std::ios::binary);
  out << svg;
  out.close();
  if (!out) {
    std::cerr << "zv: cannot write '" << output << "'\n";
    std::remove(output.c_str());
    return 1;
  }
  std::cout << "zv: wrote " << output << " (" << contours << " contours from " << grey.GetWidth()
            << "x" << grey.GetHeight() << ")\n";
  return 0;
}
