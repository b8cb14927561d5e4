// ZvMatrix and the index-ranged vectors: storage, products, comparison and text dumps.
#include <zv/matrix.h>

#include <cstddef>
#include <limits>
#include <new>
#include <ostream>

namespace {

const std::size_t kMaxCount = std::numeric_limits<std::size_t>::max() / sizeof(double) - 1;

// Element count of an inclusive range; a reversed range counts as empty. A count that no block
// could hold (possible in 32-bit builds) fails like any other impossible allocation.
std::size_t Extent(int low, int high) {
  const long long n = static_cast<long long>(high) - low + 1;
  if (n <= 0) return 0;
  if (static_cast<unsigned long long>(n) > kMaxCount) throw std::bad_array_new_length();
  return static_cast<std::size_t>(n);
}

bool Covers(int low, int high, int innerLow, int innerHigh) {
  return innerLow > innerHigh || (low <= innerLow && innerHigh <= high);
}

}  // namespace

ZvMatrix::ZvMatrix(int rLow, int rHigh, int cLow, int cHigh)
    : rowLow(rLow), rowHigh(rHigh), colLow(cLow), colHigh(cHigh), rows(nullptr) {
  const std::size_t nr = Extent(rowLow, rowHigh), nc = Extent(colLow, colHigh);
  if (nc != 0 && nr > kMaxCount / nc) throw std::bad_array_new_length();
  // The extra element and row pointer keep both blocks non-empty for empty ranges.
  double** rowBlock = new double*[nr + 1];
  double* elements;
  try {
    elements = new double[nr * nc + 1]();
  } catch (...) {
    delete[] rowBlock;
    throw;
  }
  for (std::size_t i = 0; i < nr; ++i)
    rowBlock[i] = elements + i * nc - colLow;
  rowBlock[nr] = elements;  // kept so the element block can be found when there are no rows
  rows = rowBlock - rowLow;
}

ZvMatrix::ZvMatrix(const ZvMatrix& other)
    : ZvMatrix(other.rowLow, other.rowHigh, other.colLow, other.colHigh) {
  for (int r = rowLow; r <= rowHigh; ++r) {
    for (int c = colLow; c <= colHigh; ++c)
      rows[r][c] = other.rows[r][c];
  }
}

ZvMatrix::~ZvMatrix() {
  double** rowBlock = rows + rowLow;
  // The constructor checked the range already; the destructor must not throw.
  const long long rowCount = static_cast<long long>(rowHigh) - rowLow + 1;
  delete[] rowBlock[rowCount > 0 ? rowCount : 0];
  delete[] rowBlock;
}

int ZvMatrix::IsIdentity(double tolerance) const {
  for (int r = rowLow; r <= rowHigh; ++r) {
    for (int c = colLow; c <= colHigh; ++c) {
      const double expected = r - rowLow == c - colLow ? 1.0 : 0.0;
      const double diff = rows[r][c] - expected;
      if (diff > tolerance || -diff > tolerance) return 0;
    }
  }
  return 1;
}

int ZvMatrix_Multiply(const ZvMatrix& a, const ZvMatrix& b, ZvMatrix& out) {
  if (a.rowLow > a.rowHigh || b.colLow > b.colHigh) return 1;
  if (!Covers(b.rowLow, b.rowHigh, a.colLow, a.colHigh) ||
      !Covers(out.rowLow, out.rowHigh, a.rowLow, a.rowHigh) ||
      !Covers(out.colLow, out.colHigh, b.colLow, b.colHigh)) {
    return 0;
  }
  for (int r = a.rowLow; r <= a.rowHigh; ++r) {
    for (int c = b.colLow; c <= b.colHigh; ++c) {
      double sum = 0.0;
      for (int k = a.colLow; k <= a.colHigh; ++k)
        sum += a.rows[r][k] * b.rows[k][c];
      out.rows[r][c] = sum;
    }
  }
  return 1;
}

int ZvMatrix_AreAlmostEqual(const ZvMatrix& a, const ZvMatrix& b, double tolerance) {
  if (a.rowLow > a.rowHigh || b.colLow > b.colHigh) return 1;
  if (!Covers(b.rowLow, b.rowHigh, a.rowLow, a.rowHigh) ||
      !Covers(a.colLow, a.colHigh, b.colLow, b.colHigh)) {
    return 0;
  }
  for (int r = a.rowLow; r <= a.rowHigh; ++r) {
    for (int c = b.colLow; c <= b.colHigh; ++c) {
      const double diff = a.rows[r][c] - b.rows[r][c];
      if (diff > tolerance || -diff > tolerance) return 0;
    }
  }
  return 1;
}

template <class T>
ZvVectorOf<T>::ZvVectorOf(int lo, int hi) : low(lo), high(hi), data(new T[Extent(lo, hi) + 1]()) {}

template <class T>
ZvVectorOf<T>::~ZvVectorOf() {
  delete[] data;
}

template class ZvVectorOf<int32_t>;
template class ZvVectorOf<double>;

std::ostream& operator<<(std::ostream& os, const ZvMatrix& m) {
  os << "Matrix [" << m.rowLow << ".." << m.rowHigh << "][" << m.colLow << ".." << m.colHigh << "]"
     << std::endl;
  for (int r = m.rowLow; r <= m.rowHigh; ++r) {
    for (int c = m.colLow; c <= m.colHigh; ++c)
      os << m.rows[r][c] << " ";
    os << std::endl;
  }
  os << std::endl;
  return os;
}

std::ostream& operator<<(std::ostream& os, const ZvVectorLong& v) {
  os << "long vector [" << v.low << ".." << v.high << "]" << std::endl;
  return os;
}

std::ostream& operator<<(std::ostream& os, const ZvVectorDouble& v) {
  os << "zvFloat64 vector [" << v.low << ".." << v.high << "]" << std::endl;
  return os;
}
