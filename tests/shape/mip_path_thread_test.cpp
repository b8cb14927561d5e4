// Several agents on one mip path, each on its own thread, evaluating while another edits: every
// result must be one the sequence could give in some state it passed through.
#include <zv/mip_path2f_prop1d.h>
#include <zv/path2f_prop1d.h>

#include <gtest/gtest.h>

#include <atomic>
#include <thread>
#include <vector>

#include "mip_path_fixtures.h"
#include "tests/support/byte_blocks.h"

namespace {

TEST(MipPathThreads, AgentsEvaluateConsistentlyWhileOneEdits) {
  // The key at 1 swaps between a sibling of the key at 0 (a blend of points) and a path of
  // another topology (flattened, resampled and refitted).
  ZvPath2fProp1d other = Bar(30.0f, 9.0f);
  other.Lineto({40.0f, 5.0f});
  const ZvPath2fProp1d start = Bar(0.0f), ends[2] = {Bar(10.0f), other};
  const double times[6] = {0.0, 0.25, 0.5, 0.75, 1.0, 1.5};
  Bytes expected[6][2];
  for (int variant = 0; variant < 2; ++variant) {
    ZvMipPath2fProp1d mip(start, 0.0);
    ZvMipP2fP1dAgent agent(mip);
    agent.CreateKey(1.0, ends[variant]);
    for (int k = 0; k < 6; ++k)
      expected[k][variant] = Block(agent.Eval(times[k], 0.5, 0.1));
  }
  ASSERT_NE(expected[2][0], expected[2][1]);

  ZvMipPath2fProp1d mip(start, 0.0);
  ZvMipP2fP1dAgent(mip).CreateKey(1.0, ends[0]);
  constexpr int kRounds = 200;
  std::atomic<int> mismatches(0), badCounts(0);
  std::vector<std::thread> threads;
  for (int reader = 0; reader < 3; ++reader) {
    threads.emplace_back([&, reader] {
      ZvMipP2fP1dAgent agent(mip);
      for (int round = 0; round < kRounds; ++round) {
        const int k = (round + reader) % 6;
        const Bytes got = Block(agent.Eval(times[k], 0.5, 0.1));
        if (got != expected[k][0] && got != expected[k][1]) ++mismatches;
        const unsigned int keys = ZvMipPath2fProp1d(mip).GetNumKeys();
        if (keys != 2 && keys != 3) ++badCounts;
      }
    });
  }
  threads.emplace_back([&] {
    ZvMipP2fP1dAgent editor(mip);
    for (int round = 0; round < kRounds; ++round) {
      editor.CreateKey(1.0, ends[round % 2]);
      // A key before the evaluated times comes and goes; none of them sees it.
      if (round % 3 == 0)
        editor.CreateKey(-2.0, Bar(50.0f));
      else
        editor.RemoveKey(-2.0, 0.1);
    }
  });
  for (std::thread& thread : threads)
    thread.join();
  EXPECT_EQ(mismatches.load(), 0);
  EXPECT_EQ(badCounts.load(), 0);
  EXPECT_GE(mip.GetNumKeys(), 2u);
}

}  // namespace
