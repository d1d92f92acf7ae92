// Shared fixtures of the matrix, vector and algebra tests: random and structured operands,
// plain reference products and element-wise distances, for the run-time and the fixed sizes.
#ifndef NAX_TESTS_MATRIX_TEST_SUPPORT_H
#define NAX_TESTS_MATRIX_TEST_SUPPORT_H

#include <algorithm>
#include <cmath>
#include <random>
#include <type_traits>
#include <vector>

#include <gtest/gtest.h>

#include "nax/fixed_matrix_routines.h"
#include "nax/matrix_n.h"

namespace nax::test {

/// Uniform random matrix in [-1, 1].
template <typename T>
CNaxMatrixMN<T> RandomMatrix(int32 rows, int32 cols, std::mt19937& generator) {
  std::uniform_real_distribution<double> uniform(-1.0, 1.0);
  CNaxMatrixMN<T> m(rows, cols);
  for (int32 i = 0; i < rows * cols; ++i) m[i] = T(uniform(generator));
  return m;
}

/// Random matrix of the given rank: the product of rows x rank and rank x cols factors.
template <typename T>
CNaxMatrixMN<T> RandomOfRank(int32 rows, int32 cols, int32 rank, std::mt19937& generator) {
  const CNaxMatrixMN<T> a = RandomMatrix<T>(rows, rank, generator);
  const CNaxMatrixMN<T> b = RandomMatrix<T>(rank, cols, generator);
  return CNaxMatrixMN<T>(a * b);
}

/// Random symmetric matrix (B + B^T) / 2.
template <typename T>
CNaxMatrixN<T> RandomSymmetric(int32 n, std::mt19937& generator) {
  CNaxMatrixN<T> m(RandomMatrix<T>(n, n, generator));
  for (int32 i = 0; i < n; ++i)
    for (int32 j = 0; j < i; ++j) m(i, j) = m(j, i) = T(0.5) * (m(i, j) + m(j, i));
  return m;
}

/// Random matrix with n added to its diagonal, so that LU needs no pivoting.
template <typename T>
CNaxMatrixN<T> RandomDominant(int32 n, std::mt19937& generator) {
  CNaxMatrixN<T> m(RandomMatrix<T>(n, n, generator));
  for (int32 i = 0; i < n; ++i) m(i, i) += T(n);
  return m;
}

/// The n x n identity.
template <typename T = double>
CNaxMatrixN<T> Identity(int32 n) {
  CNaxMatrixN<T> m(n);
  m.Unit();
  return m;
}

/// Plain triple-loop product in double, the reference for the tests.
template <typename T>
std::vector<double> ReferenceProduct(const CNaxBaseMatrix<T>& a, const CNaxBaseMatrix<T>& b) {
  std::vector<double> c(a.RowsNb() * b.ColsNb(), 0.0);
  for (int32 i = 0; i < a.RowsNb(); ++i)
    for (int32 j = 0; j < b.ColsNb(); ++j) {
      double s = 0.0;
      for (int32 k = 0; k < a.ColsNb(); ++k) s += double(a(i, k)) * double(b(k, j));
      c[i * b.ColsNb() + j] = s;
    }
  return c;
}

/// Largest |a - b| over the elements of two matrices of the same shape.
template <typename T>
double MaxDifference(const CNaxBaseMatrix<T>& a, const CNaxBaseMatrix<T>& b) {
  double d = 0.0;
  for (int32 i = 0; i < a.RowsNb() * a.ColsNb(); ++i) d = std::max(d, std::fabs(double(a[i] - b[i])));
  return d;
}

/// Largest |(M^T M)(i, j) - delta(i, j)|: how far the columns of m are from orthonormal.
template <typename T>
double OrthogonalityError(const CNaxBaseMatrix<T>& m) {
  const CNaxBaseMatrix<T> product = m.Transpose() * m;
  double d = 0.0;
  for (int32 i = 0; i < product.RowsNb(); ++i)
    for (int32 j = 0; j < product.ColsNb(); ++j)
      d = std::max(d, std::fabs(double(product(i, j)) - (i == j ? 1.0 : 0.0)));
  return d;
}

// ---- Fixed sizes ------------------------------------------------------------------------------

using RealTypes = ::testing::Types<float, double>;

/// A tolerance near the rounding of T: 2e-4 for float, 1e-10 for double.
template <typename T>
T Eps() {
  return std::is_same_v<T, float> ? T(2e-4) : T(1e-10);
}

/// The element type of a fixed matrix or vector.
template <typename F>
using ElementOf = std::remove_cv_t<std::remove_reference_t<decltype(std::declval<F&>()[0])>>;

/// A fixed matrix (or vector) of k = RowsNb() * ColsNb() (or Dim()) uniform elements in [lo, hi].
template <typename F, typename T = ElementOf<F>>
F RandomFixed(std::mt19937& generator, T lo = T(-1), T hi = T(1)) {
  std::uniform_real_distribution<T> uniform(lo, hi);
  T v[16];
  for (T& x : v) x = uniform(generator);
  return F(v);
}

/// The identity of a fixed size.
template <typename M>
M FixedIdentity() {
  M m;
  m.Unit();
  return m;
}

/// Element-wise |a - b| <= tol over the first k elements of two fixed matrices or vectors.
template <typename F, typename T>
void ExpectFixedNear(const F& a, const F& b, T tol, int32 k) {
  for (int32 i = 0; i < k; ++i) EXPECT_NEAR(a[i], b[i], tol) << "element " << i;
}
template <typename M, typename T>
void ExpectMatrixNear(const M& a, const M& b, T tol) {
  ExpectFixedNear(a, b, tol, a.RowsNb() * a.ColsNb());
}

}  // namespace nax::test

#endif  // NAX_TESTS_MATRIX_TEST_SUPPORT_H
