// ZvTransfo4: construction, products, inverse, predicates, measures and the text dump.
#include <zv/transfo4.h>

#include <cmath>
#include <ostream>
#include <utility>

namespace {

static_assert(sizeof(ZvTransfo4) == 16 * sizeof(double), "a transform is its 16 doubles");

const double kIdentity[16] = {1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};

void Copy16(const double* from, double* to) {
  for (int i = 0; i < 16; ++i)
    to[i] = from[i];
}

// r = a b in storage order; r must not alias a or b.
void Product(const double* a, const double* b, double* r) {
  for (int c = 0; c < 4; ++c) {
    for (int row = 0; row < 4; ++row) {
      r[row + 4 * c] = a[row] * b[4 * c] + a[row + 4] * b[4 * c + 1] + a[row + 8] * b[4 * c + 2] +
                       a[row + 12] * b[4 * c + 3];
    }
  }
}

// The elements that must vanish for a transform without rotation, shear or perspective: all
// off-diagonal elements except the translation column.
const int kLinearOffDiagonal[9] = {1, 2, 3, 4, 6, 7, 8, 9, 11};

bool OffDiagonalBelow(const double* m, double tolerance) {
  for (int i : kLinearOffDiagonal) {
    if (!(std::fabs(m[i]) < tolerance)) return false;
  }
  return true;
}

bool NearOne(double v, double tolerance) {
  return std::fabs(v - 1.0) < tolerance;
}

}  // namespace

ZvTransfo4::ZvTransfo4() {
  Copy16(kIdentity, m);
}
ZvTransfo4::ZvTransfo4(const ZvTransfo4& other) {
  Copy16(other.m, m);
}
ZvTransfo4::ZvTransfo4(const double* m16) {
  Copy16(m16, m);
}

ZvTransfo4& ZvTransfo4::operator=(const ZvTransfo4& other) {
  Copy16(other.m, m);
  return *this;
}

ZvTransfo4& ZvTransfo4::SetToIdentity() {
  Copy16(kIdentity, m);
  return *this;
}
ZvTransfo4& ZvTransfo4::ResetToIdentity() {
  return SetToIdentity();
}
void ZvTransfo4::SetMatrix(const double* m16) {
  Copy16(m16, m);
}
void ZvTransfo4::GetMatrix(double* m16) const {
  Copy16(m, m16);
}

ZvTransfo4& ZvTransfo4::PostMultiply(const ZvTransfo4& t) {
  double r[16];
  Product(m, t.m, r);
  Copy16(r, m);
  return *this;
}

ZvTransfo4& ZvTransfo4::PreMultiply(const ZvTransfo4& t) {
  double r[16];
  Product(t.m, m, r);
  Copy16(r, m);
  return *this;
}

void ZvTransfo4::Transpose(ZvTransfo4& out) const {
  double r[16];
  for (int row = 0; row < 4; ++row) {
    for (int c = 0; c < 4; ++c)
      r[c + 4 * row] = m[row + 4 * c];
  }
  Copy16(r, out.m);
}

int ZvTransfo4::Inverse(ZvTransfo4& out) const {
  // a[row][col] views of the work copy and the result; element (r, c) lives at [r + 4c].
  double a[16];
  Copy16(m, a);
  out.SetToIdentity();
  double* b = out.m;
  for (int i = 0; i < 4; ++i) {
    // First entry of greatest magnitude at or below the diagonal: ties keep the earlier row.
    int pivotRow = i;
    for (int r = i + 1; r < 4; ++r) {
      if (std::fabs(a[r + 4 * i]) > std::fabs(a[pivotRow + 4 * i])) pivotRow = r;
    }
    if (pivotRow != i) {
      for (int c = 0; c < 4; ++c) {
        std::swap(a[i + 4 * c], a[pivotRow + 4 * c]);
        std::swap(b[i + 4 * c], b[pivotRow + 4 * c]);
      }
    }
    const double pivot = a[i + 4 * i];
    if (std::fabs(pivot) <= 1e-15) return 0;
    const double inv = 1.0 / pivot;
    for (int c = 0; c < 4; ++c) {
      a[i + 4 * c] *= inv;
      b[i + 4 * c] *= inv;
    }
    for (int r = 0; r < 4; ++r) {
      if (r == i) continue;
      const double f = a[r + 4 * i];
      for (int c = 0; c < 4; ++c) {
        a[r + 4 * c] -= f * a[i + 4 * c];
        b[r + 4 * c] -= f * b[i + 4 * c];
      }
    }
  }
  return 1;
}

int ZvTransfo4::IsSingular() const {
  ZvTransfo4 inverse;
  return Inverse(inverse) ? 0 : 1;
}

int ZvTransfo4::TestInverse() const {
  ZvTransfo4 inverse;
  if (!Inverse(inverse)) return 0;
  ZvTransfo4 left(*this), right(inverse);
  left.PostMultiply(inverse);  // M M^-1
  right.PostMultiply(*this);   // M^-1 M
  return left.IsIdentity() && right.IsIdentity() ? 1 : 0;
}

int ZvTransfo4::IsIdentity() const {
  for (int i = 0; i < 16; ++i) {
    const bool diagonal = i % 5 == 0;
    const bool ok = diagonal ? NearOne(m[i], 1e-10) : std::fabs(m[i]) < 1e-7;
    if (!ok) return 0;
  }
  return 1;
}

int ZvTransfo4::IsTranslation() const {
  return NearOne(m[0], 1e-10) && NearOne(m[5], 1e-10) && NearOne(m[10], 1e-10) &&
                 NearOne(m[15], 1e-10) && OffDiagonalBelow(m, 1e-15)
             ? 1
             : 0;
}

int ZvTransfo4::IsScalingAndTranslation() const {
  return NearOne(m[15], 1e-10) && OffDiagonalBelow(m, 1e-15) ? 1 : 0;
}

double ZvTransfo4::GetXYUnitVectorSquaredLength() const {
  const double x = m[0] + m[4], y = m[1] + m[5];
  return x * x + y * y;
}

double ZvTransfo4::GetXYZUnitVectorSquaredLength() const {
  const double x = m[0] + m[4] + m[8], y = m[1] + m[5] + m[9];
  return x * x + y * y;
}

std::ostream& operator<<(std::ostream& os, const ZvTransfo4& t) {
  const double* m = t.GetMatrixPtr();
  for (int row = 0; row < 4; ++row) {
    os << "{" << m[row] << " " << m[row + 4] << " " << m[row + 8] << " " << m[row + 12] << "}"
       << std::endl;
  }
  return os;
}
