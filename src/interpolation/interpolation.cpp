#include "nax/interpolation.h"

#include <memory>

#include "nax/detail/interpolation_resample.h"

namespace nax::detail {

/// Aitken's scheme in place over a heap copy w of y: after step i, w[j] for j > i is the
/// value at `at` of the polynomial through nodes 0..i and j. The copy is the only allocation.
template <typename T>
T AitkenInterpolate(int32 n, const T* x, const T* y, T at) {
  if (n < 1) return T(0);
  std::unique_ptr<T[]> copy(new T[n]);
  T* w = copy.get();
  for (int32 i = 0; i < n; ++i) w[i] = y[i];
  for (int32 i = 0; i < n; ++i) {
    const T xi = x[i] - at, wi = w[i];
    for (int32 j = i + 1; j < n; ++j) w[j] = ((x[j] - at) * wi - xi * w[j]) / (x[j] - x[i]);
  }
  return w[n - 1];
}

}  // namespace nax::detail

template <typename T>
T CNaxInterpolation::PolynomialInterpolate(int32 n, const T* x, const T* y, T at) {
  return nax::detail::AitkenInterpolate(n, x, y, at);
}

template <typename T>
T CNaxInterpolation::LagrangeInterpolation(int32 n, const T* x, const T* y, T at) {
  return nax::detail::AitkenInterpolate(n, x, y, at);
}

template <typename T>
void CNaxInterpolation::InterpolateData2DBilinear(int32 srcRows, int32 srcColumns, int32 dstRows,
                                                  int32 dstColumns, const T* src, T* dst) {
  nax::detail::Resample2D<T, T>(srcRows, srcColumns, dstRows, dstColumns, src, dst);
}

template <typename T>
void CNaxInterpolation::InterpolateVectorData2DBilinear(int32 srcRows, int32 srcColumns, int32 dstRows,
                                                        int32 dstColumns, const CNaxVector3<T>* src,
                                                        CNaxVector3<T>* dst) {
  nax::detail::Resample2D<T, CNaxVector3<T>>(srcRows, srcColumns, dstRows, dstColumns, src, dst);
}

template <typename T>
void CNaxInterpolation::InterpolateVectorData2DBilinear(int32 srcRows, int32 srcColumns, int32 dstRows,
                                                        int32 dstColumns, const CNaxVector4<T>* src,
                                                        CNaxVector4<T>* dst) {
  nax::detail::Resample2D<T, CNaxVector4<T>>(srcRows, srcColumns, dstRows, dstColumns, src, dst);
}

template <typename T>
void CNaxInterpolation::SpreadData2DTwice(int32 rows, int32 columns, naxInterpolationDirection direction,
                                          const T* src, T* dst) {
  if (rows < 1 || columns < 1) return;
  switch (direction) {
    case naxInterpolationVertical:
      nax::detail::SpreadRows<T>(rows, columns, src, dst);
      break;
    case naxInterpolationHorizontal:  // rows are contiguous: one run over the whole array
      nax::detail::RepeatEachTwice<T>(int64(rows) * columns, src, dst);
      break;
    default:
      nax::detail::SpreadBlocks<T>(rows, columns, src, dst);
      break;
  }
}

template <typename T>
void CNaxInterpolation::SqueezeData2DTwice(int32 rows, int32 columns, naxInterpolationDirection direction,
                                           const T* src, T* dst) {
  if (rows < 1 || columns < 1) return;
  switch (direction) {
    case naxInterpolationVertical:
      nax::detail::AverageRowPairs<T, T>(rows, columns, src, dst);
      break;
    case naxInterpolationHorizontal:
      nax::detail::AveragePairs<T, T>(int64(rows) * columns, src, dst);
      break;
    default:  // second run `columns` after the first, steps of three times `columns`
      nax::detail::AverageBlocks<T, T>(rows, columns, columns, 3 * int64(columns), src, dst);
      break;
  }
}

NAX_INTERPOLATION_INSTANTIATE(, float)
NAX_INTERPOLATION_INSTANTIATE(, double)
