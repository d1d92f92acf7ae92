// Shape rule of a polyphase split and the row shuffles between a signal and its halves.
#ifndef NAX_DETAIL_WAVELET_CHANNEL_H
#define NAX_DETAIL_WAVELET_CHANNEL_H

#include "nax/types.h"

namespace nax::detail {

/// Samples with an even absolute coordinate form the low half: the ceiling of n/2 for an
/// even start `offset`, the floor for an odd one (parity by remainder, so negative works).
inline int32 LowLength(int32 n, int32 offset) { return offset % 2 == 0 ? (n + 1) / 2 : n / 2; }
inline int32 HighLength(int32 n, int32 offset) { return n - LowLength(n, offset); }
/// Offsets of the halves, truncating toward zero.
inline int32 LowOffset(int32 offset) { return (offset + 1) / 2; }
inline int32 HighOffset(int32 offset) { return offset / 2; }
/// 1 when the absolute coordinate `offset + index` is odd.
inline int32 IsOdd(int32 offset, int32 index) { return (offset + index) & 1; }

/// An inclusive range of indices along one axis; empty when last < first.
struct Span1D {
  int32 first;
  int32 last;
  int32 Length() const { return last >= first ? last - first + 1 : 0; }
};

/// Indices, within the low (or high) half, of the samples first..last of a signal that
/// starts at absolute coordinate `offset`.
inline Span1D LowSpan(Span1D s, int32 offset) {
  return {LowLength(s.first, offset), LowLength(s.last + 1, offset) - 1};
}
inline Span1D HighSpan(Span1D s, int32 offset) {
  return {HighLength(s.first, offset), HighLength(s.last + 1, offset) - 1};
}

/// Deals the n samples of one row to its halves: the samples at even absolute positions
/// (the first one when `firstOdd` is 0) to `low`, the others to `high`.
template <typename T>
void DealRow(const T* __restrict src, int32 n, int32 firstOdd, T* __restrict low,
             T* __restrict high) {
  T* __restrict a = firstOdd ? high : low;  // takes positions 0, 2, 4, ...
  T* __restrict b = firstOdd ? low : high;  // takes positions 1, 3, 5, ...
  const int32 pairs = n / 2;
  for (int32 i = 0; i < pairs; ++i) {
    a[i] = src[2 * i];
    b[i] = src[2 * i + 1];
  }
  if (n & 1) a[pairs] = src[n - 1];
}

/// Reverse of DealRow: interleaves the halves back into n samples.
template <typename T>
void MergeRow(T* __restrict dst, int32 n, int32 firstOdd, const T* __restrict low,
              const T* __restrict high) {
  const T* __restrict a = firstOdd ? high : low;
  const T* __restrict b = firstOdd ? low : high;
  const int32 pairs = n / 2;
  for (int32 i = 0; i < pairs; ++i) {
    dst[2 * i] = a[i];
    dst[2 * i + 1] = b[i];
  }
  if (n & 1) dst[n - 1] = a[pairs];
}

}  // namespace nax::detail

#endif  // NAX_DETAIL_WAVELET_CHANNEL_H
