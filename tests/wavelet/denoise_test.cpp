// Noise reduction and enhancement: the noise estimate on Gaussian noise, the thresholds of
// each method, hard and soft shrinkage, the neighbour mask, circular shifts, enhancement
// and editing by levels, mixing and combining, and denoising that raises the PSNR.
#include "nax/statistics.h"
#include "wavelet_test_support.h"

namespace {

using namespace nax_test;

template <typename T>
class DenoiseTest : public ::testing::Test {};
TYPED_TEST_SUITE(DenoiseTest, RealTypes);

// A smooth image plus Gaussian noise of deviation `sigma`.
template <typename T>
std::vector<T> Noisy(int32 cols, int32 rows, T sigma, uint32 seed) {
  std::vector<T> v = Smooth<T>(cols, rows);
  const std::vector<T> noise = Noise<T>(cols * rows, sigma, seed);
  for (size_t i = 0; i < v.size(); ++i) v[i] += noise[i];
  return v;
}

// Hard rule at threshold t: |c| <= t vanishes, the rest stays.
template <typename T>
void ExpectHard(const CNaxChannel<T>* before, const CNaxChannel<T>* after, T t) {
  for (int32 i = 0; i < Count(before); ++i) {
    const T c = before->GetData()[i];
    ASSERT_EQ(after->GetData()[i], std::fabs(c) <= t ? T(0) : c) << "threshold " << t;
  }
}

TYPED_TEST(DenoiseTest, NoiseEstimateIsNearSigma) {
  using T = TypeParam;
  CNaxWaveletFilter<T> haar(naxWavelet1_1);  // orthonormal with the second norms
  for (const T sigma : {T(0.5), T(3), T(20)}) {
    Owned<T> tree = MakeTree(Noise<T>(128 * 128, sigma, 11), 128, 128, &haar, 3);
    EXPECT_NEAR(tree->EstimateNoise(), sigma, T(0.06) * sigma);
  }
  CNaxChannel<T> raw(4, 4, 0, 0);
  EXPECT_EQ(raw.EstimateNoise(), T(0));
  // The median is exactly that of the statistics class, for odd and even band sizes.
  for (const int32 side : {7, 13}) {
    Owned<T> small = MakeTree(Noise<T>(side * side, T(1), 2), side, side, &haar, 1);
    const CNaxChannel<T>* hh = small->SubChannel(1);
    std::vector<T> magnitudes(Count(hh));
    for (size_t i = 0; i < magnitudes.size(); ++i) magnitudes[i] = std::fabs(hh->GetData()[i]);
    const T median = CNaxStatistics<T>(int32(magnitudes.size()), magnitudes.data()).Median();
    EXPECT_EQ(small->EstimateNoise(), median / T(0.6745)) << side;
  }
}

TYPED_TEST(DenoiseTest, UniversalThresholdsByMethod) {
  using T = TypeParam;
  CNaxWaveletFilter<T> filter(naxWavelet2_2);
  const int32 cols = 48, rows = 40, depth = 3;
  Owned<T> tree = MakeTree(Noisy<T>(cols, rows, T(8), 3), cols, rows, &filter, depth);
  const T sigma = tree->EstimateNoise();
  const T universal = sigma * std::sqrt(T(2) * std::log(T(cols * rows)));
  const T tol = universal * T(1e-5);

  T first = T(0), ratio = T(0);
  Owned<T> cleaned(tree->CleanBelowThreshold(first, ratio, 0, naxDenoisingUniversal));
  EXPECT_EQ(ratio, T(1));
  EXPECT_EQ(first, T(0));  // not reported by the universal methods
  ForHighBands<T>(tree.get(), cleaned.get(), [&](auto* b, auto* a, int32) {
    for (int32 i = 0; i < Count(b); ++i) {
      const T c = b->GetData()[i];
      if (std::fabs(std::fabs(c) - universal) > tol) {
        ASSERT_EQ(a->GetData()[i], std::fabs(c) <= universal ? T(0) : c);
      }
    }
  });

  first = ratio = T(0);
  cleaned.reset(tree->CleanBelowThreshold(first, ratio, 1, naxDenoisingUniversalByLevels));
  EXPECT_NEAR(ratio, std::sqrt(T(2)), T(1e-6));
  ForHighBands<T>(tree.get(), cleaned.get(), [&](auto* b, auto* a, int32 level) {
    const T t = universal / T(2) * std::pow(std::sqrt(T(2)), T(level));  // / sqrt(2^(d-1))
    for (int32 i = 0; i < Count(b); ++i) {
      const T c = b->GetData()[i];
      const T expected = std::fabs(c) <= t ? T(0) : (c >= 0 ? c - t : c + t);
      ASSERT_NEAR(a->GetData()[i], expected, T(2e-4) * t);
    }
  });
}

TYPED_TEST(DenoiseTest, GivenThresholdsAreGeometricButDirectOnesAreNot) {
  using T = TypeParam;
  CNaxWaveletFilter<T> filter(naxWavelet2_4);
  std::mt19937 rng(5);
  const std::vector<T> samples = RandomSamples<T>(32 * 32, rng, 10);
  Owned<T> tree = MakeTree(samples, 32, 32, &filter, 3);
  T first = T(4), ratio = T(0.5);
  Owned<T> geometric(tree->CleanBelowThreshold(first, ratio, 0, naxDenoisingByGivenThresholds));
  EXPECT_NEAR(ratio, T(0.5), T(1e-6));
  ForHighBands<T>(tree.get(), geometric.get(), [&](auto* b, auto* a, int32 level) {
    ExpectHard(b, a, T(4) * std::pow(T(0.5), T(level)));
  });
  Owned<T> direct(tree->CleanDirectly(T(4), T(0.5), 0));
  ForHighBands<T>(tree.get(), direct.get(), [&](auto* b, auto* a, int32 level) {
    ExpectHard(b, a, level == 0 ? T(4) : T(2));
  });
  // The soft rule shrinks what it keeps toward zero by the threshold.
  Owned<T> soft(tree->CleanDirectly(T(1.5), T(1), 1));
  ForHighBands<T>(tree.get(), soft.get(), [&](auto* b, auto* a, int32) {
    for (int32 i = 0; i < Count(b); ++i) {
      const T c = b->GetData()[i];
      ASSERT_EQ(a->GetData()[i], std::fabs(c) <= T(1.5) ? T(0) : c - std::copysign(T(1.5), c));
    }
  });
  // The low band is never touched, nor is anything at a threshold of 1e-6 or less.
  EXPECT_EQ(naxAreChannelsAlmostEqual(tree->SubChannel(2, 0), direct->SubChannel(2, 0), T(0)), 1);
  Owned<T> untouched(tree->CleanDirectly(T(1e-6), T(1), 1));
  EXPECT_EQ(naxAreChannelsAlmostEqual(tree.get(), untouched.get(), T(0)), 1);
  CNaxChannel<T> raw(4, 4, samples.data(), 0, 0);
  EXPECT_EQ(raw.CleanDirectly(T(1), T(1), 0), nullptr);
  EXPECT_EQ(raw.CleanBelowThreshold(first, ratio, 0, naxDenoisingUniversal), nullptr);
}

TYPED_TEST(DenoiseTest, BandMethodsReportAndFlatBandsVanish) {
  using T = TypeParam;
  CNaxWaveletFilter<T> filter(naxWavelet2_2);
  const int32 n = 32;
  const std::vector<T> samples = Noisy<T>(n, n, T(6), 9);
  Owned<T> tree = MakeTree(samples, n, n, &filter, 2);
  for (const auto method : {naxDenoisingByBandDeviation, naxDenoisingByBandSignal}) {
    T first = T(0), ratio = T(0);
    Owned<T> cleaned(tree->CleanBelowThreshold(first, ratio, 0, method));
    EXPECT_GT(first, T(0)) << method;
    EXPECT_GT(ratio, T(0)) << method;
  }
  // A flat band: variance 0, so its threshold is its largest coefficient and it vanishes.
  tree->SubChannel(2)->Clean();
  tree->SubChannel(3)->Initialize();
  tree->SubChannel(3)->GetData()[5] = T(0.25);
  T first = T(0), ratio = T(0);
  Owned<T> cleaned(tree->CleanBelowThreshold(first, ratio, 0, naxDenoisingByBandDeviation));
  for (int32 i = 0; i < Count(cleaned->SubChannel(3)); ++i) EXPECT_EQ(cleaned->SubChannel(3)->GetData()[i], T(0));
  tree->EstimateThreshold(first, ratio);
  EXPECT_GT(first, T(1e6) / T(3));  // two of three bands at 1e6
  EXPECT_GT(ratio, T(0));
  Owned<T> shallow = MakeTree(samples, n, n, &filter, 1);
  shallow->EstimateThreshold(first, ratio);
  EXPECT_EQ(ratio, T(0));
  first = T(1);
  ratio = T(7);
  cleaned.reset(shallow->CleanBelowThreshold(first, ratio, 0, naxDenoisingUniversal));
  EXPECT_EQ(ratio, T(7));  // depth 1: the ratio is the caller's
}

TYPED_TEST(DenoiseTest, NeighbourMaskIsLopsided) {
  using T = TypeParam;
  CNaxChannel<T> dummy;
  const T data[12] = {1, -2, 3, -4, 5, -6, 7, -8, 9, -10, 11, -12};  // 3 columns, 4 rows
  // Centre (1, 1) = 5: neighbours -2 (above), -4 (left), -6 (right), 9 (below right).
  EXPECT_EQ(dummy.GetAbsMaxInMask(data, 4, 3, 4), T(9));
  // The centre enters with its sign: (1, 0) = -2 sees 1, 3 and -6 at (2, 1).
  EXPECT_EQ(dummy.GetAbsMaxInMask(data, 1, 3, 4), T(6));
  // Last column: the below-right neighbour is the first sample two rows down.
  EXPECT_EQ(dummy.GetAbsMaxInMask(data, 2, 3, 4), T(7));
  // Last row: no below-right neighbour; a lone negative centre stays negative.
  const T lone[1] = {-3};
  EXPECT_EQ(dummy.GetAbsMaxInMask(lone, 0, 1, 1), T(-3));
}

TYPED_TEST(DenoiseTest, NeighbourMethodKeepsSmallCoefficientsBesideLargeOnes) {
  using T = TypeParam;
  CNaxWaveletFilter<T> filter(naxWavelet2_2);
  std::vector<T> samples = Noisy<T>(32, 32, T(5), 4);
  samples[16 * 32 + 16] += T(400);  // a spike gives large coefficients
  Owned<T> tree = MakeTree(samples, 32, 32, &filter, 2);
  T first = T(0), ratio = T(0);
  Owned<T> plain(tree->CleanBelowThreshold(first, ratio, 1, naxDenoisingByBandSignal));
  first = ratio = T(0);
  Owned<T> masked(tree->CleanBelowThreshold(first, ratio, 1, naxDenoisingByBandSignalAndNeighbours));
  int32 kept = 0;
  ForHighBands<T>(plain.get(), masked.get(), [&](auto* p, auto* m, int32) {
    for (int32 i = 0; i < Count(p); ++i) {
      if (p->GetData()[i] != T(0)) {
        ASSERT_NE(m->GetData()[i], T(0));  // a superset is kept
      }
      if (p->GetData()[i] == T(0) && m->GetData()[i] != T(0)) ++kept;
    }
  });
  EXPECT_GT(kept, 0);
}

TYPED_TEST(DenoiseTest, CircularShiftsRoundTrip) {
  using T = TypeParam;
  std::vector<T> samples(7 * 5);
  for (size_t i = 0; i < samples.size(); ++i) samples[i] = T(i);
  CNaxChannel<T> source(7, 5, samples.data(), 2, 3);
  source.SetTypeOfNormalization(naxNormalizationByFirstNorms);
  for (const int32 sy : {0, 2, -1, 11})
    for (const int32 sx : {0, 3, -4, 15}) {
      CNaxChannel<T> shifted, back;
      shifted.CopyDataWithShifts(&source, sy, sx);
      EXPECT_EQ(shifted.GetTypeOfNormalization(), naxNormalizationByFirstNorms);
      for (int32 y = 0; y < 5; ++y)
        for (int32 x = 0; x < 7; ++x)
          ASSERT_EQ(shifted(x, y), source(((x + sx) % 7 + 7) % 7, ((y + sy) % 5 + 5) % 5));
      back.CopyDataWithShifts(&shifted, -sy, -sx);
      EXPECT_EQ(back.RawChannelIsAlmostEqual(&source, T(0)), 1);
    }
}

TYPED_TEST(DenoiseTest, EnhanceDecaysTowardCoarseLevels) {
  using T = TypeParam;
  CNaxWaveletFilter<T> filter(naxWavelet2_2);
  const std::vector<T> samples = Smooth<T>(64, 64);
  Owned<T> tree = MakeTree(samples, 64, 64, &filter, 4);
  const auto highAt = [](const CNaxChannel<T>* c, int32 level) { return c->SubChannel(level, 2)->GetData()[1]; };
  // 0.5: level 0 by 0.5, then g = 1 and the loop stops; 4: levels by 4, 2, then 1 stops.
  for (const T gain : {T(0.5), T(4)}) {
    Owned<T> enhanced(tree->CloneDecomposedChannel());
    enhanced->Enhance(gain);
    const T factors[3] = {gain, gain > 1 ? gain / 2 : T(1), T(1)};
    for (int32 level = 0; level < 3; ++level)
      EXPECT_EQ(highAt(enhanced.get(), level), highAt(tree.get(), level) * factors[level]) << gain;
  }
  Owned<T> one(tree->CloneDecomposedChannel());
  one->EnhanceHRLevel(T(3), 2);
  one->EnhanceSubLevel(T(5), 1, naxSubChannelHH);
  one->EnhanceHRLevel(T(9), 5);  // beyond the depth: nothing
  EXPECT_EQ(highAt(one.get(), 1), highAt(tree.get(), 1) * T(3));
  EXPECT_EQ(one->SubChannel(1)->GetData()[2], tree->SubChannel(1)->GetData()[2] * T(5));
  EXPECT_EQ(highAt(one.get(), 0), highAt(tree.get(), 0));
  // Editing by levels with factors 1 ... 1, 0 removes only the lowest low band.
  const T factors[5] = {1, 1, 1, 1, 0};
  one->EditByLevels(factors);
  const CNaxChannel<T>* low = one->SubChannel(3, 0);
  for (int32 i = 0; i < Count(low); ++i) EXPECT_EQ(low->GetData()[i], T(0));
}

TYPED_TEST(DenoiseTest, MixAndCombineAreLinear) {
  using T = TypeParam;
  CNaxWaveletFilter<T> filter(naxWavelet4_4);
  std::mt19937 rng(8);
  const std::vector<T> x = RandomSamples<T>(40 * 24, rng), y = RandomSamples<T>(40 * 24, rng);
  std::vector<T> z(40 * 24);
  const T a = T(0.75), b = T(-2);
  for (size_t i = 0; i < z.size(); ++i) z[i] = a * x[i] + b * y[i];
  const T tol = Tolerance<T>();
  for (const auto norm : {naxNoNormalization, naxNormalizationBySecondNorms}) {
    Owned<T> deep = MakeTree(x, 40, 24, &filter, 3, norm);
    Owned<T> shallow = MakeTree(y, 40, 24, &filter, 2, norm);
    Owned<T> expected = MakeTree(z, 40, 24, &filter, 2, norm);
    Owned<T> combined(deep->Combine(shallow.get(), a, b, nullptr));
    EXPECT_EQ(combined->GetDepth(), 2);
    EXPECT_EQ(naxAreChannelsAlmostEqual(combined.get(), expected.get(), tol), 1);
    // Against a raw channel: the reconstruction.
    CNaxChannel<T> rawY(40, 24, y.data(), 0, 0);
    CNaxChannel<T> rawZ(40, 24, z.data(), 0, 0);
    CNaxChannel<T> result;
    EXPECT_EQ(deep->Combine(&rawY, a, b, &result), &result);
    EXPECT_EQ(result.RawChannelIsAlmostEqual(&rawZ, tol), 1);

    Owned<T> other = MakeTree(y, 40, 24, &filter, 3, norm);
    const T ones[4] = {1, 1, 1, 1}, zeros[4] = {0, 0, 0, 0};
    Owned<T> mine(deep->MixByLevels(other.get(), ones, nullptr));
    EXPECT_EQ(naxAreChannelsAlmostEqual(mine.get(), deep.get(), T(0)), 1);
    Owned<T> theirs(deep->MixByLevels(other.get(), zeros, nullptr));
    EXPECT_EQ(naxAreChannelsAlmostEqual(theirs.get(), other.get(), T(0)), 1);
  }
}

TYPED_TEST(DenoiseTest, DenoisingRaisesPsnr) {
  using T = TypeParam;
  const int32 cols = 64, rows = 64;
  const std::vector<T> clean = Smooth<T>(cols, rows), noisy = Noisy<T>(cols, rows, T(15), 21);
  const double before = Psnr(noisy.data(), clean);
  for (const auto wavelet : {naxWavelet1_1, naxWavelet2_2, naxWavelet4_4}) {
    CNaxWaveletFilter<T> filter(wavelet);
    for (const auto method : {naxDenoisingUniversal, naxDenoisingUniversalByLevels, naxDenoisingByBandSignal}) {
      Owned<T> tree = MakeTree(noisy, cols, rows, &filter, 3);
      T first = T(0), ratio = T(0);
      Owned<T> cleaned(tree->CleanBelowThreshold(first, ratio, 1, method));
      Owned<T> back(cleaned->IFWT());
      const double gain = method == naxDenoisingByBandSignal ? 2 : 3;  // per band: milder
      EXPECT_GT(Psnr(back->GetData(), clean), before + gain) << "wavelet " << wavelet << " method " << method;
    }
    CNaxChannel<T> raw(cols, rows, noisy.data(), 0, 0);
    raw.SetTypeOfNormalization(naxNormalizationBySecondNorms);
    T first = T(0), ratio = T(0);
    Owned<T> spun(raw.CleanWithCircularShifts(first, ratio, 4, &filter, 3, 1, naxDenoisingUniversal));
    ASSERT_NE(spun, nullptr);
    EXPECT_EQ(spun->GetColsNb(), cols);
    EXPECT_NE(raw.GetData(), nullptr);  // this channel stays
    EXPECT_NEAR(ratio, T(1), T(1e-6));
    EXPECT_GT(Psnr(spun->GetData(), clean), before + 4) << "wavelet " << wavelet;
  }
}

}  // namespace
