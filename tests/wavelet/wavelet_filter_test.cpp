// Wavelet filters: the coefficient tables, supports, norms, copy semantics and the index
// routines of the transform.
#include <gtest/gtest.h>

#include <new>
#include <vector>

#include "nax/wavelet_filter.h"

namespace {

struct FilterTable {
  naxWaveletType type;
  std::vector<double> prime, dual, prime2;
  int32 primeStart, primeEnd, dualStart, dualEnd;
  double norms[4];  // low 0, high 0, low 1, high 1
};

const double kR2 = 1.4142135623730951;

std::vector<FilterTable> Tables() {
  const double n12[4] = {kR2, -0.7071067811865476, 1, -0.5};
  const double n3[4] = {2.121320343559643, -0.47140452079103173, 2, -1.0 / 12};
  const double n4[4] = {2.8284271247461903, 0.3535533905932738, 2, -0.25};
  auto make = [](naxWaveletType t, std::vector<double> p, std::vector<double> d,
                 std::vector<double> p2, int32 a, int32 b, int32 c, int32 e, const double* n) {
    return FilterTable{t, p, d, p2, a, b, c, e, {n[0], n[1], n[2], n[3]}};
  };
  const std::vector<double> dh = {-1, 0}, dl = {-0.5, -0.5}, dq = {-1.125, -0.375}, dc = {-1, -1};
  const std::vector<double> pq = {-1.0 / 3, 0}, pc = {-0.25, -0.25};
  return {
      make(naxWavelet1_1, {0, 0.5}, dh, {}, 0, 1, 0, 1, n12),
      make(naxWavelet1_3, {0, 0.0625, 0.5, -0.0625}, dh, {}, 0, 1, -2, 3, n12),
      make(naxWavelet1_5, {0, -0.01171875, 0.0859375, 0.5, -0.0859375, 0.01171875}, dh, {}, 0, 1,
           -4, 5, n12),
      make(naxWavelet2_2, {0.25, 0.25}, dl, {}, 0, 2, -2, 2, n12),
      make(naxWavelet2_4, {-0.046875, 0.296875, 0.296875, -0.046875}, dl, {}, 0, 2, -4, 4, n12),
      make(naxWavelet2_6,
           {0.009765625, -0.076171875, 0.31640625, 0.31640625, -0.076171875, 0.009765625}, dl, {},
           0, 2, -6, 6, n12),
      make(naxWavelet3_1, pq, dq, {0, 4.0 / 9}, -1, 2, -1, 2, n3),
      make(naxWavelet3_3, pq, dq, {0, 1.0 / 12, -4.0 / 9, -1.0 / 12}, -1, 2, -3, 4, n3),
      make(naxWavelet3_5, pq, dq, {0, -5.0 / 288, 17.0 / 144, 4.0 / 9, -17.0 / 144, 5.0 / 288}, -1,
           2, -5, 6, n3),
      make(naxWavelet4_2, pc, dc, {0.1875, 0.1875}, -1, 3, -3, 3, n4),
      make(naxWavelet4_4, pc, dc, {-0.0390625, 0.2265625, 0.2265625, -0.0390625}, -1, 3, -5, 5, n4),
      make(naxWavelet4_6, pc, dc,
           {0.008544921875, -0.064697265625, 0.24365234375, 0.24365234375, -0.064697265625,
            0.008544921875},
           -1, 3, -7, 7, n4),
  };
}

template <typename T>
class WaveletFilterTest : public ::testing::Test {};
using RealTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(WaveletFilterTest, RealTypes);

template <typename T>
void ExpectArray(const T* a, const std::vector<double>& expected) {
  for (size_t k = 0; k < expected.size(); ++k)
    EXPECT_EQ(a[k], static_cast<T>(expected[k])) << "entry " << k;
}

TYPED_TEST(WaveletFilterTest, AllTwelveFiltersMatchTheTables) {
  using T = TypeParam;
  for (const FilterTable& t : Tables()) {
    SCOPED_TRACE(static_cast<int>(t.type));
    CNaxWaveletFilter<T> f(t.type);
    EXPECT_EQ(f.GetWavelet(), t.type);
    ASSERT_EQ(f.GetPrimeSize(), static_cast<int32>(t.prime.size()));
    ASSERT_EQ(f.GetDualSize(), 2);
    ASSERT_EQ(f.GetPrimeSize2(), static_cast<int32>(t.prime2.size()));
    ExpectArray(f.PrimeCoefficients(), t.prime);
    ExpectArray(f.DualCoefficients(), t.dual);
    if (t.prime2.empty()) EXPECT_EQ(f.Prime2Coefficients(), nullptr);
    else ExpectArray(f.Prime2Coefficients(), t.prime2);
    const int32 ends[4] = {f.GetPrimeStartInd(), f.GetPrimeEndInd(), f.GetDualStartInd(), f.GetDualEndInd()};
    const int32 expected[4] = {t.primeStart, t.primeEnd, t.dualStart, t.dualEnd};
    for (int32 k = 0; k < 4; ++k) EXPECT_EQ(ends[k], expected[k]) << "end " << k;
    EXPECT_EQ(f.GetLowShift() + f.GetHighShift(), -2);
    // Index 0 selects the second norms, any other index the first.
    const T norms[4] = {f.GetLowNorm(0), f.GetHighNorm(0), f.GetLowNorm(5), f.GetHighNorm(-3)};
    for (int32 k = 0; k < 4; ++k) EXPECT_EQ(norms[k], static_cast<T>(t.norms[k])) << "norm " << k;
  }
}

// Unknown types take the 2_2 coefficients; Set() does so without a type; SetWavelet stores
// the type only.
TYPED_TEST(WaveletFilterTest, UnknownTypesFallToTwoTwo) {
  using T = TypeParam;
  CNaxWaveletFilter<T> f;
  EXPECT_EQ(static_cast<int32>(f.GetWavelet()), -1);
  EXPECT_EQ(f.PrimeCoefficients(), nullptr);
  f.Set();
  EXPECT_EQ(static_cast<int32>(f.GetWavelet()), -1);
  ASSERT_EQ(f.GetPrimeSize(), 2);
  EXPECT_EQ(f.PrimeCoefficients()[0], T(0.25));
  EXPECT_EQ(f.DualCoefficients()[1], T(-0.5));
  EXPECT_EQ(f.GetDualStartInd(), -2);
  CNaxWaveletFilter<T> g(static_cast<naxWaveletType>(42));
  EXPECT_EQ(static_cast<int32>(g.GetWavelet()), 42);
  EXPECT_EQ(g.PrimeCoefficients()[1], T(0.25));
  CNaxWaveletFilter<T> h(naxWavelet1_1);
  h.SetWavelet(naxWavelet4_6);
  EXPECT_EQ(h.GetWavelet(), naxWavelet4_6);
  EXPECT_EQ(h.PrimeCoefficients()[1], T(0.5));
  EXPECT_EQ(h.Prime2Coefficients(), nullptr);
}

TYPED_TEST(WaveletFilterTest, CopyConstructorCarriesShapeButNotValues) {
  using T = TypeParam;
  CNaxWaveletFilter<T> source(naxWavelet3_5);
  CNaxWaveletFilter<T> copy(source);
  EXPECT_EQ(copy.GetWavelet(), naxWavelet3_5);
  EXPECT_EQ(copy.GetPrimeSize2(), 6);
  EXPECT_EQ(copy.GetDualStartInd(), -5);
  ASSERT_NE(copy.Prime2Coefficients(), nullptr);
  EXPECT_NE(copy.Prime2Coefficients(), source.Prime2Coefficients());
  EXPECT_NE(copy.DualCoefficients()[0], source.DualCoefficients()[0]);
  EXPECT_NE(copy.GetLowNorm(0), source.GetLowNorm(0));
}

TYPED_TEST(WaveletFilterTest, AssignmentSharesTheArrays) {
  using T = TypeParam;
  CNaxWaveletFilter<T> source(naxWavelet4_4);
  // The target is never destroyed: its arrays belong to `source` after the assignment.
  alignas(CNaxWaveletFilter<T>) unsigned char storage[sizeof(CNaxWaveletFilter<T>)];
  auto* target = new (storage) CNaxWaveletFilter<T>();
  *target = source;
  EXPECT_EQ(target->GetWavelet(), naxWavelet4_4);
  EXPECT_EQ(target->PrimeCoefficients(), source.PrimeCoefficients());
  EXPECT_EQ(target->Prime2Coefficients(), source.Prime2Coefficients());
  EXPECT_EQ(target->GetHighNorm(0), source.GetHighNorm(0));
}

TEST(WaveletIndexTest, SymmetricExtensionIsAMirror) {
  // Whole-sample mirror on both ends: ... 2 1 | 0 1 2 3 4 | 3 2 ...
  const int32 n = 5;
  const int32 whole[] = {4, 3, 2, 1, 0, 1, 2, 3, 4, 3, 2, 1, 0, 1};
  for (int32 i = -4; i <= 9; ++i) EXPECT_EQ(naxSymExtension(i, n, 0, 0), whole[i + 4]) << i;
  // Half-sample mirror on both ends: ... 1 0 | 0 1 2 3 4 | 4 3 ...
  const int32 half[] = {3, 2, 1, 0, 0, 1, 2, 3, 4, 4, 3, 2, 1, 0, 0};
  for (int32 i = -4; i <= 10; ++i) EXPECT_EQ(naxSymExtension(i, n, 1, 1), half[i + 4]) << i;
  // Whole on the left, half on the right.
  const int32 mixed[] = {2, 1, 0, 1, 2, 3, 4, 4, 3, 2, 1, 0, 1};
  for (int32 i = -2; i <= 10; ++i) EXPECT_EQ(naxSymExtension(i, n, 0, 1), mixed[i + 2]) << i;
  // Half on the left, whole on the right.
  const int32 flipped[] = {2, 1, 0, 0, 1, 2, 3, 4, 3, 2, 1};
  for (int32 i = -3; i <= 7; ++i) EXPECT_EQ(naxSymExtension(i, n, 1, 0), flipped[i + 3]) << i;
  // A source of one sample with a half-sample end is always sample 0.
  for (int32 i = -3; i <= 3; ++i)
    for (int32 flags = 1; flags < 4; ++flags) EXPECT_EQ(naxSymExtension(i, 1, flags & 1, flags >> 1), 0);
  // Every result lies in range.
  for (int32 size = 2; size < 9; ++size)
    for (int32 flags = 0; flags < 4; ++flags)
      for (int32 i = -3 * size; i < 4 * size; ++i) {
        const int32 r = naxSymExtension(i, size, flags & 1, flags >> 1);
        EXPECT_TRUE(r >= 0 && r < size);
      }
}

TEST(WaveletIndexTest, MaximumDepth) {
  const int32 expected[] = {0, 0, 0, 0, 1, 1, 1, 1, 2, 2, 2, 2, 2, 2, 2, 2, 3};
  for (int32 n = 0; n <= 16; ++n) EXPECT_EQ(naxCalculateMaximumDepth(n), expected[n]) << n;
  EXPECT_EQ(naxCalculateMaximumDepth(4096), 11);
  EXPECT_EQ(naxCalculateMaximumDepth(33, 7), 1);
  EXPECT_EQ(naxCalculateMaximumDepth(8, 1024), 2);
  EXPECT_EQ(naxCalculateMaximumDepth(3, 1024), 0);
}

}  // namespace
