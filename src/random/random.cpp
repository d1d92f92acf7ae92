#include "nax/random.h"

template class CNaxRandom<float>;
template class CNaxRandom<double>;
