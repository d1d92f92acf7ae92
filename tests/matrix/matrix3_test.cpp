// The 3 x 3 matrix: inverse and solve, rank, decompositions, eigenvalues and eigenvectors,
// Euler angles in the six orders, angle and axis, and the plane transforms with their quirks.
#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "matrix/matrix_test_support.h"

namespace {

using nax::test::Eps;

template <typename T>
class Matrix3Test : public ::testing::Test {};
TYPED_TEST_SUITE(Matrix3Test, nax::test::RealTypes);

template <typename T>
CNaxMatrix3<T> Random(std::mt19937& rng, T lo = -1, T hi = 1) {
  return nax::test::RandomFixed<CNaxMatrix3<T>>(rng, lo, hi);
}
template <typename T>
void ExpectNear(const CNaxMatrix3<T>& a, const CNaxMatrix3<T>& b, T tol) {
  nax::test::ExpectMatrixNear(a, b, tol);
}
template <typename T>
CNaxMatrix3<T> Identity() {
  return nax::test::FixedIdentity<CNaxMatrix3<T>>();
}

const naxRotationsOrder kOrders[6] = {naxRotationsOrderXYZ, naxRotationsOrderXZY, naxRotationsOrderYXZ,
                                      naxRotationsOrderYZX, naxRotationsOrderZYX, naxRotationsOrderZXY};

template <typename T>
CNaxMatrix3<T> Elementary(int axis, T degrees) {
  CNaxMatrix3<T> m;
  CNaxVector3<T> v;
  v[axis] = 1;
  m.SetRotationByAngleAxis(degrees, v);
  return m;
}

TYPED_TEST(Matrix3Test, RankNormsAndPositivity) {
  using T = TypeParam;
  const CNaxMatrix3<T> zero;
  EXPECT_EQ(zero.CalculateRank(T(0)), 3);  // |det| >= 0 always holds
  EXPECT_EQ(zero.CalculateRank(Eps<T>()), 0);
  EXPECT_EQ(CNaxMatrix3<T>(1, 2, 3, 2, 4, 6, 3, 6, 9).CalculateRank(Eps<T>()), 1);
  EXPECT_EQ(CNaxMatrix3<T>(1, 2, 3, 0, 1, 4, 1, 3, 7).CalculateRank(Eps<T>()), 2);
  const CNaxMatrix3<T> m(1, -2, 3, -4, 5, -6, 7, -8, 10);
  EXPECT_EQ(m.Norm(naxMatrixNormOne), T(19));
  EXPECT_EQ(m.Norm(naxMatrixNormInfinity), T(25));
  EXPECT_EQ(m.Norm(naxMatrixNormMaxElement), T(30));
  EXPECT_NEAR(m.Norm(naxMatrixNormFrobenius), std::sqrt(T(304)), Eps<T>() * 100);
  EXPECT_EQ(CNaxMatrix3<T>(T(3e-4), 0, 0, 0, 0, 0, 0, 0, 0).Norm(naxMatrixNormFrobenius), T(0));
  EXPECT_NEAR(CNaxMatrix3<T>(0, 0, 0, 0, -5, 0, 0, 0, 2).Norm(naxMatrixNormSpectral), T(5), Eps<T>() * 10);
  EXPECT_EQ(CNaxMatrix3<T>(2, -1, 0, -1, 2, -1, 0, -1, 2).IsPositive(Eps<T>()), 1);
  EXPECT_EQ(CNaxMatrix3<T>(1, 2, 0, 2, 1, 0, 0, 0, 1).IsPositive(Eps<T>()), 0);
  EXPECT_EQ(CNaxMatrix3<T>(1, 2, 3, 2, 4, 6, 0, 1, 1).IsSingular(Eps<T>()), 1);
}

TYPED_TEST(Matrix3Test, PolarAndScaleRotationDecompositions) {
  using T = TypeParam;
  std::mt19937 rng(2);
  for (int k = 0; k < 50; ++k) {
    const CNaxMatrix3<T> m = Random<T>(rng);
    if (std::fabs(m.Det()) < T(0.05)) continue;
    for (int right = 0; right < 2; ++right) {
      CNaxMatrix3<T> rot, stretch;
      ASSERT_EQ(m.PolarDecomposition(rot, stretch, right, Eps<T>()), 1);
      EXPECT_EQ(rot.IsOrthogonal(Eps<T>() * 100), 1);
      EXPECT_EQ(stretch.IsSymmetric(Eps<T>()), 1);
      ExpectNear(right ? rot * stretch : stretch * rot, m, Eps<T>() * 1000);
      CNaxMatrix3<T> scale, rotation, shear;
      int32 reflected, general;
      ASSERT_EQ(m.ExtractScaleRotation(scale, rotation, shear, right, Eps<T>(), reflected, general), 1);
      EXPECT_EQ(reflected, m.Det() < 0 ? 1 : 0);
      const CNaxMatrix3<T> s = shear * scale * shear.Transpose();
      ExpectNear(right ? rotation * s : s * rotation, m, Eps<T>() * 1000);
    }
  }
  // A rank-one matrix: the singular vectors still form orthogonal bases, the polar form refuses.
  const CNaxMatrix3<T> rank1(1, 2, 3, 2, 4, 6, 3, 6, 9);
  CNaxMatrix3<T> u, v;
  CNaxVector3<T> w;
  rank1.SV_Decomposition(u, v, w, Eps<T>());
  EXPECT_EQ(u.IsOrthogonal(Eps<T>() * 10), 1);
  EXPECT_EQ(v.IsOrthogonal(Eps<T>() * 10), 1);
  EXPECT_NEAR(w.y, T(0), Eps<T>() * 100);
  CNaxMatrix3<T> rot, stretch;
  EXPECT_EQ(rank1.PolarDecomposition(rot, stretch, 1, Eps<T>()), 0);
}

TYPED_TEST(Matrix3Test, GeneralEigenvaluesAndVectors) {
  using T = TypeParam;
  const T tol = std::is_same_v<T, float> ? T(1e-4) : T(1e-8);
  std::mt19937 rng(4);
  for (int k = 0; k < 100; ++k) {
    const CNaxMatrix3<T> m = Random<T>(rng, T(-2), T(2));
    T l1, l2, l3;
    const int32 kind = m.FindEigenvalues(l1, l2, l3, tol);
    const T ls[3] = {l1, l2, l3};
    const int real = kind == 1 ? 1 : 3;
    for (int i = 0; i < real; ++i) {
      T vectors[9];
      const int32 count = m.FindEigenvectorsReal(ls[i], vectors, T(1e-3));
      ASSERT_GE(count, 1);
      const CNaxVector3<T> v(vectors);
      EXPECT_NEAR((m * v - v * ls[i]).Length() / v.Length(), T(0), T(2e-3)) << k;
    }
    if (kind != 1) continue;
    CNaxBaseVector<CNaxComplex<T>> cv(3);
    const CNaxComplex<T> lambda(l2, l3);
    m.FindEigenvectorComplex(lambda, cv, tol);
    T residual = 0, length = 0;
    for (int r = 0; r < 3; ++r) {
      CNaxComplex<T> s = cv[r] * lambda * T(-1);
      for (int c = 0; c < 3; ++c) s += cv[c] * m(r, c);
      residual += s.SquareMagn();
      length += cv[r].SquareMagn();
    }
    EXPECT_LT(std::sqrt(residual / length), T(2e-3));
  }
  // The identity: three equal roots and a whole space of eigenvectors.
  T l1, l2, l3;
  const CNaxMatrix3<T> id = Identity<T>();
  EXPECT_GE(id.FindEigenvalues(l1, l2, l3, tol), 2);
  EXPECT_NEAR(l1, T(1), T(1e-3));
  EXPECT_NEAR(l3, T(1), T(1e-3));
  T vectors[9];
  EXPECT_EQ(id.FindEigenvectorsReal(T(1), vectors, tol), 3);
  // diag(2, 2, 5): a plane for 2, a line for 5.
  const CNaxMatrix3<T> d(2, 0, 0, 0, 2, 0, 0, 0, 5);
  EXPECT_EQ(d.FindEigenvectorsReal(T(2), vectors, tol), 2);
  EXPECT_EQ(d.FindEigenvectorsReal(T(5), vectors, tol), 2 - 1);
  EXPECT_NEAR(std::fabs(vectors[2]), T(1), tol);
  // Roots within tol of nought become exactly 0.
  EXPECT_GE(CNaxMatrix3<T>(1, 2, 3, 2, 4, 6, 3, 6, 9).FindEigenvalues(l1, l2, l3, T(1e-3)), 2);
  EXPECT_NEAR(l1 + l2 + l3, T(14), T(1e-3));
  EXPECT_EQ((l1 == T(0)) + (l2 == T(0)) + (l3 == T(0)), 2);
}

TYPED_TEST(Matrix3Test, SingularSystemsHelpers) {
  using T = TypeParam;
  // N has a zero last row: a vector lies in its range only with a nought third component.
  const CNaxMatrix3<T> n(0, 1, 0, 0, 0, 1, 0, 0, 0);
  T weights[2];
  CNaxVector3<T> result;
  ASSERT_EQ(n.FindProperCombination(CNaxVector3<T>(1, 0, 1), CNaxVector3<T>(0, 1, 2), weights, result, Eps<T>()), 1);
  EXPECT_NEAR(result.z, T(0), Eps<T>());
  EXPECT_GT(result.Length(), T(0));
  EXPECT_EQ(Identity<T>().FindProperCombination(CNaxVector3<T>(1, 0, 0), CNaxVector3<T>(0, 1, 0), weights, result,
                                                Eps<T>()),
            0);
  CNaxVector3<T> x;
  n.FindAnySolution(CNaxVector3<T>(2, 3, 0), x, T(1e-6));
  EXPECT_NEAR((n * x - CNaxVector3<T>(2, 3, 0)).Length(), T(0), Eps<T>() * 10);
  int32 first, second;
  n.GetPairOfIndices(1, first, second);
  EXPECT_EQ(first, 0);
  EXPECT_EQ(second, 2);
  EXPECT_EQ(n.GetThirdIndex(2, 0), 1);
  int32 rows[3];
  EXPECT_EQ(n.FindZeroRows(rows, Eps<T>()), 1);
  EXPECT_EQ(rows[0], 2);
  EXPECT_EQ(CNaxMatrix3<T>(1, 2, 3, 2, 4, 6, 0, 0, 1).TestRowsForDependence(0, 1, Eps<T>()), 1);
  CNaxMatrix3<T> frame;
  for (int index = 0; index < 3; ++index) {
    ASSERT_EQ(n.ExtractOrthogonal(CNaxVector3<T>(1, 2, 2), index, Eps<T>(), frame), 1);
    EXPECT_EQ(frame.IsOrthogonal(Eps<T>() * 10), 1);
    EXPECT_NEAR(frame.Det(), T(1), Eps<T>() * 10);
    EXPECT_NEAR(frame(0, index), T(1) / 3, Eps<T>());
  }
}

TYPED_TEST(Matrix3Test, EulerAnglesRoundTripInAllOrders) {
  using T = TypeParam;
  std::mt19937 rng(5);
  std::uniform_real_distribution<T> u(-179, 179), mid(-85, 85);
  const T tol = std::is_same_v<T, float> ? T(5e-3) : T(1e-8);
  for (int o = 0; o < 6; ++o) {
    for (int k = 0; k < 100; ++k) {
      T angles[3] = {u(rng), u(rng), u(rng)};
      // The middle axis of the sequence stays away from the poles.
      const int middle[6] = {1, 2, 0, 2, 1, 0};
      angles[middle[o]] = mid(rng);
      CNaxMatrix3<T> m;
      m.SetRotationByEulerAngles(angles[0], angles[1], angles[2], kOrders[o]);
      EXPECT_EQ(m.IsOrthogonal(Eps<T>() * 10), 1);
      T b[3] = {};
      m.ExtractEulerAngles(kOrders[o], b[0], b[1], b[2]);
      for (int i = 0; i < 3; ++i) EXPECT_NEAR(b[i], angles[i], tol * 100) << "order " << o;
    }
  }
}

TYPED_TEST(Matrix3Test, EulerOrdersComposeElementaryRotations) {
  using T = TypeParam;
  const T x = 10, y = 20, z = 30;
  const CNaxMatrix3<T> rx = Elementary<T>(0, x), ry = Elementary<T>(1, y), rz = Elementary<T>(2, z);
  const CNaxMatrix3<T> expected[6] = {rz * ry * rx, ry * rz * rx, rz * rx * ry, rx * rz * ry, rx * ry * rz, ry * rx * rz};
  for (int o = 0; o < 6; ++o) {
    CNaxMatrix3<T> m;
    m.SetRotationByEulerAngles(x, y, z, kOrders[o]);
    ExpectNear(m, expected[o], Eps<T>() * 10);
  }
  // The elementary rotation about X has rows (1, 0, 0), (0, c, -s), (0, s, c).
  EXPECT_NEAR(rx(1, 2), -std::sin(x * T(M_PI) / 180), Eps<T>());
}

TYPED_TEST(Matrix3Test, EulerAnglesSplitEvenlyAtThePoles) {
  using T = TypeParam;
  const T tol = std::is_same_v<T, float> ? T(0.05) : T(1e-5);
  for (int o = 0; o < 6; ++o) {
    const int middle[6] = {1, 2, 0, 2, 1, 0};
    for (T pole : {T(90), T(-90)}) {
      T angles[3] = {T(25), T(25), T(25)};
      angles[(middle[o] + 1) % 3] = T(40);
      angles[(middle[o] + 2) % 3] = T(-10);
      angles[middle[o]] = pole;
      CNaxMatrix3<T> m, back;
      m.SetRotationByEulerAngles(angles[0], angles[1], angles[2], kOrders[o]);
      T b[3] = {};
      m.ExtractEulerAngles(kOrders[o], b[0], b[1], b[2]);
      EXPECT_NEAR(b[middle[o]], pole, tol);
      const int outer1 = (middle[o] + 1) % 3, outer2 = (middle[o] + 2) % 3;
      EXPECT_NEAR(std::fabs(b[outer1]), std::fabs(b[outer2]), tol) << "order " << o;
      back.SetRotationByEulerAngles(b[0], b[1], b[2], kOrders[o]);
      ExpectNear(back, m, T(1e-3));
    }
  }
  // In the XYZ order the split is half each for a negative middle angle and half with
  // opposite signs for a positive one.
  CNaxMatrix3<T> m;
  T b[3] = {};
  m.SetRotationByEulerAngles(T(30), T(90), T(-10), naxRotationsOrderXYZ);
  m.ExtractEulerAngles(naxRotationsOrderXYZ, b[0], b[1], b[2]);
  EXPECT_NEAR(b[0], T(20), tol);
  EXPECT_NEAR(b[2], T(-20), tol);
  m.SetRotationByEulerAngles(T(30), T(-90), T(-10), naxRotationsOrderXYZ);
  m.ExtractEulerAngles(naxRotationsOrderXYZ, b[0], b[1], b[2]);
  EXPECT_NEAR(b[0], T(10), tol);
  EXPECT_NEAR(b[2], T(10), tol);
}

TYPED_TEST(Matrix3Test, AngleAxisRoundTripNearZeroAndHalfTurn) {
  using T = TypeParam;
  std::mt19937 rng(6);
  const T angles[] = {T(0.5), T(3), T(45), T(120), T(179), T(179.9), T(180), T(-170)};
  for (T angle : angles) {
    for (int k = 0; k < 20; ++k) {
      CNaxVector3<T> axis = CNaxVector3<T>(std::uniform_real_distribution<T>(-1, 1)(rng),
                                           std::uniform_real_distribution<T>(-1, 1)(rng), T(0.5));
      axis.Normalize();
      CNaxMatrix3<T> m, back;
      m.SetRotationByAngleAxis(angle, axis);
      T a;
      CNaxVector3<T> n;
      m.ExtractRotationAngleAxis(a, n);
      EXPECT_NEAR(n.Length(), T(1), T(1e-3)) << angle;
      back.SetRotationByAngleAxis(a, n);
      ExpectNear(back, m, std::is_same_v<T, float> ? T(2e-3) : T(1e-8));
      EXPECT_TRUE(a >= T(0) || a == T(-180));  // the angle lies in [0, 180], the axis turned to match
      if (std::fabs(angle) < 179) {
        EXPECT_NEAR((n * a - axis * angle).Length(), T(0), T(1e-2));
      }
    }
  }
  T a;
  CNaxVector3<T> n;
  Identity<T>().ExtractRotationAngleAxis(a, n);
  EXPECT_EQ(a, T(0));
  EXPECT_EQ(n, CNaxVector3<T>(1, 0, 0));
  // A zero axis is used unnormalised: the matrix becomes cos(angle) I.
  CNaxMatrix3<T> m;
  m.SetRotationByAngleAxis(T(60), CNaxVector3<T>());
  EXPECT_NEAR(m(0, 0), T(0.5), Eps<T>());
  EXPECT_EQ(m(0, 1), T(0));
}

TYPED_TEST(Matrix3Test, PlaneTransformsAndTheirQuirks) {
  using T = TypeParam;
  CNaxMatrix3<T> m = Identity<T>();
  m.Rotate(T(0.3), 1);
  m.Translate(T(2), T(3), 1);
  EXPECT_EQ(m.IsRotation(Eps<T>()), 1);  // the translation column isn't examined
  EXPECT_EQ(m.IsCoordinateMatrix(Eps<T>()), 1);
  CNaxMatrix3<T> inv;
  ASSERT_EQ(m.InverseCoordinateMatrix(inv), 1);
  ExpectNear(inv * m, Identity<T>(), Eps<T>() * 10);
  // Left and right products agree with explicit matrices.
  std::mt19937 rng(8);
  const CNaxMatrix3<T> a = Random<T>(rng);
  CNaxMatrix3<T> r = Identity<T>(), s = Identity<T>(), t = Identity<T>();
  r.Rotate(T(0.7), 1);
  s.Scale(T(2), T(-3), 1);
  t.Translate(T(4), T(5), 1);
  for (int left = 0; left < 2; ++left) {
    CNaxMatrix3<T> b = a;
    b.Rotate(T(0.7), left);
    ExpectNear(b, left ? r * a : a * r, Eps<T>() * 10);
    b = a;
    b.Scale(T(2), T(-3), left);
    ExpectNear(b, left ? s * a : a * s, Eps<T>() * 10);
  }
  CNaxMatrix3<T> b = a;
  b.Translate(T(4), T(5), 1);
  ExpectNear(b, t * a, Eps<T>() * 10);
  // With left 0 each translation component deliberately gains a(2,2).
  CNaxMatrix3<T> id = Identity<T>();
  id.Translate(T(4), T(5), 0);
  EXPECT_EQ(id(0, 2), T(5));
  EXPECT_EQ(id(1, 2), T(6));
  EXPECT_EQ(id(2, 2), T(1));
  // IsRotation looks for a plane transform: a rotation of space about X fails.
  EXPECT_EQ(Elementary<T>(0, T(30)).IsRotation(Eps<T>()), 0);
  EXPECT_EQ(Elementary<T>(2, T(30)).IsRotation(Eps<T>()), 1);
  EXPECT_EQ(t.IsTranslation(Eps<T>()), 1);
  EXPECT_EQ(s.IsScaling(Eps<T>()), 1);
  EXPECT_EQ(s.IsTranslation(Eps<T>()), 0);
  EXPECT_EQ(a.Reflect()(0, 1), -a(0, 1));
  EXPECT_EQ(a.Reflect()(2, 1), a(2, 1));
}

TYPED_TEST(Matrix3Test, DiagInverseAnnulationAndConversions) {
  using T = TypeParam;
  const CNaxMatrix3<T> m(1, 2, 3, 4, 5, 6, 7, 8, 9);
  EXPECT_NEAR(m.CorrelationCoefficient(m * T(2)), T(1), Eps<T>());
  CNaxMatrix3<T> p, inv;
  p.SetDiagonal(T(3));
  EXPECT_EQ(p.DiagInverse(inv, Eps<T>()), 1);
  EXPECT_NEAR(inv(1, 1), T(1) / 3, Eps<T>());
  EXPECT_EQ(m.DiagInverse(inv, Eps<T>()), 0);
  CNaxMatrix3<T> q = m;
  q.AnnulateSmallElements(T(4));  // strictly below tol becomes 0
  EXPECT_EQ(q, CNaxMatrix3<T>(0, 0, 0, 4, 5, 6, 7, 8, 9));
  EXPECT_EQ(m.ConvertToMatrixN()(2, 1), T(8));
  EXPECT_EQ(m.ConvertToMatrixMN()(1, 2), T(6));
}

}  // namespace
