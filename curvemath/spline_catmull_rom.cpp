#include "curvemath/spline_catmull_rom.h"

#include <cmath>

template <class T, class ArrayT>
void EvalCatmullRom(T& out, double t, unsigned int i, const ZvDoubleArray& keyParameters,
                    const ArrayT& keyValues, int closed) {
  const double* K = keyParameters.data;
  const T* V = keyValues.data;
  const unsigned int n = keyParameters.size;
  const double h = K[i + 1] - K[i];
  const double u = (t - K[i]) / h;
  if (n == 2) {
    // A closed curve of two keys has nothing to go round: it holds its value.
    out = closed ? V[i] : V[i] + (V[i + 1] - V[i]) * u;
  } else if (i == 0 && !closed) {
    out = zvCatmullRomFirst(u, h / (K[2] - K[0]), V[0], V[1], V[2]);
  } else if (i == 0) {
    // The predecessor of the first key is the last key but one, one period back.
    const double a = h / (K[1] - K[0] + K[n - 1] - K[n - 2]);
    out = zvCatmullRomInner(u, a, h / (K[2] - K[0]), V[n - 2], V[0], V[1], V[2]);
  } else if (i == n - 2 && !closed) {
    out = zvCatmullRomLast(u, h / (K[i + 1] - K[i - 1]), V[i - 1], V[i], V[i + 1]);
  } else if (i == n - 2) {
    // The successor of the last key is the second key, one period on.
    const double b = h / (K[n - 1] + K[1] - K[0] - K[n - 2]);
    out = zvCatmullRomInner(u, h / (K[i + 1] - K[i - 1]), b, V[i - 1], V[i], V[i + 1], V[1]);
  } else {
    out = zvCatmullRomInner(u, h / (K[i + 1] - K[i - 1]), h / (K[i + 2] - K[i]), V[i - 1], V[i],
                            V[i + 1], V[i + 2]);
  }
}

namespace {

template <class T, class Piece>
int SamplesWithin(const double* P, const T* V, unsigned int first, unsigned int last, double t0,
                  double span, double tolerance2, const Piece& piece) {
  for (unsigned int k = first + 1; k < last; ++k) {
    if (zvSplineNorm2(piece((P[k] - t0) / span) - V[k]) > tolerance2) return 0;
  }
  return 1;
}

}  // namespace

// The end pieces are judged on the first three (or last three) input samples whatever keys
// remain, not on the kept keys the final spline uses there. That is the established behaviour
// of the fit and decides which samples near the ends survive, so it is kept as it is.
template <class T, class ArrayT, class ImplT>
int CatmullRomTest(const SCatmullRomFitContext<T, ArrayT, ImplT>& context, unsigned int first,
                   unsigned int last) {
  const double* P = context.params->data;
  const T* V = context.values->data;
  const unsigned int n = context.params->size;
  const unsigned int i0 = context.i0, i1 = context.i1, i2 = context.i2, i3 = context.i3;
  const double t0 = P[i1];
  const double span = P[i2] - t0;
  const double tol2 = context.tolerance2;
  if (i1 == 0) {
    const double r = (P[1] - P[0]) / (P[2] - P[0]);
    return SamplesWithin(P, V, first, last, t0, span, tol2,
                         [&](double u) { return zvCatmullRomFirst(u, r, V[0], V[1], V[2]); });
  }
  if (i2 == n - 1) {
    const double a = (P[i2] - P[n - 2]) / (P[i2] - P[n - 3]);
    return SamplesWithin(P, V, first, last, t0, span, tol2, [&](double u) {
      return zvCatmullRomLast(u, a, V[n - 3], V[n - 2], V[i2]);
    });
  }
  const double a = span / (P[i2] - P[i0]);
  const double b = span / (P[i3] - P[i1]);
  return SamplesWithin(P, V, first, last, t0, span, tol2, [&](double u) {
    return zvCatmullRomInner(u, a, b, V[i0], V[i1], V[i2], V[i3]);
  });
}

namespace {

template <class T, class ArrayT, class ImplT>
int TestFrame(SCatmullRomFitContext<T, ArrayT, ImplT>& context, unsigned int i0, unsigned int i1,
              unsigned int i2, unsigned int i3) {
  context.i0 = i0;
  context.i1 = i1;
  context.i2 = i2;
  context.i3 = i3;
  return CatmullRomTest(context, i1, i2);
}

inline unsigned int AtMost(unsigned int i, unsigned int last) {
  return i < last ? i : last;
}

// Candidates are taken left to right and a removed sample is never reconsidered, so when sample
// i comes up everything to its right is still kept (its right neighbours are i+1, i+2, i+3) and
// everything to its left is final (its left neighbours p1, p2, p3 are carried along). A search
// that runs off the samples yields the end index. A sample goes only when all three pieces it
// influences stay in tolerance without it.
template <class T, class ArrayT, class ImplT>
void RemoveFromOpen(SCatmullRomFitContext<T, ArrayT, ImplT>& c, unsigned char* keep) {
  const unsigned int n = c.params->size, last = n - 1;
  unsigned int p1 = 0, p2 = 0, p3 = 0;
  for (unsigned int i = 1; i <= n - 2; ++i) {
    const unsigned int q1 = i + 1, q2 = AtMost(i + 2, last), q3 = AtMost(i + 3, last);
    if (p1 != 0 && q1 != last) {
      if (TestFrame(c, p3, p2, p1, q1) && TestFrame(c, p2, p1, q1, q2) &&
          TestFrame(c, p1, q1, q2, q3))
        keep[i] = 0;
    } else if (p1 != 0) {
      if (TestFrame(c, p3, p2, p1, last) && TestFrame(c, p2, p1, last, last)) keep[i] = 0;
    } else if (q1 != last) {
      if (TestFrame(c, 0u, 0u, q1, q2) && TestFrame(c, 0u, q1, q2, q3)) keep[i] = 0;
    } else {
      // Only the ends are left around i. The test is tied to the first three samples and the
      // ratio divides by the second span rather than the whole: the established behaviour, which
      // drops sample 1 of a three-sample curve and leaves a later lone candidate in place.
      const double* P = c.params->data;
      const T* V = c.values->data;
      const double r = (P[1] - P[0]) / (P[2] - P[1]);
      if (zvSplineNorm2((V[2] - V[0]) * r + V[0] - V[1]) <= c.tolerance2) keep[1] = 0;
    }
    if (keep[i]) {
      p3 = p2;
      p2 = p1;
      p1 = i;
    }
  }
}

// Samples 0, 1, n-2 and n-1 next to the seam are not candidates here; the seam repair gives the
// keys at 1 and n-2 their own trial afterwards.
template <class T, class ArrayT, class ImplT>
void RemoveFromClosed(SCatmullRomFitContext<T, ArrayT, ImplT>& c, unsigned char* keep) {
  const unsigned int n = c.params->size, last = n - 1;
  unsigned int p1 = 1, p2 = 0, p3 = 0;
  for (unsigned int i = 2; i < n - 2; ++i) {
    const unsigned int q1 = i + 1, q2 = i + 2, q3 = AtMost(i + 3, last);
    if ((p1 < 2 || TestFrame(c, p3, p2, p1, q1)) && TestFrame(c, p2, p1, q1, q2) &&
        (q1 >= n - 2 || TestFrame(c, p1, q1, q2, q3)))
      keep[i] = 0;
    if (keep[i]) {
      p3 = p2;
      p2 = p1;
      p1 = i;
    }
  }
}

// 1 when the closed spline of the record's keys reproduces every inner sample within the
// tolerance. Samples on a key are skipped: the key is the sample.
template <class T, class ArrayT, class ImplT>
int ClosedKeysHold(const SCatmullRomFitContext<T, ArrayT, ImplT>& c) {
  const ZvDoubleArray& K = c.record->keyParameters;
  const double first = K[0], last = K[K.size - 1];
  const unsigned int n = c.params->size;
  for (unsigned int k = 1; k + 1 < n; ++k) {
    const double t = (*c.params)[k];
    if (std::fabs(t - first) <= 1e-15 || std::fabs(t - last) <= 1e-15) continue;
    bool exact;
    const unsigned int i = zvSplineLocate(K, t, exact);
    if (exact) continue;
    T value;
    EvalCatmullRom(value, t, i, K, c.record->keyValues, 1);
    if (zvSplineNorm2(value - (*c.values)[k]) > c.tolerance2) return 0;
  }
  return 1;
}

// Tries to drop the key at index; puts it back when the curve no longer holds.
template <class T, class ArrayT, class ImplT>
void TryRemoveKey(const SCatmullRomFitContext<T, ArrayT, ImplT>& c, unsigned int index) {
  ImplT& record = *c.record;
  const double t = record.keyParameters[index];
  const T value = record.keyValues[index];
  record.keyParameters.Remove(index);
  record.keyValues.Remove(index);
  if (ClosedKeysHold(c)) return;
  record.keyParameters.InsertBefore(index, t);
  record.keyValues.InsertBefore(index, value);
}

}  // namespace

template <class T, class ArrayT, class ImplT>
int CatmullRomFit(const ZvDoubleArray& params, const ArrayT& values, double tolerance,
                  ImplT& record) {
  SCatmullRomFitContext<T, ArrayT, ImplT> context = {
      &params, &values, &record, tolerance * tolerance, 0, 0, 0, 0};
  const unsigned int n = params.size;
  ZvUByteArray keep(n);
  keep.Resize(n);
  for (unsigned int k = 0; k < n; ++k)
    keep[k] = 1;
  if (!record.closed && n >= 3) RemoveFromOpen(context, keep.data);
  if (record.closed && n >= 5) RemoveFromClosed(context, keep.data);
  for (unsigned int k = 0; k < n; ++k) {
    if (keep[k]) record.AddKey(params[k], values[k]);
  }
  if (record.closed && record.keyParameters.size >= 5) {
    TryRemoveKey(context, 1);
    TryRemoveKey(context, record.keyParameters.size - 2);
  }
  return 1;
}

template <class ImplT>
void CatmullRomToBezierCubicFCurve(ImplT& record) {
  const ZvDoubleArray& K = record.keyParameters;
  const auto& V = record.keyValues;
  auto& left = record.leftDerivatives;
  auto& right = record.rightDerivatives;
  const unsigned int n = K.size;
  record.kind = ZvSpline::BezierCubicFCurve;
  left.Resize(n);
  right.Resize(n);
  if (n == 2) {
    right[0] = right[1] = (V[1] - V[0]) / (K[1] - K[0]);
    left[0] = left[1] = -right[0];
    return;
  }
  right[0] = record.ComputeFirstTangent(K, V, record.closed ? K[n - 1] - K[n - 2] : 0.0);
  left[0] = -right[0];
  // Inner tangents are central differences: the Catmull-Rom tangents, so the conversion is exact.
  for (unsigned int i = 1; i + 1 < n; ++i) {
    left[i] = (V[i - 1] - V[i + 1]) / (K[i + 1] - K[i - 1]);
    right[i] = -left[i];
  }
  left[n - 1] = record.closed ? -right[0] : (V[n - 2] - V[n - 1]) / (K[n - 1] - K[n - 2]);
  right[n - 1] = -left[n - 1];
}

#define ZV_INSTANTIATE_CATMULL_ROM(T, ArrayT, ImplT)                                            \
  template void EvalCatmullRom<T, ArrayT>(T&, double, unsigned int, const ZvDoubleArray&,       \
                                          const ArrayT&, int);                                  \
  template int CatmullRomTest<T, ArrayT, ImplT>(const SCatmullRomFitContext<T, ArrayT, ImplT>&, \
                                                unsigned int, unsigned int);                    \
  template int CatmullRomFit<T, ArrayT, ImplT>(const ZvDoubleArray&, const ArrayT&, double,     \
                                               ImplT&);                                         \
  template void CatmullRomToBezierCubicFCurve<ImplT>(ImplT&);

ZV_INSTANTIATE_CATMULL_ROM(double, ZvDoubleArray, ZvSpline1dImpl)
ZV_INSTANTIATE_CATMULL_ROM(ZvPoint2<double>, ZvPoint2dArray, ZvSpline2dImpl)
ZV_INSTANTIATE_CATMULL_ROM(ZvPoint3<double>, ZvPoint3dArray, ZvSpline3dImpl)
