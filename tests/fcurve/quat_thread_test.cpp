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
  const ZvQuatFCurve reference(shared);
  std::atomic<int> mismatches{0};
  std::vector<std::thread> threads;
  for (int r = 0; r < 4; ++r) {
    threads.emplace_back([&, r]() {
      for (int i = 0; i < 5000; ++i) {
        const double t = -0.5 + (i % 500) * 0.01 * (r + 1);
        const double v = shared.Eval(t, 0);
        // A private copy per call: its cache belongs to this thread alone.
        const ZvQuatFCurve own(reference);
        if (!(std::fabs(v - own.Eval(t, 0)) <= 1e-12)) ++mismatches;
      }
    });
  }
  for (std::thread& t : threads)
    t.join();
  EXPECT_EQ(mismatches.load(), 0);
}

}  // namespace
