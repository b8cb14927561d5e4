// Mip paths under allocation failure: every edit, copy and read is run with the k-th allocation
// failing, for k = 0, 1, 2, ... until it completes, and after each failure the sequence must be
// as it was (its block unchanged). Under AddressSanitizer, leak detection catches a key path a
// failure leaves behind.
#include <zv/mip_path2f_prop1d.h>
#include <zv/path2f_prop1d.h>
#include <zv/raw_fcurve.h>

#include <gtest/gtest.h>

#include <functional>
#include <vector>

#include "mip_path_fixtures.h"
#include "tests/support/byte_blocks.h"
#include "tests/support/failing_allocator.h"

namespace {

ZvMipPath2fProp1d Three() {
  ZvMipPath2fProp1d mip;
  ZvMipP2fP1dAgent agent(mip);
  ZvPath2fProp1d curved = Bar(5.0f);
  curved.SetPropCurve(0, ZvRawFCurve(0.0, 1.0, 4.0, 3.0));
  agent.CreateKey(0.0, Bar(0.0f));
  agent.CreateKey(1.0, curved);
  agent.CreateKey(2.0, Bar(9.0f));
  return mip;
}

// Runs `op` on a fresh sequence with the k-th allocation failing, for every k until none fails;
// each failure must leave the sequence's block as it was. Returns the number of failures.
int Failures(const std::function<void(ZvMipPath2fProp1d&)>& op) {
  const Bytes original = Block(Three());
  ZvMipPath2fProp1d mip;
  return zv_test::ForEachFailure([&] { mip = Three(); }, [&] { op(mip); },
                                 [&](bool) { EXPECT_EQ(Block(mip), original); });
}

TEST(MipPathAllocation, FailuresLeaveTheSequenceAsItWas) {
  const ZvPath2fProp1d bar = Bar(3.0f);
  const ZvMipPath2fProp1d other(Bar(7.0f), 4.0);
  const Bytes block = Block(other);
  const std::function<void(ZvMipPath2fProp1d&)> ops[] = {
      [&](ZvMipPath2fProp1d& m) { ZvMipP2fP1dAgent(m).CreateKey(0.5, bar); },
      [&](ZvMipPath2fProp1d& m) { ZvMipP2fP1dAgent(m).CreateKey(1.0, bar); },
      [&](ZvMipPath2fProp1d& m) {
        ZvMipP2fP1dAgent(m).MergeAndCreateKey(1.0, 0.5, 2.0, bar, 1, 1);
      },
      [&](ZvMipPath2fProp1d& m) { ZvMipP2fP1dAgent(m).RemoveKeys(0.0, 1.0, 1, 1); },
      [&](ZvMipPath2fProp1d& m) { m = other; },
      [&](ZvMipPath2fProp1d& m) { ZvMipPath2fProp1d copy(m); },
      [&](ZvMipPath2fProp1d& m) { ZvMipPath2fProp1d part(m, 0.5, 1.5); },
      [&](ZvMipPath2fProp1d& m) { m.ReadFromBufferBody(block.data() + 4); },
      [&](ZvMipPath2fProp1d& m) { m.ReadFromBuffer(block.data(), block.size()); }};
  for (const auto& op : ops)
    EXPECT_GT(Failures(op), 0);
}

}  // namespace
