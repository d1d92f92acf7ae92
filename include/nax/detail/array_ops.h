// Reductions and element-wise loops over raw contiguous arrays, shared by the run-time
// sized vectors and matrices.
//
// The floating-point reductions keep eight independent partial sums so that the compiler
// can keep them in vector registers; only the last bits of a sum depend on that order.
#ifndef NAX_DETAIL_ARRAY_OPS_H
#define NAX_DETAIL_ARRAY_OPS_H

#include <cmath>
#include <cstring>
#include <new>
#include <type_traits>

#include "nax/complex.h"
#include "nax/types.h"

namespace nax::detail {

template <typename T>
inline constexpr bool kIsFloat = std::is_floating_point_v<T>;

template <typename T>
struct ScalarOfImpl {
  using type = T;
};
template <typename T>
struct ScalarOfImpl<CNaxComplex<T>> {
  using type = T;
};
/// The scalar type under an element type: T itself, or the part type of a complex number.
template <typename T>
using ScalarOf = typename ScalarOfImpl<T>::type;

/// Sets n elements to a scalar value (complex elements become that real number exactly).
template <typename T>
void SetElements(int32 n, T* data, ScalarOf<T> value) {
  for (int32 i = 0; i < n; ++i) data[i] = value;
}

/// Sum of a[i] * b[i] over n elements.
template <typename T>
T DotArrays(int32 n, const T* a, const T* b) {
  if constexpr (kIsFloat<T>) {
    T acc[8] = {};
    int32 i = 0;
    for (; i + 8 <= n; i += 8)
      for (int32 j = 0; j < 8; ++j) acc[j] += a[i + j] * b[i + j];
    T sum = ((acc[0] + acc[4]) + (acc[1] + acc[5])) + ((acc[2] + acc[6]) + (acc[3] + acc[7]));
    for (; i < n; ++i) sum += a[i] * b[i];
    return sum;
  } else {
    T sum = T(0);
    for (int32 i = 0; i < n; ++i) sum += a[i] * b[i];
    return sum;
  }
}

/// Sum of a[i]^2 over n elements.
template <typename T>
T SumSquares(int32 n, const T* a) {
  return DotArrays(n, a, a);
}

/// Sum of |a[i]| over n elements.
template <typename T>
T SumAbs(int32 n, const T* a) {
  T acc[8] = {};
  int32 i = 0;
  for (; i + 8 <= n; i += 8)
    for (int32 j = 0; j < 8; ++j) acc[j] += std::fabs(a[i + j]);
  T sum = ((acc[0] + acc[4]) + (acc[1] + acc[5])) + ((acc[2] + acc[6]) + (acc[3] + acc[7]));
  for (; i < n; ++i) sum += std::fabs(a[i]);
  return sum;
}

/// Storage of n elements from the global allocation operator: raw and zero-filled for the
/// arithmetic types; constructed objects, each assigned zero, for the complex types.
/// Zero elements give a null pointer.
template <typename T>
T* AllocateZeroed(int32 n) {
  if (n <= 0) return nullptr;
  if constexpr (kIsComplex<T>) {
    T* data = new T[n];
    SetElements(n, data, ScalarOf<T>(0));
    return data;
  } else {
    T* data = static_cast<T*>(::operator new(sizeof(T) * static_cast<std::size_t>(n)));
    std::memset(data, 0, sizeof(T) * static_cast<std::size_t>(n));
    return data;
  }
}

/// Storage of n elements, even when n is 0 (a non-null empty array).
template <typename T>
T* AllocateZeroedAlways(int32 n) {
  if (n > 0) return AllocateZeroed<T>(n);
  if constexpr (kIsComplex<T>) {
    return new T[0];
  } else {
    return static_cast<T*>(::operator new(0));
  }
}

/// Releases storage from AllocateZeroed; null is ignored.
template <typename T>
void Release(T* data) {
  if (!data) return;
  if constexpr (kIsComplex<T>) {
    delete[] data;
  } else {
    ::operator delete(data);
  }
}

/// Copies n elements; complex elements go through their own assignment.
template <typename T>
void CopyElements(int32 n, const T* source, T* target) {
  if (n <= 0) return;
  if constexpr (kIsComplex<T>) {
    for (int32 i = 0; i < n; ++i) target[i] = source[i];
  } else {
    std::memcpy(target, source, sizeof(T) * static_cast<std::size_t>(n));
  }
}

/// Storage of n elements copied from source.
template <typename T>
T* AllocateCopy(int32 n, const T* source) {
  T* data = AllocateZeroed<T>(n);
  CopyElements(n, source, data);
  return data;
}

/// |a - b| as the element comparisons measure it: naxAbs for complex elements.
template <typename T>
inline auto AbsDifference(const T& a, const T& b) {
  if constexpr (kIsComplex<T>) {
    return naxAbs(a - b);
  } else if constexpr (kIsFloat<T>) {
    return std::fabs(a - b);
  } else {
    return a > b ? a - b : b - a;
  }
}

/// 1 when no element pair differs by more than tol (a difference of exactly tol is equal).
template <typename T, typename Tol>
int32 ArraysAlmostEqual(int32 n, const T* a, const T* b, Tol tol) {
  for (int32 i = 0; i < n; ++i)
    if (AbsDifference(a[i], b[i]) > tol) return 0;
  return 1;
}

}  // namespace nax::detail

#endif  // NAX_DETAIL_ARRAY_OPS_H
