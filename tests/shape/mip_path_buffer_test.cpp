// Persistent blocks of mip paths: exact bytes, round trips of random sequences, refused blocks
// and the fuzzing seeds, which are the blocks written here.
#include <zv/mip_path2f_prop1d.h>
#include <zv/path2f_prop1d.h>
#include <zv/raw_fcurve.h>

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iterator>
#include <limits>
#include <random>
#include <string>
#include <vector>

#include "mip_path_fixtures.h"
#include "tests/support/byte_blocks.h"

namespace {

ZvPath2fProp1d Line(float x0, float y0, float x1, float y1) {
  ZvPath2fProp1d path;
  path.Moveto({x0, y0});
  path.Lineto({x1, y1});
  return path;
}

ZvMipPath2fProp1d TwoLines() {
  ZvMipPath2fProp1d mip(Line(1, 2, 3, 4), 0.5);
  ZvMipP2fP1dAgent(mip).CreateKey(-2.0, Line(0, 0, -1, 0.5f));
  return mip;
}

// Random keys: up to six, of random subpaths of lines and cubics, some closed, half of them
// with a property curve.
ZvMipPath2fProp1d RandomSequence(std::mt19937& rng) {
  std::uniform_real_distribution<float> coord(-100.0f, 100.0f);
  std::uniform_real_distribution<double> parameter(-10.0, 10.0);
  std::uniform_int_distribution<int> small(0, 3);
  ZvMipPath2fProp1d mip;
  ZvMipP2fP1dAgent agent(mip);
  const int keys = std::uniform_int_distribution<int>(0, 6)(rng);
  for (int k = 0; k < keys; ++k) {
    ZvPath2fProp1d path;
    for (int s = small(rng); s >= 0; --s) {
      const unsigned int start = path.NumPoints();
      path.Moveto({coord(rng), coord(rng)});
      for (int i = small(rng); i >= 0; --i) {
        if (small(rng) == 0)
          path.Curveto({coord(rng), coord(rng)}, {coord(rng), coord(rng)},
                       {coord(rng), coord(rng)});
        else
          path.Lineto({coord(rng), coord(rng)});
      }
      if (small(rng) == 0) path.CloseSubpath(path.NumPoints() - 1);
      if (small(rng) < 2) path.SetPropCurve(start, ZvRawFCurve(0.0, coord(rng), 50.0, coord(rng)));
    }
    agent.CreateKey(parameter(rng), path);
  }
  return mip;
}

TEST(MipPathBuffer, ExactBytes) {
  // Version 256, two keys in parameter order, each key path's whole block behind its parameter.
  const Bytes expected = HexBytes(
      "74000000 00010000 02000000"
      " 00000000000000c0"
      "   2a000000 0400 0001"
      "     1e000000 0100 0000 02000000 00000000 00000000 000080bf 0000003f 01 03 01000000"
      "   00000000"
      " 000000000000e03f"
      "   2a000000 0400 0001"
      "     1e000000 0100 0000 02000000 0000803f 00000040 00004040 00008040 01 03 01000000"
      "   00000000");
  EXPECT_EQ(Block(TwoLines()), expected);
  EXPECT_EQ(Block(ZvMipPath2fProp1d()), HexBytes("08000000 00010000 00000000"));
}

TEST(MipPathBuffer, RandomSequencesRoundTripThroughBothReaders) {
  std::mt19937 rng(2126);
  for (int round = 0; round < 200; ++round) {
    const ZvMipPath2fProp1d mip = RandomSequence(rng);
    const Bytes block = Block(mip);
    ZvMipPath2fProp1d trusted(Line(5, 5, 6, 6), 99.0);
    // The trusted reader counts the body: 8 + (12 + key path body length) per key.
    ASSERT_EQ(trusted.ReadFromBufferBody(block.data() + 4), block.size() - 4);
    EXPECT_EQ(Block(trusted), block);
    ZvMipPath2fProp1d bounded;
    ASSERT_EQ(bounded.ReadFromBuffer(block.data(), block.size()), block.size());
    EXPECT_EQ(Block(bounded), block);
    EXPECT_EQ(KeyParameters(bounded), KeyParameters(mip));
  }
}

TEST(MipPathBuffer, BadBlocksAreRefusedAndChangeNothing) {
  const Bytes good = Block(TwoLines());
  ZvMipPath2fProp1d target(Line(7, 7, 8, 9), 3.0);
  const Bytes before = Block(target);
  const auto refusedByBoth = [&](const Bytes& bad) {
    EXPECT_EQ(target.ReadFromBufferBody(bad.data() + 4), 0u);
    EXPECT_EQ(target.ReadFromBuffer(bad.data(), bad.size()), 0u);
    EXPECT_EQ(Block(target), before);
  };
  // Version words below 256, whatever byte 0 holds.
  for (unsigned char low : {0x00, 0xff}) {
    Bytes bad = good;
    bad[4] = low;
    bad[5] = 0;
    refusedByBoth(bad);
  }
  // A key path that is not a property path.
  Bytes badKind = good;
  badKind[12 + 8 + 4] = 1;
  refusedByBoth(badKind);

  // The bounded reader: any block cut short, or whose length or count overstates it.
  for (std::size_t size = 0; size < good.size(); ++size) {
    EXPECT_EQ(target.ReadFromBuffer(good.data(), size), 0u) << size;
    Bytes cut(good.begin(), good.begin() + static_cast<std::ptrdiff_t>(size));
    if (size >= 4) {
      const std::uint32_t length = static_cast<std::uint32_t>(size - 4);
      std::memcpy(cut.data(), &length, 4);  // the tests run on little-endian hosts
      EXPECT_EQ(target.ReadFromBuffer(cut.data(), cut.size()), 0u) << size;
    }
  }
  Bytes manyKeys = good;
  manyKeys[11] = 0x7f;
  EXPECT_EQ(target.ReadFromBuffer(manyKeys.data(), manyKeys.size()), 0u);
  EXPECT_EQ(Block(target), before);

  // Keys out of order are refused from a foreign block, which the search could not walk.
  Bytes swapped = good;
  const double late = 1e9;
  std::memcpy(swapped.data() + 12, &late, 8);
  EXPECT_EQ(target.ReadFromBuffer(swapped.data(), swapped.size()), 0u);
  EXPECT_EQ(Block(target), before);
}

TEST(MipPathBuffer, ParametersThatAreNotFiniteReadAsZero) {
  Bytes block = Block(ZvMipPath2fProp1d(Line(1, 2, 3, 4), 0.5));
  const double nan = std::numeric_limits<double>::quiet_NaN();
  std::memcpy(block.data() + 12, &nan, 8);
  ZvMipPath2fProp1d read;
  ASSERT_NE(read.ReadFromBuffer(block.data(), block.size()), 0u);
  EXPECT_EQ(KeyParameters(read), std::vector<double>{0.0});
  // And the writer never stores one.
  ZvMipP2fP1dAgent(read).ShiftKeyParameters(INFINITY);
  EXPECT_EQ(Block(read), Block(ZvMipPath2fProp1d(Line(1, 2, 3, 4), 0.0)));
}

TEST(MipPathBuffer, FuzzSeedsAreTheWrittenBlocks) {
  // ZV_WRITE_FUZZ_SEEDS=1 rewrites the committed seeds; otherwise they must match the writer.
  std::mt19937 rng(21);
  ZvMipPath2fProp1d random = RandomSequence(rng);
  while (random.GetNumKeys() < 3)
    random = RandomSequence(rng);
  ZvMipPath2fProp1d bars;
  ZvMipP2fP1dAgent agent(bars);
  for (int k = 0; k < 4; ++k)
    agent.CreateKey(k, Bar(static_cast<float>(k), static_cast<float>(k + 1)));
  const struct {
    const char* name;
    Bytes block;
  } seeds[] = {{"empty", Block(ZvMipPath2fProp1d())},
               {"two_lines", Block(TwoLines())},
               {"bars", Block(bars)},
               {"random", Block(random)}};
  for (const auto& seed : seeds)
    ExpectFuzzSeed("fuzz_mip_path_buffer", seed.name, seed.block);
}

}  // namespace
