// Conversions between the fixed matrices and their comparison within a tolerance.
#ifndef NAX_FIXED_MATRIX_ROUTINES_H
#define NAX_FIXED_MATRIX_ROUTINES_H

#include "nax/detail/array_ops.h"
#include "nax/matrix2.h"
#include "nax/matrix3.h"
#include "nax/matrix4.h"

/// 1 unless some |a - b| > tol, element by element (a difference of exactly tol is equal).
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxMatrix2<T>& a, const CNaxMatrix2<T>& b, T tol) {
  return nax::detail::ArraysAlmostEqual(4, a.Data(), b.Data(), tol);
}
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxMatrix3<T>& a, const CNaxMatrix3<T>& b, T tol) {
  return nax::detail::ArraysAlmostEqual(9, a.Data(), b.Data(), tol);
}
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxMatrix4<T>& a, const CNaxMatrix4<T>& b, T tol) {
  return nax::detail::ArraysAlmostEqual(16, a.Data(), b.Data(), tol);
}

/// The upper left 3 x 3 block.
template <typename T>
inline CNaxMatrix3<T> naxMatrix4To3(const CNaxMatrix4<T>& m) {
  return CNaxMatrix3<T>(m(0, 0), m(0, 1), m(0, 2), m(1, 0), m(1, 1), m(1, 2), m(2, 0), m(2, 1), m(2, 2));
}
/// m in the upper left, the rest 0, element (3, 3) 1.
template <typename T>
inline CNaxMatrix4<T> naxMatrix3To4(const CNaxMatrix3<T>& m) {
  return CNaxMatrix4<T>(m(0, 0), m(0, 1), m(0, 2), 0, m(1, 0), m(1, 1), m(1, 2), 0, m(2, 0), m(2, 1), m(2, 2), 0, 0, 0,
                        0, 1);
}
/// The upper left 2 x 2 block.
template <typename T>
inline CNaxMatrix2<T> naxMatrix3To2(const CNaxMatrix3<T>& m) {
  return CNaxMatrix2<T>(m(0, 0), m(0, 1), m(1, 0), m(1, 1));
}
/// m in the upper left, the rest 0, element (2, 2) 1.
template <typename T>
inline CNaxMatrix3<T> naxMatrix2To3(const CNaxMatrix2<T>& m) {
  return CNaxMatrix3<T>(m(0, 0), m(0, 1), 0, m(1, 0), m(1, 1), 0, 0, 0, 1);
}

#endif  // NAX_FIXED_MATRIX_ROUTINES_H
