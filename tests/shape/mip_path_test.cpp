// Mip paths: the key search, key edits through agents, evaluation between keys, and the copies.
#include <zv/mip_path2f_prop1d.h>
#include <zv/path2f_prop1d.h>
#include <zv/transfo4.h>

#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "mip_path_fixtures.h"
#include "shape/mip_path_impl.h"

namespace {

using Params = std::vector<double>;

// A sequence with a bar at each parameter, the bar's x being 10 times the key's index.
ZvMipPath2fProp1d Sequence(const Params& parameters) {
  ZvMipPath2fProp1d mip;
  ZvMipP2fP1dAgent agent(mip);
  for (unsigned int i = 0; i < parameters.size(); ++i)
    agent.CreateKey(parameters[i], Bar(10.0f * static_cast<float>(i)));
  return mip;
}

ZvMipPath2fProp1dImpl Store(const Params& parameters) {
  ZvMipPath2fProp1dImpl store;
  for (double p : parameters)
    store.AppendOwned(p, new ZvPath2fProp1d(Bar(0.0f)));
  return store;
}

TEST(MipPathKeys, LocateAnswersTheFirstKeyAboveOrOnePastAHit) {
  const ZvMipPath2fProp1dImpl store = Store({0.0, 1.0, 2.0, 3.0, 4.0});
  const struct {
    double t;
    unsigned int index;
    int exact;
  } cases[] = {{-1.0, 0, 0}, {0.0, 1, 1},         {1e-16, 1, 1}, {0.5, 1, 0}, {1.0, 2, 1},
               {1.5, 2, 0},  {2.0 - 1e-16, 3, 1}, {2.5, 3, 0},   {3.0, 4, 1}, {3.9, 4, 0},
               {4.0, 5, 1},  {4.0 + 1e-16, 5, 1}, {9.0, 5, 0}};
  for (const auto& c : cases) {
    int exact = -1;
    EXPECT_EQ(store.LocateParameter(c.t, exact), c.index) << c.t;
    EXPECT_EQ(exact, c.exact) << c.t;
  }
  int exact = -1;
  EXPECT_EQ(ZvMipPath2fProp1dImpl().LocateParameter(1.0, exact), 0u);
  EXPECT_EQ(exact, 0);
  // Within 1e-15 a parameter is the key; beyond it is not.
  EXPECT_EQ(store.LocateParameter(3.0 + 4e-15, exact), 4u);
  EXPECT_EQ(exact, 0);
}

TEST(MipPathKeys, IntervalsTakeKeysOnTheirBoundsAndLeaveIndicesAloneWhenEmpty) {
  const ZvMipPath2fProp1dImpl store = Store({0.0, 1.0, 2.0, 3.0});
  unsigned int first = 77, last = 77;
  EXPECT_EQ(store.GetKeyIndicesInInterval(0.5, 2.0 + 1e-16, first, last), 1);
  EXPECT_EQ(first, 1u);
  EXPECT_EQ(last, 2u);
  EXPECT_EQ(store.GetKeyIndicesInInterval(-5.0, 9.0, first, last), 1);
  EXPECT_EQ(first, 0u);
  EXPECT_EQ(last, 3u);
  first = last = 77;
  EXPECT_EQ(store.GetKeyIndicesInInterval(1.2, 1.8, first, last), 0);
  EXPECT_EQ(store.GetKeyIndicesInInterval(3.5, 4.0, first, last), 0);
  EXPECT_EQ(store.GetKeyIndicesInInterval(2.0, 1.0, first, last), 0);
  EXPECT_EQ(first, 77u);
  EXPECT_EQ(last, 77u);

  // The include flags move a bound that lies on a key one key inwards.
  unsigned int begin = 0, end = 0;
  store.GetIntervalRange(1.0, 3.0, 0, 0, begin, end);
  EXPECT_EQ(begin, 2u);
  EXPECT_EQ(end, 3u);
  store.GetIntervalRange(1.0, 3.0, 1, 1, begin, end);
  EXPECT_EQ(begin, 1u);
  EXPECT_EQ(end, 4u);
  store.GetIntervalRange(1.0, 1.0, 1, 0, begin, end);
  EXPECT_GE(begin, end);
}

TEST(MipPathKeys, BodyReplacementShrinksTheStoreAndCopiesThePath) {
  ZvMipPath2fProp1dImpl store = Store({0, 1, 2, 3, 4, 5, 6, 7, 8});
  const ZvPath2fProp1d bar = Bar(50.0f);
  MPKey key;
  key.parameter = 4.5;
  key.path = const_cast<ZvPath2fProp1d*>(&bar);
  EXPECT_EQ(store.RemoveBodyAndCreateKeyBetweenExistingKeys(key, 0, 8), 1);
  ASSERT_EQ(store.keys.size, 3u);
  EXPECT_EQ(store.keys.capacity, 4u);  // 16 slots held 9 keys; 3 fill less than half of them
  EXPECT_EQ(store.keys[1].parameter, 4.5);
  EXPECT_NE(store.keys[1].path, &bar);
  EXPECT_EQ(store.keys[1].path->GetPoint(0).x, 50.0f);
  EXPECT_EQ(store.keys[2].parameter, 8.0);
  // At the front: `before` wraps.
  key.parameter = -1.0;
  store.RemoveBodyAndCreateKeyBetweenExistingKeys(key, ~0u, 1);
  EXPECT_EQ(store.keys[0].parameter, -1.0);
  EXPECT_EQ(store.keys[1].parameter, 4.5);
}

TEST(MipPathAgent, CreateKeyKeepsOrderReplacesOnAHitAndCopies) {
  ZvMipPath2fProp1d mip;
  ZvMipP2fP1dAgent agent(mip);
  ZvPath2fProp1d bar = Bar(1.0f);
  EXPECT_EQ(agent.CreateKey(2.0, bar), 1);
  EXPECT_EQ(agent.CreateKey(0.0, Bar(2.0f)), 1);
  EXPECT_EQ(agent.CreateKey(3.0, Bar(3.0f)), 1);
  EXPECT_EQ(agent.CreateKey(1.0, Bar(4.0f)), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{0.0, 1.0, 2.0, 3.0}));
  // A hit within 1e-15 replaces the path and keeps the key's parameter.
  EXPECT_EQ(agent.CreateKey(2.0 + 1e-16, Bar(9.0f)), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{0.0, 1.0, 2.0, 3.0}));
  EXPECT_EQ(FirstXAt(agent, 2.0), 9.0f);
  // The key holds a copy: editing the caller's path afterwards changes nothing.
  bar.Translate({100.0f, 0.0f});
  agent.CreateKey(5.0, bar);
  bar.Translate({100.0f, 0.0f});
  EXPECT_EQ(FirstXAt(agent, 5.0), 101.0f);
  EXPECT_EQ(agent.CreateKey(std::nan(""), bar), 0);
  EXPECT_EQ(agent.CreateKey(INFINITY, bar), 0);
  EXPECT_EQ(mip.GetNumKeys(), 5u);
  double lo = 0.0, hi = 0.0;
  EXPECT_EQ(mip.GetSmallestKeyParameter(lo), 1);
  EXPECT_EQ(mip.GetLargestKeyParameter(hi), 1);
  EXPECT_EQ(lo, 0.0);
  EXPECT_EQ(hi, 5.0);
  ZvMipPath2fProp1d empty;
  lo = hi = 7.0;
  EXPECT_EQ(empty.GetSmallestKeyParameter(lo), 0);
  EXPECT_EQ(empty.GetLargestKeyParameter(hi), 0);
  EXPECT_EQ(lo, 7.0);
}

TEST(MipPathAgent, RemovingKeysByNearnessAndByInterval) {
  ZvMipPath2fProp1d mip = Sequence({0.0, 1.0, 2.0, 3.0, 4.0});
  ZvMipP2fP1dAgent agent(mip);
  // 1.5 is as near to 1 as to 2: only a strictly nearer key displaces the earlier one.
  EXPECT_EQ(agent.RemoveKey(1.5, 0.5), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{0.0, 2.0, 3.0, 4.0}));
  EXPECT_EQ(agent.RemoveKey(2.9, 1.0), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{0.0, 2.0, 4.0}));
  EXPECT_EQ(agent.RemoveKey(1.0, 0.5), 0);
  EXPECT_EQ(KeyParameters(mip), (Params{0.0, 2.0, 4.0}));

  mip = Sequence({0.0, 1.0, 2.0, 3.0, 4.0});
  EXPECT_EQ(agent.RemoveKeys(1.0, 3.0, 0, 1), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{0.0, 1.0, 4.0}));
  EXPECT_EQ(agent.RemoveKeys(1.0, 4.0, 0, 0), 0);
  EXPECT_EQ(agent.RemoveKeys(-1.0, 1.0, 1, 1), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{4.0}));

  ZvMipPath2fProp1d empty;
  ZvMipP2fP1dAgent onEmpty(empty);
  EXPECT_EQ(onEmpty.RemoveKey(0.0, 1.0), 1);
  EXPECT_EQ(onEmpty.RemoveKeys(0.0, 1.0, 1, 1), 1);
}

TEST(MipPathAgent, MergeReplacesTheIntervalByOneKeyBetweenTheKeptOnes) {
  ZvMipPath2fProp1d mip = Sequence({0.0, 1.0, 2.0, 3.0, 4.0});
  ZvMipP2fP1dAgent agent(mip);
  EXPECT_EQ(agent.MergeAndCreateKey(2.5, 1.0, 3.0, Bar(70.0f), 1, 1), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{0.0, 2.5, 4.0}));
  EXPECT_EQ(FirstXAt(agent, 2.5), 70.0f);
  // The key on an excluded bound stays, and the new key may not sit on it.
  EXPECT_EQ(agent.MergeAndCreateKey(2.5, 2.5, 4.0, Bar(71.0f), 0, 1), 0);
  EXPECT_EQ(agent.MergeAndCreateKey(3.0, 2.5, 4.0, Bar(71.0f), 0, 1), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{0.0, 2.5, 3.0}));
  // At the front.
  EXPECT_EQ(agent.MergeAndCreateKey(-1.0, -5.0, 0.0, Bar(72.0f), 1, 1), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{-1.0, 2.5, 3.0}));
  // A t outside the gap would break the order.
  EXPECT_EQ(agent.MergeAndCreateKey(9.0, 0.0, 1.0, Bar(73.0f), 1, 1), 0);
  EXPECT_EQ(KeyParameters(mip), (Params{-1.0, 2.5, 3.0}));

  ZvMipPath2fProp1d empty;
  ZvMipP2fP1dAgent onEmpty(empty);
  EXPECT_EQ(onEmpty.MergeAndCreateKey(5.0, 0.0, 1.0, Bar(1.0f), 1, 1), 1);
  EXPECT_EQ(KeyParameters(empty), (Params{5.0}));
}

TEST(MipPathAgent, ParameterAxisAndGeometryEdits) {
  ZvMipPath2fProp1d mip = Sequence({1.0, 2.0});
  ZvMipP2fP1dAgent agent(mip);
  EXPECT_EQ(agent.ShiftKeyParameters(0.5), 1);
  EXPECT_EQ(agent.ScaleKeyParameterAxis(2.0), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{3.0, 5.0}));
  ZvTransfo4 move;
  move.Translate(3.0, 0.0, 0.0);
  EXPECT_EQ(agent.Transform(move), 1);
  EXPECT_EQ(FirstXAt(agent, 3.0), 3.0f);
  EXPECT_EQ(FirstXAt(agent, 5.0), 13.0f);
}

TEST(MipPathEval, KeysEndsAndSiblingBlends) {
  ZvMipPath2fProp1d mip;
  ZvMipP2fP1dAgent agent(mip);
  EXPECT_EQ(agent.Eval(0.0, 0.5, 0.1).NumPoints(), 0u);
  EXPECT_EQ(agent.CreateKeyFromEvaluation(1.0), 0);

  agent.CreateKey(1.0, Bar(10.0f));
  for (double t : {-5.0, 1.0, 7.0})
    EXPECT_EQ(FirstXAt(agent, t), 10.0f) << t;

  agent.CreateKey(3.0, Bar(20.0f, 5.0f));
  EXPECT_EQ(FirstXAt(agent, 0.0), 10.0f);
  EXPECT_EQ(FirstXAt(agent, 3.0 - 1e-16), 20.0f);
  EXPECT_EQ(FirstXAt(agent, 9.0), 20.0f);
  // A quarter of the way: siblings blend point by point and keep their codes.
  const ZvPath2fProp1d& mid = agent.Eval(1.5, 0.5, 0.1);
  ASSERT_EQ(mid.NumPoints(), 3u);
  EXPECT_TRUE(mid.IsSiblingOf(Bar(0.0f)));
  EXPECT_FLOAT_EQ(mid.GetPoint(0).x, 12.5f);
  EXPECT_FLOAT_EQ(mid.GetPoint(1).y, 2.0f);
  // A later evaluation replaces the result rather than adding to it.
  EXPECT_EQ(agent.Eval(2.0, 0.5, 0.1).NumPoints(), 3u);
  EXPECT_EQ(agent.CreateKeyFromEvaluation(2.0), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{1.0, 2.0, 3.0}));
  EXPECT_FLOAT_EQ(FirstXAt(agent, 2.0), 15.0f);
}

TEST(MipPathEval, IntervalsHideKeysAndSnapToTheNearestVisibleOne) {
  ZvMipPath2fProp1d mip = Sequence({0.0, 1.0, 2.0, 3.0});  // x = 0, 10, 20, 30
  ZvMipP2fP1dAgent agent(mip);
  const auto at = [&](double t, double from, double to, int inFrom, int inTo) {
    const ZvPath2fProp1d& r = agent.EvalInInterval(t, from, to, inFrom, inTo, 0.5, 0.1);
    return r.NumPoints() ? r.GetPoint(0).x : -1000.0f;
  };
  EXPECT_EQ(at(0.0, 1.0, 2.0, 1, 1), 10.0f);
  EXPECT_EQ(at(2.9, 1.0, 2.0, 1, 1), 20.0f);
  EXPECT_FLOAT_EQ(at(1.5, 1.0, 2.0, 1, 1), 15.0f);
  // Excluded bounds move inwards: only key 2 is left visible.
  EXPECT_EQ(at(0.5, 1.0, 3.0, 0, 0), 20.0f);
  EXPECT_EQ(at(2.9, 1.0, 3.0, 0, 0), 20.0f);
  EXPECT_EQ(at(1.5, 1.2, 1.8, 1, 1), -1000.0f);
}

TEST(MipPathCopies, DeepCopiesAssignmentAndSubIntervals) {
  ZvMipPath2fProp1d mip = Sequence({0.0, 1.0, 2.0, 3.0});
  ZvMipPath2fProp1d copy(mip);
  ZvMipP2fP1dAgent onCopy(copy);
  ZvTransfo4 move;
  move.Translate(100.0, 0.0, 0.0);
  onCopy.Transform(move);
  ZvMipP2fP1dAgent onMip(mip);
  EXPECT_EQ(FirstXAt(onMip, 1.0), 10.0f);
  EXPECT_EQ(FirstXAt(onCopy, 1.0), 110.0f);

  copy = mip;
  const ZvMipPath2fProp1d& same = copy;
  copy = same;
  EXPECT_EQ(KeyParameters(copy), KeyParameters(mip));
  EXPECT_EQ(FirstXAt(onCopy, 1.0), 10.0f);

  const ZvMipPath2fProp1d single(Bar(4.0f), 2.5);
  EXPECT_EQ(KeyParameters(single), (Params{2.5}));

  // Bounds between keys get evaluated keys; a bound on a key or beyond the keys adds none.
  const ZvMipPath2fProp1d part(mip, 0.5, 2.0);
  EXPECT_EQ(KeyParameters(part), (Params{0.5, 1.0, 2.0}));
  ZvMipPath2fProp1d partCopy(part);
  ZvMipP2fP1dAgent onPart(partCopy);
  EXPECT_FLOAT_EQ(FirstXAt(onPart, 0.5), 5.0f);
  EXPECT_EQ(KeyParameters(ZvMipPath2fProp1d(mip, -4.0, 9.0)), KeyParameters(mip));
  EXPECT_EQ(KeyParameters(ZvMipPath2fProp1d(mip, 1.25, 1.75)), (Params{1.25, 1.75}));
  EXPECT_EQ(KeyParameters(ZvMipPath2fProp1d(mip, 2.0, 1.0)), Params{});
}

}  // namespace
