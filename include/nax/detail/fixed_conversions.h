// Heap copies of the fixed matrices as run-time sized matrices. Kept apart from the class
// headers so that these need not include the run-time sized matrices.
#ifndef NAX_DETAIL_FIXED_CONVERSIONS_H
#define NAX_DETAIL_FIXED_CONVERSIONS_H

#include "nax/matrix2.h"
#include "nax/matrix3.h"
#include "nax/matrix4.h"
#include "nax/matrix_n.h"

template <typename T>
CNaxMatrixN<T> CNaxMatrix2<T>::ConvertToMatrixN() const {
  return CNaxMatrixN<T>(2, a);
}
template <typename T>
CNaxMatrixMN<T> CNaxMatrix2<T>::ConvertToMatrixMN() const {
  return CNaxMatrixMN<T>(2, 2, a);
}
template <typename T>
CNaxMatrixN<T> CNaxMatrix3<T>::ConvertToMatrixN() const {
  return CNaxMatrixN<T>(3, a);
}
template <typename T>
CNaxMatrixMN<T> CNaxMatrix3<T>::ConvertToMatrixMN() const {
  return CNaxMatrixMN<T>(3, 3, a);
}
template <typename T>
CNaxMatrixN<T> CNaxMatrix4<T>::ConvertToMatrixN() const {
  return CNaxMatrixN<T>(4, a);
}
template <typename T>
CNaxMatrixMN<T> CNaxMatrix4<T>::ConvertToMatrixMN() const {
  return CNaxMatrixMN<T>(4, 4, a);
}

#endif  // NAX_DETAIL_FIXED_CONVERSIONS_H
