#include "fcurve/key_params.h"
#include "tests/fcurve/test_fcurve.h"
#include "tests/fcurve/uid.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <memory>

TEST(BaseFCurve, ConstraintCodesMapToKeyFlagBits) {
  // code -> KeyFlags bits, in the order of the codes.
  const unsigned int expected[][2] = {
      {1, 4},    {2, 2},     {4, 1},     {8, 8},      {16, 16},     {32, 30},     {64, 32},
      {128, 64}, {256, 128}, {512, 256}, {1024, 512}, {2048, 1024}, {4096, 2048}, {8192, 1024}};
  for (const auto& e : expected)
    EXPECT_EQ(zvKeyFlagsOfConstraint(e[0]), e[1]) << "code " << e[0];
  EXPECT_EQ(zvKeyFlagsOfConstraint(0), 0);
  EXPECT_EQ(zvKeyFlagsOfConstraint(3), 0);
  EXPECT_EQ(zvKeyFlagsOfConstraint(16384), 0);

  EXPECT_EQ(zvKeyFlagsOfConstraints(ZvBaseFCurve::ParameterLock | ZvBaseFCurve::ValueLock), 6);
  EXPECT_EQ(zvKeyFlagsOfConstraints(2048 | 8192), 1024);
  EXPECT_EQ(zvKeyFlagsOfConstraints(0xFFFFFFFFu), 4095);

  // The whole-key lock reads true only with all four locks.
  EXPECT_EQ(zvKeyFlagsHaveConstraint(30, ZvBaseFCurve::WholeKeyLock), 1);
  EXPECT_EQ(zvKeyFlagsHaveConstraint(28, ZvBaseFCurve::WholeKeyLock), 0);
  EXPECT_EQ(zvKeyFlagsHaveConstraint(2, ZvBaseFCurve::ValueLock), 1);
  EXPECT_EQ(zvKeyFlagsHaveConstraint(1024, ZvBaseFCurve::ChordTangentAlias), 1);
  EXPECT_EQ(zvKeyFlagsHaveConstraint(0xFFFF, 3), 0);
}

TEST(BaseFCurve, ParameterIdentityIsWithinOneEMinusFifteen) {
  EXPECT_TRUE(zvIsSameParameter(1.0, 1.0 + 8e-16));
  EXPECT_TRUE(zvIsSameParameter(0.0, -1e-15));
  EXPECT_FALSE(zvIsSameParameter(0.0, 2e-15));
  const double nan = std::numeric_limits<double>::quiet_NaN();
  EXPECT_FALSE(zvIsSameParameter(nan, nan));
  EXPECT_FALSE(zvIsSameParameter(0.0, nan));
}

TEST(BaseFCurve, LockCountFollowsNestedLocks) {
  TestFCurve curve({0.0});
  EXPECT_EQ(curve.GetLockCount(), 0u);
  curve.Lock();
  curve.Lock();
  EXPECT_EQ(curve.GetLockCount(), 2u);
  // Operations inside a held lock nest on it and give it back.
  EXPECT_EQ(curve.SetFCurveUserData(MakeUID(1), TextBytes("a"), 1), 1u);
  EXPECT_EQ(curve.GetLockCount(), 2u);
  curve.Unlock();
  curve.Unlock();
  EXPECT_EQ(curve.GetLockCount(), 0u);
  curve.Unlock();  // nothing held: refused
  EXPECT_EQ(curve.GetLockCount(), 0u);
}

TEST(BaseFCurve, CurveLevelUserData) {
  TestFCurve curve;
  const unsigned char* data = nullptr;
  unsigned int size = 0;
  EXPECT_EQ(curve.GetFCurveUserData(MakeUID(1), data, size), 0u);
  EXPECT_EQ(curve.RemoveFCurveUserData(MakeUID(1)), 0u);
  EXPECT_EQ(curve.HasUserData(), 0u);

  // A curve without keys takes curve-level items and creates the store.
  EXPECT_EQ(curve.SetFCurveUserData(MakeUID(1), TextBytes("first"), 5), 1u);
  EXPECT_EQ(curve.SetFCurveUserData(MakeUID(1), TextBytes("second"), 6), 1u);
  ASSERT_EQ(curve.GetFCurveUserData(MakeUID(1), data, size), 1u);
  EXPECT_EQ(AsString(data, size), "second");
  // The pointer is into the store: a second read gives the same one.
  const unsigned char* again = nullptr;
  curve.GetFCurveUserData(MakeUID(1), again, size);
  EXPECT_EQ(again, data);

  EXPECT_EQ(curve.RemoveFCurveUserData(MakeUID(1)), 1u);
  EXPECT_EQ(curve.GetFCurveUserData(MakeUID(1), data, size), 0u);
  EXPECT_EQ(curve.HasUserData(), 1u);  // the store stays
}

TEST(BaseFCurve, KeyUserDataSnapsToTheNearestKey) {
  TestFCurve empty;
  double t = 0.0;
  EXPECT_EQ(empty.SetKeyUserData(t, MakeUID(1), TextBytes("a"), 1, 1.0), 0u);
  EXPECT_EQ(empty.HasUserData(), 0u);  // no store created

  TestFCurve curve({1.0, 2.0, 3.0});
  t = 2.3;
  EXPECT_EQ(curve.SetKeyUserData(t, MakeUID(1), TextBytes("two"), 3, 0.5), 1u);
  EXPECT_EQ(t, 2.0);
  t = 2.6;
  EXPECT_EQ(curve.SetKeyUserData(t, MakeUID(1), TextBytes("x"), 1, 0.1), 0u);
  EXPECT_EQ(t, 2.6);  // no key in reach: left alone
  EXPECT_EQ(curve.HasUserData(2.0), 1u);
  EXPECT_EQ(curve.HasUserData(2.0 + 1e-15), 0u);  // the per-key map is exact
  EXPECT_EQ(curve.HasUserData(3.0), 0u);

  const unsigned char* data = nullptr;
  unsigned int size = 0;
  t = 1.9;
  ASSERT_EQ(curve.GetKeyUserData(t, MakeUID(1), data, size, 0.2), 1u);
  EXPECT_EQ(t, 2.0);
  EXPECT_EQ(AsString(data, size), "two");
  t = 1.0;
  EXPECT_EQ(curve.GetKeyUserData(t, MakeUID(1), data, size, 0.0), 0u);
  EXPECT_EQ(curve.GetKeyUserData(t, MakeUID(2), data, size, 5.0), 0u);

  // The set goes with its last item.
  t = 2.0;
  curve.SetKeyUserData(t, MakeUID(2), TextBytes("b"), 1, 0.0);
  t = 2.1;
  EXPECT_EQ(curve.RemoveKeyUserData(t, MakeUID(1), 0.2), 1u);
  EXPECT_EQ(t, 2.0);
  EXPECT_EQ(curve.HasUserData(2.0), 1u);
  EXPECT_EQ(curve.RemoveKeyUserData(t, MakeUID(2), 0.0), 1u);
  EXPECT_EQ(curve.HasUserData(2.0), 0u);
  EXPECT_EQ(curve.GetUserDataSet(2.0), nullptr);
  EXPECT_EQ(curve.RemoveKeyUserData(t, MakeUID(2), 0.0), 0u);
}

TEST(BaseFCurve, WholeKeySetsAndCopies) {
  TestFCurve curve({1.0, 2.0});
  CFCUserDataSet set;
  set.SetUserData(MakeUID(1), TextBytes("one"), 3);
  set.SetUserData(MakeUID(2), TextBytes("two"), 3);
  EXPECT_EQ(curve.SetUserDataSet(set, 1.0), 1u);
  set.RemoveAllUserData();  // the curve holds a copy
  const CFCUserDataSet* held = curve.GetUserDataSet(1.0);
  ASSERT_NE(held, nullptr);
  EXPECT_EQ(held->GetCount(), 2u);

  // Copying merges into what the target key has, from another curve or the same.
  TestFCurve other({5.0});
  double t = 5.0;
  other.SetKeyUserData(t, MakeUID(2), TextBytes("old"), 3, 0.0);
  other.SetKeyUserData(t, MakeUID(3), TextBytes("three"), 5, 0.0);
  EXPECT_EQ(other.CopyKeyUserData(curve, 1.0, 5.0), 1u);
  const CFCUserDataSet* merged = other.GetUserDataSet(5.0);
  ASSERT_NE(merged, nullptr);
  EXPECT_EQ(merged->GetCount(), 3u);
  EXPECT_EQ(AsString(merged->FindUserData(MakeUID(2))), "two");
  EXPECT_EQ(curve.CopyKeyUserData(curve, 1.0, 2.0), 1u);
  EXPECT_EQ(curve.GetUserDataSet(2.0)->GetCount(), 2u);
  EXPECT_EQ(curve.CopyKeyUserData(curve, 1.0, 1.0), 1u);
  EXPECT_EQ(curve.GetUserDataSet(1.0)->GetCount(), 2u);
  // Nothing at the source: still 1, nothing made.
  EXPECT_EQ(other.CopyKeyUserData(curve, 7.0, 1.5), 1u);
  EXPECT_EQ(other.GetUserDataSet(1.5), nullptr);

  // An empty set removes the key's entry.
  EXPECT_EQ(curve.SetUserDataSet(CFCUserDataSet(), 2.0), 1u);
  EXPECT_EQ(curve.HasUserData(2.0), 0u);
  EXPECT_EQ(curve.RemoveKeyUserData(1.0), 1u);
  EXPECT_EQ(curve.RemoveKeyUserData(1.0), 0u);

  TestFCurve bare({1.0});
  EXPECT_EQ(bare.SetUserDataSet(CFCUserDataSet(), 1.0), 1u);
  EXPECT_EQ(bare.HasUserData(), 0u);
}

TEST(BaseFCurve, HasKeyUserDataNeedsAKey) {
  TestFCurve curve;
  CFCUserDataSet set;
  set.SetUserData(MakeUID(1), TextBytes("a"), 1);
  curve.SetUserDataSet(set, 1.0);
  EXPECT_EQ(curve.HasUserData(1.0), 0u);  // no keys at all
  EXPECT_NE(curve.GetUserDataSet(1.0), nullptr);
}

TEST(BaseFCurve, CopyAssignAndExchangeAreDeep) {
  TestFCurve a({0.0, 1.0});
  a.SetFCurveUserData(MakeUID(1), TextBytes("curve"), 5);
  double t = 1.0;
  a.SetKeyUserData(t, MakeUID(2), TextBytes("key"), 3, 0.0);

  std::unique_ptr<ZvBaseFCurve> clone(a.Clone());
  a.RemoveAllKeyUserData();
  a.SetFCurveUserData(MakeUID(1), TextBytes("changed"), 7);
  const unsigned char* data = nullptr;
  unsigned int size = 0;
  ASSERT_EQ(clone->GetFCurveUserData(MakeUID(1), data, size), 1u);
  EXPECT_EQ(AsString(data, size), "curve");
  EXPECT_EQ(clone->HasUserData(1.0), 1u);
  EXPECT_EQ(a.HasUserData(1.0), 0u);
  EXPECT_EQ(a.GetFCurveUserData(MakeUID(1), data, size), 1u);  // curve-level items stay

  TestFCurve b({1.0});
  b = *clone;
  EXPECT_EQ(b.HasUserData(1.0), 1u);
  const ZvBaseFCurve& self = b;
  b = self;  // self-assignment keeps everything
  EXPECT_EQ(b.HasUserData(1.0), 1u);
  TestFCurve none;
  b = none;  // a source without store leaves none
  EXPECT_EQ(b.HasUserData(), 0u);

  TestFCurve c({1.0});
  EXPECT_EQ(c.ExchangeUserData(*clone), 1u);
  EXPECT_EQ(c.HasUserData(1.0), 1u);
  EXPECT_EQ(clone->HasUserData(), 0u);
  EXPECT_EQ(c.ExchangeUserData(c), 1u);
  EXPECT_EQ(c.HasUserData(1.0), 1u);
  EXPECT_EQ(c.GetLockCount(), 0u);
}
