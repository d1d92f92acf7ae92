#include "nax/detail/fixed_conversions.h"
#include "nax/matrix2.h"

template class CNaxMatrix2<float>;
template class CNaxMatrix2<double>;
