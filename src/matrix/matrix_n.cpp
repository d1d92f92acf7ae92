// Instantiations of the square matrix.
#include "nax/matrix_n.h"

template class CNaxMatrixN<float>;
template class CNaxMatrixN<double>;
