#include "nax/complex.h"

#define NAX_COMPLEX_INSTANTIATE(T)                                                   \
  template class CNaxComplex<T>;                                                     \
  template void naxAbsMaxInArray<T>(int32, const CNaxComplex<T>*, T&, int32&);       \
  template void naxAbsMinInArray<T>(int32, const CNaxComplex<T>*, T&, int32&);
NAX_COMPLEX_INSTANTIATE(float)
NAX_COMPLEX_INSTANTIATE(double)
