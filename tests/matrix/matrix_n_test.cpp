// CNaxMatrixN: LU, determinant, inverses, systems, conditioning, polar and spectral
// decompositions and the Jacobi eigensolver.
#include <gtest/gtest.h>

#include "matrix/matrix_test_support.h"

namespace {

using nax::test::Identity;
using nax::test::MaxDifference;
using nax::test::OrthogonalityError;
using nax::test::RandomDominant;
using nax::test::RandomMatrix;
using nax::test::RandomSymmetric;

constexpr double kPseudoInfinity = 3.4028234663852886e38;

CNaxMatrixN<double> Diagonal(std::initializer_list<double> values) {
  CNaxMatrixN<double> m(static_cast<int32>(values.size()));
  int32 i = 0;
  for (double v : values) m(i, i) = v, ++i;
  return m;
}

// The 5 x 5 permutation that exchanges the first two rows: regular, yet LU refuses it.
CNaxMatrixN<double> SwapFirstRows() {
  CNaxMatrixN<double> p = Identity(5);
  p.SetElementTransposition(0, 1);
  return p;
}

TEST(MatrixNLu, FactorsMultiplyBack) {
  std::mt19937 generator(31);
  for (int32 n : {1, 2, 3, 5, 8, 13, 40}) {
    const CNaxMatrixN<double> a = RandomDominant<double>(n, generator);
    CNaxMatrixN<double> lower(n), upper(n);
    ASSERT_EQ(a.LU_Decomposition(lower, upper, 1e-9), 1);
    EXPECT_EQ(lower.IsLLTriangular(0.0), 1);
    EXPECT_EQ(upper.IsURTriangular(0.0), 1);
    for (int32 i = 0; i < n; ++i) EXPECT_EQ(lower(i, i), 1.0);
    EXPECT_LT(MaxDifference(CNaxMatrixN<double>(lower * upper), a), 1e-12 * n);
  }
}

TEST(MatrixNLu, NoPivotingRefusesARegularPermutation) {
  CNaxMatrixN<double> lower(5), upper(5);
  lower.SetConstant(3.0);
  EXPECT_EQ(SwapFirstRows().LU_Decomposition(lower, upper, 1e-9), 0);
  EXPECT_EQ(lower.IsAlmostZero(0.0), 1);
  EXPECT_EQ(upper.IsAlmostZero(0.0), 1);
  // A pivot of exactly tol passes; the test is strict.
  CNaxMatrixN<double> lower2(2), upper2(2);
  EXPECT_EQ(Diagonal({1e-3, 1.0}).LU_Decomposition(lower2, upper2, 1e-3), 1);
}

// det(A B) = det(A) det(B), det(A^T) = det(A), and a triangular matrix gives the product of
// its diagonal, with either sign.
TEST(MatrixNDet, IsMultiplicativeAndExactOnTriangles) {
  std::mt19937 generator(32);
  for (int32 n : {2, 4, 6, 9}) {
    CNaxMatrixN<double> a = RandomDominant<double>(n, generator), b = RandomDominant<double>(n, generator);
    a(0, 0) = -a(0, 0);
    const double product = a.Det() * b.Det();
    EXPECT_NEAR(CNaxMatrixN<double>(a * b).Det(), product, 1e-10 * std::fabs(product));
    EXPECT_NEAR(CNaxMatrixN<double>(a.Transpose()).Det(), a.Det(), 1e-10 * std::fabs(a.Det()));
    a.AnnulateRelativelyDiagonal(1);
    double diagonal = 1.0;
    for (int32 i = 0; i < n; ++i) diagonal *= a(i, i);
    EXPECT_NEAR(a.Det(), diagonal, 1e-12 * std::fabs(diagonal));
  }
}

TEST(MatrixNDet, ExchangeMatrixFallsToQrAndReportsPlusOne) {
  const double d[4] = {0, 1, 1, 0};
  CNaxMatrixN<double> exchange(2, d);
  EXPECT_DOUBLE_EQ(exchange.Det(), 1.0);
}

TEST(MatrixNDet, SignLostAfterSingularValueDecomposition) {
  CNaxMatrixN<double> a = Diagonal({-1, 2, 3, 4, 5});
  EXPECT_DOUBLE_EQ(a.Det(), -120.0);
  CNaxMatrixMN<double> u(5), v(5);
  CNaxVectorN<double> w(5);
  ASSERT_EQ(a.SV_Decomposition(u, v, w, 1e-9), 0);
  EXPECT_DOUBLE_EQ(a.Det(), 120.0);
}

TEST(MatrixNDet, CharacteristicMatrixOfAnEigenvalueIsSingular) {
  const CNaxMatrixN<double> a = Diagonal({2, 3, 7});
  EXPECT_NEAR(a.GetCharacteristicsMatrix(3.0).Det(), 0.0, 1e-12);
  CNaxMatrixN<double> half = Diagonal({2, 0.5});
  EXPECT_EQ(half.IsSingular(1.0), 1);  // a determinant of exactly tol is singular
  EXPECT_EQ(half.IsSingular(0.99), 0);
}

// Sizes 2 to 4 go through the fixed classes, larger ones through LU: A A^-1 = I, the
// condition is the product of the norms, the solve recovers x; a singular matrix gives 3 and
// leaves the result as it was. Size 1 answers 1.
TEST(MatrixNInverse, InvertsAndSolvesAtEverySize) {
  CNaxMatrixN<double> one(1), result(1);
  one(0, 0) = 4.0;
  result(0, 0) = 9.0;
  EXPECT_EQ(one.Inverse(result, 1e-9), 1);
  EXPECT_EQ(result(0, 0), 9.0);
  std::mt19937 generator(33);
  for (int32 n : {2, 3, 4, 5, 7, 12, 30}) {
    CNaxMatrixN<double> a = RandomDominant<double>(n, generator), inverse(n);
    ASSERT_EQ(a.Inverse(inverse, 1e-9), 0);
    EXPECT_LT(MaxDifference(CNaxMatrixN<double>(a * inverse), Identity(n)), 1e-12);
    double condition = 0.0;
    ASSERT_EQ(a.Inverse(inverse, naxMatrixNormInfinity, 1e-9, condition), 0);
    EXPECT_NEAR(condition, a.Norm(naxMatrixNormInfinity) * inverse.Norm(naxMatrixNormInfinity), 1e-12 * condition);
    EXPECT_DOUBLE_EQ(a.ConditionNumber(naxMatrixNormInfinity), condition);
    CNaxVectorN<double> x(n), solution(n);
    for (int32 i = 0; i < n; ++i) x[i] = i - 4.0;
    ASSERT_EQ(a.SolveSystem(CNaxVectorN<double>(a * x), solution, 1e-9), 0);
    for (int32 i = 0; i < n; ++i) EXPECT_NEAR(solution[i], x[i], 1e-11);
    ASSERT_EQ(a.SolveSystem(CNaxVectorN<double>(a * x), solution, naxMatrixNormOne, 1e-9, condition), 0);
    EXPECT_GT(condition, 1.0);
    if (n > 4) continue;
    CNaxMatrixN<double> singular(n), untouched(n);
    CNaxVectorN<double> unsolved(n, 7.0);
    untouched.SetConstant(2.0);
    EXPECT_EQ(singular.Inverse(untouched, 1e-9), 3);
    EXPECT_EQ(singular.SolveSystem(CNaxVectorN<double>(n, 1.0), unsolved, 1e-9), 3);
    EXPECT_EQ(untouched(0, 0), 2.0);
    EXPECT_EQ(unsolved[0], 7.0);
    EXPECT_EQ(singular.Inverse(untouched, naxMatrixNormOne, 1e-9, condition), 3);
    EXPECT_EQ(condition, kPseudoInfinity);
  }
}

TEST(MatrixNInverse, SingularAndRefusedCases) {
  CNaxMatrixN<double> small = Diagonal({1e-3, 1e-3, 1e-3, 1e-3, 1e-3}), result(5);
  result.SetConstant(2.0);
  EXPECT_EQ(small.Inverse(result, 1e-9), 3);  // LU passes, det 1e-15 < tol
  EXPECT_EQ(result(0, 0), 2.0);
  double condition = 0.0;
  EXPECT_EQ(small.Inverse(result, naxMatrixNormOne, 1e-9, condition), 1);  // floor 1e-6
  EXPECT_EQ(condition, kPseudoInfinity);
  // LU refuses the permutation; the rectangular route answers with its zero result.
  CNaxMatrixN<double> p = SwapFirstRows();
  result.SetConstant(2.0);
  EXPECT_EQ(p.Inverse(result, 1e-9), 0);
  EXPECT_EQ(result.IsAlmostZero(0.0), 1);
}

TEST(MatrixNCondition, SpectralRatioAndSingularSentinel) {
  CNaxMatrixN<double> d = Diagonal({1, -2, 4, 8, 0.5});
  EXPECT_DOUBLE_EQ(d.ConditionNumber(naxMatrixNormSpectral), 16.0);
  CNaxMatrixN<double> singular = Diagonal({1, 2, 0, 3, 4});
  EXPECT_EQ(singular.ConditionNumber(naxMatrixNormSpectral), kPseudoInfinity);
  EXPECT_EQ(singular.ConditionNumber(naxMatrixNormOne), kPseudoInfinity);
  CNaxMatrixN<float> singularF(5);
  EXPECT_EQ(singularF.ConditionNumber(naxMatrixNormFrobenius), 3.4028234663852886e38f);
}

TEST(MatrixNTriangular, InversesAndTheirRefusals) {
  std::mt19937 generator(35);
  CNaxMatrixN<double> l = RandomDominant<double>(7, generator);
  CNaxMatrixN<double> u(l);
  l.AnnulateRelativelyDiagonal(0);
  u.AnnulateRelativelyDiagonal(1);
  CNaxMatrixN<double> li(7), ui(7);
  ASSERT_EQ(l.LowLeftInverse(li, 1e-9), 1);
  ASSERT_EQ(u.UpperRightInverse(ui, 1e-9), 1);
  EXPECT_LT(MaxDifference(CNaxMatrixN<double>(l * li), Identity(7)), 1e-14);
  EXPECT_LT(MaxDifference(CNaxMatrixN<double>(u * ui), Identity(7)), 1e-14);
  EXPECT_EQ(l.UpperRightInverse(ui, 1e-9), 0);
  // The shape test uses the fixed 1e-6, whatever tol is.
  l(0, 3) = 2e-6;
  EXPECT_EQ(l.LowLeftInverse(li, 1.0e-30), 0);
  l(0, 3) = 5e-7;
  EXPECT_EQ(l.LowLeftInverse(li, 1.0e-30), 1);
  CNaxMatrixN<double> d = Diagonal({2, 4, 0.5}), di(3);
  ASSERT_EQ(d.DiagInverse(di, 1e-9), 1);
  EXPECT_EQ(di(1, 1), 0.25);
  EXPECT_EQ(d.DiagInverse(di, 5.0), 0);  // |det| = 4 is below tol
  d(0, 1) = 0.1;
  EXPECT_EQ(d.DiagInverse(di, 0.05), 0);
}

TEST(MatrixNPreconditioner, ExactForTriangularAndDiagonal) {
  std::mt19937 generator(36);
  CNaxMatrixN<double> l = RandomDominant<double>(6, generator), result(6);
  l.AnnulateRelativelyDiagonal(0);
  ASSERT_EQ(l.InvPreconditioner(result, 1e-9), 1);
  EXPECT_LT(MaxDifference(CNaxMatrixN<double>(l * result), Identity(6)), 1e-13);
  CNaxMatrixN<double> d = Diagonal({2, 5, 0.25});
  CNaxMatrixN<double> dr(3);
  ASSERT_EQ(d.InvPreconditioner(dr, 1e-9), 1);
  EXPECT_DOUBLE_EQ(dr(2, 2), 4.0);
  d(1, 1) = 5e-7;
  EXPECT_EQ(d.InvPreconditioner(dr, 1e-12), 0);
}

TEST(MatrixNPolar, BothSidesRecompose) {
  std::mt19937 generator(37);
  // A = Q S with Q orthogonal and S near the identity, so that Newton settles within size rounds.
  const CNaxMatrixMN<double> random = RandomMatrix<double>(6, 6, generator);
  CNaxMatrixMN<double> q(6), r(6);
  ASSERT_EQ(random.QR_Decomposition(q, r, 1e-12), 0);
  CNaxMatrixN<double> s = RandomSymmetric<double>(6, generator) * 0.1;
  s.Add(Identity(6));
  CNaxMatrixN<double> a(q * s);
  for (int32 right : {1, 0}) {
    CNaxMatrixN<double> rotation(6), stretch(6);
    ASSERT_EQ(a.PolarDecomposition(rotation, stretch, right, 1e-10), 1);
    EXPECT_LT(OrthogonalityError(rotation), 1e-9);
    EXPECT_EQ(stretch.IsSymmetric(0.0), 1);
    const CNaxMatrixN<double> back(right ? rotation * stretch : stretch * rotation);
    EXPECT_LT(MaxDifference(back, a), 1e-9);
  }
  CNaxMatrixN<double> diag = Diagonal({1, 2, 3, 4, 5}), rotation(5), stretch(5);
  ASSERT_EQ(diag.PolarDecomposition(rotation, stretch, 1, 1e-9), 1);
  EXPECT_EQ(rotation.IsUnit(0.0), 1);
  CNaxMatrixN<double> singular = Diagonal({1, 0, 3, 4, 5});
  EXPECT_EQ(singular.PolarDecomposition(rotation, stretch, 1, 1e-9), 0);
}

TEST(MatrixNEigen, SymmetricEigensolveSatisfiesAvEqualsLambdaV) {
  std::mt19937 generator(38);
  for (int32 n : {1, 2, 3, 6, 10, 25}) {
    CNaxMatrixN<double> a = RandomSymmetric<double>(n, generator), vectors(n);
    CNaxVectorN<double> values(n);
    ASSERT_EQ(a.SymmetricEigensolve(values, vectors, 1e-12), naxStatusOk) << n;
    EXPECT_LT(OrthogonalityError(vectors), 1e-10);
    for (int32 k = 0; k < n; ++k) {
      if (k + 1 < n) {
        EXPECT_LE(values[k], values[k + 1]);
      }
      for (int32 i = 0; i < n; ++i) {
        double av = 0.0;
        for (int32 j = 0; j < n; ++j) av += a(i, j) * vectors(j, k);
        EXPECT_NEAR(av, values[k] * vectors(i, k), 1e-9);
      }
    }
  }
}

TEST(MatrixNEigen, AsymmetryAboveTolIsRefused) {
  CNaxMatrixN<double> a = Identity(3);
  a(0, 2) = 1.0;
  a(2, 0) = 1.0 + 1e-10;
  CNaxMatrixN<double> vectors(3);
  CNaxVectorN<double> values(3);
  EXPECT_EQ(a.SymmetricEigensolve(values, vectors, 1e-11), naxStatusNotSymmetric);
  EXPECT_EQ(a.SymmetricEigensolve(values, vectors, 1e-9), naxStatusOk);
}

// Fifty disjoint 2 x 2 blocks need exactly fifty rotations, which the rotation-count test
// reports as too many; forty-nine blocks pass.
TEST(MatrixNEigen, RotationCountOfExactlyFiftyIsReportedAsFailure) {
  for (int32 blocks : {50, 49}) {
    CNaxMatrixN<double> a(2 * blocks), vectors(2 * blocks);
    for (int32 b = 0; b < blocks; ++b) {
      a(2 * b, 2 * b) = 1.0;
      a(2 * b + 1, 2 * b + 1) = 2.0 + b;
      a(2 * b, 2 * b + 1) = a(2 * b + 1, 2 * b) = 0.5;
    }
    CNaxVectorN<double> values(2 * blocks);
    EXPECT_EQ(a.SymmetricEigensolve(values, vectors, 1e-9),
              blocks == 50 ? naxStatusTooManyRotations : naxStatusOk);
  }
}

TEST(MatrixNEigen, IdentityWithZeroTolRunsAllSweepsWithoutRotating) {
  CNaxMatrixN<float> a(4), vectors(4);
  a.Unit();
  CNaxVectorN<float> values(4);
  EXPECT_EQ(a.SymmetricEigensolve(values, vectors, 0.0f), naxStatusOk);
  // Equal eigenvalues may be exchanged by the sort, so the vectors are a permutation.
  EXPECT_EQ(vectors.IsOrthogonal(0.0f), 1);
  for (int32 i = 0; i < 4; ++i) EXPECT_EQ(values[i], 1.0f);
}

TEST(MatrixNEigen, SpectralDecompositionOfAPositiveMatrix) {
  std::mt19937 generator(39);
  const CNaxMatrixMN<double> b = RandomMatrix<double>(6, 6, generator);
  CNaxMatrixN<double> a(b * b.Transpose());
  for (int32 i = 0; i < 6; ++i) a(i, i) += 1.0;
  EXPECT_EQ(a.IsPositive(1e-9), 1);
  for (int32 sorted : {0, 1}) {
    CNaxMatrixN<double> vectors(6), values(6);
    ASSERT_EQ(a.SpectralDecomposition(vectors, values, sorted, 1e-12), 1);
    EXPECT_EQ(values.IsDiagonal(0.0), 1);
    const CNaxMatrixN<double> back(CNaxMatrixN<double>(vectors * values) * vectors.Transpose());
    EXPECT_LT(MaxDifference(back, a), 1e-9);
    if (sorted) {
      for (int32 i = 0; i + 1 < 6; ++i) EXPECT_LE(values(i, i), values(i + 1, i + 1));
    }
  }
  CNaxMatrixN<double> indefinite = Diagonal({1, -1, 2}), vectors(3), values(3);
  EXPECT_EQ(indefinite.IsPositive(1e-9), 0);
  EXPECT_EQ(indefinite.SpectralDecomposition(vectors, values, 1, 1e-9), 0);
}

TEST(MatrixNAlgebra, PowersProductsAndOrthogonality) {
  std::mt19937 generator(40);
  const CNaxMatrixN<double> a = RandomDominant<double>(4, generator);
  const CNaxMatrixN<double> cube(CNaxMatrixN<double>(a * a) * a);
  EXPECT_EQ(MaxDifference(a ^ 3, cube), 0.0);
  EXPECT_EQ((a ^ 0).IsUnit(0.0), 1);
  CNaxMatrixN<double> b(a);
  b ^= 2;
  CNaxMatrixN<double> c(a);
  c.PostMultiply(a);
  EXPECT_EQ(MaxDifference(b, c), 0.0);
  CNaxMatrixN<double> pre = Identity(4) * 2.0;
  pre.PreMultiply(a);
  EXPECT_EQ(MaxDifference(pre, CNaxMatrixN<double>(a * 2.0)), 0.0);
  const double r[4] = {0.6, -0.8, 0.8, 0.6};
  EXPECT_EQ(CNaxMatrixN<double>(2, r).IsOrthogonal(1e-12), 1);
  EXPECT_EQ(a.IsOrthogonal(1e-3), 0);
  EXPECT_EQ(naxAreAlmostEqual(a, CNaxMatrixN<double>(a), 0.0), 1);
  EXPECT_EQ(naxAreAlmostEqual(a, Identity(3), 1e9), 0);
}

}  // namespace
