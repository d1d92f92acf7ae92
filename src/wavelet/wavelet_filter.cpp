// Instantiations of the wavelet filter and the index routines of the transform.
#include "nax/wavelet_filter.h"

template class CNaxWaveletFilter<float>;
template class CNaxWaveletFilter<double>;

int32 naxSymExtension(int32 index, int32 size, int32 leftHalf, int32 rightHalf) {
  return nax::detail::SymExtension(index, size, leftHalf, rightHalf);
}

int32 naxCalculateMaximumDepth(int32 size) {
  int32 depth = 0;
  while (size >= 4) {
    ++depth;
    size /= 2;
  }
  return depth;
}

int32 naxCalculateMaximumDepth(int32 cols, int32 rows) {
  const int32 byCols = naxCalculateMaximumDepth(cols);
  const int32 byRows = naxCalculateMaximumDepth(rows);
  return byCols < byRows ? byCols : byRows;
}
