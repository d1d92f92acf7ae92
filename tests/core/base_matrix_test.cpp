// CNaxBaseMatrix: the product against the plain loop, part transfers with their range test,
// the shape-swapping Negate, printing, equality and assignment without resizing.
#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "matrix/matrix_test_support.h"
#include "nax/base_matrix.h"

namespace {

template <typename T>
CNaxBaseMatrix<T> Random(int32 rows, int32 cols, std::mt19937& generator) {
  return nax::test::RandomMatrix<T>(rows, cols, generator);
}

// The blocked product adds each element's products in index order, so it equals the plain
// triple loop bit for bit, on shapes that cross every block and tile edge.
template <typename T>
void ExpectProductIsThePlainLoop() {
  std::mt19937 generator(51);
  const int32 shapes[][3] = {{1, 1, 1}, {3, 0, 4},   {5, 3, 9},    {4, 8, 4},   {33, 17, 29},
                             {97, 300, 70}, {130, 257, 9}, {8, 600, 1100}};
  for (const auto& s : shapes) {
    const CNaxBaseMatrix<T> a = Random<T>(s[0], s[1], generator);
    const CNaxBaseMatrix<T> b = Random<T>(s[1], s[2], generator);
    const CNaxBaseMatrix<T> c = a * b;
    ASSERT_EQ(c.RowsNb(), s[0]);
    ASSERT_EQ(c.ColsNb(), s[2]);
    int32 mismatches = 0;
    for (int32 i = 0; i < s[0]; ++i)
      for (int32 j = 0; j < s[2]; ++j) {
        T sum = T(0);
        for (int32 k = 0; k < s[1]; ++k) sum += a(i, k) * b(k, j);
        mismatches += c(i, j) != sum;
      }
    EXPECT_EQ(mismatches, 0) << s[0] << "x" << s[1] << "x" << s[2];
  }
}

TEST(BaseMatrixProduct, EqualsThePlainLoopBitForBit) {
  ExpectProductIsThePlainLoop<double>();
  ExpectProductIsThePlainLoop<float>();
}

TEST(BaseMatrixProduct, ComplexAndVectorProducts) {
  using C = CNaxComplex<double>;
  const C a[4] = {C(1, 1), C(0, 2), C(3, 0), C(1, -1)};
  const CNaxBaseMatrix<C> m(2, 2, a);
  const CNaxBaseMatrix<C> square = m * m;
  // (1+i)(1+i) + 2i * 3 = 2i + 6i
  EXPECT_EQ(square(0, 0).Real(), 0.0);
  EXPECT_EQ(square(0, 0).Imag(), 8.0);
  const double d[6] = {1, 2, 3, 4, 5, 6};
  const CNaxBaseMatrix<double> r(2, 3, d);
  const double x[3] = {1, 0, -1};
  const CNaxBaseVector<double> y = r * CNaxBaseVector<double>(3, x);
  ASSERT_EQ(y.Dim(), 2);
  EXPECT_EQ(y[0], -2.0);
  EXPECT_EQ(y[1], -2.0);
}

TEST(BaseMatrixNegate, SwapsTheShapeAndKeepsTheFlatOrder) {
  const double d[6] = {1, 2, 3, 4, 5, 6};
  const CNaxBaseMatrix<double> m(2, 3, d);
  const CNaxBaseMatrix<double> n = m.Negate();
  EXPECT_EQ(n.RowsNb(), 3);
  EXPECT_EQ(n.ColsNb(), 2);
  for (int32 i = 0; i < 6; ++i) EXPECT_EQ(n[i], -d[i]);
  EXPECT_EQ(m(0, 0), 1.0);
  using C = CNaxComplex<float>;
  const C c[2] = {C(1, 2), C(-3, 0)};
  const CNaxBaseMatrix<C> z = CNaxBaseMatrix<C>(1, 2, c).Negate();
  EXPECT_EQ(z.RowsNb(), 2);
  EXPECT_EQ(z(1, 0).Real(), 3.0f);
  EXPECT_EQ(z(0, 0).Imag(), -2.0f);
}

TEST(BaseMatrixParts, LastColumnIsTestedAgainstTheRowCount) {
  CNaxBaseMatrix<double> wide(2, 5);
  const double source[6] = {1, 2, 3, 4, 5, 6};
  wide.FillPart(0, 0, 1, 2, source, 1);  // 2 is not below rows = 2: refused
  EXPECT_EQ(wide(0, 0), 0.0);
  wide.FillPart(0, 0, 1, 1, source, 1);
  EXPECT_EQ(wide(0, 1), 2.0);
  EXPECT_EQ(wide(1, 0), 3.0);
  wide.FillPart(0, 3, 1, 1, source, 1);  // firstCol > lastCol
  EXPECT_EQ(wide(0, 3), 0.0);
  // Column by column when byRows is 0, and the dump reads the same order.
  CNaxBaseMatrix<double> square(3, 3);
  square.FillPart(1, 0, 2, 1, source, 0);
  EXPECT_EQ(square(1, 0), 1.0);
  EXPECT_EQ(square(2, 0), 2.0);
  EXPECT_EQ(square(1, 1), 3.0);
  double target[4] = {0, 0, 0, 0};
  square.DumpPart(1, 0, 2, 1, target, 0);
  for (int32 i = 0; i < 4; ++i) EXPECT_EQ(target[i], source[i]);
  square.DumpPart(1, 0, 2, 1, target, 1);
  EXPECT_EQ(target[1], 3.0);
  double untouched[2] = {9, 9};
  wide.DumpPart(0, 3, 0, 4, untouched, 1);
  EXPECT_EQ(untouched[0], 9.0);
}

TEST(BaseMatrixParts, RowColumnAndVectorCopies) {
  CNaxBaseMatrix<double> m(3, 4);
  const double row[4] = {1, 2, 3, 4};
  m.SetRow(1, row);
  m.SetColumn(3, row);
  EXPECT_EQ(m(1, 2), 3.0);
  EXPECT_EQ(m(2, 3), 3.0);
  const CNaxBaseVector<double> column = m.ColVector(3);
  EXPECT_EQ(column[1], 2.0);
  CNaxBaseMatrix<double> other(4, 4);
  other.CopyPartRow(0, 1, 3, 1, 0, m);
  EXPECT_EQ(other(0, 3), 3.0);
  other.CopyPartColumn(0, 1, 2, 3, 0, m);  // column first, then row
  EXPECT_EQ(other(1, 0), 1.0);
  EXPECT_EQ(other(2, 0), 2.0);
  other.SetPartColVector(2, 1, 2, 1, column);
  EXPECT_EQ(other(1, 2), 2.0);
  EXPECT_EQ(other(2, 2), 3.0);
  other.SetPartRowVector(3, 0, 2, 0, m.RowVector(1));
  EXPECT_EQ(other(3, 1), 2.0);
  EXPECT_EQ(m.Diagonal().Dim(), 3);
}

TEST(BaseMatrixShape, TraceAndDiagonalOfRectangles) {
  CNaxBaseMatrix<double> m(2, 3);
  m.SetConstant(5.0);
  EXPECT_EQ(m.Trace(), 10.0);
  m.SetDiagonal(2.0);
  EXPECT_EQ(m(0, 2), 0.0);
  EXPECT_EQ(m(1, 1), 2.0);
  EXPECT_EQ(m.Trace(), 4.0);
  EXPECT_EQ(m.IsSquare(), 0);
}

TEST(BaseMatrixAssign, CopiesFlatWithoutResizing) {
  const double d[6] = {1, 2, 3, 4, 5, 6};
  CNaxBaseMatrix<double> target(2, 3);
  target = CNaxBaseMatrix<double>(3, 2, d);
  EXPECT_EQ(target.RowsNb(), 2);
  EXPECT_EQ(target(1, 0), 4.0);
  CNaxBaseMatrix<double> t = CNaxBaseMatrix<double>(2, 3, d).Transpose();
  EXPECT_EQ(t(2, 1), 6.0);
  t *= 2.0;
  t /= 4.0;
  EXPECT_EQ(t(2, 1), 3.0);
}

TEST(BaseMatrixEquality, ToleranceShapeAndComplexDeadZone) {
  CNaxBaseMatrix<double> a(2, 2), b(2, 2);
  b(1, 1) = 1e-9;  // exactly the tolerance: equal
  EXPECT_EQ(a == b, 1);
  b(1, 1) = 3e-9;
  EXPECT_EQ(a == b, 0);
  EXPECT_EQ(a != b, 1);
  EXPECT_EQ(CNaxBaseMatrix<double>(0, 3) == CNaxBaseMatrix<double>(0, 3), 1);
  EXPECT_EQ(CNaxBaseMatrix<double>(0, 3) == CNaxBaseMatrix<double>(3, 0), 0);
  EXPECT_EQ(CNaxBaseMatrix<double>(1, 2) == CNaxBaseMatrix<double>(2, 1), 0);
  using C = CNaxComplex<double>;
  CNaxBaseMatrix<C> x(1, 1), y(1, 1);
  y(0, 0) = C(2e-5, 0);  // inside the dead zone of the safe root
  EXPECT_EQ(x == y, 1);
  y(0, 0) = C(1e-4, 0);
  EXPECT_EQ(x == y, 0);
}

TEST(BaseMatrixPrint, WritesRowsInParenthesesAndABlankLine) {
  const double d[2] = {1, 2};
  testing::internal::CaptureStdout();
  CNaxBaseMatrix<double>(1, 2, d).PrintPartOfMatrix(0, 0, 0, 1);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "( 1 2 )\n\n");
  using C = CNaxComplex<double>;
  const C c[2] = {C(1, 2), C(3, -4)};
  testing::internal::CaptureStdout();
  CNaxBaseMatrix<C>(1, 2, c).PrintPartOfMatrix(0, 0, 0, 1);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "( 1 + 2*i  3 - 4*i  )\n\n");
  testing::internal::CaptureStdout();
  CNaxBaseMatrix<double>(2, 1, d).PrintPartOfMatrix(0, 0, 1, 1);  // lastCol >= cols
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
}

}  // namespace
