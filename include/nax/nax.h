// All of nax: every public header of the library.
#ifndef NAX_NAX_H
#define NAX_NAX_H

#include "nax/types.h"
#include "nax/scalar.h"
#include "nax/complex.h"
#include "nax/base_vector.h"
#include "nax/vector_n.h"
#include "nax/sorting.h"
#include "nax/statistics.h"
#include "nax/random.h"
#include "nax/wavelet_filter.h"
#include "nax/lifting.h"
#include "nax/channel.h"

#endif  // NAX_NAX_H
