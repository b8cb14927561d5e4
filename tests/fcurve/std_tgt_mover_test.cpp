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

// Absolute stored handles of the key at t.
void Handles(const ZvStdFCurve& c, double t, P& left, P& right) {
  P l, r;
  double lv = 0, rv = 0;
  c.GetActualKeyTgtHandles(t, l, r, 0.0);
  c.GetKeyValues(t, lv, rv, 0.0);
  left = {t + l.x, lv + l.y};
  right = {t + r.x, rv + r.y};
}

P Right(const ZvStdFCurve& c, double t) {
  P l, r;
  Handles(c, t, l, r);
  return r;
}

P Left(const ZvStdFCurve& c, double t) {
  P l, r;
  Handles(c, t, l, r);
  return l;
}

// Index of the first segment whose stored controls fold back in X, or -1.
int FirstFoldedSegment(const ZvStdFCurve& c) {
  const std::vector<double> t = stdedit::KeyParams(c);
  for (size_t i = 0; i + 1 < t.size(); ++i) {
    double v0l, v0r, v1l, v1r;
    c.GetKeyValues(t[i], v0l, v0r, 0.0);
    c.GetKeyValues(t[i + 1], v1l, v1r, 0.0);
    if (!ZvStdFCurve_IsCubicSegmentValid({t[i], v0r}, Right(c, t[i]), Left(c, t[i + 1]),
                                         {t[i + 1], v1l})) {
      return static_cast<int>(i);
    }
  }
  return -1;
}

// Keys (0, 0), (3, 3), (6, 0); the outer keys' inner handles reach far across, the middle
// key's handles are short and level.
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

TEST(StdTgtMover, FreeDragStaysOnItsSideAndRestoresFarHandle) {
  ZvStdFCurve c = ThreeKeys();
  ZvStdTgtMover mover(c, 3.0 + 1e-4, C::RightSide, 1e-3);
  ZvExtent2<double> ext;
  ASSERT_EQ(mover.Update({4.5, 4.0}, 0, 0, 1.0, ext), 1);
  EXPECT_EQ(Right(c, 3.0).x, 4.5);
  EXPECT_EQ(Right(c, 3.0).y, 4.0);
  EXPECT_LE(ext.xmin, 3.0);  // the old handle (4, 3) and the key's pieces are in the extent
  EXPECT_GE(ext.ymax, 4.0);
  ASSERT_EQ(mover.Update({2.0, 5.0}, 0, 0, 1.0, ext), 1);  // left of its key
  EXPECT_EQ(Right(c, 3.0).x, 3.0);
  EXPECT_EQ(Right(c, 3.0).y, 5.0);
  EXPECT_EQ(Left(c, 3.0).x, 2.0);  // without continuity the other handle stays
  EXPECT_EQ(c.IsValid(), 1u);
}

// Past the far key, the far handle slides along its own line just far enough; dragged back,
// it returns to where it was. The left handle is the mirror image of the right one.
TEST(StdTgtMover, FarHandleSlidesAlongItsLineOnBothSides) {
  for (const C::KeySide side : {C::RightSide, C::LeftSide}) {
    const double s = side == C::RightSide ? 1.0 : -1.0;
    const double farKey = 3.0 + 3.0 * s;
    auto far = [&](const ZvStdFCurve& c) { return s > 0 ? Left(c, 6.0) : Right(c, 0.0); };
    ZvStdFCurve c = ThreeKeys();
    const P saved = far(c);
    ZvStdTgtMover mover(c, 3.0, side, 0.0);
    ZvExtent2<double> ext;
    const P wanted{3.0 + 3.6 * s, 3.0};
    ASSERT_EQ(mover.Update(wanted, 0, 0, 1.0, ext), 1);
    const P moved = far(c);
    EXPECT_EQ(c.IsValid(), 1u) << side;
    EXPECT_EQ(s > 0 ? Right(c, 3.0).x : Left(c, 3.0).x, wanted.x);
    EXPECT_GT((moved.x - saved.x) * s, 0.1);  // shortened toward its own key
    // On the line through the far key and the saved handle (slope 1/2 on both sides).
    EXPECT_NEAR(moved.y, (moved.x - farKey) / 2.0, 1e-12);
    // Just enough: a little less would fold the segment.
    const P less{moved.x - 1e-3 * s, moved.y};
    const P key{3.0, 3.0}, fk{farKey, 0.0};
    EXPECT_EQ(s > 0 ? ZvStdFCurve_IsCubicSegmentValid(key, wanted, less, fk)
                    : ZvStdFCurve_IsCubicSegmentValid(fk, less, wanted, key),
              0);
    EXPECT_GE(ext.xmax - ext.xmin, std::fabs(moved.x - wanted.x));
    ASSERT_EQ(mover.Update({3.0 + s, 3.0}, 0, 0, 1.0, ext), 1);
    EXPECT_EQ(far(c).x, saved.x);
    EXPECT_EQ(far(c).y, saved.y);
  }
}

TEST(StdTgtMover, DraggedHandleGivesWhenFarHandleCannot) {
  ZvStdFCurve c = ThreeKeys();
  c.SetKeyTgtHandle(6.0, C::LeftSide, {0.0, -1.0}, 0.0);  // vertical: no line to slide along
  ZvStdTgtMover mover(c, 3.0, C::RightSide, 0.0);
  ZvExtent2<double> ext;
  ASSERT_EQ(mover.Update({7.5, 4.5}, 0, 0, 1.0, ext), 1);
  // Pulled back along its own line to the far key's parameter.
  EXPECT_NEAR(Right(c, 3.0).x, 6.0, 1e-9);
  EXPECT_NEAR(Right(c, 3.0).y, 4.0, 1e-9);
  EXPECT_EQ(Left(c, 6.0).x, 6.0);
  EXPECT_EQ(c.IsValid(), 1u);
}

TEST(StdTgtMover, DirectionAndLengthLocks) {
  ZvStdFCurve c = ThreeKeys();
  c.SetKeyTgtHandle(3.0, C::RightSide, {1.0, 1.0}, 0.0);
  stdedit::SetFlag(c, 3.0, C::TangentDirectionLock, 1);
  ZvExtent2<double> ext;
  {
    ZvStdTgtMover mover(c, 3.0, C::RightSide, 0.0);
    ASSERT_EQ(mover.Update({5.0, 3.0}, 0, 0, 1.0, ext), 1);  // projected on its line
    EXPECT_NEAR(Right(c, 3.0).x, 4.0, 1e-12);
    EXPECT_NEAR(Right(c, 3.0).y, 4.0, 1e-12);
    // Through the key, near it or far from it: the handle keeps its direction, 0.01 long.
    for (const P across : {P{2.9, 2.85}, P{1.0, 1.0}}) {
      ASSERT_EQ(mover.Update(across, 0, 0, 1.0, ext), 1);
      EXPECT_NEAR(Right(c, 3.0).x - 3.0, 0.01 / std::sqrt(2.0), 1e-12);
      EXPECT_NEAR(Right(c, 3.0).y - 3.0, 0.01 / std::sqrt(2.0), 1e-12);
    }
  }
  stdedit::SetFlag(c, 3.0, C::TangentLengthLock, 1);
  const std::string before = stdedit::Dump(c);
  ZvStdTgtMover both(c, 3.0, C::RightSide, 0.0);
  EXPECT_EQ(both.Update({5.0, 1.0}, 1, 1, 1.0, ext), 0);
  EXPECT_EQ(stdedit::Dump(c), before);
  // Length locked alone: a circle at ratio 1, an ellipse on screen at ratio 2.
  for (const double ratio : {1.0, 2.0}) {
    ZvStdFCurve l = ThreeKeys();
    l.SetKeyTgtHandle(3.0, C::RightSide, {1.0, 1.0}, 0.0);
    stdedit::SetFlag(l, 3.0, C::TangentLengthLock, 1);
    ZvStdTgtMover mover(l, 3.0, C::RightSide, 0.0);
    ASSERT_EQ(mover.Update({3.1, 4.0}, 0, 0, ratio, ext), 1);
    const P h = Right(l, 3.0) - P{3.0, 3.0};
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
    const P left = Left(c, 3.0) - P{3.0, 3.0};
    EXPECT_NEAR(left.x, k.left.x, 1e-12) << k.tangent << k.length << k.mirrored;
    EXPECT_NEAR(left.y, k.left.y, 1e-12) << k.tangent << k.length << k.mirrored;
    EXPECT_EQ(stdedit::HasFlag(c, 3.0, C::TangentContinuity), k.tangent);
    EXPECT_EQ(stdedit::HasFlag(c, 3.0, C::TangentLengthContinuity), k.length);
  }
}

TEST(StdTgtMover, RefusalsAndReadOnly) {
  ZvStdFCurve c = ThreeKeys();
  ZvExtent2<double> ext;
  ZvStdTgtMover nowhere(c, 1.5, C::RightSide, 0.1);
  EXPECT_EQ(nowhere.Update({2.0, 1.0}, 0, 0, 1.0, ext), 0);
  stdedit::SetFlag(c, 3.0, C::CollapsedTangent, 1);
  ZvStdTgtMover collapsed(c, 3.0, C::RightSide, 0.0);
  EXPECT_EQ(collapsed.Update({4.0, 1.0}, 0, 0, 1.0, ext), 0);
  const std::string before = stdedit::Dump(c);
  c.SetReadOnlyConstraint(1);
  ZvStdTgtMover locked(c, 0.0, C::RightSide, 0.0);
  EXPECT_EQ(locked.Update({1.0, 1.0}, 0, 0, 1.0, ext), 1);  // answered as done, nothing moved
  c.SetReadOnlyConstraint(0);
  EXPECT_EQ(stdedit::Dump(c), before);
  // The outer handles of the end keys are free.
  ZvStdTgtMover last(c, 6.0, C::RightSide, 0.0);
  ASSERT_EQ(last.Update({60.0, -9.0}, 0, 0, 1.0, ext), 1);
  EXPECT_EQ(Right(c, 6.0).x, 60.0);
}

// Random drags with random flags on random curves: every Update leaves every segment a
// function, and a refused one (after the first, which clears automatic flags) changes nothing.
TEST(StdTgtMover, RandomDragsLeaveEverySegmentValid) {
  std::mt19937 rng(19);
  std::uniform_real_distribution<double> u(0.0, 1.0);
  const C::KeyConstraint flags[] = {C::AutoTangent,       C::FlatTangent,
                                    C::FlatAtExtremum,    C::ChordTangent,
                                    C::MirroredTangents,  C::TangentDirectionLock,
                                    C::TangentLengthLock, C::TangentLengthContinuity,
                                    C::CollapsedTangent};
  int updates = 0, moved = 0;
  for (int round = 0; round < 1000; ++round) {
    ZvStdFCurve c;
    const int n = 2 + static_cast<int>(u(rng) * 6);
    double x = 0.0;
    for (int i = 0; i < n; ++i) {
      c.CreateKey(x, u(rng) * 6 - 3);
      x += 0.2 + u(rng) * 3;
    }
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
    ASSERT_EQ(FirstFoldedSegment(c), -1);
    const double at = t[static_cast<size_t>(u(rng) * t.size())];
    const C::KeySide side = u(rng) < 0.5 ? C::LeftSide : C::RightSide;
    ZvStdTgtMover mover(c, at, side, 0.0);
    for (int k = 0; k < 12; ++k) {
      const std::string before = stdedit::Dump(c);
      const P wanted{at + u(rng) * 8 - 4, u(rng) * 8 - 4};
      const double ratio = u(rng) < 0.5 ? 1.0 : 0.25 + u(rng) * 3;
      ZvExtent2<double> ext;
      const int tc = u(rng) < 0.5, lc = u(rng) < 0.3;
      const int r = mover.Update(wanted, tc, lc, ratio, ext);
      ++updates;
      moved += r;
      ASSERT_EQ(FirstFoldedSegment(c), -1)
          << "round " << round << " update " << k << " key " << at << " side " << side << "\n"
          << before << stdedit::Dump(c);
      ASSERT_EQ(c.IsValid(), 1u);
      if (r == 0 && k > 0) {
        ASSERT_EQ(stdedit::Dump(c), before);
      }
      P l, h;
      Handles(c, at, l, h);
      if (r) {
        ASSERT_TRUE(side == C::LeftSide ? l.x <= at : h.x >= at);
      }
    }
  }
  // Most drags must succeed: refusing everything would pass the checks above.
  EXPECT_GT(moved, updates / 2) << moved << " of " << updates;
}

// The intervals hold only places where the segment is a function, and miss few of them.
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
    if (ComputeP2ValidInterval(x0, x1, x3, lo, hi)) {
      ++found;
      const double d = (hi - lo) * 1e-3;
      for (double x : {lo, (lo + hi) / 2, hi})
        EXPECT_TRUE(x > x3 || valid(x0, x1, x, x3)) << x0 << " " << x1 << " " << x3 << " " << x;
      // Uncrossed handles are always valid: only the low end bounds the far handle.
      if (d > 1e-6 && lo - d < x1 - 1e-6) {
        EXPECT_FALSE(valid(x0, x1, lo - d, x3));
      }
    }
    if (ComputeP1ValidInterval(x0, x2, x3, lo, hi)) {
      ++found;
      const double d = (hi - lo) * 1e-3;
      for (double x : {std::max(lo, x0), (lo + hi) / 2, hi})
        EXPECT_TRUE(x < x0 || valid(x0, x, x2, x3)) << x0 << " " << x2 << " " << x3 << " " << x;
      if (d > 1e-6 && hi + d > x2 + 1e-6) {
        EXPECT_FALSE(valid(x0, hi + d, x2, x3));
      }
    }
  }
  EXPECT_GT(found, 1000);
}

TEST(StdTgtMover, UnifyAndLockTurnsTheOtherHandle) {
  for (const C::KeySide side : {C::RightSide, C::LeftSide}) {
    ZvStdFCurve c = ThreeKeys();
    c.SetKeyTgtHandles(3.0, {-1.0, -1.0}, {1.0, -0.5}, 0.0);
    stdedit::SetFlag(c, 3.0, C::TangentContinuity, 0);
    const P keptLeft = Left(c, 3.0), keptRight = Right(c, 3.0);
    double at = 3.0 + 1e-4;
    ASSERT_EQ(c.UnifyAndLockTangentContinuity(at, side, 1e-3), 1u);
    EXPECT_EQ(at, 3.0);
    EXPECT_EQ(stdedit::HasFlag(c, 3.0, C::TangentContinuity), 1);
    const P l = Left(c, 3.0) - P{3, 3}, r = Right(c, 3.0) - P{3, 3};
    EXPECT_NEAR(l.x * r.y - l.y * r.x, 0.0, 1e-12);
    EXPECT_LT(l.x * r.x, 0.0);
    const P kept = side == C::RightSide ? Right(c, 3.0) : Left(c, 3.0);
    const P expected = side == C::RightSide ? keptRight : keptLeft;
    EXPECT_EQ(kept.x, expected.x);
    EXPECT_EQ(kept.y, expected.y);
    EXPECT_EQ(c.IsValid(), 1u);
    EXPECT_EQ(c.UnifyAndLockTangentContinuity(at, side, 0.0), 0u);  // nothing left to do
    // The same for lengths, on screen with Y counted twice.
    ASSERT_EQ(c.UnifyAndLockTangentLengthContinuity(at, side, 0.0, 2.0), 1u);
    EXPECT_NEAR(ScreenLength(Left(c, 3.0) - P{3, 3}, 2.0),
                ScreenLength(Right(c, 3.0) - P{3, 3}, 2.0), 1e-12);
    EXPECT_EQ(stdedit::HasFlag(c, 3.0, C::TangentContinuity), 1);
  }
}

}  // namespace
