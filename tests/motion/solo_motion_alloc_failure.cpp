// Motion paths under allocation failure. A test-only global operator new throws on the k-th
// allocation after it is armed; each operation runs for k = 0, 1, 2, ... until it completes
// without the failure firing. The block reader reports a null path and a count of 0; an edit
// lets std::bad_alloc through with the path exactly as it was; evaluation lets it through with
// the path still answering the same. Every time the lock must have been released, which a
// second thread checks. Under AddressSanitizer, leak detection catches what a failure leaves.
#include <zv/motion_path.h>

#include <gtest/gtest.h>

#include <chrono>
#include <functional>
#include <future>
#include <memory>

#include "motion_fixtures.h"
#include "tests/support/failing_allocator.h"

using zv_test::ForEachFailure;

namespace {

// Another thread can take the path's lock, so no failure left it held.
bool Unlocked(const ZvMotionPath3d& path) {
  auto probe = std::async(std::launch::async, [&path] { return path.NumPoints(); });
  return probe.wait_for(std::chrono::seconds(10)) == std::future_status::ready;
}

// Runs `edit` on copies of `start` with the k-th allocation failing, for every k until it
// succeeds; a failed run must let the failure through with the copy's block as it was.
void EveryFailure(const ZvMotionPath3d& start, const std::function<void(ZvMotionPath3d&)>& edit) {
  const Bytes before = Block(start);
  std::unique_ptr<ZvMotionPath3d> path;
  ForEachFailure([&] { path.reset(new ZvMotionPath3d(start)); }, [&] { edit(*path); },
                 [&](bool threw) {
                   ASSERT_TRUE(threw);
                   ASSERT_TRUE(Unlocked(*path));
                   ASSERT_EQ(Block(*path), before);
                 });
  ASSERT_TRUE(Unlocked(*path));
}

}  // namespace

TEST(MotionAllocFailure, EditsLeaveThePathAsItWas) {
  const ZvMotionPath3d wave = Wave();
  EveryFailure(wave, [](ZvMotionPath3d& p) { p.Curveto({1, 2, 3}, {4, 5, 6}, {7, 8, 9}, 9.0); });
  EveryFailure(wave, [](ZvMotionPath3d& p) { p.Lineto({1, 2, 3}, 9.0); });
  EveryFailure(wave, [](ZvMotionPath3d& p) {
    p.PreCurveto({1, 2, 3}, {4, 5, 6}, {7, 8, 9}, -1.0);
  });
  EveryFailure(wave, [](ZvMotionPath3d& p) { p.PreLineto({1, 2, 3}, -1.0); });
  EveryFailure(wave, [](ZvMotionPath3d& p) {
    unsigned int index;
    int existing;
    p.InsertNode(1.5, 0.01, 0.01, index, existing);
  });
  EveryFailure(wave, [](ZvMotionPath3d& p) { p.ScaleAndOffsetInitialTimes(2.0, 1.0); });
  EveryFailure(wave, [](ZvMotionPath3d& p) { p.SmoothSegment(3); });
}

TEST(MotionAllocFailure, EvaluationAndReadingRecover) {
  const ZvMotionPath3d wave = Wave();
  P3 want;
  wave.Eval(1.7, 0.01, want);
  std::unique_ptr<ZvMotionPath3d> path;
  P3 got{};
  ForEachFailure([&] { path.reset(new ZvMotionPath3d(wave)); }, [&] { path->Eval(1.7, 0.01, got); },
                 [&](bool) {
                   ASSERT_TRUE(Unlocked(*path));
                   path->Eval(1.7, 0.01, got);
                   ASSERT_EQ(got.x, want.x);
                   ASSERT_EQ(got.z, want.z);
                 });

  const Bytes block = Block(wave);
  unsigned int consumed = 99;
  ZvMotionPath3d* read = nullptr;
  ForEachFailure(
      [&] {
        read = ZvMotionPath3d_CreateFromBufferBody(
            block.data() + 4, static_cast<unsigned int>(block.size() - 4), consumed);
      },
      [&](bool threw) {
        EXPECT_FALSE(threw);
        EXPECT_EQ(read, nullptr);
        EXPECT_EQ(consumed, 0u);
      });
  ASSERT_NE(read, nullptr);
  EXPECT_EQ(Block(*read), block);
  delete read;
}
