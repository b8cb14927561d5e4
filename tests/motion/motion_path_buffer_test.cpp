// Persistent blocks of motion paths: exact bytes, round trips, older versions, refusals of
// cut and damaged blocks, and the fuzzing seeds, which are the blocks written here.
#include <zv/motion_path.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <iterator>
#include <limits>
#include <memory>
#include <string>

#include "motion_fixtures.h"
#include "tests/support/byte_blocks.h"

namespace {

// One eased cubic whose last node carries a G1 lock.
ZvMotionPath3d Small() {
  ZvMotionPath3d path({1, 2, 0}, {4, 2, 1}, 0.5, 2.0, {2, 2, 0}, {3, 2, 0.5});
  path.SetRightTangentInfo(0, ZvMotionPath3d::Ease);
  path.SetLeftTangentInfo(3, ZvMotionPath3d::Constant);
  path.LockG1Continuity(3);
  return path;
}

std::unique_ptr<ZvMotionPath3d> Read(const Bytes& block, unsigned int& consumed) {
  return std::unique_ptr<ZvMotionPath3d>(ZvMotionPath3d_CreateFromBufferBody(
      block.data() + 4, static_cast<unsigned int>(block.size() - 4), consumed));
}

}  // namespace

TEST(MotionBuffer, ExactBytes) {
  EXPECT_EQ(Block(ZvMotionPath3d()), HexBytes("10000000 0301 000000000000 00000000 00000000"));
  const Bytes small = HexBytes(
      "86000000 0301 000000000000 04000000"
      " 000000000000F03F 0000000000000040 0000000000000000"
      " 0000000000000040 0000000000000040 0000000000000000"
      " 0000000000000840 0000000000000040 000000000000E03F"
      " 0000000000001040 0000000000000040 000000000000F03F"
      " 000000000000E03F 0000000000000040"
      " 0304 0203 0002 00000000");
  ASSERT_EQ(small.size(), 138u);
  EXPECT_EQ(Block(Small()), small);
  EXPECT_EQ(ZvMotionPath3d_GetBufferBodyLengthSize(), 4u);

  // What is not finite is stored as 0.
  ZvMotionPath3d odd = Small();
  odd.ReplaceControlPointIgnoringLock(
      1, {std::numeric_limits<double>::quiet_NaN(), std::numeric_limits<double>::infinity(), 2.0});
  const Bytes block = Block(odd);
  unsigned int consumed = 0;
  const auto back = Read(block, consumed);
  ASSERT_TRUE(back);
  P3 p;
  back->GetControlPoint(1, p);
  EXPECT_EQ(p.x, 0.0);
  EXPECT_EQ(p.y, 0.0);
  EXPECT_EQ(p.z, 2.0);
}

TEST(MotionBuffer, RandomPathsRoundTrip) {
  std::mt19937 rng(3);
  for (unsigned int nodes = 1; nodes < 40; nodes += 3) {
    ZvMotionPath3d path = RandomPath(rng, nodes);
    path.LockG1ContinuityAtAllNodes();
    const Bytes block = Block(path);
    unsigned int consumed = 0;
    const auto back = Read(block, consumed);
    ASSERT_TRUE(back) << nodes;
    EXPECT_EQ(consumed, block.size() - 4);
    EXPECT_EQ(Block(*back), block);
    ZvMotionPath3d into = Small();
    EXPECT_EQ(into.ReadFromBufferBody(block.data() + 4), consumed);
    EXPECT_EQ(Block(into), block);
  }
}

TEST(MotionBuffer, OlderVersionsRunAtConstantSpeed) {
  // Build the older layouts from a current block: no tangents, and for 258 a spare byte per
  // node before the flags.
  const Bytes now = Block(Small());
  const size_t times = 16 + 24 * 4, tangents = times + 16;
  for (unsigned int version : {257u, 258u}) {
    Bytes old(now.begin(), now.begin() + tangents);
    old[4] = static_cast<unsigned char>(version);
    if (version == 258) old.insert(old.end(), {0xaa, 0xbb});
    old.insert(old.end(), {0x00, 0x02, 0, 0, 0, 0});
    unsigned int consumed = 0;
    const auto back = Read(old, consumed);
    ASSERT_TRUE(back) << version;
    EXPECT_EQ(consumed, old.size() - 4);
    ZvMotionPath3d::TangentInfo info;
    back->GetRightTangentInfo(0, info);
    EXPECT_EQ(info, ZvMotionPath3d::Constant);
    back->GetLeftTangentInfo(3, info);
    EXPECT_EQ(info, ZvMotionPath3d::Constant);
    EXPECT_TRUE(back->IsG1ContinuityLocked(3));
    EXPECT_EQ(back->GetLastTime(), 2.0);
  }
}

TEST(MotionBuffer, CutAndDamagedBlocksAreRefusedWithoutChange) {
  std::mt19937 rng(5);
  const Bytes good = Block(RandomPath(rng, 4));
  ZvMotionPath3d target = Small();
  const Bytes before = Block(target);
  unsigned int consumed = 77;
  for (size_t size = 0; size + 4 < good.size(); ++size) {
    EXPECT_EQ(target.ReadFromBufferBody(good.data() + 4, static_cast<unsigned int>(size)), 0u);
    EXPECT_EQ(ZvMotionPath3d_CreateFromBufferBody(good.data() + 4, static_cast<unsigned int>(size),
                                                  consumed),
              nullptr);
    EXPECT_EQ(consumed, 0u);
  }
  const auto damaged = [&](size_t at, unsigned char value) {
    Bytes bad = good;
    bad[at] = value;
    return bad;
  };
  const size_t nodesAt = 16 + 24 * 10;
  const Bytes bad[] = {
      damaged(4, 0x00),             // version 256
      damaged(12, 11),              // point count not whole segments
      damaged(12, 0xff),            // point count beyond the block
      damaged(nodesAt + 8 * 4, 9),  // unknown tangent information
  };
  for (size_t k = 0; k < std::size(bad); ++k) {
    EXPECT_EQ(
        target.ReadFromBufferBody(bad[k].data() + 4, static_cast<unsigned int>(bad[k].size() - 4)),
        0u)
        << k;
  }
  // Times that stop increasing: the second time set to the first.
  Bytes flat = good;
  std::copy(flat.begin() + nodesAt, flat.begin() + nodesAt + 8, flat.begin() + nodesAt + 8);
  EXPECT_EQ(target.ReadFromBufferBody(flat.data() + 4, static_cast<unsigned int>(flat.size() - 4)),
            0u);
  EXPECT_EQ(Block(target), before);
}

TEST(MotionBuffer, FuzzSeedsAreTheWrittenBlocks) {
  // ZV_WRITE_FUZZ_SEEDS=1 rewrites the committed seeds; otherwise they must match the writer.
  std::mt19937 rng(19);
  const struct {
    const char* name;
    ZvMotionPath3d path;
  } seeds[] = {{"empty", ZvMotionPath3d()},
               {"small", Small()},
               {"wave", Wave()},
               {"random", RandomPath(rng, 6)}};
  for (const auto& seed : seeds) {
    // The fuzz target reads bodies: the length field is not part of the input.
    const Bytes whole = Block(seed.path);
    ExpectFuzzSeed("fuzz_motion_path_buffer", seed.name, Bytes(whole.begin() + 4, whole.end()));
  }
}
