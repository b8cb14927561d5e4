// The implementation record a spline owns, one template over the three value types.
#ifndef ZV_CURVEMATH_SPLINE_RECORD_H
#define ZV_CURVEMATH_SPLINE_RECORD_H

#include <zv/spline.h>

#include "curvemath/spline_pieces.h"

template <class T, class ArrayT>
class ZvSplineRecord {
 public:
  ZvDoubleArray keyParameters;  // strictly increasing
  ArrayT keyValues;
  ArrayT leftDerivatives;  // per key, pointing backwards; empty for CatmullRom
  ArrayT rightDerivatives;
  int kind;
  int closed;

  explicit ZvSplineRecord(int k = ZvSpline::NoKind)
      : keyParameters(4),
        keyValues(4),
        leftDerivatives(1),
        rightDerivatives(1),
        kind(k),
        closed(0) {}

  void AddKey(double t, const T& value) {
    keyParameters.Add(t);
    keyValues.Add(value);
  }

  // Value at t of the Bezier segment from key i to key i+1.
  T BezierCubicFCurveEval(double t, unsigned int i) const {
    const double h = keyParameters[i + 1] - keyParameters[i];
    const ZvSplineCubic<T> cubic(keyValues[i], keyValues[i + 1], rightDerivatives[i],
                                 leftDerivatives[i + 1], h);
    return cubic((t - keyParameters[i]) / h);
  }

  // Derivative at the first sample of params/values. The sample before it sits spanBefore
  // earlier: on a closed curve that is the last sample but one, one period back; an open curve
  // passes 0 and takes the forward difference.
  T ComputeFirstTangent(const ZvDoubleArray& params, const ArrayT& values,
                        double spanBefore) const {
    const unsigned int n = params.size;
    const T& before = closed ? values[n - 2] : values[0];
    return (values[1] - before) / (params[1] - (params[0] - spanBefore));
  }
};

class ZvSpline1dImpl : public ZvSplineRecord<double, ZvDoubleArray> {
 public:
  using ZvSplineRecord::ZvSplineRecord;
};

class ZvSpline2dImpl : public ZvSplineRecord<ZvPoint2<double>, ZvPoint2dArray> {
 public:
  using ZvSplineRecord::ZvSplineRecord;
};

class ZvSpline3dImpl : public ZvSplineRecord<ZvPoint3<double>, ZvPoint3dArray> {
 public:
  using ZvSplineRecord::ZvSplineRecord;
};

#endif
