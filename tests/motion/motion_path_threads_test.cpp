// One path shared by four evaluating threads and one editing thread. Each whole-path read
// happens under one hold of the lock, so every sequence a reader gets must be exactly the
// sequence of one of the states the editor passes through: a torn edit or a cache entry left
// from an earlier state would show as a sequence that matches none of them.
#include <zv/motion_path.h>

#include <gtest/gtest.h>

#include <atomic>
#include <cstring>
#include <thread>
#include <vector>

#include "motion_fixtures.h"

namespace {

const double kTol = 0.05;

std::vector<double> Sequence(const ZvMotionPath3d& path) {
  ZvPoint3dArray out;
  path.EvalSequence(0.0, 3.0, 0.05, kTol, out);
  std::vector<double> v;
  for (unsigned int k = 0; k < out.size; ++k)
    v.insert(v.end(), {out[k].x, out[k].y, out[k].z});
  return v;
}

// The editor's cycle, applied to `path`; `visit` sees every state reached.
template <class Visit>
void EditCycle(ZvMotionPath3d& path, const ZvMotionPath3d& a, const ZvMotionPath3d& b,
               Visit visit) {
  unsigned int index;
  int existing;
  path = a;
  visit();
  path.InsertNode(1.7, 0.01, kTol, index, existing);
  visit();
  path = b;
  visit();
  path.TranslateControlPoint(4, {0.0, 0.0, 3.0}, 0);
  visit();
}

}  // namespace

TEST(MotionThreads, ReadersSeeOnlyWholeStates) {
  const ZvMotionPath3d a = Wave();
  ZvMotionPath3d b = Wave();
  b.SetRightTangentInfo(3, ZvMotionPath3d::Ease);
  b.LockG1Continuity(3);

  std::vector<std::vector<double>> states;
  ZvMotionPath3d replay;
  EditCycle(replay, a, b, [&] { states.push_back(Sequence(replay)); });
  ASSERT_EQ(states.size(), 4u);
  for (size_t k = 1; k < states.size(); ++k)
    ASSERT_NE(states[k], states[k - 1]);

  ZvMotionPath3d shared = a;
  std::atomic<bool> done{false};
  std::atomic<int> mismatches{0}, reads{0};
  std::vector<std::thread> readers;
  for (int r = 0; r < 4; ++r) {
    readers.emplace_back([&] {
      while (!done.load()) {
        const std::vector<double> seen = Sequence(shared);
        bool known = false;
        for (const auto& s : states)
          known = known || s == seen;
        if (!known) ++mismatches;
        // A copy is taken under the lock too, and is a well formed path.
        const ZvMotionPath3d copy(shared);
        if (copy.NumPoints() != 3 * (copy.NumNodes() - 1) + 1) ++mismatches;
        ++reads;
      }
    });
  }
  std::thread editor([&] {
    for (int cycle = 0; cycle < 150; ++cycle)
      EditCycle(shared, a, b, [] {});
    done = true;
  });
  editor.join();
  for (auto& t : readers)
    t.join();
  EXPECT_EQ(mismatches.load(), 0);
  EXPECT_GT(reads.load(), 0);
}
