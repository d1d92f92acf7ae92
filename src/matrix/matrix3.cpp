#include "nax/detail/fixed_conversions.h"
#include "nax/matrix3.h"

template class CNaxMatrix3<float>;
template class CNaxMatrix3<double>;
