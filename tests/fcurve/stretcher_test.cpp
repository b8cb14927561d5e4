// Stretching boxes of keys: random stretches on every kind, then the clamps one by one, and the
// scale of part of the keys by ScaleAndOffsetParameters.
#include <zv/fcurve_stretcher.h>
#include <zv/raw_fcurve.h>
#include <zv/std_fcurve.h>
#include <zv/step_fcurve.h>

#include <gtest/gtest.h>

#include "drag_curves.h"

#include <algorithm>
#include <cmath>
#include <memory>
#include <random>
#include <string>
#include <vector>

namespace {

using namespace dragtest;
using Box = ZvExtent2<double>;

const Box kWide(-1e3, -1e3, 1e3, 1e3);

std::vector<double> Keys(const C& curve) {
  ZvDoubleArray keys;
  curve.GetAllKeyParameters(keys);
  return std::vector<double>(keys.data, keys.data + keys.size);
}

template <class Curve>
Curve Points(std::initializer_list<std::pair<double, double>> points) {
  Curve c;
  for (const auto& p : points)
    c.CreateKey(p.first, p.second);
  return c;
}

ZvDoubleArray Params(std::initializer_list<double> list) {
  ZvDoubleArray a;
  for (double t : list)
    a.Add(t);
  return a;
}

// One stretch, with everything Update hands back.
struct Stretch {
  Stretch(C& curve, Box box, ZvDoubleArray selected, ZvPoint2<double> pivot, C::RegionHandle handle,
          int ripple = 0, double minimumScale = 0.001, Box bounds = kWide)
      : stretcher(curve, box, selected, bounds, pivot, handle, ripple, minimumScale) {}
  int To(double x, double y = 0) {
    before.Resize(0);
    after.Resize(0);
    moved = ZvPoint2<double>{x, y};
    return stretcher.Update(moved, -100, 100, before, after, modified, box, clamped);
  }
  ZvFCurveStretcher stretcher;
  ZvPoint2<double> moved{0, 0};
  ZvDoubleArray before, after;
  Box modified, box;
  int clamped = -1;
};

void ExpectKeys(const C& curve, std::vector<double> expected) {
  const std::vector<double> keys = Keys(curve);
  ASSERT_EQ(keys.size(), expected.size());
  for (std::size_t i = 0; i < keys.size(); ++i)
    EXPECT_NEAR(keys[i], expected[i], 1e-12) << i;
}

double Sign(double v) {
  return v < 0 ? -1.0 : v > 0 ? 1.0 : 0.0;
}

class StretcherKinds : public ::testing::TestWithParam<C::Kind> {};

// Random boxes stretched from random sides: keys stay strictly increasing, no moved key passes
// or reaches a key that stays, the scale stays clear of zero, the dry run agrees with Update, and
// a stretch brought back to (0, 0) gives back the curve and its user data.
TEST_P(StretcherKinds, RandomStretchesKeepTheRulesAndComeBack) {
  const C::RegionHandle handles[] = {C::LeftHandle, C::RightHandle, C::TopHandle, C::BottomHandle};
  std::mt19937 rng(99 + GetParam());
  std::uniform_real_distribution<double> unit(0.0, 1.0);
  int stretched = 0, clampedSeen = 0, mirrored = 0;
  for (int trial = 0; trial < 80; ++trial) {
    std::unique_ptr<C> curve = MakeCurve(GetParam(), rng, 12);
    const std::string start = Dump(*curve), startData = UserData(*curve);
    const std::vector<double> keys = Keys(*curve);
    const unsigned int i0 = rng() % 9, i1 = i0 + 1 + rng() % 3;
    ZvDoubleArray selected;
    double low = 1e300, high = -1e300;
    for (unsigned int i = i0; i <= i1; ++i) {
      if (i != i0 && i != i1 && unit(rng) < 0.3) continue;
      selected.Add(keys[i]);
      C::KeyInfo k{};
      k.mask = 511;
      curve->GetKeyInfoFromIndex(i, &k);
      low = std::min({low, k.leftValue, k.rightValue});
      high = std::max({high, k.leftValue, k.rightValue});
    }
    const Box box(keys[i0], low - 0.5, keys[i1], high + 0.5);
    const C::RegionHandle handle = handles[rng() % 4];
    const bool inParameter = handle == C::LeftHandle || handle == C::RightHandle;
    ZvPoint2<double> pivot{handle == C::RightHandle ? box.xmin : box.xmax,
                           handle == C::TopHandle ? box.ymin : box.ymax};
    if (unit(rng) < 0.3) {  // off the opposite side
      pivot.x = box.xmin + (box.xmax - box.xmin) * unit(rng) * 0.8;
      pivot.y = box.ymin + (box.ymax - box.ymin) * unit(rng) * 0.8;
    }
    const double minimumScale = unit(rng) < 0.5 ? 0.001 : 0.05;
    const double size = inParameter ? box.xmax - box.xmin : box.ymax - box.ymin;
    const double margin = inParameter ? 0.001 : 1e-6;
    Stretch s(*curve, box, selected, pivot, handle, unit(rng) < 0.5, minimumScale);
    std::vector<double> startMoved;
    for (int step = 0; step < 10; ++step) {
      const double want = (unit(rng) * 6 - 3) * size;
      ZvPoint2<double> dry{inParameter ? want : 0, inParameter ? 0 : want};
      double scale = 0;
      const int dryClamped = s.stretcher.ComputeScalingFactorAndTranslationVector(dry, scale);
      if (!s.To(inParameter ? want : 0, inParameter ? 0 : want)) {
        EXPECT_EQ(Dump(*curve), start) << "an inert stretcher changes nothing";
        EXPECT_EQ(scale, 1.0);
        break;
      }
      ++stretched;
      clampedSeen += s.clamped;
      mirrored += scale < 0;
      EXPECT_EQ(s.moved.x, dry.x);
      EXPECT_EQ(s.moved.y, dry.y);
      EXPECT_EQ(s.clamped, dryClamped);
      EXPECT_GT(std::fabs(scale), margin / size) << "trial " << trial;
      EXPECT_GE(std::fabs(scale), minimumScale) << "trial " << trial;
      const double stretchedSize = inParameter ? s.box.xmax - s.box.xmin : s.box.ymax - s.box.ymin;
      EXPECT_NEAR(stretchedSize, std::fabs(scale) * size, 1e-9 * size);
      ASSERT_NO_FATAL_FAILURE(ExpectApart(*curve));
      ASSERT_EQ(curve->GetNumKeys(), keys.size());
      if (startMoved.empty()) startMoved.assign(s.before.data, s.before.data + s.before.size);
      ASSERT_EQ(s.after.size, startMoved.size());
      // The keys that stay are where they were, and every moved key on the same side of each.
      for (double u : keys) {
        if (std::find(startMoved.begin(), startMoved.end(), u) != startMoved.end()) continue;
        ASSERT_TRUE(curve->IsKeyParameter(u, 0.0)) << "trial " << trial;
        for (unsigned int i = 0; i < s.after.size; ++i) {
          ASSERT_EQ(Sign(s.after[i] - u), Sign(startMoved[i] - u))
              << "trial " << trial << ": the key from " << startMoved[i] << " passed " << u;
          if (std::fabs(startMoved[i] - u) >= 0.001) {
            EXPECT_GE(std::fabs(s.after[i] - u), 0.001 - 1e-12);
          }
          EXPECT_GE(std::fabs(s.after[i] - u), 0.001 - 1e-12);
        }
      }
    }
    s.To(0, 0);
    s.stretcher.Finalize();
    EXPECT_EQ(Dump(*curve), start) << "trial " << trial;
    EXPECT_EQ(UserData(*curve), startData) << "trial " << trial;
  }
  // The random stretches reached the clamps and, in parameter or value, the mirror.
  EXPECT_GT(stretched, 200);
  EXPECT_GT(clampedSeen, 20);
  EXPECT_GT(mirrored, 5);
}

INSTANTIATE_TEST_SUITE_P(AllKinds, StretcherKinds,
                         ::testing::Values(C::BooleanKind, C::IntegerKind, C::StdKind, C::RawKind,
                                           C::QuatKind));

TEST(Stretcher, ClampsOfAParameterStretch) {
  const Box box(0, -1, 2, 2);
  const ZvDoubleArray first3 = Params({0, 1, 2});
  {
    auto curve = Points<ZvRawFCurve>({{0, 0}, {1, 1}, {2, 0}, {3, 1}});
    Stretch s(curve, box, first3, {0, 0}, C::RightHandle);
    ASSERT_EQ(s.To(5), 1);
    EXPECT_EQ(s.clamped, 1) << "growing against an unselected key stops 0.001 short";
    EXPECT_NEAR(s.moved.x, 0.999, 1e-12);
    ExpectKeys(curve, {0, 1.4995, 2.999, 3});
    ASSERT_EQ(s.To(-2), 1);
    EXPECT_EQ(s.clamped, 1) << "a scale of zero stops at the smallest box";
    EXPECT_NEAR(s.moved.x, (0.0015 - 1) * 2, 1e-12);
    EXPECT_NEAR(s.box.xmax, 0.003, 1e-12);
    ASSERT_EQ(s.To(-0.5), 1);
    EXPECT_EQ(s.clamped, 0);
    EXPECT_EQ(Keys(curve), (std::vector<double>{0, 0.75, 1.5, 3}));
  }
  {
    auto curve = Points<ZvRawFCurve>({{0, 0}, {1, 1}, {2, 0}, {3, 1}});
    Stretch s(curve, box, first3, {0, 0}, C::RightHandle, 0, 0.01);
    ASSERT_EQ(s.To(-2), 1);
    EXPECT_NEAR(s.box.xmax, 0.02, 1e-12) << "or the minimum scale, if larger";
  }
  {
    // Shrinking stops 0.001 before a locked key in the box.
    auto curve =
        Points<ZvIntegerFCurve>({{0, 0}, {1, 1}, {2, 0}, {4, 1}});  // raw keys have no locks
    double at = 2;
    curve.SetConstraint(at, C::ParameterLock, 1, 0.0);
    Stretch s(curve, Box(0, -1, 4, 2), Params({0, 1, 2, 4}), {0, 0}, C::RightHandle);
    ASSERT_EQ(s.To(-3.9), 1);
    EXPECT_EQ(s.clamped, 1);
    ExpectKeys(curve, {0, 0.50025, 2, 2.001});
  }
  {
    // With ripple on the keys behind the box follow its side, and the extent grows with them.
    auto curve = Points<ZvRawFCurve>({{0, 0}, {1, 1}, {2, 0}, {5, 1}, {6, 2}});
    Stretch s(curve, box, first3, {0, 0}, C::RightHandle, 1);
    ASSERT_EQ(s.To(1), 1);
    EXPECT_EQ(Keys(curve), (std::vector<double>{0, 1.5, 3, 6, 7}));
    EXPECT_EQ(s.modified.xmax, 100) << "the last key moved: the view's end is redrawn";
    EXPECT_EQ(s.before.size, 5u);
  }
  {
    // Too narrow a box, or a side dragged from the pivot itself: inert.
    auto curve = Points<ZvRawFCurve>({{0, 0}, {0.0005, 1}, {1, 0}});
    Stretch narrow(curve, Box(0, -1, 0.0005, 2), Params({0, 0.0005}), {0, 0}, C::RightHandle);
    EXPECT_EQ(narrow.To(1), 0);
    ZvPoint2<double> t{1, 1};
    double scale = 0;
    EXPECT_EQ(narrow.stretcher.ComputeScalingFactorAndTranslationVector(t, scale), 0);
    EXPECT_EQ(t.x, 0.0);
    EXPECT_EQ(scale, 1.0);
    EXPECT_EQ(narrow.stretcher.Finalize(), 0);
    Stretch atPivot(curve, Box(0, -1, 1, 2), Params({0, 1}), {1, 0}, C::RightHandle);
    EXPECT_EQ(atPivot.To(1), 0);
    EXPECT_EQ(Keys(curve), (std::vector<double>{0, 0.0005, 1}));
  }
}

// A drag past the pivot mirrors the keys: a Bezier curve between them is the mirror image of what
// it was; with a key between them that stays, the scale stops short of it instead.
TEST(Stretcher, DragPastThePivotMirrors) {
  ZvStdFCurve curve;
  for (double t : {-10.0, 1.0, 2.0, 3.0, 10.0})
    curve.CreateKey(t, t * t * 0.25);
  curve.SetKeyTgtHandles(1.0, {-0.3, -0.1}, {0.3, 0.2}, 0.0);
  curve.SetKeyTgtHandles(2.0, {-0.3, -0.4}, {0.2, 0.9}, 0.0);
  curve.SetKeyTgtHandles(3.0, {-0.1, -0.4}, {0.4, 0.3}, 0.0);
  const ZvStdFCurve original = curve;
  Stretch s(curve, Box(1, -100, 3, 100), Params({1, 2, 3}), {1, 0}, C::RightHandle);
  ASSERT_EQ(s.To(-4), 1);
  EXPECT_EQ(s.clamped, 0);
  EXPECT_EQ(Keys(curve), (std::vector<double>{-10, -1, 0, 1, 10}));
  EXPECT_EQ(curve.IsValid(), 1u);
  for (double t = 1.05; t < 3.0; t += 0.1)
    EXPECT_NEAR(curve.Eval(2.0 - t, 0), original.Eval(t, 0), 1e-9) << t;
  ASSERT_EQ(s.To(0), 1);
  EXPECT_EQ(stdedit::Dump(curve), stdedit::Dump(original));

  auto raw = Points<ZvRawFCurve>({{-10, 0}, {1, 1}, {1.5, 5}, {2, 2}, {3, 3}, {10, 0}});
  Stretch blocked(raw, Box(1, -100, 3, 100), Params({1, 2, 3}), {1, 0}, C::RightHandle);
  ASSERT_EQ(blocked.To(-4), 1);
  EXPECT_EQ(blocked.clamped, 1);
  ExpectKeys(raw, {-10, 1, 1.5, 1.501, 2.002, 10});
}

TEST(Stretcher, ValueStretches) {
  ZvStdFCurve curve;
  for (auto p : {std::pair<double, double>{0, 0}, {1, 2}, {2, 4}, {3, 1}})
    curve.CreateKey(p.first, p.second);
  curve.SetKeyTgtHandles(2.0, {-0.3, -0.5}, {0.3, 0.5}, 0.0);
  const ZvStdFCurve original = curve;
  Stretch s(curve, Box(1, 2, 2, 4), Params({1, 2}), {1, 2}, C::TopHandle);
  ASSERT_EQ(s.To(0, 2), 1);
  EXPECT_EQ(s.clamped, 0);
  EXPECT_EQ(curve.Eval(1, 0), 2.0);
  EXPECT_EQ(curve.Eval(2, 0), 6.0);
  EXPECT_EQ(Keys(curve), Keys(original));
  // The handles of a scaled key scale in value with it: the slope doubles.
  EXPECT_NEAR(curve.Eval(2.0001, 0) - 6.0, 2 * (original.Eval(2.0001, 0) - 4.0), 1e-6);
  ASSERT_EQ(s.To(0, -4), 1) << "past the pivot: mirrored in value";
  EXPECT_EQ(curve.Eval(2, 0), 0.0);

  auto step = Points<ZvIntegerFCurve>({{0, 0}, {1, 1}, {2, 3}});
  Stretch whole(step, Box(1, 1, 2, 3), Params({1, 2}), {1, 1}, C::TopHandle);
  ASSERT_EQ(whole.To(0, 1), 1);
  EXPECT_EQ(step.Eval(2, 0), 4.0);

  auto flags = Points<ZvBooleanFCurve>({{0, 0}, {1, 1}});
  Stretch none(flags, Box(0, 0, 1, 1), Params({0, 1}), {0, 0}, C::TopHandle);
  EXPECT_EQ(none.To(0, 3), 0) << "a boolean curve has no values to stretch";
  EXPECT_EQ(none.clamped, -1) << "and reports nothing";
}

TEST(Stretcher, ScaleAndOffsetParametersOfPartOfTheKeys) {
  const auto make = [] {
    ZvStdFCurve c;
    for (int i = 0; i <= 5; ++i)
      c.CreateKey(i, i * i);
    return c;
  };
  ZvStdFCurve curve = make();
  ASSERT_EQ(curve.ScaleAndOffsetParameters(1, 3, 1, 2.0, 0, 0, 0, C::RightHandle), 1u);
  ExpectKeys(curve, {0, 1, 2.4995, 3.999, 4, 5});  // clamped as a drag, short of the key at 4
  curve = make();
  ASSERT_EQ(curve.ScaleAndOffsetParameters(1, 3, 1, 2.0, 0.5, 1, 0, C::RightHandle), 1u);
  // With the head moving, the keys behind follow, then all of it is offset.
  ExpectKeys(curve, {0, 1.5, 3.5, 5.5, 6.5, 7.5});
  curve = make();
  ASSERT_EQ(curve.ScaleAndOffsetParameters(1, 3, 2, -1.0, 0, 0, 0, C::LeftHandle), 1u);
  EXPECT_EQ(Keys(curve), (std::vector<double>{0, 1, 2, 3, 4, 5}));
  EXPECT_EQ(curve.Eval(1, 0), 9.0);
  EXPECT_EQ(curve.Eval(3, 0), 1.0);
  curve = make();
  EXPECT_EQ(curve.ScaleAndOffsetParameters(0, 2, 0, -1.0, 0, 1, 0, C::RightHandle), 0u)
      << "a mirror that would carry keys across others is refused";
  EXPECT_EQ(Keys(curve), Keys(make()));

  auto raw = Points<ZvRawFCurve>({{0, 0}, {1, 1}, {2, 0}, {4, 1}});
  ASSERT_EQ(raw.ScaleAndOffsetParameters(0, 2, 0, 0.5, 0, 0, 0, C::RightHandle), 1u);
  ExpectKeys(raw, {0, 0.5, 1, 4});
}

}  // namespace
