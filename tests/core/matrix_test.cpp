#include <zv/matrix.h>

#include <gtest/gtest.h>

#include <cmath>
#include <sstream>

namespace {

// Fills rows rLow.. and columns cLow.. of m from a row-major list.
void Fill(ZvMatrix& m, const double* values) {
  for (int r = m.rowLow; r <= m.rowHigh; ++r) {
    for (int c = m.colLow; c <= m.colHigh; ++c)
      m[r][c] = *values++;
  }
}

}  // namespace

TEST(MatrixStorage, CallerChosenRanges) {
  ZvMatrix z(1, 3, 1, 3);
  for (int r = 1; r <= 3; ++r) {
    for (int c = 1; c <= 3; ++c)
      EXPECT_EQ(z[r][c], 0.0);
  }
  EXPECT_EQ(z.IsIdentity(0.5), 0);
  // Negative and shifted bounds: every element is its own cell.
  ZvMatrix m(-2, 0, 5, 7);
  for (int r = -2; r <= 0; ++r) {
    for (int c = 5; c <= 7; ++c)
      m[r][c] = 10 * r + c;
  }
  for (int r = -2; r <= 0; ++r) {
    for (int c = 5; c <= 7; ++c)
      EXPECT_EQ(m[r][c], 10 * r + c);
  }
  ZvMatrix copy(m);
  EXPECT_EQ(copy.rowLow, -2);
  EXPECT_EQ(copy.colHigh, 7);
  m[-1][6] = 99;
  EXPECT_EQ(copy[-1][6], -4);
  EXPECT_EQ(copy[0][7], 7);
  // Empty ranges are legal objects.
  ZvMatrix empty(0, -1, 0, 0);
  ZvMatrix copyOfEmpty(empty);
  EXPECT_EQ(copyOfEmpty.rowHigh, -1);
}

TEST(MatrixStorage, VectorsIndexFromTheBlockStart) {
  ZvVectorLong l(1, 4);
  ZvVectorDouble d(0, 2);
  // high - low + 2 zeroed elements from index 0.
  for (int i = 0; i <= 4; ++i) {
    EXPECT_EQ(l[i], 0);
    l[i] = i;
  }
  for (int i = 0; i <= 3; ++i)
    EXPECT_EQ(d[i], 0.0);
  EXPECT_EQ(l[4], 4);
  EXPECT_EQ(l.low, 1);
  EXPECT_EQ(d.high, 2);
}

TEST(MatrixAlgebra, MultiplyAcrossIndexBases) {
  ZvMatrix a(1, 2, 0, 2);  // 2 x 3, columns 0-based
  ZvMatrix b(0, 2, 1, 2);  // 3 x 2, rows 0-based to match
  const double av[] = {1, 2, 3, 4, 5, 6};
  const double bv[] = {7, 8, 9, 10, 11, 12};
  Fill(a, av);
  Fill(b, bv);
  ZvMatrix out(1, 2, 1, 2);
  ASSERT_EQ(ZvMatrix_Multiply(a, b, out), 1);
  EXPECT_EQ(out[1][1], 58);
  EXPECT_EQ(out[1][2], 64);
  EXPECT_EQ(out[2][1], 139);
  EXPECT_EQ(out[2][2], 154);
  // A larger result matrix is fine; only the product's cells are written.
  ZvMatrix wide(0, 3, 0, 3);
  wide[0][0] = 5;
  ASSERT_EQ(ZvMatrix_Multiply(a, b, wide), 1);
  EXPECT_EQ(wide[2][2], 154);
  EXPECT_EQ(wide[0][0], 5);
  // Ranges that do not meet are refused without writing.
  ZvMatrix small(1, 1, 1, 2);
  EXPECT_EQ(ZvMatrix_Multiply(a, b, small), 0);
  EXPECT_EQ(small[1][1], 0);
  EXPECT_EQ(ZvMatrix_Multiply(b, b, out), 0);
}

TEST(MatrixAlgebra, EmptyRanges) {
  ZvMatrix noRows(0, -1, 0, 0), any(0, 5, 0, 5), out(0, 1, 0, 1);
  EXPECT_EQ(ZvMatrix_Multiply(noRows, any, out), 1);
  EXPECT_EQ(ZvMatrix_AreAlmostEqual(noRows, any, 0), 1);
  // No inner columns: the product is zero.
  ZvMatrix noCols(0, 1, 0, -1), b(0, -1, 0, 1);
  out[0][0] = out[1][1] = 3;
  ASSERT_EQ(ZvMatrix_Multiply(noCols, b, out), 1);
  EXPECT_EQ(out.IsIdentity(0), 0);
  EXPECT_EQ(out[0][0], 0);
  EXPECT_EQ(out[1][1], 0);
}

TEST(MatrixAlgebra, ComparisonTolerances) {
  ZvMatrix a(1, 2, 1, 2), b(1, 2, 1, 2);
  a[1][1] = a[2][2] = 1;
  b[1][1] = 1;
  b[2][2] = 1.25;
  EXPECT_EQ(ZvMatrix_AreAlmostEqual(a, b, 0.25), 1);  // equal to the tolerance passes
  EXPECT_EQ(ZvMatrix_AreAlmostEqual(a, b, 0.2), 0);
  EXPECT_EQ(a.IsIdentity(0), 1);
  EXPECT_EQ(b.IsIdentity(0.25), 1);
  EXPECT_EQ(b.IsIdentity(0.2), 0);
  // The diagonal follows the low bounds: here (0, 5), (1, 6) and (2, 7).
  ZvMatrix shifted(0, 2, 5, 8);
  shifted[0][5] = shifted[1][6] = shifted[2][7] = 1;
  EXPECT_EQ(shifted.IsIdentity(1e-12), 1);
  shifted[2][8] = 1e-3;
  EXPECT_EQ(shifted.IsIdentity(1e-12), 0);
  EXPECT_EQ(shifted.IsIdentity(1e-3), 1);
}

TEST(MatrixGaussJordan, SolvesAndInverts) {
  // Leading zero forces a pivot search; the solution is (1, -2, 3).
  const double av[] = {0, 2, 1, 4, -1, 3, 2, 5, -2};
  ZvMatrix a(1, 3, 1, 3), b(1, 3, 1, 2);
  Fill(a, av);
  const ZvMatrix original(a);
  const double x[3] = {1, -2, 3};
  for (int r = 1; r <= 3; ++r) {
    b[r][1] = av[3 * (r - 1)] * x[0] + av[3 * (r - 1) + 1] * x[1] + av[3 * (r - 1) + 2] * x[2];
    b[r][2] = r;  // a second right-hand side
  }
  const ZvMatrix rhs(b);
  ASSERT_EQ(ZvMatrix_GaussJordanElim(a, b), 1);
  for (int r = 1; r <= 3; ++r)
    EXPECT_NEAR(b[r][1], x[r - 1], 1e-13);
  // a now holds the inverse; both products are the identity and the second column solves too.
  ZvMatrix product(1, 3, 1, 3), residual(1, 3, 1, 2);
  ZvMatrix_Multiply(original, a, product);
  EXPECT_EQ(product.IsIdentity(1e-13), 1);
  ZvMatrix_Multiply(a, original, product);
  EXPECT_EQ(product.IsIdentity(1e-13), 1);
  ZvMatrix_Multiply(original, b, residual);
  EXPECT_EQ(ZvMatrix_AreAlmostEqual(residual, rhs, 1e-13), 1);
}

TEST(MatrixGaussJordan, IllConditionedResidual) {
  // A 6 x 6 Hilbert matrix: full pivoting keeps the residual small despite the conditioning.
  const int n = 6;
  ZvMatrix a(1, n, 1, n), b(1, n, 1, 1);
  for (int r = 1; r <= n; ++r) {
    for (int c = 1; c <= n; ++c)
      a[r][c] = 1.0 / (r + c - 1);
    b[r][1] = r;
  }
  const ZvMatrix original(a), rhs(b);
  ASSERT_EQ(ZvMatrix_GaussJordanElim(a, b), 1);
  ZvMatrix residual(1, n, 1, 1);
  ZvMatrix_Multiply(original, b, residual);
  EXPECT_EQ(ZvMatrix_AreAlmostEqual(residual, rhs, 1e-7), 1);
}

TEST(MatrixGaussJordan, IdentityAndSingularSystems) {
  ZvMatrix id(1, 3, 1, 3), b(1, 3, 1, 1);
  for (int i = 1; i <= 3; ++i) {
    id[i][i] = 1;
    b[i][1] = 2 * i;
  }
  const ZvMatrix rhs(b);
  ASSERT_EQ(ZvMatrix_GaussJordanElim(id, b), 1);
  EXPECT_EQ(id.IsIdentity(0), 1);
  EXPECT_EQ(ZvMatrix_AreAlmostEqual(b, rhs, 0), 1);

  ZvMatrix zeroRow(1, 2, 1, 2), b2(1, 2, 1, 1);
  zeroRow[1][1] = 3;
  zeroRow[1][2] = 4;
  EXPECT_EQ(ZvMatrix_GaussJordanElim(zeroRow, b2), 0);
  // Rank two: the third row is the sum of the others.
  const double dep[] = {1, 2, 3, 4, 5, 6, 5, 7, 9};
  ZvMatrix singular(1, 3, 1, 3), b3(1, 3, 1, 1);
  Fill(singular, dep);
  EXPECT_EQ(ZvMatrix_GaussJordanElim(singular, b3), 0);
  // Pivots within 1e-9 of zero count as singular.
  ZvMatrix tiny(1, 2, 1, 2), b4(1, 2, 1, 1);
  tiny[1][1] = 1;
  tiny[2][2] = 1e-9;
  EXPECT_EQ(ZvMatrix_GaussJordanElim(tiny, b4), 0);
  tiny[1][1] = 1;
  tiny[1][2] = tiny[2][1] = 0;
  tiny[2][2] = 2e-9;
  EXPECT_EQ(ZvMatrix_GaussJordanElim(tiny, b4), 1);
  EXPECT_NEAR(tiny[2][2], 5e8, 1e-3);
}

TEST(MatrixGaussJordan, RangesMustHoldOneBasedIndices) {
  ZvMatrix a(2, 3, 1, 3), b(1, 3, 1, 1);  // row 1 missing
  a[2][2] = 7;
  EXPECT_EQ(ZvMatrix_GaussJordanElim(a, b), 0);
  EXPECT_EQ(a[2][2], 7);
  ZvMatrix a2(1, 2, 1, 2), shortB(1, 1, 1, 1);
  a2[1][1] = a2[2][2] = 1;
  EXPECT_EQ(ZvMatrix_GaussJordanElim(a2, shortB), 0);
  // A 0-based matrix holds 1..n as well; its row and column 0 are left alone.
  ZvMatrix zeroBased(0, 2, 0, 2), b0(0, 2, 0, 1);
  zeroBased[0][0] = 42;
  zeroBased[1][1] = 2;
  zeroBased[2][2] = 4;
  b0[1][1] = 1;
  b0[2][1] = 1;
  ASSERT_EQ(ZvMatrix_GaussJordanElim(zeroBased, b0), 1);
  EXPECT_EQ(b0[1][1], 0.5);
  EXPECT_EQ(b0[2][1], 0.25);
  EXPECT_EQ(zeroBased[0][0], 42);
}

TEST(MatrixPrint, ExactText) {
  ZvMatrix m(1, 2, 0, 1);
  const double v[] = {1, -2, 3.5, 0};
  Fill(m, v);
  std::ostringstream os;
  os << m;
  EXPECT_EQ(os.str(), "Matrix [1..2][0..1]\n1 -2 \n3.5 0 \n\n");
  std::ostringstream vs;
  vs << ZvVectorLong(1, 3) << ZvVectorDouble(-1, 4);
  EXPECT_EQ(vs.str(), "long vector [1..3]\nzvFloat64 vector [-1..4]\n");
}
