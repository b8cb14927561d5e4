// The standard curve's block: exact bytes, round trips of random curves, every older version and
// the repairs it gets, and refused blocks.
#include <zv/std_fcurve.h>

#include <gtest/gtest.h>

#include <cfloat>
#include <cmath>
#include <limits>
#include <random>

#include "tests/fcurve/curve_blocks.h"

namespace {

struct KeyState {
  ZvBaseFCurve::KeyInfo info;
  int flags[13];
};

// Everything a key shows through the interface: values, actual handles, kind and every flag.
std::vector<KeyState> Keys(const ZvStdFCurve& curve) {
  std::vector<KeyState> keys(curve.GetNumKeys());
  for (unsigned int i = 0; i < keys.size(); ++i) {
    keys[i].info.mask = 0x1FF;
    curve.GetKeyInfoFromIndex(i, &keys[i].info);
    for (int bit = 0; bit < 13; ++bit)
      curve.GetConstraintAtIndex(i, ZvBaseFCurve::KeyConstraint(1 << bit), keys[i].flags[bit]);
  }
  return keys;
}

void ExpectSameKeys(const ZvStdFCurve& a, const ZvStdFCurve& b) {
  const std::vector<KeyState> ka = Keys(a), kb = Keys(b);
  ASSERT_EQ(ka.size(), kb.size());
  for (std::size_t i = 0; i < ka.size(); ++i) {
    EXPECT_EQ(std::memcmp(&ka[i].info.parameter, &kb[i].info.parameter, 7 * sizeof(double)), 0)
        << "key " << i;
    EXPECT_EQ(ka[i].info.segmentKind, kb[i].info.segmentKind) << "key " << i;
    EXPECT_EQ(std::memcmp(ka[i].flags, kb[i].flags, sizeof ka[i].flags), 0) << "key " << i;
  }
}

// Reads a body that should be taken whole but for the bytes its writer left unwritten.
ZvStdFCurve Read(const Bytes& block, unsigned int unwritten = 0) {
  ZvStdFCurve curve;
  EXPECT_EQ(curve.ReadFromBufferBody(block.data() + 4), block.size() - 4 - unwritten);
  return curve;
}

int Flag(const ZvStdFCurve& curve, unsigned int key, ZvBaseFCurve::KeyConstraint c) {
  int on = -1;
  curve.GetConstraintAtIndex(key, c, on);
  return on;
}

}  // namespace

TEST(StdCurveBuffer, FixedCurvesWriteTheseBytes) {
  // No keys, no user data: 77 bytes, of which the reader takes 69 after the length field.
  const Bytes empty = HexBytes(
      "49 00 00 00  08 01 00 00  14 00 00 00  00 00 00 00 00 00 00 00"
      "ff ff ff ff ff ff ef ff  ff ff ff ff ff ff ef 7f  03 00 00 00  00 00 00 00"
      "01 01 00 00  03 01 00 00  01 00  05 00 00 00  00 01 00 00  00"
      "06 01 00 00  00  08 01 00 00  01  00 00 00 00");
  EXPECT_EQ(Block(ZvStdFCurve()), empty);
  EXPECT_EQ(ZvStdFCurve().ReadFromBufferBody(empty.data() + 4), 69u);

  // One key at 1 with left value 2 and right value 3, a parameter lock, clamps, linear
  // extrapolation and one curve-level item "hi".
  ZvStdFCurve curve(1.0, 2.0, 3.0, ZvBaseFCurve::ConstantSegment, ZvBaseFCurve::LinearSegment);
  curve.SetClampingValues(-4.0, 8.0);
  curve.SetExtrapolationMethod(ZvBaseFCurve::LinearExtrapolation);
  double t = 1.0;
  curve.SetConstraint(t, ZvBaseFCurve::ParameterLock, 1, 0.0);
  _zvUID uid = {0x01020304, 0x0506, 0x0708, {9, 10, 11, 12, 13, 14, 15, 16}};
  curve.SetFCurveUserData(uid, TextBytes("hi"), 2);
  const Bytes block = HexBytes(
      "ad 00 00 00  08 01 00 00  14 00 00 00"
      "00 00 00 00 00 00 00 40  00 00 00 00 00 00 10 c0  00 00 00 00 00 00 20 40"
      "01 00 00 00  01 00 00 00"
      // the key: parameter, values, left handle, right handle, segment kind
      "00 00 00 00 00 00 f0 3f  00 00 00 00 00 00 00 40  00 00 00 00 00 00 08 40"
      "00 00 00 00 00 00 f0 3f  00 00 00 00 00 00 00 40"
      "00 00 00 00 00 00 f0 3f  00 00 00 00 00 00 08 40  02 00 00 00"
      "01 01 00 00  05 00  03 01 00 00  02 00  00 00"
      // user data: one curve-level set of one item
      "29 00 00 00  00 01 00 00  01 01"
      "1e 00 00 00  00 01 00 00  01 00 00 00"
      "04 03 02 01 06 05 08 07  09 0a 0b 0c 0d 0e 0f 10  02 00 00 00  68 69  00"
      "06 01 00 00  00  08 01 00 00  01  00 00 00 00");
  EXPECT_EQ(Block(curve), block);
  const ZvStdFCurve back = Read(block, 4);
  EXPECT_EQ(Block(back), block);
}

TEST(StdCurveBuffer, RandomCurvesComeBackEqual) {
  std::mt19937 random(15);
  std::uniform_real_distribution<double> value(-5.0, 5.0);
  for (int round = 0; round < 40; ++round) {
    ZvStdFCurve curve(value(random), ZvBaseFCurve::FSKind(1 + random() % 3));
    const int n = static_cast<int>(random() % 12);
    double t = value(random);
    for (int i = 0; i < n; ++i) {
      t += 0.1 + std::fabs(value(random));
      curve.CreateKey(t, value(random));
    }
    for (int i = 0; i < n; ++i) {
      curve.SetSegmentKindAtIndex(i, ZvBaseFCurve::FSKind(1 + random() % 3));
      // Reading keeps continuity only where the handles agree (tested with the older versions);
      // these keys claim none, and take any other flag.
      curve.SetConstraintAtIndex(i, ZvBaseFCurve::TangentContinuity, 0);
      int code = 1 << (random() % 13);
      if (code == ZvBaseFCurve::TangentContinuity) code = ZvBaseFCurve::MirroredTangents;
      curve.SetConstraintAtIndex(i, ZvBaseFCurve::KeyConstraint(code), 1);
      if (random() % 3 == 0) {
        double p;
        curve.GetKeyParameter(i, p);
        const std::string data(random() % 5, char('a' + i));
        curve.SetKeyUserData(p, MakeUID(random() % 3), TextBytes(data), Size(data), 0.0);
      }
    }
    curve.SetExtrapolationMethod(ZvBaseFCurve::ExtrapolationMethod(1 + random() % 4));
    const double low = value(random);
    curve.SetClampingValues(low, low + std::fabs(value(random)));
    if (random() % 2) curve.SetFCurveUserData(MakeUID(7), TextBytes("c"), 1);
    curve.SetDefaultBezierTangentConstraint(random() % 2);
    curve.SetAsTimeFCurve(random() % 2);
    curve.SetReadOnlyConstraint(random() % 2);

    const Bytes block = Block(curve);
    unsigned int consumed = 0;
    ZvBaseFCurve* read = ZvBaseFCurve_CreateFromBuffer(block.data(), block.size(), consumed);
    ASSERT_NE(read, nullptr) << "round " << round;
    EXPECT_EQ(consumed, block.size());
    const ZvStdFCurve& back = *static_cast<ZvStdFCurve*>(read);
    ExpectSameKeys(curve, back);
    for (double x = -12.0; x < 80.0; x += 0.37) {
      EXPECT_EQ(curve.Eval(x, 1), back.Eval(x, 1)) << "round " << round << " at " << x;
      EXPECT_EQ(curve.EvalLeft(x, 0), back.EvalLeft(x, 0)) << "round " << round << " at " << x;
    }
    // The rest (user data, settings) shows in the block written again.
    EXPECT_EQ(Block(back), block) << "round " << round;
    delete read;
  }
}

TEST(StdCurveBuffer, FiniteExtremesOfKeyFieldsWriteUnchanged) {
  // Only an all-ones exponent is not finite: the largest double, the smallest subnormal and a
  // negative zero must come back bit for bit.
  StdFields f;
  f.readOnly = 1;
  f.keys[0].left = -0.0;
  f.keys[0].right = std::numeric_limits<double>::denorm_min();
  f.keys[1].left = std::numeric_limits<double>::max();
  f.keys[1].right = std::numeric_limits<double>::lowest();
  const Bytes block = StdBlock(264, f);
  // The written block only adds the four zeroed tail bytes, which its length word counts.
  const Bytes written = Block(Read(block));
  ASSERT_EQ(written.size(), block.size() + 4);
  EXPECT_EQ(Bytes(written.begin() + 4, written.end() - 4), Bytes(block.begin() + 4, block.end()));
}

TEST(StdCurveBuffer, WritingDropsKeysOutOfOrderWithTheirUserData) {
  // A foreign block may hold keys in any order; the curve reads them as they are and writes
  // only those above the last kept one.
  StdFields f;
  f.keys = {{0, 1, 1, 0, 1, 0, 1, 2},
            {2, 2, 2, 2, 2, 2, 2, 2},
            {1, 5, 5, 1, 5, 1, 5, 2},
            {2, 7, 7, 2, 7, 2, 7, 2},
            {3, 0, 0, 3, 0, 3, 0, 2}};
  const std::string item =
      "1d 00 00 00 00 01 00 00 01 00 00 00 01 00 00 00 02 00 03 00"
      "04 05 06 07 08 09 0a 0b 01 00 00 00 ";
  // A set at 1 (a dropped key) and a set at 2 (a kept key and a dropped one).
  f.userData = HexBytes(
      "00 00 00 00 00 01 00 00 01 00 01 02 00 00 00"
      "00 00 00 00 00 00 f0 3f" +
      item +
      "61"
      "00 00 00 00 00 00 00 40" +
      item + "62");
  f.userData[0] = static_cast<unsigned char>(f.userData.size() - 4);
  const Bytes block = StdBlock(264, f);
  ZvStdFCurve curve = Read(block);
  EXPECT_EQ(curve.GetNumKeys(), 5u);
  EXPECT_NE(curve.GetUserDataSet(1.0), nullptr);
  const unsigned int size = curve.GetBufferSize();
  EXPECT_EQ(size, 68 + 64 * 3 + curve.GetUserDataBufferSize());
  ZvDoubleArray parameters;
  curve.GetAllKeyParameters(parameters);
  ASSERT_EQ(parameters.size, 3u);
  EXPECT_EQ(parameters[2], 3.0);
  EXPECT_EQ(curve.GetUserDataSet(1.0), nullptr);
  EXPECT_NE(curve.GetUserDataSet(2.0), nullptr);
  EXPECT_EQ(curve.IsValid(), 1u);
}

TEST(StdCurveBuffer, EveryOlderVersionReadsIntoTodaysFields) {
  const StdFields f;
  for (unsigned int stamp : {1u, 256u, 257u, 258u, 259u, 260u, 261u, 262u, 263u, 264u, 300u}) {
    SCOPED_TRACE(stamp);
    const Bytes block = StdBlock(stamp, f);
    const ZvStdFCurve curve = Read(block);
    ZvBaseFCurve::FCurveInfo info;
    info.mask = 0x7F;
    curve.GetFCurveInfo(&info);
    EXPECT_EQ(info.numKeys, 3u);
    EXPECT_EQ(info.valueWhenNoKeys, 0.5);
    EXPECT_EQ(info.minClamp, stamp == 1 ? -DBL_MAX : -10.0);
    EXPECT_EQ(info.extrapolation, stamp >= 259 ? 2u : 1u);
    EXPECT_EQ(curve.IsReadOnly(), stamp >= 259 ? 1u : 0u);
    EXPECT_EQ(curve.IsDefautlBezierTangentConstraintOn(), stamp >= 262 ? 1u : 0u);
    EXPECT_EQ(curve.IsTimeFCurve(), stamp >= 264 ? 0u : 1u);
    // One byte of flags before 261, the automatic bit only from 260.
    const bool flags = stamp >= 257;
    EXPECT_EQ(Flag(curve, 1, ZvBaseFCurve::TangentContinuity), 1);
    EXPECT_EQ(Flag(curve, 1, ZvBaseFCurve::ParameterLock), flags ? 1 : 0);
    EXPECT_EQ(Flag(curve, 1, ZvBaseFCurve::AutoTangent), stamp >= 260 ? 1 : 0);
    EXPECT_EQ(Flag(curve, 1, ZvBaseFCurve::TangentLengthContinuity), stamp >= 261 ? 1 : 0);
    ZvPoint2<double> left, right;
    ASSERT_EQ(curve.GetActualKeyTgtHandles(1.0, left, right, 0.0), 1u);
    EXPECT_EQ(left.x, -0.25);
    EXPECT_EQ(right.y, 1.0);
    // The extra bytes came with 259; they travel on into today's block.
    const Bytes again = Block(curve);
    const std::size_t extra = 44 + 3 * 60 + 4 + 6 + 4 + 2;
    EXPECT_EQ(again[extra], stamp >= 259 ? 0xA0 : 0);
    EXPECT_EQ(again[extra + 5], stamp >= 259 ? 0x0B : 0);
  }

  // A block of today whose middle key claims continuity over a kink reads without the claim.
  StdFields kink;
  kink.keys[1].rty = 1.0;
  kink.flags = 3;  // KeyFlags: continuity (1) and value lock (2)
  const ZvStdFCurve curve = Read(StdBlock(264, kink));
  EXPECT_EQ(Flag(curve, 0, ZvBaseFCurve::TangentContinuity), 1);
  EXPECT_EQ(Flag(curve, 1, ZvBaseFCurve::TangentContinuity), 0);
  EXPECT_EQ(Flag(curve, 1, ZvBaseFCurve::ValueLock), 1);
}

TEST(StdCurveBuffer, OlderBlocksGetHandlesThatMakeFunctions) {
  // A constant segment whose right handle reaches past the next key, a first key whose left
  // handle points right and a last linear key whose right handle points left.
  StdFields f;
  f.firstSegmentKind = ZvBaseFCurve::ConstantSegment;
  f.keys = {{0, 1, 1, 0.5, 1, 3, 1, 1}, {1, 2, 2, -1, 2, 1.5, 2, 2}, {2, 0, 0, 1.5, 0, 1.5, 0, 2}};
  f.flags = 0;
  for (unsigned int stamp : {256u, 257u, 258u}) {
    SCOPED_TRACE(stamp);
    const Bytes block = StdBlock(stamp, f);
    const ZvStdFCurve curve = Read(block);
    ZvPoint2<double> l0, r0, l1, r1, l2, r2;
    curve.GetActualKeyTgtHandles(0.0, l0, r0, 0.0);
    curve.GetActualKeyTgtHandles(1.0, l1, r1, 0.0);
    curve.GetActualKeyTgtHandles(2.0, l2, r2, 0.0);
    const bool repaired = stamp < 258;
    EXPECT_EQ(l0.x, repaired ? 0.0 : 0.5);
    EXPECT_EQ(r0.x, repaired ? 0.0 : 3.0);
    EXPECT_EQ(l1.x, repaired ? 0.0 : -2.0);
    EXPECT_EQ(r1.x, 0.5);  // the linear segment from key 1 is a function already
    // Put on its key, the last right handle then mirrors the left one.
    EXPECT_EQ(r2.x, repaired ? 0.5 : -0.5);
  }

  // Up to 262 a collapsed outer handle of an end key mirrors its partner through the key.
  f = StdFields();
  f.keys.front().ltx = 0.0;
  f.keys.front().lty = 1.0;
  f.keys.back().rtx = 2.0;
  f.keys.back().rty = 0.0;
  for (unsigned int stamp : {262u, 263u}) {
    const ZvStdFCurve curve = Read(StdBlock(stamp, f));
    ZvPoint2<double> l0, r0, l2, r2;
    curve.GetActualKeyTgtHandles(0.0, l0, r0, 0.0);
    curve.GetActualKeyTgtHandles(2.0, l2, r2, 0.0);
    EXPECT_EQ(l0.x, stamp == 262 ? -0.5 : 0.0) << stamp;
    EXPECT_EQ(l0.y, stamp == 262 ? -0.5 : 0.0) << stamp;
    EXPECT_EQ(r2.x, stamp == 262 ? 0.5 : 0.0) << stamp;
    EXPECT_EQ(r2.y, stamp == 262 ? -0.5 : 0.0) << stamp;
  }
}

TEST(StdCurveBuffer, RefusedBodiesLeaveTheCurveAlone) {
  const Bytes good = StdBlock(264);
  std::vector<Bytes> refused;
  for (unsigned int stamp : {0u, 2u, 255u}) {
    Bytes b = good;
    b[4] = static_cast<unsigned char>(stamp);
    b[5] = 0;
    refused.push_back(b);
  }
  Bytes kind = good;
  kind[8] = ZvBaseFCurve::RawKind;
  refused.push_back(kind);
  // Each tag in turn: 257, 259, 262, 264.
  for (std::size_t at :
       {std::size_t{44 + 180}, std::size_t{44 + 180 + 10}, good.size() - 10, good.size() - 5}) {
    Bytes b = good;
    b[at] ^= 0x40;
    refused.push_back(b);
  }
  Bytes userData = good;
  userData[44 + 180 + 10 + 4 + 2 + 6 + 5] = 0;  // user data version 0
  refused.push_back(userData);
  Bytes oldest = StdBlock(1);
  oldest[oldest.size() - 1] = 1;  // a key record whose last word is not 0
  refused.push_back(oldest);

  ZvStdFCurve target = RichStdCurve();
  const Bytes before = Block(target);
  for (std::size_t i = 0; i < refused.size(); ++i) {
    EXPECT_EQ(target.ReadFromBufferBody(refused[i].data() + 4), 0u) << "block " << i;
    EXPECT_EQ(target.ReadFromBuffer(refused[i].data(), refused[i].size()), 0u) << "block " << i;
    EXPECT_EQ(Block(target), before) << "block " << i;
  }
  // A NaN read from a block becomes 0.0.
  StdFields nan;
  nan.valueWhenNoKeys = std::numeric_limits<double>::quiet_NaN();
  nan.keys[0].ltx = -std::numeric_limits<double>::infinity();
  const ZvStdFCurve repaired = Read(StdBlock(264, nan));
  ZvBaseFCurve::FCurveInfo info;
  info.mask = ZvBaseFCurve::FCurveInfo::ValueWhenNoKeysMask;
  repaired.GetFCurveInfo(&info);
  EXPECT_EQ(info.valueWhenNoKeys, 0.0);
  ZvPoint2<double> left, right;
  repaired.GetActualKeyTgtHandles(0.0, left, right, 0.0);
  EXPECT_EQ(left.x, 0.0);
}
