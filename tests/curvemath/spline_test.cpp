#include <zv/spline.h>

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <random>
#include <vector>

#include "tests/curvemath/spline_samples.h"

namespace {

template <class S>
class SplineFit : public ::testing::Test {};
using SplineKinds = ::testing::Types<ZvSpline1d, ZvSpline2d, ZvSpline3d>;
TYPED_TEST_SUITE(SplineFit, SplineKinds);

// Indices of the samples that became keys; every key must be one of the samples.
template <class S>
std::vector<unsigned int> KeySampleIndices(const S& spline, const ZvDoubleArray& params) {
  std::vector<unsigned int> indices;
  for (unsigned int j = 0, k = 0; j < spline.GetNumKeys(); ++j, ++k) {
    while (k < params.size && params[k] != spline.GetKeyParameters()[j])
      ++k;
    EXPECT_LT(k, params.size) << "key " << j << " is not a sample";
    indices.push_back(k);
  }
  return indices;
}

template <class S>
int Fit(S& spline, const SplineSamples<S>& s, bool closed, double tol, ZvSpline::Kind kind) {
  return closed ? spline.ClosedFit(s.params, s.values, tol, kind)
                : spline.OpenFit(s.params, s.values, tol, kind);
}

// Largest squared error under Eval of the samples first..last.
template <class S>
double WorstError2(const S& spline, const SplineSamples<S>& s, unsigned int first,
                   unsigned int last) {
  double worst = 0;
  for (unsigned int k = first; k <= last; ++k) {
    typename SplineDim<S>::Value v;
    EXPECT_EQ(spline.Eval(v, s.params[k]), 1);
    worst = std::max(worst, zvSplineNorm2(v - s.values[k]));
  }
  return worst;
}

// The greedy pass checks every piece between inner keys with the very polynomial Eval uses, so
// those samples are reproduced within the tolerance to the bit. The end pieces are judged on the
// first and last three samples instead, which here keeps samples 1 and n-2.
TYPED_TEST(SplineFit, OpenCatmullRomKeepsCheckedSamplesWithinTolerance) {
  const double tol = 1e-3;
  const SplineSamples<TypeParam> s = MakeSamples<TypeParam>(3000, 2e-4, 7, false);
  TypeParam spline;
  ASSERT_EQ(spline.OpenFit(s.params, s.values, tol, ZvSpline::CatmullRom), 1);
  EXPECT_TRUE(spline.GetKind() == ZvSpline::CatmullRom && spline.GetLeftDerivatives().size == 0);
  const std::vector<unsigned int> keys = KeySampleIndices(spline, s.params);
  ASSERT_GE(keys.size(), 4u);
  EXPECT_LT(keys.size(), s.params.size / 5);
  EXPECT_TRUE(keys[1] == 1 && keys.back() == s.params.size - 1);
  EXPECT_LE(WorstError2(spline, s, 0, s.params.size - 1), tol * tol);
  for (unsigned int k : keys)
    EXPECT_EQ(WorstError2(spline, s, k, k), 0.0);
}

TYPED_TEST(SplineFit, BezierFitKeepsEverySampleWithinTolerance) {
  const double tol = 1e-3;
  const SplineSamples<TypeParam> open = MakeSamples<TypeParam>(3000, 2e-4, 11, false);
  const SplineSamples<TypeParam> closed = MakeSamples<TypeParam>(1001, 2e-4, 12, true);
  for (const SplineSamples<TypeParam>* s : {&open, &closed}) {
    TypeParam spline;
    ASSERT_EQ(Fit(spline, *s, s == &closed, tol, ZvSpline::BezierCubicFCurve), 1);
    const unsigned int n = spline.GetNumKeys();
    KeySampleIndices(spline, s->params);
    EXPECT_LT(n, s->params.size / 5);
    ASSERT_EQ(spline.GetLeftDerivatives().size, n);
    ASSERT_EQ(spline.GetRightDerivatives().size, n);
    EXPECT_LE(WorstError2(spline, *s, 0, s->params.size - 1), tol * tol);
    // C1 at every key, and across the seam when closed.
    const auto& left = spline.GetLeftDerivatives();
    const auto& right = spline.GetRightDerivatives();
    double kinks = s == &closed ? zvSplineNorm2(left[n - 1] + right[0]) : 0.0;
    for (unsigned int i = 0; i < n; ++i)
      kinks += zvSplineNorm2(left[i] + right[i]);
    EXPECT_EQ(kinks, 0.0);
  }
}

TYPED_TEST(SplineFit, ClosedCatmullRomRepairsTheSeamAndWraps) {
  using Value = typename SplineDim<TypeParam>::Value;
  const SplineSamples<TypeParam> s = MakeSamples<TypeParam>(1001, 0.0, 3, true);
  TypeParam spline;
  ASSERT_EQ(spline.ClosedFit(s.params, s.values, 1e-3, ZvSpline::CatmullRom), 1);
  EXPECT_TRUE(spline.IsClosed());
  const std::vector<unsigned int> keys = KeySampleIndices(spline, s.params);
  ASSERT_GE(keys.size(), 5u);
  // Samples 1 and n-2 are no candidates of the greedy pass; on a smooth curve the repair drops
  // them, and the whole curve stays in tolerance.
  EXPECT_TRUE(keys[1] > 1 && keys[keys.size() - 2] < s.params.size - 2);
  EXPECT_LE(WorstError2(spline, s, 0, s.params.size - 1), 1e-6);

  const double t0 = s.params[0], t1 = s.params[s.params.size - 1], span = t1 - t0;
  Value a, b, c;
  spline.Eval(a, t0 + 2 * span);
  EXPECT_EQ(zvSplineNorm2(a - s.values[0]), 0.0);
  for (double t : {t0 + 0.3 * span, t0 + 0.77 * span}) {
    spline.Eval(a, t);
    spline.Eval(b, t + 3 * span);
    spline.Eval(c, t - 2 * span);
    EXPECT_LT(zvSplineNorm2(a - b) + zvSplineNorm2(a - c), 1e-18);
  }
  // Smooth across the seam: the one-sided slopes agree.
  const double e = 1e-6 * span;
  spline.Eval(a, t1 - e);
  spline.Eval(b, t0);
  spline.Eval(c, t0 + e);
  EXPECT_LT(zvSplineNorm2((b - a) / e - (c - b) / e), 1e-8);
}

// The Bezier form of a Catmull-Rom spline is the same polynomial.
TYPED_TEST(SplineFit, ConversionToBezierReproducesCatmullRom) {
  const SplineSamples<TypeParam> open = MakeSamples<TypeParam>(800, 2e-4, 5, false);
  const SplineSamples<TypeParam> closed = MakeSamples<TypeParam>(801, 2e-4, 6, true);
  for (const SplineSamples<TypeParam>* s : {&open, &closed}) {
    TypeParam cr, bezier, copy;
    ASSERT_EQ(Fit(cr, *s, s == &closed, 1e-3, ZvSpline::CatmullRom), 1);
    ASSERT_EQ(cr.CopyAndConvert(bezier, ZvSpline::BezierCubicFCurve), 1);
    EXPECT_TRUE(bezier.GetKind() == ZvSpline::BezierCubicFCurve &&
                bezier.IsClosed() == cr.IsClosed());
    for (double t = s->params[0] - 1; t < s->params[s->params.size - 1] + 1; t += 0.0137) {
      typename SplineDim<TypeParam>::Value a, b;
      ASSERT_EQ(cr.Eval(a, t) + bezier.Eval(b, t), 2);
      ASSERT_LT(zvSplineNorm2(a - b), 1e-20) << t;
    }
    ASSERT_EQ(cr.CopyAndConvert(copy, ZvSpline::CatmullRom), 1);
    EXPECT_TRUE(SameSpline(copy, cr));
    // A Bezier spline converts only to itself; a failed conversion leaves the target alone.
    EXPECT_EQ(bezier.CopyAndConvert(copy, ZvSpline::CatmullRom), 0);
    EXPECT_EQ(bezier.CopyAndConvert(copy, ZvSpline::NoKind), 0);
    EXPECT_TRUE(SameSpline(copy, cr));
    ASSERT_EQ(cr.CopyAndConvert(cr, ZvSpline::BezierCubicFCurve), 1);
    EXPECT_TRUE(SameSpline(cr, bezier));
  }
  TypeParam empty, target;
  EXPECT_EQ(empty.CopyAndConvert(target, ZvSpline::CatmullRom), 0);
}

TYPED_TEST(SplineFit, BadInputFailsAndLeavesTheSplineWhole) {
  const SplineSamples<TypeParam> s = MakeSamples<TypeParam>(200, 1e-4, 2, false);
  TypeParam spline;
  ASSERT_EQ(spline.OpenFit(s.params, s.values, 1e-3, ZvSpline::BezierCubicFCurve), 1);
  const TypeParam before(spline);
  typename SplineDim<TypeParam>::Array one(s.values[0], 1), shorter(s.values);
  shorter.Resize(shorter.size - 1);
  ZvDoubleArray oneParam(0.0, 1), repeated(s.params), decreasing(s.params);
  repeated[50] = repeated[49];
  decreasing[50] = repeated[48];
  const double nan = std::numeric_limits<double>::quiet_NaN();
  for (ZvSpline::Kind kind : {ZvSpline::CatmullRom, ZvSpline::BezierCubicFCurve}) {
    EXPECT_EQ(spline.OpenFit(oneParam, one, 1e-3, kind), 0);
    EXPECT_EQ(spline.OpenFit(s.params, shorter, 1e-3, kind), 0);
    EXPECT_EQ(spline.OpenFit(s.params, s.values, -1e-3, kind), 0);
    EXPECT_EQ(spline.OpenFit(s.params, s.values, nan, kind), 0);
    EXPECT_EQ(spline.OpenFit(repeated, s.values, 1e-3, kind), 0);
    EXPECT_EQ(spline.OpenFit(decreasing, s.values, 1e-3, kind), 0);
    EXPECT_EQ(spline.ClosedFit(s.params, s.values, 1e-3, kind), 0);  // the ends differ
  }
  EXPECT_EQ(spline.OpenFit(s.params, s.values, 1e-3, ZvSpline::NoKind), 0);
  EXPECT_EQ(spline.OpenFit(s.params, s.values, 1e-3, static_cast<ZvSpline::Kind>(15)), 0);
  EXPECT_TRUE(SameSpline(spline, before));
}

TYPED_TEST(SplineFit, SmallFitsAndEvaluationLimits) {
  using Dim = SplineDim<TypeParam>;
  const typename Dim::Value v0 = Dim::Make(1, 2, 3), v1 = Dim::Make(4, -1, 0);
  ZvDoubleArray params(0.0, 1);
  typename Dim::Array values(v0, 1);
  params.Add(2.0);
  values.Add(v1);
  typename Dim::Value v = Dim::Make(9, 9, 9);
  TypeParam spline;
  EXPECT_TRUE(spline.IsEmpty() && spline.GetKind() == ZvSpline::NoKind);
  EXPECT_EQ(spline.Eval(v, 0.0), 0);
  for (ZvSpline::Kind kind : {ZvSpline::CatmullRom, ZvSpline::BezierCubicFCurve}) {
    ASSERT_EQ(spline.OpenFit(params, values, 100.0, kind), 1);
    EXPECT_EQ(spline.GetNumKeys(), 2u);
    ASSERT_EQ(spline.Eval(v, 0.5), 1);
    EXPECT_LT(zvSplineNorm2(v - (v0 * 0.75 + v1 * 0.25)), 1e-24);
    typename Dim::Value w;  // no extrapolation
    spline.Eval(v, -5);
    spline.Eval(w, 7);
    EXPECT_TRUE(zvSplineNorm2(v - v0) == 0.0 && zvSplineNorm2(w - v1) == 0.0);
    EXPECT_EQ(spline.ClosedFit(params, values, 1.0, kind), 0);  // two samples cannot close
  }
  params.Add(3.0);
  values.Add(v0);
  ASSERT_EQ(spline.ClosedFit(params, values, 100.0, ZvSpline::CatmullRom), 1);
  EXPECT_EQ(spline.GetNumKeys(), 3u);
}

// At tolerance 0 any removal that changes the curve is refused, so noisy samples all stay.
// Collinear, evenly spaced samples all go except the two next to the ends: an end piece is judged
// on the first (or last) three samples stretched over the whole piece, which leaves the line.
TEST(SplineCatmullRom, RemovalAtTheEdgesOfTolerance) {
  std::mt19937 rng(1);
  std::uniform_real_distribution<double> noise(-1, 1);
  ZvDoubleArray params(1), noisy(1), line(1);
  for (int k = 0; k < 50; ++k) {
    params.Add(k * 0.5);
    noisy.Add(noise(rng));
    line.Add(3 - 0.25 * k);
  }
  ZvSpline1d spline;
  ASSERT_EQ(spline.OpenFit(params, noisy, 0.0, ZvSpline::CatmullRom), 1);
  EXPECT_EQ(spline.GetNumKeys(), 50u);
  ASSERT_EQ(spline.OpenFit(params, line, 1e-12, ZvSpline::CatmullRom), 1);
  ASSERT_EQ(spline.GetNumKeys(), 4u);
  EXPECT_TRUE(spline.GetKeyParameters()[1] == params[1] &&
              spline.GetKeyParameters()[2] == params[48]);
  ASSERT_EQ(spline.OpenFit(params, line, 1e-12, ZvSpline::BezierCubicFCurve), 1);
  EXPECT_EQ(spline.GetNumKeys(), 2u);

  // A three-sample curve has only the special test, whose ratio divides by the second span:
  // on a line with spans 1 and 3 the middle sample is predicted 2/3 off.
  ZvDoubleArray t3(1), v3(1);
  for (double t : {0.0, 1.0, 4.0}) {
    t3.Add(t);
    v3.Add(2 * t);
  }
  ASSERT_EQ(spline.OpenFit(t3, v3, 0.66, ZvSpline::CatmullRom), 1);
  EXPECT_EQ(spline.GetNumKeys(), 3u);
  ASSERT_EQ(spline.OpenFit(t3, v3, 0.67, ZvSpline::CatmullRom), 1);
  EXPECT_EQ(spline.GetNumKeys(), 2u);
}

TEST(SplineInput, SeamValuesAndExtents) {
  ZvDoubleArray params(1), v1(1);
  ZvPoint2dArray v2(1);
  for (int k = 0; k < 6; ++k) {
    params.Add(k);
    v1.Add(std::sin(k));
    v2.Add(std::cos(k), std::sin(k));
  }
  // The ends must repeat exactly in 1-D and within 1e-9 per component otherwise.
  v1[5] = 1e-300;
  v2[5] = {1, -1e-9};
  ZvSpline1d s1;
  ZvSpline2d s2;
  EXPECT_EQ(s1.ClosedFit(params, v1, 1e-3, ZvSpline::CatmullRom), 0);
  EXPECT_EQ(s2.ClosedFit(params, v2, 1e-3, ZvSpline::CatmullRom), 1);
  v1[5] = 0;
  v2[5].y = 2e-9;
  EXPECT_EQ(s1.ClosedFit(params, v1, 1e-3, ZvSpline::CatmullRom), 1);
  EXPECT_EQ(s2.ClosedFit(params, v2, 1e-3, ZvSpline::CatmullRom), 0);

  double span = -1;
  ZvExtent2<double> box;
  EXPECT_EQ(ZvSpline2d::GetInputExtent(ZvDoubleArray(1), v2, span, box), 0);
  EXPECT_EQ(span, -1);
  ASSERT_EQ(ZvSpline2d::GetInputExtent(params, v2, span, box), 1);
  EXPECT_TRUE(span == 5.0 && box.kind == ZvExtent2<double>::Regular);
  EXPECT_TRUE(box.xmin == std::cos(3.0) && box.ymax == std::sin(2.0));
  double valueSpan = -1;
  ASSERT_EQ(ZvSpline1d::GetInputExtent(params, v1, span, valueSpan), 1);
  EXPECT_EQ(valueSpan, std::sin(2.0) - std::sin(4.0));
}

}  // namespace
