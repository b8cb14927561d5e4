// Small dense linear algebra for the curve fitters: ZvMatrix, ZvVectorLong, ZvVectorDouble.
//
// The index range of each dimension is chosen by the caller at construction, as an inclusive
// low and high bound, so one matrix may be 0-based and the next 1-based. An empty range
// (high = low - 1) is legal. No lock: these are plain working objects.
#ifndef ZV_MATRIX_H
#define ZV_MATRIX_H

#include <zv/api.h>

#include <cstdint>
#include <iosfwd>

class ZV_API ZvMatrix {
 public:
  // A zero matrix with rows rowLow..rowHigh and columns colLow..colHigh, inclusive. On a failed
  // allocation what was allocated is freed and the exception goes on.
  ZvMatrix(int rowLow, int rowHigh, int colLow, int colHigh);
  ZvMatrix(const ZvMatrix& other);  // same bounds, elements copied
  ZvMatrix& operator=(const ZvMatrix&) = delete;
  ~ZvMatrix();

  // m[r][c] for r in rowLow..rowHigh and c in colLow..colHigh; not range-checked.
  double* operator[](int r) { return rows[r]; }
  const double* operator[](int r) const { return rows[r]; }

  // 1 unless some element differs from the identity by more than tolerance. The diagonal is
  // where r - rowLow equals c - colLow, so non-square and shifted matrices are allowed.
  int IsIdentity(double tolerance) const;

  int rowLow;
  int rowHigh;
  int colLow;
  int colHigh;
  // Row pointers shifted by the low bounds, so that rows[r][c] addresses element (r, c). The
  // elements are one block of rows x columns + 1 doubles; the row pointers another block.
  double** rows;
};

// out[r][c] = sum over k in a's columns of a[r][k] b[k][c], for r in a's rows and c in b's
// columns; zero when a has no columns. 1, or 0 (nothing written) when b's rows or out's range
// do not cover what the product reads or writes.
ZV_API int ZvMatrix_Multiply(const ZvMatrix& a, const ZvMatrix& b, ZvMatrix& out);

// 1 unless some |a[r][c] - b[r][c]| exceeds tolerance, r in a's rows and c in b's columns.
// 0 when the two do not both hold that range.
ZV_API int ZvMatrix_AreAlmostEqual(const ZvMatrix& a, const ZvMatrix& b, double tolerance);

// Solves a x = b in place by Gauss-Jordan elimination with full pivoting: afterwards a holds its
// inverse and b the solution for each of its columns. Indices are 1-based: rows and columns of
// a run 1..a.rowHigh, columns of b 1..b.colHigh. 0 for a singular system (a pivot within 1e-9
// of 0), with a and b left partly reduced; 0 also, untouched, when the ranges do not hold those
// indices.
ZV_API int ZvMatrix_GaussJordanElim(ZvMatrix& a, ZvMatrix& b);

// Vectors of 32-bit integers and of doubles. The block holds high - low + 2 zeroed elements
// indexed from 0 of the block, whatever low is: a 1-based vector (1, n) takes indices 0..n.
template <class T>
class ZvVectorOf {
 public:
  ZvVectorOf(int low, int high);
  ZvVectorOf(const ZvVectorOf&) = delete;
  ZvVectorOf& operator=(const ZvVectorOf&) = delete;
  ~ZvVectorOf();

  T& operator[](int i) { return data[i]; }
  const T& operator[](int i) const { return data[i]; }

  int low;
  int high;
  T* data;
};

extern template class ZV_API ZvVectorOf<int32_t>;
extern template class ZV_API ZvVectorOf<double>;

typedef ZvVectorOf<int32_t> ZvVectorLong;
typedef ZvVectorOf<double> ZvVectorDouble;

// "Matrix [rowLow..rowHigh][colLow..colHigh]", then one line per row with each element
// followed by " ", then an empty line.
ZV_API std::ostream& operator<<(std::ostream& os, const ZvMatrix& m);
// The bounds only: "long vector [low..high]" and "zvFloat64 vector [low..high]".
ZV_API std::ostream& operator<<(std::ostream& os, const ZvVectorLong& v);
ZV_API std::ostream& operator<<(std::ostream& os, const ZvVectorDouble& v);

#endif
