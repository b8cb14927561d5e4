// Persistent blocks of property paths: exact bytes, round trips of random paths, the first
// format, refusals that change nothing, and the fuzzing seeds, which are the blocks written here.
#include <gtest/gtest.h>
#include <zv/path2f_prop1d.h>
#include <zv/std_fcurve.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iterator>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "path_fixtures.h"
#include "path_prop_fixtures.h"
#include "tests/support/byte_blocks.h"

namespace {

void PutU32(Bytes& b, std::uint32_t v) {
  for (int i = 0; i < 4; ++i)
    b.push_back(static_cast<unsigned char>(v >> (8 * i)));
}

ZvPath2fProp1d OneLine() {
  ZvPath2fProp1d path;
  path.Moveto(P(1, 2));
  path.Lineto(P(3, 4));
  path.SetPropCurve(0, ZvRawFCurve(0.0, 1.0, 2.0, 3.0));
  return path;
}

// The curve of each subpath start, or -1 for none, and the value at a few arc lengths.
std::vector<double> Profile(const ZvPath2fProp1d& path) {
  std::vector<double> out;
  ZvPath2fIter it(path);
  unsigned int first = 0, last = 0;
  while (it.GetNextSubPathIndices(first, last)) {
    out.push_back(path.HasPropCurve(first) ? first : -1.0);
    for (double s : {0.0, 0.7, 3.0, 25.0})
      out.push_back(path.EvalPropCurve(first, s));
  }
  return out;
}

}  // namespace

TEST(PathPropBuffer, WrittenBytesAreFixed) {
  // Kind 4 with the format in the upper half, the whole path block, then the records.
  const Bytes expected = HexBytes(
      "8e000000 0400 0001"
      "1e000000 0100 0000 02000000 0000803f 00000040 00004040 00008040 01 03 01000000"
      "01000000 00000000"
      "5c000000 08010000 1e000000 000000000000f03f ffffffffffffefff ffffffffffffef7f"
      "02000000 0000000000000000 000000000000f03f 0000000000000040 0000000000000840"
      "00000000 02010000 01 00 05000000 0001000000 08010000 01");
  EXPECT_EQ(Block(OneLine()), expected);
  EXPECT_EQ(Block(ZvPath2fProp1d()), HexBytes("18000000 0400 0001 0c000000 0100 0000 00000000 "
                                              "00000000 00000000"));
}

TEST(PathPropBuffer, RandomPathsReadBackWhole) {
  std::mt19937 rng(21);
  for (int round = 0; round < 200; ++round) {
    const ZvPath2fProp1d source = RandomPropPath(rng);
    const Bytes block = Block(source);
    // Trusted body reader, bounded reader and factory agree, and write the same block again.
    ZvPath2fProp1d body, bounded;
    const unsigned int expected =
        static_cast<unsigned int>(block.size() - 4 - 4 * source.GetNumPropCurves());
    EXPECT_EQ(expected, body.ReadFromBufferBody(block.data() + 4));
    EXPECT_EQ(block.size(), bounded.ReadFromBuffer(block.data(), block.size()));
    unsigned int consumed = 0;
    std::unique_ptr<ZvShape2f> made(
        ZvShape2f_CreateFromBuffer(block.data(), block.size(), consumed));
    ASSERT_NE(nullptr, made);
    EXPECT_EQ(block.size(), consumed);
    const ZvPath2fProp1d* fromFactory =
        static_cast<const ZvPath2fProp1d*>(made->QueryShapeKind(ZvShape2f::KindPathProp));
    ASSERT_NE(nullptr, fromFactory);
    const ZvPath2fProp1d* reads[] = {&body, &bounded, fromFactory};
    for (const ZvPath2fProp1d* read : reads) {
      EXPECT_EQ(block, Block(*read));
      EXPECT_EQ(Profile(source), Profile(*read));
      EXPECT_TRUE(PathInvariantHolds(*read));
    }
  }
}

TEST(PathPropBuffer, FirstFormatCurvesBecomePolygons) {
  // Version 0 holds standard curves: (2, 5) to (10, 3) with handles, on a line of length 10.
  ZvPath2fProp1d line;
  line.Moveto(P(0, 0));
  line.Lineto(P(10, 0));
  const ZvStdFCurve old(2.0, 5.0, 10.0, 3.0);
  Bytes block = {0, 0, 0, 0, 4, 0, 0, 0};
  Bytes path(line.ZvPath2f::GetBufferSize());
  line.ZvPath2f::WriteToBuffer(path.data());
  block.insert(block.end(), path.begin(), path.end());
  PutU32(block, 1);
  PutU32(block, 0);
  Bytes curve(old.GetBufferSize());
  old.WriteToBuffer(curve.data());
  block.insert(block.end(), curve.begin(), curve.end());
  const std::uint32_t length = static_cast<std::uint32_t>(block.size() - 4);
  std::memcpy(block.data(), &length, 4);

  ZvPath2fProp1d read;
  EXPECT_EQ(block.size() - 8, read.ReadFromBufferBody(block.data() + 4));
  ASSERT_EQ(1, read.HasPropCurve(1));
  // The converted curve starts from a key of 1.0 at 0 and runs straight between the old keys.
  EXPECT_EQ(3u, read.GetPropCurve(0).GetNumKeys());
  EXPECT_DOUBLE_EQ(1.0, read.EvalPropCurve(0, 0.0));
  EXPECT_DOUBLE_EQ(4.0, read.EvalPropCurve(0, 6.0));
  EXPECT_DOUBLE_EQ(3.0, read.EvalPropCurve(0, 10.0));
  ZvPath2fProp1d bounded;
  EXPECT_EQ(block.size(), bounded.ReadFromBuffer(block.data(), block.size()));
  EXPECT_EQ(Block(read), Block(bounded));

  // Versions between the first format and today's were never written: refused.
  ZvPath2fProp1d keep = OneLine();
  const Bytes before = Block(keep);
  block[6] = 1;
  EXPECT_EQ(0u, keep.ReadFromBufferBody(block.data() + 4));
  EXPECT_EQ(0u, keep.ReadFromBuffer(block.data(), block.size()));
  EXPECT_EQ(before, Block(keep));
}

TEST(PathPropBuffer, BadBlocksAreRefusedAndChangeNothing) {
  std::mt19937 rng(7);
  ZvPath2fProp1d source = RandomPropPath(rng);
  while (source.GetNumPropCurves() < 2)
    source = RandomPropPath(rng);
  const Bytes block = Block(source);
  ZvPath2fProp1d keep = OneLine();
  const Bytes before = Block(keep);
  // Every cut of the block, and a length prefix that claims more than there is.
  for (std::size_t size = 0; size < block.size(); ++size)
    ASSERT_EQ(0u, keep.ReadFromBuffer(block.data(), size)) << size;
  Bytes longer = block;
  longer[0] = static_cast<unsigned char>(longer[0] + 1);
  EXPECT_EQ(0u, keep.ReadFromBuffer(longer.data(), longer.size()));

  // Records must name subpath starts, in ascending order, each once.
  const std::size_t firstRecord = 12 + (block[8] | block[9] << 8 | block[10] << 16) + 4;
  for (std::uint32_t start : {1u, 100000u, 0xffffffffu}) {
    Bytes bad = block;
    std::memcpy(bad.data() + firstRecord, &start, 4);
    EXPECT_EQ(0u, keep.ReadFromBuffer(bad.data(), bad.size())) << start;
  }
  // The second record moved onto the first one's subpath: out of order.
  {
    Bytes bad = block;
    std::uint32_t curveLength = 0;
    std::memcpy(&curveLength, bad.data() + firstRecord + 4, 4);
    std::memcpy(bad.data() + firstRecord + 8 + curveLength, bad.data() + firstRecord, 4);
    EXPECT_EQ(0u, keep.ReadFromBuffer(bad.data(), bad.size()));
  }
  // Another kind, or an inner path whose codes do not parse.
  {
    Bytes bad = block;
    bad[4] = 1;
    EXPECT_EQ(0u, keep.ReadFromBuffer(bad.data(), bad.size()));
    EXPECT_EQ(0u, keep.ReadFromBufferBody(bad.data() + 4));
    bad = block;
    bad[8 + 12 + 8 * (block[16] | block[17] << 8)] = 2;  // the first segment code
    EXPECT_EQ(0u, keep.ReadFromBuffer(bad.data(), bad.size()));
  }
  // A record count far beyond the block is refused before anything is reserved for it.
  {
    Bytes bad = block;
    std::memset(bad.data() + firstRecord - 4, 0xff, 4);
    EXPECT_EQ(0u, keep.ReadFromBuffer(bad.data(), bad.size()));
  }
  EXPECT_EQ(before, Block(keep));
}

TEST(PathPropBuffer, FuzzSeedsAreTheWrittenBlocks) {
  // ZV_WRITE_FUZZ_SEEDS=1 rewrites the committed seeds; otherwise they must match the writer.
  std::mt19937 rng(3);
  const struct {
    const char* name;
    Bytes block;
  } seeds[] = {{"empty", Block(ZvPath2fProp1d())},
               {"one_line", Block(OneLine())},
               {"two_lines", Block(TwoLinesWithCurves())},
               {"random_a", Block(RandomPropPath(rng))},
               {"random_b", Block(RandomPropPath(rng))}};
  for (const auto& seed : seeds)
    ExpectFuzzSeed("fuzz_path_prop_buffer", seed.name, seed.block);
}
