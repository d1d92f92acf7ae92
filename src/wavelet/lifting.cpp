// Instantiations of the lifting record.
#include "nax/lifting.h"

template class CNaxLifting<float>;
template class CNaxLifting<double>;
