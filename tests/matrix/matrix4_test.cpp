// The 4 x 4 matrix: closed-form inverse, the coarse rank, the symmetric eigenproblem,
// coordinate matrices and the elementary transforms with the quirk of Translate.
#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "nax/fixed_matrix_routines.h"

namespace {

template <typename T>
class Matrix4Test : public ::testing::Test {};
using RealTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(Matrix4Test, RealTypes);

template <typename T>
T Eps() {
  return std::is_same_v<T, float> ? T(2e-4) : T(1e-10);
}

template <typename T>
CNaxMatrix4<T> Random(std::mt19937& rng) {
  std::uniform_real_distribution<T> u(-1, 1);
  T v[16];
  for (T& x : v) x = u(rng);
  return CNaxMatrix4<T>(v);
}

template <typename T>
CNaxMatrix4<T> Identity() {
  CNaxMatrix4<T> m;
  m.Unit();
  return m;
}

template <typename T>
T ReferenceDet(const CNaxMatrix4<T>& m) {
  T det = 0;
  for (int c = 0; c < 4; ++c) {
    T minor[9];
    int k = 0;
    for (int r = 1; r < 4; ++r)
      for (int j = 0; j < 4; ++j)
        if (j != c) minor[k++] = m(r, j);
    det += (c % 2 ? -1 : 1) * m(0, c) * CNaxMatrix3<T>(minor).Det();
  }
  return det;
}

TYPED_TEST(Matrix4Test, InverseAndDeterminant) {
  using T = TypeParam;
  std::mt19937 rng(1);
  for (int k = 0; k < 200; ++k) {
    const CNaxMatrix4<T> m = Random<T>(rng);
    EXPECT_NEAR(m.Det(), ReferenceDet(m), Eps<T>() * 10);
    if (std::fabs(m.Det()) < T(0.05)) continue;
    CNaxMatrix4<T> inv;
    ASSERT_EQ(m.Inverse(inv, Eps<T>()), 0);
    EXPECT_EQ(naxAreAlmostEqual(inv * m, Identity<T>(), Eps<T>() * 500), 1);
    EXPECT_EQ(naxAreAlmostEqual(m * inv, Identity<T>(), Eps<T>() * 500), 1);
    const CNaxVector4<T> x(1, 2, -1, 0.5);
    CNaxVector4<T> s;
    ASSERT_EQ(m.SolveSystem(m * x, s, Eps<T>()), 0);
    EXPECT_NEAR((s - x).Length(), T(0), Eps<T>() * 500);
  }
  CNaxMatrix4<T> keep = Identity<T>();
  T condition;
  CNaxMatrix4<T> singular = Identity<T>();
  singular(3, 3) = 0;
  EXPECT_EQ(singular.Inverse(keep, Eps<T>()), 3);
  EXPECT_EQ(singular.Inverse(keep, naxMatrixNormOne, Eps<T>(), condition), 3);
  EXPECT_EQ(keep, Identity<T>());
  EXPECT_EQ(condition, T(3.4028234663852886e38));
}

TYPED_TEST(Matrix4Test, CoarseRankAndNorms) {
  using T = TypeParam;
  CNaxMatrix4<T> one;
  one(1, 2) = 5;
  EXPECT_EQ(one.CalculateRank(Eps<T>()), 3);  // a single non-zero element is rank 3 here
  EXPECT_EQ(CNaxMatrix4<T>().CalculateRank(Eps<T>()), 0);
  EXPECT_EQ(Identity<T>().CalculateRank(Eps<T>()), 4);
  EXPECT_EQ(one.Norm(naxMatrixNormMaxElement), T(20));  // times 4, the root of 16
  EXPECT_EQ(one.Norm(naxMatrixNormOne), T(5));
  EXPECT_NEAR(Identity<T>().Norm(naxMatrixNormFrobenius), T(2), Eps<T>());
  EXPECT_NEAR((Identity<T>() * T(3)).ConditionNumber(naxMatrixNormSpectral), T(1), Eps<T>() * 10);
}

TYPED_TEST(Matrix4Test, DecompositionsAndEigenproblem) {
  using T = TypeParam;
  std::mt19937 rng(2);
  int solved = 0;
  for (int k = 0; k < 50; ++k) {
    const CNaxMatrix4<T> b = Random<T>(rng);
    const CNaxMatrix4<T> s = b + b.Transpose();
    CNaxVector4<T> values;
    CNaxMatrix4<T> vectors;
    const naxStatus status = s.SymmetricEigensolve(values, vectors, Eps<T>());
    if (status == naxStatusTooManyRotations) continue;  // exactly 50 rotations
    ASSERT_EQ(status, naxStatusOk);
    ++solved;
    for (int j = 0; j < 3; ++j) EXPECT_LE(values[j], values[j + 1]);
    for (int j = 0; j < 4; ++j) {
      const CNaxVector4<T> v = vectors.ColVector(j);
      EXPECT_NEAR((s * v - v * values[j]).Length(), T(0), Eps<T>() * 100);
    }
    CNaxMatrix4<T> q, r, u, w;
    CNaxVector4<T> sv;
    EXPECT_EQ(b.QR_Decomposition(q, r, Eps<T>()), 0);
    EXPECT_EQ(naxAreAlmostEqual(q * r, b, Eps<T>() * 100), 1);
    EXPECT_EQ(b.SV_Decomposition(u, w, sv, Eps<T>()), 0);
    CNaxMatrix4<T> d;
    d.SetDiagonal(0);
    for (int j = 0; j < 4; ++j) d(j, j) = sv[j];
    EXPECT_EQ(naxAreAlmostEqual(u * d * w.Transpose(), b, Eps<T>() * 100), 1);
    CNaxMatrix4<T> lower, upper;
    if (b.LU_Decomposition(lower, upper, Eps<T>()) == 1) {
      EXPECT_EQ(naxAreAlmostEqual(lower * upper, b, Eps<T>() * 100), 1);
    }
  }
  EXPECT_GT(solved, 25);
  // Polar decomposition of a rotation times a moderate stretch.
  CNaxMatrix4<T> m = Identity<T>();
  m.RotateXAxis(T(0.4), 1);
  m.RotateZAxis(T(-1.1), 1);
  m.Scale(T(1.2), T(0.9), T(1.1), 0);
  CNaxMatrix4<T> rot, stretch;
  ASSERT_EQ(m.PolarDecomposition(rot, stretch, 1, Eps<T>()), 1);
  EXPECT_EQ(stretch.IsSymmetric(T(0)), 1);
  EXPECT_EQ(naxAreAlmostEqual(rot * stretch, m, T(1e-2)), 1);
}

TYPED_TEST(Matrix4Test, ElementaryTransforms) {
  using T = TypeParam;
  std::mt19937 rng(3);
  const CNaxMatrix4<T> a = Random<T>(rng);
  const T c = std::cos(T(0.6)), s = std::sin(T(0.6));
  const CNaxMatrix4<T> rx(1, 0, 0, 0, 0, c, -s, 0, 0, s, c, 0, 0, 0, 0, 1);
  const CNaxMatrix4<T> ry(c, 0, s, 0, 0, 1, 0, 0, -s, 0, c, 0, 0, 0, 0, 1);
  const CNaxMatrix4<T> rz(c, -s, 0, 0, s, c, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1);
  const CNaxMatrix4<T> sc(2, 0, 0, 0, 0, 3, 0, 0, 0, 0, 4, 0, 0, 0, 0, 1);
  const CNaxMatrix4<T> tr(1, 0, 0, 1, 0, 1, 0, 2, 0, 0, 1, 3, 0, 0, 0, 1);
  for (int left = 0; left < 2; ++left) {
    CNaxMatrix4<T> b = a;
    b.RotateXAxis(T(0.6), left);
    EXPECT_EQ(naxAreAlmostEqual(b, left ? rx * a : a * rx, Eps<T>() * 10), 1);
    b = a;
    b.RotateYAxis(T(0.6), left);
    EXPECT_EQ(naxAreAlmostEqual(b, left ? ry * a : a * ry, Eps<T>() * 10), 1);
    b = a;
    b.RotateZAxis(T(0.6), left);
    EXPECT_EQ(naxAreAlmostEqual(b, left ? rz * a : a * rz, Eps<T>() * 10), 1);
    b = a;
    b.Scale(T(2), T(3), T(4), left);
    EXPECT_EQ(naxAreAlmostEqual(b, left ? sc * a : a * sc, Eps<T>() * 10), 1);
  }
  CNaxMatrix4<T> b = a;
  b.Translate(T(1), T(2), T(3), 1);
  EXPECT_EQ(naxAreAlmostEqual(b, tr * a, Eps<T>() * 10), 1);
  // With left 0 the translation deliberately gains a(3,3) and a(3,3) doubles.
  CNaxMatrix4<T> id = Identity<T>();
  id.Translate(T(1), T(2), T(3), 0);
  EXPECT_EQ(id.ExtractTranslation(), CNaxVector3<T>(2, 3, 4));
  EXPECT_EQ(id(3, 3), T(2));
  id = Identity<T>();
  id.Translate(T(1), T(2), T(3), 1);
  EXPECT_EQ(id.ExtractTranslation(), CNaxVector3<T>(1, 2, 3));
  EXPECT_EQ(id(3, 3), T(1));
  EXPECT_EQ(Identity<T>().ExtractTranslation(), CNaxVector3<T>());
  // On the identity the left and right forms agree.
  CNaxMatrix4<T> l = Identity<T>(), r = Identity<T>();
  l.RotateXAxis(T(0.3), 1);
  r.RotateXAxis(T(0.3), 0);
  EXPECT_EQ(l, r);
}

TYPED_TEST(Matrix4Test, CoordinateMatrices) {
  using T = TypeParam;
  CNaxMatrix4<T> m = Identity<T>();
  m.RotateYAxis(T(0.8), 1);
  m.RotateXAxis(T(-0.3), 1);
  m.Translate(T(4), T(-5), T(6), 1);
  EXPECT_EQ(m.IsRotation(Eps<T>() * 10), 1);
  EXPECT_EQ(m.IsCoordinateMatrix(Eps<T>() * 10), 1);
  CNaxMatrix4<T> inv;
  ASSERT_EQ(m.InverseCoordinateMatrix(inv), 1);
  EXPECT_EQ(naxAreAlmostEqual(inv * m, Identity<T>(), Eps<T>() * 10), 1);
  CNaxMatrix4<T> reflected = m;
  reflected.Scale(T(-1), T(1), T(1), 1);
  EXPECT_EQ(reflected.IsRotation(Eps<T>() * 10), 0);
  EXPECT_EQ(reflected.IsCoordinateMatrix(Eps<T>() * 10), 1);
  CNaxMatrix4<T> t = Identity<T>();
  t.Translate(T(1), T(2), T(3), 1);
  EXPECT_EQ(t.IsTranslation(Eps<T>()), 1);
  EXPECT_EQ(t.IsScaling(Eps<T>()), 0);
  CNaxMatrix4<T> sc = Identity<T>();
  sc.Scale(T(2), T(3), T(4), 1);
  EXPECT_EQ(sc.IsScaling(Eps<T>()), 1);
  EXPECT_EQ(sc.InverseCoordinateMatrix(inv), 0);
  EXPECT_EQ(sc.Diagonal3(), CNaxVector3<T>(2, 3, 4));
}

}  // namespace
