// The 4 x 4 matrix: the coarse rank, the polar decomposition,
// coordinate matrices and the elementary transforms with the quirk of Translate.
#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "matrix/matrix_test_support.h"

namespace {

using nax::test::Eps;

template <typename T>
class Matrix4Test : public ::testing::Test {};
TYPED_TEST_SUITE(Matrix4Test, nax::test::RealTypes);

template <typename T>
CNaxMatrix4<T> Identity() {
  return nax::test::FixedIdentity<CNaxMatrix4<T>>();
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

TYPED_TEST(Matrix4Test, PolarDecompositionOfARotatedStretch) {
  using T = TypeParam;
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
  const CNaxMatrix4<T> a = nax::test::RandomFixed<CNaxMatrix4<T>>(rng);
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
