// Thresholding, tracing and the SVG text of `zv trace`.
#include "trace.h"

#include <zv/gc.h>
#include <zv/path2f.h>
#include <zv/vectorizer.h>

#include <cstdio>

namespace {
// Up to three decimals without trailing zeros: exact traces are integers, fitted ones are not.
void Number(std::string& out, float v) {
  char buffer[32];
  std::snprintf(buffer, sizeof buffer, "%.3f", static_cast<double>(v));
  std::string s = buffer;
  while (s.back() == '0')
    s.pop_back();
  if (s.back() == '.') s.pop_back();
  if (s == "-0") s = "0";
  out += s;
}

void Point(std::string& out, const ZvPoint2<float>& p) {
  Number(out, p.x);
  out += ' ';
  Number(out, p.y);
}

std::string PathData(const ZvPath2f& path) {
  std::string d;
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  while (it.GetNextSubPathIndices(first, last)) {
    d += d.empty() ? "M" : "\nM";
    Point(d, path.GetPoint(first));
    for (unsigned int i = first + 1; i <= last;) {
      const unsigned int degree = path.GetDegree(i);
      d += degree == 3 ? " C" : degree == 2 ? " Q" : " L";
      // The tracer makes lines and cubics only; other degrees would be written as polylines.
      const unsigned int n = degree == 2 || degree == 3 ? degree : 1;
      for (unsigned int k = 0; k < n; ++k) {
        if (k) d += ' ';
        Point(d, path.GetPoint(i + k));
      }
      i += n;
    }
    if (path.IsSubpathClosed(first)) d += " Z";
  }
  return d;
}
}  // namespace

std::string ZvTraceToSvg(const ZvRaster<unsigned char>& grey, const ZvTraceOptions& options,
                         unsigned int& contours) {
  const int w = grey.GetWidth(), h = grey.GetHeight();
  ZvRaster<unsigned char> mask(w, h, 0);
  for (int i = 0; i < grey.GetSize(); ++i) {
    const bool dark = grey.GetVal(i) < options.threshold;
    mask.SetVal(i, dark != options.invert ? 1 : 0);
  }
  ZvVectorizer vectorizer(0.0, options.minArea);
  ZvPath2f path;
  if (options.fit > 0.0) {
    ZvGC gc;
    gc.flattenTolerance = options.fit;
    vectorizer.VectorizeAndFit(mask, 1, mask.GetExtent2f(), gc, path);
  } else {
    vectorizer.Vectorize(mask, 1, mask.GetExtent2f(), path);
  }
  contours = path.NumSubpaths();
  const std::string size = std::to_string(w) + "\" height=\"" + std::to_string(h);
  return "<svg xmlns=\"http://www.w3.org/2000/svg\" width=\"" + size + "\" viewBox=\"0 0 " +
         std::to_string(w) + " " + std::to_string(h) +
         "\">\n<path fill=\"black\" fill-rule=\"evenodd\" d=\"" + PathData(path) + "\"/>\n</svg>\n";
}
