// Gauss-Jordan elimination with full pivoting on 1-based ZvMatrix objects.
//
// The fitters build small normal-equation systems (a handful of unknowns) whose conditioning
// varies a lot with the sample spacing; full pivoting costs nothing at that size and keeps the
// solution stable. The inverse is produced as a by-product, in place.
#include <zv/matrix.h>

#include <cmath>
#include <utility>

namespace {

// Does the matrix hold rows 1..nRows and columns 1..nCols?
bool Holds1Based(const ZvMatrix& x, int nRows, int nCols) {
  const bool rowsOk = nRows < 1 || (x.rowLow <= 1 && nRows <= x.rowHigh);
  const bool colsOk = nCols < 1 || (x.colLow <= 1 && nCols <= x.colHigh);
  return rowsOk && colsOk;
}

void SwapRows(ZvMatrix& x, int r1, int r2, int nCols) {
  for (int c = 1; c <= nCols; ++c)
    std::swap(x[r1][c], x[r2][c]);
}

}  // namespace

int ZvMatrix_GaussJordanElim(ZvMatrix& a, ZvMatrix& b) {
  const int n = a.rowHigh;
  const int m = b.colHigh;
  if (!Holds1Based(a, n, n) || !Holds1Based(b, n, m)) return 0;

  // ipiv counts how often a column served as pivot; indxr/indxc record the row and column of
  // pivot i, so the column permutation can be undone at the end.
  ZvVectorLong ipiv(1, n), indxr(1, n), indxc(1, n);
  for (int i = 1; i <= n; ++i) {
    double big = 0.0;
    int irow = 0, icol = 0;
    for (int r = 1; r <= n; ++r) {
      if (ipiv[r] == 1) continue;
      for (int c = 1; c <= n; ++c) {
        if (ipiv[c] == 0) {
          // At-least: among equal magnitudes the last one scanned wins.
          if (std::fabs(a[r][c]) >= big) {
            big = std::fabs(a[r][c]);
            irow = r;
            icol = c;
          }
        } else if (ipiv[c] > 1) {
          return 0;
        }
      }
    }
    if (icol == 0) return 0;  // only non-numbers were left to pivot on
    ++ipiv[icol];
    if (irow != icol) {
      SwapRows(a, irow, icol, n);
      SwapRows(b, irow, icol, m);
    }
    indxr[i] = irow;
    indxc[i] = icol;
    const double pivot = a[icol][icol];
    if (std::fabs(pivot) <= 1e-9) return 0;
    const double inv = 1.0 / pivot;
    a[icol][icol] = 1.0;
    for (int c = 1; c <= n; ++c)
      a[icol][c] *= inv;
    for (int c = 1; c <= m; ++c)
      b[icol][c] *= inv;
    for (int r = 1; r <= n; ++r) {
      if (r == icol) continue;
      const double f = a[r][icol];
      a[r][icol] = 0.0;
      for (int c = 1; c <= n; ++c)
        a[r][c] -= a[icol][c] * f;
      for (int c = 1; c <= m; ++c)
        b[r][c] -= b[icol][c] * f;
    }
  }
  // Undo the column interchanges implied by the row swaps, in reverse order.
  for (int i = n; i >= 1; --i) {
    if (indxr[i] == indxc[i]) continue;
    for (int r = 1; r <= n; ++r)
      std::swap(a[r][indxr[i]], a[r][indxc[i]]);
  }
  return 1;
}
