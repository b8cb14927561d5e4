// Splines fitted to densely sampled curves.
//
// A fit reduces a parameter array and a value array (one value per parameter) to a few keys that
// reproduce the samples within a tolerance, either as a non-uniform Catmull-Rom spline (keys and
// values; tangents come from the neighbouring keys) or as a chain of cubic Bezier segments with
// stored derivatives. `ZvSpline1d`, `ZvSpline2d` and `ZvSpline3d` are the same algorithm over
// `double`, `ZvPoint2<double>` and `ZvPoint3<double>` values; the squared error of a sample is
// its squared distance to the spline.
//
// A Bezier segment from key i to key i+1, with h = t[i+1] - t[i], has the control points
// P[i], P[i] + (h/3) right[i], P[i+1] + (h/3) left[i+1], P[i+1]. Left derivatives point
// backwards: the tangent coming into a key is the negated stored value, and on a smooth key
// left = -right.
//
// Splines have no lock. A fit touches only its arguments and a fresh record, so distinct splines
// may be fitted in parallel. Every operation returns 1 on success and 0 on failure, and a failure
// (bad input or an allocation failure, which is caught) leaves the spline as it was.
#ifndef ZV_SPLINE_H
#define ZV_SPLINE_H

#include <zv/api.h>
#include <zv/arrays.h>
#include <zv/point.h>

struct ZvSpline {
  enum Kind {
    CatmullRom = 10,         // keys and values only
    BezierCubicFCurve = 20,  // keys, values and per-key left and right derivatives
    NoKind = 255             // empty spline
  };
};

// Implementation records, owned by the spline objects.
class ZvSpline1dImpl;
class ZvSpline2dImpl;
class ZvSpline3dImpl;

// T is the value type, ArrayT its array, ImplT the record and ExtentT the box of the values
// that GetInputExtent reports (a plain span in 1-D).
template <class T, class ArrayT, class ImplT, class ExtentT>
class ZV_API ZvSplineT {
 public:
  // An empty spline of kind NoKind.
  ZvSplineT();
  ZvSplineT(const ZvSplineT& other);
  ZvSplineT& operator=(const ZvSplineT& other);
  ~ZvSplineT();

  unsigned int GetNumKeys() const;
  int IsClosed() const;
  ZvSpline::Kind GetKind() const;
  int IsEmpty() const;

  const ZvDoubleArray& GetKeyParameters() const;
  const ArrayT& GetKeyValues() const;
  // Empty for a Catmull-Rom spline.
  const ArrayT& GetLeftDerivatives() const;
  const ArrayT& GetRightDerivatives() const;

  // The span (max - min) of the parameters and the Regular box of the values. 0 when either
  // array is empty.
  static int GetInputExtent(const ZvDoubleArray& params, const ArrayT& values, double& paramSpan,
                            ExtentT& extent);

  // Fits an open curve through at least 2 samples with strictly increasing parameters; the keys
  // are a subset of the samples, always including the first and the last. Fails for arrays of
  // different sizes, a negative (or NaN) tolerance or a kind other than CatmullRom and
  // BezierCubicFCurve.
  //
  // BezierCubicFCurve: every sample is reproduced within the tolerance. Segments are halved at
  // the middle sample until they fit, with central differences of the samples as derivatives.
  // CatmullRom: samples are removed greedily from left to right, a removal standing when the
  // three pieces it changes keep their samples within the tolerance. The two end pieces are
  // judged on the first (last) three samples rather than on the kept keys, which keeps samples
  // next to the ends whenever those three samples do not describe the whole end piece.
  int OpenFit(const ZvDoubleArray& params, const ArrayT& values, double tolerance,
              ZvSpline::Kind kind);
  // As OpenFit for a closed curve: at least 3 samples, and the last value repeats the first
  // (exactly in 1-D, within 1e-9 per component in 2-D and 3-D). The curve is smooth across the
  // seam; a Catmull-Rom fit gives the keys next to the seam a trial of their own afterwards.
  int ClosedFit(const ZvDoubleArray& params, const ArrayT& values, double tolerance,
                ZvSpline::Kind kind);

  // Value at t; needs at least 2 keys. There is no extrapolation: outside the keys the end
  // values are returned, and a closed spline first wraps t into its period. At a key the stored
  // value is returned exactly.
  int Eval(T& out, double t) const;

  // Replaces target with a copy of this spline in the given kind. A Catmull-Rom spline converts
  // to either kind (the Bezier form reproduces it); a Bezier spline only copies to its own kind.
  // Fails on fewer than 2 keys, or fewer than 3 when closed.
  int CopyAndConvert(ZvSplineT& target, ZvSpline::Kind kind) const;

 private:
  int Fit(const ZvDoubleArray& params, const ArrayT& values, double tolerance, ZvSpline::Kind kind,
          int closed);
  void Adopt(ImplT* record);

  ImplT* impl;
};

extern template class ZV_API ZvSplineT<double, ZvDoubleArray, ZvSpline1dImpl, double>;
extern template class ZV_API
    ZvSplineT<ZvPoint2<double>, ZvPoint2dArray, ZvSpline2dImpl, ZvExtent2<double>>;
extern template class ZV_API
    ZvSplineT<ZvPoint3<double>, ZvPoint3dArray, ZvSpline3dImpl, ZvExtent3<double>>;

class ZV_API ZvSpline1d : public ZvSplineT<double, ZvDoubleArray, ZvSpline1dImpl, double> {};

class ZV_API ZvSpline2d
    : public ZvSplineT<ZvPoint2<double>, ZvPoint2dArray, ZvSpline2dImpl, ZvExtent2<double>> {};

class ZV_API ZvSpline3d
    : public ZvSplineT<ZvPoint3<double>, ZvPoint3dArray, ZvSpline3dImpl, ZvExtent3<double>> {};

#endif
