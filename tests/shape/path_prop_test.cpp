// Property paths: the records that tie one curve to each subpath, and the operations that read
// or blend them.
#include <gtest/gtest.h>
#include <zv/path2f_prop1d.h>

#include <memory>

#include "path_fixtures.h"
#include "path_prop_fixtures.h"

TEST(PathProp, CurvesFollowTheirSubpathWhicheverPointNamesIt) {
  ZvPath2fProp1d path = TwoLines();  // subpaths 0..1 and 2..4
  EXPECT_EQ(0, path.HasPropCurve(0));
  EXPECT_EQ(1, path.SetPropCurve(4, ZvRawFCurve(0.0, 2.0, 10.0, 4.0)));
  EXPECT_EQ(1, path.HasPropCurve(2));
  EXPECT_EQ(1, path.HasPropCurve(3));
  EXPECT_EQ(0, path.HasPropCurve(1));
  EXPECT_EQ(0, path.HasPropCurve(5));  // outside the path
  EXPECT_EQ(0, path.SetPropCurve(5, ZvRawFCurve(1.0)));
  EXPECT_DOUBLE_EQ(3.0, path.EvalPropCurve(3, 5.0));
  EXPECT_DOUBLE_EQ(0.0, path.EvalPropCurve(0, 5.0));
  EXPECT_DOUBLE_EQ(10.0, path.GetLargestArcLength(2));
  EXPECT_DOUBLE_EQ(0.0, path.GetLargestArcLength(1));
  EXPECT_EQ(0u, path.GetPropCurve(0).GetNumKeys());

  // A second curve in front keeps the list in order: the later one is still found.
  EXPECT_EQ(1, path.SetPropCurve(1, ZvRawFCurve(0.0, 7.0)));
  EXPECT_EQ(2u, path.GetNumPropCurves());
  EXPECT_NE(nullptr, path.GetPropCurveInsideCriticalSection(2));
  EXPECT_EQ(nullptr, path.GetPropCurveInsideCriticalSection(1));
  EXPECT_DOUBLE_EQ(7.0, path.EvalPropCurve(0, 3.0));
  EXPECT_DOUBLE_EQ(4.0, path.EvalPropCurve(4, 10.0));

  ZvDoubleArray params, values;
  params.Add(0.0);
  params.Add(10.0);
  values.Add(-1.0);
  EXPECT_EQ(2u, path.EvalPropCurve(2, params, values));
  ASSERT_EQ(3u, values.size);
  EXPECT_DOUBLE_EQ(-1.0, values[0]);
  EXPECT_DOUBLE_EQ(2.0, values[1]);
  EXPECT_DOUBLE_EQ(4.0, values[2]);
}

TEST(PathProp, CurvesFromPairsAndCopiesBetweenSubpaths) {
  ZvPath2fProp1d path = TwoLines();
  ZvPoint2dArray pairs;
  pairs.Add(ZvPoint2<double>{3.0, 5.0});
  EXPECT_EQ(1, path.SetPropCurve(0, pairs, 0.1));
  // One pair: one key, at arc length 0 whatever the pair's own length.
  EXPECT_EQ(1u, path.GetPropCurve(0).GetNumKeys());
  EXPECT_DOUBLE_EQ(0.0, path.GetLargestArcLength(0));
  pairs.Add(ZvPoint2<double>{8.0, 9.0});
  EXPECT_EQ(1, path.SetPropCurve(0, pairs, 0.1));
  EXPECT_DOUBLE_EQ(7.0, path.EvalPropCurve(0, 4.0));
  // Collinear pairs collapse to the ends; a kink stays.
  ZvPoint2dArray many;
  for (int k = 0; k <= 10; ++k)
    many.Add(ZvPoint2<double>{double(k), k <= 5 ? double(k) : 10.0 - k});
  EXPECT_EQ(1, path.SetPropCurve(3, many, 0.01));
  EXPECT_EQ(3u, path.GetPropCurve(3).GetNumKeys());
  EXPECT_EQ(0, path.SetPropCurve(2, ZvPoint2dArray(), 0.1));

  EXPECT_EQ(0, path.SetPropCurve(2, 4));  // same subpath
  EXPECT_EQ(1, path.SetPropCurve(1, 4));
  EXPECT_DOUBLE_EQ(5.0, path.EvalPropCurve(0, 5.0));

  ZvPath2fProp1d other = TwoLines();
  EXPECT_EQ(0, other.SetPropCurve(0, other, 2));  // no curve to copy
  EXPECT_EQ(1, other.SetPropCurve(0, path, 2));
  EXPECT_DOUBLE_EQ(5.0, other.EvalPropCurve(1, 5.0));
  EXPECT_EQ(0, other.HasPropCurve(2));
}

TEST(PathProp, AppendingNeedsACurveAndExtendsItsLastPiece) {
  ZvPath2fProp1d path = TwoLines();
  EXPECT_EQ(0u, path.AppendLinearSegment(0, 1.0, 1.0));
  EXPECT_EQ(0, path.HasPropCurve(0));
  path.SetPropCurve(0, ZvRawFCurve(0.0, 1.0));
  EXPECT_NE(0u, path.AppendLinearSegment(0, 2.0, 2.0));
  EXPECT_EQ(0u, path.AppendLinearSegment(0, 1.0, 5.0));  // not right of the last key
  EXPECT_NE(0u, path.AppendOrExtendLinearSegment(0, 4.0, 3.0001, 0.01));
  EXPECT_EQ(2u, path.GetPropCurve(0).GetNumKeys());  // the last key moved along its line
  EXPECT_DOUBLE_EQ(4.0, path.GetLargestArcLength(1));
  EXPECT_NE(0u, path.AppendOrExtendLinearSegment(0, 5.0, 0.0, 0.01));
  EXPECT_EQ(3u, path.GetPropCurve(0).GetNumKeys());
}

TEST(PathProp, CopiesOwnTheirCurvesAndAnswerOnlyTheirKind) {
  ZvPath2fProp1d path = TwoLines();
  path.SetPropCurve(2, ZvRawFCurve(0.0, 2.0, 10.0, 4.0));
  ZvPath2fProp1d copy(path);
  std::unique_ptr<ZvShape2f> clone(path.Clone());
  ZvPath2fProp1d assigned;
  assigned = path;
  path.AppendLinearSegment(2, 20.0, 0.0);
  path.SetPropCurve(0, ZvRawFCurve(0.0, 9.0));
  for (const ZvPath2fProp1d* p :
       {static_cast<const ZvPath2fProp1d*>(&copy), static_cast<const ZvPath2fProp1d*>(&assigned),
        static_cast<const ZvPath2fProp1d*>(clone.get())}) {
    EXPECT_EQ(5u, p->NumPoints());
    EXPECT_EQ(0, p->HasPropCurve(0));
    EXPECT_DOUBLE_EQ(10.0, p->GetLargestArcLength(2));
  }
  EXPECT_EQ(nullptr, path.QueryShapeKind(ZvShape2f::KindPath));
  EXPECT_EQ(&path, path.QueryShapeKind(ZvShape2f::KindPathProp));

  // Through the shape slot: another property path is copied whole, a plain path drops curves.
  ZvShape2f& shape = assigned;
  shape = static_cast<const ZvShape2f&>(path);
  EXPECT_EQ(1, assigned.HasPropCurve(0));
  shape = static_cast<const ZvShape2f&>(Segment(0, 0, 1, 1));
  EXPECT_EQ(2u, assigned.NumPoints());
  EXPECT_EQ(0u, assigned.GetNumPropCurves());
  ZvPath2fProp1d fromPath(Segment(0, 0, 1, 1));
  EXPECT_EQ(0u, fromPath.GetNumPropCurves());
}

TEST(PathProp, NodeParametersScaleTheNormalizedArcLength) {
  ZvPath2fProp1d path;
  path.Moveto(P(0, 0));
  path.Lineto(P(10, 0));
  path.Lineto(P(40, 0));
  double parameter = -1.0;
  EXPECT_EQ(0, path.GetPropCurveParameter(1, 0.1, parameter));  // no curve
  path.SetPropCurve(0, ZvRawFCurve(0.0, 1.0, 8.0, 2.0));
  EXPECT_EQ(1, path.GetPropCurveParameter(1, 0.1, parameter));
  EXPECT_NEAR(2.0, parameter, 1e-9);
  EXPECT_EQ(1, path.GetPropCurveParameter(2, 0.1, parameter));
  EXPECT_NEAR(8.0, parameter, 1e-9);
  EXPECT_EQ(1, path.GetPropCurveParameter(0, 0.1, parameter));
  EXPECT_EQ(0.0, parameter);
  EXPECT_EQ(0, path.GetPropCurveParameter(7, 0.1, parameter));
}

TEST(PathProp, LerpBlendsPointsAndCurvesOfSiblings) {
  ZvPath2fProp1d a, b;
  a.Moveto(P(0, 0));
  a.Lineto(P(10, 0));
  b.Moveto(P(0.1f, 1));
  b.Lineto(P(30, 1));
  a.SetPropCurve(0, ZvRawFCurve(0.0, 1.0, 10.0, 1.0));
  b.SetPropCurve(0, ZvRawFCurve(0.0, 3.0, 30.0, 5.0));
  ZvPath2fProp1d out;
  ASSERT_EQ(1, out.SetToLerpAB(a, b, 0.0, 1.0, 1e-6));
  // t = 0 gives a's points as narrowed from a * 1.0 + b * 0.0, bit for bit.
  EXPECT_EQ(0.0f, out.GetPoint(0).x);
  EXPECT_EQ(10.0f, out.GetPoint(1).x);
  ASSERT_EQ(1, out.SetToLerpAB(a, b, 0.5, 1.0, 1e-6));
  EXPECT_FLOAT_EQ(20.0f, out.GetPoint(1).x);
  EXPECT_FLOAT_EQ(0.5f, out.GetPoint(1).y);
  // b covers more arc length, so its parameters carry the blend: 0.5 * (1 + 3) at 0, 0.5 *
  // (1 + 5) at the end.
  EXPECT_NEAR(30.0, out.GetLargestArcLength(0), 1e-9);
  EXPECT_NEAR(2.0, out.EvalPropCurve(0, 0.0), 1e-9);
  EXPECT_NEAR(3.0, out.EvalPropCurve(0, 30.0), 1e-9);
  EXPECT_NEAR(2.5, out.EvalPropCurve(0, 15.0), 1e-9);

  // Only a with a curve: copied. Only b: none. This path may be one of the inputs.
  ZvPath2fProp1d bare(static_cast<const ZvPath2f&>(b));
  ASSERT_EQ(1, a.SetToLerpAB(a, bare, 0.5, 1.0, 1e-6));
  EXPECT_DOUBLE_EQ(10.0, a.GetLargestArcLength(0));
  ASSERT_EQ(1, out.SetToLerpAB(bare, b, 0.5, 1.0, 1e-6));
  EXPECT_EQ(0, out.HasPropCurve(0));

  // Not siblings: refused, nothing changes.
  ZvPath2fProp1d three = TwoLines();
  EXPECT_EQ(0, out.SetToLerpAB(a, three, 0.5, 1.0, 1e-6));
  EXPECT_FLOAT_EQ(30.0f, out.GetPoint(1).x);
}
