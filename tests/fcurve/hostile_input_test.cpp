// Curves under extreme arguments: an operation that cannot keep the keys strictly increasing
// and finite refuses and leaves the curve as it was, and nothing runs or allocates without
// bound.
#include <zv/fcurve_stretcher.h>
#include <zv/quat_fcurve.h>
#include <zv/raw_fcurve.h>
#include <zv/std_fcurve.h>
#include <zv/step_fcurve.h>
#include <zv/transfo4.h>

#include <gtest/gtest.h>

#include <cfloat>
#include <chrono>
#include <cmath>
#include <limits>
#include <memory>
#include <vector>

#include "tests/support/byte_blocks.h"

namespace {

const double kNaN = std::numeric_limits<double>::quiet_NaN();
const double kInf = std::numeric_limits<double>::infinity();

void ExpectAscending(const std::vector<double>& k) {
  for (size_t i = 1; i < k.size(); ++i)
    EXPECT_LT(k[i - 1], k[i]) << "at " << i;
}

std::vector<double> KeysOf(const ZvBaseFCurve& c) {
  ZvDoubleArray p;
  c.GetAllKeyParameters(p);
  return std::vector<double>(p.data, p.data + p.size);
}

// Fresh curves of every kind with keys at the given parameters.
// The rotation view is left out where its own rules differ: it merges into an empty interval
// by setting a key, and draws and samples without repeating periods.
std::vector<std::unique_ptr<ZvBaseFCurve>> AllKinds(const std::vector<double>& at,
                                                    bool withRotation = true) {
  std::vector<std::unique_ptr<ZvBaseFCurve>> curves;
  curves.emplace_back(new ZvStdFCurve());
  curves.emplace_back(new ZvRawFCurve());
  curves.emplace_back(new ZvIntegerFCurve());
  curves.emplace_back(new ZvBooleanFCurve());
  if (withRotation) curves.emplace_back(new ZvQuatFCurve(0));
  for (auto& c : curves) {
    for (size_t i = 0; i < at.size(); ++i)
      EXPECT_EQ(c->CreateKey(at[i], static_cast<double>(i % 2)), 1u);
  }
  return curves;
}

// Runs `op` on every kind and expects it to be refused with the keys untouched.
template <class Op>
void ExpectRefusedUnchanged(const std::vector<double>& at, Op op, bool withRotation = true) {
  for (auto& c : AllKinds(at, withRotation)) {
    SCOPED_TRACE(c->GetKind());
    EXPECT_EQ(op(*c), 0u);
    EXPECT_EQ(KeysOf(*c), at);
  }
}

TEST(HostileCurveInput, MergeNeverBreaksKeyOrder) {
  ExpectRefusedUnchanged(
      {0, 10}, [](ZvBaseFCurve& c) { return c.MergeAndCreateKey(10, 15, 10, 1, 1, 0, 0); }, false);
  ExpectRefusedUnchanged(
      {0, 10}, [](ZvBaseFCurve& c) { return c.MergeAndCreateKey(12, 20, 5, 1, 0, 0, 0); }, false);
  ZvQuatFCurve rotation(0);
  rotation.CreateKey(0, 0);
  rotation.CreateKey(10, 1);
  rotation.MergeAndCreateKey(12, 20, 5, 1, 0, 0, 0);
  EXPECT_EQ(KeysOf(rotation), (std::vector<double>{0, 5, 10}));
  ExpectRefusedUnchanged(
      {0, 10}, [](ZvBaseFCurve& c) { return c.MergeAndCreateKey(2, 8, kNaN, 1, 0, 0, 0); });
  // A merge that keeps the order still works on every kind.
  for (auto& c : AllKinds({0, 10, 20})) {
    EXPECT_EQ(c->MergeAndCreateKey(5, 25, 15, 1, 0, 0, 0), 1u);
    EXPECT_EQ(KeysOf(*c), (std::vector<double>{0, 15}));
  }
}

TEST(HostileCurveInput, CutNeverLeavesEqualKeys) {
  {
    ZvStdFCurve c(-30, -40, 15, 32), out;
    const std::vector<double> before = KeysOf(c);
    c.Cut(-30, 14.999999999999998, out);
    const std::vector<double> k = KeysOf(c);
    for (size_t i = 1; i < k.size(); ++i)
      EXPECT_LT(k[i - 1], k[i]);
    EXPECT_EQ(c.IsValid(), 1u);
  }
  for (auto& c : AllKinds({1, 2})) {
    std::unique_ptr<ZvBaseFCurve> out(c->Clone());
    c->Cut(-62.5, 0.99999999999999989, *out);
    const std::vector<double> k = KeysOf(*c);
    for (size_t i = 1; i < k.size(); ++i)
      EXPECT_LT(k[i - 1], k[i]) << c->GetKind();
  }
}

TEST(HostileCurveInput, AppendNeverRoundsKeysTogether) {
  // Moved to a last key at 1e18, the piece's keys 6 apart round onto one parameter.
  ZvStdFCurve c;
  for (double t : {-32.0, -26.0, 1e18})
    c.CreateKey(t, 0);
  const ZvStdFCurve piece(c);
  EXPECT_EQ(c.Append(piece), 0u);
  EXPECT_EQ(KeysOf(c), (std::vector<double>{-32, -26, 1e18}));
  // Pasted into a curve that reaches the largest double, the piece would move its tail past it.
  for (auto& wide : AllKinds({-DBL_MAX, -32.0, 0.0, DBL_MAX}, false)) {
    std::unique_ptr<ZvBaseFCurve> whole(wide->Clone());
    EXPECT_EQ(wide->Paste(*whole, 0, -32), 0u) << wide->GetKind();
    EXPECT_EQ(KeysOf(*wide), (std::vector<double>{-DBL_MAX, -32, 0, DBL_MAX}));
    EXPECT_EQ(wide->Append(*whole), 0u) << wide->GetKind();
  }
  EXPECT_EQ(c.Append(ZvStdFCurve(0, 1, 1024, 2)), 1u);
  EXPECT_EQ(KeysOf(c), (std::vector<double>{-32, -26, 1e18, 1e18 + 1024}));
}

TEST(HostileCurveInput, WholeCurveMovesRefuseToMergeOrOverflowKeys) {
  ExpectRefusedUnchanged({0, 1}, [](ZvBaseFCurve& c) { return c.ShiftParameters(1e300); });
  ExpectRefusedUnchanged({1, 2}, [](ZvBaseFCurve& c) { return c.ScaleParameterAxis(1e308); });
  ExpectRefusedUnchanged({1, 1.1}, [](ZvBaseFCurve& c) { return c.ScaleParameterAxis(5e-324); });
  ExpectRefusedUnchanged({0, 1, 1e17}, [](ZvBaseFCurve& c) { return c.MirrorParameters(); });
  ExpectRefusedUnchanged({DBL_MAX / 2, DBL_MAX},
                         [](ZvBaseFCurve& c) { return c.MirrorParameters(); });
  // Part of the keys scaled about a pivot at the far left: the last key overflows.
  ExpectRefusedUnchanged({-32, -14, -13, 0}, [](ZvBaseFCurve& c) {
    return c.ScaleAndOffsetParameters(0, 1e18, -DBL_MAX, 2, 0, 0, 0, ZvBaseFCurve::BottomHandle);
  });
}

TEST(HostileCurveInput, KeyReductionReturnsNearTheLargestDouble) {
  // Cubic runs are refitted; with parameters and values near the largest double the fit
  // overflows, and the reduction must still move on and keep the order.
  const double at[] = {DBL_MAX / 8, DBL_MAX / 4, DBL_MAX / 2, DBL_MAX * 0.75, DBL_MAX};
  for (int variant = 0; variant < 4; ++variant) {
    ZvStdFCurve c;
    for (int i = 0; i < 5; ++i) {
      c.CreateKey(variant & 1 ? at[i] : -at[4 - i],
                  variant & 2 ? (i % 2 ? DBL_MAX : -DBL_MAX) : i * 1.0);
    }
    c.ReduceNumKeys(-DBL_MAX, DBL_MAX, 0.5);
    c.ReduceNumKeys(-DBL_MAX, DBL_MAX, 1e308);
    const std::vector<double> k = KeysOf(c);
    for (size_t i = 1; i < k.size(); ++i)
      EXPECT_LT(k[i - 1], k[i]);
  }
  for (auto& c : AllKinds({DBL_MAX / 4, DBL_MAX / 2, DBL_MAX * 0.75, DBL_MAX})) {
    c->SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation);
    c->ReduceNumKeys(-DBL_MAX, DBL_MAX, 0.5);
    c->ReduceNumKeys(DBL_MAX / 3, DBL_MAX, 1e300);
    const std::vector<double> k = KeysOf(*c);
    for (size_t i = 1; i < k.size(); ++i)
      EXPECT_LT(k[i - 1], k[i]);
  }
  // Keys scaled to a few subnormals apart: a far bound is more periods away than a double can
  // count.
  for (auto& c : AllKinds({-20, -9, -1, 8, 24})) {
    c->ScaleParameterAxis(4.9406564584124654e-324);
    c->SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation);
    c->ReduceNumKeys(-5e187, -5e187, 1e214);
    c->ReduceNumKeys(-5e187, 5e187, 1.0);
    ExpectAscending(KeysOf(*c));
  }
}

// Two cubic segments rising to 0.5 and back over [0, 0.5], repeated by cycles.
void MakeCyclicArch(ZvStdFCurve& c) {
  c.CreateKey(0, 0);
  c.CreateKey(0.25, 0.5);
  c.CreateKey(0.5, 0);
  c.SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation);
}

TEST(HostileCurveInput, DrawingsAtATinyToleranceSkipPiecesOutsideTheBox) {
  // Cubic segments flattened at 1e-15 take a million points each; 2,000 periods of them all
  // lie below the box, so the drawing is empty and must not compute them.
  ZvStdFCurve c;
  MakeCyclicArch(c);
  ZvExtent2<double> box;
  box.AddPoint(ZvPoint2<double>{0, 1});
  box.AddPoint(ZvPoint2<double>{1000, DBL_MAX});
  ZvPoint2dArray points;
  ZvPointTagArray tags;
  ZvBoolArray extrapolated;
  const auto start = std::chrono::steady_clock::now();
  EXPECT_EQ(c.FlattenFromTo(box, ZvTransfo4(), 1e-15, points, tags, extrapolated, 0), 1u);
  EXPECT_EQ(points.size, 0u);
  EXPECT_LT(std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count(), 5.0);
}

TEST(HostileCurveInput, StretchesPastTheDoubleRangeAreRefused) {
  // The left side dragged from near the lowest double by as much again: the scale is infinite,
  // and the key at the pivot would become 0 * infinity.
  for (auto& c : AllKinds({-32, 5})) {
    SCOPED_TRACE(c->GetKind());
    ZvExtent2<double> box(-DBL_MAX, -1e6, -13.25, 1e6), moved, changed;
    ZvDoubleArray keys, before, after;
    keys.Add(-32);
    ZvFCurveStretcher stretch(*c, box, keys, ZvExtent2<double>(), ZvPoint2<double>{-32, 0},
                              ZvBaseFCurve::LeftHandle, 0, 0.001);
    ZvPoint2<double> drag{-DBL_MAX, 0};
    int clamped = 0;
    EXPECT_EQ(stretch.Update(drag, -1e9, 1e9, before, after, changed, moved, clamped), 0);
    EXPECT_EQ(drag.x, -DBL_MAX);
    EXPECT_EQ(KeysOf(*c), (std::vector<double>{-32, 5}));
  }
}

TEST(HostileCurveInput, ResamplingAPointOrAReversedIntervalCoversOnlyItsFoldedPart) {
  // The point folds, as an end, onto the end of the period before: it is no range across the
  // boundary, whose two pieces would be the whole million-unit period twice.
  for (auto& c : AllKinds({-14.25, 1e6}, false)) {
    SCOPED_TRACE(c->GetKind());
    c->SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation);
    EXPECT_EQ(c->ResampleSequence(-14.25, -14.25, 1.0, 0, 0), 1u);
    EXPECT_EQ(KeysOf(*c), (std::vector<double>{-14.25, 1e6}));
    // A reversed interval ending on the boundary covers the last 10.25 of the period before,
    // whose step of 2 goes the other way: its two ends.
    EXPECT_EQ(c->ResampleSequence(-14.25, -24.5, 2.0, 1, 0), 1u);
    EXPECT_EQ(KeysOf(*c), (std::vector<double>{-14.25, 1e6 - 10.25, 1e6}));
  }
}

TEST(HostileCurveInput, StretchesThatRoundKeysTogetherAreRefused) {
  // Keys 3.6e-15 apart, carried 12 to the left by a ripple stretch, land on one parameter.
  const std::vector<double> at{-21.5, -21.499999999999996, 1};
  for (auto& c : AllKinds(at)) {
    SCOPED_TRACE(c->GetKind());
    ZvExtent2<double> box(0.5, -1e6, 1e300, 1e6), moved, changed;
    ZvDoubleArray keys, before, after;
    keys.Add(1);
    ZvFCurveStretcher stretch(*c, box, keys, ZvExtent2<double>(-1e9, -1e9, 1e9, 1e9),
                              ZvPoint2<double>{3.25, 0}, ZvBaseFCurve::LeftHandle, 1, 1.001);
    ZvPoint2<double> drag{-12, 0};
    int clamped = 0;
    EXPECT_EQ(stretch.Update(drag, -1e9, 1e9, before, after, changed, moved, clamped), 0);
    EXPECT_EQ(KeysOf(*c), at);
  }
}

TEST(HostileCurveInput, SamplingsThatWouldFlattenBeyondTheCapAreRefused) {
  // A million points for each cubic at this tolerance, over 2,000 periods of two cubics: the
  // samples are few, the points streamed through the sampler would be billions.
  ZvStdFCurve c;
  MakeCyclicArch(c);
  ZvDoubleArray params, values;
  const auto start = std::chrono::steady_clock::now();
  EXPECT_EQ(c.EvalSequence(0, 1000, 1.0, 1e-300, params, values, 0), 0u);
  EXPECT_LT(std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count(), 10.0);
  // At an ordinary tolerance the same sampling goes through.
  EXPECT_EQ(c.EvalSequence(0, 1000, 1.0, 0.01, params, values, 0), 1001u);
}

TEST(HostileCurveInput, CycleSamplingOverTooManyPeriodsIsRefused) {
  for (auto& c : AllKinds({2, 4, 15}, false)) {
    c->SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation);
    ZvExtent2<double> box;
    box.AddPoint(ZvPoint2<double>{0, -10});
    box.AddPoint(ZvPoint2<double>{1e18, 10});
    ZvTransfo4 id;
    ZvPoint2dArray points;
    ZvPointTagArray tags;
    ZvBoolArray extrapolated;
    EXPECT_EQ(c->FlattenFromTo(box, id, 0.01, points, tags, extrapolated, 0), 0u);
    EXPECT_EQ(points.size, 0u);
    ZvDoubleArray params, values;
    EXPECT_EQ(c->EvalSequence(0, 1e18, 1e12, 0.01, params, values, 0), 0u);
    EXPECT_EQ(c->EvalSequence(0, 100, 1e-12, 0.01, params, values, 0), 0u);
  }
}

TEST(HostileCurveInput, ResamplingIsBoundedByTheKeyCap) {
  for (auto& c : AllKinds({0, 1e6})) {
    c->SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation);
    EXPECT_EQ(c->ResampleSequence(0, 1e6, 1e-13, 0, 0), 0u);
    EXPECT_EQ(c->ResampleSequence(0, 4.29e9, 1e-3, 0, 0), 0u);
    EXPECT_EQ(KeysOf(*c), (std::vector<double>{0, 1e6}));
    EXPECT_EQ(c->ResampleSequence(0, 1e6, 1e5, 0, 0), 1u);
    EXPECT_EQ(c->GetNumKeys(), 11u);
  }
  // A downward step makes the same keys as an upward one (they are placed in ascending order).
  for (auto& c : AllKinds({0, 10}, false)) {
    EXPECT_EQ(c->ResampleSequence(10, 0, -1, 0, 0), 1u);
    std::vector<double> expected;
    for (int i = 0; i <= 10; ++i)
      expected.push_back(i);
    EXPECT_EQ(KeysOf(*c), expected) << c->GetKind();
  }
  // Samples in front of many keys would each move all of them: refused.
  ZvRawFCurve many;
  ASSERT_EQ(many.ResampleSequence(0, 1e6, 1, 0, 0), 1u);
  EXPECT_EQ(many.ResampleSequence(-1, 0, 1e-6, 1, 0), 0u);
  EXPECT_EQ(many.GetNumKeys(), 1000001u);
}

TEST(HostileCurveInput, NonFiniteParametersAreNeverStored) {
  ZvStdFCurve a(kNaN, 1, 2, 3);
  EXPECT_EQ(a.GetNumKeys(), 0u);
  ZvStdFCurve b(0, 1, kInf, 3);
  EXPECT_EQ(b.GetNumKeys(), 0u);
  ZvStdFCurve d(kNaN, 1.0, 1.0, ZvBaseFCurve::CubicSegment);
  EXPECT_EQ(d.GetNumKeys(), 0u);
  ZvRawFCurve r(kInf, 1.0);
  EXPECT_EQ(r.GetNumKeys(), 0u);
  ZvRawFCurve r2(0, 1, kNaN, 2);
  EXPECT_EQ(r2.GetNumKeys(), 0u);
  for (auto& c : AllKinds({0, 1})) {
    EXPECT_EQ(c->CreateKey(kNaN, 0), 0u);
    EXPECT_EQ(c->CreateKey(-kInf, 0), 0u);
    EXPECT_EQ(c->CreateNonModifyingKey(kInf, 1), 0u);
    // Folding into a period from the lowest double overflows: no key may come of it.
    std::unique_ptr<ZvBaseFCurve> wide(c->Clone());
    wide->CreateKey(-DBL_MAX, 0);
    wide->SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation);
    wide->CreateNonModifyingKey(1e308, 0);
    for (double p : KeysOf(*wide))
      EXPECT_TRUE(std::isfinite(p)) << c->GetKind();
    EXPECT_EQ(c->ShiftParameters(kInf), 0u);
    EXPECT_EQ(c->RemoveHead(kNaN), 0u);
    EXPECT_EQ(c->RemoveTail(kInf), 0u);
    std::unique_ptr<ZvBaseFCurve> snap(c->SnapShot(kNaN, 5, ZvBaseFCurve::ConstantExtrapolation));
    if (snap) {
      for (double p : KeysOf(*snap))
        EXPECT_TRUE(std::isfinite(p)) << c->GetKind();
    }
    EXPECT_EQ(KeysOf(*c), (std::vector<double>{0, 1}));
  }
}

TEST(HostileCurveInput, KeyQueriesAtNaNFindNoKey) {
  // One key is the case where a NaN used to reach the bisection and read past the keys.
  for (auto& c : AllKinds({3})) {
    unsigned int index;
    EXPECT_EQ(c->GetKeyIndex(kNaN, index), 0u);
    c->Eval(kNaN, 0);
  }
  for (auto& c : AllKinds({0, 1, 2})) {
    SCOPED_TRACE(c->GetKind());
    unsigned int index = 7;
    EXPECT_EQ(c->GetKeyIndex(kNaN, index), 0u);
    double p = kNaN, v;
    EXPECT_EQ(c->IsKeyParameter(kNaN, 1.0), 0u);
    EXPECT_EQ(c->GetNearestKeyParameter(kNaN, p), 0u);
    EXPECT_EQ(c->GetNextKeyParameter(kNaN, p, 1), 0u);
    EXPECT_EQ(c->GetPrevKeyParameter(kNaN, p, 1), 0u);
    EXPECT_EQ(c->GetKeyValue(kNaN, ZvBaseFCurve::RightSide, v, 1.0), 0u);
    EXPECT_EQ(c->SetKeyValue(kNaN, ZvBaseFCurve::RightSide, 1, 1.0), 0u);
    EXPECT_EQ(c->RemoveKey(kNaN, 1.0), 0u);
    EXPECT_EQ(c->GetNumKeys(), 3u);
  }
}

TEST(HostileCurveInput, RotationSplicesRefuseWhatWouldBreakKeyOrder) {
  const auto rotation = [](std::vector<double> at) {
    std::unique_ptr<ZvQuatFCurve> c(new ZvQuatFCurve(0));
    for (double t : at)
      c->CreateKey(t, t);
    return c;
  };
  // Ends closer than the key tolerance find one key: nothing is cut, and the call returns.
  auto narrow = rotation({31.5});
  ZvQuatFCurve out(0);
  EXPECT_EQ(narrow->Cut(-0.0, 5e-324, out), 1u);
  EXPECT_EQ(KeysOf(*narrow), (std::vector<double>{0, 31.5}));
  // The tail moved by the width of a cut from near the largest double lands on the keys before.
  auto wide = rotation({0, 2, 3});
  EXPECT_EQ(wide->Cut(1, 1e308, out), 0u);
  EXPECT_EQ(KeysOf(*wide), (std::vector<double>{0, 2, 3}));
  // A paste far to the left moves the tail onto one parameter.
  auto pasted = rotation({0, 1, 2});
  EXPECT_EQ(pasted->Paste(*rotation({0, 1}), -1e156, 0.5), 0u);
  EXPECT_EQ(KeysOf(*pasted), (std::vector<double>{0, 1, 2}));
  EXPECT_EQ(pasted->ScaleAndOffsetParameters(-DBL_MAX, DBL_MAX, kNaN, 2, 0, 0, 0,
                                             ZvBaseFCurve::BottomHandle),
            0u);
  EXPECT_EQ(pasted->ScaleAndOffsetParameters(0, 2, 0, DBL_MAX, 0, 0, 0, ZvBaseFCurve::BottomHandle),
            0u);
  EXPECT_EQ(KeysOf(*pasted), (std::vector<double>{0, 1, 2}));
  // A merge onto a parameter beyond the largest float from every key has no key to take the
  // attributes from.
  auto far = rotation({0, 1});
  EXPECT_EQ(far->MergeAndCreateNonModifyingKey(-10, 11, -DBL_MAX, 0, 0, 1, 1), 1u);
  EXPECT_EQ(KeysOf(*far), (std::vector<double>{-DBL_MAX}));
  // Ordinary splices still join: the piece's first key replaces the key it lands on.
  EXPECT_EQ(pasted->Paste(*rotation({0, 1}), 1, 1), 1u);
  EXPECT_EQ(KeysOf(*pasted), (std::vector<double>{0, 1, 2, 3}));
  EXPECT_EQ(pasted->Append(*rotation({10, 11})), 1u);
  EXPECT_EQ(KeysOf(*pasted), (std::vector<double>{0, 1, 2, 3, 4}));
}

TEST(HostileCurveInput, LargeSplicesResamplingsAndReadsTakeLinearTime) {
  // 2^17 keys: linear work takes a fraction of a second, work that moves the tail once per key or
  // walks the keys once per key takes minutes. The bound leaves room for sanitizers and
  // emulators.
  const double n = 131072;
  const auto start = std::chrono::steady_clock::now();
  for (auto& c : AllKinds({0, 1})) {
    SCOPED_TRACE(c->GetKind());
    ASSERT_EQ(c->ResampleSequence(0, n, 1, 0, 0), 1u);
    std::unique_ptr<ZvBaseFCurve> piece(c->Clone());
    ASSERT_EQ(c->Paste(*piece, 10.5, 10.5), 1u);
    EXPECT_EQ(c->GetNumKeys(), 2 * n + 2);
    ASSERT_EQ(c->Append(*piece), 1u);
    const std::vector<unsigned char> block = Block(*c);
    unsigned int consumed = 0;
    std::unique_ptr<ZvBaseFCurve> back(
        ZvBaseFCurve_CreateFromBuffer(block.data(), block.size(), consumed));
    ASSERT_NE(back, nullptr);
    EXPECT_EQ(back->GetNumKeys(), c->GetNumKeys());
    ExpectAscending(KeysOf(*back));
  }
  EXPECT_LT(std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count(), 30.0);
  // A snapshot of many short periods joins them one after the other: 10^5 periods take
  // milliseconds, rescanning the snapshot at each takes many seconds.
  const auto snapStart = std::chrono::steady_clock::now();
  for (auto& c : AllKinds({0, 1}, false)) {
    SCOPED_TRACE(c->GetKind());
    c->SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation);
    std::unique_ptr<ZvBaseFCurve> snap(c->SnapShot(0, 99999, ZvBaseFCurve::CycleExtrapolation));
    ASSERT_NE(snap, nullptr);
    EXPECT_EQ(snap->GetNumKeys(), 100000u);
  }
  EXPECT_LT(std::chrono::duration<double>(std::chrono::steady_clock::now() - snapStart).count(),
            5.0);
  // A rotation's snapshot keys each sample of its drawing, several for each of these keys.
  ZvQuatFCurve rotation(0);
  for (int i = 0; i < 4096; ++i)
    rotation.CreateKey(i, i % 2 ? 30.0 : 0.0);
  const auto rotationStart = std::chrono::steady_clock::now();
  std::unique_ptr<ZvBaseFCurve> snap(
      rotation.SnapShot(0, 4095, ZvBaseFCurve::ConstantExtrapolation));
  const double rotationSeconds =
      std::chrono::duration<double>(std::chrono::steady_clock::now() - rotationStart).count();
  ASSERT_NE(snap, nullptr);
  EXPECT_GT(snap->GetNumKeys(), 4 * 4096u);
  ExpectAscending(KeysOf(*snap));
  EXPECT_LT(rotationSeconds, 2.0);
}

TEST(HostileCurveInput, CycleSnapshotsAreBoundedByTheKeyCap) {
  std::vector<double> at;
  for (int i = 0; i < 4096; ++i)
    at.push_back(i);
  for (auto& c : AllKinds(at, false)) {
    SCOPED_TRACE(c->GetKind());
    c->SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation);
    // 1e4 periods of 4096 keys: 4e7 keys, refused before any is made.
    std::unique_ptr<ZvBaseFCurve> huge(
        c->SnapShot(0, 4095.0 * 1e4, ZvBaseFCurve::ConstantExtrapolation));
    EXPECT_EQ(huge, nullptr);
    std::unique_ptr<ZvBaseFCurve> some(
        c->SnapShot(0, 4095.0 * 10, ZvBaseFCurve::ConstantExtrapolation));
    ASSERT_NE(some, nullptr);
    EXPECT_EQ(some->GetNumKeys(), 4095u * 10 + 1);
  }
}

TEST(HostileCurveInput, CycleSnapshotsFarFromTheOriginReturn) {
  // Periods are counted near 1e17 there, where adding one rounds back to the same count.
  for (auto& c : AllKinds({0, 2, 7}, false)) {
    c->SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation);
    for (double at : {1e18, -1e18}) {
      std::unique_ptr<ZvBaseFCurve> snap(
          c->SnapShot(at, at + 1e4, ZvBaseFCurve::LinearExtrapolation));
      if (snap) ExpectAscending(KeysOf(*snap));
      snap.reset(c->SnapShot(at, at, ZvBaseFCurve::ConstantExtrapolation));
      if (snap) ExpectAscending(KeysOf(*snap));
    }
  }
}

TEST(HostileCurveInput, EditedStandardCurvesWriteBlocksThatReadBackEqual) {
  // A refitted run pasted back joins at keys whose handles may no longer agree; a block read
  // back claims continuity only where they do, so the curve must not claim it either.
  ZvStdFCurve c;
  ASSERT_EQ(c.ResampleSequence(1e-7, -32, -32, 1, 0), 1u);
  c.ReduceNumKeys(-32, -22.75, -32);
  const std::vector<unsigned char> block = Block(c);
  unsigned int consumed = 0;
  std::unique_ptr<ZvBaseFCurve> back(
      ZvBaseFCurve_CreateFromBuffer(block.data(), block.size(), consumed));
  ASSERT_NE(back, nullptr);
  EXPECT_EQ(Block(*back), block);
}

}  // namespace
