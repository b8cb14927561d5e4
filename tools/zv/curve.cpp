#include "curve.h"

#include "curve_keys.h"
#include "png_write.h"
#include "render.h"

#include <zv/std_fcurve.h>

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
#include <string>
#include <vector>

const char kZvCurveUsage[] =
    "usage: zv curve [options] [KEYS]   sample, plot or save a function curve (keys from KEYS or\n"
    "                                   standard input)\n"
    "curve options (at least one of --csv, --plot, --save):\n"
    "  --block FILE             read a saved curve block of any kind instead of keys\n"
    "  --csv FILE               write samples as 'parameter,value' lines\n"
    "  --plot FILE              PNG plot of the curve, keys marked\n"
    "  --save FILE              write the curve's block\n"
    "  --range A,B              sample from A to B (default: first to last key)\n"
    "  --samples N              samples in the CSV, 2..1000000 (default 101)\n"
    "  --size WxH               plot size in pixels (default 512x256)\n"
    "curve keys: one a line, 'PARAMETER VALUE [KIND]', fields apart by spaces or commas, KIND\n"
    "  the segment leaving the key: constant, linear or cubic (the default, with tangents that\n"
    "  follow the neighbours); '#' starts a comment. For example:\n"
    "    0 0\n"
    "    1 2.5 linear\n"
    "    3 1 constant\n";

namespace {

struct CurveError {
  int status;
  std::string message;
};

CurveError Usage(const std::string& message) {
  return CurveError{2, message + " (zv help for usage)"};
}

double Number(const std::string& option, const std::string& text) {
  char* end = nullptr;
  errno = 0;
  const double v = std::strtod(text.c_str(), &end);
  if (text.empty() || *end || errno || !std::isfinite(v))
    throw Usage("option " + option + " expects a number, not '" + text + "'");
  return v;
}

void Pair(const std::string& option, const std::string& text, char separator, double& a,
          double& b) {
  const std::size_t at = text.find(separator);
  if (at == std::string::npos)
    throw Usage("option " + option + " expects two numbers separated by '" +
                std::string(1, separator) + "', not '" + text + "'");
  a = Number(option, text.substr(0, at));
  b = Number(option, text.substr(at + 1));
}

std::string ReadFile(const std::string& file) {
  if (file == "-")
    return std::string(std::istreambuf_iterator<char>(std::cin), std::istreambuf_iterator<char>());
  std::ifstream in(file, std::ios::binary);
  if (!in) throw CurveError{1, "cannot read '" + file + "': " + std::strerror(errno)};
  return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

void WriteFile(const std::string& file, const void* data, std::size_t size) {
  std::ofstream out(file, std::ios::binary);
  out.write(static_cast<const char*>(data), static_cast<std::streamsize>(size));
  if (!out.flush()) throw CurveError{1, "cannot write '" + file + "'"};
}

std::unique_ptr<ZvBaseFCurve> CurveFromBlock(const std::string& file) {
  const std::string bytes = ReadFile(file);
  unsigned int consumed = 0;
  std::unique_ptr<ZvBaseFCurve> curve(
      ZvBaseFCurve_CreateFromBuffer(bytes.data(), bytes.size(), consumed));
  if (!curve) throw CurveError{1, file + ": not a curve block that zv can read"};
  if (consumed != bytes.size())
    throw CurveError{
        1, file + ": " + std::to_string(bytes.size() - consumed) + " bytes follow the curve block"};
  return curve;
}

std::unique_ptr<ZvBaseFCurve> CurveFromKeys(const std::string& file) {
  const std::string name = file == "-" ? "<stdin>" : file;
  std::vector<ZvCurveKeyLine> keys;
  std::string error;
  std::unique_ptr<ZvStdFCurve> curve(new ZvStdFCurve);
  if (!ZvParseCurveKeys(ReadFile(file), keys, error) ||
      !ZvBuildCurveFromKeys(keys, *curve, error)) {
    throw CurveError{1, name + ": " + error};
  }
  return std::unique_ptr<ZvBaseFCurve>(curve.release());
}

// The keyed range, widened around a single key; [0, 1] without keys.
void DefaultRange(const ZvBaseFCurve& curve, double& start, double& end) {
  start = 0.0;
  end = 1.0;
  if (!curve.GetSmallestKeyParameter(start) || !curve.GetLargestKeyParameter(end)) return;
  if (end - start < 1e-9) {
    start -= 1.0;
    end += 1.0;
  }
}

void WriteCsv(const ZvBaseFCurve& curve, double start, double end, int samples,
              const std::string& file) {
  std::string text = "parameter,value\n";
  char line[64];
  for (int i = 0; i < samples; ++i) {
    const double t = i + 1 == samples ? end : start + (end - start) * i / (samples - 1);
    std::snprintf(line, sizeof line, "%.17g,%.17g\n", t, curve.Eval(t, 1));
    text += line;
  }
  WriteFile(file, text.data(), text.size());
  std::cout << "zv: wrote " << file << " (" << samples << " samples)\n";
}

// The curve as a 1.5-pixel line through two samples a pixel, each key a 5-pixel square, inside a
// frame; dark on white.
void Plot(const ZvBaseFCurve& curve, double start, double end, int width, int height,
          const std::string& file) {
  const int columns = 2 * width;
  std::vector<ZvPoint2<double>> samples;
  for (int i = 0; i <= columns; ++i) {
    const double t = start + (end - start) * i / columns;
    samples.push_back({t, curve.Eval(t, 1)});
  }
  ZvDoubleArray keys(1), left(1), right(1);
  curve.GetKeys(keys, left, right, 1);
  double low = samples[0].y, high = low;
  for (const ZvPoint2<double>& s : samples) {
    low = std::min(low, s.y);
    high = std::max(high, s.y);
  }
  for (unsigned int i = 0; i < keys.size; ++i) {
    if (keys[i] < start || keys[i] > end) continue;
    low = std::min({low, left[i], right[i]});
    high = std::max({high, left[i], right[i]});
  }
  if (high - low < 1e-12) {
    low -= 1.0;
    high += 1.0;
  }
  const double margin = 12.0, pad = 0.06 * (high - low);
  low -= pad;
  high += pad;
  const auto at = [&](double t, double v) {
    return ZvPoint2<float>{
        static_cast<float>(margin + (t - start) / (end - start) * (width - 2 * margin)),
        static_cast<float>(height - margin - (v - low) / (high - low) * (height - 2 * margin))};
  };
  ZvPath2f line, marks, frame;
  line.Moveto(at(samples[0].x, samples[0].y));
  for (std::size_t i = 1; i < samples.size(); ++i)
    line.Lineto(at(samples[i].x, samples[i].y));
  for (unsigned int i = 0; i < keys.size; ++i) {
    if (keys[i] < start || keys[i] > end) continue;
    for (const double v : {left[i], right[i]}) {
      const ZvPoint2<float> c = at(keys[i], v);
      marks.Moveto({c.x - 2.5f, c.y - 2.5f});
      marks.Lineto({c.x + 2.5f, c.y - 2.5f});
      marks.Lineto({c.x + 2.5f, c.y + 2.5f});
      marks.Lineto({c.x - 2.5f, c.y + 2.5f});
      marks.Closeto();
    }
  }
  const float w = static_cast<float>(width) - 4.0f, h = static_cast<float>(height) - 4.0f;
  frame.Moveto({4, 4});
  frame.Lineto({w, 4});
  frame.Lineto({w, h});
  frame.Lineto({4, h});
  frame.Closeto();

  ZvRaster<unsigned char> raster(width, height, 0);
  ZvRenderOptions stroke;
  stroke.fill = false;
  stroke.strokeWidth = 1.5;
  stroke.join = 2;
  ZvRenderPath(line, stroke, raster);
  ZvRenderOptions fill;
  ZvRenderPath(marks, fill, raster);
  ZvRenderOptions thin = stroke;
  thin.strokeWidth = 1.0;
  thin.opacity = 0.35;
  ZvRenderPath(frame, thin, raster);
  for (int i = 0; i < raster.GetSize(); ++i)
    raster.SetVal(i, static_cast<unsigned char>(255 - raster.GetVal(i)));
  std::string error;
  if (!ZvWritePng(file, raster, error)) throw CurveError{1, error};
  std::cout << "zv: wrote " << file << " (" << width << "x" << height << ")\n";
}

void Save(const ZvBaseFCurve& curve, const std::string& file) {
  std::vector<unsigned char> block(curve.GetBufferSize());
  curve.WriteToBuffer(block.data());
  WriteFile(file, block.data(), block.size());
  std::cout << "zv: wrote " << file << " (" << block.size() << " bytes)\n";
}

int Run(int argc, char** argv) {
  std::string keysFile, blockFile, csv, plot, save;
  bool ranged = false;
  double start = 0.0, end = 1.0, width = 512, height = 256;
  int samples = 101;
  for (int i = 2; i < argc; ++i) {
    const std::string a = argv[i];
    const auto value = [&]() -> std::string {
      if (i + 1 >= argc) throw Usage("option " + a + " needs a value");
      return argv[++i];
    };
    if (a == "--block") {
      blockFile = value();
    } else if (a == "--csv") {
      csv = value();
    } else if (a == "--plot") {
      plot = value();
    } else if (a == "--save") {
      save = value();
    } else if (a == "--range") {
      Pair(a, value(), ',', start, end);
      if (!(start < end)) throw Usage("option --range expects A below B");
      ranged = true;
    } else if (a == "--samples") {
      const double n = Number(a, value());
      if (n != std::floor(n) || n < 2 || n > 1e6)
        throw Usage("option --samples expects a whole number from 2 to 1000000");
      samples = static_cast<int>(n);
    } else if (a == "--size") {
      Pair(a, value(), 'x', width, height);
      if (width != std::floor(width) || height != std::floor(height) || width < 32 || height < 32 ||
          width > 8192 || height > 8192)
        throw Usage("option --size expects whole sizes from 32 to 8192");
    } else if (a.size() > 1 && a[0] == '-') {
      throw Usage("unknown option '" + a + "'");
    } else if (keysFile.empty()) {
      keysFile = a;
    } else {
      throw Usage("only one keys file, not also '" + a + "'");
    }
  }
  if (!blockFile.empty() && !keysFile.empty())
    throw Usage("give either a keys file or --block, not both");
  if (csv.empty() && plot.empty() && save.empty())
    throw Usage("curve needs an output: --csv, --plot or --save");

  const std::unique_ptr<ZvBaseFCurve> curve = blockFile.empty()
                                                  ? CurveFromKeys(keysFile.empty() ? "-" : keysFile)
                                                  : CurveFromBlock(blockFile);
  if (!ranged) DefaultRange(*curve, start, end);
  if (!csv.empty()) WriteCsv(*curve, start, end, samples, csv);
  if (!plot.empty())
    Plot(*curve, start, end, static_cast<int>(width), static_cast<int>(height), plot);
  if (!save.empty()) Save(*curve, save);
  return 0;
}

}  // namespace

int ZvCurveCommand(int argc, char** argv) {
  try {
    return Run(argc, argv);
  } catch (const CurveError& e) {
    std::cerr << "zv: " << e.message << "\n";
    return e.status;
  } catch (const std::bad_alloc&) {
    std::cerr << "zv: out of memory\n";
    return 1;
  }
}
