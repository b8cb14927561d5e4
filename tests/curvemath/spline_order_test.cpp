// The greedy Catmull-Rom pass carries its left neighbours along instead of searching for them.
// Here the pass is run the plain way, scanning the keep flags around every candidate in order,
// and both must keep the same samples.
#include <zv/spline.h>

#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "curvemath/spline_catmull_rom.h"

namespace {

struct PlainPass {
  const ZvDoubleArray &t, &v;
  SCatmullRomFitContext<double, ZvDoubleArray, ZvSpline1dImpl> context;
  std::vector<unsigned char> keep;
  unsigned int n;

  PlainPass(const ZvDoubleArray& params, const ZvDoubleArray& values, double tol, bool closed)
      : t(params),
        v(values),
        context{&t, &v, nullptr, tol * tol, 0, 0, 0, 0},
        keep(t.size, 1),
        n(t.size) {
    closed ? Closed() : Open();
  }
  // Nearest kept sample left or right of i; running off gives the end index.
  unsigned int L(unsigned int i) const {
    while (i > 0)
      if (keep[--i]) return i;
    return 0;
  }
  unsigned int R(unsigned int i) const {
    while (i < n - 1)
      if (keep[++i]) return i;
    return n - 1;
  }
  bool Test(unsigned int i0, unsigned int i1, unsigned int i2, unsigned int i3) {
    context.i0 = i0, context.i1 = i1, context.i2 = i2, context.i3 = i3;
    return CatmullRomTest(context, i1, i2) == 1;
  }
  void Open() {
    for (unsigned int i = 1; i + 1 < n; ++i) {
      const unsigned int p1 = L(i), p2 = L(p1), p3 = L(p2), q1 = R(i), q2 = R(q1), q3 = R(q2);
      if (p1 != 0 && q1 != n - 1) {
        keep[i] = !(Test(p3, p2, p1, q1) && Test(p2, p1, q1, q2) && Test(p1, q1, q2, q3));
      } else if (p1 != 0) {
        keep[i] = !(Test(p3, p2, p1, n - 1) && Test(p2, p1, n - 1, n - 1));
      } else if (q1 != n - 1) {
        keep[i] = !(Test(0, 0, q1, q2) && Test(0, q1, q2, q3));
      } else {
        const double d = (v[2] - v[0]) * ((t[1] - t[0]) / (t[2] - t[1])) + v[0] - v[1];
        if (d * d <= context.tolerance2) keep[1] = 0;
      }
    }
  }
  void Closed() {
    for (unsigned int i = 2; i < n - 2; ++i) {
      const unsigned int p1 = L(i), p2 = L(p1), p3 = L(p2), q1 = R(i), q2 = R(q1), q3 = R(q2);
      if (p1 >= 2 && !Test(p3, p2, p1, q1)) continue;
      if (Test(p2, p1, q1, q2) && (q1 >= n - 2 || Test(p1, q1, q2, q3))) keep[i] = 0;
    }
  }
  std::vector<double> Kept() const {
    std::vector<double> kept;
    for (unsigned int k = 0; k < n; ++k)
      if (keep[k]) kept.push_back(t[k]);
    return kept;
  }
};

// A random walk with steps of varied size, so that runs of removals of every length occur.
void RandomWalk(unsigned int n, unsigned int seed, ZvDoubleArray& params, ZvDoubleArray& values) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<double> step(0.2, 1.0), unit(-1, 1);
  double t = 0, v = 0, dv = 0;
  for (unsigned int k = 0; k < n; ++k) {
    params.Add(t);
    values.Add(v);
    t += step(rng);
    if (k % 17 == 0) dv = unit(rng);
    v += dv * 0.1 + 0.01 * unit(rng);
  }
}

// For a closed curve the seam repair may then drop the keys at samples 1 and n-2.
TEST(SplineCatmullRomOrder, FitKeepsWhatThePlainSearchKeeps) {
  int seamDrops = 0;
  for (bool closed : {false, true}) {
    for (unsigned int seed = 1; seed <= 20; ++seed) {
      for (double tolerance : {0.0, 0.003, 0.02, 0.1, 1.0}) {
        ZvDoubleArray params(1), values(1);
        RandomWalk(5 + seed * 7, seed, params, values);
        if (closed) values[values.size - 1] = values[0];
        const std::vector<double> expected = PlainPass(params, values, tolerance, closed).Kept();
        ZvSpline1d spline;
        ASSERT_EQ(closed ? spline.ClosedFit(params, values, tolerance, ZvSpline::CatmullRom)
                         : spline.OpenFit(params, values, tolerance, ZvSpline::CatmullRom),
                  1);
        const ZvDoubleArray& K = spline.GetKeyParameters();
        std::vector<double> keys(K.data, K.data + K.size);
        if (closed && expected.size() >= 5) {
          for (unsigned int seam : {1u, params.size - 2}) {
            const auto at = seam == 1 ? keys.begin() + 1 : keys.end() - 1;
            if (*(seam == 1 ? at : at - 1) != params[seam]) {
              keys.insert(at, params[seam]);
              ++seamDrops;
            }
          }
        }
        EXPECT_EQ(keys, expected) << "closed " << closed << " seed " << seed << " tol "
                                  << tolerance;
      }
    }
  }
  EXPECT_GT(seamDrops, 0);
}

}  // namespace
