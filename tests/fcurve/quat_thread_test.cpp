// One rotation view evaluated by several threads. Eval writes the rotation curve's cache and
// builds its spline on first use, so only the view's lock keeps each thread's answer its own.
#include <gtest/gtest.h>

#include <zv/quat_fcurve.h>

#include <atomic>
#include <cmath>
#include <thread>
#include <vector>

namespace {

TEST(QuatViewThreads, ConcurrentEvaluationsMatchAPrivateCopy) {
  ZvQuatFCurve shared(1);
  for (int i = 0; i < 8; ++i)
    shared.GetQuatCurve()->SetKey(i * 0.5, ZvPoint3<double>{0.3 * i, std::sin(i) * 0.8, -0.2 * i},
                                  0.0);
  // Each thread sweeps its own times; the answers come from a private copy beforehand.
  std::vector<std::vector<double>> expected(4);
  {
    const ZvQuatFCurve own(shared);
    for (int r = 0; r < 4; ++r)
      for (int i = 0; i < 500; ++i)
        expected[r].push_back(own.Eval(-0.5 + i * 0.01 * (r + 1), 0));
  }
  std::atomic<int> mismatches{0};
  std::vector<std::thread> threads;
  for (int r = 0; r < 4; ++r) {
    threads.emplace_back([&, r]() {
      for (int i = 0; i < 20000; ++i) {
        const double t = -0.5 + (i % 500) * 0.01 * (r + 1);
        if (!(std::fabs(shared.Eval(t, 0) - expected[r][i % 500]) <= 1e-12)) ++mismatches;
      }
    });
  }
  for (std::thread& t : threads)
    t.join();
  EXPECT_EQ(mismatches.load(), 0);
}

}  // namespace
