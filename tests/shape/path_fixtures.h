// Small paths shared by the shape tests, and the path invariant they check.
#ifndef ZV_TESTS_SHAPE_PATH_FIXTURES_H
#define ZV_TESTS_SHAPE_PATH_FIXTURES_H

#include <zv/path2f.h>

#include <vector>

inline ZvPoint2<float> P(float x, float y) {
  return ZvPoint2<float>{x, y};
}

// Whether two points lie within 1e-7 of each other on each axis, in single precision, as the
// ends of a closed subpath must.
inline bool Coincide(const ZvPoint2<float>& a, const ZvPoint2<float>& b) {
  const float dx = a.x - b.x, dy = a.y - b.y;
  return dx >= -1e-7f && dx <= 1e-7f && dy >= -1e-7f && dy <= 1e-7f;
}

// The path's own arrays, reached through a derived class: a pointer to a protected member
// named through the derived class has the base class's member type.
struct PathArrays : ZvPath2f {
  static const ZvPoint2fArray& Points(const ZvPath2f& p) { return p.*(&PathArrays::points); }
  static const ZvUByteArray& RawCodes(const ZvPath2f& p) { return p.*(&PathArrays::codes); }
  static unsigned int Open(const ZvPath2f& p) { return p.*(&PathArrays::currentSubpathOpen); }
};

// Segment codes of every point (bits 0..5), or the whole bytes with the lock bit.
inline std::vector<int> Codes(const ZvPath2f& path, int mask = 63) {
  const ZvUByteArray& codes = PathArrays::RawCodes(path);
  std::vector<int> out;
  for (unsigned int i = 0; i < codes.size; ++i)
    out.push_back(codes[i] & mask);
  return out;
}

// An open path of one line.
inline ZvPath2f Segment(float x0, float y0, float x1, float y1) {
  ZvPath2f path;
  path.Moveto(P(x0, y0));
  path.Lineto(P(x1, y1));
  return path;
}

// A closed axis-aligned rectangle, drawn from (x0, y0) through (x1, y0) and (x1, y1).
inline ZvPath2f ClosedSquare(float x0, float y0, float x1, float y1) {
  ZvPath2f path;
  path.Moveto(P(x0, y0));
  path.Lineto(P(x1, y0));
  path.Lineto(P(x1, y1));
  path.Lineto(P(x0, y1));
  path.Lineto(P(x0, y0));
  path.Closeto();
  return path;
}

// A closed cubic loop whose start is smooth, and a smooth inner node at 3.
inline ZvPath2f SmoothLoop() {
  ZvPath2f path;
  path.Moveto(P(20, 0));
  path.Curveto(P(25, -5), P(30, -5), P(35, 0));
  path.Curveto(P(40, 5), P(15, 5), P(20, 0));
  path.Closeto();
  return path;
}

// An open triangle, a closed cubic loop, and a lone start point.
inline ZvPath2f ThreeSubpaths() {
  ZvPath2f path(4);
  path.Moveto(P(0, 0));
  path.Lineto(P(10, 0));
  path.Lineto(P(10, 10));
  path.Moveto(P(20, 0));
  path.Curveto(P(25, -5), P(30, -5), P(35, 0));
  path.Curveto(P(40, 5), P(25, 15), P(20, 0));
  path.Closeto();
  path.Moveto(P(50, 50));
  return path;
}

// The invariant a path keeps through any failure: both arrays are as long as each other, and
// the codes parse from index 0: a start, then whole segments of legal codes in order, a closed
// end code only at the end of a segment.
inline bool PathInvariantHolds(const ZvPath2f& path) {
  const ZvPoint2fArray& points = PathArrays::Points(path);
  const ZvUByteArray& codes = PathArrays::RawCodes(path);
  if (points.size != codes.size || points.size > points.capacity) return false;
  if (codes.size > codes.capacity) return false;
  if (codes.size == 0) return true;
  if ((codes[0] & 63) != 1) return false;
  for (unsigned int i = 1; i < codes.size;) {
    const unsigned int c = codes[i] & 63;
    if (c == 1) {
      ++i;
      continue;
    }
    unsigned int d = 1;
    while (d <= 8 && !(c == d * (d + 1) / 2 + 2 || (d == 1 && c == 4)))
      ++d;
    if (d > 8 || i + d > codes.size) return false;
    const unsigned int base = d * (d + 1) / 2 + 2;
    for (unsigned int k = 0; k + 1 < d; ++k)
      if ((codes[i + k] & 63) != base + k) return false;
    const unsigned int end = codes[i + d - 1] & 63;
    if (end != base + d - 1 && end != base + d) return false;
    i += d;
  }
  return true;
}

#endif
