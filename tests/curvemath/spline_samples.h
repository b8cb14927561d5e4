// Sample curves and per-dimension helpers for the spline tests.
#ifndef ZV_TESTS_CURVEMATH_SPLINE_SAMPLES_H
#define ZV_TESTS_CURVEMATH_SPLINE_SAMPLES_H

#include <zv/spline.h>

#include <cmath>
#include <random>

template <class S>
struct SplineDim;

template <>
struct SplineDim<ZvSpline1d> {
  using Value = double;
  using Array = ZvDoubleArray;
  using Extent = double;
  static Value Make(double x, double, double) { return x; }
  static bool ExtentIs(double e, double x0, double x1, double, double, double, double) {
    return e == x1 - x0;
  }
};

template <>
struct SplineDim<ZvSpline2d> {
  using Value = ZvPoint2<double>;
  using Array = ZvPoint2dArray;
  using Extent = ZvExtent2<double>;
  static Value Make(double x, double y, double) { return {x, y}; }
  static bool ExtentIs(const Extent& e, double x0, double x1, double y0, double y1, double,
                       double) {
    return e.kind == Extent::Regular && e.xmin == x0 && e.xmax == x1 && e.ymin == y0 &&
           e.ymax == y1;
  }
};

template <>
struct SplineDim<ZvSpline3d> {
  using Value = ZvPoint3<double>;
  using Array = ZvPoint3dArray;
  using Extent = ZvExtent3<double>;
  static Value Make(double x, double y, double z) { return {x, y, z}; }
  static bool ExtentIs(const Extent& e, double x0, double x1, double y0, double y1, double z0,
                       double z1) {
    return e.kind == Extent::Regular && e.xmin == x0 && e.xmax == x1 && e.ymin == y0 &&
           e.ymax == y1 && e.zmin == z0 && e.zmax == z1;
  }
};

template <class S>
struct SplineSamples {
  ZvDoubleArray params{1};
  typename SplineDim<S>::Array values{1};
};

// A smooth open curve on unevenly spaced parameters, each component disturbed by uniform noise
// of the given amplitude.
template <class S>
SplineSamples<S> MakeNoisySamples(unsigned int n, double noise, unsigned int seed) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<double> e(-noise, noise);
  SplineSamples<S> s;
  for (unsigned int k = 0; k < n; ++k) {
    const double t = 0.01 * k + 0.004 * std::sin(1.7 * k);
    s.params.Add(t);
    s.values.Add(SplineDim<S>::Make(std::sin(t) + 0.3 * std::sin(2.7 * t + 1) + e(rng),
                                    0.8 * std::cos(0.7 * t) + e(rng),
                                    0.5 * std::sin(1.3 * t + 2) + e(rng)));
  }
  return s;
}

// One turn of a smooth closed curve; the last sample repeats the first exactly.
template <class S>
SplineSamples<S> MakeClosedSamples(unsigned int n, double noise, unsigned int seed) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<double> e(-noise, noise);
  SplineSamples<S> s;
  const double step = 2 * M_PI / (n - 1);
  for (unsigned int k = 0; k + 1 < n; ++k) {
    const double a = k * step + (k ? 0.3 * step * std::sin(2.3 * k) : 0.0);
    s.params.Add(a);
    const double d = k ? 1.0 : 0.0;
    s.values.Add(SplineDim<S>::Make(std::cos(a) + 0.2 * std::cos(3 * a) + d * e(rng),
                                    std::sin(a) + d * e(rng), 0.3 * std::sin(2 * a) + d * e(rng)));
  }
  s.params.Add(2 * M_PI);
  s.values.Add(s.values[0]);
  return s;
}

#endif
