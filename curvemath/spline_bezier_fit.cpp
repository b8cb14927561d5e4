#include "curvemath/spline_bezier_fit.h"

namespace {

template <class T, class ImplT>
void AppendSegmentEnd(ImplT& record, const T& right, double t, const T& value, const T& left) {
  record.rightDerivatives.Add(right);
  record.AddKey(t, value);
  record.leftDerivatives.Add(left);
}

}  // namespace

// Derivatives at the split keys are central differences of the samples: no least squares, so a
// segment either reproduces its samples or is halved. The halving depth is the logarithm of the
// sample count, and a failing segment stops at its first sample out of tolerance.
template <class T, class ArrayT, class ImplT>
void BezierCubicFCurveFitOneStep(const T& right, const T& left, unsigned int first,
                                 unsigned int last, const ZvDoubleArray& params,
                                 const ArrayT& values, double tolerance2, ImplT& record) {
  const double h = params[last] - params[first];
  const ZvSplineCubic<T> cubic(values[first], values[last], right, left, h);
  unsigned int k = first + 1;
  while (k < last &&
         zvSplineNorm2(cubic((params[k] - params[first]) / h) - values[k]) <= tolerance2)
    ++k;
  if (k == last) {
    AppendSegmentEnd(record, right, params[last], values[last], left);
    return;
  }
  const unsigned int mid = (first + last) / 2;
  const T slope = (values[mid + 1] - values[mid - 1]) / (params[mid + 1] - params[mid - 1]);
  if (first + 1 < mid) {
    BezierCubicFCurveFitOneStep(right, -slope, first, mid, params, values, tolerance2, record);
  } else {
    AppendSegmentEnd(record, right, params[mid], values[mid], -slope);
  }
  if (mid + 1 < last) {
    BezierCubicFCurveFitOneStep(slope, left, mid, last, params, values, tolerance2, record);
  } else {
    AppendSegmentEnd(record, slope, params[last], values[last], left);
  }
}

template <class T, class ArrayT, class ImplT>
int BezierCubicFCurveFit(const ZvDoubleArray& params, const ArrayT& values, double tolerance,
                         ImplT& record) {
  const unsigned int n = params.size;
  T startRight, endLeft;
  if (record.closed) {
    // One slope across the seam, so the closed curve is smooth there.
    startRight = record.ComputeFirstTangent(params, values, params[n - 1] - params[n - 2]);
    endLeft = -startRight;
  } else {
    startRight = record.ComputeFirstTangent(params, values, 0.0);
    endLeft = (values[n - 2] - values[n - 1]) / (params[n - 1] - params[n - 2]);
  }
  record.AddKey(params[0], values[0]);
  record.leftDerivatives.Add(-startRight);
  BezierCubicFCurveFitOneStep(startRight, endLeft, 0, n - 1, params, values, tolerance * tolerance,
                              record);
  const ArrayT& left = record.leftDerivatives;
  record.rightDerivatives.Add(-left[left.size - 1]);
  return 1;
}

#define ZV_INSTANTIATE_BEZIER_FIT(T, ArrayT, ImplT)                                                \
  template int BezierCubicFCurveFit<T, ArrayT, ImplT>(const ZvDoubleArray&, const ArrayT&, double, \
                                                      ImplT&);                                     \
  template void BezierCubicFCurveFitOneStep<T, ArrayT, ImplT>(const T&, const T&, unsigned int,    \
                                                              unsigned int, const ZvDoubleArray&,  \
                                                              const ArrayT&, double, ImplT&);

ZV_INSTANTIATE_BEZIER_FIT(double, ZvDoubleArray, ZvSpline1dImpl)
ZV_INSTANTIATE_BEZIER_FIT(ZvPoint2<double>, ZvPoint2dArray, ZvSpline2dImpl)
ZV_INSTANTIATE_BEZIER_FIT(ZvPoint3<double>, ZvPoint3dArray, ZvSpline3dImpl)
