// Dragging keys: random drags on every draggable kind, then the rules one by one.
#include <zv/fcurve_key_mover.h>
#include <zv/quat_fcurve.h>
#include <zv/raw_fcurve.h>
#include <zv/std_fcurve.h>
#include <zv/step_fcurve.h>

#include <gtest/gtest.h>

#include "drag_curves.h"
#include "stdedit_util.h"
#include "uid.h"

#include <cstdio>
#include <memory>
#include <random>
#include <string>
#include <vector>

namespace {

using namespace dragtest;
using C = ZvBaseFCurve;
using Box = ZvExtent2<double>;

const Box kNoBox;
const Box kWide(-1e3, -1e3, 1e3, 1e3);

class KeyMoverKinds : public ::testing::TestWithParam<C::Kind> {};

// Random selections dragged about never bring two keys together, carry their user data along,
// and come back to the curve they started from when the drag comes back to (0, 0).
TEST_P(KeyMoverKinds, RandomDragsStayApartAndComeBack) {
  std::mt19937 rng(1234 + GetParam());
  std::uniform_int_distribution<int> quarters(-16, 16);
  std::uniform_real_distribution<double> dy(-2.0, 2.0), unit(0.0, 1.0);
  for (int trial = 0; trial < 60; ++trial) {
    std::unique_ptr<C> curve = MakeCurve(GetParam(), rng, 12);
    const std::string start = Dump(*curve), startData = UserData(*curve);
    ZvDoubleArray keys, selected;
    curve->GetAllKeyParameters(keys);
    for (unsigned int i = 0; i < keys.size; ++i)
      if (unit(rng) < 0.4) selected.Add(keys[i]);
    if (selected.size == 0) selected.Add(keys[trial % keys.size]);
    ZvFCurveKeyMover mover(*curve, selected, kWide, kNoBox);
    for (int step = 0; step < 10; ++step) {
      ZvPoint2<double> move{0.25 * quarters(rng), dy(rng)};
      ZvDoubleArray now;
      Box modified, selection;
      mover.Update(move, now, modified, selection, -10, 20);
      ASSERT_NO_FATAL_FAILURE(ExpectApart(*curve));
      ASSERT_EQ(now.size, selected.size);
      for (unsigned int i = 0; i < now.size; ++i)
        EXPECT_TRUE(curve->IsKeyParameter(now[i], 0.0));
      EXPECT_EQ(curve->GetNumKeys(), keys.size);
    }
    ZvPoint2<double> home{0, 0};
    ZvDoubleArray now;
    Box modified, selection;
    mover.Update(home, now, modified, selection, -10, 20);
    EXPECT_EQ(mover.Finalize(), 1);
    EXPECT_EQ(Dump(*curve), start) << "trial " << trial;
    EXPECT_EQ(UserData(*curve), startData) << "trial " << trial;
  }
}

INSTANTIATE_TEST_SUITE_P(AllKinds, KeyMoverKinds,
                         ::testing::Values(C::BooleanKind, C::IntegerKind, C::StdKind, C::RawKind,
                                           C::QuatKind));

struct Drag {
  explicit Drag(ZvFCurveKeyMover& m) : mover(m) {}
  ZvFCurveKeyMover& mover;
  ZvDoubleArray now;
  Box modified, selection;
  int To(double x, double y, double viewStart = -100, double viewEnd = 100) {
    now.Resize(0);
    last = ZvPoint2<double>{x, y};
    return mover.Update(last, now, modified, selection, viewStart, viewEnd);
  }
  ZvPoint2<double> last{0, 0};
};

ZvDoubleArray Params(std::initializer_list<double> list) {
  ZvDoubleArray a;
  for (double t : list)
    a.Add(t);
  return a;
}

std::vector<double> Keys(const C& curve) {
  ZvDoubleArray keys;
  curve.GetAllKeyParameters(keys);
  return std::vector<double>(keys.data, keys.data + keys.size);
}

ZvRawFCurve Raw(std::initializer_list<std::pair<double, double>> points) {
  ZvRawFCurve curve;
  for (const auto& p : points)
    curve.CreateKey(p.first, p.second);
  return curve;
}

// A key stops short of an unmoved key for as long as the drag would put it there, the keys
// behind it stop with it, and the drag goes on once the way is clear.
TEST(KeyMover, StopsOnUnmovedKeysAndGoesOn) {
  ZvRawFCurve curve = Raw({{0, 0}, {1, 1}, {2, 2}, {3, 3}});
  ZvFCurveKeyMover mover(curve, Params({0, 1}), kWide, kNoBox);
  Drag drag(mover);
  EXPECT_EQ(drag.To(0.5, 0), 1);
  EXPECT_EQ(Keys(curve), (std::vector<double>{0.5, 1.5, 2, 3}));
  EXPECT_EQ(drag.To(0.5, 1), 1);  // onto the key at 2: both stay, values follow
  EXPECT_EQ(Keys(curve), (std::vector<double>{0.5, 1.5, 2, 3}));
  EXPECT_DOUBLE_EQ(curve.Eval(1.5, 0), 2.0);
  EXPECT_EQ(drag.To(1.0, 0), 1);
  EXPECT_EQ(Keys(curve), (std::vector<double>{0.5, 1.5, 2, 3})) << "1 + 1 lands on 2";
  EXPECT_EQ(drag.To(1.5, 0), 1);
  EXPECT_EQ(Keys(curve), (std::vector<double>{1.5, 2, 2.5, 3}));
  EXPECT_EQ(drag.To(5, 0), 1);  // past everything in one step
  EXPECT_EQ(Keys(curve), (std::vector<double>{2, 3, 5, 6}));
  EXPECT_EQ(drag.now[0], 5);
  EXPECT_EQ(drag.now[1], 6);
  EXPECT_EQ(drag.To(0, 0), 1);
  EXPECT_EQ(Dump(curve), Dump(Raw({{0, 0}, {1, 1}, {2, 2}, {3, 3}})));
  EXPECT_EQ(drag.To(0, 0), 0) << "nothing left to change";

  // Keys that started nearer than the collision distance may always go back where they were.
  ZvIntegerFCurve close;
  close.CreateKey(0, 0);
  close.CreateKey(5e-7, 1);
  close.CreateKey(1, 0);
  double at = 5e-7;
  close.SetConstraint(at, C::ParameterLock, 1, 0.0);
  const std::string closeStart = Dump(close);
  ZvFCurveKeyMover apart(close, Params({0, 5e-7}), kWide, kNoBox);
  Drag back(apart);
  back.To(-0.5, 1);
  EXPECT_EQ(Keys(close), (std::vector<double>{-0.5, 5e-7, 1}));
  back.To(0, 0);
  EXPECT_EQ(Dump(close), closeStart);
}

// The translation is clamped so that the selection's extreme keys reach the bounds exactly.
TEST(KeyMover, ClampsToBounds) {
  ZvRawFCurve curve = Raw({{0, 0}, {1, 5}, {2, -1}, {9, 0}});
  ZvFCurveKeyMover mover(curve, Params({1, 2}), Box(0.5, -2, 4, 6), Box(1, -1, 2, 5));
  Drag drag(mover);
  drag.To(-3, 4);
  EXPECT_DOUBLE_EQ(drag.last.x, -0.5);
  EXPECT_DOUBLE_EQ(drag.last.y, 1.0);
  EXPECT_EQ(Keys(curve), (std::vector<double>{0, 0.5, 1.5, 9}));
  EXPECT_DOUBLE_EQ(curve.Eval(0.5, 0), 6.0);
  EXPECT_DOUBLE_EQ(drag.selection.xmin, 0.5);
  EXPECT_DOUBLE_EQ(drag.selection.xmax, 1.5);
  EXPECT_DOUBLE_EQ(drag.selection.ymax, 6.0);
  drag.To(7, -9);
  EXPECT_DOUBLE_EQ(drag.last.x, 2.0);
  EXPECT_DOUBLE_EQ(drag.last.y, -1.0);
  EXPECT_EQ(Keys(curve), (std::vector<double>{0, 3, 4, 9}));
}

// Locks degrade a key's motion; they never fail the drag.
TEST(KeyMover, LockedParameterOrValueStays) {
  ZvIntegerFCurve curve;
  for (int i = 0; i < 4; ++i)
    curve.CreateKey(i, i);
  double at = 1;
  curve.SetConstraint(at, C::ParameterLock, 1, 0.0);
  at = 2;
  curve.SetConstraint(at, C::ValueLock, 1, 0.0);
  ZvFCurveKeyMover mover(curve, Params({1, 2}), kWide, kNoBox);
  Drag drag(mover);
  EXPECT_EQ(drag.To(0.5, 2.6), 1);
  EXPECT_EQ(Keys(curve), (std::vector<double>{0, 1, 2.5, 3}));
  EXPECT_EQ(curve.Eval(1, 0), 3) << "value follows, whole part";
  EXPECT_EQ(curve.Eval(2.5, 0), 2) << "value locked";
  EXPECT_EQ(drag.To(-0.999999999999, -1), 1);
  EXPECT_EQ(curve.Eval(1, 0), 0) << "a value a rounding away from whole is whole";

  // All locked: nothing can move, and the mover says so.
  ZvIntegerFCurve locked;
  locked.CreateKey(0, 0);
  at = 0;
  locked.SetConstraint(at, C::WholeKeyLock, 1, 0.0);
  ZvFCurveKeyMover still(locked, Params({0}), kWide, kNoBox);
  Drag none(still);
  EXPECT_EQ(none.To(1, 1), 0);
  EXPECT_EQ(still.Finalize(), 0);
}

// A boolean key flips only past half a unit towards the other value.
TEST(KeyMover, BooleanValuesFlipPastHalf) {
  ZvBooleanFCurve curve;
  curve.CreateKey(0, 0);
  curve.CreateKey(1, 1);
  ZvFCurveKeyMover mover(curve, Params({0, 1}), kWide, kNoBox);
  Drag drag(mover);
  drag.To(0, 0.4);
  EXPECT_EQ(curve.Eval(0, 0), 0);
  drag.To(0, 0.6);
  EXPECT_EQ(curve.Eval(0, 0), 1);
  EXPECT_EQ(curve.Eval(1, 0), 1);
  drag.To(0, -0.6);
  EXPECT_EQ(curve.Eval(0, 0), 0);
  EXPECT_EQ(curve.Eval(1, 0), 0);
}

// Refusals change nothing.
TEST(KeyMover, RefusesBadCallsAndMissingKeys) {
  ZvRawFCurve curve = Raw({{0, 0}, {1, 1}});
  const std::string start = Dump(curve);
  {
    ZvFCurveKeyMover mover(curve, Params({1}), kWide, kNoBox);
    ZvDoubleArray notEmpty = Params({7});
    ZvPoint2<double> move{0.5, 0};
    Box modified, selection;
    EXPECT_EQ(mover.Update(move, notEmpty, modified, selection, 0, 1), 0);
    ZvDoubleArray now;
    EXPECT_EQ(mover.Update(move, now, modified, selection, 2, 1), 0);
    curve.SetReadOnlyConstraint(1);
    EXPECT_EQ(mover.Update(move, now, modified, selection, 0, 1), 0);
    curve.SetReadOnlyConstraint(0);
  }
  for (const ZvDoubleArray& bad : {Params({0.5}), Params({1, 1}), Params({})}) {
    ZvFCurveKeyMover mover(curve, bad, kWide, kNoBox);
    Drag drag(mover);
    EXPECT_EQ(drag.To(0.25, 1), 0);
    EXPECT_EQ(mover.Finalize(), 0);
  }
  EXPECT_EQ(Dump(curve), start);
}

// Handles travel with their key; a segment squeezed by the drag gets shorter handles for as
// long as it is squeezed, and the modified extent covers both places and the ends of the view.
TEST(KeyMover, StandardHandlesTravelAndFit) {
  ZvStdFCurve curve;
  for (int i = 0; i < 3; ++i)
    curve.CreateKey(i, 0);
  curve.SetKeyTgtHandles(1, ZvPoint2<double>{-0.5, -1}, ZvPoint2<double>{0.9, 1}, 0.0);
  const std::string start = stdedit::Dump(curve);
  ZvFCurveKeyMover mover(curve, Params({1}), kWide, kNoBox);
  Drag drag(mover);
  drag.To(0.6, 2, -5, 5);
  ZvPoint2<double> left, right;
  curve.GetActualKeyTgtHandles(1.6, left, right, 0.0);
  EXPECT_DOUBLE_EQ(left.x, -0.5);
  EXPECT_DOUBLE_EQ(left.y, -1);
  EXPECT_NEAR(right.x, 0.4, 1e-12) << "shortened to the segment's length";
  EXPECT_NEAR(right.y, 0.4 / 0.9, 1e-12) << "along its direction";
  EXPECT_TRUE(curve.IsValid());
  EXPECT_LE(drag.modified.xmin, 0.0);
  EXPECT_GE(drag.modified.xmax, 2.0);
  EXPECT_GE(drag.modified.ymax, 2.0);
  drag.To(0, 0);
  EXPECT_EQ(stdedit::Dump(curve), start);

  ZvFCurveKeyMover end(curve, Params({2}), kWide, kNoBox);
  Drag tail(end);
  tail.To(1, 0, -5, 5);
  EXPECT_EQ(tail.modified.xmax, 5) << "moving the last key changes the extrapolation";
}

}  // namespace

namespace {

// An offset of part of the keys is one drag: the keys of the interval, or up to an end of the
// curve when the head or the tail moves, stop short of keys that stay.
TEST(KeyMover, OffsetOfPartOfTheKeys) {
  ZvStdFCurve curve;
  for (int i = 0; i < 6; ++i)
    curve.CreateKey(i, i % 2);
  const ZvStdFCurve original = curve;
  ASSERT_EQ(curve.ScaleAndOffsetParameters(1, 2, 0, 1, 0.5, 0, 0, C::RightHandle), 1u);
  EXPECT_EQ(Keys(curve), (std::vector<double>{0, 1.5, 2.5, 3, 4, 5}));
  EXPECT_DOUBLE_EQ(curve.Eval(2.5, 0), 0.0);
  EXPECT_TRUE(curve.IsValid());

  curve = original;
  ASSERT_EQ(curve.ScaleAndOffsetParameters(1, 2, 0, 1, 1.0, 0, 0, C::RightHandle), 1u);
  EXPECT_EQ(Keys(curve), Keys(original)) << "2 + 1 lands on 3: nothing moves";

  curve = original;
  ASSERT_EQ(curve.ScaleAndOffsetParameters(1, 2, 0, 1, 1.0, 1, 0, C::RightHandle), 1u);
  EXPECT_EQ(Keys(curve), (std::vector<double>{0, 2, 3, 4, 5, 6})) << "the head moves along";

  curve = original;
  ASSERT_EQ(curve.ScaleAndOffsetParameters(3, 4, 0, 1, 0.25, 0, 1, C::RightHandle), 1u);
  EXPECT_EQ(Keys(curve), (std::vector<double>{0.25, 1.25, 2.25, 3.25, 4.25, 5}))
      << "the tail moves along";

  // The same rules for the other kinds, which share the operation.
  ZvRawFCurve raw = Raw({{0, 0}, {1, 1}, {2, 0}});
  ASSERT_EQ(raw.ScaleAndOffsetParameters(0.5, 1.5, 0, 1, -0.75, 0, 0, C::LeftHandle), 1u);
  EXPECT_EQ(Keys(raw), (std::vector<double>{0, 0.25, 2}));
  EXPECT_EQ(raw.ScaleAndOffsetParameters(0.5, 1.5, 0, 2, 0, 0, 0, C::LeftHandle), 1u);
  EXPECT_EQ(Keys(raw), (std::vector<double>{0, 0.25, 2}))
      << "an interval without keys scales only its temporary keys, which go again";
}

}  // namespace
