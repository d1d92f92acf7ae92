#include "nax/sorting.h"

#define NAX_SORTING_INSTANTIATE(T)                                               \
  template class CNaxSorting<T>;                                                 \
  template int32 naxIsArraySorted<T>(int32, const T*, T, int32, int32);          \
  template void naxSort<T>(int32, const T*, T*, int32, int32);                   \
  template void naxSort<T>(int32, int32, int32, const T*, T*, int32, int32);     \
  template void naxSort<T>(int32, const T*, T*, int32*, int32, int32);           \
  template void naxSort2DArray<T>(int32, const T*, T*, T, int32, int32, int32);
NAX_SORTING_FOR_EACH_TYPE(NAX_SORTING_INSTANTIATE)

template void naxSort2DVectors<float>(int32, int32, const CNaxVector2<float>*, CNaxVector2<float>*,
                                      float, int32, int32);
template void naxSort2DVectors<double>(int32, int32, const CNaxVector2<double>*,
                                       CNaxVector2<double>*, double, int32, int32);
