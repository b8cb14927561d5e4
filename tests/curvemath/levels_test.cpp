// The screened level count of plane pieces against the exact route through the square root and
// the division, which defines it.
#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "curvemath/cubic_steps.h"

namespace {

unsigned int Exact(double num, double l2, double factor) {
  return zvForwardDifferencingLevels(num / std::sqrt(l2), factor);
}

TEST(ForwardDifferencingLevels, ScreenedQuotientAgreesWithTheExactRoute) {
  std::mt19937_64 rng(11);
  std::uniform_real_distribution<double> mantissa(1.0, 2.0);
  std::uniform_int_distribution<int> small(-29, 40), mid(-12, 20);
  auto draw = [&](std::uniform_int_distribution<int>& e) {
    return std::ldexp(mantissa(rng), e(rng));
  };

  unsigned int mismatches = 0;
  for (int i = 0; i < 100000; ++i) {
    const double l2 = draw(small), factor = draw(mid), num = draw(small);
    mismatches += zvLevelsOfQuotient(num, l2, factor) != Exact(num, l2, factor);
  }
  EXPECT_EQ(mismatches, 0u);

  // At the bounds 4^j - 0.5 of v = num * factor / sqrt(l2): a few ulps either side (the exact
  // route decides), and just outside the screening band (the comparisons decide).
  for (int j = 0; j <= 4; ++j) {
    const double bound = std::ldexp(1.0, 2 * j) - 0.5;
    for (int trial = 0; trial < 200; ++trial) {
      const double l2 = draw(small), factor = draw(mid);
      const double num0 = bound * std::sqrt(l2) / factor;
      for (double scale : {1.0 - 6e-13, 1.0 + 6e-13, 1.0 - 1e-9, 1.0 + 1e-9}) {
        mismatches +=
            zvLevelsOfQuotient(num0 * scale, l2, factor) != Exact(num0 * scale, l2, factor);
      }
      double up = num0, down = num0;
      for (int k = 0; k < 16; ++k) {
        mismatches += zvLevelsOfQuotient(up, l2, factor) != Exact(up, l2, factor);
        mismatches += zvLevelsOfQuotient(down, l2, factor) != Exact(down, l2, factor);
        up = std::nextafter(up, 1e300);
        down = std::nextafter(down, 0.0);
      }
    }
  }
  EXPECT_EQ(mismatches, 0u);

  // Degenerate and non-finite inputs fall through to the exact route.
  for (double num : {0.0, -1.0, 1e-320, HUGE_VAL, std::nan("")}) {
    for (double factor : {0.75, 0.0, -1.0, HUGE_VAL, std::nan("")}) {
      EXPECT_EQ(zvLevelsOfQuotient(num, 2.0, factor), Exact(num, 2.0, factor))
          << num << " " << factor;
    }
  }
}

}  // namespace
