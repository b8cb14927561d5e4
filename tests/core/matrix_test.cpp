#include <zv/matrix.h>

#include <gtest/gtest.h>

#include <climits>
#include <new>
#include <sstream>

namespace {

// Fills m row by row from a list.
void Fill(ZvMatrix& m, const double* values) {
  for (int r = m.rowLow; r <= m.rowHigh; ++r) {
    for (int c = m.colLow; c <= m.colHigh; ++c)
      m[r][c] = *values++;
  }
}

// a x = b solved in place; 1 when the residual of the original system is within tolerance.
int SolveAndCheck(ZvMatrix& a, ZvMatrix& b, double tolerance) {
  const ZvMatrix a0(a), b0(b);
  if (!ZvMatrix_GaussJordanElim(a, b)) return 0;
  ZvMatrix ax(1, a.rowHigh, 1, b.colHigh), inverseCheck(1, a.rowHigh, 1, a.rowHigh);
  ZvMatrix_Multiply(a0, b, ax);
  ZvMatrix_Multiply(a0, a, inverseCheck);
  return ZvMatrix_AreAlmostEqual(ax, b0, tolerance) && inverseCheck.IsIdentity(tolerance);
}

}  // namespace

TEST(MatrixStorage, CallerChosenRanges) {
  ZvMatrix z(1, 3, 1, 3);
  EXPECT_EQ(z.IsIdentity(0.5), 0);  // all zero: the diagonal is off by 1
  EXPECT_EQ(z.IsIdentity(1.0), 1);
  // Negative and shifted bounds: every element is its own cell, and copies are deep.
  ZvMatrix m(-2, 0, 5, 7);
  for (int r = -2; r <= 0; ++r) {
    for (int c = 5; c <= 7; ++c)
      m[r][c] = 10 * r + c;
  }
  ZvMatrix copy(m);
  m[-1][6] = 99;
  for (int r = -2; r <= 0; ++r) {
    for (int c = 5; c <= 7; ++c)
      EXPECT_EQ(copy[r][c], 10 * r + c);
  }
  // The diagonal follows the low bounds, for non-square matrices too.
  ZvMatrix shifted(0, 1, 5, 7);
  shifted[0][5] = shifted[1][6] = 1;
  shifted[1][7] = 1e-3;
  EXPECT_EQ(shifted.IsIdentity(1e-4), 0);
  EXPECT_EQ(shifted.IsIdentity(1e-3), 1);  // a difference equal to the tolerance passes
  // A size no block can hold fails as an allocation does, before anything is allocated.
  EXPECT_THROW(ZvMatrix(INT_MIN, INT_MAX, INT_MIN, INT_MAX), std::bad_alloc);
  // Vectors hold high - low + 2 zeroed elements indexed from the block start.
  ZvVectorLong l(1, 4);
  for (int i = 0; i <= 4; ++i)
    EXPECT_EQ(l[i], 0);
}

TEST(MatrixAlgebra, MultiplyAndCompare) {
  ZvMatrix a(1, 2, 0, 2), b(0, 2, 1, 2), out(1, 2, 1, 2), wide(0, 3, 0, 3);
  const double av[] = {1, 2, 3, 4, 5, 6}, bv[] = {7, 8, 9, 10, 11, 12},
               product[] = {58, 64, 139, 154};
  Fill(a, av);
  Fill(b, bv);
  ZvMatrix expected(1, 2, 1, 2);
  Fill(expected, product);
  ASSERT_EQ(ZvMatrix_Multiply(a, b, out), 1);
  EXPECT_EQ(ZvMatrix_AreAlmostEqual(out, expected, 0), 1);
  expected[2][2] += 0.5;
  EXPECT_EQ(ZvMatrix_AreAlmostEqual(out, expected, 0.4), 0);
  // A larger result matrix takes only the product's cells.
  wide[0][0] = 5;
  ASSERT_EQ(ZvMatrix_Multiply(a, b, wide), 1);
  EXPECT_TRUE(wide[2][2] == 154 && wide[0][0] == 5);
  // Ranges that do not hold what the product reads or writes are refused.
  ZvMatrix small(1, 1, 1, 2);
  EXPECT_EQ(ZvMatrix_Multiply(a, b, small), 0);
  EXPECT_EQ(small[1][1], 0);
  // Empty ranges: no rows is done at once, no inner columns gives zero.
  ZvMatrix noRows(0, -1, 0, 0), noCols(1, 2, 0, -1), noInner(0, -1, 1, 2);
  EXPECT_EQ(ZvMatrix_Multiply(noRows, a, out), 1);
  EXPECT_EQ(ZvMatrix_AreAlmostEqual(noRows, a, 0), 1);
  ASSERT_EQ(ZvMatrix_Multiply(noCols, noInner, out), 1);
  EXPECT_TRUE(out[1][1] == 0 && out[2][2] == 0);
}

TEST(MatrixGaussJordan, KnownSystems) {
  // A zero leading element forces pivoting; the solution is (1, -2, 3), with a second
  // right-hand side solved alongside.
  const double av[] = {0, 2, 1, 4, -1, 3, 2, 5, -2}, bv[] = {-1, 1, 15, 2, -14, 3};
  ZvMatrix a(1, 3, 1, 3), b(1, 3, 1, 2);
  Fill(a, av);
  Fill(b, bv);
  ASSERT_EQ(SolveAndCheck(a, b, 1e-13), 1);
  for (int r = 1; r <= 3; ++r)
    EXPECT_NEAR(b[r][1], r % 2 ? r : -r, 1e-14);
  // 6 x 6 Hilbert: full pivoting keeps the residual small despite the conditioning.
  ZvMatrix h(1, 6, 1, 6), hb(1, 6, 1, 1);
  for (int r = 1; r <= 6; ++r) {
    for (int c = 1; c <= 6; ++c)
      h[r][c] = 1.0 / (r + c - 1);
    hb[r][1] = r;
  }
  EXPECT_EQ(SolveAndCheck(h, hb, 1e-6), 1);
  // The identity is left as it is, and so is b.
  ZvMatrix id(1, 3, 1, 3), ib(1, 3, 1, 1);
  for (int i = 1; i <= 3; ++i)
    id[i][i] = 1, ib[i][1] = 2 * i;
  ASSERT_EQ(ZvMatrix_GaussJordanElim(id, ib), 1);
  EXPECT_TRUE(id.IsIdentity(0) && ib[1][1] == 2 && ib[3][1] == 6);
  // A 0-based matrix holds 1..n too; its row and column 0 are not touched.
  ZvMatrix z(0, 2, 0, 2), zb(0, 2, 0, 1);
  z[0][0] = 42, z[1][1] = 2, z[2][2] = 4, zb[1][1] = zb[2][1] = 1;
  ASSERT_EQ(ZvMatrix_GaussJordanElim(z, zb), 1);
  EXPECT_TRUE(zb[1][1] == 0.5 && zb[2][1] == 0.25 && z[0][0] == 42);
}

TEST(MatrixGaussJordan, SingularSystems) {
  ZvMatrix zeroRow(1, 2, 1, 2), b(1, 2, 1, 1);
  zeroRow[1][1] = 3, zeroRow[1][2] = 4;
  EXPECT_EQ(ZvMatrix_GaussJordanElim(zeroRow, b), 0);
  const double dependent[] = {1, 2, 3, 4, 5, 6, 5, 7, 9};  // row 3 = row 1 + row 2
  ZvMatrix rank2(1, 3, 1, 3), b3(1, 3, 1, 1);
  Fill(rank2, dependent);
  EXPECT_EQ(ZvMatrix_GaussJordanElim(rank2, b3), 0);
  // Pivots within 1e-9 of zero count as singular.
  ZvMatrix tiny(1, 2, 1, 2), tiny2(1, 2, 1, 2);
  tiny[1][1] = tiny2[1][1] = 1;
  tiny[2][2] = 1e-9;
  tiny2[2][2] = 2e-9;
  EXPECT_EQ(ZvMatrix_GaussJordanElim(tiny, b), 0);
  EXPECT_EQ(ZvMatrix_GaussJordanElim(tiny2, b), 1);
  // Ranges without the 1-based indices are refused untouched.
  ZvMatrix noRow1(2, 3, 1, 3), shortB(1, 1, 1, 1);
  noRow1[2][2] = 7;
  EXPECT_TRUE(ZvMatrix_GaussJordanElim(noRow1, b3) == 0 && noRow1[2][2] == 7);
  EXPECT_EQ(ZvMatrix_GaussJordanElim(tiny2, shortB), 0);
}

TEST(MatrixPrint, ExactText) {
  ZvMatrix m(1, 2, 0, 1);
  const double v[] = {1, -2, 3.5, 0};
  Fill(m, v);
  std::ostringstream os;
  os << m << ZvVectorLong(1, 3) << ZvVectorDouble(-1, 4);
  EXPECT_EQ(os.str(),
            "Matrix [1..2][0..1]\n1 -2 \n3.5 0 \n\nlong vector [1..3]\nzvFloat64 vector [-1..4]\n");
}
