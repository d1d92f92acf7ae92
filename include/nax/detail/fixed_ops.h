// Element-wise loops and the inverse-based routines shared by the fixed matrices. Every
// bound is a compile-time constant, so the loops unroll and nothing allocates.
#ifndef NAX_DETAIL_FIXED_OPS_H
#define NAX_DETAIL_FIXED_OPS_H

#include <cmath>

#include "nax/detail/fixed_linalg.h"

namespace nax::detail {

// ---- Loops over the K elements of an array -------------------------------------------------

template <int K, typename T>
inline void CopyArray(const T* source, T* target) {
  for (int i = 0; i < K; ++i) target[i] = source[i];
}
template <int K, typename T>
inline void SetArray(T* a, T value) {
  for (int i = 0; i < K; ++i) a[i] = value;
}
template <int K, typename T>
inline void AddArray(T* a, const T* b) {
  for (int i = 0; i < K; ++i) a[i] += b[i];
}
template <int K, typename T>
inline void SubArray(T* a, const T* b) {
  for (int i = 0; i < K; ++i) a[i] -= b[i];
}
template <int K, typename T>
inline void MulArray(T* a, T value) {
  for (int i = 0; i < K; ++i) a[i] *= value;
}
template <int K, typename T>
inline void DivArray(T* a, T value) {
  for (int i = 0; i < K; ++i) a[i] /= value;
}

// ---- Rows, columns and the diagonal of a row-major N x N array -----------------------------

template <int N, typename T>
inline void SetRow(T* a, int32 row, const T* source) {
  CopyArray<N>(source, a + row * N);
}
template <int N, typename T>
inline void GetRow(const T* a, int32 row, T* target) {
  CopyArray<N>(a + row * N, target);
}
template <int N, typename T>
inline void SetColumn(T* a, int32 col, const T* source) {
  for (int i = 0; i < N; ++i) a[i * N + col] = source[i];
}
template <int N, typename T>
inline void GetColumn(const T* a, int32 col, T* target) {
  for (int i = 0; i < N; ++i) target[i] = a[i * N + col];
}
/// Zeros with value on the diagonal.
template <int N, typename T>
inline void SetDiagonal(T* a, T value) {
  SetArray<N * N>(a, T(0));
  for (int i = 0; i < N; ++i) a[i * N + i] = value;
}
/// Sum of the diagonal, from the first element on.
template <int N, typename T>
inline T Trace(const T* a) {
  T s = a[0];
  for (int i = 1; i < N; ++i) s += a[i * N + i];
  return s;
}
/// out = a v, each row summed from its first term on; out must not alias v.
template <int N, typename T>
inline void ProductVector(const T* a, const T* v, T* out) {
  for (int r = 0; r < N; ++r) {
    T s = a[r * N] * v[0];
    for (int k = 1; k < N; ++k) s += a[r * N + k] * v[k];
    out[r] = s;
  }
}

// ---- Norms and the routines built on a matrix's own inverse --------------------------------

/// The norm of the given kind; the max-element form is scaled by maxElementFactor (the
/// root of the element count, or the deliberate 3 of the 2 x 2 matrix); -1 if the singular
/// value decomposition of the spectral form fails.
template <int N, typename T>
inline T FixedNorm(const T* a, naxMatrixNorm norm, T maxElementFactor) {
  using Ops = Fixed<T, N>;
  switch (norm) {
    case naxMatrixNormOne: return Ops::NormOne(a);
    case naxMatrixNormInfinity: return Ops::NormInfinity(a);
    case naxMatrixNormSpectral: {
      T u[N * N], w[N], v[N * N];
      return Ops::SVD(a, u, w, v) == 0 ? w[0] : T(-1);
    }
    case naxMatrixNormMaxElement: return Ops::MaxAbsElement(a) * maxElementFactor;
    default: return Ops::NormFrobenius(a);
  }
}

/// Condition number of m in the given norm: the ratio of the extreme singular values, or
/// the norm of m times the norm of its inverse; 3.4028234663852886e38 when singular.
template <int N, typename M, typename T>
inline T FixedConditionNumber(const M& m, const T* a, naxMatrixNorm norm) {
  if (norm == naxMatrixNormSpectral) {
    T u[N * N], w[N], v[N * N];
    if (Fixed<T, N>::SVD(a, u, w, v) != 0 || w[N - 1] < MatrixFloor<T>()) return PseudoInfinity<T>();
    return w[0] / w[N - 1];
  }
  M inverse;
  T condition;
  if (m.Inverse(inverse, norm, DefaultTol<T>(), condition) != 0) return PseudoInfinity<T>();
  return condition;
}

/// m.Inverse(result, tol) with the condition number m.Norm(norm) * result.Norm(norm); on
/// failure 3, the condition 3.4028234663852886e38 and result unchanged.
template <typename M, typename T>
inline int32 InverseWithCondition(const M& m, M& result, naxMatrixNorm norm, T tol, T& condition) {
  if (m.Inverse(result, tol) != 0) {
    condition = PseudoInfinity<T>();
    return 3;
  }
  condition = m.Norm(norm) * result.Norm(norm);
  return 0;
}

/// Solves m x = rhs through m's inverse; the status of Inverse, solution unchanged unless 0.
template <typename M, typename V, typename T>
inline int32 SolveByInverse(const M& m, const V& rhs, V& solution, T tol) {
  M inverse;
  const int32 status = m.Inverse(inverse, tol);
  if (status == 0) solution = inverse * rhs;
  return status;
}
/// SolveByInverse through the inverse that also yields the condition number.
template <typename M, typename V, typename T>
inline int32 SolveByInverse(const M& m, const V& rhs, V& solution, naxMatrixNorm norm, T tol, T& condition) {
  M inverse;
  const int32 status = m.Inverse(inverse, norm, tol, condition);
  if (status == 0) solution = inverse * rhs;
  return status;
}

}  // namespace nax::detail

#endif  // NAX_DETAIL_FIXED_OPS_H
