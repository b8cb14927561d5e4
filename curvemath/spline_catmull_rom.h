// Non-uniform Catmull-Rom splines: evaluation, the greedy fit and the conversion to Bezier form.
#ifndef ZV_CURVEMATH_SPLINE_CATMULL_ROM_H
#define ZV_CURVEMATH_SPLINE_CATMULL_ROM_H

#include "curvemath/spline_record.h"

// One fit in progress: the samples, the record receiving the keys, the squared tolerance and the
// current frame of four sample indices. The piece under test runs from i1 to i2; i0 and i3 are
// its neighbours.
template <class T, class ArrayT, class ImplT>
struct SCatmullRomFitContext {
  const ZvDoubleArray* params;
  const ArrayT* values;
  ImplT* record;
  double tolerance2;
  unsigned int i0, i1, i2, i3;
};

// Value at t of the piece from key i to key i+1. Open curves have their own end pieces; closed
// ones wrap the neighbours round the seam (whose key repeats the first value).
template <class T, class ArrayT>
void EvalCatmullRom(T& out, double t, unsigned int i, const ZvDoubleArray& keyParameters,
                    const ArrayT& keyValues, int closed);

// 1 when every sample strictly between first and last stays within the tolerance of the frame's
// piece.
template <class T, class ArrayT, class ImplT>
int CatmullRomTest(const SCatmullRomFitContext<T, ArrayT, ImplT>& context, unsigned int first,
                   unsigned int last);

// Keeps the samples that the greedy removal pass cannot drop and appends them to the record,
// whose `closed` flag chooses the pass. Allocation failure propagates.
template <class T, class ArrayT, class ImplT>
int CatmullRomFit(const ZvDoubleArray& params, const ArrayT& values, double tolerance,
                  ImplT& record);

// Turns a Catmull-Rom record into the Bezier record of the same curve.
template <class ImplT>
void CatmullRomToBezierCubicFCurve(ImplT& record);

#endif
