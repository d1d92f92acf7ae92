// The route of the run-time sized inverses through the fixed 2 x 2, 3 x 3 and 4 x 4 classes.
#include "nax/detail/matrix_kernels.h"
#include "nax/matrix2.h"
#include "nax/matrix3.h"
#include "nax/matrix4.h"

namespace nax::detail {
namespace {

template <typename Fixed, typename T>
int32 InvertFixed(const T* a, T* result, T tol) {
  const Fixed m(a);
  Fixed inverse;
  const int32 status = m.Inverse(inverse, tol);
  if (status == 0) inverse.Dump(result);
  return status;
}

template <typename Fixed, typename T>
int32 InvertFixed(const T* a, T* result, naxMatrixNorm norm, T tol, T& condition) {
  const Fixed m(a);
  Fixed inverse;
  const int32 status = m.Inverse(inverse, norm, tol, condition);
  if (status == 0) inverse.Dump(result);
  return status;
}

template <typename T>
int32 FixedInverseOf(int32 n, const T* a, T* result, T tol) {
  switch (n) {
    case 2: return InvertFixed<CNaxMatrix2<T>>(a, result, tol);
    case 3: return InvertFixed<CNaxMatrix3<T>>(a, result, tol);
    case 4: return InvertFixed<CNaxMatrix4<T>>(a, result, tol);
    default: return 1;
  }
}

template <typename T>
int32 FixedInverseOf(int32 n, const T* a, T* result, naxMatrixNorm norm, T tol, T& condition) {
  switch (n) {
    case 2: return InvertFixed<CNaxMatrix2<T>>(a, result, norm, tol, condition);
    case 3: return InvertFixed<CNaxMatrix3<T>>(a, result, norm, tol, condition);
    case 4: return InvertFixed<CNaxMatrix4<T>>(a, result, norm, tol, condition);
    default: return 1;
  }
}

}  // namespace

int32 FixedInverse(int32 n, const double* a, double* result, double tol) {
  return FixedInverseOf(n, a, result, tol);
}
int32 FixedInverse(int32 n, const float* a, float* result, float tol) {
  return FixedInverseOf(n, a, result, tol);
}
int32 FixedInverse(int32 n, const double* a, double* result, naxMatrixNorm norm, double tol,
                   double& condition) {
  return FixedInverseOf(n, a, result, norm, tol, condition);
}
int32 FixedInverse(int32 n, const float* a, float* result, naxMatrixNorm norm, float tol,
                   float& condition) {
  return FixedInverseOf(n, a, result, norm, tol, condition);
}

}  // namespace nax::detail
