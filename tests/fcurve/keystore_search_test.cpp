// The engine's search: the hinted locate with its deliberate epsilon quirks, the centred
// interval, key intervals, folding, and the constraint bits of each store.
#include <gtest/gtest.h>

#include "fcurve/cfc_base_impl.h"

#include <cmath>
#include <random>

namespace {

using IntStore =
    CFCBaseImpl<int, CFCSingleValueKey<int>, CFCKeyStoreA<int, CFCSingleValueKey<int>>>;
using RawStore =
    CFCBaseImpl<double, CFCSingleValueKey<double>, CFCKeyStoreB<double, CFCSingleValueKey<double>>>;
using StdStore = CFCBaseImpl<double, CFCStdKey, CFCKeyStoreC<double, CFCStdKey>>;

// Keys at 0, 0.125, 0.25, ...: exact binary fractions, so a few ulps above a key stay within
// the parameter epsilon.
RawStore MakeStore(unsigned int count) {
  RawStore s;
  for (unsigned int i = 0; i < count; ++i)
    s.InsertKey(i, i * 0.125, static_cast<double>(i));
  return s;
}

double TwoUlpsAbove(double x) {
  return std::nextafter(std::nextafter(x, 1e9), 1e9);
}

TEST(KeystoreLocate, HairAboveKeyIsFoundOnlyThroughTheNeighbourhood) {
  const double t = TwoUlpsAbove(5 * 0.125);
  ASSERT_LT(t - 5 * 0.125, 1e-15);
  int found = -1;

  RawStore twelve = MakeStore(12);
  twelve.searchHint = 5;
  EXPECT_EQ(twelve.LocateParameter(t, found), 6u);
  EXPECT_EQ(found, 1);
  EXPECT_EQ(twelve.searchHint, 5u);

  // Eleven keys: the neighbourhood is skipped and the bisection compares exactly.
  RawStore eleven = MakeStore(11);
  eleven.searchHint = 5;
  EXPECT_EQ(eleven.LocateParameter(t, found), 6u);
  EXPECT_EQ(found, 0);

  // Far from the hint the bisection decides too.
  twelve.searchHint = 0;
  EXPECT_EQ(twelve.LocateParameter(t, found), 6u);
  EXPECT_EQ(found, 0);
  EXPECT_EQ(twelve.searchHint, 5u);
}

TEST(KeystoreLocate, EndsUseTheEpsilonAndTheBisectionExactEquality) {
  RawStore s = MakeStore(12);
  int found = -1;
  EXPECT_EQ(s.LocateParameter(-5e-16, found), 1u);
  EXPECT_EQ(found, 1);
  EXPECT_EQ(s.LocateParameter(-1e-14, found), 0u);
  EXPECT_EQ(found, 0);
  EXPECT_EQ(s.LocateParameter(TwoUlpsAbove(11 * 0.125), found), 12u);
  EXPECT_EQ(found, 1);
  EXPECT_EQ(s.LocateParameter(5.0, found), 12u);
  EXPECT_EQ(found, 0);
  EXPECT_EQ(s.searchHint, 11u);

  s.searchHint = 0;
  EXPECT_EQ(s.LocateParameter(7 * 0.125, found), 8u);
  EXPECT_EQ(found, 1);
  EXPECT_EQ(s.searchHint, 7u);

  // The right end of the neighbourhood itself.
  s.searchHint = 4;
  EXPECT_EQ(s.LocateParameter(6 * 0.125, found), 7u);
  EXPECT_EQ(found, 1);
  EXPECT_EQ(s.searchHint, 6u);
}

// Up to a few hundred keys, so that the bisection runs many passes over ranges of every
// parity, and a third of the probes exactly on a key, which only exact equality finds there.
TEST(KeystoreLocate, AgreesWithACountWhateverTheHint) {
  std::mt19937 rng(7);
  std::uniform_real_distribution<double> gap(0.01, 1.0);
  for (int round = 0; round < 200; ++round) {
    RawStore s;
    const unsigned int n = 1 + rng() % (round < 100 ? 40 : 400);
    double p = -3.0;
    for (unsigned int i = 0; i < n; ++i) {
      p += gap(rng);
      s.InsertKey(i, p, 0.0);
    }
    for (int probe = 0; probe < 50; ++probe) {
      s.searchHint = rng() % (2 * n + 1);  // any value is legal
      const double t = probe % 3 == 0 ? s.keys[rng() % n].parameter
                                      : std::uniform_real_distribution<double>(-4.0, p + 1.0)(rng);
      unsigned int expected = 0;
      bool on = false;
      for (unsigned int i = 0; i < n; ++i) {
        if (s.keys[i].parameter <= t) ++expected;
        if (s.keys[i].parameter == t) on = true;
      }
      int found;
      ASSERT_EQ(s.LocateParameter(t, found), expected);
      ASSERT_EQ(found != 0, on);
      // The hint ends on the key at or below t, or on the first key when there is none.
      ASSERT_EQ(s.searchHint, expected ? expected - 1 : 0u);
    }
  }
}

TEST(KeystoreSearch, ClosestKeyInCenteredInterval) {
  RawStore s = MakeStore(4);  // 0, 0.125, 0.25, 0.375
  unsigned int i = 99;
  EXPECT_EQ(s.GetClosestKeyIndexInCenteredInterval(0.1875, 0.0625, i), 1);
  EXPECT_EQ(i, 1u);  // equal distances: the earlier key
  EXPECT_EQ(s.GetClosestKeyIndexInCenteredInterval(0.24, 0.2, i), 1);
  EXPECT_EQ(i, 2u);
  i = 99;
  EXPECT_EQ(s.GetClosestKeyIndexInCenteredInterval(0.19, 0.05, i), 0);
  EXPECT_EQ(s.GetClosestKeyIndexInCenteredInterval(2.0, 0.5, i), 0);
  EXPECT_EQ(i, 99u);
  EXPECT_EQ(s.GetClosestKeyIndexInCenteredInterval(0.25, 0.0, i), 1);
  EXPECT_EQ(i, 2u);
  EXPECT_EQ(s.GetClosestKeyIndexInCenteredInterval(std::nan(""), 1.0, i), 0);
  RawStore empty;
  EXPECT_EQ(empty.GetClosestKeyIndexInCenteredInterval(0.0, 1.0, i), 0);
}

TEST(KeystoreSearch, KeyIndicesInInterval) {
  RawStore s = MakeStore(5);  // 0 .. 0.5
  unsigned int first = 77, last = 77;
  EXPECT_EQ(s.GetKeyIndicesInInterval(0.125, 0.375, first, last, 0, 0), 1);
  EXPECT_EQ(first, 1u);
  EXPECT_EQ(last, 3u);
  EXPECT_EQ(s.GetKeyIndicesInInterval(0.125, 0.375, first, last, 1, 0), 1);
  EXPECT_EQ(first, 2u);
  EXPECT_EQ(last, 3u);
  EXPECT_EQ(s.GetKeyIndicesInInterval(0.125, 0.375, first, last, 0, 1), 1);
  EXPECT_EQ(first, 1u);
  EXPECT_EQ(last, 2u);
  EXPECT_EQ(s.GetKeyIndicesInInterval(-1.0, 9.0, first, last, 1, 1), 1);
  EXPECT_EQ(first, 0u);
  EXPECT_EQ(last, 4u);
  first = last = 77;
  EXPECT_EQ(s.GetKeyIndicesInInterval(0.25, 0.25, first, last, 1, 1), 0);
  EXPECT_EQ(s.GetKeyIndicesInInterval(0.13, 0.2, first, last, 0, 0), 0);
  EXPECT_EQ(s.GetKeyIndicesInInterval(0.375, 0.125, first, last, 0, 0), 0);  // reversed
  EXPECT_EQ(first, 77u);
  EXPECT_EQ(s.GetKeyIndicesInInterval(0.25, 0.25, first, last, 0, 0), 1);
  EXPECT_EQ(first, 2u);
  EXPECT_EQ(last, 2u);
}

TEST(KeystoreSearch, FoldingUnderTheCycleMethods) {
  RawStore s;
  for (unsigned int i = 0; i < 5; ++i)
    s.InsertKey(i, i, 0.0);  // period 4
  double t = 9.0;
  s.FoldParameter(t);
  EXPECT_EQ(t, 9.0);  // constant extrapolation: no folding
  for (unsigned char method : {3, 4}) {
    s.extrapolation = method;
    t = 9.0;
    s.FoldParameter(t);
    EXPECT_DOUBLE_EQ(t, 1.0);
    t = 8.0;  // a whole number of periods above the last key
    s.FoldParameter(t);
    EXPECT_EQ(t, 0.0);
    t = -1.0;
    s.FoldParameter(t);
    EXPECT_DOUBLE_EQ(t, 3.0);
    t = -4.0;
    s.FoldParameter(t);
    EXPECT_EQ(t, 4.0);
    t = 5.0 + 4e-13;  // snapped onto the key
    s.FoldParameter(t);
    EXPECT_EQ(t, 1.0);
  }
  double start = 8.5, end = 9.5;
  t = 9.0;
  s.FoldBoundsAndParameter(start, end, t);
  EXPECT_DOUBLE_EQ(t, 1.0);
  EXPECT_DOUBLE_EQ(start, 0.5);
  EXPECT_DOUBLE_EQ(end, 1.5);

  RawStore one;
  one.InsertKey(0, 2.0, 0.0);
  one.extrapolation = 3;
  t = 7.0;
  one.FoldParameter(t);
  EXPECT_EQ(t, 7.0);
}

TEST(KeystoreConstraints, EachStoreKeepsItsOwnBits) {
  IntStore a;
  a.InsertKey(0, 0.0, 1);
  a.SetConstraint(0, ZvBaseFCurve::TangentContinuity, 1);  // unknown to store A
  EXPECT_EQ(a.GetKeyFlags(0), 0);
  a.SetConstraint(0, ZvBaseFCurve::WholeKeyLock, 1);
  EXPECT_EQ(a.GetKeyFlags(0), 6);
  EXPECT_EQ(a.GetConstraint(0, ZvBaseFCurve::WholeKeyLock), 1);
  a.SetConstraint(0, ZvBaseFCurve::ValueLock, 0);
  EXPECT_EQ(a.GetConstraint(0, ZvBaseFCurve::WholeKeyLock), 0);
  EXPECT_EQ(a.GetConstraint(0, ZvBaseFCurve::ParameterLock), 1);
  a.SetConstraint(
      0, static_cast<unsigned int>(ZvBaseFCurve::ValueLock | ZvBaseFCurve::ParameterLock), 0);
  EXPECT_EQ(a.GetKeyFlags(0), 0);

  RawStore b = MakeStore(1);
  b.SetConstraint(0, ZvBaseFCurve::WholeKeyLock, 1);
  EXPECT_EQ(b.GetConstraint(0, ZvBaseFCurve::ValueLock), 0);

  StdStore c;
  c.InsertKey(0, 0.0, 1.0);
  c.SetConstraint(0, ZvBaseFCurve::WholeKeyLock, 1);
  EXPECT_EQ(c.GetKeyFlags(0), 30);
  c.SetConstraint(0, ZvBaseFCurve::ParameterLock, 0);
  EXPECT_EQ(c.GetConstraint(0, ZvBaseFCurve::WholeKeyLock), 0);
  EXPECT_EQ(c.GetConstraint(0, ZvBaseFCurve::ValueLock), 1);
  c.SetConstraint(0, ZvBaseFCurve::ChordTangentAlias, 1);  // the second code of the chord bit
  EXPECT_EQ(c.GetKeyFlags(0) & 1024, 1024);
  EXPECT_EQ(c.GetConstraint(0, ZvBaseFCurve::ChordTangent), 1);
  EXPECT_EQ(c.GetConstraint(0, static_cast<ZvBaseFCurve::KeyConstraint>(3)), 0);
}

}  // namespace
