// Instantiations of the multi-plane image decomposition.
#include "nax/wavelet_decomposition.h"

template class CNaxWaveletDecomposition<float>;
template class CNaxWaveletDecomposition<double>;
