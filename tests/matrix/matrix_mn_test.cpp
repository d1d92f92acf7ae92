// CNaxMatrixMN: norms, shape tests, extraction, QR, inverses by size and the pseudo-inverse.
#include <gtest/gtest.h>

#include "matrix/matrix_test_support.h"

namespace {

using nax::test::Identity;
using nax::test::MaxDifference;
using nax::test::OrthogonalityError;
using nax::test::RandomMatrix;

TEST(MatrixMNNorm, ValuesAndSentinels) {
  const double d[6] = {1, -2, 3, -4, 5, -6};
  CNaxMatrixMN<double> a(2, 3, d);
  EXPECT_EQ(a.Norm(naxMatrixNormOne), 9.0);
  EXPECT_EQ(a.Norm(naxMatrixNormInfinity), 15.0);
  EXPECT_DOUBLE_EQ(a.Norm(naxMatrixNormFrobenius), std::sqrt(91.0));
  EXPECT_DOUBLE_EQ(a.Norm(static_cast<naxMatrixNorm>(7)), std::sqrt(91.0));
  EXPECT_DOUBLE_EQ(a.Norm(naxMatrixNormMaxElement), 6.0 * std::sqrt(6.0));
  const double e[4] = {1, 3, -2, 0};
  EXPECT_DOUBLE_EQ(CNaxMatrixMN<double>(2, 2, e).Norm(naxMatrixNormMaxElement), 6.0);
  // Spectral: the largest singular value, here of a diagonal matrix.
  const double diag[4] = {-7, 0, 0, 2};
  EXPECT_DOUBLE_EQ(CNaxMatrixMN<double>(2, 2, diag).Norm(naxMatrixNormSpectral), 7.0);
  CNaxMatrixMN<double> noCols(3, 0), noRows(0, 3);
  EXPECT_EQ(noCols.Norm(naxMatrixNormOne), -1.0);
  EXPECT_EQ(noRows.Norm(naxMatrixNormInfinity), -1.0);
  EXPECT_EQ(noRows.Norm(naxMatrixNormMaxElement), 0.0);
}

TEST(MatrixMNNorm, FrobeniusFloorIsCoarse) {
  const double tiny = 9e-4;  // square 8.1e-7, below the floor 1e-6
  EXPECT_EQ(CNaxMatrixMN<double>(1, 1, &tiny).Norm(naxMatrixNormFrobenius), 0.0);
  const float tinyF = 9e-4f;
  EXPECT_EQ(CNaxMatrixMN<float>(1, 1, &tinyF).Norm(naxMatrixNormFrobenius), 0.0f);
  const double small = 1.1e-3;
  EXPECT_DOUBLE_EQ(CNaxMatrixMN<double>(1, 1, &small).Norm(naxMatrixNormFrobenius), 1.1e-3);
}

TEST(MatrixMNShape, TestsWithTheirFixedLiterals) {
  const double lower[6] = {1, 0, 0, 2, 3, 0};
  CNaxMatrixMN<double> l(2, 3, lower);
  EXPECT_EQ(l.IsLLTriangular(0.0), 1);
  EXPECT_EQ(l.IsURTriangular(0.0), 0);
  EXPECT_EQ(l.IsDiagonal(2.0), 1);
  EXPECT_EQ(l.IsAlmostZero(2.9), 0);
  EXPECT_EQ(l.IsAlmostZero(3.0), 1);
  // IsBidiagonal compares with 1e-6 whatever tol is, and refuses wide matrices.
  const double bi[6] = {1, 2, 5e-7, 3, 0, 0};
  CNaxMatrixMN<double> tall(3, 2, bi);
  EXPECT_EQ(tall.IsBidiagonal(0.0), 1);
  tall(1, 0) = 2e-6;
  EXPECT_EQ(tall.IsBidiagonal(1.0), 0);
  EXPECT_EQ(Identity(2).ExtractMatrix(0, 0, 1, 0).IsBidiagonal(1.0), 1);
  EXPECT_EQ(CNaxMatrixMN<double>(2, 3).IsBidiagonal(1.0), 0);
}

TEST(MatrixMNShape, AnnulationAndTransposition) {
  CNaxMatrixMN<double> a(3, 3);
  a.SetConstant(2.0);
  a(1, 1) = 1e-3;
  a.AnnulateSmallElements(1e-3);  // exactly tol stays
  EXPECT_EQ(a(1, 1), 1e-3);
  a.AnnulateSmallElements(2e-3);
  EXPECT_EQ(a(1, 1), 0.0);
  a.AnnulateRelativelyDiagonal(0);
  EXPECT_EQ(a.IsLLTriangular(0.0), 1);
  CNaxMatrixMN<double> p = Identity(4);
  p.SetElementTransposition(1, 3);
  EXPECT_EQ(p(1, 3), 1.0);
  EXPECT_EQ(p(3, 1), 1.0);
  EXPECT_EQ(p(1, 1), 0.0);
  EXPECT_LT(OrthogonalityError(p), 1e-15);
}

TEST(MatrixMNParts, ExtractInsertAndCompare) {
  std::mt19937 generator(21);
  const CNaxMatrixMN<double> a = RandomMatrix<double>(5, 6, generator);
  const CNaxMatrixMN<double> part = a.ExtractMatrix(1, 2, 3, 4);
  EXPECT_EQ(naxIsMatrixEqualPartOfMatrix(part, a, 1, 2, 3, 4, 0.0), 1);
  EXPECT_EQ(naxIsMatrixEqualPartOfMatrix(part, a, 1, 2, 3, 5, 1e9), 0);
  CNaxMatrixMN<double> b(5, 6);
  b.InsertMatrix(part, 2, 0, 4, 2);
  EXPECT_EQ(naxArePartsMatricesEqual(a, 1, 2, 3, 4, b, 2, 0, 4, 2, 0.0), 1);
  // Rectangles of different widths differ whatever their contents.
  EXPECT_EQ(naxArePartsMatricesEqual(a, 0, 0, 1, 1, a, 0, 0, 1, 2, 1e9), 0);
  EXPECT_EQ(naxAreAlmostEqual(a, a.ExtractLeftCornerMatrix(5, 6), 0.0), 1);
  EXPECT_EQ(naxAreAlmostEqual(a, a.ExtractLeftCornerMatrix(5, 5), 1e9), 0);
  CNaxMatrixMN<double> shifted(a);
  shifted(4, 5) += 0.5;
  EXPECT_EQ(naxAreAlmostEqual(a, shifted, 0.5), 1);
  EXPECT_EQ(naxAreAlmostEqual(a, shifted, 0.49), 0);
}

TEST(MatrixMNStatistics, MeanInnerProductCorrelation) {
  const double d[4] = {1, 2, 3, 6};
  const CNaxMatrixMN<double> a(2, 2, d);
  EXPECT_DOUBLE_EQ(a.Mean(), 3.0);
  EXPECT_DOUBLE_EQ(a.InnerProduct(a), 50.0);
  EXPECT_DOUBLE_EQ(a.CorrelationCoefficient(a), 1.0);
  CNaxMatrixMN<double> b(a * -3.0);
  EXPECT_DOUBLE_EQ(a.CorrelationCoefficient(b), -1.0);
}

TEST(MatrixMNQr, FactorsMultiplyBack) {
  std::mt19937 generator(22);
  const int32 shapes[][2] = {{1, 1}, {3, 3}, {5, 2}, {6, 6}, {9, 4}, {20, 20}, {30, 7}};
  for (const auto& s : shapes) {
    const CNaxMatrixMN<double> a = RandomMatrix<double>(s[0], s[1], generator);
    CNaxMatrixMN<double> q(s[0], s[0]), r(s[0], s[1]);
    ASSERT_EQ(a.QR_Decomposition(q, r, 1e-12), 0);
    EXPECT_EQ(r.IsURTriangular(0.0), 1);
    EXPECT_LT(OrthogonalityError(q), 1e-12);
    EXPECT_LT(MaxDifference(CNaxMatrixMN<double>(q * r), a), 1e-12) << s[0] << "x" << s[1];
  }
  // Rank-deficient: a zero column is skipped and the product still holds.
  CNaxMatrixMN<double> a = RandomMatrix<double>(5, 4, generator);
  for (int32 i = 0; i < 5; ++i) a(i, 1) = 0.0;
  CNaxMatrixMN<double> q(5, 5), r(5, 4);
  ASSERT_EQ(a.QR_Decomposition(q, r, 1e-12), 0);
  EXPECT_LT(MaxDifference(CNaxMatrixMN<double>(q * r), a), 1e-12);
  // The diagonal of r takes the sign of the column: (3, 4) gives +5, not -5.
  const double d[4] = {3, 1, 4, 2};
  CNaxMatrixMN<double> b(2, 2, d), q2(2), r2(2);
  ASSERT_EQ(b.QR_Decomposition(q2, r2, 1e-12), 0);
  EXPECT_DOUBLE_EQ(r2(0, 0), 5.0);
}

TEST(MatrixMNQr, WideShapeIsRefusedUntouched) {
  CNaxMatrixMN<double> a(2, 3), q(2, 2), r(2, 3);
  q.SetConstant(7.0);
  r.SetConstant(8.0);
  EXPECT_EQ(a.QR_Decomposition(q, r, 1e-9), 6);
  EXPECT_EQ(q(1, 1), 7.0);
  EXPECT_EQ(r(1, 2), 8.0);
}

// Sizes 2 and 3 invert in closed form, 4 through CNaxMatrix4: A A^-1 = I, the condition is
// the product of the norms, a singular matrix gives 3, the pseudo-infinity and no change.
TEST(MatrixMNInverse, ClosedFormsAndTheFourByFourRouteInvert) {
  std::mt19937 generator(23);
  for (int32 n : {2, 3, 4}) {
    for (int32 trial = 0; trial < 10; ++trial) {
      CNaxMatrixMN<double> a = RandomMatrix<double>(n, n, generator), inverse(n);
      for (int32 i = 0; i < n; ++i) a(i, i) += 3.0;
      ASSERT_EQ(a.Inverse(inverse, 1e-9), 0);
      EXPECT_LT(MaxDifference(CNaxMatrixMN<double>(a * inverse), Identity(n)), 1e-12);
      double condition = 0.0;
      for (naxMatrixNorm norm : {naxMatrixNormOne, naxMatrixNormInfinity}) {
        ASSERT_EQ(a.Inverse(inverse, norm, 1e-9, condition), 0);
        EXPECT_DOUBLE_EQ(condition, a.Norm(norm) * inverse.Norm(norm));
      }
    }
    CNaxMatrixMN<double> singular(n, n), untouched(n);
    singular(0, 1) = 1.0;
    untouched.SetConstant(4.0);
    double condition = 0.0;
    EXPECT_EQ(singular.Inverse(untouched, 1e-9), 3);
    EXPECT_EQ(singular.Inverse(untouched, naxMatrixNormOne, 1e-9, condition), 3);
    EXPECT_EQ(untouched(n - 1, n - 1), 4.0);
    EXPECT_EQ(condition, 3.4028234663852886e38);
  }
}

// Size 1 answers 1 untouched; from 5 on the singular value branch yields zero for a regular
// matrix and the spectral condition number.
TEST(MatrixMNInverse, SizeOneRefusesAndTheSingularValueBranchYieldsZero) {
  const double x = 5.0;
  CNaxMatrixMN<double> one(1, 1, &x), result1(1, 1, &x);
  EXPECT_EQ(one.Inverse(result1, 1e-9), 1);
  EXPECT_EQ(result1(0, 0), 5.0);
  CNaxMatrixMN<double> a = Identity(6), result(6);
  result.SetConstant(3.0);
  EXPECT_EQ(a.Inverse(result, 1e-9), 0);
  EXPECT_EQ(result.IsAlmostZero(0.0), 1);
  double condition = 0.0;
  EXPECT_EQ(a.Inverse(result, naxMatrixNormSpectral, 1e-9, condition), 0);
  EXPECT_EQ(condition, 1.0);
  CNaxMatrixMN<double> singular(6);
  singular.SetDiagonal(2.0);
  singular(5, 5) = 0.0;
  EXPECT_EQ(singular.Inverse(result, 1e-9), 3);
  EXPECT_EQ(singular.Inverse(result, naxMatrixNormOne, 1e-9, condition), 3);
  EXPECT_EQ(condition, 3.4028234663852886e38);
}

TEST(MatrixMNPseudoInverse, SolvesLeastSquaresForThreeColumns) {
  std::mt19937 generator(24);
  const CNaxMatrixMN<double> a = RandomMatrix<double>(8, 3, generator);
  CNaxMatrixMN<double> copy(a), pseudo(3, 8);
  double condition = 0.0;
  ASSERT_EQ(copy.PseudoInverse(pseudo, naxMatrixNormOne, condition), 0);
  EXPECT_LT(MaxDifference(CNaxMatrixMN<double>(pseudo * a), Identity(3)), 1e-10);
  EXPECT_GT(condition, 1.0);
  // The residual of the least-squares solution is orthogonal to the columns.
  CNaxVectorN<double> rhs(8), solution(3);
  for (int32 i = 0; i < 8; ++i) rhs[i] = std::sin(double(i));
  ASSERT_EQ(copy.PseudoSolveSystem(rhs, solution, naxMatrixNormOne, condition), 0);
  const CNaxBaseVector<double> fitted = a * solution;
  for (int32 c = 0; c < 3; ++c) {
    double dot = 0.0;
    for (int32 i = 0; i < 8; ++i) dot += a(i, c) * (rhs[i] - fitted[i]);
    EXPECT_NEAR(dot, 0.0, 1e-10);
  }
  // A wide matrix makes A^T A singular; result stays as it was.
  CNaxMatrixMN<double> wide = RandomMatrix<double>(2, 3, generator), untouched(3, 2);
  untouched.SetConstant(1.5);
  EXPECT_EQ(wide.PseudoInverse(untouched, naxMatrixNormOne, condition), 3);
  EXPECT_EQ(untouched(0, 0), 1.5);
}

TEST(MatrixMNCache, AssignmentCarriesOrClearsIt) {
  std::mt19937 generator(25);
  CNaxMatrixMN<double> a = RandomMatrix<double>(4, 4, generator), u(4), v(4);
  CNaxVectorN<double> w(4);
  ASSERT_EQ(a.SV_Decomposition(u, v, w, 1e-9), 0);
  a.SetRank(3);
  CNaxMatrixMN<double> b(4);
  b = a;
  EXPECT_EQ(b.IsSingCalculated(), 1);
  EXPECT_EQ(b.GetRank(), 3);
  b = static_cast<const CNaxBaseMatrix<double>&>(a);
  EXPECT_EQ(b.IsSingCalculated(), 0);
  double untouched[4] = {-1, -1, -1, -1};
  b.GetSingularNumbers(untouched);
  EXPECT_EQ(untouched[0], -1.0);
}

}  // namespace
