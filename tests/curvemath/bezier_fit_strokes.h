// Pen-like strokes for the fit tests and benchmark (a smooth random curve walked at a varying
// speed, with Gaussian noise on every coordinate, from a fixed seed), and the plain geometry
// they check fits with.
#ifndef ZV_TESTS_CURVEMATH_BEZIER_FIT_STROKES_H
#define ZV_TESTS_CURVEMATH_BEZIER_FIT_STROKES_H

#include <zv/arrays.h>
#include <zv/point.h>

#include <cmath>
#include <random>

// `count` points about `spacing` apart on a curve whose curvature is a sum of three random
// waves (radii down to about 15 px), plus noise of standard deviation `noise` px on x and y.
inline ZvPoint2fArray PenStroke(std::mt19937& rng, unsigned int count, double spacing,
                                double noise) {
  std::uniform_real_distribution<double> u(0.0, 1.0);
  std::normal_distribution<double> gauss(0.0, noise);
  double amp[3], freq[3], phase[3];
  for (int i = 0; i < 3; ++i) {
    amp[i] = 0.025 * u(rng);
    freq[i] = 0.002 + 0.03 * u(rng);
    phase[i] = 6.283185307179586 * u(rng);
  }
  const double speedPhase = 6.283185307179586 * u(rng);
  double x = 100.0 + 400.0 * u(rng), y = 100.0 + 400.0 * u(rng);
  double heading = 6.283185307179586 * u(rng), s = 0.0;
  ZvPoint2fArray out(count);
  for (unsigned int k = 0; k < count; ++k) {
    out.Add(x + gauss(rng), y + gauss(rng));
    // The pen slows down and speeds up: spacing varies by half around its mean.
    const double step = spacing * (1.0 + 0.5 * std::sin(0.02 * k + speedPhase));
    for (int sub = 0; sub < 8; ++sub) {
      double curvature = 0.0;
      for (int i = 0; i < 3; ++i)
        curvature += amp[i] * std::sin(freq[i] * s + phase[i]);
      heading += curvature * step / 8;
      x += std::cos(heading) * step / 8;
      y += std::sin(heading) * step / 8;
      s += step / 8;
    }
  }
  return out;
}

// De Casteljau, evaluated afresh at every parameter.
inline ZvPoint2<double> EvalBezier(const ZvPoint2<double>* p, unsigned int degree, double t) {
  ZvPoint2<double> w[9];
  for (unsigned int i = 0; i <= degree; ++i)
    w[i] = p[i];
  for (unsigned int level = degree; level > 0; --level)
    for (unsigned int i = 0; i < level; ++i)
      w[i] = w[i] * (1.0 - t) + w[i + 1] * t;
  return w[0];
}

inline double DistanceToSegment(const ZvPoint2<double>& q, const ZvPoint2<double>& a,
                                const ZvPoint2<double>& b) {
  const ZvPoint2<double> ab = b - a, aq = q - a;
  const double l2 = ZvDot(ab, ab);
  double t = l2 > 0.0 ? ZvDot(aq, ab) / l2 : 0.0;
  t = t < 0.0 ? 0.0 : (t > 1.0 ? 1.0 : t);
  const ZvPoint2<double> d = a + ab * t - q;
  return std::sqrt(ZvDot(d, d));
}

#endif
