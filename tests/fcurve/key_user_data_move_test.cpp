#include "tests/fcurve/test_fcurve.h"
#include "tests/fcurve/uid.h"

#include <gtest/gtest.h>

#include <limits>
#include <string>
#include <utility>
#include <vector>

namespace {

// Puts the text as item 1 on the key at each parameter.
void Tag(ZvBaseFCurve& curve, const std::vector<std::pair<double, std::string>>& tags) {
  for (const auto& tag : tags) {
    CFCUserDataSet set;
    set.SetUserData(MakeUID(1), TextBytes(tag.second), Size(tag.second));
    curve.SetUserDataSet(set, tag.first);
  }
}

// (parameter, item 1) of every key set, in parameter order.
std::vector<std::pair<double, std::string>> Entries(const ZvBaseFCurve& curve,
                                                    const std::vector<double>& candidates) {
  std::vector<std::pair<double, std::string>> out;
  for (double t : candidates)
    if (const CFCUserDataSet* set = curve.GetUserDataSet(t))
      out.emplace_back(t, AsString(set->FindUserData(MakeUID(1))));
  return out;
}

ZvDoubleArray Array(const std::vector<double>& values) {
  ZvDoubleArray a;
  for (double v : values)
    a.Add(v);
  return a;
}

typedef std::vector<std::pair<double, std::string>> EntryList;

}  // namespace

TEST(KeyUserDataMove, TranslateAndScaleCarryTheSetsThemselves) {
  TestFCurve curve({1.0, 2.0, 3.0});
  Tag(curve, {{1.0, "a"}, {3.0, "c"}});
  const CFCUserDataSet* first = curve.GetUserDataSet(1.0);

  EXPECT_EQ(curve.ShiftParameters(0.25), 1u);
  EXPECT_EQ(Entries(curve, {1.0, 1.25, 3.0, 3.25}), (EntryList{{1.25, "a"}, {3.25, "c"}}));
  EXPECT_EQ(curve.GetUserDataSet(1.25), first);  // moved, not copied

  EXPECT_EQ(curve.ScaleParameterAxis(4.0), 1u);
  EXPECT_EQ(Entries(curve, {1.25, 5.0, 13.0}), (EntryList{{5.0, "a"}, {13.0, "c"}}));
  // Every set sits on exactly the parameter of a key.
  for (double key : curve.Keys())
    EXPECT_EQ(curve.HasUserData(key), key != 9.0 ? 1u : 0u) << key;

  // Parameters that collapse onto one share a set: the later items win.
  EXPECT_EQ(curve.ScaleAllKeyUserData(0.0), 1u);
  EXPECT_EQ(Entries(curve, {0.0, 5.0, 13.0}), (EntryList{{0.0, "c"}}));

  TestFCurve bare({1.0});
  EXPECT_EQ(bare.TranslateAllKeyUserData(1.0), 1u);
  EXPECT_EQ(bare.HasUserData(), 0u);
}

TEST(KeyUserDataMove, TailMergesIntoTheKeyItLandsOn) {
  // A cut of [1, 3] on keys 0..4: key 2 went with its data, keys 3 and 4
  // slide down by 2, and key 3 lands on key 1.
  TestFCurve curve({0.0, 1.0, 2.0, 3.0, 4.0});
  Tag(curve, {{0.0, "k0"}, {1.0, "k1"}, {3.0, "k3"}, {4.0, "k4"}});
  double t = 1.0;
  curve.SetKeyUserData(t, MakeUID(2), TextBytes("only1"), 5, 0.0);
  t = 3.0;
  curve.SetKeyUserData(t, MakeUID(3), TextBytes("only3"), 5, 0.0);

  EXPECT_EQ(curve.MoveKeyUserDataTail(Array({3.0, 4.0}), Array({1.0 + 4e-16, 2.0})), 1u);
  EXPECT_EQ(Entries(curve, {0.0, 1.0, 1.0 + 4e-16, 2.0, 3.0, 4.0}),
            (EntryList{{0.0, "k0"}, {1.0, "k3"}, {2.0, "k4"}}));
  const CFCUserDataSet* merged = curve.GetUserDataSet(1.0);
  ASSERT_NE(merged, nullptr);
  EXPECT_EQ(merged->GetCount(), 3u);
  EXPECT_NE(merged->FindUserData(MakeUID(2)), nullptr);
  EXPECT_NE(merged->FindUserData(MakeUID(3)), nullptr);
  EXPECT_EQ(curve.GetLockCount(), 0u);
}

TEST(KeyUserDataMove, TailOutsideTheToleranceStaysApart) {
  TestFCurve curve({1.0, 2.0});
  Tag(curve, {{1.0, "a"}, {2.0, "b"}});
  EXPECT_EQ(curve.MoveKeyUserDataTail(Array({2.0}), Array({1.0 + 3e-15})), 1u);
  EXPECT_EQ(Entries(curve, {1.0, 1.0 + 3e-15, 2.0}), (EntryList{{1.0, "a"}, {1.0 + 3e-15, "b"}}));
}

TEST(KeyUserDataMove, TailSetsFollowTheirOwnOldParameter) {
  // The first listed key has no data: the others still go where their own
  // key goes, not one slot off.
  TestFCurve curve({1.0, 2.0, 3.0, 4.0});
  Tag(curve, {{1.0, "a"}, {3.0, "c"}, {4.0, "d"}});
  EXPECT_EQ(curve.MoveKeyUserDataTail(Array({2.0, 3.0, 4.0}), Array({2.5, 3.5, 4.5})), 1u);
  EXPECT_EQ(Entries(curve, {1.0, 2.5, 3.0, 3.5, 4.0, 4.5}),
            (EntryList{{1.0, "a"}, {3.5, "c"}, {4.5, "d"}}));

  // A set that the lists do not name stays where it is.
  EXPECT_EQ(curve.MoveKeyUserDataTail(Array({3.5}), Array({6.0})), 1u);
  EXPECT_EQ(Entries(curve, {1.0, 3.5, 4.5, 6.0}), (EntryList{{1.0, "a"}, {4.5, "d"}, {6.0, "c"}}));
}

TEST(KeyUserDataMove, TailRefusalsAndTheEmptyList) {
  TestFCurve curve({1.0, 2.0});
  Tag(curve, {{2.0, "b"}});
  EXPECT_EQ(curve.MoveKeyUserDataTail(Array({2.0}), Array({3.0, 4.0})), 0u);
  EXPECT_EQ(Entries(curve, {2.0, 3.0}), (EntryList{{2.0, "b"}}));
  EXPECT_EQ(curve.GetLockCount(), 0u);

  // The empty list answers at once and leaves the curve locked once more.
  EXPECT_EQ(curve.MoveKeyUserDataTail(Array({}), Array({})), 1u);
  EXPECT_EQ(curve.GetLockCount(), 1u);
  curve.Unlock();
  EXPECT_EQ(curve.GetLockCount(), 0u);

  TestFCurve bare({1.0});
  EXPECT_EQ(bare.MoveKeyUserDataTail(Array({1.0}), Array({2.0})), 1u);
  EXPECT_EQ(bare.HasUserData(), 0u);
}

// A NaN orders equal to everything in a map: it must never reach one.
TEST(KeyUserDataMove, NonFiniteParametersAreRefused) {
  const double nan = std::numeric_limits<double>::quiet_NaN();
  const double inf = std::numeric_limits<double>::infinity();
  TestFCurve curve({1.0, 2.0});
  Tag(curve, {{1.0, "a"}, {2.0, "b"}});
  EXPECT_EQ(curve.GetUserDataSet(nan), nullptr);
  EXPECT_EQ(curve.HasUserData(nan), 0u);
  EXPECT_EQ(curve.RemoveKeyUserData(nan), 0u);
  CFCUserDataSet set;
  set.SetUserData(MakeUID(1), TextBytes("n"), 1);
  EXPECT_EQ(curve.SetUserDataSet(set, nan), 0u);
  EXPECT_EQ(curve.CopyKeyUserData(curve, 1.0, nan), 1u);
  EXPECT_EQ(curve.MoveKeyUserDataTail(Array({2.0}), Array({nan})), 0u);
  EXPECT_EQ(curve.TranslateAllKeyUserData(inf), 0u);
  EXPECT_EQ(curve.ScaleAllKeyUserData(nan), 0u);
  EXPECT_EQ(Entries(curve, {1.0, 2.0}), (EntryList{{1.0, "a"}, {2.0, "b"}}));
  EXPECT_EQ(curve.GetLockCount(), 0u);
}
