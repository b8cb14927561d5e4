// Traced polygons smoothed: each contour resampled at every pixel step and fitted with cubics.
#include "raster/vect_path.h"

#include <zv/bezier_fit.h>
#include <zv/gc.h>
#include <zv/path2f.h>

#include <cmath>
#include <utility>
#include <vector>

void ComputeTgtVector(const ZvPoint2fArray& samples, unsigned int index,
                      ZvPoint2<double>& tangent) {
  if (samples.size < 2) return;
  const unsigned int n = samples.size - 1;  // the loop without its repeated end
  const unsigned int i = index;
  auto at = [&samples](unsigned int k) { return ZvPoint2<double>{samples[k].x, samples[k].y}; };
  ZvPoint2<double> v{0.0, 0.0};
  if (i >= 4 && i + 4 <= n) {
    for (unsigned int k = 2; k <= 4; ++k)
      v += at(i + k) - at(i - k);
  } else {
    // Near the seam the differences wrap one-sidedly; at the seam itself they cancel to 0 and
    // the fallback below takes over. Fitted loops depend on this choice of tangents.
    for (unsigned int k = 2; k <= 4; ++k)
      v += at((i + k) % n) - at((n - i + k) % n);
  }
  if (std::fabs(static_cast<float>(v.x)) <= 1e-07f && std::fabs(static_cast<float>(v.y)) <= 1e-07f)
    v = (i == 0 || i >= n) ? at(1) - at(n - 1) : at(i + 1) - at(i - 1);
  tangent = v;
  if (std::fabs(v.x) <= 1e-09 && std::fabs(v.y) <= 1e-09) return;
  const double len2 = v.x * v.x + v.y * v.y;
  if (len2 <= 1e-09) return;
  const double len = std::sqrt(len2);
  tangent = {v.x / len, v.y / len};
}

void FitSamples(ZvBezierTool& tool, const ZvPoint2fArray& samples, const ZvDoubleArray& parameters,
                unsigned int first, unsigned int last, const ZvPoint2<double>& t0,
                const ZvPoint2<double>& t1, double tolerance, ZvPath2f& path) {
  // Pending ranges, the next to fit on top. Long staircases can split many times in a row, so
  // the ranges are kept on the heap rather than in nested calls.
  struct Range {
    unsigned int first, last;
    ZvPoint2<double> t0, t1;
  };
  std::vector<Range> todo{{first, last, t0, t1}};
  while (!todo.empty()) {
    const Range r = todo.back();
    todo.pop_back();
    if (r.first + 1 == r.last) {
      path.Lineto(samples[r.last]);
      continue;
    }
    if (r.first + 2 == r.last) {
      path.Curveto(samples[r.first + 1], samples[r.first + 1], samples[r.last]);
      continue;
    }
    ZvPoint2<float> control[4];
    // A fit that fails without a computed curve reports no split: halve the range then.
    unsigned int split = (r.first + r.last) / 2;
    if (tool.SingleCurveFitG1G1(samples, parameters, r.first, r.last, r.t0, r.t1, tolerance, 3,
                                control, split)) {
      path.AltCurveto(control + 1, 3);
      continue;
    }
    if (split <= r.first || split >= r.last) split = (r.first + r.last) / 2;
    ZvPoint2<double> t;
    ComputeTgtVector(samples, split, t);
    todo.push_back({split, r.last, t, r.t1});
    todo.push_back({r.first, split, r.t0, t});
  }
}

// Every integer pixel step along one traced polygon, from its truncated corners.
void VectStepSamples(const ZvPath2f& polygons, unsigned int first, unsigned int last,
                     ZvPoint2fArray& samples, ZvDoubleArray& parameters) {
  samples.Resize(0);
  parameters.Resize(0);
  auto corner = [&polygons](unsigned int i) {
    const ZvPoint2<float> p = polygons.GetPoint(i);
    return std::pair<int, int>(static_cast<int>(p.x), static_cast<int>(p.y));
  };
  std::pair<int, int> at = corner(first);
  samples.Add(at.first, at.second);
  parameters.Add(0.0);
  for (unsigned int i = first + 1; i <= last; ++i) {
    const std::pair<int, int> to = corner(i);
    while (at != to) {
      if (at.first != to.first)
        at.first += at.first < to.first ? 1 : -1;
      else
        at.second += at.second < to.second ? 1 : -1;
      parameters.Add(static_cast<double>(samples.size));
      samples.Add(at.first, at.second);
    }
  }
}

unsigned int VectFitPolygons(const ZvPath2f& polygons, const ZvGC& gc, ZvPath2f& path) {
  const unsigned int before = path.NumPoints();
  ZvBezierTool tool;
  ZvPoint2fArray samples(64);
  ZvDoubleArray parameters(64);
  ZvPath2fIter it(polygons);
  unsigned int first = 0, last = 0;
  while (it.GetNextSubPathIndices(first, last)) {
    VectStepSamples(polygons, first, last, samples, parameters);
    path.Moveto(samples[0]);
    ZvPoint2<double> t;
    ComputeTgtVector(samples, 0, t);
    FitSamples(tool, samples, parameters, 0, samples.size - 1, t, t, gc.flattenTolerance, path);
    path.Closeto();
  }
  return path.NumPoints() - before;
}
