// The rotation view's block: exact bytes, random round trips, the older form without the
// component, the shared rotation curve that a read replaces, and refused blocks.
#include <zv/quat_fcurve.h>

#include <gtest/gtest.h>

#include <memory>
#include <random>

#include "tests/fcurve/curve_blocks.h"

namespace {

// Every field of every key, compared bit for bit.
void ExpectSameRotation(const ZvQuatCurve& a, const ZvQuatCurve& b) {
  ASSERT_EQ(a.GetNumKeys(), b.GetNumKeys());
  for (unsigned int i = 0; i < a.GetNumKeys(); ++i) {
    const ZvQuatKey &ka = a.GetKeys()[i], &kb = b.GetKeys()[i];
    EXPECT_EQ(std::memcmp(&ka.time, &kb.time, 8), 0) << i;
    EXPECT_EQ(std::memcmp(&ka.angles, &kb.angles, 24), 0) << i;
    EXPECT_EQ(std::memcmp(&ka.tension, &kb.tension, 4), 0) << i;
    EXPECT_EQ(std::memcmp(&ka.continuity, &kb.continuity, 4), 0) << i;
    EXPECT_EQ(std::memcmp(&ka.bias, &kb.bias, 4), 0) << i;
    EXPECT_EQ(ka.flags, kb.flags) << i;
  }
  EXPECT_EQ(a.GetExtrapolationMethod(), b.GetExtrapolationMethod());
  EXPECT_EQ(a.IsReadOnly(), b.IsReadOnly());
}

}  // namespace

TEST(QuatCurveBuffer, AFixedViewWritesTheseBytes) {
  ZvQuatFCurve view(1);
  ZvQuatCurve& rotation = *view.GetQuatCurve();
  rotation.SetKey(ZvQuatKey(1.0, {0.5, -0.25, 2.0}, 0.5f, 0.0f, -1.0f, 3), 0.0);
  rotation.SetValueLock(0, 1);
  const Bytes block = HexBytes(
      "69 00 00 00  31 30 31 30  28 00 00 00  01 00 00 00  01 00 00 00"
      // time, three angles, tension, continuity, bias, spins, value lock (2), zero
      "00 00 00 00 00 00 f0 3f  00 00 00 00 00 00 e0 3f  00 00 00 00 00 00 d0 bf"
      "00 00 00 00 00 00 00 40  00 00 00 3f  00 00 00 00  00 00 80 bf  03 00  02  00"
      "00 00 00 00 00 00 00 00  00 00 00 00 00 00 00 00  00 00 00 00 00 00 00 00"
      "00 00 00 00  01 00 00 00  05 00 00 00  00 01 00 00  00");
  EXPECT_EQ(Block(view), block);

  // A read replaces the rotation that every view of it shows.
  ZvQuatFCurve reader(2);
  ZvQuatFCurve sibling(reader.GetQuatCurve(), 0);
  EXPECT_EQ(reader.ReadFromBufferBody(block.data() + 4), block.size() - 4);
  EXPECT_EQ(reader.GetComponent(), 1u);
  EXPECT_EQ(sibling.GetNumKeys(), 1u);
  EXPECT_NEAR(sibling.Eval(1.0, 0), 0.5 * 57.29577951308232, 1e-9);
  EXPECT_EQ(Block(reader), block);
}

TEST(QuatCurveBuffer, RandomViewsComeBackEqual) {
  std::mt19937 random(13);
  std::uniform_real_distribution<double> angle(-7.0, 7.0);
  std::uniform_real_distribution<float> parameter(-1.0f, 1.0f);
  for (int round = 0; round < 30; ++round) {
    ZvQuatFCurve view(random() % 3);
    ZvQuatCurve& rotation = *view.GetQuatCurve();
    double t = angle(random);
    for (int i = static_cast<int>(random() % 8); i > 0; --i) {
      t += 0.05 + std::fabs(angle(random));
      const unsigned int at = rotation.SetKey(
          ZvQuatKey(t, {angle(random), angle(random), angle(random)}, parameter(random),
                    parameter(random), parameter(random), static_cast<int>(random() % 16384)),
          0.0);
      rotation.SetConstraintData(at, random() % 8);
      if (random() % 3 == 0) {
        double p = t;
        view.SetKeyUserData(p, MakeUID(random() % 3), TextBytes("q"), 1, 0.0);
      }
    }
    rotation.SetValueWhenNoKeys({angle(random), angle(random), angle(random)});
    rotation.SetExtrapolationMethod(1 + random() % 4);
    if (random() % 2) view.SetFCurveUserData(MakeUID(4), TextBytes("view"), 4);
    rotation.SetReadOnlyConstraint(random() % 2);

    const Bytes block = Block(view);
    unsigned int consumed = 0;
    std::unique_ptr<ZvBaseFCurve> read(
        ZvBaseFCurve_CreateFromBuffer(block.data(), block.size(), consumed));
    ASSERT_NE(read, nullptr) << "round " << round;
    EXPECT_EQ(consumed, block.size());
    const ZvQuatFCurve& back = static_cast<const ZvQuatFCurve&>(*read);
    EXPECT_EQ(back.GetComponent(), view.GetComponent());
    ExpectSameRotation(*back.GetQuatCurve(), rotation);
    for (double x = -10.0; x < 60.0; x += 0.61)
      EXPECT_EQ(back.Eval(x, 0), view.Eval(x, 0)) << "round " << round << " at " << x;
    EXPECT_EQ(Block(back), block) << "round " << round;
  }
}

TEST(QuatCurveBuffer, TheOlderFormKeepsTheComponent) {
  const Bytes block = QuatBlockWithoutComponent();
  ZvQuatFCurve view(2);
  EXPECT_EQ(view.ReadFromBuffer(block.data(), block.size()), block.size());
  EXPECT_EQ(view.GetComponent(), 2u);
  const ZvQuatCurve& rotation = *view.GetQuatCurve();
  ASSERT_EQ(rotation.GetNumKeys(), 2u);
  EXPECT_EQ(rotation.GetKeyTime(0), 1.0);
  EXPECT_EQ(rotation.GetKeys()[1].GetSpins(), 5);
  EXPECT_EQ(rotation.IsParamLocked(1), 1);
  EXPECT_EQ(rotation.IsValueLocked(1), 0);
  EXPECT_EQ(rotation.GetExtrapolationMethod(), 3u);
  EXPECT_EQ(rotation.GetValueWhenNoKeys().z, 0.3);
}

TEST(QuatCurveBuffer, RefusedBlocksLeaveTheViewAlone) {
  ZvQuatFCurve source(0);
  source.GetQuatCurve()->SetKey(1.0, {0.1, 0.2, 0.3}, 0.0);
  const Bytes good = Block(source);
  std::vector<Bytes> refused(3, good);
  refused[0][4] = '2';  // stamp "2010"
  refused[1][8] = 20;   // the standard kind behind a rotation stamp
  refused[2].resize(good.size() - 1);
  refused[2][0] = static_cast<unsigned char>(refused[2].size() - 4);  // the user data cut short

  ZvQuatFCurve target(1);
  target.CreateKey(5.0, 30.0);
  const Bytes before = Block(target);
  for (const Bytes& b : refused) {
    EXPECT_EQ(target.ReadFromBuffer(b.data(), b.size()), 0u);
    unsigned int consumed = 7;
    EXPECT_EQ(ZvBaseFCurve_CreateFromBuffer(b.data(), b.size(), consumed), nullptr);
    EXPECT_EQ(consumed, 0u);
  }
  for (std::size_t i = 0; i < 2; ++i)
    EXPECT_EQ(target.ReadFromBufferBody(refused[i].data() + 4), 0u);
  EXPECT_EQ(Block(target), before);
}
