#include "nax/algebra.h"

#include "nax/matrix_n.h"

template <typename T>
int32 CNaxAlgebra::SolveByCongugateGradient(const CNaxMatrixN<T>& matrix, const CNaxVectorN<T>& rhs,
                                            CNaxVectorN<T>& x, T tolerance, T regularisation) {
  const int32 n = matrix.Size();
  CNaxMatrixN<T> m(matrix);
  CNaxVectorN<T> b(rhs);
  // A matrix that is not symmetric and positive goes through the normal equations.
  if (!(m.IsSymmetric(tolerance) && m.IsPositive(tolerance))) {
    for (int32 i = 0; i < n; ++i) {
      for (int32 j = 0; j < n; ++j) {
        T s = T(0);
        for (int32 k = 0; k < n; ++k) s += matrix(k, i) * matrix(k, j);
        m(i, j) = s;
      }
      T s = T(0);
      for (int32 k = 0; k < n; ++k) s += matrix(k, i) * rhs[k];
      b[i] = s;
    }
  }
  const T bb = b.Dot(b);
  if (regularisation > nax::detail::DefaultTol<T>())
    for (int32 i = 0; i < n; ++i) m(i, i) += regularisation;
  CNaxMatrixN<T> p(n);
  if (!m.InvPreconditioner(p, T(1))) return 0;

  CNaxVectorN<T> r(n), dir(n), q(n), z(n), best(x);
  // r = b - m x, recomputed from x each round rather than updated by recurrence.
  auto residual = [&]() {
    for (int32 i = 0; i < n; ++i) {
      T s = b[i];
      for (int32 j = 0; j < n; ++j) s -= m(i, j) * x[j];
      r[i] = s;
    }
    return r.Dot(r);
  };
  // out = p r.
  auto precondition = [&](CNaxVectorN<T>& out) {
    for (int32 i = 0; i < n; ++i) {
      T s = T(0);
      for (int32 j = 0; j < n; ++j) s += p(i, j) * r[j];
      out[i] = s;
    }
  };
  T rr = residual();
  precondition(dir);
  T rho = r.Dot(dir);
  T bestRR = rr;
  const T goal = bb * tolerance * tolerance;
  const T limit = T(1000) * rr;
  const int32 cap = 100 * n;
  for (int32 count = 0; rr > goal && limit > rr && count < cap; ++count) {
    for (int32 i = 0; i < n; ++i) {
      T s = T(0);
      for (int32 j = 0; j < n; ++j) s += m(i, j) * dir[j];
      q[i] = s;
    }
    const T alpha = rho / dir.Dot(q);
    for (int32 i = 0; i < n; ++i) x[i] += alpha * dir[i];
    rr = residual();
    if (rr < bestRR) {
      bestRR = rr;
      best = x;
    }
    // z = r^T p, the row vector r times the preconditioner.
    for (int32 j = 0; j < n; ++j) {
      T s = T(0);
      for (int32 i = 0; i < n; ++i) s += p(i, j) * r[i];
      z[j] = s;
    }
    const T rhoNext = z.Dot(r);
    const T beta = rhoNext / rho;
    precondition(q);
    for (int32 i = 0; i < n; ++i) dir[i] = beta * dir[i] + q[i];
    rho = rhoNext;
  }
  if (rr <= goal) return 1;
  if (rr > bestRR) x = best;
  return 0;
}

NAX_ALGEBRA_DECLARE(, float)
NAX_ALGEBRA_DECLARE(, double)
template int32 CNaxAlgebra::Permutations<int32>(int32);
template uint32 CNaxAlgebra::Permutations<uint32>(uint32);
template int32 CNaxAlgebra::Combinations<int32>(int32, int32);
template uint32 CNaxAlgebra::Combinations<uint32>(uint32, uint32);
