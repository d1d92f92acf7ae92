// Instantiations of the rectangular matrix and its comparison routines.
#include "nax/matrix_mn.h"

#define NAX_MATRIX_MN_INSTANTIATE(T)                                                            \
  template class CNaxMatrixMN<T>;                                                               \
  template int32 naxAreAlmostEqual<T>(const CNaxMatrixMN<T>&, const CNaxMatrixMN<T>&, T);       \
  template int32 naxArePartsMatricesEqual<T>(const CNaxMatrixMN<T>&, int32, int32, int32, int32, \
                                             const CNaxMatrixMN<T>&, int32, int32, int32, int32, \
                                             T);                                                \
  template int32 naxIsMatrixEqualPartOfMatrix<T>(const CNaxMatrixMN<T>&, const CNaxMatrixMN<T>&, \
                                                 int32, int32, int32, int32, T);
NAX_MATRIX_MN_INSTANTIATE(float)
NAX_MATRIX_MN_INSTANTIATE(double)
