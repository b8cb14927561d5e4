// Least-squares Bezier fitting under end conditions.
#include "curvemath/bezier_fit_solve.h"

#include <zv/bezier_fit.h>

void SetupMatricesAH(const ZvDoubleArray& chords, unsigned int first, unsigned int last,
                     unsigned int n, unsigned int d, ZvMatrix& A, ZvMatrix& H) {
  const double start = chords[first];
  const double total = chords[last] - start;
  double upow[9], spow[9];
  upow[0] = spow[0] = 1.0;
  for (unsigned int k = 0; k <= n; ++k) {
    const double u = total > 0.0 ? (chords[first + k] - start) / total : double(k) / n;
    const double s = 1.0 - u;
    for (unsigned int j = 1; j <= d; ++j) {
      upow[j] = upow[j - 1] * u;
      spow[j] = spow[j - 1] * s;
    }
    double* row = A[static_cast<int>(k)];
    for (unsigned int j = 0; j <= d; ++j)
      row[j] = ZvBezierTool::Blaise[d][j] * upow[j] * spow[d - j];
  }
  for (unsigned int i = 0; i <= d; ++i) {
    for (unsigned int j = i; j <= d; ++j) {
      double sum = 0.0;
      for (unsigned int k = 0; k <= n; ++k)
        sum += A[static_cast<int>(k)][i] * A[static_cast<int>(k)][j];
      H[static_cast<int>(i)][j] = sum;
      H[static_cast<int>(j)][i] = sum;
    }
  }
}

namespace {

template <class Array>
int FitBezier(const Array& points, const ZvDoubleArray& chords, unsigned int first,
              unsigned int last, unsigned int d, const ZvFitControl* ctl, ZvPoint2<double>* out,
              double* handle) {
  if (d > 8 || last <= first) return 0;
  const unsigned int n = last - first;
  ZvMatrix A(0, static_cast<int>(n), 0, static_cast<int>(d));
  ZvMatrix H(0, static_cast<int>(d), 0, static_cast<int>(d));
  SetupMatricesAH(chords, first, last, n, d, A, H);

  // C = A^T Q; K = the known part of each control point.
  ZvPoint2<double> c[9], known[9];
  for (unsigned int j = 0; j <= d; ++j) {
    c[j] = ZvPoint2<double>{0.0, 0.0};
    known[j] = ctl[j].kind == ZvFitControl::Free ? ZvPoint2<double>{0.0, 0.0} : ctl[j].base;
  }
  for (unsigned int k = 0; k <= n; ++k) {
    const ZvPoint2<double> q{points[first + k].x, points[first + k].y};
    const double* row = A[static_cast<int>(k)];
    for (unsigned int j = 0; j <= d; ++j)
      c[j] += q * row[j];
  }

  // One unknown per handle length, two per free point (x, then y).
  unsigned int owner[18];
  ZvPoint2<double> v[18];
  unsigned int m = 0;
  for (unsigned int j = 0; j <= d; ++j) {
    if (ctl[j].kind == ZvFitControl::Along) {
      owner[m] = j;
      v[m++] = ctl[j].dir;
    } else if (ctl[j].kind == ZvFitControl::Free) {
      owner[m] = j;
      v[m++] = ZvPoint2<double>{1.0, 0.0};
      owner[m] = j;
      v[m++] = ZvPoint2<double>{0.0, 1.0};
    }
  }
  for (unsigned int j = 0; j <= d; ++j)
    out[j] = known[j];
  if (m == 0) return 1;

  ZvMatrix N(1, static_cast<int>(m), 1, static_cast<int>(m));
  ZvMatrix R(1, static_cast<int>(m), 1, 1);
  for (unsigned int a = 0; a < m; ++a) {
    const double* h = H[static_cast<int>(owner[a])];
    for (unsigned int b = 0; b < m; ++b)
      N[static_cast<int>(a + 1)][b + 1] = h[owner[b]] * ZvDot(v[a], v[b]);
    ZvPoint2<double> r = c[owner[a]];
    for (unsigned int i = 0; i <= d; ++i)
      r -= known[i] * h[i];
    R[static_cast<int>(a + 1)][1] = ZvDot(v[a], r);
  }
  if (!ZvMatrix_GaussJordanElim(N, R)) return 0;
  for (unsigned int a = 0; a < m; ++a) {
    const double z = R[static_cast<int>(a + 1)][1];
    out[owner[a]] += v[a] * z;
    if (ctl[owner[a]].kind == ZvFitControl::Along) handle[owner[a]] = z;
  }
  return 1;
}

}  // namespace

int zvFitBezier(const ZvPoint2fArray& points, const ZvDoubleArray& chords, unsigned int first,
                unsigned int last, unsigned int d, const ZvFitControl* ctl, ZvPoint2<double>* out,
                double* handle) {
  return FitBezier(points, chords, first, last, d, ctl, out, handle);
}

int zvFitBezier(const ZvPoint2dArray& points, const ZvDoubleArray& chords, unsigned int first,
                unsigned int last, unsigned int d, const ZvFitControl* ctl, ZvPoint2<double>* out,
                double* handle) {
  return FitBezier(points, chords, first, last, d, ctl, out, handle);
}
