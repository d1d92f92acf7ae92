// Biorthogonal spline wavelet filters in lifting form, and the index routines of the
// wavelet transform.
//
// The twelve filters are the Cohen-Daubechies-Feauveau biorthogonal spline wavelets (N, M),
// factored into two or three lifting steps. Reference: A. Cohen, I. Daubechies,
// J.-C. Feauveau, "Biorthogonal bases of compactly supported wavelets", Comm. Pure Appl.
// Math. 45 (1992), and I. Daubechies, W. Sweldens, "Factoring wavelet transforms into
// lifting steps", J. Fourier Anal. Appl. 4 (1998).
//
// A filter is pure data: the lifting record applies its coefficients and the channel its
// norms.
#ifndef NAX_WAVELET_FILTER_H
#define NAX_WAVELET_FILTER_H

#include "nax/types.h"

/// The twelve wavelets, named by the orders (N, M) of their primal and dual filters.
/// 1_1 is the Haar wavelet, 2_2 the 5/3 wavelet.
enum naxWaveletType : int32 {
  naxWavelet1_1 = 0,
  naxWavelet1_3 = 1,
  naxWavelet1_5 = 2,
  naxWavelet2_2 = 3,
  naxWavelet2_4 = 4,
  naxWavelet2_6 = 5,
  naxWavelet3_1 = 6,
  naxWavelet3_3 = 7,
  naxWavelet3_5 = 8,
  naxWavelet4_2 = 9,
  naxWavelet4_4 = 10,
  naxWavelet4_6 = 11
};

/// Scaling of the bands of a decomposition. Any value other than 0 and 1 acts as 2.
enum naxWaveletNormalization : int32 {
  naxNoNormalization = 0,             ///< coefficients stay as lifting leaves them
  naxNormalizationByFirstNorms = 1,   ///< scale by GetLowNorm(1) and GetHighNorm(1)
  naxNormalizationBySecondNorms = 2   ///< scale by GetLowNorm(0) and GetHighNorm(0)
};

/// Lifting coefficients, low-pass supports and band norms of one wavelet.
///
/// Types 0 to 5 lift in two steps (predict with the dual array, update with the prime
/// array); types 6 to 11 in three (update with prime, predict with dual, update with
/// prime2). The arrays are owned, but `operator=` shares them with its source (see there).
template <typename T>
class CNaxWaveletFilter {
  static_assert(nax::detail::kIsReal<T>, "CNaxWaveletFilter is defined for float and double");

 public:
  /// Empty filter: type -1, no arrays, both shifts -1.
  CNaxWaveletFilter();
  /// The filter of `type`, as Set(type).
  explicit CNaxWaveletFilter(naxWaveletType type);
  /// Copies the type, the sizes, the supports and the shifts and allocates arrays of the
  /// source's sizes; the coefficients and norms are not carried over (they are zero), so
  /// the copy must be Set before use.
  CNaxWaveletFilter(const CNaxWaveletFilter<T>& other);
  /// Releases the three arrays.
  ~CNaxWaveletFilter();

  /// Member-wise copy, the array pointers included: afterwards both filters refer to the
  /// same arrays and only one of them may be destroyed. The arrays held before are not
  /// released.
  CNaxWaveletFilter<T>& operator=(const CNaxWaveletFilter<T>& other);

  /// Stores the type only; the coefficients stay.
  void SetWavelet(naxWaveletType type) { m_type = type; }
  /// Fills the filter for the stored type. A type that is not 0, 1, 2 or 4 to 11 gives the
  /// 2_2 wavelet while the stored type stays. Arrays held before are not released.
  void Set();
  /// Stores the type, then fills as Set().
  void Set(naxWaveletType type);

  /// Each writes sizes, arrays, supports and norms of its wavelet (not the type or shifts).
  void Set1_1();
  void Set1_3();
  void Set1_5();
  void Set2_2();
  void Set2_4();
  void Set2_6();
  void Set3_1();
  void Set3_3();
  void Set3_5();
  void Set4_2();
  void Set4_4();
  void Set4_6();

  /// Allocates the prime and dual arrays and, for a non-zero prime2 size, the prime2 array
  /// (null otherwise), from the stored sizes.
  void AllocateMemory();

  naxWaveletType GetWavelet() const { return m_type; }
  int32 GetPrimeSize() const { return m_primeSize; }
  int32 GetDualSize() const { return m_dualSize; }
  int32 GetPrimeSize2() const { return m_prime2Size; }
  /// First and last index of the support of the primal low-pass filter.
  int32 GetPrimeStartInd() const { return m_primeStart; }
  int32 GetPrimeEndInd() const { return m_primeEnd; }
  /// First and last index of the support of the dual low-pass filter.
  int32 GetDualStartInd() const { return m_dualStart; }
  int32 GetDualEndInd() const { return m_dualEnd; }
  /// Stored shifts: -1 in every filter.
  int32 GetLowShift() const { return m_lowShift; }
  int32 GetHighShift() const { return m_highShift; }
  /// Low-band norm: index 0 gives the second normalization's factor, any other the first's.
  T GetLowNorm(int32 index) const { return index == 0 ? m_norms[0] : m_norms[2]; }
  /// High-band norm: index 0 gives the second normalization's factor, any other the first's.
  T GetHighNorm(int32 index) const { return index == 0 ? m_norms[1] : m_norms[3]; }

  /// The coefficient arrays themselves (update, predict, last update).
  T* PrimeCoefficients() const { return m_prime; }
  T* DualCoefficients() const { return m_dual; }
  T* Prime2Coefficients() const { return m_prime2; }

 private:
  // Sizes, allocation and coefficients in one call; used by every SetN_M.
  void Fill(int32 primeSize, const double* prime, const double* dual, int32 prime2Size,
            const double* prime2);
  void SetSupports(int32 primeStart, int32 primeEnd, int32 dualStart, int32 dualEnd);
  void SetNorms(double low0, double high0, double low1, double high1);

  naxWaveletType m_type;
  int32 m_primeSize;
  int32 m_dualSize;
  int32 m_prime2Size;
  T* m_prime;
  T* m_dual;
  T* m_prime2;
  int32 m_primeStart = 0;
  int32 m_primeEnd = 0;
  int32 m_dualStart = 0;
  int32 m_dualEnd = 0;
  int32 m_lowShift;
  int32 m_highShift;
  T m_norms[4] = {};  // low 0, high 0, low 1, high 1
};

namespace nax::detail {

/// Symmetric extension as naxSymExtension, inline for the lifting loops. A one-sample
/// sequence maps every index to 0, also where the general rule would have period 0.
inline int32 SymExtension(int32 index, int32 size, int32 leftHalf, int32 rightHalf) {
  int32 x = index;
  if (index < 0) x = leftHalf != 0 ? -index - 1 : -index;
  if (leftHalf != 0 && rightHalf != 0) {
    const int32 period = 2 * size;
    const int32 r = x % period;
    return r < size ? r : period - r - 1;
  }
  int32 period = 2 * size - 2;
  if (leftHalf != 0 || rightHalf != 0) period += 1;
  if (period <= 0) return 0;
  const int32 r = x % period;
  if (r < size) return r;
  return leftHalf != 0 ? period - r - 1 : period - r;
}

}  // namespace nax::detail

/// Maps `index` into 0..size-1 by symmetric extension of `size` samples. A non-zero
/// `leftHalf` puts the left mirror point half a sample before sample 0 (sample 0 repeats),
/// zero puts it on sample 0; `rightHalf` says the same of the right end.
/// Size 1 with both flags zero has period 0 and is not a valid request.
int32 naxSymExtension(int32 index, int32 size, int32 leftHalf, int32 rightHalf);

/// Number of times a signal of `size` samples can be halved before its low band has fewer
/// than 4 samples: 0 for 0 to 3, 1 for 4 to 7, 2 for 8 to 15, ...
int32 naxCalculateMaximumDepth(int32 size);

/// The smaller of the maximum depths of `cols` and `rows`.
int32 naxCalculateMaximumDepth(int32 cols, int32 rows);

// ---------------------------------------------------------------------------------------
// Implementation

template <typename T>
CNaxWaveletFilter<T>::CNaxWaveletFilter()
    : m_type(static_cast<naxWaveletType>(-1)),
      m_primeSize(0),
      m_dualSize(0),
      m_prime2Size(0),
      m_prime(nullptr),
      m_dual(nullptr),
      m_prime2(nullptr),
      m_lowShift(-1),
      m_highShift(-1) {}

template <typename T>
CNaxWaveletFilter<T>::CNaxWaveletFilter(naxWaveletType type) : CNaxWaveletFilter() {
  Set(type);
}

template <typename T>
CNaxWaveletFilter<T>::CNaxWaveletFilter(const CNaxWaveletFilter<T>& other)
    : m_type(other.m_type),
      m_primeSize(other.m_primeSize),
      m_dualSize(other.m_dualSize),
      m_prime2Size(other.m_prime2Size),
      m_prime(nullptr),
      m_dual(nullptr),
      m_prime2(nullptr),
      m_primeStart(other.m_primeStart),
      m_primeEnd(other.m_primeEnd),
      m_dualStart(other.m_dualStart),
      m_dualEnd(other.m_dualEnd),
      m_lowShift(other.m_lowShift),
      m_highShift(other.m_highShift) {
  // Fresh arrays of the source's sizes; their values are deliberately not the source's.
  m_prime = m_primeSize > 0 ? new T[m_primeSize]() : nullptr;
  m_dual = m_dualSize > 0 ? new T[m_dualSize]() : nullptr;
  m_prime2 = m_prime2Size > 0 ? new T[m_prime2Size]() : nullptr;
}

template <typename T>
CNaxWaveletFilter<T>::~CNaxWaveletFilter() {
  delete[] m_prime;
  delete[] m_dual;
  delete[] m_prime2;
  m_prime = m_dual = m_prime2 = nullptr;
}

template <typename T>
CNaxWaveletFilter<T>& CNaxWaveletFilter<T>::operator=(const CNaxWaveletFilter<T>& other) {
  m_type = other.m_type;
  m_primeSize = other.m_primeSize;
  m_dualSize = other.m_dualSize;
  m_prime2Size = other.m_prime2Size;
  m_prime = other.m_prime;
  m_dual = other.m_dual;
  m_prime2 = other.m_prime2;
  m_primeStart = other.m_primeStart;
  m_primeEnd = other.m_primeEnd;
  m_dualStart = other.m_dualStart;
  m_dualEnd = other.m_dualEnd;
  m_lowShift = other.m_lowShift;
  m_highShift = other.m_highShift;
  for (int k = 0; k < 4; ++k) m_norms[k] = other.m_norms[k];
  return *this;
}

template <typename T>
void CNaxWaveletFilter<T>::Set(naxWaveletType type) {
  m_type = type;
  Set();
}

template <typename T>
void CNaxWaveletFilter<T>::Set() {
  switch (static_cast<int32>(m_type)) {
    case naxWavelet1_1: Set1_1(); break;
    case naxWavelet1_3: Set1_3(); break;
    case naxWavelet1_5: Set1_5(); break;
    case naxWavelet2_4: Set2_4(); break;
    case naxWavelet2_6: Set2_6(); break;
    case naxWavelet3_1: Set3_1(); break;
    case naxWavelet3_3: Set3_3(); break;
    case naxWavelet3_5: Set3_5(); break;
    case naxWavelet4_2: Set4_2(); break;
    case naxWavelet4_4: Set4_4(); break;
    case naxWavelet4_6: Set4_6(); break;
    default: Set2_2(); break;  // 2_2 itself and every unknown type
  }
  m_lowShift = -1;
  m_highShift = -1;
}

template <typename T>
void CNaxWaveletFilter<T>::AllocateMemory() {
  m_prime = new T[m_primeSize > 0 ? m_primeSize : 0];
  m_dual = new T[m_dualSize > 0 ? m_dualSize : 0];
  m_prime2 = m_prime2Size != 0 ? new T[m_prime2Size] : nullptr;
}

template <typename T>
void CNaxWaveletFilter<T>::Fill(int32 primeSize, const double* prime, const double* dual,
                                int32 prime2Size, const double* prime2) {
  m_primeSize = primeSize;
  m_dualSize = 2;
  m_prime2Size = prime2Size;
  AllocateMemory();
  for (int32 k = 0; k < primeSize; ++k) m_prime[k] = static_cast<T>(prime[k]);
  for (int32 k = 0; k < 2; ++k) m_dual[k] = static_cast<T>(dual[k]);
  for (int32 k = 0; k < prime2Size; ++k) m_prime2[k] = static_cast<T>(prime2[k]);
}

template <typename T>
void CNaxWaveletFilter<T>::SetSupports(int32 primeStart, int32 primeEnd, int32 dualStart,
                                       int32 dualEnd) {
  m_primeStart = primeStart;
  m_primeEnd = primeEnd;
  m_dualStart = dualStart;
  m_dualEnd = dualEnd;
}

template <typename T>
void CNaxWaveletFilter<T>::SetNorms(double low0, double high0, double low1, double high1) {
  m_norms[0] = static_cast<T>(low0);
  m_norms[1] = static_cast<T>(high0);
  m_norms[2] = static_cast<T>(low1);
  m_norms[3] = static_cast<T>(high1);
}

namespace nax::detail {

// Norms of the three families: (low 0, high 0, low 1, high 1).
inline constexpr double kWaveletNorms12[4] = {1.4142135623730951, -0.7071067811865476, 1.0, -0.5};
inline constexpr double kWaveletNorms3[4] = {2.121320343559643, -0.47140452079103173, 2.0,
                                             -0.08333333333333333};
// The positive high 0 of this family is part of the filter.
inline constexpr double kWaveletNorms4[4] = {2.8284271247461903, 0.3535533905932738, 2.0, -0.25};

// Dual (predict) arrays shared by a family.
inline constexpr double kDualHaar[2] = {-1.0, 0.0};
inline constexpr double kDualLinear[2] = {-0.5, -0.5};
inline constexpr double kDualQuadratic[2] = {-1.125, -0.375};
inline constexpr double kDualCubic[2] = {-1.0, -1.0};
// First (update) arrays of types 6 to 11.
inline constexpr double kPrimeQuadratic[2] = {-0.3333333333333333, 0.0};
inline constexpr double kPrimeCubic[2] = {-0.25, -0.25};

}  // namespace nax::detail

template <typename T>
void CNaxWaveletFilter<T>::Set1_1() {
  static constexpr double prime[2] = {0.0, 0.5};
  Fill(2, prime, nax::detail::kDualHaar, 0, nullptr);
  SetSupports(0, 1, 0, 1);
  const double* n = nax::detail::kWaveletNorms12;
  SetNorms(n[0], n[1], n[2], n[3]);
}

template <typename T>
void CNaxWaveletFilter<T>::Set1_3() {
  static constexpr double prime[4] = {0.0, 0.0625, 0.5, -0.0625};
  Fill(4, prime, nax::detail::kDualHaar, 0, nullptr);
  SetSupports(0, 1, -2, 3);
  const double* n = nax::detail::kWaveletNorms12;
  SetNorms(n[0], n[1], n[2], n[3]);
}

template <typename T>
void CNaxWaveletFilter<T>::Set1_5() {
  static constexpr double prime[6] = {0.0, -0.01171875, 0.0859375, 0.5, -0.0859375, 0.01171875};
  Fill(6, prime, nax::detail::kDualHaar, 0, nullptr);
  SetSupports(0, 1, -4, 5);
  const double* n = nax::detail::kWaveletNorms12;
  SetNorms(n[0], n[1], n[2], n[3]);
}

template <typename T>
void CNaxWaveletFilter<T>::Set2_2() {
  static constexpr double prime[2] = {0.25, 0.25};
  Fill(2, prime, nax::detail::kDualLinear, 0, nullptr);
  SetSupports(0, 2, -2, 2);
  const double* n = nax::detail::kWaveletNorms12;
  SetNorms(n[0], n[1], n[2], n[3]);
}

template <typename T>
void CNaxWaveletFilter<T>::Set2_4() {
  static constexpr double prime[4] = {-0.046875, 0.296875, 0.296875, -0.046875};
  Fill(4, prime, nax::detail::kDualLinear, 0, nullptr);
  SetSupports(0, 2, -4, 4);
  const double* n = nax::detail::kWaveletNorms12;
  SetNorms(n[0], n[1], n[2], n[3]);
}

template <typename T>
void CNaxWaveletFilter<T>::Set2_6() {
  static constexpr double prime[6] = {0.009765625, -0.076171875, 0.31640625,
                                      0.31640625,  -0.076171875, 0.009765625};
  Fill(6, prime, nax::detail::kDualLinear, 0, nullptr);
  SetSupports(0, 2, -6, 6);
  const double* n = nax::detail::kWaveletNorms12;
  SetNorms(n[0], n[1], n[2], n[3]);
}

template <typename T>
void CNaxWaveletFilter<T>::Set3_1() {
  static constexpr double prime2[2] = {0.0, 0.4444444444444444};
  Fill(2, nax::detail::kPrimeQuadratic, nax::detail::kDualQuadratic, 2, prime2);
  SetSupports(-1, 2, -1, 2);
  const double* n = nax::detail::kWaveletNorms3;
  SetNorms(n[0], n[1], n[2], n[3]);
}

template <typename T>
void CNaxWaveletFilter<T>::Set3_3() {
  // The negative 4/9 belongs to this filter (it is positive in 3_1 and 3_5).
  static constexpr double prime2[4] = {0.0, 0.08333333333333333, -0.4444444444444444,
                                       -0.08333333333333333};
  Fill(2, nax::detail::kPrimeQuadratic, nax::detail::kDualQuadratic, 4, prime2);
  SetSupports(-1, 2, -3, 4);
  const double* n = nax::detail::kWaveletNorms3;
  SetNorms(n[0], n[1], n[2], n[3]);
}

template <typename T>
void CNaxWaveletFilter<T>::Set3_5() {
  static constexpr double prime2[6] = {0.0,
                                       -0.017361111111111112,
                                       0.11805555555555555,
                                       0.4444444444444444,
                                       -0.11805555555555555,
                                       0.017361111111111112};
  Fill(2, nax::detail::kPrimeQuadratic, nax::detail::kDualQuadratic, 6, prime2);
  SetSupports(-1, 2, -5, 6);
  const double* n = nax::detail::kWaveletNorms3;
  SetNorms(n[0], n[1], n[2], n[3]);
}

template <typename T>
void CNaxWaveletFilter<T>::Set4_2() {
  static constexpr double prime2[2] = {0.1875, 0.1875};
  Fill(2, nax::detail::kPrimeCubic, nax::detail::kDualCubic, 2, prime2);
  SetSupports(-1, 3, -3, 3);
  const double* n = nax::detail::kWaveletNorms4;
  SetNorms(n[0], n[1], n[2], n[3]);
}

template <typename T>
void CNaxWaveletFilter<T>::Set4_4() {
  static constexpr double prime2[4] = {-0.0390625, 0.2265625, 0.2265625, -0.0390625};
  Fill(2, nax::detail::kPrimeCubic, nax::detail::kDualCubic, 4, prime2);
  SetSupports(-1, 3, -5, 5);
  const double* n = nax::detail::kWaveletNorms4;
  SetNorms(n[0], n[1], n[2], n[3]);
}

template <typename T>
void CNaxWaveletFilter<T>::Set4_6() {
  static constexpr double prime2[6] = {0.008544921875, -0.064697265625, 0.24365234375,
                                       0.24365234375,  -0.064697265625, 0.008544921875};
  Fill(2, nax::detail::kPrimeCubic, nax::detail::kDualCubic, 6, prime2);
  SetSupports(-1, 3, -7, 7);
  const double* n = nax::detail::kWaveletNorms4;
  SetNorms(n[0], n[1], n[2], n[3]);
}

extern template class CNaxWaveletFilter<float>;
extern template class CNaxWaveletFilter<double>;

#endif  // NAX_WAVELET_FILTER_H
