// Fits and conversions catch allocation failure: they report 0 and leave the spline as it was.
// The global allocator of this executable fails on demand after a given number of allocations.
#include <zv/spline.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <new>

#include "curvemath/spline_pieces.h"
#include "tests/curvemath/spline_samples.h"

namespace {

long allocationsLeft = -1;  // -1: no limit

void* Allocate(std::size_t n) {
  if (allocationsLeft == 0) throw std::bad_alloc();
  if (allocationsLeft > 0) --allocationsLeft;
  if (void* p = std::malloc(n ? n : 1)) return p;
  throw std::bad_alloc();
}

}  // namespace

void* operator new(std::size_t n) {
  return Allocate(n);
}
void* operator new[](std::size_t n) {
  return Allocate(n);
}
void operator delete(void* p) noexcept {
  std::free(p);
}
void operator delete[](void* p) noexcept {
  std::free(p);
}
void operator delete(void* p, std::size_t) noexcept {
  std::free(p);
}
void operator delete[](void* p, std::size_t) noexcept {
  std::free(p);
}

namespace {

template <class S>
class SplineAllocation : public ::testing::Test {};
using SplineKinds = ::testing::Types<ZvSpline1d, ZvSpline2d, ZvSpline3d>;
TYPED_TEST_SUITE(SplineAllocation, SplineKinds);

template <class A>
bool SameArray(const A& a, const A& b) {
  if (a.size != b.size) return false;
  for (unsigned int i = 0; i < a.size; ++i)
    if (zvSplineNorm2(a[i] - b[i]) != 0) return false;
  return true;
}

template <class S>
bool SameSpline(const S& a, const S& b) {
  return a.GetKind() == b.GetKind() && a.IsClosed() == b.IsClosed() &&
         SameArray(a.GetKeyParameters(), b.GetKeyParameters()) &&
         SameArray(a.GetKeyValues(), b.GetKeyValues()) &&
         SameArray(a.GetLeftDerivatives(), b.GetLeftDerivatives()) &&
         SameArray(a.GetRightDerivatives(), b.GetRightDerivatives());
}

// Runs op with a growing allocation budget until it succeeds; every failed run must leave
// `watched` equal to `before`. Returns the number of failed runs.
template <class S, class Op>
int FailUntilSuccess(const S& watched, const S& before, Op op) {
  int failures = 0;
  for (long budget = 0;; ++budget) {
    allocationsLeft = budget;
    const int result = op();
    allocationsLeft = -1;
    if (result == 1) return failures;
    EXPECT_EQ(result, 0);
    EXPECT_TRUE(SameSpline(watched, before)) << "budget " << budget;
    ++failures;
  }
}

TYPED_TEST(SplineAllocation, FailedFitLeavesTheOldSplineWhole) {
  const SplineSamples<TypeParam> open = MakeNoisySamples<TypeParam>(500, 1e-4, 1);
  const SplineSamples<TypeParam> closed = MakeClosedSamples<TypeParam>(400, 1e-4, 2);
  for (ZvSpline::Kind kind : {ZvSpline::CatmullRom, ZvSpline::BezierCubicFCurve}) {
    TypeParam spline;
    ASSERT_EQ(spline.ClosedFit(closed.params, closed.values, 1e-3, ZvSpline::CatmullRom), 1);
    const TypeParam before(spline);
    EXPECT_GT(FailUntilSuccess(spline, before,
                               [&] { return spline.OpenFit(open.params, open.values, 1e-3, kind); }),
              3);
    TypeParam expected;
    expected.OpenFit(open.params, open.values, 1e-3, kind);
    EXPECT_TRUE(SameSpline(spline, expected));

    const TypeParam opened(spline);
    EXPECT_GT(FailUntilSuccess(spline, opened,
                               [&] {
                                 return spline.ClosedFit(closed.params, closed.values, 1e-3, kind);
                               }),
              3);
    EXPECT_TRUE(spline.IsClosed());
  }
}

TYPED_TEST(SplineAllocation, FailedConversionLeavesTheTargetWhole) {
  const SplineSamples<TypeParam> s = MakeNoisySamples<TypeParam>(300, 1e-4, 3);
  TypeParam source, target;
  ASSERT_EQ(source.OpenFit(s.params, s.values, 1e-3, ZvSpline::CatmullRom), 1);
  ASSERT_EQ(target.OpenFit(s.params, s.values, 1e-2, ZvSpline::BezierCubicFCurve), 1);
  const TypeParam before(target);
  EXPECT_GT(FailUntilSuccess(target, before,
                             [&] {
                               return source.CopyAndConvert(target, ZvSpline::BezierCubicFCurve);
                             }),
            2);
  EXPECT_EQ(target.GetNumKeys(), source.GetNumKeys());
}

}  // namespace
