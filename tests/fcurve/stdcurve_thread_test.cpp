// One curve shared by four evaluating threads and one editing thread. The editor only adds and
// removes keys that do not change the function, so every evaluation must match a private copy
// whatever moment it lands in; the lock and the search hint must keep that true.
#include <gtest/gtest.h>

#include <zv/std_fcurve.h>

#include <atomic>
#include <cmath>
#include <thread>
#include <vector>

namespace {

TEST(StdCurveThreads, FourReadersOneWriterStayConsistent) {
  ZvStdFCurve shared;
  const double values[] = {0.0, 2.0, -1.0, 3.0, 1.0, 1.5};
  for (int i = 0; i < 6; ++i)
    shared.CreateKey(i * 1.5, values[i]);
  shared.SetExtrapolationMethod(ZvBaseFCurve::CycleWithOffsetExtrapolation);

  std::atomic<int> mismatches{0};
  std::atomic<int> badCounts{0};
  std::atomic<bool> writerDone{false};
  std::vector<std::thread> threads;
  for (int r = 0; r < 4; ++r) {
    ZvBaseFCurve* reference = shared.Clone();
    threads.emplace_back([&, r, reference]() {
      for (int i = 0; i < 20000; ++i) {
        // Sequential sweeps, each reader at its own pace and range, some beyond the keys.
        const double t = -2.0 + (i % 2000) * 0.0059 * (r + 1);
        const double v =
            r % 2 ? shared.Eval(t, 0) : static_cast<const ZvStdFCurve&>(shared).EvalLeft(t, 0);
        const double expected = r % 2 ? reference->Eval(t, 0)
                                      : static_cast<const ZvStdFCurve*>(reference)->EvalLeft(t, 0);
        if (!(std::fabs(v - expected) <= 1e-8)) ++mismatches;
        const unsigned int n = shared.GetNumKeys();
        if (n != 6 && n != 7) ++badCounts;
      }
      delete reference;
    });
  }
  threads.emplace_back([&]() {
    for (int i = 0; i < 2000; ++i) {
      const double t = 0.1 + (i * 0.61803398875 - std::floor(i * 0.61803398875)) * 7.2;
      if (std::fabs(t / 1.5 - std::round(t / 1.5)) < 1e-3) continue;  // not onto a key
      shared.CreateNonModifyingKey(t, 1);
      shared.RemoveKey(t, 1e-9);
    }
    writerDone = true;
  });
  for (std::thread& t : threads)
    t.join();
  EXPECT_TRUE(writerDone);
  EXPECT_EQ(mismatches.load(), 0);
  EXPECT_EQ(badCounts.load(), 0);
  EXPECT_EQ(shared.GetNumKeys(), 6u);
  EXPECT_EQ(shared.GetLockCount(), 0u);
}

}  // namespace
