// Kernels of the lifting steps: one step over the lines of a pair of polyphase halves.
//
// A step adds to (or, inverted, subtracts from) every target sample i the sum
// c[0] * src[e(i + s - N/2)] + ... + c[N-1] * src[e(i + s + N/2 - 1)], where e is the
// symmetric extension of the source. The interior runs over plain contiguous arrays; only
// the few samples near the ends go through the mirror. The two-tap step never calls it.
#ifndef NAX_DETAIL_WAVELET_LIFTING_H
#define NAX_DETAIL_WAVELET_LIFTING_H

#include "nax/types.h"
#include "nax/wavelet_filter.h"

namespace nax::detail {

/// Where a step reads and writes, and how its source is mirrored.
template <typename T>
struct LiftForm {
  const T* src;
  T* tgt;
  int32 srcLength;  // along the lifting axis
  int32 tgtLength;
  int32 shift;      // s: 1 in form A, 0 in form B
  int32 leftHalf;
  int32 rightHalf;
};

template <bool Inverse, typename T>
inline void Apply(T& target, T sum) {
  if constexpr (Inverse)
    target -= sum;
  else
    target += sum;
}

/// One line of a horizontal step: nT targets from nS contiguous source samples.
template <int N, bool Inverse, typename T>
void LiftLine(T* tgt, int32 nT, const T* src, int32 nS, int32 s, int32 lh, int32 rh,
              const T* c) {
  if (nT <= 0 || nS <= 0) return;
  if constexpr (N == 2) {
    const T c0 = c[0], c1 = c[1], cs = c[0] + c[1];
    if (s == 1) {  // form A: j = i + 1 reads src[i], src[i + 1]
      const int32 body = nT < nS - 1 ? nT : nS - 1;
      for (int32 i = 0; i < body; ++i) Apply<Inverse>(tgt[i], c0 * src[i] + c1 * src[i + 1]);
      for (int32 i = body; i < nT; ++i) Apply<Inverse>(tgt[i], cs * src[nS - 1]);
    } else {  // form B: j = i reads src[i - 1], src[i]; sample 0 repeats on the left
      Apply<Inverse>(tgt[0], cs * src[0]);
      const int32 body = nT < nS ? nT : nS;
      for (int32 i = 1; i < body; ++i) Apply<Inverse>(tgt[i], c0 * src[i - 1] + c1 * src[i]);
      for (int32 i = body > 1 ? body : 1; i < nT; ++i) Apply<Inverse>(tgt[i], cs * src[nS - 1]);
    }
  } else {
    constexpr int32 h = N / 2;
    // Targets whose taps all fall inside the source.
    int32 lo = h - s > 0 ? h - s : 0;
    int32 hi = nS - h - s + 1;
    if (lo > nT) lo = nT;
    if (hi > nT) hi = nT;
    if (hi < lo) hi = lo;
    auto mirrored = [&](int32 i) {
      const int32 base = i + s - h;
      T sum = c[0] * src[SymExtension(base, nS, lh, rh)];
      for (int32 t = 1; t < N; ++t) sum += c[t] * src[SymExtension(base + t, nS, lh, rh)];
      Apply<Inverse>(tgt[i], sum);
    };
    for (int32 i = 0; i < lo; ++i) mirrored(i);
    const T* p = src + s - h;
    for (int32 i = lo; i < hi; ++i) {
      T sum = c[0] * p[i];
      for (int32 t = 1; t < N; ++t) sum += c[t] * p[i + t];
      Apply<Inverse>(tgt[i], sum);
    }
    for (int32 i = hi; i < nT; ++i) mirrored(i);
  }
}

/// target row += sum over taps of c[t] * rows[t], element by element.
template <int N, bool Inverse, typename T>
inline void CombineRows(T* __restrict target, const T* const* rows, const T* c, int32 width) {
  if constexpr (N == 1) {
    const T c0 = c[0];
    const T* __restrict r0 = rows[0];
    for (int32 x = 0; x < width; ++x) Apply<Inverse>(target[x], c0 * r0[x]);
  } else if constexpr (N == 2) {
    const T c0 = c[0], c1 = c[1];
    const T* __restrict r0 = rows[0];
    const T* __restrict r1 = rows[1];
    for (int32 x = 0; x < width; ++x) Apply<Inverse>(target[x], c0 * r0[x] + c1 * r1[x]);
  } else if constexpr (N == 4) {
    const T c0 = c[0], c1 = c[1], c2 = c[2], c3 = c[3];
    const T *__restrict r0 = rows[0], *__restrict r1 = rows[1], *__restrict r2 = rows[2],
            *__restrict r3 = rows[3];
    for (int32 x = 0; x < width; ++x)
      Apply<Inverse>(target[x], c0 * r0[x] + c1 * r1[x] + c2 * r2[x] + c3 * r3[x]);
  } else {
    const T c0 = c[0], c1 = c[1], c2 = c[2], c3 = c[3], c4 = c[4], c5 = c[5];
    const T *__restrict r0 = rows[0], *__restrict r1 = rows[1], *__restrict r2 = rows[2],
            *__restrict r3 = rows[3], *__restrict r4 = rows[4], *__restrict r5 = rows[5];
    for (int32 x = 0; x < width; ++x)
      Apply<Inverse>(target[x], c0 * r0[x] + c1 * r1[x] + c2 * r2[x] + c3 * r3[x] + c4 * r4[x] +
                                    c5 * r5[x]);
  }
}

/// A vertical step: target rows [rowBegin, rowEnd) of `width` samples take whole source
/// rows. The same sums as LiftLine, with rows in place of samples.
template <int N, bool Inverse, typename T>
void LiftRowsOfLines(const LiftForm<T>& f, int32 width, int32 rowBegin, int32 rowEnd,
                     const T* c) {
  const int32 nS = f.srcLength, nT = f.tgtLength;
  if (nT <= 0 || nS <= 0 || width <= 0) return;
  if (rowEnd > nT) rowEnd = nT;
  auto row = [&](int32 r) { return f.src + static_cast<int64>(r) * width; };
  for (int32 i = rowBegin; i < rowEnd; ++i) {
    T* target = f.tgt + static_cast<int64>(i) * width;
    if constexpr (N == 2) {
      // The written-out two-tap cases: a border target takes (c0 + c1) times one row.
      const int32 a = i + f.shift - 1;  // first tap
      if (a >= 0 && a + 1 <= nS - 1) {
        const T* rows[2] = {row(a), row(a + 1)};
        CombineRows<2, Inverse>(target, rows, c, width);
      } else {
        const T cs[1] = {c[0] + c[1]};
        const T* rows[1] = {row(a < 0 ? 0 : nS - 1)};
        CombineRows<1, Inverse>(target, rows, cs, width);
      }
    } else {
      const T* rows[N];
      const int32 base = i + f.shift - N / 2;
      for (int32 t = 0; t < N; ++t) {
        const int32 p = base + t;
        rows[t] = row(p >= 0 && p < nS ? p : SymExtension(p, nS, f.leftHalf, f.rightHalf));
      }
      CombineRows<N, Inverse>(target, rows, c, width);
    }
  }
}

}  // namespace nax::detail

#endif  // NAX_DETAIL_WAVELET_LIFTING_H
