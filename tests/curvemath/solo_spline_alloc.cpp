// Fits and conversions catch allocation failure: they report 0 and leave the spline as it was.
// The global allocator of this executable fails on demand after a given number of allocations.
#include <zv/spline.h>

#include <gtest/gtest.h>

#include "tests/curvemath/spline_samples.h"
#include "tests/support/failing_allocator.h"

namespace {

// Fails the k-th allocation of op for k = 0, 1, ... until op runs without the failure firing;
// every failed run must report 0 and leave `watched` as it was. Returns the number of failures.
template <class Op>
int FailUntilSuccess(const ZvSpline2d& watched, Op op) {
  const ZvSpline2d before(watched);
  int result = 0;
  const int failures = zv_test::ForEachFailure([&] { result = op(); },
                                               [&](bool) {
                                                 EXPECT_EQ(result, 0);
                                                 EXPECT_TRUE(SameSpline(watched, before));
                                               });
  EXPECT_EQ(result, 1);
  return failures;
}

TEST(SplineAllocation, FailuresLeaveTheOldSplineWhole) {
  const SplineSamples<ZvSpline2d> open = MakeSamples<ZvSpline2d>(500, 1e-4, 1, false);
  const SplineSamples<ZvSpline2d> closed = MakeSamples<ZvSpline2d>(400, 1e-4, 2, true);
  for (ZvSpline::Kind kind : {ZvSpline::CatmullRom, ZvSpline::BezierCubicFCurve}) {
    ZvSpline2d spline, expected;
    ASSERT_EQ(spline.ClosedFit(closed.params, closed.values, 1e-3, ZvSpline::CatmullRom), 1);
    EXPECT_GT(FailUntilSuccess(
                  spline, [&] { return spline.OpenFit(open.params, open.values, 1e-3, kind); }),
              3);
    expected.OpenFit(open.params, open.values, 1e-3, kind);
    EXPECT_TRUE(SameSpline(spline, expected));
    EXPECT_GT(
        FailUntilSuccess(
            spline, [&] { return spline.ClosedFit(closed.params, closed.values, 1e-3, kind); }),
        3);
    EXPECT_TRUE(spline.IsClosed());
  }
  ZvSpline2d source, target;
  ASSERT_EQ(source.OpenFit(open.params, open.values, 1e-3, ZvSpline::CatmullRom), 1);
  ASSERT_EQ(target.OpenFit(open.params, open.values, 1e-2, ZvSpline::BezierCubicFCurve), 1);
  EXPECT_GT(FailUntilSuccess(
                target, [&] { return source.CopyAndConvert(target, ZvSpline::BezierCubicFCurve); }),
            2);
  EXPECT_EQ(target.GetNumKeys(), source.GetNumKeys());
}

}  // namespace
