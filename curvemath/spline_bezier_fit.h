// Fitting a chain of cubic Bezier segments with per-key derivatives to samples.
#ifndef ZV_CURVEMATH_SPLINE_BEZIER_FIT_H
#define ZV_CURVEMATH_SPLINE_BEZIER_FIT_H

#include "curvemath/spline_record.h"

// Appends to the record (whose `closed` flag is set) keys at sample indices that bound segments
// reproducing every sample within the tolerance. Allocation failure propagates.
template <class T, class ArrayT, class ImplT>
int BezierCubicFCurveFit(const ZvDoubleArray& params, const ArrayT& values, double tolerance,
                         ImplT& record);

// Fits the samples first..last with one segment leaving first with the derivative right and
// entering last with the backward derivative left, halving the range until every sample fits.
// Appends the right derivative of first, then key last with its left derivative.
template <class T, class ArrayT, class ImplT>
void BezierCubicFCurveFitOneStep(const T& right, const T& left, unsigned int first,
                                 unsigned int last, const ZvDoubleArray& params,
                                 const ArrayT& values, double tolerance2, ImplT& record);

#endif
