// Kernels of the two-dimensional resampling routines of CNaxInterpolation: doubling by
// repetition, halving by averaging, and the general bilinear resampler.
//
// Arrays are row-major and contiguous. Each kernel is written over an element type E (a
// scalar, or a fixed vector of scalars T) with E + E and E * T only, so that the inner loops
// stay free of calls and vectorise for the scalar types. Source and target are separate
// buffers.
//
// The general resampler works separably with the sample-centre convention: target sample i
// of an axis of n samples taken from m lies at source position (i + 0.5) m / n - 0.5,
// clamped to the first and last sample. Each source row is resampled along the row once
// into a small cache of two rows, and every target row is the blend of two cached rows.
#ifndef NAX_DETAIL_INTERPOLATION_RESAMPLE_H
#define NAX_DETAIL_INTERPOLATION_RESAMPLE_H

#include <cmath>
#include <vector>

#include "nax/types.h"

namespace nax::detail {

// ---- Doubling and halving -------------------------------------------------------------------

/// d[2i] = d[2i + 1] = s[i] for i < n.
template <typename E>
void RepeatEachTwice(int64 n, const E* s, E* d) {
  for (int64 i = 0; i < n; ++i) {
    d[2 * i] = s[i];
    d[2 * i + 1] = s[i];
  }
}

/// d[i] = s[i] for i < n.
template <typename E>
void CopyRun(int64 n, const E* s, E* d) {
  for (int64 i = 0; i < n; ++i) d[i] = s[i];
}

/// Every row of rows x columns written twice into 2 rows x columns.
template <typename E>
void SpreadRows(int32 rows, int32 columns, const E* src, E* dst) {
  for (int32 r = 0; r < rows; ++r) {
    const E* s = src + int64(r) * columns;
    E* d = dst + int64(2 * r) * columns;
    CopyRun<E>(columns, s, d);
    CopyRun<E>(columns, s, d + columns);
  }
}

/// Each sample of rows x columns as a 2 x 2 block of 2 rows x 2 columns.
template <typename E>
void SpreadBlocks(int32 rows, int32 columns, const E* src, E* dst) {
  const int64 width = 2 * int64(columns);
  for (int32 r = 0; r < rows; ++r) {
    E* d = dst + 2 * int64(r) * width;
    RepeatEachTwice<E>(columns, src + int64(r) * columns, d);
    CopyRun<E>(width, d, d + width);
  }
}

/// d[i] = (s[2i] + s[2i + 1]) / 2 for i < n: pairs along rows, rows being contiguous.
template <typename T, typename E>
void AveragePairs(int64 n, const E* s, E* d) {
  const T half = T(0.5);
  for (int64 i = 0; i < n; ++i) d[i] = (s[2 * i] + s[2 * i + 1]) * half;
}

/// Output rows x columns from 2 rows x columns: the mean of each pair of rows.
template <typename T, typename E>
void AverageRowPairs(int32 rows, int32 columns, const E* src, E* dst) {
  const T half = T(0.5);
  for (int32 r = 0; r < rows; ++r) {
    const E* a = src + int64(2 * r) * columns;
    const E* b = a + columns;
    E* d = dst + int64(r) * columns;
    for (int32 c = 0; c < columns; ++c) d[c] = (a[c] + b[c]) * half;
  }
}

/// Output rows x columns, each the mean of a pair along the first source row of its step and
/// the pair below it, the second row starting `second` elements after the first and the
/// first row of step r at r * step.
template <typename T, typename E>
void AverageBlocks(int32 rows, int32 columns, int64 second, int64 step, const E* src, E* dst) {
  const T quarter = T(0.25);
  for (int32 r = 0; r < rows; ++r) {
    const E* a = src + int64(r) * step;
    const E* b = a + second;
    E* d = dst + int64(r) * columns;
    for (int32 c = 0; c < columns; ++c) d[c] = ((a[2 * c] + a[2 * c + 1]) + (b[2 * c] + b[2 * c + 1])) * quarter;
  }
}

// ---- General bilinear resampling ------------------------------------------------------------

/// How one axis maps target samples onto source samples.
enum class AxisScale { kSame, kDouble, kHalf, kGeneral };

inline AxisScale ClassifyAxis(int32 source, int32 target) {
  if (target == source) return AxisScale::kSame;
  if (target == 2 * int64(source)) return AxisScale::kDouble;
  if (2 * int64(target) == source) return AxisScale::kHalf;
  return AxisScale::kGeneral;
}

/// Per target sample of one axis: the two source samples and their weights.
template <typename T>
struct AxisTaps {
  std::vector<int32> lo, hi;
  std::vector<T> wlo, whi;

  AxisTaps(int32 source, int32 target) : lo(target), hi(target), wlo(target), whi(target) {
    const AxisScale scale = ClassifyAxis(source, target);
    const double ratio = double(source) / double(target);
    for (int32 i = 0; i < target; ++i) {
      int32 k0 = i, k1 = i;
      double f = 0;
      if (scale == AxisScale::kDouble) {  // repetition, as the spread routine
        k0 = k1 = i / 2;
      } else if (scale == AxisScale::kHalf) {  // the mean of a pair, as the squeeze routine
        k0 = 2 * i, k1 = 2 * i + 1, f = 0.5;
      } else if (scale == AxisScale::kGeneral) {
        double p = (i + 0.5) * ratio - 0.5;
        if (p < 0) p = 0;
        if (p > source - 1) p = source - 1;
        k0 = int32(p);
        k1 = k0 + 1 < source ? k0 + 1 : k0;
        f = p - k0;
      }
      lo[i] = k0, hi[i] = k1;
      wlo[i] = T(1 - f), whi[i] = T(f);
    }
  }
};

/// d[i] = s[lo[i]] wlo[i] + s[hi[i]] whi[i] for i < n: one row along its length.
template <typename T, typename E>
void ResampleRow(int32 n, const E* s, const int32* lo, const int32* hi, const T* wlo, const T* whi, E* d) {
  for (int32 i = 0; i < n; ++i) d[i] = s[lo[i]] * wlo[i] + s[hi[i]] * whi[i];
}

/// d[i] = a[i] u + b[i] w for i < n: the blend of two rows.
template <typename T, typename E>
void BlendRows(int32 n, const E* a, const E* b, T u, T w, E* d) {
  for (int32 i = 0; i < n; ++i) d[i] = a[i] * u + b[i] * w;
}

/// Resamples src (srcRows x srcColumns) into dst (dstRows x dstColumns) by the taps of both
/// axes. Source rows are fetched in increasing order, so two cached rows suffice.
template <typename T, typename E>
void ResampleBilinear(int32 srcRows, int32 srcColumns, int32 dstRows, int32 dstColumns, const E* src, E* dst) {
  const AxisTaps<T> across(srcColumns, dstColumns), down(srcRows, dstRows);
  const bool sameColumns = srcColumns == dstColumns;
  std::vector<E> cache(sameColumns ? 0 : 2 * size_t(dstColumns));
  E* slot[2] = {cache.data(), cache.data() + (sameColumns ? 0 : dstColumns)};
  int32 tag[2] = {-1, -1};
  auto row = [&](int32 k) -> const E* {
    if (sameColumns) return src + int64(k) * srcColumns;
    if (tag[0] == k) return slot[0];
    if (tag[1] == k) return slot[1];
    const int32 older = tag[0] < tag[1] ? 0 : 1;
    ResampleRow<T, E>(dstColumns, src + int64(k) * srcColumns, across.lo.data(), across.hi.data(),
                      across.wlo.data(), across.whi.data(), slot[older]);
    tag[older] = k;
    return slot[older];
  };
  for (int32 r = 0; r < dstRows; ++r) {
    E* d = dst + int64(r) * dstColumns;
    const E* a = row(down.lo[r]);
    if (down.whi[r] == T(0)) {
      CopyRun<E>(dstColumns, a, d);
    } else {
      const E* b = row(down.hi[r]);
      BlendRows<T, E>(dstColumns, a, b, down.wlo[r], down.whi[r], d);
    }
  }
}

/// The resampling of InterpolateData2DBilinear: copies at equal sizes, repeats or averages
/// whole arrays when both axes keep, double or halve alike, and runs the general resampler
/// otherwise. Nothing happens when a size is below 1.
template <typename T, typename E>
void Resample2D(int32 srcRows, int32 srcColumns, int32 dstRows, int32 dstColumns, const E* src, E* dst) {
  if (srcRows < 1 || srcColumns < 1 || dstRows < 1 || dstColumns < 1) return;
  const AxisScale down = ClassifyAxis(srcRows, dstRows), across = ClassifyAxis(srcColumns, dstColumns);
  const bool keepDown = down == AxisScale::kSame, keepAcross = across == AxisScale::kSame;
  if (keepDown && keepAcross) {
    CopyRun<E>(int64(srcRows) * srcColumns, src, dst);
  } else if (keepDown && across == AxisScale::kDouble) {
    RepeatEachTwice<E>(int64(srcRows) * srcColumns, src, dst);
  } else if (down == AxisScale::kDouble && keepAcross) {
    SpreadRows<E>(srcRows, srcColumns, src, dst);
  } else if (down == AxisScale::kDouble && across == AxisScale::kDouble) {
    SpreadBlocks<E>(srcRows, srcColumns, src, dst);
  } else if (keepDown && across == AxisScale::kHalf) {
    AveragePairs<T, E>(int64(dstRows) * dstColumns, src, dst);
  } else if (down == AxisScale::kHalf && keepAcross) {
    AverageRowPairs<T, E>(dstRows, dstColumns, src, dst);
  } else if (down == AxisScale::kHalf && across == AxisScale::kHalf) {
    // The true 2 x 2 blocks of the source, whose rows are 2 dstColumns wide.
    AverageBlocks<T, E>(dstRows, dstColumns, 2 * int64(dstColumns), 4 * int64(dstColumns), src, dst);
  } else {
    ResampleBilinear<T, E>(srcRows, srcColumns, dstRows, dstColumns, src, dst);
  }
}

}  // namespace nax::detail

#endif  // NAX_DETAIL_INTERPOLATION_RESAMPLE_H
