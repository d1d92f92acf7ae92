// Closed-form solvers: roots satisfy their equations in the stated order, systems are
// solved, the singular descents pick the documented member, and the counting functions.
#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "matrix/matrix_test_support.h"
#include "nax/algebra.h"
#include "nax/matrix3.h"

namespace {

template <typename T>
class AlgebraTest : public ::testing::Test {};
TYPED_TEST_SUITE(AlgebraTest, nax::test::RealTypes);

template <typename T>
T Tol() {
  return std::is_same_v<T, float> ? T(1e-7f) : T(1e-9);
}
template <typename T>
T Loose() {
  return std::is_same_v<T, float> ? T(2e-3) : T(1e-8);
}

// Solve3x3System on a row-major array of coefficients and a right side.
template <typename T>
int32 Solve3(const T (&m)[9], const T (&r)[3], T& x, T& y, T& z) {
  int32 quality;
  return CNaxAlgebra::Solve3x3System(m[0], m[1], m[2], m[3], m[4], m[5], m[6], m[7], m[8], r[0], r[1], r[2], x, y,
                                     z, quality, Tol<T>());
}

TYPED_TEST(AlgebraTest, ReducedQuadraticRootsAndOrder) {
  using T = TypeParam;
  std::mt19937 rng(1);
  std::uniform_real_distribution<T> u(-5, 5);
  for (int k = 0; k < 200; ++k) {
    const T p = u(rng), q = u(rng);
    T x1, x2;
    const int32 kind = CNaxAlgebra::SolveReducedQuadratic(p, q, x1, x2, Tol<T>());
    if (kind == 2) {
      EXPECT_LT(x1, x2);
      EXPECT_NEAR(x1 * x1 + p * x1 + q, T(0), Loose<T>() * 10);
      EXPECT_NEAR(x2 * x2 + p * x2 + q, T(0), Loose<T>() * 10);
    } else if (kind == 0) {
      CNaxComplex<T> c1, c2;
      EXPECT_EQ(CNaxAlgebra::SolveReducedQuadratic(p, q, c1, c2, Tol<T>()), 0);
      EXPECT_EQ(c1.Real(), x1);
      EXPECT_EQ(c1.Imag(), x2);
      EXPECT_EQ(c2.Imag(), -x2);
      const CNaxComplex<T> r = c1 * c1 + c1 * p + CNaxComplex<T>(q);
      EXPECT_NEAR(r.Real(), T(0), Loose<T>() * 10);
      EXPECT_NEAR(r.Imag(), T(0), Loose<T>() * 10);
    }
  }
}

TYPED_TEST(AlgebraTest, QuadraticDegenerateCases) {
  using T = TypeParam;
  T x1 = 5, x2 = 5;
  EXPECT_EQ(CNaxAlgebra::SolveReducedQuadratic(T(0), T(0), x1, x2, Tol<T>()), 1);
  EXPECT_EQ(x1, T(0));
  EXPECT_EQ(x2, T(0));
  // Discriminant exactly at the tolerance: both tests are strict, so a double root.
  EXPECT_EQ(CNaxAlgebra::SolveReducedQuadratic(T(2), T(0.75), x1, x2, T(0.25)), 1);
  EXPECT_EQ(x1, T(-1));
  EXPECT_EQ(x2, T(-1));
  x1 = x2 = 5;
  EXPECT_EQ(CNaxAlgebra::SolveQuadratic(T(0), T(0), T(0), x1, x2, Tol<T>()), -2);
  EXPECT_EQ(x1, T(0));
  x1 = x2 = 5;
  EXPECT_EQ(CNaxAlgebra::SolveQuadratic(T(0), T(0), T(1), x1, x2, Tol<T>()), -1);
  EXPECT_EQ(x2, T(0));
  EXPECT_EQ(CNaxAlgebra::SolveQuadratic(T(0), T(2), T(-3), x1, x2, Tol<T>()), 1);
  EXPECT_EQ(x1, T(1.5));
  EXPECT_EQ(x2, T(1.5));
  // The general form uses the fixed band 1e-6 around a nil discriminant, not the tolerance:
  // D = 1e-7 is a double root even with a tiny tolerance.
  EXPECT_EQ(CNaxAlgebra::SolveQuadratic(T(1), T(0), T(-1e-7), x1, x2, T(1e-12)), 1);
  EXPECT_EQ(CNaxAlgebra::SolveReducedQuadratic(T(0), T(-1e-3), x1, x2, T(1e-12)), 2);
  EXPECT_EQ(CNaxAlgebra::SolveQuadratic(T(2), T(-2), T(-4), x1, x2, Tol<T>()), 2);
  EXPECT_NEAR(x1, T(-1), Loose<T>());
  EXPECT_NEAR(x2, T(2), Loose<T>());
  CNaxComplex<T> c1, c2;
  EXPECT_EQ(CNaxAlgebra::SolveQuadratic(T(1), T(0), T(4), c1, c2, Tol<T>()), 0);
  EXPECT_NEAR(c1.Imag(), T(2), Loose<T>());
  EXPECT_NEAR(c2.Imag(), T(-2), Loose<T>());
}

TYPED_TEST(AlgebraTest, ReducedCubicKindsAndOrder) {
  using T = TypeParam;
  // Three real roots from the trigonometric branch, in its unsorted order.
  T x1, x2, x3;
  // (x - 1)(x - 2)(x + 3) = x^3 - 7x + 6
  EXPECT_EQ(CNaxAlgebra::SolveReducedCubic(T(0), T(-7), T(6), x1, x2, x3, Tol<T>()), 3);
  for (T r : {x1, x2, x3}) EXPECT_NEAR(r * r * r - 7 * r + 6, T(0), Loose<T>() * 100);
  EXPECT_NEAR(x1, T(-3), Loose<T>() * 10);  // v cos(theta) with v < 0 leads
  // (x - 1)^3: Q = R = 0, A = B = 0, second branch with result 2.
  EXPECT_EQ(CNaxAlgebra::SolveReducedCubic(T(-3), T(3), T(-1), x1, x2, x3, Tol<T>()), 2);
  EXPECT_NEAR(x1, T(1), Loose<T>());
  EXPECT_NEAR(x2, T(1), Loose<T>());
  EXPECT_EQ(x2, x3);
  // (x - 1)^2 (x + 2) = x^3 - 3x + 2: Q^3 = R^2 = 1 exactly, the double root lands in x2, x3.
  EXPECT_EQ(CNaxAlgebra::SolveReducedCubic(T(0), T(-3), T(2), x1, x2, x3, Tol<T>()), 2);
  EXPECT_NEAR(x1, T(-2), Loose<T>());
  EXPECT_NEAR(x2, T(1), Loose<T>());
  EXPECT_EQ(x2, x3);
  // (x - 2)(x^2 + 2x + 5): one real root and -1 +- 2i.
  EXPECT_EQ(CNaxAlgebra::SolveReducedCubic(T(0), T(1), T(-10), x1, x2, x3, Tol<T>()), 1);
  EXPECT_NEAR(x1, T(2), Loose<T>() * 10);
  EXPECT_NEAR(x2, T(-1), Loose<T>() * 10);
  EXPECT_NEAR(x3, T(2), Loose<T>() * 10);
  CNaxComplex<T> c1, c2, c3;
  EXPECT_EQ(CNaxAlgebra::SolveReducedCubic(T(0), T(1), T(-10), c1, c2, c3, Tol<T>()), 1);
  EXPECT_GT(c2.Imag(), T(0));
  EXPECT_EQ(c3.Imag(), -c2.Imag());
  EXPECT_EQ(c3.Real(), c2.Real());
}

TYPED_TEST(AlgebraTest, RandomCubicsSatisfyTheirEquation) {
  using T = TypeParam;
  std::mt19937 rng(7);
  std::uniform_real_distribution<T> u(-3, 3);
  for (int k = 0; k < 300; ++k) {
    const T a = u(rng), b = u(rng), c = u(rng);
    CNaxComplex<T> roots[3];
    const int32 kind = CNaxAlgebra::SolveReducedCubic(a, b, c, roots[0], roots[1], roots[2], Tol<T>());
    ASSERT_GE(kind, 1);
    for (const CNaxComplex<T>& r : roots) {
      const CNaxComplex<T> v = r * r * r + r * r * a + r * b + CNaxComplex<T>(c);
      EXPECT_LT(std::hypot(v.Real(), v.Imag()), Loose<T>() * 1000) << a << " " << b << " " << c;
    }
  }
}

TYPED_TEST(AlgebraTest, TwoByTwoSystems) {
  using T = TypeParam;
  T x, y;
  int32 quality = 0;
  EXPECT_EQ(CNaxAlgebra::Solve2x2System(T(2), T(1), T(1), T(3), T(5), T(10), x, y, quality, Tol<T>()), 1);
  EXPECT_NEAR(x, T(1), Loose<T>());
  EXPECT_NEAR(y, T(3), Loose<T>());
  EXPECT_EQ(quality, 1);
  // Ill conditioned: the measure (sum of squares / |D|) times the tolerance exceeds 1.
  EXPECT_EQ(CNaxAlgebra::Solve2x2System(T(10), T(10), T(10), T(10.01), T(20), T(20), x, y, quality, T(0.01)), 1);
  EXPECT_EQ(quality, 2);
  // Inconsistent.
  EXPECT_EQ(CNaxAlgebra::Solve2x2System(T(1), T(2), T(2), T(4), T(1), T(3), x, y, quality, Tol<T>()), -1);
  EXPECT_EQ(x, T(0));
  EXPECT_EQ(quality, 1);
  // Singular and consistent with |a| above tolerance: y = 1, x = (e - b) / a.
  EXPECT_EQ(CNaxAlgebra::Solve2x2System(T(1), T(2), T(2), T(4), T(3), T(6), x, y, quality, Tol<T>()), -2);
  EXPECT_EQ(y, T(1));
  EXPECT_EQ(x, T(1));
  // Only b non-zero: the numerator deliberately repeats (e - b).
  EXPECT_EQ(CNaxAlgebra::Solve2x2System(T(0), T(2), T(0), T(0), T(6), T(0), x, y, quality, Tol<T>()), -2);
  EXPECT_EQ(x, T(1));
  EXPECT_EQ(y, T(2));
  EXPECT_EQ(CNaxAlgebra::Solve2x2System(T(0), T(0), T(0), T(0), T(0), T(0), x, y, quality, Tol<T>()), -2);
  EXPECT_EQ(x, T(1));
  EXPECT_EQ(y, T(1));
}

TYPED_TEST(AlgebraTest, ThreeByThreeRegularSystems) {
  using T = TypeParam;
  std::mt19937 rng(3);
  std::uniform_real_distribution<T> u(-1, 1);
  for (int k = 0; k < 200; ++k) {
    T m[9], s[3], r[3], x, y, z;
    for (T& v : m) v = u(rng);
    for (T& v : s) v = u(rng);
    for (int i = 0; i < 3; ++i) r[i] = m[3 * i] * s[0] + m[3 * i + 1] * s[1] + m[3 * i + 2] * s[2];
    ASSERT_EQ(Solve3(m, r, x, y, z), 1);
    if (std::fabs(CNaxMatrix3<T>(m).Det()) < T(0.05)) continue;
    EXPECT_NEAR(x, s[0], Loose<T>() * 20);
    EXPECT_NEAR(y, s[1], Loose<T>() * 20);
    EXPECT_NEAR(z, s[2], Loose<T>() * 20);
  }
}

TYPED_TEST(AlgebraTest, ThreeByThreeRankDescent) {
  using T = TypeParam;
  T x, y, z;
  // All coefficients nought: (1, 1, 1) and -2 whatever the right side.
  EXPECT_EQ(Solve3<T>({0, 0, 0, 0, 0, 0, 0, 0, 0}, {4, 5, 6}, x, y, z), -2);
  EXPECT_EQ(CNaxVector3<T>(x, y, z), CNaxVector3<T>(1, 1, 1));
  // Inconsistent: rows 1 and 2 equal, different right sides.
  EXPECT_EQ(Solve3<T>({1, 2, 3, 1, 2, 3, 0, 1, 1}, {1, 2, 0}, x, y, z), -1);
  EXPECT_EQ(x, T(0));
  // Rank two, consistent: rows 1, 2 independent, row 3 their sum.
  const T m[9] = {1, 2, 3, 0, 1, 4, 1, 3, 7};
  const T r[3] = {6, 5, 11};
  EXPECT_EQ(Solve3(m, r, x, y, z), -2);
  for (int i = 0; i < 3; ++i) EXPECT_NEAR(m[3 * i] * x + m[3 * i + 1] * y + m[3 * i + 2] * z, r[i], Loose<T>());
  // The minors of rows (1, 2): xy = 1, xz = 4, yz = 5; yz wins, so x is set to 1.
  EXPECT_EQ(x, T(1));
  // Rank one: the largest coefficient of the first non-zero row is solved for.
  EXPECT_EQ(Solve3<T>({1, 4, 2, 2, 8, 4, 0, 0, 0}, {9, 18, 0}, x, y, z), -2);
  EXPECT_EQ(x, T(1));
  EXPECT_EQ(z, T(1));
  EXPECT_NEAR(y, T(1.5), Loose<T>());
  // Ties in the rank-one step: x wins against y and z.
  EXPECT_EQ(Solve3<T>({0, 0, 0, 2, 2, 2, 0, 0, 0}, {0, 6, 0}, x, y, z), -2);
  EXPECT_EQ(CNaxVector3<T>(x, y, z), CNaxVector3<T>(1, 1, 1));
}

TYPED_TEST(AlgebraTest, ConjugateGradientSolvesSymmetricAndGeneralSystems) {
  using T = TypeParam;
  const int n = 6;
  std::mt19937 rng(12);
  std::uniform_real_distribution<T> u(-1, 1);
  // A diagonally dominant general matrix and the positive G^T G + I.
  CNaxMatrixN<T> general = nax::test::RandomDominant<T>(n, rng);
  CNaxMatrixN<T> spd(CNaxMatrixN<T>(general.Transpose() * general));
  for (int i = 0; i < n; ++i) spd(i, i) += T(1);
  CNaxVectorN<T> solution(n);
  for (int i = 0; i < n; ++i) solution[i] = u(rng);
  for (const CNaxMatrixN<T>* m : {&spd, &general}) {
    const CNaxVectorN<T> rhs(*m * solution);
    CNaxVectorN<T> x(n);
    ASSERT_EQ(CNaxAlgebra::SolveByCongugateGradient(*m, rhs, x, Loose<T>(), T(0)), 1);
    for (int i = 0; i < n; ++i) EXPECT_NEAR(x[i], solution[i], Loose<T>() * 100);
    // Starting from the solution: 1 at once, x unchanged.
    CNaxVectorN<T> start(solution);
    ASSERT_EQ(CNaxAlgebra::SolveByCongugateGradient(*m, rhs, start, Loose<T>(), T(0)), 1);
    EXPECT_TRUE(start == solution);
  }
}

TEST(AlgebraCounting, PermutationsAndCombinations) {
  const int32 permutations[][2] = {{-3, 1}, {0, 1}, {5, 120}, {12, 479001600}};
  for (const auto& p : permutations) EXPECT_EQ(CNaxAlgebra::Permutations<int32>(p[0]), p[1]);
  // 13! leaves the range of uint32: the low 32 bits of 6227020800.
  EXPECT_EQ(CNaxAlgebra::Permutations<uint32>(13), static_cast<uint32>(6227020800ull));
  // k outside 1 to n - 1 gives 1; Pascal's rule holds for the rest.
  const int32 combinations[][3] = {{5, 7, 1}, {5, 0, 1}, {5, -2, 1}, {5, 4, 5}, {10, 3, 120}};
  for (const auto& c : combinations) EXPECT_EQ(CNaxAlgebra::Combinations<int32>(c[0], c[1]), c[2]);
  EXPECT_EQ(CNaxAlgebra::Combinations<uint32>(30, 15), 155117520u);
  for (int32 n = 0; n < 20; ++n)
    for (int32 k = 1; k < n; ++k)
      EXPECT_EQ(CNaxAlgebra::Combinations<int32>(n, k),
                CNaxAlgebra::Combinations<int32>(n - 1, k - 1) + CNaxAlgebra::Combinations<int32>(n - 1, k));
}

}  // namespace
