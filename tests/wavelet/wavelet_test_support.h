// Fixtures shared by the wavelet tests: sample makers, tree builders and comparisons.
#ifndef NAX_TESTS_WAVELET_TEST_SUPPORT_H
#define NAX_TESTS_WAVELET_TEST_SUPPORT_H

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <memory>
#include <random>
#include <vector>

#include "nax/channel.h"
#include "nax/random.h"

namespace nax_test {

using RealTypes = ::testing::Types<float, double>;

template <typename T>
using Owned = std::unique_ptr<CNaxChannel<T>>;

template <typename T>
std::vector<T> RandomSamples(int32 n, std::mt19937& rng, double range = 1) {
  std::uniform_real_distribution<double> u(-range, range);
  std::vector<T> v(n);
  for (auto& x : v) x = T(u(rng));
  return v;
}

// Gaussian noise of deviation `sigma` from the library's own generator, fixed seed.
template <typename T>
std::vector<T> Noise(int32 n, T sigma, uint32 seed) {
  CNaxRandom<T> random;
  random.SetAlgorithm(naxRandomAlgorithmXorshift32);
  random.SetXorshift32Seed(seed);
  random.SetNormal(T(0), sigma);
  random.Initialize();
  std::vector<T> v(n);
  random.GetArrayNumbers(n, v.data());
  return v;
}

// A smooth image with values in about 40..220, `planes` samples per pixel.
template <typename T>
std::vector<T> Smooth(int32 cols, int32 rows, int32 planes = 1) {
  std::vector<T> v(static_cast<size_t>(cols) * rows * planes);
  for (int32 y = 0; y < rows; ++y)
    for (int32 x = 0; x < cols; ++x)
      for (int32 c = 0; c < planes; ++c)
        v[(static_cast<size_t>(y) * cols + x) * planes + c] =
            T(128 + 60 * std::sin(x / (9.0 + c)) * std::cos(y / 7.0) + 0.3 * (x - y));
  return v;
}

template <typename T>
double Psnr(const T* a, const std::vector<T>& b) {
  double se = 0;
  for (size_t i = 0; i < b.size(); ++i) se += (double(a[i]) - b[i]) * (double(a[i]) - b[i]);
  return 10 * std::log10(255.0 * 255.0 / (se / b.size()));
}

// Reconstruction tolerance for samples of magnitude about 1.
template <typename T>
T Tolerance() {
  return sizeof(T) == 4 ? T(5e-4) : T(1e-10);
}

template <typename T>
int32 Count(const CNaxChannel<T>* c) {
  return c->GetColsNb() * c->GetRowsNb();
}

// The transform of `samples` (cols x rows from (ox, oy)) with the given settings.
template <typename T>
Owned<T> MakeTree(const std::vector<T>& samples, int32 cols, int32 rows,
                  CNaxWaveletFilter<T>* filter, int32 depth,
                  naxWaveletNormalization norm = naxNormalizationBySecondNorms,
                  naxChannelType type = naxChannel2D, int32 ox = 0, int32 oy = 0) {
  CNaxChannel<T> raw(cols, rows, samples.data(), ox, oy);
  raw.SetTypeOfNormalization(norm);
  return Owned<T>(raw.FWT(filter, type, depth));
}

// Largest magnitude in a tree.
template <typename T>
double MaxAbs(const CNaxChannel<T>* c) {
  double m = 0;
  if (c == nullptr) return m;
  if (c->GetData() != nullptr)
    for (int32 i = 0; i < Count(c); ++i)
      m = std::max(m, static_cast<double>(std::fabs(c->GetData()[i])));
  for (int32 k = 0; k < c->GetSubChannelsNb(); ++k) m = std::max(m, MaxAbs(c->SubChannel(k)));
  return m;
}

// Calls `check(band of a, band of b, level)` for every high band of two trees of one shape.
template <typename T, typename Check>
void ForHighBands(const CNaxChannel<T>* a, const CNaxChannel<T>* b, Check check) {
  for (int32 level = 0; a != nullptr && a->IsDecomposed() != 0; ++level) {
    for (int32 k = 1; k < a->GetSubChannelsNb(); ++k)
      check(a->SubChannel(k), b->SubChannel(k), level);
    a = a->SubChannel(0);
    b = b->SubChannel(0);
  }
}

}  // namespace nax_test

#endif  // NAX_TESTS_WAVELET_TEST_SUPPORT_H
