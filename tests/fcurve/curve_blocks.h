// Curve blocks for the persistence tests: the writer's output, blocks assembled field by field
// as older writers made them, and the fixed curves whose blocks seed the fuzzer.
#ifndef ZV_TESTS_FCURVE_CURVE_BLOCKS_H
#define ZV_TESTS_FCURVE_CURVE_BLOCKS_H

#include <zv/quat_fcurve.h>
#include <zv/raw_fcurve.h>
#include <zv/std_fcurve.h>
#include <zv/step_fcurve.h>

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "tests/fcurve/uid.h"
#include "tests/support/byte_blocks.h"

// A block assembled field by field; Finish() puts the body length in front.
class BlockBuilder {
 public:
  BlockBuilder& U8(unsigned int v) {
    body.push_back(static_cast<unsigned char>(v));
    return *this;
  }
  BlockBuilder& U16(unsigned int v) { return U8(v & 0xFF).U8(v >> 8 & 0xFF); }
  BlockBuilder& U32(std::uint32_t v) { return U16(v & 0xFFFF).U16(v >> 16); }
  BlockBuilder& F64(double v) {
    std::uint64_t bits;
    std::memcpy(&bits, &v, 8);
    return U32(static_cast<std::uint32_t>(bits)).U32(static_cast<std::uint32_t>(bits >> 32));
  }
  BlockBuilder& Raw(const Bytes& bytes) {
    body.insert(body.end(), bytes.begin(), bytes.end());
    return *this;
  }
  // The user data block of a curve without a store.
  BlockBuilder& NoUserData() { return U32(5).U32(256).U8(0); }
  Bytes Finish() const {
    Bytes block;
    const std::uint32_t n = static_cast<std::uint32_t>(body.size());
    for (int i = 0; i < 4; ++i)
      block.push_back(static_cast<unsigned char>(n >> (8 * i)));
    block.insert(block.end(), body.begin(), body.end());
    return block;
  }

  Bytes body;
};

// A key record of the blocks from 256 on: seven doubles, the segment kind, three zero bytes.
struct KeyRecord {
  double parameter, left, right, ltx, lty, rtx, rty;
  unsigned int kind;
};

inline BlockBuilder& AddKey(BlockBuilder& b, const KeyRecord& k) {
  b.F64(k.parameter).F64(k.left).F64(k.right).F64(k.ltx).F64(k.lty).F64(k.rtx).F64(k.rty);
  return b.U8(k.kind).U8(0).U16(0);
}

// The fields of a standard block; StdBlock writes those that the stamp's layout holds.
struct StdFields {
  double valueWhenNoKeys = 0.5;
  double minClamp = -10.0;
  double maxClamp = 10.0;
  unsigned int firstSegmentKind = ZvBaseFCurve::CubicSegment;
  // Three keys of cubic segments; the middle one's handles are collinear.
  std::vector<KeyRecord> keys = {{0, 1, 1, -0.5, 0.5, 0.5, 1.5, 3},
                                 {1, 2, 2, 0.75, 1.5, 1.5, 3.0, 3},
                                 {2, 0, 0, 1.5, 0.5, 2.5, -0.5, 3}};
  unsigned int flags = 0x285;  // continuity, parameter lock, automatic, length continuity
  unsigned int extrapolation = 2;
  unsigned int readOnly = 7;  // any non-zero byte sets it
  Bytes userData = HexBytes("05 00 00 00 00 01 00 00 00");
  unsigned int tangentConstraint = 1;
  unsigned int timeCurve = 0;
};

// A standard block as the writer of `stamp` made it: the oldest layout for stamp 1, otherwise the
// header and keys of today followed by the tag blocks of that version.
inline Bytes StdBlock(unsigned int stamp, const StdFields& f = StdFields()) {
  BlockBuilder b;
  const unsigned int n = static_cast<unsigned int>(f.keys.size());
  b.U32(stamp);
  if (stamp == 1) {
    b.F64(f.valueWhenNoKeys).U32(f.firstSegmentKind).U32(n);
    for (const KeyRecord& k : f.keys)
      AddKey(b, k).U32(0);
    return b.Finish();
  }
  b.U32(ZvBaseFCurve::StdKind).F64(f.valueWhenNoKeys).F64(f.minClamp).F64(f.maxClamp);
  b.U32(f.firstSegmentKind).U32(n);
  for (const KeyRecord& k : f.keys)
    AddKey(b, k);
  if (stamp >= 257) {
    b.U32(257);
    for (unsigned int i = 0; i < n; ++i)
      stamp >= 261 ? b.U16(f.flags) : b.U8(f.flags & 0xFF);
  }
  if (stamp >= 259) {
    b.U32(259).U8(f.extrapolation).U8(f.readOnly);
    for (unsigned int i = 0; i < n; ++i)
      b.U8(0xA0 + i).U8(0x0B);
    b.Raw(f.userData);
  }
  if (stamp >= 262) b.U32(262).U8(f.tangentConstraint);
  if (stamp >= 264) b.U32(264).U8(f.timeCurve);
  return b.Finish();
}

// A standard curve with a key of every segment kind, locks, handles, clamps, extrapolation and
// user data on the curve and on two keys.
inline ZvStdFCurve RichStdCurve() {
  ZvStdFCurve curve(0.5, ZvBaseFCurve::LinearSegment);
  curve.CreateKey(0.0, 1.0);
  curve.CreateKey(1.0, 3.0);
  curve.CreateKey(2.5, -1.0);
  curve.CreateKey(4.0, 2.0);
  curve.SetSegmentKindAtIndex(0, ZvBaseFCurve::ConstantSegment);
  curve.SetSegmentKindAtIndex(1, ZvBaseFCurve::CubicSegment);
  curve.SetKeyTgtHandles(1.0, {-0.3, -0.5}, {0.6, 1.0}, 0.0);
  curve.SetKeyValue(2.5, ZvBaseFCurve::LeftSide, -2.0, 0.0);
  curve.SetConstraintAtIndex(2, ZvBaseFCurve::ValueLock, 1);
  curve.SetConstraintAtIndex(3, ZvBaseFCurve::FlatTangent, 1);
  curve.SetClampingValues(-1.5, 2.75);
  curve.SetExtrapolationMethod(ZvBaseFCurve::CycleWithOffsetExtrapolation);
  curve.SetFCurveUserData(MakeUID(1), TextBytes("curve"), 5);
  double t = 1.0;
  curve.SetKeyUserData(t, MakeUID(2), TextBytes("one"), 3, 0.0);
  t = 4.0;
  curve.SetKeyUserData(t, MakeUID(3), TextBytes("four"), 4, 0.0);
  curve.SetAsTimeFCurve(0);
  return curve;
}

// Step curves of a few keys with locks and user data.
inline ZvBooleanFCurve SteppedBoolean() {
  ZvBooleanFCurve curve(1.0);
  curve.CreateKey(0.5, 0.0);
  curve.CreateKey(1.5, 1.0);
  double t = 1.5;
  curve.SetConstraint(t, ZvBaseFCurve::ValueLock, 1, 0.0);
  curve.SetFCurveUserData(MakeUID(6), TextBytes("on"), 2);
  return curve;
}

inline ZvIntegerFCurve SteppedInteger() {
  ZvIntegerFCurve curve(3.0);
  for (int i = 0; i < 4; ++i)
    curve.CreateKey(i * 0.75, i * i - 5.0);
  double t = 0.75;
  curve.SetConstraint(t, ZvBaseFCurve::WholeKeyLock, 1, 0.0);
  curve.SetKeyUserData(t, MakeUID(7), TextBytes("step"), 4, 0.0);
  return curve;
}

// A rotation block of the older form, "0010", which has no component: two keys out of time
// order, spins with the top bits set (masked off on reading), parameter locks.
inline Bytes QuatBlockWithoutComponent() {
  BlockBuilder b;
  b.U32(0x30313030).U32(ZvBaseFCurve::QuatKind).U32(2);
  for (double time : {1.0, 2.0}) {
    b.F64(time).F64(time / 4).F64(0.0).F64(-time / 8);
    b.U32(0).U32(0).U32(0).U16(0xC005).U16(4);
  }
  return b.F64(0.1).F64(0.2).F64(0.3).U32(0).U32(3).NoUserData().Finish();
}

// A rotation view of two keys with locks, spins and user data.
// (Held by pointer: a copy of a view leaves its user data behind.)
inline std::unique_ptr<ZvQuatFCurve> RotationView() {
  std::unique_ptr<ZvQuatFCurve> owner(new ZvQuatFCurve(2));
  ZvQuatFCurve& view = *owner;
  ZvQuatCurve& rotation = *view.GetQuatCurve();
  rotation.SetKey(ZvQuatKey(0.0, {0.1, 0.2, 0.3}, 0.25f, -0.5f, 0.0f, -2), 0.0);
  rotation.SetKey(ZvQuatKey(1.5, {1.0, -0.5, 0.25}, 0.0f, 0.0f, 0.75f, 1), 0.0);
  rotation.SetConstraintData(1, 6);
  double t = 1.5;
  view.SetKeyUserData(t, MakeUID(8), TextBytes("turn"), 4, 0.0);
  return owner;
}

// The fuzzer's seeds: one block of each kind as written today and one of each older layout, by
// file name under fuzz/corpus/fuzz_fcurve_buffer/.
inline std::vector<std::pair<std::string, Bytes>> SeedBlocks() {
  std::vector<std::pair<std::string, Bytes>> seeds = {
      {"std_empty", Block(ZvStdFCurve())},
      {"std_rich", Block(RichStdCurve())},
      {"quat", Block(*RotationView())},
      {"boolean", Block(SteppedBoolean())},
      {"integer", Block(SteppedInteger())},
      {"raw", Block(ZvRawFCurve(0.0, 1.0, 2.0, 3.0))},
      {"quat_v0010", QuatBlockWithoutComponent()},
  };
  for (unsigned int stamp : {1u, 256u, 257u, 259u, 261u, 262u})
    seeds.emplace_back("std_v" + std::to_string(stamp), StdBlock(stamp));
  return seeds;
}

#endif
