// Instantiations of the channel, its wavelet transform and editing, and the rectangle copies.
#include "nax/channel.h"

template class CNaxChannel<float>;
template class CNaxChannel<double>;
template int32 naxAreChannelsAlmostEqual<float>(const CNaxChannel<float>*,
                                                const CNaxChannel<float>*, float);
template int32 naxAreChannelsAlmostEqual<double>(const CNaxChannel<double>*,
                                                 const CNaxChannel<double>*, double);
template void naxInsertRectData<float>(const float*, float*, int32, int32, int32, int32, int32);
template void naxInsertRectData<double>(const double*, double*, int32, int32, int32, int32,
                                        int32);
template void naxExtractRectData<float>(const float*, int32, int32, int32, int32, int32, float*);
template void naxExtractRectData<double>(const double*, int32, int32, int32, int32, int32,
                                         double*);
template void naxInsertPartRectData<float>(const float*, float*, int32, int32, int32, int32,
                                           int32, int32, int32, int32);
template void naxInsertPartRectData<double>(const double*, double*, int32, int32, int32, int32,
                                            int32, int32, int32, int32);
