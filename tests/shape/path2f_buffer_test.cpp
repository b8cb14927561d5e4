// Persistent blocks of paths: exact bytes, round trips, the shape factory, the bounded reader
// and the fuzzing seeds, which are the blocks written here.
#include <zv/gc.h>
#include <zv/oval2f.h>
#include <zv/path2f.h>
#include <zv/rect2f.h>

#include <gtest/gtest.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iterator>
#include <limits>
#include <string>

#include "path_fixtures.h"
#include "tests/support/byte_blocks.h"

namespace {

ZvPath2f Line() {
  return Segment(1, -2, 0.5f, 3);
}

ZvPath2f LockedLoop() {
  ZvPath2f path = SmoothLoop();
  path.LockG1(3);
  path.LockG1(0);
  return path;
}

ZvPath2f HighDegrees() {
  ZvPath2f path;
  path.Moveto(P(0, 0));
  ZvPoint2<float> pts[8];
  for (int i = 0; i < 8; ++i)
    pts[i] = P(static_cast<float>(i + 1), static_cast<float>(i % 3));
  for (unsigned int d = 1; d <= 8; ++d)
    path.AltCurveto(pts, d);
  return path;
}

}  // namespace

TEST(Path2fBuffer, WrittenBytesAreFixed) {
  // The same bytes from every build: little-endian integers, binary32 floats, lock bits gone.
  EXPECT_EQ(Block(ZvPath2f()), HexBytes("0c000000 0100 0000 00000000 00000000"));
  EXPECT_EQ(Block(Line()), HexBytes("1e000000 0100 0000 02000000"
                                    "0000803f 000000c0 0000003f 00004040"
                                    "01 03 01000000"));
  EXPECT_EQ(Block(LockedLoop()), HexBytes("4b000000 0100 0000 07000000"
                                          "0000a041 00000000 0000c841 0000a0c0"
                                          "0000f041 0000a0c0 00000c42 00000000"
                                          "00002042 0000a040 00007041 0000a040"
                                          "0000a041 00000000"
                                          "01 08 09 0a 08 09 0b 00000000"));
}

TEST(Path2fBuffer, RoundTripKeepsEverythingButLocks) {
  ZvPath2f odd;
  odd.Moveto(P(-0.0f, std::numeric_limits<float>::denorm_min()));
  odd.Lineto(P(std::numeric_limits<float>::infinity(), std::numeric_limits<float>::quiet_NaN()));
  const ZvPath2f sources[] = {ZvPath2f(),      Line(),        LockedLoop(),
                              ThreeSubpaths(), HighDegrees(), odd};
  for (const ZvPath2f& source : sources) {
    const Bytes block = Block(source);
    unsigned int consumed = 99;
    ZvShape2f* shape = ZvShape2f_CreateFromBufferBody(block.data() + 4, consumed);
    ASSERT_NE(shape, nullptr);
    EXPECT_EQ(consumed, block.size() - 4);
    ZvPath2f* path = static_cast<ZvPath2f*>(shape->QueryShapeKind(ZvShape2f::KindPath));
    ASSERT_NE(path, nullptr);
    EXPECT_EQ(Codes(*path, 255), Codes(source, 63));
    EXPECT_TRUE(PathInvariantHolds(*path));
    EXPECT_EQ(Block(*path), block);  // bit patterns of the points included
    delete shape;
  }
  // The open flag travels: drawing continues on the read path as on the source.
  ZvPath2f read;
  const Bytes line = Block(Line());
  EXPECT_EQ(read.ReadFromBufferBody(line.data() + 4), line.size() - 4);
  EXPECT_EQ(Block(read), line);
}

TEST(Path2fBuffer, KindsAndRefusals) {
  Bytes block = Block(Line());
  const unsigned char* body = block.data() + 4;
  EXPECT_EQ(ZvShape2f_GetBufferBodyLengthSize(), 4u);
  EXPECT_EQ(ZvShape2f_GetKindFromBufferBody(body), ZvShape2f::KindPath);
  block[6] = 0x7f;  // the upper half of the kind word is not looked at
  EXPECT_EQ(ZvShape2f_GetKindFromBufferBody(body), ZvShape2f::KindPath);
  unsigned int consumed = 0;
  ZvShape2f* shape = ZvShape2f_CreateFromBufferBody(body, consumed);
  EXPECT_NE(shape, nullptr);
  delete shape;

  ZvPath2f keep = ThreeSubpaths();
  for (unsigned char kind : {0, 4, 5, 255}) {
    block[4] = kind;
    EXPECT_EQ(ZvShape2f_GetKindFromBufferBody(body),
              kind >= 1 && kind <= 4 ? static_cast<ZvShape2f::Kind>(kind) : ZvShape2f::KindNone);
    EXPECT_EQ(keep.ReadFromBufferBody(body), 0u);
    consumed = 7;
    // Unknown kinds are refused, and a path body does not parse as a property path.
    EXPECT_EQ(ZvShape2f_CreateFromBufferBody(body, consumed), nullptr);
    EXPECT_EQ(consumed, 0u);
  }
  EXPECT_EQ(keep.NumPoints(), 11u);  // a refused body changes nothing
}

TEST(Path2fBuffer, BoundedReaderRefusesWhatWouldReadPastTheBlock) {
  const Bytes block = Block(ThreeSubpaths());
  unsigned int consumed = 0;
  ZvShape2f* shape = ZvShape2f_CreateFromBuffer(block.data(), block.size(), consumed);
  ASSERT_NE(shape, nullptr);
  EXPECT_EQ(consumed, block.size());
  EXPECT_EQ(Block(*static_cast<ZvPath2f*>(shape)), block);
  delete shape;

  // Every shorter size is refused, with nothing consumed.
  for (size_t size = 0; size < block.size(); ++size) {
    consumed = 5;
    EXPECT_EQ(ZvShape2f_CreateFromBuffer(block.data(), size, consumed), nullptr) << size;
    EXPECT_EQ(consumed, 0u);
  }
  EXPECT_EQ(ZvShape2f_CreateFromBuffer(nullptr, 100, consumed), nullptr);

  // A body length that claims less than the points need is refused even inside a long buffer.
  Bytes shortBody = block;
  shortBody.insert(shortBody.end(), 64, 0);
  shortBody[0] = static_cast<unsigned char>(shortBody[0] - 1);
  EXPECT_EQ(ZvShape2f_CreateFromBuffer(shortBody.data(), shortBody.size(), consumed), nullptr);
  // A huge point count is refused before anything is allocated for it.
  Bytes huge = block;
  huge[8] = huge[9] = huge[10] = huge[11] = 0xff;
  EXPECT_EQ(ZvShape2f_CreateFromBuffer(huge.data(), huge.size(), consumed), nullptr);
  // A longer body (padding behind the path) is accepted and stepped over whole.
  Bytes padded = block;
  padded.insert(padded.end(), 8, 0xab);
  padded[0] = static_cast<unsigned char>(padded[0] + 5);
  shape = ZvShape2f_CreateFromBuffer(padded.data(), padded.size(), consumed);
  ASSERT_NE(shape, nullptr);
  EXPECT_EQ(consumed, block.size() + 5);
  delete shape;
}

TEST(Path2fBuffer, ForeignCodesAreQueriedSafely) {
  // A block may carry codes no drawing call makes; the queries stay inside the arrays.
  const unsigned char codeSets[][4] = {
      {8, 9, 10, 11}, {46, 1, 0, 63}, {1, 45, 2, 38}, {4, 4, 1, 7}};
  for (const auto& set : codeSets) {
    ZvPath2f path;
    for (int i = 0; i < 4; ++i)
      path.Moveto(P(static_cast<float>(i), 0));
    Bytes block = Block(path);
    std::memcpy(block.data() + 12 + 32, set, 4);
    ASSERT_EQ(path.ReadFromBufferBody(block.data() + 4), block.size() - 4);
    EXPECT_LE(path.NumSegments(), 4u);
    EXPECT_LE(path.LargestDegree(), 8u);
    unsigned int first, last;
    for (unsigned int i = 0; i < 4; ++i) {
      ASSERT_EQ(path.GetSegmentIndices(i, first, last), 1);
      EXPECT_LT(first, 4u);
      EXPECT_LT(last, 4u);
      path.IsG1Continuous(i);
    }
    for (unsigned int i = 0; i < 4; ++i) {
      path.LockG1(i);
      path.CloseSubpath(i);
      path.OpenSubpath(i);
    }
    ZvPath2fIter it(path);
    unsigned int subpaths = 0;
    while (it.GetNextSubPathIndices(first, last))
      ++subpaths;
    EXPECT_EQ(subpaths, path.NumSubpaths());
  }
}

namespace {
// What a host may do with a path it was handed: measure it and draw it. Run under the
// sanitizers, any read outside the arrays fails the test.
void MeasureAndDraw(const ZvPath2f& path) {
  ZvGC gc;
  gc.flattenTolerance = 0.5;
  ZvExtent2<double> box;
  path.GetTightExtent(box);
  ZvPoint2fArray points;
  ZvPointTagArray tags;
  // An unclipped flatten makes as many points as the size over the tolerance asks for.
  if (box.kind == ZvExtent2<double>::Regular && box.xmin > -1e4 && box.ymin > -1e4 &&
      box.xmax < 1e4 && box.ymax < 1e4) {
    path.Flatten(gc, points, tags);
    path.Sample(gc, points, tags);
    path.IntersectSamplePointsExtent(gc, ZvExtent2<float>(0, 0, 16, 16), points, tags, 1);
  }
  const ZvExtent2<float> window(0, 0, 16, 16);
  path.IsIntersectingExtent(gc, window, 1);
  path.IsInteriorIntersectingExtent(gc, window, 1);
  unsigned int index = 0;
  path.GetClosePointIndex(P(3, 3), 2.0, &index);
  ZvRaster<unsigned char> bytes(16, 16, 0);
  ZvRaster<float> floats(16, 16, 0);
  ZvRaster<short> shorts(16, 16, 0);
  path.Fill(gc, bytes, nullptr, nullptr);
  for (int rate : {4, 8}) {
    gc.samplingRate = rate;
    gc.featherRadius = rate / 4;
    path.AAFill(gc, bytes, nullptr, nullptr);
    path.AAFill(gc, floats, nullptr, nullptr);
    path.AAFill(gc, shorts, nullptr, nullptr);
  }
  gc.lineWidth = 2;
  gc.joinStyle = 2;
  path.Stroke(gc, bytes);
}

// The bounded reader on a corrupted block: refused, or a path whose codes parse, without lock
// bits, that can be measured and drawn.
void ExpectRefusedOrWellFormed(const Bytes& block) {
  unsigned int consumed = 0;
  ZvShape2f* shape = ZvShape2f_CreateFromBuffer(block.data(), block.size(), consumed);
  if (!shape) return;
  // A corrupted kind word may name a rectangle or an oval, whose blocks are checked elsewhere.
  const ZvPath2f* path = static_cast<ZvPath2f*>(shape->QueryShapeKind(ZvShape2f::KindPath));
  if (!path) {
    delete shape;
    return;
  }
  EXPECT_TRUE(PathInvariantHolds(*path));
  EXPECT_EQ(Codes(*path, 255), Codes(*path, 63));
  MeasureAndDraw(*path);
  delete shape;
}
}  // namespace

TEST(Path2fBuffer, BoundedReaderHandsOnlyWellFormedPaths) {
  // Codes that break the path's rules are refused: an illegal code, a segment cut short by a
  // new start, a closed end inside a segment, a missing start, a lock bit.
  const ZvPath2f loop = LockedLoop();  // codes 1 8 9 10 8 9 11
  const Bytes good = Block(loop);
  const std::size_t codesAt = 12 + 8 * loop.NumPoints();
  const struct {
    std::size_t at;
    unsigned char code;
  } broken[] = {{2, 2}, {3, 1}, {2, 11}, {0, 3}, {1, 9}, {6, 10 | 0x80}, {5, 0x49}};
  unsigned int consumed = 0;
  for (const auto& b : broken) {
    Bytes block = good;
    block[codesAt + b.at] = b.code;
    consumed = 9;
    EXPECT_EQ(ZvShape2f_CreateFromBuffer(block.data(), block.size(), consumed), nullptr) << b.at;
    EXPECT_EQ(consumed, 0u);
    // The trusted body reader keeps its exact behaviour: it takes what it is given.
    ZvPath2f raw;
    EXPECT_EQ(raw.ReadFromBufferBody(block.data() + 4), block.size() - 4);
  }
  // Well-formed rewrites of the codes pass: after the first cubic's end, a new open subpath of
  // one quadratic.
  Bytes split = good;
  split[codesAt + 4] = 1;
  split[codesAt + 5] = 5;
  split[codesAt + 6] = 6;
  ZvShape2f* shape = ZvShape2f_CreateFromBuffer(split.data(), split.size(), consumed);
  ASSERT_NE(shape, nullptr);
  EXPECT_EQ(static_cast<ZvPath2f*>(shape)->NumSubpaths(), 2u);
  delete shape;

  // Every byte of valid blocks changed in turn, then random corruptions of several bytes.
  const ZvPath2f sources[] = {Line(), LockedLoop(), ThreeSubpaths(), HighDegrees()};
  for (const ZvPath2f& source : sources) {
    const Bytes block = Block(source);
    for (std::size_t at = 0; at < block.size(); ++at)
      for (unsigned char change : {0x01, 0x02, 0x40, 0x80, 0xff}) {
        Bytes bad = block;
        bad[at] = static_cast<unsigned char>(bad[at] ^ change);
        ExpectRefusedOrWellFormed(bad);
      }
  }
  std::srand(11);
  for (int n = 0; n < 4000; ++n) {
    const ZvPath2f& source = sources[n % 4];
    Bytes bad = Block(source);
    const std::size_t codes = 12 + 8 * source.NumPoints();
    for (int k = 1 + n % 5; k > 0; --k) {
      // Mostly the codes, where structure lives; sometimes anywhere.
      const std::size_t at = n % 3 ? codes + std::rand() % source.NumPoints()
                                   : static_cast<std::size_t>(std::rand()) % bad.size();
      bad[at] = static_cast<unsigned char>(n % 2 ? std::rand() % 48 : std::rand());
    }
    ExpectRefusedOrWellFormed(bad);
  }
}

TEST(Path2fBuffer, FuzzSeedsAreTheWrittenBlocks) {
  // ZV_WRITE_FUZZ_SEEDS=1 rewrites the committed seeds; otherwise they must match the writer.
  const struct {
    const char* name;
    Bytes block;
  } seeds[] = {{"empty", Block(ZvPath2f())},
               {"line", Block(Line())},
               {"loop", Block(LockedLoop())},
               {"three_subpaths", Block(ThreeSubpaths())},
               {"degrees", Block(HighDegrees())},
               {"rect", Block(ZvRect2f(P(2, 3), P(9, 4.5f), P(1, 8)))},
               {"oval", Block(ZvOval2f(P(4, 5), 6, 3))}};
  for (const auto& seed : seeds)
    ExpectFuzzSeed("fuzz_path_buffer", seed.name, seed.block);
}
