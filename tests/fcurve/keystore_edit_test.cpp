// The engine's editing on the integer store (the simplest complete member), with a standard
// curve as the owner whose per-key user data follows the keys; smoothing runs through a
// standard curve because it writes back through the owner.
#include <gtest/gtest.h>

#include <zv/std_fcurve.h>

#include "fcurve/cfc_base_impl.h"
#include "fcurve/std_fcurve_impl.h"
#include "stdedit_util.h"

#include <vector>

namespace {

using IntStore =
    CFCBaseImpl<int, CFCSingleValueKey<int>, CFCKeyStoreA<int, CFCSingleValueKey<int>>>;
using RawStore =
    CFCBaseImpl<double, CFCSingleValueKey<double>, CFCKeyStoreB<double, CFCSingleValueKey<double>>>;

// The owner answers user data questions only while it has a key; it sits far away.
struct Owner {
  ZvStdFCurve curve;
  Owner() { curve.CreateKey(1000.0, 0.0); }
  void Tag(double parameter, unsigned char byte) {
    CFCUserDataSet set;
    const _zvUID uid = {1, 2, 3, {4, 5, 6, 7, 8, 9, 10, 11}};
    set.SetUserData(uid, &byte, 1);
    curve.SetUserDataSet(set, parameter);
  }
  bool HasTag(double parameter) const { return curve.GetUserDataSet(parameter) != nullptr; }
};

// The parameters of a store's keys in order.
template <class Store>
std::vector<double> Params(const Store& s) {
  std::vector<double> out;
  for (unsigned int i = 0; i < s.keys.size; ++i)
    out.push_back(s.keys[i].parameter);
  return out;
}

using V = std::vector<double>;

IntStore MakeInts(std::initializer_list<std::pair<double, int>> keys) {
  IntStore s;
  unsigned int i = 0;
  for (const auto& k : keys)
    s.InsertKey(i++, k.first, k.second);
  return s;
}

TEST(KeystoreEdit, CreateKeyKeepsTheValueBeforeTheFirstKey) {
  Owner owner;
  IntStore s;
  EXPECT_EQ(s.CreateKey(2.0, 5, owner.curve), 1);
  EXPECT_EQ(s.valueWhenNoKeys, 5);
  EXPECT_EQ(s.valueBeforeFirstKey, 5);
  EXPECT_EQ(s.CreateKey(1.0, 3, owner.curve), 1);  // before the first key
  EXPECT_EQ(s.valueBeforeFirstKey, 3);
  EXPECT_EQ(s.CreateKey(4.0, 9, owner.curve), 1);
  EXPECT_EQ(s.CreateKey(3.0, 7, owner.curve), 1);
  ASSERT_EQ(Params(s), (V{1.0, 2.0, 3.0, 4.0}));
  EXPECT_EQ(s.keys[2].value, 7);
  EXPECT_EQ(s.flags.size, 4u);
  s.SetConstraint(2, ZvBaseFCurve::ValueLock, 1);
  EXPECT_EQ(s.CreateKey(3.0, 8, owner.curve), 0);
  EXPECT_EQ(s.keys[2].value, 7);
  EXPECT_EQ(s.CreateKey(1.0, 4, owner.curve), 1);  // existing first key
  EXPECT_EQ(s.valueBeforeFirstKey, 4);
}

TEST(KeystoreEdit, RemovingKeysKeepsTheFunctionLeftOfTheFirstKey) {
  Owner owner;
  IntStore s = MakeInts({{1.0, 10}, {2.0, 20}});
  owner.Tag(1.0, 1);
  EXPECT_EQ(s.RemoveKey(1.0, 0.0, owner.curve), 1);
  EXPECT_EQ(s.valueBeforeFirstKey, 10);
  EXPECT_FALSE(owner.HasTag(1.0));

  IntStore locked = MakeInts({{1.0, 10}, {2.0, 20}});
  locked.valueBeforeFirstKey = 3;
  locked.SetConstraint(1, ZvBaseFCurve::ValueLock, 1);
  EXPECT_EQ(locked.RemoveKey(1.0, 0.0, owner.curve), 1);
  EXPECT_EQ(locked.valueBeforeFirstKey, 3);  // the locked survivor keeps its step

  IntStore last = MakeInts({{1.0, 10}});
  last.valueWhenNoKeys = 6;
  EXPECT_EQ(last.RemoveKey(1.2, 0.5, owner.curve), 1);
  EXPECT_EQ(last.keys.size, 0u);
  EXPECT_EQ(last.flags.size, 0u);
  EXPECT_EQ(last.valueBeforeFirstKey, 6);
  EXPECT_EQ(last.RemoveKey(1.0, 0.5, owner.curve), 0);
}

TEST(KeystoreEdit, NonModifyingKeysTakeTheValueInForce) {
  Owner owner;
  IntStore steps = MakeInts({{0.0, 10}, {2.0, 20}});
  steps.valueBeforeFirstKey = 4;
  unsigned int index = 99;
  steps.CreateNonModifyingKey(1.0, index, owner.curve);
  EXPECT_EQ(index, 1u);
  EXPECT_EQ(steps.keys[1].value, 10);
  steps.CreateNonModifyingKey(-1.0, index, owner.curve);
  EXPECT_EQ(index, 0u);
  EXPECT_EQ(steps.keys[0].value, 4);
  steps.CreateNonModifyingKey(3.0, index, owner.curve);
  EXPECT_EQ(steps.keys[index].value, 20);

  RawStore line;
  line.InsertKey(0, 0.0, 0.0);
  line.InsertKey(1, 2.0, 4.0);
  line.CreateNonModifyingKey(0.5, index, owner.curve);
  EXPECT_DOUBLE_EQ(line.keys[1].value, 1.0);
}

TEST(KeystoreEdit, MergeKeepsTheNearestKeysAttributes) {
  Owner owner;
  IntStore s = MakeInts({{1.0, 1}, {2.0, 2}, {3.0, 3}, {4.0, 4}});
  s.SetConstraint(1, ZvBaseFCurve::ParameterLock, 1);
  owner.Tag(2.0, 42);
  EXPECT_EQ(s.MergeAndCreateKey(1.5, 3.5, 2.4, 9, owner.curve, 0, 0, 1), 1);
  ASSERT_EQ(Params(s), (V{1.0, 2.4, 4.0}));
  EXPECT_EQ(s.keys[1].value, 9);
  EXPECT_EQ(s.GetKeyFlags(1), CFCFlag_ParameterLock);
  EXPECT_TRUE(owner.HasTag(2.4));
  EXPECT_FALSE(owner.HasTag(2.0));

  // Without attributes the new key starts clean; an interval reaching past the first key
  // replaces the head.
  EXPECT_EQ(s.MergeAndCreateKey(0.0, 2.5, 0.5, 7, owner.curve, 0, 0, 0), 1);
  ASSERT_EQ(Params(s), (V{0.5, 4.0}));
  EXPECT_EQ(s.GetKeyFlags(0), 0);
  EXPECT_EQ(s.valueBeforeFirstKey, 7);
  // One key inside, on the parameter: a plain value change.
  EXPECT_EQ(s.MergeAndCreateKey(3.0, 5.0, 4.0, 8, owner.curve, 0, 0, 1), 1);
  ASSERT_EQ(Params(s), (V{0.5, 4.0}));
  EXPECT_EQ(s.keys[1].value, 8);
}

TEST(KeystoreEdit, CutClosesTheGap) {
  Owner owner;
  IntStore s = MakeInts({{0.0, 10}, {1.0, 20}, {2.0, 30}, {3.0, 40}});
  IntStore locked = s;
  EXPECT_EQ(s.Cut(1.0, 2.0, owner.curve), 1);
  ASSERT_EQ(Params(s), (V{0.0, 1.0, 2.0}));
  EXPECT_EQ(s.keys[1].value, 30);
  locked.SetConstraint(1, ZvBaseFCurve::ValueLock, 1);
  EXPECT_EQ(locked.Cut(1.0, 2.0, owner.curve), 0);
}

TEST(KeystoreEdit, TranslationAsksForUserDataByIndex) {
  Owner owner;
  IntStore s = MakeInts({{0.0, 0}, {5.0, 1}, {10.0, 2}, {15.0, 3}});
  owner.Tag(5.0, 1);  // at key 1's parameter: does not follow, no data sits at 1.0
  EXPECT_EQ(s.TranslateParamsAfterExistingKey(0, 6.0, 1.0, owner.curve), 1);
  EXPECT_EQ(Params(s), (V{0.0, 6.0, 11.0, 16.0}));
  EXPECT_TRUE(owner.HasTag(5.0));
  EXPECT_FALSE(owner.HasTag(6.0));

  // A locked key that would be overtaken stops the walk; what moved stays moved.
  IntStore stuck = MakeInts({{0.0, 0}, {1.0, 1}, {2.0, 2}, {3.0, 3}});
  stuck.SetConstraint(3, ZvBaseFCurve::ParameterLock, 1);
  EXPECT_EQ(stuck.TranslateParamsAfterExistingKey(0, 1.5, 1.5, owner.curve), 0);
  EXPECT_EQ(Params(stuck), (V{0.0, 1.5, 3.5, 3.0}));
}

TEST(KeystoreEdit, ReduceDropsRepeatedUnlockedValues) {
  Owner owner;
  IntStore s = MakeInts({{0, 1}, {1, 1}, {2, 1}, {3, 2}, {4, 2}, {5, 2}});
  s.SetConstraint(2, ZvBaseFCurve::ParameterLock, 1);
  owner.Tag(1.0, 5);
  EXPECT_EQ(s.ReduceNumKeys(0, 5, 0.0, owner.curve), 2u);
  ASSERT_EQ(Params(s), (V{0.0, 2.0, 3.0, 5.0}));
  EXPECT_EQ(s.GetKeyFlags(1), CFCFlag_ParameterLock);  // flags travel with their keys
  EXPECT_FALSE(owner.HasTag(1.0));
  IntStore two = MakeInts({{0, 1}, {1, 1}});
  EXPECT_EQ(two.ReduceNumKeys(0, 1, 0.0, owner.curve), 0u);
}

TEST(KeystoreEdit, RawAndStandardStoresThinAlongLines) {
  Owner owner;
  RawStore raw;
  const double values[] = {0.0, 1.0, 2.0, 3.05, 4.0, 9.0, 10.0};
  for (unsigned int i = 0; i < 7; ++i)
    raw.InsertKey(i, i, values[i]);
  // Keys 1, 2 and 3 lie on the line from key 0 within 0.1; key 4 too, but key 5 leaves it,
  // so key 4 stays and the line restarts there.
  EXPECT_EQ(raw.ReduceNumKeys(0, 6, 0.1, owner.curve), 3u);
  EXPECT_EQ(Params(raw), (V{0.0, 4.0, 5.0, 6.0}));

  ZvStdFCurveImpl line(0.0, ZvBaseFCurve::LinearSegment);
  for (unsigned int i = 0; i < 5; ++i) {
    line.InsertKey(i, i, i < 4 ? i : 7.0);
    line.keys[i].segmentKind = ZvBaseFCurve::LinearSegment;
  }
  line.SetConstraint(1, ZvBaseFCurve::ValueLock, 1);
  line.keys[3].segmentKind = ZvBaseFCurve::CubicSegment;      // key 3 starts a cubic: it stays
  EXPECT_EQ(line.ReduceNumKeys(0, 4, 0.0, owner.curve), 1u);  // only key 2 goes
  EXPECT_EQ(Params(line), (V{0.0, 1.0, 3.0, 4.0}));
}

TEST(KeystoreEdit, ResampleWithALongStepKeepsOnlyTheEnds) {
  Owner owner;
  IntStore s = MakeInts({{0.0, 10}, {1.0, 20}, {2.0, 30}});
  EXPECT_EQ(IntStore::ResampleKeys(s, 0.5, 1.5, 5.0, 0, owner.curve), 1);
  ASSERT_EQ(Params(s), (V{0.0, 0.5, 1.5, 2.0}));
  EXPECT_EQ(s.keys[2].value, 20);

  IntStore grid = MakeInts({{0.0, 1}, {0.3, 2}, {1.0, 3}});
  EXPECT_EQ(IntStore::ResampleKeys(grid, 0.0, 1.0, 0.25, 0, owner.curve), 1);
  ASSERT_EQ(Params(grid), (V{0.0, 0.25, 0.5, 0.75, 1.0}));
  EXPECT_EQ(grid.keys[1].value, 1);
  EXPECT_EQ(grid.keys[2].value, 2);  // the step of the removed key at 0.3
}

TEST(KeystoreEdit, RedrawBoxesCoverTheStepsAroundAKey) {
  IntStore s = MakeInts({{0.0, 5}, {2.0, 1}, {3.0, 8}});
  s.valueBeforeFirstKey = -2;
  ZvExtent2<double> box;
  ASSERT_EQ(s.ComputeKeyExtent(1, box), 1);
  EXPECT_EQ((V{box.xmin, box.ymin, box.xmax, box.ymax}), (V{0.0, 1.0, 3.0, 8.0}));
  ASSERT_EQ(s.ComputeNeighboringKeysExtent(-1.0, box), 1);
  EXPECT_EQ(box.ymin, -2.0);  // the step into the first key
  ASSERT_EQ(s.ComputeNeighboringKeysExtent(2.5, box), 1);
  EXPECT_EQ((V{box.xmin, box.xmax}), (V{0.0, 3.0}));
  EXPECT_EQ(s.ComputeKeyExtent(3, box), 0);
}

TEST(KeystoreEdit, SmoothingConvolvesThroughTheOwner) {
  ZvStdFCurve curve = stdedit::Polyline({{0, 1}, {1, 10}});
  // Two keys and five taps: only the taps around the centre reach a sample.
  const double wide[5] = {1000.0, 1.0, 2.0, 3.0, 1000.0};
  EXPECT_EQ(curve.SmoothSequence(0.0, 1.0, wide, 5), 1u);
  EXPECT_DOUBLE_EQ(curve.Eval(0.0, 0), 2.0 * 1.0 + 3.0 * 10.0);
  EXPECT_DOUBLE_EQ(curve.Eval(1.0, 0), 1.0 * 1.0 + 2.0 * 10.0);

  ZvStdFCurve five = stdedit::Polyline({{0, 0}, {1, 1}, {2, 4}, {3, 9}, {4, 16}});
  stdedit::SetFlag(five, 2.0, ZvBaseFCurve::ValueLock, 1);
  const double box[3] = {1.0, 1.0, 1.0};
  EXPECT_EQ(five.SmoothSequence(0.0, 4.0, box, 3), 1u);
  EXPECT_DOUBLE_EQ(five.Eval(0.0, 0), 0.0 + 1.0 + 1.0);  // mirrored about the sample itself
  EXPECT_DOUBLE_EQ(five.Eval(1.0, 0), 0.0 + 1.0 + 4.0);
  EXPECT_DOUBLE_EQ(five.Eval(2.0, 0), 4.0);  // locked: refused, the rest goes on
  EXPECT_DOUBLE_EQ(five.Eval(4.0, 0), 9.0 + 16.0 + 9.0);
}

}  // namespace
