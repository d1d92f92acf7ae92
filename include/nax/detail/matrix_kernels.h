// Raw-array helpers shared by the run-time sized matrices: storage, element tests and the
// general product. Everything here works on contiguous row-major arrays.
#ifndef NAX_DETAIL_MATRIX_KERNELS_H
#define NAX_DETAIL_MATRIX_KERNELS_H

#include <algorithm>
#include <cmath>

#include "nax/scalar.h"
#include "nax/types.h"

namespace nax::detail {

/// c (m x n) = a (m x k) * b (k x n), all row-major and not aliased. Each element is the sum
/// of its k products added in index order starting from zero, so the result is bit-identical
/// to the plain triple loop; the real versions are register and cache blocked.
void MultiplyRaw(const double* a, const double* b, double* c, int32 m, int32 k, int32 n);
void MultiplyRaw(const float* a, const float* b, float* c, int32 m, int32 k, int32 n);

/// The plain product for the complex element types.
template <typename T>
void MultiplyRaw(const T* a, const T* b, T* c, int32 m, int32 k, int32 n) {
  for (int32 i = 0; i < m; ++i) {
    for (int32 j = 0; j < n; ++j) {
      T sum = T();
      for (int32 p = 0; p < k; ++p) sum += a[i * k + p] * b[p * n + j];
      c[i * n + j] = sum;
    }
  }
}

/// Inverse of the n x n (n = 2, 3 or 4) row-major a by the closed form of CNaxMatrix2,
/// CNaxMatrix3 or CNaxMatrix4: that class's status, and on 0 the n * n elements of the
/// inverse in result (untouched otherwise). The norm form also gives the fixed class's
/// condition number. Defined beside the fixed classes so that the headers stay acyclic.
int32 FixedInverse(int32 n, const double* a, double* result, double tol);
int32 FixedInverse(int32 n, const float* a, float* result, float tol);
int32 FixedInverse(int32 n, const double* a, double* result, naxMatrixNorm norm, double tol,
                   double& condition);
int32 FixedInverse(int32 n, const float* a, float* result, naxMatrixNorm norm, float tol,
                   float& condition);

}  // namespace nax::detail

#endif  // NAX_DETAIL_MATRIX_KERNELS_H
