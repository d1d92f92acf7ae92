// All of nax: every public header of the library.
#ifndef NAX_NAX_H
#define NAX_NAX_H

#include "nax/types.h"
#include "nax/scalar.h"
#include "nax/complex.h"
#include "nax/base_vector.h"
#include "nax/vector_n.h"
#include "nax/rotations_order.h"
#include "nax/vector2.h"
#include "nax/vector3.h"
#include "nax/vector4.h"
#include "nax/vector_routines.h"
#include "nax/base_matrix.h"
#include "nax/matrix_mn.h"
#include "nax/matrix_n.h"
#include "nax/matrix2.h"
#include "nax/matrix3.h"
#include "nax/matrix4.h"
#include "nax/fixed_matrix_routines.h"
#include "nax/algebra.h"
#include "nax/interpolation.h"
#include "nax/sorting.h"
#include "nax/statistics.h"
#include "nax/random.h"
#include "nax/wavelet_filter.h"
#include "nax/lifting.h"
#include "nax/channel.h"
#include "nax/wavelet_decomposition.h"

#endif  // NAX_NAX_H
