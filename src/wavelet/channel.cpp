// Instantiations of the channel and its wavelet transform.
#include "nax/channel.h"

template class CNaxChannel<float>;
template class CNaxChannel<double>;
template int32 naxAreChannelsAlmostEqual<float>(const CNaxChannel<float>*,
                                                const CNaxChannel<float>*, float);
template int32 naxAreChannelsAlmostEqual<double>(const CNaxChannel<double>*,
                                                 const CNaxChannel<double>*, double);
