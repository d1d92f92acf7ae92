// Properties shared by the 2 x 2, 3 x 3 and 4 x 4 matrices, checked over random operands of
// every size and both element types: products against the plain loops, inverse and solve,
// the singular refusal, LU, QR and singular value reconstructions, and A v = lambda v.
#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include "matrix/matrix_test_support.h"

namespace {

using nax::test::Eps;
using nax::test::ExpectMatrixNear;
using nax::test::FixedIdentity;
using nax::test::RandomFixed;

template <typename M>
class FixedMatrixTest : public ::testing::Test {};
using FixedMatrices = ::testing::Types<CNaxMatrix2<float>, CNaxMatrix2<double>, CNaxMatrix3<float>,
                                       CNaxMatrix3<double>, CNaxMatrix4<float>, CNaxMatrix4<double>>;
TYPED_TEST_SUITE(FixedMatrixTest, FixedMatrices);

template <typename M>
using Elem = nax::test::ElementOf<M>;
template <typename M>
using VectorOf = decltype(std::declval<M>().Diagonal());

// The products against the plain loops over (row, column), bit for bit, and the element-wise
// arithmetic and row and column copies against their definitions.
TYPED_TEST(FixedMatrixTest, ProductsAndElementwiseMatchThePlainLoops) {
  using M = TypeParam;
  using T = Elem<M>;
  using V = VectorOf<M>;
  const int32 n = M().Size();
  std::mt19937 rng(1);
  for (int k = 0; k < 20; ++k) {
    const M a = RandomFixed<M>(rng), b = RandomFixed<M>(rng);
    const V x = RandomFixed<V>(rng);
    const T s = std::uniform_real_distribution<T>(T(0.5), T(2))(rng);
    const M product = a * b, sum = a + b, scaled = a / s;
    M pre = b, post = a, copy;
    pre.PreMultiply(a);
    post.PostMultiply(b);
    T trace = a(0, 0), line[4];
    for (int32 i = 0; i < n; ++i) {
      trace += i > 0 ? a(i, i) : T(0);
      T dot = a(i, 0) * x[0];
      for (int32 c = 1; c < n; ++c) dot += a(i, c) * x[c];
      EXPECT_EQ((a * x)[i], dot);
      for (int32 j = 0; j < n; ++j) {
        T e = a(i, 0) * b(0, j);
        for (int32 c = 1; c < n; ++c) e += a(i, c) * b(c, j);
        EXPECT_EQ(product(i, j), e);
        EXPECT_EQ(sum(i, j), a(i, j) + b(i, j));
        EXPECT_EQ((a - b)(i, j), a(i, j) - b(i, j));
        EXPECT_EQ(scaled(i, j), a(i, j) / s);
        EXPECT_EQ(a.Transpose()(j, i), -a.Negate()(i, j));
      }
      a.Column(i, line);
      copy.SetRow(i, line);
    }
    EXPECT_EQ(copy, a.Transpose());
    M back;
    for (int32 i = 0; i < n; ++i) copy.Row(i, line), back.SetColumn(i, line);
    EXPECT_EQ(back, a);
    EXPECT_EQ(a.Trace(), trace);
    EXPECT_EQ(pre, product);
    EXPECT_EQ(post, product);
    copy.SetDiagonal(s);
    EXPECT_EQ(copy, FixedIdentity<M>() * s);
  }
}

// A^-1 A = A A^-1 = I, the solve returns the right side's preimage, the condition number is
// the product of the norms, and det(A B) = det(A) det(B).
TYPED_TEST(FixedMatrixTest, InverseSolveAndDeterminant) {
  using M = TypeParam;
  using T = Elem<M>;
  using V = VectorOf<M>;
  std::mt19937 rng(2);
  for (int k = 0; k < 100; ++k) {
    const M m = RandomFixed<M>(rng), b = RandomFixed<M>(rng);
    EXPECT_NEAR((m * b).Det(), m.Det() * b.Det(), Eps<T>() * 100);
    if (std::fabs(m.Det()) < T(0.05)) continue;
    M inv;
    ASSERT_EQ(m.Inverse(inv, Eps<T>()), 0);
    ExpectMatrixNear(inv * m, FixedIdentity<M>(), Eps<T>() * 500);
    ExpectMatrixNear(m * inv, FixedIdentity<M>(), Eps<T>() * 500);
    const V x = RandomFixed<V>(rng);
    V solution;
    ASSERT_EQ(m.SolveSystem(m * x, solution, Eps<T>()), 0);
    EXPECT_NEAR((solution - x).Length(), T(0), Eps<T>() * 500);
    for (naxMatrixNorm norm : {naxMatrixNormOne, naxMatrixNormInfinity, naxMatrixNormSpectral}) {
      T condition;
      ASSERT_EQ(m.SolveSystem(m * x, solution, norm, Eps<T>(), condition), 0);
      EXPECT_NEAR(condition, m.Norm(norm) * inv.Norm(norm), condition * Eps<T>() * 100);
      EXPECT_GE(m.ConditionNumber(naxMatrixNormSpectral), T(1) - Eps<T>());
    }
  }
  // Singular: status 3, the result untouched, the pseudo-infinity as condition number.
  M singular = FixedIdentity<M>();
  singular(0, 0) = 0;
  M keep = FixedIdentity<M>() * T(7);
  T condition = 0;
  EXPECT_EQ(singular.Inverse(keep, Eps<T>()), 3);
  EXPECT_EQ(singular.Inverse(keep, naxMatrixNormOne, Eps<T>(), condition), 3);
  EXPECT_EQ(keep, FixedIdentity<M>() * T(7));
  EXPECT_EQ(condition, T(3.4028234663852886e38));
  for (naxMatrixNorm norm : {naxMatrixNormOne, naxMatrixNormSpectral})
    EXPECT_EQ(singular.ConditionNumber(norm), T(3.4028234663852886e38));
  V untouched(T(5));
  EXPECT_EQ(singular.SolveSystem(V(T(1)), untouched, Eps<T>()), 3);
  EXPECT_EQ(untouched, V(T(5)));
}

// LU, QR and A = U diag(w) V^T multiply back, with triangular, orthogonal factors and
// descending non-negative singular values.
TYPED_TEST(FixedMatrixTest, DecompositionsMultiplyBack) {
  using M = TypeParam;
  using T = Elem<M>;
  using V = VectorOf<M>;
  const int32 n = M().Size();
  std::mt19937 rng(3);
  for (int k = 0; k < 50; ++k) {
    const M m = RandomFixed<M>(rng);
    M l, u;
    if (m.LU_Decomposition(l, u, Eps<T>()) == 1) {
      EXPECT_EQ(l.IsLLTriangular(T(0)), 1);
      EXPECT_EQ(u.IsURTriangular(T(0)), 1);
      ExpectMatrixNear(l * u, m, Eps<T>() * 100);
    }
    M q, r;
    EXPECT_EQ(m.QR_Decomposition(q, r, Eps<T>()), 0);
    EXPECT_EQ(q.IsOrthogonal(Eps<T>() * 10), 1);
    EXPECT_EQ(r.IsURTriangular(T(0)), 1);
    ExpectMatrixNear(q * r, m, Eps<T>() * 100);
    M su, sv, d;
    V w;
    ASSERT_EQ(m.SV_Decomposition(su, sv, w, Eps<T>()), 0);
    EXPECT_EQ(su.IsOrthogonal(Eps<T>() * 10), 1);
    EXPECT_EQ(sv.IsOrthogonal(Eps<T>() * 10), 1);
    T product = 1;
    for (int32 i = 0; i < n; ++i) {
      d(i, i) = w[i], product *= w[i];
      EXPECT_GE(w[i], i + 1 < n ? w[i + 1] : T(0));
    }
    ExpectMatrixNear(su * d * sv.Transpose(), m, Eps<T>() * 100);
    EXPECT_NEAR(product, std::fabs(m.Det()), Eps<T>() * 100);
    EXPECT_NEAR(m.Norm(naxMatrixNormSpectral), w[0], Eps<T>() * 10);
  }
}

// The Jacobi eigensolver: ascending values with A v = lambda v for each column v; the
// spectral decomposition of a positive matrix multiplies back; asymmetry above tol refused.
TYPED_TEST(FixedMatrixTest, SymmetricEigenproblem) {
  using M = TypeParam;
  using T = Elem<M>;
  using V = VectorOf<M>;
  const int32 n = M().Size();
  std::mt19937 rng(4);
  int solved = 0;
  for (int k = 0; k < 50; ++k) {
    const M b = RandomFixed<M>(rng);
    const M s = b + b.Transpose();
    V values;
    M vectors;
    const naxStatus status = s.SymmetricEigensolve(values, vectors, Eps<T>());
    if (status == naxStatusTooManyRotations) continue;  // a count of exactly 50 rotations
    ASSERT_EQ(status, naxStatusOk);
    ++solved;
    for (int32 j = 0; j < n; ++j) {
      EXPECT_LE(values[j], j + 1 < n ? values[j + 1] : values[j]);
      const V v = vectors.ColVector(j);
      EXPECT_NEAR((s * v - v * values[j]).Length(), T(0), Eps<T>() * 100);
    }
    const M p = b * b.Transpose() + FixedIdentity<M>();
    M pv, pd;
    if (p.SpectralDecomposition(pv, pd, 1, Eps<T>()) == 1) ExpectMatrixNear(pv * pd * pv.Transpose(), p, Eps<T>() * 100);
  }
  EXPECT_GT(solved, 25);
  M asym = FixedIdentity<M>();
  asym(0, 1) = T(1e-3);
  V values;
  M vectors;
  EXPECT_EQ(asym.SymmetricEigensolve(values, vectors, T(1e-4)), naxStatusNotSymmetric);
}

}  // namespace
