// Compile-time check of the constant tables of ZvBezierTool against the rules they come from.
#include <zv/bezier_fit.h>

namespace {

constexpr unsigned int kRows = 9;

// Pascal's recurrence; d(d - 1) / 2; and beta = binomial times i! S(k, i), the number of maps
// of k elements onto i, which is the i-th forward difference of j^k at j = 0 and obeys
// F(k, i) = i (F(k - 1, i) + F(k - 1, i - 1)).
struct Rules {
  unsigned int blaise[kRows][kRows];
  unsigned int dd2[kRows];
  unsigned int beta[kRows][kRows][kRows];

  constexpr Rules() : blaise(), dd2(), beta() {
    for (unsigned int n = 0; n < kRows; ++n) {
      blaise[n][0] = 1;
      for (unsigned int k = 1; k <= n; ++k)
        blaise[n][k] = blaise[n - 1][k - 1] + (k < n ? blaise[n - 1][k] : 0);
      dd2[n] = n > 0 ? n * (n - 1) / 2 : 0;
    }
    unsigned int onto[kRows][kRows] = {};
    onto[0][0] = 1;
    for (unsigned int k = 1; k < kRows; ++k)
      for (unsigned int i = 1; i <= k; ++i)
        onto[k][i] = i * (onto[k - 1][i] + onto[k - 1][i - 1]);
    for (unsigned int d = 0; d < kRows; ++d)
      for (unsigned int k = 1; k <= d; ++k)
        for (unsigned int i = 1; i <= k; ++i)
          beta[d][k][i] = blaise[d][k] * onto[k][i];
  }
};

constexpr bool TablesFollowTheirRules() {
  constexpr Rules rules{};
  for (unsigned int d = 0; d < kRows; ++d) {
    if (ZvBezierTool::dd2[d] != rules.dd2[d]) return false;
    for (unsigned int k = 0; k < kRows; ++k) {
      if (ZvBezierTool::Blaise[d][k] != rules.blaise[d][k]) return false;
      for (unsigned int i = 0; i < kRows; ++i)
        if (ZvBezierTool::beta[d][k][i] != rules.beta[d][k][i]) return false;
    }
  }
  return true;
}
static_assert(TablesFollowTheirRules(), "a written table differs from its rule");

}  // namespace
