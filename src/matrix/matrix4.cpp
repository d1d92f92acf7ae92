#include "nax/detail/fixed_conversions.h"
#include "nax/matrix4.h"

template class CNaxMatrix4<float>;
template class CNaxMatrix4<double>;
