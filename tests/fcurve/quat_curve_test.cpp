#include <zv/quat_fcurve.h>

#include <gtest/gtest.h>

#include <cmath>

namespace {

constexpr double kPi = 3.141592653589793;

ZvPoint3<double> Angles(double x, double y, double z) {
  return ZvPoint3<double>{x, y, z};
}

TEST(QuatCurve, EvaluatesWithoutKeysOneKeyAndOnTheKeysOwnBranch) {
  ZvQuatCurve c;
  c.SetValueWhenNoKeys(Angles(0.1, 0.2, 0.3));
  EXPECT_DOUBLE_EQ(c.Eval(5.0).y, 0.2);
  EXPECT_NEAR(c.Eval(5.0, 2), 0.3 * 57.29577951308232, 1e-12);
  c.SetKey(1.0, Angles(0.0, 0.0, 10.0), 0.0);  // ten radians: kept as keyed
  EXPECT_DOUBLE_EQ(c.Eval(-3.0).z, 10.0);
  // Keys at 170 and 190 degrees: the middle evaluates at 180, on the keys' side of the cut,
  // not at -180.
  ZvQuatCurve d;
  d.SetKey(0.0, 2, 170.0, 0.0);
  d.SetKey(1.0, 2, 190.0, 0.0);
  EXPECT_NEAR(d.Eval(0.5, 2), 180.0, 1e-9);
  EXPECT_NEAR(d.Eval(1.0, 2), 190.0, 1e-9);
  EXPECT_NEAR(d.Eval(0.0, 2), 170.0, 1e-9);
}

TEST(QuatCurve, CachesTheLastResultUntilTheKeysChange) {
  ZvQuatCurve c;
  c.SetKey(0.0, Angles(0.0, 0.0, 0.0), 0.0);
  c.SetKey(1.0, Angles(1.0, 0.5, -0.5), 0.0);
  const ZvPoint3<double> a = c.Eval(0.3);
  const ZvPoint3<double> b = c.Eval(0.3 + 1e-10);
  EXPECT_EQ(a.x, b.x);
  EXPECT_EQ(a.y, b.y);
  EXPECT_EQ(a.z, b.z);
  EXPECT_NE(c.Eval(0.3 + 1e-3).x, a.x);
  // A changed key rebuilds the spline and is seen at once, even at the cached time.
  c.Eval(0.3);
  c.SetKeyValue(1, 0, 120.0);
  EXPECT_NE(c.Eval(0.3).x, a.x);
  // So is a changed extrapolation beyond the keys.
  const double held = c.Eval(3.5, 0);
  ASSERT_EQ(c.SetExtrapolationMethod(3), 1);
  EXPECT_NEAR(c.Eval(3.5, 0), c.Eval(0.5, 0), 1e-9);
  EXPECT_NE(c.Eval(3.5, 0), held);
  EXPECT_EQ(c.SetExtrapolationMethod(0), 0);
  EXPECT_EQ(c.SetExtrapolationMethod(5), 0);
  EXPECT_EQ(c.GetExtrapolationMethod(), 3u);
}

TEST(QuatCurve, FindsSetsAndRemovesKeys) {
  ZvQuatCurve c;
  EXPECT_EQ(c.SetKey(2.0, Angles(0.2, 0, 0), 0.0), 0u);
  EXPECT_EQ(c.SetKey(1.0, Angles(0.1, 0, 0), 0.0), 0u);
  EXPECT_EQ(c.SetKey(3.0, Angles(0.3, 0, 0), 0.0), 2u);
  // Within the tolerance the key is replaced, time included.
  EXPECT_EQ(c.SetKey(2.05, Angles(0.25, 0, 0), 0.1), 1u);
  EXPECT_EQ(c.GetNumKeys(), 3u);
  EXPECT_EQ(c.GetKeyTime(1), 2.05);
  // Nearest in range; of two equally near the earlier; nothing outside.
  EXPECT_EQ(c.FindKey(2.9, 0.5), 2u);
  EXPECT_EQ(c.FindKey(1.525, 0.6), 0u);
  EXPECT_EQ(c.FindKey(1.5, 0.4), ZvQuatCurve::NoKey);
  EXPECT_EQ(c.GetNextKey(2.05, 0.0), 2u);
  EXPECT_EQ(c.GetPrevKey(2.05, 0.0), 0u);
  EXPECT_EQ(c.GetNextKey(3.0, 0.0), ZvQuatCurve::NoKey);
  EXPECT_EQ(c.RemoveKeyRange(2, 1), 0);
  EXPECT_EQ(c.RemoveKeyRange(1, 3), 0);
  EXPECT_EQ(c.RemoveKey(1.2, 0.1), 0);
  EXPECT_EQ(c.RemoveKey(1.05, 0.1), 1);
  EXPECT_EQ(c.GetNumKeys(), 2u);
  EXPECT_EQ(c.RemoveKeyAt(2), 0);
  ZvQuatKey k;
  EXPECT_EQ(c.GetKey(2, k), 0);
  ASSERT_EQ(c.GetKey(1, k), 1);
  EXPECT_EQ(k.angles.x, 0.3);
}

TEST(QuatCurve, ScaleAndShiftSpareLockedKeys) {
  ZvQuatCurve c;
  for (int i = 0; i < 3; ++i)
    c.SetKey(i, Angles(0.1 * i, 0, 0), 0.0);
  EXPECT_EQ(c.Scale(0.0), 0);
  ASSERT_EQ(c.SetConstraintData(1, 4), 1);
  EXPECT_EQ(c.GetConstraintData(1), 4u);
  EXPECT_TRUE(c.IsParamLocked(1) && !c.IsValueLocked(1));
  EXPECT_EQ(c.Shift(5.0), 1);
  EXPECT_EQ(c.GetKeyTime(0), 5.0);
  EXPECT_EQ(c.GetKeyTime(1), 1.0);
  EXPECT_EQ(c.IsValid(), 0);
  EXPECT_EQ(c.Scale(0.1), 1);
  EXPECT_EQ(c.GetKeyTime(2), 0.7000000000000001);
  EXPECT_EQ(c.GetKeyTime(1), 1.0);
  c.SetValueLock(0, 1);
  EXPECT_EQ(c.GetConstraintData(0), 2u);
  EXPECT_EQ(c.GetConstraintData(7), 0u);
}

TEST(QuatCurve, KeyExtentCoversNeighboursInTheDisplayedBranch) {
  ZvQuatCurve c;
  EXPECT_EQ(c.GetKeyExtent(0, 0).kind, ZvExtent2<double>::Empty);
  c.SetKey(1.0, Angles(0, 0, -kPi / 2), 0.0);  // -90 shows as 270
  c.SetKey(2.0, Angles(0, 0, kPi / 4), 0.0);
  const ZvExtent2<double> e = c.GetKeyExtent(1, 2);
  // Missing neighbours count as time 0 with the no-keys value.
  EXPECT_EQ(e.xmin, 0.0);
  EXPECT_EQ(e.xmax, 2.0);
  EXPECT_EQ(e.ymin, 0.0);
  EXPECT_NEAR(e.ymax, 270.0, 1e-9);
}

TEST(QuatCurve, ReferenceCountDecidesItsLife) {
  ZvQuatCurve* c = new ZvQuatCurve;
  c->Ref();  // the test's own reference, to watch the count
  {
    ZvQuatFCurve x(c, 0), y(c, 1), z(c, 2);
    EXPECT_EQ(c->GetRefCount(), 4);
    ZvQuatFCurve copy(x);  // a copy owns a rotation curve of its own
    EXPECT_NE(copy.GetQuatCurve(), c);
    EXPECT_EQ(c->GetRefCount(), 4);
  }
  EXPECT_EQ(c->GetRefCount(), 1);
  c->UnRef();  // frees it; the leak checker of the sanitizer build watches this

  // Without an outside reference the rotation outlives the view that made it.
  ZvQuatFCurve* maker = new ZvQuatFCurve(0);
  ZvQuatFCurve* other = new ZvQuatFCurve(maker->GetQuatCurve(), 1);
  maker->CreateKey(1.0, 10.0);
  delete maker;
  EXPECT_EQ(other->GetNumKeys(), 1u);
  EXPECT_NEAR(other->Eval(2.0, 0), 0.0, 1e-12);
  EXPECT_EQ(other->GetQuatCurve()->GetRefCount(), 1);
  delete other;
}

}  // namespace
