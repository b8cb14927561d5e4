// Dragging tangent handles: constraints, the far handles giving way, the other handle following,
// and the promise that a drag never leaves a segment that is not a function.
#include <gtest/gtest.h>

#include <zv/std_tgt_mover.h>

#include "stdedit_util.h"

#include <cmath>
#include <random>

namespace {

using stdedit::C;
using P = ZvPoint2<double>;

// The absolute stored handle on one side of the key at t.
P Handle(const ZvStdFCurve& c, double t, C::KeySide side) {
  P l, r;
  double lv = 0, rv = 0;
  c.GetActualKeyTgtHandles(t, l, r, 0.0);
  c.GetKeyValues(t, lv, rv, 0.0);
  return side == C::LeftSide ? P{t + l.x, lv + l.y} : P{t + r.x, rv + r.y};
}

// Keys (0, 0), (3, 3), (6, 0); the outer keys' inner handles reach far across (slope 1/2), the
// middle key's handles are short and level.
ZvStdFCurve ThreeKeys() {
  ZvStdFCurve c = stdedit::Polyline({{0, 0}, {3, 3}, {6, 0}}, C::CubicSegment);
  c.SetKeyTgtHandles(0.0, {-1, 0}, {2.4, 1.2}, 0.0);
  c.SetKeyTgtHandles(3.0, {-1, 0}, {1, 0}, 0.0);
  c.SetKeyTgtHandles(6.0, {-2.4, -1.2}, {1, 0}, 0.0);
  return c;
}

double ScreenLength(const P& v, double ratio) {
  return std::hypot(v.x, ratio * v.y);
}

// Past the far key, the far handle slides along its own line just far enough; dragged back, it
// returns to where it was. The left handle is the mirror image of the right one.
TEST(StdTgtMover, FarHandleSlidesAlongItsLineOnBothSides) {
  for (const C::KeySide side : {C::RightSide, C::LeftSide}) {
    const double s = side == C::RightSide ? 1.0 : -1.0, farKey = 3.0 + 3.0 * s;
    const C::KeySide farSide = side == C::RightSide ? C::LeftSide : C::RightSide;
    ZvStdFCurve c = ThreeKeys();
    const P saved = Handle(c, farKey, farSide);
    ZvStdTgtMover mover(c, 3.0 + 1e-4, side, 1e-3);
    ZvExtent2<double> ext;
    ASSERT_EQ(mover.Update({3.0 - s, 5.0}, 0, 0, 1.0, ext), 1);  // behind its key
    EXPECT_EQ(Handle(c, 3.0, side).x, 3.0);
    EXPECT_EQ(Handle(c, 3.0, side).y, 5.0);
    EXPECT_EQ(Handle(c, 3.0, farSide).x, 3.0 - s);  // without continuity the other one stays
    const P wanted{3.0 + 3.6 * s, 3.0};
    ASSERT_EQ(mover.Update(wanted, 0, 0, 1.0, ext), 1);
    EXPECT_EQ(Handle(c, 3.0, side).x, wanted.x);
    const P moved = Handle(c, farKey, farSide);
    EXPECT_EQ(c.IsValid(), 1u) << side;
    EXPECT_GT((moved.x - saved.x) * s, 0.1);  // shortened toward its own key
    EXPECT_NEAR(moved.y, (moved.x - farKey) / 2.0, 1e-12);
    // Just enough: a little less would fold the segment.
    const P less{moved.x - 1e-3 * s, moved.y}, key{3.0, 3.0}, fk{farKey, 0.0};
    EXPECT_EQ(s > 0 ? ZvStdFCurve_IsCubicSegmentValid(key, wanted, less, fk)
                    : ZvStdFCurve_IsCubicSegmentValid(fk, less, wanted, key),
              0);
    EXPECT_LE(ext.xmin, std::min(moved.x, wanted.x));  // old and new places are to redraw
    EXPECT_GE(ext.xmax, std::max(moved.x, wanted.x));
    ASSERT_EQ(mover.Update({3.0 + s, 3.0}, 0, 0, 1.0, ext), 1);
    EXPECT_EQ(Handle(c, farKey, farSide).x, saved.x);
    EXPECT_EQ(Handle(c, farKey, farSide).y, saved.y);
  }
}

TEST(StdTgtMover, DraggedHandleGivesWhenFarHandleCannot) {
  ZvStdFCurve c = ThreeKeys();
  c.SetKeyTgtHandle(6.0, C::LeftSide, {0.0, -1.0}, 0.0);  // vertical: no line to slide along
  ZvStdTgtMover mover(c, 3.0, C::RightSide, 0.0);
  ZvExtent2<double> ext;
  ASSERT_EQ(mover.Update({7.5, 4.5}, 0, 0, 1.0, ext), 1);
  // Pulled back along its own line to the far key's parameter.
  EXPECT_NEAR(Handle(c, 3.0, C::RightSide).x, 6.0, 1e-9);
  EXPECT_NEAR(Handle(c, 3.0, C::RightSide).y, 4.0, 1e-9);
  EXPECT_EQ(Handle(c, 6.0, C::LeftSide).x, 6.0);
  EXPECT_EQ(c.IsValid(), 1u);
}

TEST(StdTgtMover, LocksAndRefusals) {
  ZvStdFCurve c = ThreeKeys();
  c.SetKeyTgtHandle(3.0, C::RightSide, {1.0, 1.0}, 0.0);
  stdedit::SetFlag(c, 3.0, C::TangentDirectionLock, 1);
  ZvExtent2<double> ext;
  {
    ZvStdTgtMover mover(c, 3.0, C::RightSide, 0.0);
    ASSERT_EQ(mover.Update({5.0, 3.0}, 0, 0, 1.0, ext), 1);  // projected on its line
    EXPECT_NEAR(Handle(c, 3.0, C::RightSide).y, 4.0, 1e-12);
    // Through the key, near it or far from it: the handle keeps its direction, 0.01 long.
    for (const P across : {P{2.9, 2.85}, P{1.0, 1.0}}) {
      ASSERT_EQ(mover.Update(across, 0, 0, 1.0, ext), 1);
      EXPECT_NEAR(Handle(c, 3.0, C::RightSide).x - 3.0, 0.01 / std::sqrt(2.0), 1e-12);
      EXPECT_NEAR(Handle(c, 3.0, C::RightSide).y - 3.0, 0.01 / std::sqrt(2.0), 1e-12);
    }
  }
  stdedit::SetFlag(c, 3.0, C::TangentLengthLock, 1);
  std::string before = stdedit::Dump(c);
  ZvStdTgtMover both(c, 3.0, C::RightSide, 0.0);
  EXPECT_EQ(both.Update({5.0, 1.0}, 1, 1, 1.0, ext), 0);
  EXPECT_EQ(stdedit::Dump(c), before);
  ZvStdTgtMover nowhere(c, 1.5, C::RightSide, 0.1);
  EXPECT_EQ(nowhere.Update({2.0, 1.0}, 0, 0, 1.0, ext), 0);
  stdedit::SetFlag(c, 0.0, C::CollapsedTangent, 1);
  ZvStdTgtMover collapsed(c, 0.0, C::RightSide, 0.0);
  EXPECT_EQ(collapsed.Update({1.0, 1.0}, 0, 0, 1.0, ext), 0);
  before = stdedit::Dump(c);
  c.SetReadOnlyConstraint(1);
  ZvStdTgtMover readOnly(c, 6.0, C::LeftSide, 0.0);
  EXPECT_EQ(readOnly.Update({5.0, 1.0}, 0, 0, 1.0, ext), 1);  // answered as done, nothing moved
  c.SetReadOnlyConstraint(0);
  EXPECT_EQ(stdedit::Dump(c), before);
  // Length locked alone: a circle at ratio 1, an ellipse on screen at ratio 2.
  for (const double ratio : {1.0, 2.0}) {
    ZvStdFCurve l = ThreeKeys();
    l.SetKeyTgtHandle(3.0, C::RightSide, {1.0, 1.0}, 0.0);
    stdedit::SetFlag(l, 3.0, C::TangentLengthLock, 1);
    ZvStdTgtMover mover(l, 3.0, C::RightSide, 0.0);
    ASSERT_EQ(mover.Update({3.1, 4.0}, 0, 0, ratio, ext), 1);
    const P h = Handle(l, 3.0, C::RightSide) - P{3.0, 3.0};
    EXPECT_NEAR(ScreenLength(h, ratio), ScreenLength({1.0, 1.0}, ratio), 1e-12) << ratio;
    EXPECT_NEAR(h.y / h.x, 10.0, 1e-9);  // toward the pointer
  }
}

TEST(StdTgtMover, OtherHandleFollowsAndLocksAreKept) {
  struct Case {
    int tangent, length, mirrored;
    P left;  // expected left handle relative to the key after dragging the right one to (1, 2)
  };
  const double r5 = 1.0 / std::sqrt(5.0);
  for (const Case& k : {Case{1, 0, 0, {-r5, -2 * r5}}, Case{1, 1, 0, {-1, -2}},
                        Case{1, 1, 1, {-1, 2}}, Case{0, 1, 0, {-std::sqrt(5.0), 0}}}) {
    ZvStdFCurve c = ThreeKeys();
    stdedit::SetFlag(c, 3.0, C::MirroredTangents, k.mirrored);
    ZvStdTgtMover mover(c, 3.0, C::RightSide, 0.0);
    ZvExtent2<double> ext;
    ASSERT_EQ(mover.Update({4.0, 5.0}, k.tangent, k.length, 1.0, ext), 1);
    const P left = Handle(c, 3.0, C::LeftSide) - P{3.0, 3.0};
    EXPECT_NEAR(left.x, k.left.x, 1e-12) << k.tangent << k.length << k.mirrored;
    EXPECT_NEAR(left.y, k.left.y, 1e-12) << k.tangent << k.length << k.mirrored;
    EXPECT_EQ(stdedit::HasFlag(c, 3.0, C::TangentContinuity), k.tangent);
    EXPECT_EQ(stdedit::HasFlag(c, 3.0, C::TangentLengthContinuity), k.length);
  }
}

// Random drags with random flags on random curves: every Update leaves every segment a
// function, the handle on its side, and a refused one (after the first, which clears automatic
// flags) changes nothing.
TEST(StdTgtMover, RandomDragsLeaveEverySegmentValid) {
  std::mt19937 rng(19);
  std::uniform_real_distribution<double> u(0.0, 1.0);
  const C::KeyConstraint flags[] = {
      C::AutoTangent,       C::FlatTangent,      C::FlatAtExtremum,
      C::ChordTangent,      C::MirroredTangents, C::TangentDirectionLock,
      C::TangentLengthLock, C::CollapsedTangent, C::TangentLengthContinuity};
  int updates = 0, moved = 0;
  for (int round = 0; round < 1000; ++round) {
    ZvStdFCurve c;
    const int n = 2 + static_cast<int>(u(rng) * 6);
    for (double i = 0, x = 0; i < n; ++i, x += 0.2 + u(rng) * 3)
      c.CreateKey(x, u(rng) * 6 - 3);
    if (u(rng) < 0.2) c.SetDefaultBezierTangentConstraint(1);
    const std::vector<double> t = stdedit::KeyParams(c);
    for (size_t i = 0; i < t.size(); ++i) {
      const double gl = i > 0 ? t[i] - t[i - 1] : 1.0, gr = i + 1 < t.size() ? t[i + 1] - t[i] : 1;
      // Handles within their segments, so that whatever automatic flags the key gets, the
      // handles it is drawn with (frozen by the mover) are valid to start with.
      c.SetKeyTgtHandles(t[i], {-u(rng) * gl, u(rng) * 6 - 3}, {u(rng) * gr, u(rng) * 6 - 3}, 0.0);
      for (const C::KeyConstraint f : flags) {
        if (u(rng) < 0.08) stdedit::SetFlag(c, t[i], f, 1);
      }
      if (u(rng) < 0.15) c.SetSegmentKind(t[i], C::RightSide, C::LinearSegment, 0.0);
    }
    const double at = t[static_cast<size_t>(u(rng) * t.size())];
    const C::KeySide side = u(rng) < 0.5 ? C::LeftSide : C::RightSide;
    ZvStdTgtMover mover(c, at, side, 0.0);
    for (int k = 0; k < 12; ++k) {
      const std::string before = stdedit::Dump(c);
      const P wanted{at + u(rng) * 8 - 4, u(rng) * 8 - 4};
      const double ratio = u(rng) < 0.5 ? 1.0 : 0.25 + u(rng) * 3;
      const int tc = u(rng) < 0.5, lc = u(rng) < 0.3;
      ZvExtent2<double> ext;
      const int r = mover.Update(wanted, tc, lc, ratio, ext);
      ++updates;
      moved += r;
      ASSERT_EQ(c.IsValid(), 1u) << "round " << round << " update " << k << " key " << at
                                 << " side " << side << "\n"
                                 << before << stdedit::Dump(c);
      if (r == 0 && k > 0) {
        ASSERT_EQ(stdedit::Dump(c), before);
      }
      const double x = Handle(c, at, side).x;
      ASSERT_TRUE(side == C::LeftSide ? x <= at : x >= at);
    }
  }
  // Most drags must succeed: refusing everything would pass the checks above.
  EXPECT_GT(moved, updates * 3 / 4) << moved << " of " << updates;
}

// The intervals hold only places where the segment is a function, and miss few of them.
// Uncrossed handles are always valid, so the far handle is bounded by the low end only and the
// near one by the high end only.
TEST(StdTgtMover, ValidIntervalsAreSafeAndTight) {
  std::mt19937 rng(5);
  std::uniform_real_distribution<double> u(0.0, 1.0);
  auto valid = [](double x0, double x1, double x2, double x3) {
    return ZvStdFCurve_IsCubicSegmentValid({x0, 0}, {x1, 0}, {x2, 0}, {x3, 0}) != 0;
  };
  int found = 0;
  for (int i = 0; i < 2000; ++i) {
    const double x0 = u(rng) * 10 - 5, x3 = x0 + 0.1 + u(rng) * 5;
    const double a = x0 + (x3 - x0) * (u(rng) * 1.6 - 0.3);
    const double x1 = std::max(a, x0), x2 = std::min(a, x3);
    double lo, hi;
    if (ComputeP2ValidInterval(x0, x1, x3, lo, hi) && ++found) {
      for (double x : {lo, (lo + hi) / 2, hi})
        EXPECT_TRUE(x > x3 || valid(x0, x1, x, x3));
      EXPECT_TRUE(hi - lo <= 1e-3 || !valid(x0, x1, lo - (hi - lo) * 1e-3, x3));
    }
    if (ComputeP1ValidInterval(x0, x2, x3, lo, hi) && ++found) {
      for (double x : {std::max(lo, x0), (lo + hi) / 2, hi})
        EXPECT_TRUE(x < x0 || valid(x0, x, x2, x3));
      EXPECT_TRUE(hi - lo <= 1e-3 || !valid(x0, hi + (hi - lo) * 1e-3, x2, x3));
    }
  }
  EXPECT_GT(found, 1000);
}

TEST(StdTgtMover, UnifyAndLockTurnsTheOtherHandle) {
  for (const C::KeySide side : {C::RightSide, C::LeftSide}) {
    ZvStdFCurve c = ThreeKeys();
    c.SetKeyTgtHandles(3.0, {-1.0, -1.0}, {1.0, -0.5}, 0.0);
    stdedit::SetFlag(c, 3.0, C::TangentContinuity, 0);
    const P kept = Handle(c, 3.0, side);
    double at = 3.0 + 1e-4;
    ASSERT_EQ(c.UnifyAndLockTangentContinuity(at, side, 1e-3), 1u);
    EXPECT_EQ(at, 3.0);
    EXPECT_EQ(stdedit::HasFlag(c, 3.0, C::TangentContinuity), 1);
    const P l = Handle(c, 3.0, C::LeftSide) - P{3, 3}, r = Handle(c, 3.0, C::RightSide) - P{3, 3};
    EXPECT_NEAR(l.x * r.y - l.y * r.x, 0.0, 1e-12);
    EXPECT_LT(l.x * r.x, 0.0);
    EXPECT_EQ(Handle(c, 3.0, side).x, kept.x);
    EXPECT_EQ(Handle(c, 3.0, side).y, kept.y);
    EXPECT_EQ(c.IsValid(), 1u);
    EXPECT_EQ(c.UnifyAndLockTangentContinuity(at, side, 0.0), 0u);  // nothing left to do
    // The same for lengths, on screen with Y counted twice; the continuity stays.
    ASSERT_EQ(c.UnifyAndLockTangentLengthContinuity(at, side, 0.0, 2.0), 1u);
    EXPECT_NEAR(ScreenLength(Handle(c, 3.0, C::LeftSide) - P{3, 3}, 2.0),
                ScreenLength(Handle(c, 3.0, C::RightSide) - P{3, 3}, 2.0), 1e-12);
    EXPECT_EQ(stdedit::HasFlag(c, 3.0, C::TangentContinuity), 1);
  }
}

}  // namespace
