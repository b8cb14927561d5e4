// Least-squares Bezier fitting under end conditions, shared by every fit of ZvBezierTool.
//
// Samples Q_k at chord-length parameters u_k are matched by a curve sum_j A_kj P_j with A the
// Bernstein matrix. Each control point is fixed, free (two unknowns) or bound to a line through
// a given base point along a given direction (one unknown, the signed handle length). With the
// unknowns z and P_j = K_j + sum_u z_u V_u, the normal equations are
//   sum_v H[j(u)][j(v)] (V_u . V_v) z_v = V_u . (C_j(u) - sum_i H[j(u)][i] K_i),
// H = A^T A the Gram matrix and C = A^T Q, so x and y share one system whenever a handle length
// couples them.
#ifndef ZV_CURVEMATH_BEZIER_FIT_SOLVE_H
#define ZV_CURVEMATH_BEZIER_FIT_SOLVE_H

#include <zv/arrays.h>
#include <zv/matrix.h>
#include <zv/point.h>

struct ZvFitControl {
  enum Kind { Fixed, Free, Along };
  Kind kind;
  ZvPoint2<double> base;  // the point itself (Fixed), the line's point (Along); unused for Free
  ZvPoint2<double> dir;   // the line's direction (Along)
};

// A (rows 0..n, columns 0..d) = Bernstein coefficients Blaise[d][j] u^j (1 - u)^(d - j) at
// u_k = (chords[first + k] - chords[first]) / (chords[last] - chords[first]), built with running
// powers; then H (0..d by 0..d) = A^T A. A range of no length is parameterised evenly.
void SetupMatricesAH(const ZvDoubleArray& chords, unsigned int first, unsigned int last,
                     unsigned int n, unsigned int d, ZvMatrix& A, ZvMatrix& H);

// Fits control points 0..d to the samples points[first..last] (chords as above) under `ctl`.
// Writes every control point to `out` and, for each Along control j, its handle length to
// handle[j]. 0 when the reduced system is singular (out and handle then unspecified).
int zvFitBezier(const ZvPoint2fArray& points, const ZvDoubleArray& chords, unsigned int first,
                unsigned int last, unsigned int d, const ZvFitControl* ctl, ZvPoint2<double>* out,
                double* handle);
int zvFitBezier(const ZvPoint2dArray& points, const ZvDoubleArray& chords, unsigned int first,
                unsigned int last, unsigned int d, const ZvFitControl* ctl, ZvPoint2<double>* out,
                double* handle);

#endif
