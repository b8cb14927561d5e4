// The blocks of the boolean, integer and raw curves: exact bytes, round trips of random curves,
// the older versions, and refused blocks.
#include <zv/raw_fcurve.h>
#include <zv/step_fcurve.h>

#include <gtest/gtest.h>

#include <memory>
#include <random>

#include "tests/fcurve/curve_blocks.h"

namespace {

std::unique_ptr<ZvBaseFCurve> ReadBounded(const Bytes& block) {
  unsigned int consumed = 0;
  std::unique_ptr<ZvBaseFCurve> curve(
      ZvBaseFCurve_CreateFromBuffer(block.data(), block.size(), consumed));
  EXPECT_EQ(consumed, curve ? block.size() : 0u);
  return curve;
}

// Keys, values on both sides and the two locks, as the interface shows them.
std::vector<double> Shown(const ZvBaseFCurve& curve) {
  std::vector<double> shown;
  for (unsigned int i = 0; i < curve.GetNumKeys(); ++i) {
    double t = 0, left = 0, right = 0;
    curve.GetKeyParameter(i, t);
    curve.GetKeyValues(t, left, right, 0.0);
    int value = 0, parameter = 0;
    curve.GetConstraint(t, ZvBaseFCurve::ValueLock, value, 0.0);
    curve.GetConstraint(t, ZvBaseFCurve::ParameterLock, parameter, 0.0);
    shown.insert(shown.end(), {t, left, right, double(value), double(parameter)});
  }
  return shown;
}

}  // namespace

TEST(KeyedKindsBuffer, FixedCurvesWriteTheseBytes) {
  ZvIntegerFCurve integer(5.0);
  integer.CreateKey(1.0, -2.0);
  integer.CreateKey(2.5, 7.0);
  double t = 2.5;
  integer.SetConstraint(t, ZvBaseFCurve::ValueLock, 1, 0.0);
  integer.SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation);
  const Bytes integerBlock = HexBytes(
      "4b 00 00 00  02 01 00 00  0f 00 00 00"
      "61 14 f2 84 ca 97 d1 11 93 6a 00 a0 24 3e 35 f0"
      // the first key set the value without keys and the value before the first key
      "fe ff ff ff  fe ff ff ff  03 00  02 00 00 00"
      "00 00 00 00 00 00 f0 3f  fe ff ff ff  00 00"
      "00 00 00 00 00 00 04 40  07 00 00 00  02 00"
      "05 00 00 00  00 01 00 00  00");
  EXPECT_EQ(Block(integer), integerBlock);

  ZvBooleanFCurve boolean(1.0);
  boolean.CreateKey(0.5, 1.0);
  t = 0.5;
  boolean.SetConstraint(t, ZvBaseFCurve::ParameterLock, 1, 0.0);
  const Bytes booleanBlock = HexBytes(
      "34 00 00 00  02 01 00 00  0a 00 00 00"
      "62 14 f2 84 ca 97 d1 11 93 6a 00 a0 24 3e 35 f0"
      "01 01 01 00  01 00 00 00"
      "00 00 00 00 00 00 e0 3f  01  04 00"
      "05 00 00 00  00 01 00 00  00");
  EXPECT_EQ(Block(boolean), booleanBlock);

  const ZvRawFCurve raw(0.0, 1.0, 2.0, 3.0);
  const Bytes rawBlock = HexBytes(
      "5c 00 00 00  08 01 00 00  1e 00 00 00"
      "00 00 00 00 00 00 f0 3f  ff ff ff ff ff ff ef ff  ff ff ff ff ff ff ef 7f"
      "02 00 00 00  00 00 00 00 00 00 00 00  00 00 00 00 00 00 f0 3f"
      "00 00 00 00 00 00 00 40  00 00 00 00 00 00 08 40"
      "00 00 00 00  02 01 00 00  01 00  05 00 00 00  00 01 00 00  00  08 01 00 00  01");
  EXPECT_EQ(Block(raw), rawBlock);

  // Each reads back to the same bytes, and the body reader takes the whole body.
  for (const Bytes* block : {&integerBlock, &booleanBlock, &rawBlock}) {
    const std::unique_ptr<ZvBaseFCurve> curve = ReadBounded(*block);
    ASSERT_NE(curve, nullptr);
    EXPECT_EQ(Block(*curve), *block);
    EXPECT_EQ(curve->ReadFromBufferBody(block->data() + 4), block->size() - 4);
  }
}

TEST(KeyedKindsBuffer, RandomCurvesComeBackEqual) {
  std::mt19937 random(14);
  std::uniform_real_distribution<double> value(-50.0, 50.0);
  for (int round = 0; round < 60; ++round) {
    std::unique_ptr<ZvBaseFCurve> curve;
    switch (round % 3) {
      case 0:
        curve.reset(new ZvBooleanFCurve(random() % 2));
        break;
      case 1:
        curve.reset(new ZvIntegerFCurve(std::floor(value(random))));
        break;
      default:
        curve.reset(new ZvRawFCurve(value(random)));
    }
    double t = value(random);
    for (int i = static_cast<int>(random() % 10); i > 0; --i) {
      t += 0.01 + std::fabs(value(random)) / 10;
      const double v = round % 3 == 0 ? random() % 2 : std::floor(value(random));
      curve->CreateKey(t, round % 3 == 2 ? value(random) : v);
      double at = t;
      if (random() % 3 == 0)
        curve->SetConstraint(at, ZvBaseFCurve::KeyConstraint(1 + random() % 2), 1, 0.0);
      if (random() % 3 == 0) {
        const std::string data(random() % 4, 'k');
        curve->SetKeyUserData(at, MakeUID(random() % 3), TextBytes(data), Size(data), 0.0);
      }
    }
    const ZvBaseFCurve::ExtrapolationMethod methods[] = {
        ZvBaseFCurve::ConstantExtrapolation, ZvBaseFCurve::CycleExtrapolation,
        ZvBaseFCurve::CycleWithOffsetExtrapolation};
    curve->SetExtrapolationMethod(methods[random() % 3]);
    if (random() % 2) curve->SetFCurveUserData(MakeUID(5), TextBytes("c"), 1);
    curve->SetAsTimeFCurve(random() % 2);
    curve->SetReadOnlyConstraint(random() % 2);

    const Bytes block = Block(*curve);
    const std::unique_ptr<ZvBaseFCurve> back = ReadBounded(block);
    ASSERT_NE(back, nullptr) << "round " << round;
    EXPECT_EQ(back->GetKind(), curve->GetKind());
    EXPECT_EQ(Shown(*back), Shown(*curve)) << "round " << round;
    for (double x = -60.0; x < 120.0; x += 0.77)
      EXPECT_EQ(back->Eval(x, 0), curve->Eval(x, 0)) << "round " << round << " at " << x;
    EXPECT_EQ(Block(*back), block) << "round " << round;
  }
}

namespace {

const Bytes kIdentifierTail = HexBytes("ca 97 d1 11 93 6a 00 a0 24 3e 35 f0");

// A boolean or integer body of `stamp`: header values, then keys of one-byte flags before 258.
Bytes StepBlock(unsigned int stamp, bool boolean, int noKeys, int before,
                const std::vector<std::pair<double, int>>& keys, unsigned int flags) {
  BlockBuilder b;
  b.U32(stamp).U32(boolean ? 10 : 15).U32(boolean ? 0x84F21462u : 0x84F21461u).Raw(kIdentifierTail);
  boolean ? b.U8(noKeys).U8(before) : b.U32(noKeys).U32(before);
  b.U8(3).U8(9).U32(static_cast<unsigned int>(keys.size()));
  for (const auto& k : keys) {
    b.F64(k.first);
    boolean ? b.U8(k.second) : b.U32(k.second);
    stamp == 257 ? b.U8(flags) : b.U16(flags);
  }
  return b.NoUserData().Finish();
}

// A raw body of `stamp`, with a flags array behind the marker when `marker` says so.
Bytes RawBlock(unsigned int stamp, std::uint32_t marker) {
  BlockBuilder b;
  b.U32(stamp).U32(30).F64(0.5).F64(-8.0).F64(8.0).U32(2);
  b.F64(1.0).F64(2.0).F64(3.0).F64(-1.0).U32(marker);
  if (marker >= 0xFFFFFFFEu) {
    for (int i = 0; i < 2; ++i)
      stamp >= 259 ? b.U16(0x5A5A) : b.U8(0x5A);
  }
  if (stamp >= 258) b.U32(258).U8(4).U8(1).NoUserData();
  if (stamp >= 264) b.U32(264).U8(0);
  return b.Finish();
}

}  // namespace

TEST(KeyedKindsBuffer, OlderVersionsReadIntoTodaysFields) {
  // Boolean 257: one byte of flags; a key's value byte is on only when it is 1, a header byte
  // whenever it is not 0.
  const Bytes boolean = StepBlock(257, true, 2, 0, {{1.0, 1}, {2.0, 2}, {3.0, 1}}, 0x04);
  std::unique_ptr<ZvBaseFCurve> curve = ReadBounded(boolean);
  ASSERT_NE(curve, nullptr);
  EXPECT_EQ(Shown(*curve), (std::vector<double>{1, 0, 1, 0, 1, 2, 1, 0, 0, 1, 3, 0, 1, 0, 1}));
  ZvBaseFCurve::FCurveInfo info;
  info.mask =
      ZvBaseFCurve::FCurveInfo::ValueWhenNoKeysMask | ZvBaseFCurve::FCurveInfo::ExtrapolationMask;
  curve->GetFCurveInfo(&info);
  EXPECT_EQ(info.valueWhenNoKeys, 1.0);
  EXPECT_EQ(info.extrapolation, 3u);
  EXPECT_EQ(curve->IsReadOnly(), 1u);
  EXPECT_EQ(curve->ReadFromBufferBody(boolean.data() + 4), boolean.size() - 4);

  // Integer 257 and 258: the flags word widened.
  for (unsigned int stamp : {257u, 258u}) {
    const Bytes block = StepBlock(stamp, false, -4, 6, {{0.5, -70000}, {1.5, 12}}, 0x02);
    curve = ReadBounded(block);
    ASSERT_NE(curve, nullptr) << stamp;
    EXPECT_EQ(Shown(*curve), (std::vector<double>{0.5, 6, -70000, 1, 0, 1.5, -70000, 12, 1, 0}))
        << stamp;
  }

  // Raw: no settings before 258, the flags array skipped by the marker, the time flag from 264.
  for (unsigned int stamp : {256u, 257u, 258u, 259u, 263u, 264u}) {
    for (std::uint32_t marker : {0u, 0xFFFFFFFFu}) {
      SCOPED_TRACE(stamp);
      const Bytes block = RawBlock(stamp, marker);
      curve = ReadBounded(block);
      ASSERT_NE(curve, nullptr) << marker;
      EXPECT_EQ(Shown(*curve), (std::vector<double>{1, 2, 2, 0, 0, 3, -1, -1, 0, 0}));
      info.mask = 0x7F;
      curve->GetFCurveInfo(&info);
      EXPECT_EQ(info.minClamp, -8.0);
      EXPECT_EQ(info.extrapolation, stamp >= 258 ? 4u : 1u);
      EXPECT_EQ(curve->IsReadOnly(), stamp >= 258 ? 1u : 0u);
      EXPECT_EQ(curve->IsTimeFCurve(), stamp >= 264 ? 0u : 1u);
      EXPECT_EQ(curve->ReadFromBufferBody(block.data() + 4), block.size() - 4);
    }
  }
}

TEST(KeyedKindsBuffer, RefusedBlocksLeaveTheCurveAlone) {
  const Bytes boolean = StepBlock(258, true, 1, 0, {{1.0, 1}}, 0);
  std::vector<Bytes> refusedBoolean;
  for (std::size_t at = 12; at < 28; ++at) {
    Bytes b = boolean;
    b[at] ^= 0x01;  // one identifier byte off
    refusedBoolean.push_back(b);
  }
  for (std::uint32_t stamp : {256u, 0xFFFFFFFFu}) {
    Bytes b = boolean;
    for (int i = 0; i < 4; ++i)
      b[4 + i] = static_cast<unsigned char>(stamp >> (8 * i));
    refusedBoolean.push_back(b);
  }
  ZvBooleanFCurve target(0.0);
  target.CreateKey(4.0, 1.0);
  const Bytes before = Block(target);
  for (const Bytes& b : refusedBoolean) {
    EXPECT_EQ(target.ReadFromBufferBody(b.data() + 4), 0u);
    EXPECT_EQ(target.ReadFromBuffer(b.data(), b.size()), 0u);
    EXPECT_EQ(ReadBounded(b), nullptr);
  }
  EXPECT_EQ(Block(target), before);

  // Raw: a stamp below 256, another kind, a wrong tag.
  const Bytes raw = RawBlock(264, 0);
  std::vector<Bytes> refusedRaw(4, raw);
  refusedRaw[0][5] = 0;                 // stamp 8
  refusedRaw[1][8] = 20;                // the standard kind, which the raw reader refuses
  refusedRaw[2][raw.size() - 20] ^= 1;  // tag 258
  refusedRaw[3][raw.size() - 5] ^= 1;   // tag 264
  ZvRawFCurve rawTarget(0.0, 1.0, 2.0, 3.0);
  const Bytes rawBefore = Block(rawTarget);
  for (const Bytes& b : refusedRaw) {
    EXPECT_EQ(rawTarget.ReadFromBufferBody(b.data() + 4), 0u);
    EXPECT_EQ(rawTarget.ReadFromBuffer(b.data(), b.size()), 0u);
  }
  EXPECT_EQ(Block(rawTarget), rawBefore);
}
