// Operations on two curves across the keyed kinds - kind queries, assignment, cutting, pasting
// and appending - and the whole-curve copies of the single-value kinds: parts, snapshots and
// mirrors.
#include <gtest/gtest.h>

#include <zv/raw_fcurve.h>
#include <zv/std_fcurve.h>
#include <zv/step_fcurve.h>

#include <cmath>
#include <memory>

#include "uid.h"

namespace {

using C = ZvBaseFCurve;

ZvRawFCurve Zigzag() {  // (0,0) (1,2) (2,0) (3,2) (4,0)
  ZvRawFCurve c(0.0, 0.0);
  for (int i = 1; i <= 4; ++i)
    c.CreateKey(i, (i % 2) * 2.0);
  return c;
}

ZvIntegerFCurve Staircase() {  // value i from key i, for i = 0..4
  ZvIntegerFCurve c;
  for (int i = 0; i <= 4; ++i)
    c.CreateKey(i, i);
  return c;
}

TEST(CurveKinds, EachKindAnswersOnlyForItselfAndRefusesTheOthers) {
  ZvBooleanFCurve b;
  ZvIntegerFCurve n = Staircase();
  ZvStdFCurve s(0.0, 1.0, 1.0, 2.0);
  ZvRawFCurve r = Zigzag();
  C* curves[4] = {&b, &n, &s, &r};
  const C::Kind kinds[4] = {C::BooleanKind, C::IntegerKind, C::StdKind, C::RawKind};
  for (int i = 0; i < 4; ++i) {
    EXPECT_EQ(curves[i]->GetKind(), kinds[i]);
    for (int k = 0; k < 4; ++k)
      EXPECT_EQ(curves[i]->QueryFCurveKind(kinds[k]), i == k ? curves[i] : nullptr) << i << k;
    EXPECT_EQ(curves[i]->QueryFCurveKind(C::QuatKind), nullptr);
    std::unique_ptr<C> clone(curves[i]->Clone());
    ASSERT_NE(clone, nullptr);
    EXPECT_EQ(clone->GetKind(), kinds[i]);
    EXPECT_EQ(clone->GetNumKeys(), curves[i]->GetNumKeys());
  }
  for (int i = 0; i < 4; ++i) {
    for (int k = 0; k < 4; ++k) {
      if (i == k) continue;
      const unsigned int keys = curves[i]->GetNumKeys();
      EXPECT_FALSE(curves[i]->Set(*curves[k])) << i << k;
      EXPECT_FALSE(curves[i]->Paste(*curves[k], 0.0, 1.0)) << i << k;
      EXPECT_FALSE(curves[i]->Append(*curves[k])) << i << k;
      EXPECT_FALSE(curves[i]->Cut(0.0, 1.0, *curves[k])) << i << k;
      EXPECT_EQ(curves[i]->GetNumKeys(), keys);
    }
  }
  ZvIntegerFCurve copy;
  copy = n;
  EXPECT_EQ(copy.Eval(2.5, 0), 2.0);
  C& base = copy;
  base = r;  // another kind through the contract: nothing changes
  EXPECT_EQ(copy.Eval(2.5, 0), 2.0);
}

TEST(SingleValueSplice, CutClosesTheGapAndHandsOutThePiece) {
  ZvRawFCurve r = Zigzag();
  ZvRawFCurve piece;
  ASSERT_TRUE(r.Cut(0.5, 1.5, piece));
  EXPECT_DOUBLE_EQ(r.Eval(0.25, 0), 0.5);
  EXPECT_DOUBLE_EQ(r.Eval(0.5, 0), 1.0);  // 1.5 moved onto 0.5
  EXPECT_DOUBLE_EQ(r.Eval(1.0, 0), 0.0);
  EXPECT_DOUBLE_EQ(r.Eval(2.0, 0), 2.0);
  double first = 0.0, last = 0.0;
  piece.GetSmallestKeyParameter(first);
  piece.GetLargestKeyParameter(last);
  EXPECT_EQ(first, 0.5);
  EXPECT_EQ(last, 1.5);
  EXPECT_DOUBLE_EQ(piece.Eval(1.0, 0), 2.0);

  ZvIntegerFCurve n = Staircase();
  ZvIntegerFCurve steps;
  ASSERT_TRUE(n.Cut(1.0, 3.0, steps));
  EXPECT_EQ(n.Eval(0.5, 0), 0.0);
  EXPECT_EQ(n.Eval(1.0, 0), 3.0);
  EXPECT_EQ(n.Eval(2.0, 0), 4.0);
  EXPECT_EQ(steps.Eval(2.5, 0), 2.0);
  ZvIntegerFCurve locked = Staircase();
  double at = 2.0;
  locked.SetConstraint(at, C::ParameterLock, 1, 0.0);
  EXPECT_FALSE(locked.Cut(1.0, 3.0, steps));
  EXPECT_EQ(locked.GetNumKeys(), 5u);
  ZvIntegerFCurve readOnly;
  readOnly.SetReadOnlyConstraint(1);
  EXPECT_FALSE(n.Cut(1.0, 1.5, readOnly));
}

TEST(SingleValueSplice, PasteReplacesTheIntervalAndMovesTheTailByTheDifference) {
  ZvIntegerFCurve n = Staircase();
  ZvIntegerFCurve piece;
  piece.CreateKey(10.0, 7.0);
  piece.CreateKey(13.0, 8.0);  // three long where the interval is one
  ASSERT_TRUE(n.Paste(piece, 1.0, 2.0));
  const double expected[][2] = {{0.5, 0}, {1.0, 7}, {3.5, 7}, {4.0, 2}, {5.0, 3}, {7.0, 4}};
  for (const auto& e : expected)
    EXPECT_EQ(n.Eval(e[0], 0), e[1]) << e[0];

  ZvRawFCurve r = Zigzag();
  ZvRawFCurve bump(0.0, 5.0, 1.0, 5.0);
  ASSERT_TRUE(r.Paste(bump, 2.0, 3.0));  // as long as the interval: the tail stays
  EXPECT_DOUBLE_EQ(r.Eval(1.5, 0), 3.5);
  EXPECT_DOUBLE_EQ(r.Eval(2.0, 0), 5.0);
  // One key holds one value: the curve after the interval sets the far end.
  EXPECT_DOUBLE_EQ(r.Eval(2.5, 0), 3.5);
  EXPECT_DOUBLE_EQ(r.Eval(3.5, 0), 1.0);
  EXPECT_FALSE(r.Paste(ZvRawFCurve(), 0.0, 1.0));  // nothing to paste
}

TEST(SingleValueSplice, AppendJoinsAtTheLastKeyAndBringsTheKeyUserData) {
  ZvRawFCurve r(0.0, 0.0, 1.0, 1.0);
  ZvRawFCurve tail(5.0, 3.0, 6.0, 4.0);
  const unsigned char byte = 9;
  double at = 6.0;
  ASSERT_TRUE(tail.SetKeyUserData(at, MakeUID(1), &byte, 1, 0.0));
  ASSERT_TRUE(r.Append(tail));
  EXPECT_EQ(r.GetNumKeys(), 3u);
  EXPECT_DOUBLE_EQ(r.Eval(1.0, 0), 3.0);  // the joined key takes the appended value
  EXPECT_DOUBLE_EQ(r.Eval(2.0, 0), 4.0);
  const unsigned char* data = nullptr;
  unsigned int size = 0;
  at = 2.0;
  ASSERT_TRUE(r.GetKeyUserData(at, MakeUID(1), data, size, 0.0));
  EXPECT_EQ(*data, 9);
  ZvBooleanFCurve empty, flag;
  flag.CreateKey(3.0, 1.0);
  ASSERT_TRUE(empty.Append(flag));
  EXPECT_EQ(empty.Eval(3.0, 0), 1.0);
  EXPECT_EQ(empty.Eval(2.0, 0), 1.0);
}

TEST(SingleValueCopies, PartsSnapshotsAndMirrorsKeepTheFunction) {
  ZvIntegerFCurve n = Staircase();
  ZvIntegerFCurve part(n, 1.5, 3.5);
  EXPECT_EQ(part.GetNumKeys(), 4u);  // 1.5, 2, 3, 3.5
  for (double t = 1.5; t <= 3.5; t += 0.25)
    EXPECT_EQ(part.Eval(t, 0), n.Eval(t, 0)) << t;

  ASSERT_TRUE(n.SetExtrapolationMethod(C::CycleExtrapolation));
  std::unique_ptr<C> shot(n.SnapShot(-3.2, 9.7, C::ConstantExtrapolation));
  ASSERT_NE(shot, nullptr);
  EXPECT_EQ(shot->GetKind(), C::IntegerKind);
  for (double t = -3.2; t < 9.7; t += 0.1)
    EXPECT_EQ(shot->Eval(t, 0), n.Eval(t, 0)) << t;
  EXPECT_EQ(shot->Eval(20.0, 0), n.Eval(9.7, 0));

  ZvRawFCurve r = Zigzag();
  ASSERT_TRUE(r.SetExtrapolationMethod(C::CycleWithOffsetExtrapolation));
  r.CreateKey(4.0, 1.0);  // one unit of offset per period
  std::unique_ptr<C> rawShot(r.SnapShot(-2.5, 6.5, C::LinearExtrapolation));
  ASSERT_NE(rawShot, nullptr);
  for (double t = -2.5; t <= 6.5; t += 0.125)
    EXPECT_NEAR(rawShot->Eval(t, 0), r.Eval(t, 0), 1e-12) << t;

  ZvIntegerFCurve m = Staircase();
  ASSERT_TRUE(m.MirrorParameters());
  for (double t = 0.25; t < 4.0; t += 0.5)
    EXPECT_EQ(m.Eval(4.0 - t, 0), Staircase().Eval(t, 0)) << t;
  EXPECT_EQ(m.Eval(-1.0, 0), 4.0);
  ZvRawFCurve mr = Zigzag();
  mr.CreateKey(4.0, 3.0);
  ASSERT_TRUE(mr.MirrorParameters());
  EXPECT_DOUBLE_EQ(mr.Eval(0.5, 0), 2.5);
}

TEST(SingleValueCopies, ScaleAndOffsetOfTheWholeCurve) {
  ZvRawFCurve r = Zigzag();
  ASSERT_TRUE(r.ScaleAndOffsetParameters(0.0, 4.0, 0.0, 2.0, 1.0, 1, 1, C::RightHandle));
  EXPECT_DOUBLE_EQ(r.Eval(3.0, 0), 2.0);  // the key from 1 now lies at 3
  ZvIntegerFCurve n = Staircase();
  ASSERT_TRUE(n.ScaleAndOffsetParameters(0.0, 4.0, 2.0, -1.0, 0.0, 1, 1, C::RightHandle));
  EXPECT_EQ(n.Eval(0.5, 0), 3.0);  // mirrored about 2
}

}  // namespace
