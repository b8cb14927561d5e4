// Mip paths: the key search, key edits through agents, evaluation between keys, and the copies.
#include <zv/mip_path2f_prop1d.h>
#include <zv/path2f_prop1d.h>

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

TEST(MipPathKeys, SearchAndIntervals) {
  ZvMipPath2fProp1dImpl store;
  for (int p = 0; p <= 8; ++p)
    store.AppendOwned(p, new ZvPath2fProp1d(Bar(0.0f)));
  // The first key above t, or one past a key within 1e-15 of t.
  const struct {
    double t;
    unsigned int index;
    int exact;
  } cases[] = {{-1.0, 0, 0},        {1e-16, 1, 1}, {0.5, 1, 0},         {2.0 - 1e-16, 3, 1},
               {3.0 + 4e-15, 4, 0}, {5.0, 6, 1},   {8.0 + 1e-16, 9, 1}, {9.0, 9, 0}};
  for (const auto& c : cases) {
    int exact = -1;
    EXPECT_EQ(store.LocateParameter(c.t, exact), c.index) << c.t;
    EXPECT_EQ(exact, c.exact) << c.t;
  }
  unsigned int first = 77, last = 77;
  EXPECT_EQ(store.GetKeyIndicesInInterval(1.2, 1.8, first, last), 0);
  EXPECT_EQ(first, 77u);  // untouched
  EXPECT_EQ(store.GetKeyIndicesInInterval(0.5, 2.0 + 1e-16, first, last), 1);
  EXPECT_EQ(first, 1u);
  EXPECT_EQ(last, 2u);
}

TEST(MipPathAgent, CreatingKeysKeepsOrderReplacesOnAHitAndCopies) {
  ZvMipPath2fProp1d mip;
  ZvMipP2fP1dAgent agent(mip);
  ZvPath2fProp1d bar = Bar(1.0f);
  for (double t : {2.0, 0.0, 3.0, 1.0})
    EXPECT_EQ(agent.CreateKey(t, bar), 1);
  EXPECT_EQ(agent.CreateKey(2.0 + 1e-16, Bar(9.0f)), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{0.0, 1.0, 2.0, 3.0}));
  EXPECT_EQ(FirstXAt(agent, 2.0), 9.0f);
  bar.Translate({100.0f, 0.0f});  // the keys hold copies
  EXPECT_EQ(FirstXAt(agent, 3.0), 1.0f);
  EXPECT_EQ(agent.CreateKey(std::nan(""), bar), 0);
  EXPECT_EQ(mip.GetNumKeys(), 4u);
}

TEST(MipPathAgent, RemovingAndMergingKeys) {
  ZvMipPath2fProp1d mip = Sequence({0.0, 1.0, 2.0, 3.0, 4.0});
  ZvMipP2fP1dAgent agent(mip);
  // 1.5 is as near to 1 as to 2: only a strictly nearer key displaces the earlier one.
  EXPECT_EQ(agent.RemoveKey(1.5, 0.5), 1);
  EXPECT_EQ(agent.RemoveKey(1.0, 0.5), 0);
  EXPECT_EQ(KeyParameters(mip), (Params{0.0, 2.0, 3.0, 4.0}));
  // An excluded bound keeps its key.
  EXPECT_EQ(agent.RemoveKeys(2.0, 3.0, 0, 1), 1);
  EXPECT_EQ(agent.RemoveKeys(2.0, 4.0, 0, 0), 0);
  EXPECT_EQ(KeyParameters(mip), (Params{0.0, 2.0, 4.0}));

  mip = Sequence({0.0, 1.0, 2.0, 3.0, 4.0});
  EXPECT_EQ(agent.MergeAndCreateKey(2.5, 1.0, 3.0, Bar(70.0f), 1, 1), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{0.0, 2.5, 4.0}));
  EXPECT_EQ(FirstXAt(agent, 2.5), 70.0f);
  // The new key may not sit on a kept key, nor outside the gap.
  EXPECT_EQ(agent.MergeAndCreateKey(2.5, 2.5, 4.0, Bar(71.0f), 0, 1), 0);
  EXPECT_EQ(agent.MergeAndCreateKey(9.0, 0.0, 1.0, Bar(71.0f), 1, 1), 0);
  EXPECT_EQ(agent.MergeAndCreateKey(-1.0, -5.0, 2.5, Bar(72.0f), 1, 0), 1);
  EXPECT_EQ(KeyParameters(mip), (Params{-1.0, 2.5, 4.0}));

  ZvMipPath2fProp1d empty;
  ZvMipP2fP1dAgent onEmpty(empty);
  EXPECT_EQ(onEmpty.RemoveKey(0.0, 1.0), 1);
  EXPECT_EQ(onEmpty.RemoveKeys(0.0, 1.0, 1, 1), 1);
}

TEST(MipPathEval, KeysEndsSiblingBlendsAndIntervals) {
  ZvMipPath2fProp1d mip;
  ZvMipP2fP1dAgent agent(mip);
  EXPECT_EQ(agent.Eval(0.0, 0.5, 0.1).NumPoints(), 0u);
  EXPECT_EQ(agent.CreateKeyFromEvaluation(1.0), 0);
  agent.CreateKey(1.0, Bar(10.0f));
  EXPECT_EQ(FirstXAt(agent, -5.0), 10.0f);
  agent.CreateKey(3.0, Bar(20.0f, 5.0f));
  EXPECT_EQ(FirstXAt(agent, 0.0), 10.0f);
  EXPECT_EQ(FirstXAt(agent, 3.0 - 1e-16), 20.0f);
  EXPECT_EQ(FirstXAt(agent, 9.0), 20.0f);
  // A quarter of the way: siblings blend point by point and keep their codes.
  const ZvPath2fProp1d& mid = agent.Eval(1.5, 0.5, 0.1);
  ASSERT_TRUE(mid.IsSiblingOf(Bar(0.0f)));
  EXPECT_FLOAT_EQ(mid.GetPoint(0).x, 12.5f);
  EXPECT_FLOAT_EQ(mid.GetPoint(1).y, 2.0f);
  EXPECT_EQ(agent.CreateKeyFromEvaluation(1.5), 1);
  EXPECT_FLOAT_EQ(FirstXAt(agent, 1.5), 12.5f);

  mip = Sequence({0.0, 1.0, 2.0, 3.0});
  const auto at = [&](double t, double from, double to, int inFrom, int inTo) {
    const ZvPath2fProp1d& r = agent.EvalInInterval(t, from, to, inFrom, inTo, 0.5, 0.1);
    return r.NumPoints() ? r.GetPoint(0).x : -1000.0f;
  };
  EXPECT_EQ(at(0.0, 1.0, 2.0, 1, 1), 10.0f);
  EXPECT_FLOAT_EQ(at(1.5, 1.0, 2.0, 1, 1), 15.0f);
  EXPECT_EQ(at(0.5, 1.0, 3.0, 0, 0), 20.0f);  // only key 2 is visible
  EXPECT_EQ(at(2.9, 1.0, 3.0, 0, 0), 20.0f);
  EXPECT_EQ(at(1.5, 1.2, 1.8, 1, 1), -1000.0f);
}

TEST(MipPathCopies, DeepCopiesAssignmentAndSubIntervals) {
  const ZvMipPath2fProp1d mip = Sequence({0.0, 1.0, 2.0, 3.0});
  ZvMipPath2fProp1d copy(mip);
  ZvMipP2fP1dAgent onCopy(copy);
  onCopy.CreateKey(1.0, Bar(-7.0f));
  copy = ZvMipPath2fProp1d(copy);
  EXPECT_EQ(FirstXAt(onCopy, 1.0), -7.0f);
  copy = mip;
  EXPECT_EQ(FirstXAt(onCopy, 1.0), 10.0f);
  // Bounds between keys get evaluated keys; a bound on a key or beyond the keys adds none.
  copy = ZvMipPath2fProp1d(mip, 0.5, 2.0);
  EXPECT_EQ(KeyParameters(copy), (Params{0.5, 1.0, 2.0}));
  EXPECT_FLOAT_EQ(FirstXAt(onCopy, 0.5), 5.0f);
  EXPECT_EQ(KeyParameters(ZvMipPath2fProp1d(mip, -4.0, 9.0)), KeyParameters(mip));
  EXPECT_EQ(KeyParameters(ZvMipPath2fProp1d(mip, 1.25, 1.75)), (Params{1.25, 1.75}));
}

}  // namespace
