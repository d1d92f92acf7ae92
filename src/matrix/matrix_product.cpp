// The general product of row-major matrices for float and double.
//
// Each element of the result is the sum of its products added in index order, starting
// from zero, exactly as the plain triple loop adds them; only the schedule differs. The
// blocked form packs a panel of B and a block of A into contiguous strips (after Goto and
// van de Geijn, "Anatomy of high-performance matrix multiplication", ACM TOMS 34, 2008) and
// keeps an MR x NR tile of the result in registers while k runs in order. A tile that meets
// a later panel of k is reloaded from memory and continued, which keeps the order.
#include <algorithm>
#include <vector>

#include "nax/detail/matrix_kernels.h"

namespace nax::detail {
namespace {

// Register tile and cache blocks. The tile fills the SSE2 registers: MR rows of NR values
// of accumulators, the strip of B and one broadcast element of A.
template <typename T>
struct Blocking;
template <>
struct Blocking<double> {
  static constexpr int32 MR = 4, NR = 4, KC = 256, MC = 96, NC = 512;
};
template <>
struct Blocking<float> {
  static constexpr int32 MR = 4, NR = 8, KC = 256, MC = 96, NC = 1024;
};

// acc (MR x NR) = (first ? 0 : c) + ap (packed kc x MR) * bp (packed kc x NR), then stored
// to the mr x nr valid part of c.
template <typename T, int32 MR, int32 NR>
inline void MicroKernel(int32 kc, const T* __restrict ap, const T* __restrict bp,
                        T* __restrict c, int32 ldc, int32 mr, int32 nr, bool first) {
  T acc[MR][NR];
  if (first || mr < MR || nr < NR) {
    for (int32 r = 0; r < MR; ++r)
      for (int32 j = 0; j < NR; ++j) acc[r][j] = (!first && r < mr && j < nr) ? c[r * ldc + j] : T(0);
  } else {
    for (int32 r = 0; r < MR; ++r)
      for (int32 j = 0; j < NR; ++j) acc[r][j] = c[r * ldc + j];
  }
  for (int32 p = 0; p < kc; ++p) {
    const T* a = ap + p * MR;
    const T* b = bp + p * NR;
    for (int32 r = 0; r < MR; ++r) {
      const T ar = a[r];
      for (int32 j = 0; j < NR; ++j) acc[r][j] += ar * b[j];
    }
  }
  if (mr == MR && nr == NR) {
    for (int32 r = 0; r < MR; ++r)
      for (int32 j = 0; j < NR; ++j) c[r * ldc + j] = acc[r][j];
  } else {
    for (int32 r = 0; r < mr; ++r)
      for (int32 j = 0; j < nr; ++j) c[r * ldc + j] = acc[r][j];
  }
}

// Packs rows [i0, i0 + mc) and columns [p0, p0 + kc) of a (lda) into strips of MR rows,
// each stored k-major; missing rows of the last strip are zeros.
template <typename T, int32 MR>
void PackA(const T* a, int32 lda, int32 mc, int32 kc, T* out) {
  for (int32 i = 0; i < mc; i += MR) {
    const int32 mr = std::min(MR, mc - i);
    for (int32 p = 0; p < kc; ++p)
      for (int32 r = 0; r < MR; ++r) *out++ = r < mr ? a[(i + r) * lda + p] : T(0);
  }
}

// Packs a kc x nc panel of b (ldb) into strips of NR columns, each stored k-major.
template <typename T, int32 NR>
void PackB(const T* b, int32 ldb, int32 kc, int32 nc, T* out) {
  for (int32 j = 0; j < nc; j += NR) {
    const int32 nr = std::min(NR, nc - j);
    for (int32 p = 0; p < kc; ++p) {
      const T* row = b + p * ldb + j;
      if (nr == NR) {
        for (int32 q = 0; q < NR; ++q) out[q] = row[q];
      } else {
        for (int32 q = 0; q < NR; ++q) out[q] = q < nr ? row[q] : T(0);
      }
      out += NR;
    }
  }
}

// The plain i-k-j loop for small products, where packing does not pay.
template <typename T>
void MultiplySmall(const T* a, const T* b, T* c, int32 m, int32 k, int32 n) {
  for (int32 i = 0; i < m; ++i) {
    T* ci = c + i * n;
    std::fill(ci, ci + n, T(0));
    for (int32 p = 0; p < k; ++p) {
      const T aip = a[i * k + p];
      const T* bp = b + p * n;
      for (int32 j = 0; j < n; ++j) ci[j] += aip * bp[j];
    }
  }
}

template <typename T>
void MultiplyBlocked(const T* a, const T* b, T* c, int32 m, int32 k, int32 n) {
  using B = Blocking<T>;
  constexpr int32 MR = B::MR, NR = B::NR;
  if (m < 1 || n < 1) return;
  if (k < 1) {
    std::fill(c, c + m * n, T(0));
    return;
  }
  if (static_cast<int64>(m) * n * k < 16 * 1024 || m < MR || n < NR) {
    MultiplySmall(a, b, c, m, k, n);
    return;
  }
  const int32 kcMax = std::min(B::KC, k);
  const int32 ncMax = std::min(B::NC, n);
  const int32 mcMax = std::min(B::MC, m);
  std::vector<T> bPack(static_cast<size_t>(kcMax) * ((ncMax + NR - 1) / NR * NR));
  std::vector<T> aPack(static_cast<size_t>(kcMax) * ((mcMax + MR - 1) / MR * MR));
  for (int32 jc = 0; jc < n; jc += B::NC) {
    const int32 nc = std::min(B::NC, n - jc);
    for (int32 pc = 0; pc < k; pc += B::KC) {
      const int32 kc = std::min(B::KC, k - pc);
      PackB<T, NR>(b + pc * n + jc, n, kc, nc, bPack.data());
      for (int32 ic = 0; ic < m; ic += B::MC) {
        const int32 mc = std::min(B::MC, m - ic);
        PackA<T, MR>(a + ic * k + pc, k, mc, kc, aPack.data());
        for (int32 jr = 0; jr < nc; jr += NR) {
          const T* bp = bPack.data() + jr * kc;
          for (int32 ir = 0; ir < mc; ir += MR) {
            MicroKernel<T, MR, NR>(kc, aPack.data() + ir * kc, bp, c + (ic + ir) * n + jc + jr,
                                   n, std::min(MR, mc - ir), std::min(NR, nc - jr), pc == 0);
          }
        }
      }
    }
  }
}

}  // namespace

void MultiplyRaw(const double* a, const double* b, double* c, int32 m, int32 k, int32 n) {
  MultiplyBlocked(a, b, c, m, k, n);
}

void MultiplyRaw(const float* a, const float* b, float* c, int32 m, int32 k, int32 n) {
  MultiplyBlocked(a, b, c, m, k, n);
}

}  // namespace nax::detail
