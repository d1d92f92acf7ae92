#include "nax/statistics.h"

#define NAX_STATISTICS_INSTANTIATE(T)                                   \
  template class CNaxStatistics<T>;                                     \
  template T naxCalculateGaussIntegral<T>(T, T);                        \
  template void naxGetGaussWeights<T>(int32, T*);                       \
  template T naxGetPointOnNormalCurveGivenParams<T>(T, T, T);           \
  template T naxGetPointOnNormalCurveGivenEdges<T>(T, T, T);            \
  template void naxGetPointsOnNormalCurveGivenEdges<T>(T, T, int32, T*);                   \
  template void naxGetPointsOnNormalCurveGivenEdges<T>(T, T, int32, CNaxVector2<T>*);
NAX_STATISTICS_INSTANTIATE(float)
NAX_STATISTICS_INSTANTIATE(double)
