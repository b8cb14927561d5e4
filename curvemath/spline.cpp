#include <zv/spline.h>

#include <cmath>

#include "curvemath/spline_bezier_fit.h"
#include "curvemath/spline_catmull_rom.h"

namespace {

// The repeated value that closes a curve: exact in 1-D, within 1e-9 per component otherwise.
inline bool SeamMatches(double a, double b) {
  return a == b;
}
inline bool SeamMatches(const ZvPoint2<double>& a, const ZvPoint2<double>& b) {
  return std::fabs(a.x - b.x) <= 1e-9 && std::fabs(a.y - b.y) <= 1e-9;
}
inline bool SeamMatches(const ZvPoint3<double>& a, const ZvPoint3<double>& b) {
  return std::fabs(a.x - b.x) <= 1e-9 && std::fabs(a.y - b.y) <= 1e-9 &&
         std::fabs(a.z - b.z) <= 1e-9;
}

// The box of the values: a span in 1-D.
void ValueExtent(const ZvDoubleArray& values, double& span) {
  double lo = values[0], hi = values[0];
  for (unsigned int k = 1; k < values.size; ++k) {
    if (values[k] < lo) lo = values[k];
    if (values[k] > hi) hi = values[k];
  }
  span = hi - lo;
}
template <class ArrayT, class ExtentT>
void ValueExtent(const ArrayT& values, ExtentT& extent) {
  ExtentT box;
  for (unsigned int k = 0; k < values.size; ++k)
    box.AddPoint(values[k]);
  extent = box;
}

}  // namespace

template <class T, class ArrayT, class ImplT, class ExtentT>
ZvSplineT<T, ArrayT, ImplT, ExtentT>::ZvSplineT() : impl(new ImplT) {}

template <class T, class ArrayT, class ImplT, class ExtentT>
ZvSplineT<T, ArrayT, ImplT, ExtentT>::ZvSplineT(const ZvSplineT& other)
    : impl(new ImplT(*other.impl)) {}

template <class T, class ArrayT, class ImplT, class ExtentT>
ZvSplineT<T, ArrayT, ImplT, ExtentT>& ZvSplineT<T, ArrayT, ImplT, ExtentT>::operator=(
    const ZvSplineT& other) {
  if (this != &other) Adopt(new ImplT(*other.impl));
  return *this;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
ZvSplineT<T, ArrayT, ImplT, ExtentT>::~ZvSplineT() {
  delete impl;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
void ZvSplineT<T, ArrayT, ImplT, ExtentT>::Adopt(ImplT* record) {
  delete impl;
  impl = record;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
unsigned int ZvSplineT<T, ArrayT, ImplT, ExtentT>::GetNumKeys() const {
  return impl->keyParameters.size;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
int ZvSplineT<T, ArrayT, ImplT, ExtentT>::IsClosed() const {
  return impl->closed;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
ZvSpline::Kind ZvSplineT<T, ArrayT, ImplT, ExtentT>::GetKind() const {
  return static_cast<ZvSpline::Kind>(impl->kind);
}

template <class T, class ArrayT, class ImplT, class ExtentT>
int ZvSplineT<T, ArrayT, ImplT, ExtentT>::IsEmpty() const {
  return GetNumKeys() == 0;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
const ZvDoubleArray& ZvSplineT<T, ArrayT, ImplT, ExtentT>::GetKeyParameters() const {
  return impl->keyParameters;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
const ArrayT& ZvSplineT<T, ArrayT, ImplT, ExtentT>::GetKeyValues() const {
  return impl->keyValues;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
const ArrayT& ZvSplineT<T, ArrayT, ImplT, ExtentT>::GetLeftDerivatives() const {
  return impl->leftDerivatives;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
const ArrayT& ZvSplineT<T, ArrayT, ImplT, ExtentT>::GetRightDerivatives() const {
  return impl->rightDerivatives;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
int ZvSplineT<T, ArrayT, ImplT, ExtentT>::GetInputExtent(const ZvDoubleArray& params,
                                                         const ArrayT& values, double& paramSpan,
                                                         ExtentT& extent) {
  if (params.size == 0 || values.size == 0) return 0;
  ValueExtent(params, paramSpan);
  ValueExtent(values, extent);
  return 1;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
int ZvSplineT<T, ArrayT, ImplT, ExtentT>::OpenFit(const ZvDoubleArray& params, const ArrayT& values,
                                                  double tolerance, ZvSpline::Kind kind) {
  return Fit(params, values, tolerance, kind, 0);
}

template <class T, class ArrayT, class ImplT, class ExtentT>
int ZvSplineT<T, ArrayT, ImplT, ExtentT>::ClosedFit(const ZvDoubleArray& params,
                                                    const ArrayT& values, double tolerance,
                                                    ZvSpline::Kind kind) {
  if (params.size < 3 || values.size != params.size) return 0;
  if (!SeamMatches(values[0], values[values.size - 1])) return 0;
  return Fit(params, values, tolerance, kind, 1);
}

template <class T, class ArrayT, class ImplT, class ExtentT>
int ZvSplineT<T, ArrayT, ImplT, ExtentT>::Fit(const ZvDoubleArray& params, const ArrayT& values,
                                              double tolerance, ZvSpline::Kind kind, int closed) {
  const unsigned int n = params.size;
  // A NaN tolerance is refused along with a negative one.
  if (n < 2 || values.size != n || !(tolerance >= 0)) return 0;
  if (kind != ZvSpline::CatmullRom && kind != ZvSpline::BezierCubicFCurve) return 0;
  for (unsigned int k = 1; k < n; ++k) {
    if (!(params[k] > params[k - 1])) return 0;
  }
  ImplT* record = nullptr;
  try {
    record = new ImplT(kind);
    record->closed = closed;
    if (kind == ZvSpline::BezierCubicFCurve) {
      BezierCubicFCurveFit<T>(params, values, tolerance, *record);
    } else {
      CatmullRomFit<T>(params, values, tolerance, *record);
    }
  } catch (...) {
    // Allocation failure: the half-built record goes, the spline stays as it was.
    delete record;
    return 0;
  }
  Adopt(record);
  return 1;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
int ZvSplineT<T, ArrayT, ImplT, ExtentT>::Eval(T& out, double t) const {
  const ZvDoubleArray& K = impl->keyParameters;
  const ArrayT& V = impl->keyValues;
  const unsigned int n = K.size;
  if (n < 2) return 0;
  const double first = K[0], last = K[n - 1];
  if (impl->closed) {
    const double span = last - first;
    if (t > last) t = std::fmod(t - first, span) + first;
    if (t < first) t = last - std::fmod(first - t, span);
    if (t < first) t = first;
    if (t > last) t = last;
  }
  if (impl->kind != ZvSpline::CatmullRom && impl->kind != ZvSpline::BezierCubicFCurve) return 0;
  if (t <= first) {
    out = V[0];
    return 1;
  }
  if (t >= last) {
    out = V[n - 1];
    return 1;
  }
  bool exact;
  const unsigned int i = zvSplineLocate(K, t, exact);
  if (exact) {
    out = V[i];
  } else if (impl->kind == ZvSpline::BezierCubicFCurve) {
    out = impl->BezierCubicFCurveEval(t, i);
  } else {
    EvalCatmullRom(out, t, i, K, V, impl->closed);
  }
  return 1;
}

template <class T, class ArrayT, class ImplT, class ExtentT>
int ZvSplineT<T, ArrayT, ImplT, ExtentT>::CopyAndConvert(ZvSplineT& target,
                                                         ZvSpline::Kind kind) const {
  const unsigned int n = GetNumKeys();
  if (n < 2 || (impl->closed && n < 3)) return 0;
  const int from = impl->kind;
  const bool toBezier = from == ZvSpline::CatmullRom && kind == ZvSpline::BezierCubicFCurve;
  const bool copy =
      from == kind && (from == ZvSpline::CatmullRom || from == ZvSpline::BezierCubicFCurve);
  if (!toBezier && !copy) return 0;
  ImplT* record = nullptr;
  try {
    record = new ImplT(*impl);
    if (toBezier) CatmullRomToBezierCubicFCurve(*record);
  } catch (...) {
    delete record;
    return 0;
  }
  target.Adopt(record);
  return 1;
}

template class ZvSplineT<double, ZvDoubleArray, ZvSpline1dImpl, double>;
template class ZvSplineT<ZvPoint2<double>, ZvPoint2dArray, ZvSpline2dImpl, ZvExtent2<double>>;
template class ZvSplineT<ZvPoint3<double>, ZvPoint3dArray, ZvSpline3dImpl, ZvExtent3<double>>;
