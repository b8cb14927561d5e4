// The pen strokes of the fitting benchmarks: 200 strokes of 300 points, smooth random curves
// (curvature a sum of three random waves, the pen speed varying by half around 3 px a point)
// plus Gaussian noise of 0.3 px on x and y, from a fixed seed; and the same as lib2geom points.
#ifndef ZV_BENCH_PEN_STROKES_H
#define ZV_BENCH_PEN_STROKES_H

#include <zv/arrays.h>

#include <random>
#include <vector>

#include "bench/geom_fit.h"
#include "tests/curvemath/bezier_fit_strokes.h"

constexpr int kStrokes = 200;
constexpr unsigned int kPointsPerStroke = 300;

inline const std::vector<ZvPoint2fArray>& Strokes() {
  static const std::vector<ZvPoint2fArray> strokes = [] {
    std::mt19937 rng(20261122);
    std::vector<ZvPoint2fArray> v;
    for (int i = 0; i < kStrokes; ++i)
      v.push_back(PenStroke(rng, kPointsPerStroke, 3.0, 0.3));
    return v;
  }();
  return strokes;
}

#if ZV_HAVE_2GEOM
inline const std::vector<std::vector<Geom::Point>>& GeomStrokes() {
  static const std::vector<std::vector<Geom::Point>> strokes = [] {
    std::vector<std::vector<Geom::Point>> v;
    for (const ZvPoint2fArray& s : Strokes()) {
      std::vector<Geom::Point> g;
      for (unsigned int i = 0; i < s.size; ++i)
        g.emplace_back(s[i].x, s[i].y);
      v.push_back(g);
    }
    return v;
  }();
  return strokes;
}
#endif

#endif
