#include "nax/vector2.h"
#include "nax/vector3.h"
#include "nax/vector4.h"

template class CNaxVector2<float>;
template class CNaxVector2<double>;
template class CNaxVector3<float>;
template class CNaxVector3<double>;
template class CNaxVector4<float>;
template class CNaxVector4<double>;
