// Instantiations of the run-time sized matrix container.
#include "nax/base_matrix.h"

template class CNaxBaseMatrix<float>;
template class CNaxBaseMatrix<double>;
template class CNaxBaseMatrix<CNaxComplex<float>>;
template class CNaxBaseMatrix<CNaxComplex<double>>;
