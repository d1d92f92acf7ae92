// The 2 x 2 matrix: eigenvalues and eigenvectors, the closed-form
// polar decomposition, and the factor 3 of its max-element norm.
#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "matrix/matrix_test_support.h"

namespace {

using nax::test::Eps;
using nax::test::RandomFixed;

template <typename T>
class Matrix2Test : public ::testing::Test {};
TYPED_TEST_SUITE(Matrix2Test, nax::test::RealTypes);

template <typename T>
CNaxMatrix2<T> Identity() {
  return nax::test::FixedIdentity<CNaxMatrix2<T>>();
}

TYPED_TEST(Matrix2Test, NormsRankAndTheFactorThree) {
  using T = TypeParam;
  const CNaxMatrix2<T> m(1, -3, 2, 2);
  EXPECT_EQ(m.Norm(naxMatrixNormMaxElement), T(9));  // 3 times 3, not 2 times 3
  EXPECT_EQ(m.Norm(naxMatrixNormOne), T(5));
  EXPECT_EQ(m.Norm(naxMatrixNormInfinity), T(4));
  EXPECT_NEAR(m.Norm(naxMatrixNormFrobenius), std::sqrt(T(18)), Eps<T>() * 10);
  EXPECT_NEAR(CNaxMatrix2<T>(3, 0, 0, -4).Norm(naxMatrixNormSpectral), T(4), Eps<T>() * 10);
  EXPECT_EQ(m.CalculateRank(Eps<T>()), 2);
  EXPECT_EQ(CNaxMatrix2<T>(1, 2, 2, 4).CalculateRank(Eps<T>()), 1);
  EXPECT_EQ(CNaxMatrix2<T>().CalculateRank(Eps<T>()), 0);
  EXPECT_EQ(CNaxMatrix2<T>(2, 1, 1, 2).IsPositive(Eps<T>()), 1);
  EXPECT_EQ(CNaxMatrix2<T>(1, 2, 2, 1).IsPositive(Eps<T>()), 0);
}

TYPED_TEST(Matrix2Test, EigenvaluesAndVectors) {
  using T = TypeParam;
  const T tol = std::is_same_v<T, float> ? T(1e-5) : T(1e-9);
  std::mt19937 rng(2);
  for (int k = 0; k < 200; ++k) {
    const CNaxMatrix2<T> m = RandomFixed<CNaxMatrix2<T>>(rng, T(-2), T(2));
    T l1, l2;
    const int32 kind = m.FindEigenvalues(l1, l2, tol);
    if (kind == 2) {
      EXPECT_LT(l1, l2);
      for (T l : {l1, l2}) {
        T v[4];
        ASSERT_EQ(m.FindEigenvectorsReal(l, v, T(1e-4)), 1);
        const CNaxVector2<T> e(v);
        EXPECT_NEAR((m * e - e * l).Length() / e.Length(), T(0), T(1e-3));
      }
    } else if (kind == 0) {
      CNaxBaseVector<CNaxComplex<T>> cv(2);
      const CNaxComplex<T> lambda(l1, l2);
      m.FindEigenvectorComplex(lambda, cv, tol);
      for (int r = 0; r < 2; ++r) {
        const CNaxComplex<T> s = cv[0] * m(r, 0) + cv[1] * m(r, 1) - cv[r] * lambda;
        EXPECT_LT(std::hypot(s.Real(), s.Imag()), T(1e-3));
      }
    }
  }
  // The identity: a double eigenvalue with two eigenvectors.
  T l1, l2, v[4];
  EXPECT_EQ(Identity<T>().FindEigenvalues(l1, l2, tol), 1);
  EXPECT_EQ(l1, T(1));
  EXPECT_EQ(l2, T(1));
  EXPECT_EQ(Identity<T>().FindEigenvectorsReal(T(1), v, tol), 2);
  // A Jordan block: a double eigenvalue with one eigenvector (1, 0).
  EXPECT_EQ(CNaxMatrix2<T>(2, 1, 0, 2).FindEigenvectorsReal(T(2), v, tol), 1);
  EXPECT_EQ(v[0], T(1));
  EXPECT_EQ(v[1], T(0));
  // Roots within tol of nought become exactly 0.
  EXPECT_EQ(CNaxMatrix2<T>(1, 1, 1, 1).FindEigenvalues(l1, l2, T(1e-3)), 2);
  EXPECT_EQ(l1, T(0));
}

TYPED_TEST(Matrix2Test, ClosedFormPolarDecomposition) {
  using T = TypeParam;
  std::mt19937 rng(3);
  for (int k = 0; k < 100; ++k) {
    const CNaxMatrix2<T> m = RandomFixed<CNaxMatrix2<T>>(rng, T(-2), T(2));
    if (std::fabs(m.Det()) < T(0.05)) continue;
    for (int right = 0; right < 2; ++right) {
      CNaxMatrix2<T> r, s;
      ASSERT_EQ(m.PolarDecomposition(r, s, right, Eps<T>()), 1);
      EXPECT_EQ(r.IsOrthogonal(Eps<T>() * 100), 1);
      EXPECT_NEAR(r.Det(), m.Det() > 0 ? T(1) : T(-1), Eps<T>() * 100);
      EXPECT_EQ(s.IsSymmetric(T(0)), 1);
      EXPECT_EQ(naxAreAlmostEqual(right ? r * s : s * r, m, Eps<T>() * 1000), 1);
    }
  }
  // diag(1, -1): sign -1, the rotation diag(1, -1) and the identity as stretch.
  CNaxMatrix2<T> r, s;
  ASSERT_EQ(CNaxMatrix2<T>(1, 0, 0, -1).PolarDecomposition(r, s, 1, Eps<T>()), 1);
  EXPECT_EQ(r, CNaxMatrix2<T>(1, 0, 0, -1));
  EXPECT_EQ(s, Identity<T>());
  CNaxMatrix2<T> untouched(9, 9, 9, 9);
  EXPECT_EQ(CNaxMatrix2<T>(1, 2, 2, 4).PolarDecomposition(untouched, s, 1, Eps<T>()), 0);
  EXPECT_EQ(untouched(0, 0), T(9));
}

TYPED_TEST(Matrix2Test, ConversionsAndEquality) {
  using T = TypeParam;
  const CNaxMatrix3<T> m3(1, 2, 3, 4, 5, 6, 7, 8, 9);
  EXPECT_EQ(naxMatrix3To2(m3), CNaxMatrix2<T>(1, 2, 4, 5));
  EXPECT_EQ(naxMatrix2To3(CNaxMatrix2<T>(1, 2, 4, 5)), CNaxMatrix3<T>(1, 2, 0, 4, 5, 0, 0, 0, 1));
  EXPECT_EQ(naxMatrix4To3(naxMatrix3To4(m3)), m3);
  EXPECT_EQ(naxMatrix3To4(m3)(3, 3), T(1));
  EXPECT_EQ(naxMatrix3To4(m3)(2, 3), T(0));
  // A difference of exactly tol counts as equal.
  EXPECT_EQ(naxAreAlmostEqual(CNaxMatrix2<T>(1, 2, 3, 4), CNaxMatrix2<T>(1, 2, 3, T(4.5)), T(0.5)), 1);
  EXPECT_EQ(naxAreAlmostEqual(CNaxMatrix2<T>(1, 2, 3, 4), CNaxMatrix2<T>(1, 2, 3, T(4.5)), T(0.25)), 0);
}

}  // namespace
