#include <zv/quat_fcurve.h>
#include <zv/transfo4.h>

#include <gtest/gtest.h>

#include <cfloat>
#include <cmath>

namespace {

constexpr double kPi = 3.141592653589793;

// Three views of one rotation, as a host keeps the channels of one rotation.
class QuatViews : public ::testing::Test {
 protected:
  QuatViews() : x(0), y(x.GetQuatCurve(), 1), z(x.GetQuatCurve(), 2) {}
  ZvQuatFCurve x, y, z;
};

TEST_F(QuatViews, KeysMadeOnOneViewAreSeenByAll) {
  ASSERT_EQ(y.CreateKey(1.0, 90.0), 1u);
  double v;
  ASSERT_EQ(y.GetKeyValue(1.0, ZvBaseFCurve::LeftSide, v, 0.0), 1u);
  EXPECT_NEAR(v, 90.0, 1e-12);
  EXPECT_NEAR(y.GetQuatCurve()->GetKeyValue(0).y, kPi / 2, 1e-15);
  EXPECT_NEAR(y.Eval(1.0, 0), 90.0, 1e-12);
  EXPECT_EQ(x.GetNumKeys(), 1u);
  EXPECT_EQ(z.GetNumKeys(), 1u);

  ASSERT_EQ(x.CreateKey(3.0, 30.0), 1u);
  ASSERT_EQ(z.CreateKey(5.0, -40.0), 1u);
  // A key made on one channel keeps the other two where the curve had them.
  const double yAt4 = y.Eval(4.0, 0), xAt4 = x.Eval(4.0, 0);
  ASSERT_EQ(z.CreateKey(4.0, 10.0), 1u);
  EXPECT_NEAR(y.Eval(4.0, 0), yAt4, 1e-9);
  EXPECT_NEAR(x.Eval(4.0, 0), xAt4, 1e-9);
  EXPECT_NEAR(z.Eval(4.0, 0), 10.0, 1e-9);
  ZvDoubleArray params, left, right;
  EXPECT_EQ(x.GetKeys(params, left, right, 0), 4u);
  EXPECT_EQ(params[3], 5.0);
  EXPECT_NEAR(left[1], 30.0, 1e-12);
  EXPECT_NEAR(right[1], 30.0, 1e-12);

  ASSERT_EQ(y.RemoveKey(3.0, 0.1), 1u);
  EXPECT_EQ(z.GetNumKeys(), 3u);
  ASSERT_EQ(z.SetKeyValue(5.0, ZvBaseFCurve::RightSide, -45.0, 0.01), 1u);
  EXPECT_NEAR(z.Eval(5.0, 0), -45.0, 1e-9);
}

TEST_F(QuatViews, SnapshotsOfRangesThatReachNoKeyAreSafe) {
  ASSERT_EQ(x.CreateKey(1.0, 10.0), 1u);
  ASSERT_EQ(x.CreateKey(2.0, 20.0), 1u);
  ASSERT_EQ(x.CreateKey(3.0, 30.0), 1u);
  // Reversed and NaN ranges sample nothing rather than read an anchor that is not there.
  for (const double end : {1.5, std::nan("")}) {
    ZvBaseFCurve* shot = x.SnapShot(2.5, end, ZvBaseFCurve::ConstantExtrapolation);
    if (shot) {
      EXPECT_LE(shot->GetNumKeys(), 2u);
    }
    delete shot;
  }
}

TEST_F(QuatViews, ReadOnlyAndLocksRefuseChanges) {
  x.CreateKey(0.0, 10.0);
  x.CreateKey(2.0, 20.0);
  double t = 2.01;
  ASSERT_EQ(x.SetConstraint(t, ZvBaseFCurve::ValueLock, 1, 0.1), 1u);
  EXPECT_EQ(t, 2.0);
  EXPECT_EQ(z.SetKeyValue(2.0, ZvBaseFCurve::RightSide, 5.0, 0.0), 0u);
  EXPECT_EQ(y.AreAnyValuesLockedInInterval(1.0, 2.0, 0, 0), 1u);
  EXPECT_EQ(y.AreAnyValuesLockedInInterval(1.0, 2.0, 0, 1), 0u);
  EXPECT_EQ(y.AreAnyKeysLockedInInterval(0.0, 2.0, 0, 0), 0u);
  int on = 0;
  ASSERT_EQ(y.GetConstraint(t, ZvBaseFCurve::WholeKeyLock, on, 0.0), 1u);
  EXPECT_EQ(on, 0);
  ASSERT_EQ(y.SetConstraint(t, ZvBaseFCurve::WholeKeyLock, 1, 0.0), 1u);
  EXPECT_EQ(y.AreAnyKeysLockedInInterval(0.0, 2.0, 0, 0), 1u);
  EXPECT_EQ(y.SetConstraint(t, ZvBaseFCurve::TangentContinuity, 1, 0.0), 0u);
  EXPECT_EQ(y.IsConstraintSupported(ZvBaseFCurve::FlatTangent), 0u);
  EXPECT_EQ(y.IsConstraintSupported(ZvBaseFCurve::WholeKeyLock), 1u);
  EXPECT_EQ(x.ScaleAndOffsetParameters(0, 2, 0, 2.0, 0, 0, 0, ZvBaseFCurve::LeftHandle), 0u);

  y.SetReadOnlyConstraint(1);
  EXPECT_EQ(x.IsReadOnly(), 1u);  // the flag belongs to the shared rotation
  EXPECT_EQ(z.CreateKey(1.0, 3.0), 0u);
  EXPECT_EQ(z.RemoveKey(0.0, 0.0), 0u);
  EXPECT_EQ(z.SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation), 0u);
  EXPECT_EQ(x.GetNumKeys(), 2u);
}

TEST_F(QuatViews, SlotsWithoutMeaningAnswerAsAnAngleCurve) {
  x.CreateKey(0.0, 10.0);
  x.CreateKey(1.0, 50.0);
  x.CreateKey(2.0, 20.0);
  double p = 0.0;
  EXPECT_EQ(x.EvalInverse(30.0, p, 0), 0u);
  EXPECT_EQ(p, 3.4028234663852886e38);
  EXPECT_EQ(x.ReduceNumKeys(0.0, 2.0, 100.0), 0u);
  EXPECT_EQ(x.GetNumKeys(), 3u);
  EXPECT_EQ(x.SetClampingValues(0.0, 1.0), 0u);
  double lo, hi;
  x.GetClampingValues(lo, hi);
  EXPECT_EQ(hi, DBL_MAX);
  EXPECT_EQ(x.SetAsTimeFCurve(0), 1u);
  EXPECT_EQ(x.IsBijective(), 0u);

  ZvBaseFCurve::FCurveInfo info{};
  info.mask = ZvBaseFCurve::FCurveInfo::KindMask | ZvBaseFCurve::FCurveInfo::NumKeysMask |
              ZvBaseFCurve::FCurveInfo::FirstSegmentKindMask;
  EXPECT_EQ(x.GetFCurveInfo(&info), 0u);
  EXPECT_EQ(info.mask, 3u);
  EXPECT_EQ(info.kind, 40u);
  EXPECT_EQ(info.numKeys, 3u);
  EXPECT_EQ(x.GetFCurveInfo(nullptr), 0u);

  ZvBaseFCurve::KeyInfo key{};
  key.mask = ZvBaseFCurve::KeyInfo::ParameterMask | ZvBaseFCurve::KeyInfo::LeftValueMask |
             ZvBaseFCurve::KeyInfo::RightTangentYMask;
  EXPECT_EQ(x.GetKeyInfoFromIndex(1, &key), 0u);
  EXPECT_EQ(key.mask, 6u);
  EXPECT_EQ(key.parameter, 1.0);
  EXPECT_NEAR(key.leftValue, 50.0, 1e-12);
  key.mask = ZvBaseFCurve::KeyInfo::IndexMask;
  EXPECT_EQ(x.GetKeyInfoFromIndex(3, &key), 0u);
  EXPECT_EQ(key.mask, 0u);

  // Bounds of the key values, and of samples between two times.
  EXPECT_NEAR(x.GetValueUpperBound(0), 50.0, 1e-12);
  EXPECT_NEAR(x.GetValueLowerBound(0), 10.0, 1e-12);
  EXPECT_EQ(x.GetValueBoundsBetween(0.5, 0.9, lo, hi), 1u);
  EXPECT_NEAR(lo, x.Eval(0.5, 0), 1e-12);
  EXPECT_NEAR(hi, x.Eval(0.9, 0), 1e-12);
}

TEST_F(QuatViews, QueriesOfKeyParameters) {
  for (double t : {1.0, 2.0, 3.0})
    y.CreateKey(t, t);
  ZvDoubleArray params;
  EXPECT_EQ(x.GetKeyParameters(1.0, 3.0, params, 1, 1), 1u);
  EXPECT_EQ(params[0], 2.0);
  EXPECT_EQ(x.GetKeyParameters(2.0, 2.0, params, 1, 0), 1u);  // one exclusion is ignored here
  EXPECT_EQ(x.GetKeyParameters(2.0, 2.0, params, 1, 1), 0u);
  double v;
  EXPECT_EQ(x.GetNearestKeyParameter(1.5, v), 1u);
  EXPECT_EQ(v, 2.0);
  EXPECT_EQ(x.GetNextKeyParameter(2.0, v, 0), 1u);
  EXPECT_EQ(v, 3.0);
  EXPECT_EQ(x.GetPrevKeyParameter(2.0, v, 1), 1u);
  EXPECT_EQ(v, 2.0);
  v = 2.9;
  EXPECT_EQ(x.GetNearestKeyParameterInCenteredInterval(v, 0.2), 1u);
  EXPECT_EQ(v, 3.0);
  unsigned int index;
  EXPECT_EQ(x.GetKeyIndex(3.0, index), 1u);
  EXPECT_EQ(index, 2u);
  EXPECT_EQ(x.GetKeyIndex(2.5, index), 0u);
  // Folding under the cycle methods, without a snap to keys.
  EXPECT_EQ(x.FoldParameter(7.5), 7.5);
  x.SetExtrapolationMethod(ZvBaseFCurve::CycleExtrapolation);
  EXPECT_EQ(x.FoldParameter(5.5), 1.5);
  EXPECT_EQ(x.FoldParameter(0.5), 2.5);
}

TEST_F(QuatViews, HeadTailAndMergeKeepTheRotation) {
  for (double t : {0.0, 1.0, 2.0, 3.0, 4.0}) {
    x.CreateKey(t, 20.0 * t);
    z.CreateKey(t, -10.0 * t * t);
  }
  const double x15 = x.Eval(1.5, 0), z15 = z.Eval(1.5, 0);
  const double x35 = x.Eval(3.5, 0);
  ASSERT_EQ(y.RemoveHead(1.5), 1u);
  ASSERT_EQ(y.RemoveTail(3.5), 1u);
  EXPECT_EQ(x.GetNumKeys(), 4u);
  EXPECT_NEAR(x.Eval(1.5, 0), x15, 1e-9);
  EXPECT_NEAR(z.Eval(1.5, 0), z15, 1e-9);
  EXPECT_NEAR(x.Eval(3.5, 0), x35, 1e-9);

  // The keys of [2, 3] merge into one at 2.5; a locked key among them refuses.
  double t = 2.0;
  x.SetConstraint(t, ZvBaseFCurve::ParameterLock, 1, 0.0);
  EXPECT_EQ(z.MergeAndCreateKey(2.0, 3.0, 2.5, 7.0, 0, 0, 1), 0u);  // a lock refuses
  x.SetConstraint(t, ZvBaseFCurve::ParameterLock, 0, 0.0);
  ASSERT_EQ(z.MergeAndCreateNonModifyingKey(2.0, 3.0, 2.5, 0, 0, 1, 1), 1u);
  EXPECT_EQ(x.GetNumKeys(), 3u);
  EXPECT_EQ(x.IsKeyParameter(2.5, 0.0), 1u);

  // Scaling about a pivot moves the keys of the interval.
  ASSERT_EQ(x.ScaleAndOffsetParameters(1.5, 3.5, 1.5, 2.0, 1.0, 0, 0, ZvBaseFCurve::RightHandle),
            1u);
  ZvDoubleArray params;
  x.GetAllKeyParameters(params);
  ASSERT_EQ(params.size, 3u);
  EXPECT_EQ(params[0], 2.5);
  EXPECT_EQ(params[1], 4.5);
  EXPECT_EQ(params[2], 6.5);
}

TEST_F(QuatViews, SamplingFlatteningAndContinuity) {
  // The z angle winds through +-180 degrees; samples between keys stay on one branch.
  z.CreateKey(0.0, 150.0);
  z.CreateKey(1.0, 210.0);
  ZvDoubleArray times, values;
  ASSERT_EQ(z.EvalSequence(0.0, 1.0, 0.25, 0.0, times, values, 0), 5u);
  for (unsigned int i = 1; i < values.size; ++i)
    EXPECT_GT(values[i], values[i - 1]);

  ZvDoubleArray t;
  ZvPoint3dArray p;
  ZvBoolArray isKey;
  ZvQuatCurveFlatten(*z.GetQuatCurve(), -0.5, 1.5, ZvTransfo4(), 0.5, t, p, isKey, nullptr);
  ASSERT_GT(t.size, 4u);
  EXPECT_EQ(t[0], -0.5);
  EXPECT_EQ(t[t.size - 1], 1.5);
  for (unsigned int i = 1; i < p.size; ++i) {
    EXPECT_LT(std::fabs(p[i].z - p[i - 1].z), 0.5) << i;  // no 2 pi jump
    EXPECT_GT(t[i], t[i - 1]);
  }

  // Subdivision stops six halvings deep whatever the tolerance.
  ZvDoubleArray st;
  ZvPoint3dArray sp;
  ZvBoolArray sk;
  const ZvQuatCurve& c = *z.GetQuatCurve();
  ZvQuatFCurveSubdivide(c, 0.0, c.Eval(0.0), true, 1.0, c.Eval(1.0), true, ZvTransfo4(), 0.0, st,
                        sp, sk, nullptr, 0);
  EXPECT_EQ(st.size, 65u);

  // Re-expressed samples move by whole turns toward their neighbours; keys stay.
  ZvDoubleArray mt;
  ZvPoint3dArray mp;
  ZvBoolArray mk;
  for (int i = 0; i < 4; ++i) {
    mt.Add(i);
    const double deg[4] = {170.0, 179.0, -179.0, -170.0};
    mp.Add(ZvPoint3<double>{0.0, 0.0, deg[i] * kPi / 180});
    mk.Add(i == 1);
  }
  ZvQuatFCurveMakeContinuous(mt, mp, mk);
  EXPECT_NEAR(mp[2].z * 180 / kPi, 181.0, 1e-9);
  EXPECT_NEAR(mp[3].z * 180 / kPi, 190.0, 1e-9);
  EXPECT_NEAR(mp[1].z * 180 / kPi, 179.0, 1e-12);

  ZvPoint2dArray points;
  ZvPointTagArray tags;
  ASSERT_EQ(z.Flatten(ZvTransfo4(), 0.5, points, tags, 0), 1u);
  ASSERT_GT(points.size, 2u);
  EXPECT_NEAR(points[0].y, 150.0, 1e-9);
  EXPECT_NEAR(points[points.size - 1].y, 210.0, 1e-9);
  EXPECT_EQ(tags[tags.size - 1], ZvPointTag_Last);
}

TEST_F(QuatViews, CopiesSnapshotsAndResamples) {
  x.CreateKey(0.0, 0.0);
  x.CreateKey(2.0, 80.0);
  y.CreateKey(1.0, 30.0);
  ZvBaseFCurve* clone = y.Clone();
  ASSERT_NE(clone, nullptr);
  ZvQuatFCurve* copy = static_cast<ZvQuatFCurve*>(clone->QueryFCurveKind(ZvBaseFCurve::QuatKind));
  ASSERT_NE(copy, nullptr);
  EXPECT_EQ(copy->GetComponent(), 1u);
  copy->CreateKey(1.5, 5.0);
  EXPECT_EQ(y.GetNumKeys(), 3u);  // the copy has a rotation of its own
  delete clone;

  ZvBaseFCurve* shot = x.SnapShot(0.5, 1.5, ZvBaseFCurve::ConstantExtrapolation);
  ASSERT_NE(shot, nullptr);
  for (double t : {0.5, 0.8, 1.0, 1.5})
    EXPECT_NEAR(shot->Eval(t, 0), x.Eval(t, 0), 0.05) << t;
  delete shot;

  ASSERT_EQ(z.ResampleSequence(0.0, 2.0, 0.5, 0, 0), 1u);
  EXPECT_EQ(x.GetNumKeys(), 5u);
  ASSERT_EQ(z.ResampleSequence(0.0, 2.0, 0.0, 0, 0), 0u);

  ZvQuatFCurve other(2);
  EXPECT_EQ(other.Set(x), 1u);
  EXPECT_EQ(other.GetComponent(), 0u);
  EXPECT_EQ(other.GetNumKeys(), 5u);
}

TEST_F(QuatViews, CutPasteAndAppendMoveWholeRotations) {
  for (double t : {0.0, 1.0, 2.0, 3.0, 4.0}) {
    x.CreateKey(t, 15.0 * t);
    y.CreateKey(t, -5.0 * t);
  }
  const ZvPoint3<double> at3 = x.GetQuatCurve()->Eval(3.0);
  ZvQuatFCurve piece(2);
  ASSERT_EQ(z.Cut(1.0, 3.0, piece), 1u);
  // The piece holds the keys of [1, 3] with all their angles.
  ASSERT_EQ(piece.GetNumKeys(), 3u);
  EXPECT_NEAR(piece.GetQuatCurve()->GetKeyValue(2, 0), 45.0, 1e-9);
  EXPECT_NEAR(piece.GetQuatCurve()->GetKeyValue(2, 1), -15.0, 1e-9);
  // The gap closes: what was at 3 is now at 1, and the key at 4 at 2.
  ZvDoubleArray params;
  x.GetAllKeyParameters(params);
  ASSERT_EQ(params.size, 3u);
  EXPECT_EQ(params[1], 1.0);
  EXPECT_EQ(params[2], 2.0);
  EXPECT_NEAR(x.GetQuatCurve()->Eval(1.0).x, at3.x, 1e-12);

  // Pasting the piece back where it came from restores the keys and their times.
  ASSERT_EQ(y.Paste(piece, 1.0, 1.0), 1u);
  params.Resize(0);
  x.GetAllKeyParameters(params);
  ASSERT_EQ(params.size, 5u);
  for (unsigned int i = 0; i < 5; ++i) {
    EXPECT_EQ(params[i], i);
    EXPECT_NEAR(x.GetQuatCurve()->GetKeyValue(i, 0), 15.0 * i, 1e-9);
  }

  // Appending puts the piece's first key on the last key.
  ASSERT_EQ(x.Append(piece), 1u);
  EXPECT_EQ(x.GetNumKeys(), 7u);
  double last;
  x.GetLargestKeyParameter(last);
  EXPECT_EQ(last, 6.0);
  EXPECT_NEAR(x.GetQuatCurve()->GetKeyValue(4, 0), 15.0, 1e-9);

  double t = 5.0;
  x.SetConstraint(t, ZvBaseFCurve::ParameterLock, 1, 0.0);
  EXPECT_EQ(x.Cut(1.0, 2.0, piece), 0u);  // the locked key would move
  EXPECT_EQ(x.GetNumKeys(), 7u);
}

TEST_F(QuatViews, PenInputExtendsALineOrAppendsAKey) {
  EXPECT_EQ(y.AppendLinearSegment(ZvPoint2<double>{1.0, 10.0}), 0u);  // nothing to append to
  y.CreateKey(0.0, 0.0);
  ASSERT_EQ(y.AppendLinearSegment(ZvPoint2<double>{1.0, 10.0}), 1u);
  EXPECT_EQ(y.AppendLinearSegment(ZvPoint2<double>{0.5, 10.0}), 0u);  // not right of the last key
  // On the line through the last two keys: the last key moves there.
  ASSERT_EQ(y.AppendOrExtendLinearSegment(ZvPoint2<double>{2.0, 20.05}, 0.1), 1u);
  EXPECT_EQ(x.GetNumKeys(), 2u);
  double v;
  ASSERT_EQ(y.GetKeyValue(2.0, ZvBaseFCurve::RightSide, v, 0.0), 1u);
  EXPECT_NEAR(v, 20.0, 1e-9);
  // Off the line: a new key.
  ASSERT_EQ(y.AppendOrExtendLinearSegment(ZvPoint2<double>{3.0, 0.0}, 0.1), 1u);
  EXPECT_EQ(x.GetNumKeys(), 3u);
  EXPECT_NEAR(y.Eval(3.0, 0), 0.0, 1e-9);
}

}  // namespace
