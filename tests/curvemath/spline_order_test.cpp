// The greedy Catmull-Rom pass carries its left neighbours along instead of searching for them.
// Here the pass is run the plain way, scanning the keep flags for every candidate, and the two
// must keep the same samples.
#include <zv/spline.h>

#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "curvemath/spline_catmull_rom.h"

namespace {

using Context = SCatmullRomFitContext<double, ZvDoubleArray, ZvSpline1dImpl>;

struct PlainPass {
  const ZvDoubleArray& params;
  const ZvDoubleArray& values;
  Context context;
  std::vector<unsigned char> keep;

  PlainPass(const ZvDoubleArray& p, const ZvDoubleArray& v, double tolerance)
      : params(p),
        values(v),
        context{&p, &v, nullptr, tolerance * tolerance, 0, 0, 0, 0},
        keep(p.size, 1) {}

  unsigned int Left(unsigned int i) const {
    while (i > 0)
      if (keep[--i]) return i;
    return 0;
  }
  unsigned int Right(unsigned int i) const {
    const unsigned int last = params.size - 1;
    while (i < last)
      if (keep[++i]) return i;
    return last;
  }
  bool Test(unsigned int i0, unsigned int i1, unsigned int i2, unsigned int i3) {
    context.i0 = i0;
    context.i1 = i1;
    context.i2 = i2;
    context.i3 = i3;
    return CatmullRomTest(context, i1, i2) == 1;
  }

  void Open() {
    const unsigned int n = params.size, last = n - 1;
    for (unsigned int i = 1; i + 1 < n; ++i) {
      const unsigned int p1 = Left(i), p2 = Left(p1), p3 = Left(p2);
      const unsigned int q1 = Right(i), q2 = Right(q1), q3 = Right(q2);
      if (p1 != 0 && q1 != last) {
        if (Test(p3, p2, p1, q1) && Test(p2, p1, q1, q2) && Test(p1, q1, q2, q3)) keep[i] = 0;
      } else if (p1 != 0) {
        if (Test(p3, p2, p1, last) && Test(p2, p1, last, last)) keep[i] = 0;
      } else if (q1 != last) {
        if (Test(0, 0, q1, q2) && Test(0, q1, q2, q3)) keep[i] = 0;
      } else {
        const double r = (params[1] - params[0]) / (params[2] - params[1]);
        const double d = (values[2] - values[0]) * r + values[0] - values[1];
        if (d * d <= context.tolerance2) keep[1] = 0;
      }
    }
  }

  void Closed() {
    const unsigned int n = params.size;
    for (unsigned int i = 2; i < n - 2; ++i) {
      const unsigned int p1 = Left(i), p2 = Left(p1), p3 = Left(p2);
      const unsigned int q1 = Right(i), q2 = Right(q1), q3 = Right(q2);
      if (p1 >= 2 && !Test(p3, p2, p1, q1)) continue;
      if (!Test(p2, p1, q1, q2)) continue;
      if (q1 >= n - 2 || Test(p1, q1, q2, q3)) keep[i] = 0;
    }
  }

  std::vector<double> Kept() const {
    std::vector<double> kept;
    for (unsigned int k = 0; k < params.size; ++k)
      if (keep[k]) kept.push_back(params[k]);
    return kept;
  }
};

std::vector<double> Keys(const ZvSpline1d& spline) {
  const ZvDoubleArray& K = spline.GetKeyParameters();
  return std::vector<double>(K.data, K.data + K.size);
}

// A random walk with steps of varied size, so that runs of removals of every length occur.
void RandomWalk(unsigned int n, unsigned int seed, bool closed, ZvDoubleArray& params,
                ZvDoubleArray& values) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<double> step(0.2, 1.0), slope(-1, 1), kick(-1, 1);
  double t = 0, v = 0, dv = 0;
  for (unsigned int k = 0; k < n; ++k) {
    params.Add(t);
    values.Add(v);
    t += step(rng);
    if (k % 17 == 0) dv = slope(rng);
    v += dv * 0.1 + 0.01 * kick(rng);
  }
  if (closed) values[n - 1] = values[0];
}

TEST(SplineCatmullRomOrder, OpenPassMatchesThePlainSearch) {
  for (unsigned int seed = 1; seed <= 20; ++seed) {
    for (double tolerance : {0.0, 0.003, 0.02, 0.1, 1.0}) {
      ZvDoubleArray params(1), values(1);
      RandomWalk(3 + seed * 7, seed, false, params, values);
      PlainPass plain(params, values, tolerance);
      plain.Open();
      ZvSpline1d spline;
      ASSERT_EQ(spline.OpenFit(params, values, tolerance, ZvSpline::CatmullRom), 1);
      EXPECT_EQ(Keys(spline), plain.Kept()) << "seed " << seed << " tolerance " << tolerance;
    }
  }
}

// The seam repair may drop the keys at samples 1 and n-2 afterwards; everything else is the
// greedy pass.
TEST(SplineCatmullRomOrder, ClosedPassMatchesThePlainSearch) {
  int seamDrops = 0;
  for (unsigned int seed = 1; seed <= 20; ++seed) {
    for (double tolerance : {0.0, 0.003, 0.02, 0.1, 1.0}) {
      ZvDoubleArray params(1), values(1);
      RandomWalk(5 + seed * 7, seed, true, params, values);
      PlainPass plain(params, values, tolerance);
      plain.Closed();
      std::vector<double> expected = plain.Kept();
      ZvSpline1d spline;
      ASSERT_EQ(spline.ClosedFit(params, values, tolerance, ZvSpline::CatmullRom), 1);
      std::vector<double> keys = Keys(spline);
      if (expected.size() >= 5) {
        const double second = params[1], secondToLast = params[params.size - 2];
        if (keys[1] != second) {
          keys.insert(keys.begin() + 1, second);
          ++seamDrops;
        }
        if (keys[keys.size() - 2] != secondToLast) {
          keys.insert(keys.end() - 1, secondToLast);
          ++seamDrops;
        }
      }
      EXPECT_EQ(keys, expected) << "seed " << seed << " tolerance " << tolerance;
    }
  }
  EXPECT_GT(seamDrops, 0);
}

}  // namespace
