// The curve factories and the bounded readers: kinds, refusals, truncated blocks, blocks in a
// row, and the fuzzing seeds, which are the blocks written here.
#include <zv/quat_fcurve.h>
#include <zv/raw_fcurve.h>
#include <zv/std_fcurve.h>
#include <zv/step_fcurve.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iterator>
#include <memory>
#include <vector>

#include "tests/fcurve/curve_blocks.h"
#include "tests/support/byte_blocks.h"

TEST(FCurveFactory, KindsOfBodies) {
  const auto body = [](std::uint32_t stamp, std::uint32_t kind) {
    return BlockBuilder().U32(stamp).U32(kind).body;
  };
  const Bytes oldest = body(1, 99), raw = body(264, 30), unknown = body(264, 21),
              zero = body(0, 20);
  EXPECT_EQ(ZvBaseFCurve_GetKindFromBufferBody(oldest.data()), 20u);
  EXPECT_EQ(ZvBaseFCurve_GetKindFromBufferBody(raw.data()), 30u);
  EXPECT_EQ(ZvBaseFCurve_GetKindFromBufferBody(unknown.data()), 0u);
  EXPECT_EQ(ZvBaseFCurve_GetKindFromBufferBody(zero.data()), 20u);
  EXPECT_EQ(ZvBaseFCurve_GetBufferBodyLengthSize(), 4u);

  ZvBaseFCurve* sentinel = reinterpret_cast<ZvBaseFCurve*>(&sentinel);
  ZvBaseFCurve* out = sentinel;
  EXPECT_EQ(ZvBaseFCurve_CreateFromBufferBody(nullptr, &out), 0u);
  EXPECT_EQ(out, sentinel);
  EXPECT_EQ(ZvBaseFCurve_CreateFromBufferBody(raw.data(), nullptr), 0u);
  EXPECT_EQ(ZvBaseFCurve_CreateFromBufferBody(unknown.data(), &out), 0u);
  EXPECT_EQ(out, nullptr);
  // Stamp 0 names the standard curve, which refuses it.
  out = sentinel;
  EXPECT_EQ(ZvBaseFCurve_CreateFromBufferBody(zero.data(), &out), 0u);
  EXPECT_EQ(out, nullptr);

  const Bytes block = Block(RichStdCurve());
  ASSERT_EQ(ZvBaseFCurve_CreateFromBufferBody(block.data() + 4, &out), 1u);
  std::unique_ptr<ZvBaseFCurve> curve(out);
  EXPECT_EQ(curve->GetKind(), ZvBaseFCurve::StdKind);
  EXPECT_EQ(Block(*curve), block);
}

TEST(FCurveFactory, BoundedReadsTakeBlocksInARow) {
  Bytes row = Block(RichStdCurve());
  const std::size_t first = row.size();
  const Bytes second = StdBlock(257);
  row.insert(row.end(), second.begin(), second.end());
  unsigned int consumed = 0;
  std::unique_ptr<ZvBaseFCurve> a(ZvBaseFCurve_CreateFromBuffer(row.data(), row.size(), consumed));
  ASSERT_NE(a, nullptr);
  EXPECT_EQ(consumed, first);
  std::unique_ptr<ZvBaseFCurve> b(
      ZvBaseFCurve_CreateFromBuffer(row.data() + consumed, row.size() - consumed, consumed));
  ASSERT_NE(b, nullptr);
  EXPECT_EQ(consumed, second.size());
  EXPECT_EQ(b->GetNumKeys(), 3u);
  EXPECT_EQ(ZvBaseFCurve_CreateFromBuffer(nullptr, 100, consumed), nullptr);
  EXPECT_EQ(consumed, 0u);
}

TEST(FCurveFactory, EveryTruncatedBlockIsRefused) {
  for (const auto& seed : SeedBlocks()) {
    SCOPED_TRACE(seed.first);
    const Bytes& block = seed.second;
    ZvBaseFCurve* probe = nullptr;
    ASSERT_EQ(ZvBaseFCurve_CreateFromBufferBody(block.data() + 4, &probe), 1u);
    // What the reader needs: its length field and the body bytes it consumes.
    const std::size_t needed = 4 + probe->ReadFromBufferBody(block.data() + 4);
    delete probe;
    ZvStdFCurve target = RichStdCurve();
    const Bytes before = Block(target);
    for (std::size_t cut = 0; cut < block.size(); ++cut) {
      Bytes prefix(block.begin(), block.begin() + static_cast<std::ptrdiff_t>(cut));
      unsigned int consumed = 1;
      // The length field asks for more than there is.
      EXPECT_EQ(ZvBaseFCurve_CreateFromBuffer(prefix.data(), cut, consumed), nullptr) << cut;
      EXPECT_EQ(consumed, 0u);
      EXPECT_EQ(target.ReadFromBuffer(prefix.data(), cut), 0u);
      if (cut < 4) continue;
      // The length field agrees, and the contents run out.
      const std::uint32_t length = static_cast<std::uint32_t>(cut - 4);
      std::memcpy(prefix.data(), &length, 4);  // little-endian on every target
      std::unique_ptr<ZvBaseFCurve> curve(
          ZvBaseFCurve_CreateFromBuffer(prefix.data(), cut, consumed));
      EXPECT_EQ(curve != nullptr, cut >= needed) << cut;
      EXPECT_EQ(consumed, curve ? cut : 0u);
      if (cut < needed) {
        EXPECT_EQ(target.ReadFromBuffer(prefix.data(), cut), 0u) << cut;
      }
    }
    EXPECT_EQ(Block(target), before);
  }
}

TEST(FCurveFactory, FuzzSeedsAreTheWrittenBlocks) {
  // ZV_WRITE_FUZZ_SEEDS=1 rewrites the committed seeds; otherwise they must match the writers.
  for (const auto& seed : SeedBlocks())
    ExpectFuzzSeed("fuzz_fcurve_buffer", seed.first, seed.second);
}

template <class Curve>
unsigned int ReadBounded(ZvBaseFCurve& curve, const Bytes& block) {
  return static_cast<Curve&>(curve).ReadFromBuffer(block.data(), block.size());
}

TEST(FCurveFactory, BoundedReadersRefuseKeysOutOfOrder) {
  // A curve of each kind with two keys, where the second key's parameter stands in its block,
  // and the kind's own bounded reader.
  struct Case {
    std::unique_ptr<ZvBaseFCurve> curve;
    std::size_t secondParameter;
    unsigned int (*read)(ZvBaseFCurve&, const Bytes&);
  };
  std::vector<Case> cases;
  cases.push_back(
      {std::unique_ptr<ZvBaseFCurve>(new ZvStdFCurve()), 44 + 60, &ReadBounded<ZvStdFCurve>});
  cases.push_back(
      {std::unique_ptr<ZvBaseFCurve>(new ZvRawFCurve()), 40 + 16, &ReadBounded<ZvRawFCurve>});
  cases.push_back({std::unique_ptr<ZvBaseFCurve>(new ZvBooleanFCurve()), 36 + 11,
                   &ReadBounded<ZvBooleanFCurve>});
  cases.push_back({std::unique_ptr<ZvBaseFCurve>(new ZvIntegerFCurve()), 42 + 14,
                   &ReadBounded<ZvIntegerFCurve>});
  cases.push_back(
      {std::unique_ptr<ZvBaseFCurve>(new ZvQuatFCurve(1)), 20 + 48, &ReadBounded<ZvQuatFCurve>});
  for (Case& c : cases) {
    SCOPED_TRACE(c.curve->GetKind());
    ASSERT_EQ(c.curve->CreateKey(1.0, 1.0), 1u);
    ASSERT_EQ(c.curve->CreateKey(2.0, 0.0), 1u);
    const Bytes good = Block(*c.curve);
    std::unique_ptr<ZvBaseFCurve> target(c.curve->Clone());
    ASSERT_EQ(target->CreateKey(5.0, 1.0), 1u);
    const Bytes before = Block(*target);
    EXPECT_EQ(c.read(*target, good), good.size());
    for (double second : {1.0, 0.5}) {
      Bytes bad = good;
      std::memcpy(bad.data() + c.secondParameter, &second, 8);  // little-endian on every target
      unsigned int consumed = 1;
      EXPECT_EQ(ZvBaseFCurve_CreateFromBuffer(bad.data(), bad.size(), consumed), nullptr);
      EXPECT_EQ(consumed, 0u);
      ASSERT_EQ(c.read(*target, before), before.size());
      EXPECT_EQ(c.read(*target, bad), 0u);
      EXPECT_EQ(Block(*target), before);
      // The trusting body reader takes such a foreign block, and the curve writes it repaired.
      ZvBaseFCurve* probe = nullptr;
      ASSERT_EQ(ZvBaseFCurve_CreateFromBufferBody(bad.data() + 4, &probe), 1u);
      std::unique_ptr<ZvBaseFCurve> foreign(probe);
      const Bytes rewritten = Block(*foreign);
      std::unique_ptr<ZvBaseFCurve> back(
          ZvBaseFCurve_CreateFromBuffer(rewritten.data(), rewritten.size(), consumed));
      EXPECT_NE(back, nullptr);
    }
  }
}
