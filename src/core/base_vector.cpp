#include "nax/base_vector.h"

template class CNaxBaseVector<float>;
template class CNaxBaseVector<double>;
template class CNaxBaseVector<int32>;
template class CNaxBaseVector<CNaxComplex<float>>;
template class CNaxBaseVector<CNaxComplex<double>>;
