// Sample curves and per-dimension helpers for the spline tests.
#ifndef ZV_TESTS_CURVEMATH_SPLINE_SAMPLES_H
#define ZV_TESTS_CURVEMATH_SPLINE_SAMPLES_H

#include <zv/spline.h>

#include <cmath>
#include <random>

#include "curvemath/spline_pieces.h"

template <class S>
struct SplineDim;

template <>
struct SplineDim<ZvSpline1d> {
  using Value = double;
  using Array = ZvDoubleArray;
  static Value Make(double x, double, double) { return x; }
};

template <>
struct SplineDim<ZvSpline2d> {
  using Value = ZvPoint2<double>;
  using Array = ZvPoint2dArray;
  static Value Make(double x, double y, double) { return {x, y}; }
};

template <>
struct SplineDim<ZvSpline3d> {
  using Value = ZvPoint3<double>;
  using Array = ZvPoint3dArray;
  static Value Make(double x, double y, double z) { return {x, y, z}; }
};

template <class S>
struct SplineSamples {
  ZvDoubleArray params{1};
  typename SplineDim<S>::Array values{1};
};

// A smooth curve on unevenly spaced parameters, each component disturbed by uniform noise of
// the given amplitude. A closed one makes one turn and repeats its first sample exactly.
template <class S>
SplineSamples<S> MakeSamples(unsigned int n, double noise, unsigned int seed, bool closed) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<double> e(-noise, noise);
  SplineSamples<S> s;
  const double step = closed ? 2 * M_PI / (n - 1) : 0.01;
  for (unsigned int k = 0; k < n; ++k) {
    const double t = k * step + (k && k + 1 < n ? 0.4 * step * std::sin(1.7 * k) : 0.0);
    s.params.Add(t);
    if (closed && k + 1 == n) {
      s.values.Add(s.values[0]);
    } else if (closed) {
      s.values.Add(SplineDim<S>::Make(std::cos(t) + 0.2 * std::cos(3 * t) + e(rng),
                                      std::sin(t) + e(rng), 0.3 * std::sin(2 * t) + e(rng)));
    } else {
      s.values.Add(SplineDim<S>::Make(std::sin(t) + 0.3 * std::sin(2.7 * t + 1) + e(rng),
                                      0.8 * std::cos(0.7 * t) + e(rng),
                                      0.5 * std::sin(1.3 * t + 2) + e(rng)));
    }
  }
  return s;
}

template <class A>
bool SameValues(const A& a, const A& b) {
  if (a.size != b.size) return false;
  for (unsigned int i = 0; i < a.size; ++i)
    if (zvSplineNorm2(a[i] - b[i]) != 0) return false;
  return true;
}

template <class S>
bool SameSpline(const S& a, const S& b) {
  return a.GetKind() == b.GetKind() && a.IsClosed() == b.IsClosed() &&
         SameValues(a.GetKeyParameters(), b.GetKeyParameters()) &&
         SameValues(a.GetKeyValues(), b.GetKeyValues()) &&
         SameValues(a.GetLeftDerivatives(), b.GetLeftDerivatives()) &&
         SameValues(a.GetRightDerivatives(), b.GetRightDerivatives());
}

#endif
