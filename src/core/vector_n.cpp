#include "nax/vector_n.h"

template class CNaxVectorN<float>;
template class CNaxVectorN<double>;
