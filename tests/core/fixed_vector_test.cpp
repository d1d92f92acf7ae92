// Fixed vectors and the free vector routines: the safe-root dead zone, the relative tests,
// Gram-Schmidt, angles, decompositions in a basis and the homogeneous conversions.
#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "matrix/matrix_test_support.h"
#include "nax/vector_routines.h"

namespace {

using nax::test::Eps;

template <typename T>
class FixedVectorTest : public ::testing::Test {};
TYPED_TEST_SUITE(FixedVectorTest, nax::test::RealTypes);

template <typename T>
CNaxVector3<T> Random3(std::mt19937& rng) {
  return nax::test::RandomFixed<CNaxVector3<T>>(rng);
}

TYPED_TEST(FixedVectorTest, ConstructorsAndTheIgnoredInteger) {
  using T = TypeParam;
  EXPECT_EQ(CNaxVector3<T>(int32(7)), CNaxVector3<T>());  // the integer is deliberately ignored
  EXPECT_EQ(CNaxVector4<T>(int32(3)), CNaxVector4<T>());
  EXPECT_EQ(CNaxVector3<T>(T(7)), CNaxVector3<T>(7, 7, 7));
  EXPECT_EQ(CNaxVector2<T>(0.5), CNaxVector2<T>(T(0.5), T(0.5)));
  const T data[4] = {1, 2, 3, 4};
  const CNaxVectorN<T> n(4, data);
  EXPECT_EQ(CNaxVector3<T>(n), CNaxVector3<T>(1, 2, 3));
  CNaxVector4<T> v4;
  v4 = n;
  EXPECT_EQ(v4, CNaxVector4<T>(data));
}

TYPED_TEST(FixedVectorTest, LengthsNormalizingAndTheDeadZone) {
  using T = TypeParam;
  // Below the dead zone of the safe root the length is exactly 0 and Normalize refuses.
  const T tiny = std::is_same_v<T, float> ? T(1e-4) : T(1e-6);
  CNaxVector3<T> v(tiny, 0, 0);
  EXPECT_EQ(v.Length(), T(0));
  EXPECT_EQ(v.Normalize(), 0);
  EXPECT_EQ(v.x, tiny);
  // IsAlmostZero is a closed interval on the length.
  const CNaxVector2<T> w(3, 4);
  EXPECT_EQ(w.IsAlmostZero(T(5)), 1);
  CNaxVector4<T> u(1, -2, 2, 4);
  EXPECT_EQ(u.Normalize(), 1);
  EXPECT_NEAR(u.Length(), T(1), Eps<T>());
  EXPECT_EQ(u.IsAlmostUnit(Eps<T>()), 1);
  // Component search: strict comparisons, the first of equal extremes wins.
  EXPECT_EQ(CNaxVector3<T>(3, 3, 1).GetIndexOfMaxComponent(0), 0);
  EXPECT_EQ(CNaxVector3<T>(1, -3, 3).GetIndexOfMaxComponent(1), 1);
  EXPECT_EQ(CNaxVector3<T>(1, -3, 3).GetMinComponent(0), T(-3));
  EXPECT_EQ(CNaxVector4<T>(1, -3, 3, -3).GetIndexOfMinComponent(0), 1);
  EXPECT_EQ(CNaxVector4<T>(1, -3, 3, -5).GetMaxComponent(1), T(5));
  CNaxVector3<T> a(T(0.5), T(-0.1), T(0.2));
  a.AnnulateSmallComponents(T(0.2));
  EXPECT_EQ(a, CNaxVector3<T>(T(0.5), 0, T(0.2)));
}

TYPED_TEST(FixedVectorTest, EqualityIsElementwiseWithDefaultTolerance) {
  using T = TypeParam;
  const T tol = std::is_same_v<T, float> ? T(1e-7) : T(1e-9);
  const CNaxVector3<T> a(1, 2, 3);
  EXPECT_TRUE(a == CNaxVector3<T>(1, 2, 3 + tol / 2));
  EXPECT_TRUE(a != CNaxVector3<T>(1, 2, T(3.001)));
  EXPECT_EQ(naxAreAlmostEqual(a, a, T(0)), 1);
  EXPECT_EQ(naxAreAlmostEqual(CNaxVector2<T>(0, 0), CNaxVector2<T>(3, 4), T(5)), 1);
  const T d1[3] = {1, 2, 3}, d2[2] = {1, 2};
  EXPECT_EQ(naxAreAlmostEqual(CNaxVectorN<T>(3, d1), CNaxVectorN<T>(2, d2)), 0);
  EXPECT_EQ(naxAreAlmostEqual(CNaxVectorN<T>(3, d1), CNaxVectorN<T>(3, d1)), 1);
}

TYPED_TEST(FixedVectorTest, RelativeTests) {
  using T = TypeParam;
  const T tol = T(1e-3);
  const CNaxVector3<T> zero;
  // Vectors too small to measure are orthogonal, collinear and coplanar with anything.
  EXPECT_EQ(naxAreOrthogonal(zero, CNaxVector3<T>(1, 2, 3), tol), 1);
  EXPECT_EQ(naxAreColinear(zero, CNaxVector3<T>(1, 2, 3), tol), 1);
  EXPECT_EQ(naxAreOrthogonal(CNaxVector3<T>(1, 0, 0), CNaxVector3<T>(0, 5, 0), tol), 1);
  EXPECT_EQ(naxAreOrthogonal(CNaxVector3<T>(1, 0, 0), CNaxVector3<T>(1, 5, 0), tol), 0);
  EXPECT_EQ(naxAreOrthogonal(CNaxVector4<T>(1, 0, 0, 1), CNaxVector4<T>(0, 5, 0, 0), tol), 1);
  EXPECT_EQ(naxAreColinear(CNaxVector3<T>(1, 2, 3), CNaxVector3<T>(-2, -4, -6), tol), 1);
  EXPECT_EQ(naxAreColinear(CNaxVector2<T>(1, 2), CNaxVector2<T>(2, 4.1), tol), 0);
  EXPECT_EQ(naxArePointsCollinear(CNaxVector3<T>(1, 1, 1), CNaxVector3<T>(2, 3, 4), CNaxVector3<T>(3, 5, 7), tol), 1);
  EXPECT_EQ(naxArePointsCoplanar(CNaxVector3<T>(0, 0, 1), CNaxVector3<T>(1, 0, 1), CNaxVector3<T>(0, 1, 1),
                                 CNaxVector3<T>(5, 7, 1), tol),
            1);
  EXPECT_EQ(naxAreVectorsCoplanar(CNaxVector3<T>(1, 0, 0), CNaxVector3<T>(0, 1, 0), CNaxVector3<T>(0, 0, 1), tol),
            0);
  // The collinearity scale is a component, used once: a scale-dependent test.
  const CNaxVector3<T> big(1000, 0, 0), skew(1000, 1, 0);
  EXPECT_EQ(naxAreColinear(big, skew, tol), 0);  // |cross| = 1000 > 1e-3 * 1000
  const CNaxVector2<T> p(1, 0), q(0, -1);
  EXPECT_EQ(naxAreOrthonormalized(p, q, tol), 1);  // the dot product, not the handedness
  EXPECT_EQ(naxAreOrthonormalized(CNaxVector3<T>(1, 0, 0), CNaxVector3<T>(0, 1, 0), CNaxVector3<T>(0, 0, -1), tol), 0);
  EXPECT_EQ(naxAreOrthonormalized(CNaxVector3<T>(1, 0, 0), CNaxVector3<T>(0, 1, 0), CNaxVector3<T>(0, 0, 1), tol), 1);
}

TYPED_TEST(FixedVectorTest, OrthonormalizeGivesRightHandedFrames) {
  using T = TypeParam;
  std::mt19937 rng(11);
  for (int k = 0; k < 100; ++k) {
    CNaxVector3<T> a = Random3<T>(rng), b = Random3<T>(rng), c = Random3<T>(rng);
    const CNaxVector3<T> a0 = a;
    if (naxMixedProduct(a, b, c) < T(0)) c = -c;
    if (naxOrthonormalize(a, b, c, T(1e-2)) == 0) continue;
    EXPECT_EQ(naxAreOrthonormalized(a, b, c, T(1e-3)), 1);
    EXPECT_EQ(naxAreColinear(a, a0, T(1e-3)), 1);  // a keeps its direction
    CNaxVector2<T> u(a.x, a.y), v(b.x, b.y);
    if (naxOrthonormalize(u, v, T(1e-2)) == 1) {
      EXPECT_NEAR(u.Dot(v), T(0), T(1e-3));
      EXPECT_NEAR(v.Length(), T(1), T(1e-3));
    }
  }
  CNaxVector3<T> a(1, 0, 0), b(2, 0, 0), c(0, 1, 0);
  EXPECT_EQ(naxOrthonormalize(a, b, c, T(1e-3)), 0);
  EXPECT_EQ(b.x, T(2));
  EXPECT_EQ(naxOrthonormalize(a, b, T(1e-3)), 0);
}

TYPED_TEST(FixedVectorTest, AnglesAndTrigonometry) {
  using T = TypeParam;
  EXPECT_EQ(naxFindAngleInDegrees(CNaxVector2<T>(1, 0), CNaxVector2<T>(0, 0)), T(0));
  EXPECT_NEAR(naxFindAngleInDegrees(CNaxVector2<T>(1, 0), CNaxVector2<T>(-1, 1)), T(135), T(1e-3));
  EXPECT_NEAR(naxFindAngleInRadians(CNaxVector3<T>(0, 0, 2), CNaxVector3<T>(0, 3, 0)), T(M_PI / 2), T(1e-5));
  std::mt19937 rng(5);
  for (int k = 0; k < 50; ++k) {
    const CNaxVector3<T> a = Random3<T>(rng), b = Random3<T>(rng);
    const T angle = naxFindAngleInRadians(a, b);
    EXPECT_NEAR(naxSin(a, b), std::sin(angle), T(1e-3));
    EXPECT_NEAR(naxCos(a, b), std::cos(angle), T(1e-3));
    EXPECT_NEAR(naxTan(a, b) * naxCot(a, b), T(1), T(1e-2));
  }
  EXPECT_NEAR(CNaxVector2<T>(0, -1).Angle_0_360(), T(270), T(1e-4));
  EXPECT_NEAR(CNaxVector2<T>(0, -1).Angle_MINUS_180_180(), T(-90), T(1e-4));
  CNaxVector2<T> r(1, 2);
  EXPECT_EQ(r.Rotate90DegsCCW(), CNaxVector2<T>(-2, 1));
  EXPECT_EQ(naxGetTriangleArea(CNaxVector2<T>(0, 0), CNaxVector2<T>(2, 0), CNaxVector2<T>(5, 3)), T(3));
}

TYPED_TEST(FixedVectorTest, DecomposeInBasis) {
  using T = TypeParam;
  std::mt19937 rng(9);
  int solved = 0;
  for (int k = 0; k < 50; ++k) {
    const CNaxVector3<T> a = Random3<T>(rng), b = Random3<T>(rng), c = Random3<T>(rng);
    if (std::fabs(naxMixedProduct(a, b, c)) < T(0.1)) continue;
    const CNaxVector3<T> v = a * T(2) - b * T(0.5) + c * T(3);
    T x, y, z;
    ASSERT_EQ(v.DecomposeInBasis(a, b, c, x, y, z, T(1e-6)), 1);
    EXPECT_NEAR(x, T(2), T(1e-3));
    EXPECT_NEAR(y, T(-0.5), T(1e-3));
    EXPECT_NEAR(z, T(3), T(1e-3));
    ++solved;
  }
  EXPECT_GT(solved, 10);
  T x, y;
  EXPECT_EQ(CNaxVector2<T>(3, 1).DecomposeInBasis(CNaxVector2<T>(1, 1), CNaxVector2<T>(1, -1), x, y, T(1e-6)), 1);
  EXPECT_NEAR(x, T(2), Eps<T>());
  EXPECT_NEAR(y, T(1), Eps<T>());
  EXPECT_EQ(CNaxVector2<T>(3, 1).DecomposeInBasis(CNaxVector2<T>(1, 1), CNaxVector2<T>(2, 2), x, y, T(1e-6)), 0);
}

TYPED_TEST(FixedVectorTest, CombinationsAndArrays) {
  using T = TypeParam;
  const CNaxVector3<T> vs[3] = {CNaxVector3<T>(1, 0, 0), CNaxVector3<T>(0, 2, 0), CNaxVector3<T>(0, 0, 3)};
  const T w[3] = {1, 2, 3};
  EXPECT_EQ(naxCombine(3, vs, w), CNaxVector3<T>(1, 4, 9));
  EXPECT_EQ(naxCombine3(vs[0], vs[1], vs[2], T(1), T(2), T(3)), CNaxVector3<T>(1, 4, 9));
  EXPECT_EQ(naxFindMean(vs, 3), CNaxVector3<T>(T(1) / 3, T(2) / 3, 1));
  CNaxVector3<T> target[5];
  EXPECT_EQ(naxAppendVectorArray(2, target, 3, vs), 5);
  EXPECT_EQ(target[4], vs[2]);
  EXPECT_EQ(target[0], CNaxVector3<T>());
  const T d1[4] = {1, 2, 3, 4}, d2[4] = {4, 3, 2, 1};
  const CNaxVectorN<T> n1(4, d1), n2(4, d2);
  EXPECT_EQ(naxPartialDotProduct(1, 0, 2, n1, n2), T(2 * 4 + 3 * 3));
  EXPECT_EQ(naxPartialDotProduct(1, 0, 0, n1, n2), T(0));
  EXPECT_EQ(naxSquareDist(n1, n2), T(20));
  EXPECT_NEAR(naxDist(n1, n2), std::sqrt(T(20)), Eps<T>());
  EXPECT_EQ(CNaxVectorN<T>(naxFindMidpoint<T>(n1, n2))[0], T(2.5));
  const CNaxBaseVector<CNaxComplex<T>> c1(2, CNaxComplex<T>(1, 1)), c2(2, CNaxComplex<T>(0, 2));
  EXPECT_EQ(naxPartialDotProduct(0, 0, 2, c1, c2).Real(), T(-4));
  EXPECT_EQ(naxFindMidpoint(c1, c2)[1].Imag(), T(1.5));
}

TYPED_TEST(FixedVectorTest, HomogeneousConversions) {
  using T = TypeParam;
  const T tol = T(0.5);
  CNaxVector3<T> r(9, 9, 9);
  T w;
  // w equal to tol divides; just below it refuses and leaves the result.
  EXPECT_EQ(naxVector4To3(CNaxVector4<T>(1, 2, 3, tol), tol, r, w), 1);
  EXPECT_EQ(r, CNaxVector3<T>(2, 4, 6));
  r = CNaxVector3<T>(9, 9, 9);
  EXPECT_EQ(naxVector4To3(CNaxVector4<T>(1, 2, 3, T(0.49)), tol, r, w), 0);
  EXPECT_EQ(r, CNaxVector3<T>(9, 9, 9));
  EXPECT_EQ(w, T(0.49));
  CNaxVector2<T> r2;
  EXPECT_EQ(naxVector3To2(CNaxVector3<T>(2, 4, 2), tol, r2, w), 1);
  EXPECT_EQ(r2, CNaxVector2<T>(1, 2));
  EXPECT_EQ(naxVector3To2(CNaxVector3<T>(2, 4, 2), w), CNaxVector2<T>(2, 4));
  EXPECT_EQ(naxVector4To3(CNaxVector4<T>(1, 2, 3, 4), w), CNaxVector3<T>(1, 2, 3));
  EXPECT_EQ(w, T(4));
  EXPECT_EQ(naxVector2To3(CNaxVector2<T>(1, 2)), CNaxVector3<T>(1, 2, 1));
  EXPECT_EQ(naxVector3To4(CNaxVector3<T>(1, 2, 3), T(0)), CNaxVector4<T>(1, 2, 3, 0));
  EXPECT_EQ(naxCutVector4To3(CNaxVector4<T>(1, 2, 3, 4)), naxAffineVector4To3(CNaxVector4<T>(1, 2, 3, 4)));
}

}  // namespace
