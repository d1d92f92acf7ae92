// Denoising of a three-plane float image: the two-dimensional transform at maximum depth,
// ReduceNoise with the universal threshold, the inverse; and cycle spinning over random
// circular shifts.
//
// Counters: fwt_ms (loading and transform), noise_ms (noise estimates), threshold_ms
// (ReduceNoise at the universal thresholds) and ifwt_ms (inverse and output) split one
// denoising; peak_x is the largest heap footprint of the library during the run over the
// image size (3 * side^2 samples), the caller's input and output arrays not counted;
// total_x counts them too.
#include <benchmark/benchmark.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cmath>
#include <cstdlib>
#include <new>
#include <random>
#include <vector>

#include "nax/wavelet_decomposition.h"

#include "heap_counter.h"

namespace {

using Clock = std::chrono::steady_clock;
constexpr int32 kPlanes = 3;

double Since(Clock::time_point t0) {
  return std::chrono::duration<double>(Clock::now() - t0).count();
}

// A smooth colour image with Gaussian noise of deviation 12, pixel-interleaved.
std::vector<float> NoisyImage(int32 side) {
  std::mt19937 rng(5);
  std::normal_distribution<float> noise(0.0f, 12.0f);
  std::vector<float> image(static_cast<std::size_t>(side) * side * kPlanes);
  for (int32 y = 0; y < side; ++y)
    for (int32 x = 0; x < side; ++x)
      for (int32 c = 0; c < kPlanes; ++c)
        image[(static_cast<std::size_t>(y) * side + x) * kPlanes + c] =
            128.0f + 60.0f * std::sin(x / (40.0f + 9 * c)) * std::cos(y / 55.0f) + noise(rng);
  return image;
}

// Args: image side, wavelet type.
void BM_Denoise(benchmark::State& state) {
  const int32 side = static_cast<int32>(state.range(0));
  const auto wavelet = static_cast<naxWaveletType>(state.range(1));
  const std::vector<float> image = NoisyImage(side);
  std::vector<float> out(image.size());
  const double bytes = static_cast<double>(image.size() * sizeof(float));
  double fwt = 0, noise = 0, threshold = 0, ifwt = 0;
  long long peak = 0;
  for (auto _ : state) {
    const long long base = g_live.load();
    g_peak.store(base);
    const auto t0 = Clock::now();
    CNaxWaveletDecomposition<float> decomposition(wavelet);
    decomposition.SetTypeOfNormalization(naxNormalizationBySecondNorms);
    decomposition.SetImage(side, side, kPlanes, image.data());
    decomposition.FWTMaxDepthInPlace(naxChannel2D);
    const auto t1 = Clock::now();
    // The universal threshold of each plane from its noise estimate, then the cleaning
    // with it as a given threshold: the result of naxDenoisingUniversal without its
    // second estimate, so the two parts are timed apart.
    float first[kPlanes], ratios[kPlanes];
    const float root = std::sqrt(2.0f * std::log(float(side) * float(side)));
    for (int32 c = 0; c < kPlanes; ++c) {
      first[c] = decomposition[c]->EstimateNoise() * root;
      ratios[c] = 1.0f;
    }
    const auto t2 = Clock::now();
    decomposition.ReduceNoise(first, ratios, 1, naxDenoisingByGivenThresholds);
    const auto t3 = Clock::now();
    decomposition.GetImageInPixelForm(out.data());
    const auto t4 = Clock::now();
    fwt += std::chrono::duration<double>(t1 - t0).count();
    noise += std::chrono::duration<double>(t2 - t1).count();
    threshold += std::chrono::duration<double>(t3 - t2).count();
    ifwt += std::chrono::duration<double>(t4 - t3).count();
    state.SetIterationTime(std::chrono::duration<double>(t4 - t0).count());
    benchmark::DoNotOptimize(out.data());
    peak = std::max(peak, g_peak.load() - base);
  }
  const double n = static_cast<double>(state.iterations());
  state.counters["fwt_ms"] = fwt / n * 1e3;
  state.counters["noise_ms"] = noise / n * 1e3;
  state.counters["threshold_ms"] = threshold / n * 1e3;
  state.counters["ifwt_ms"] = ifwt / n * 1e3;
  state.counters["peak_x"] = static_cast<double>(peak) / bytes;
  state.counters["total_x"] = static_cast<double>(peak) / bytes + 2;
}

// Args: image side, number of shifts.
void BM_CycleSpinning(benchmark::State& state) {
  const int32 side = static_cast<int32>(state.range(0));
  const int32 shifts = static_cast<int32>(state.range(1));
  const std::vector<float> image = NoisyImage(side);
  std::vector<float> out(image.size());
  const double bytes = static_cast<double>(image.size() * sizeof(float));
  long long peak = 0;
  for (auto _ : state) {
    const long long base = g_live.load();
    g_peak.store(base);
    const auto t0 = Clock::now();
    CNaxWaveletDecomposition<float> decomposition(naxWavelet2_2);
    decomposition.SetTypeOfNormalization(naxNormalizationBySecondNorms);
    decomposition.SetImage(side, side, kPlanes, image.data());
    float first[kPlanes] = {}, ratios[kPlanes] = {};
    decomposition.ReduceNoiseByCircularShifts(first, ratios, shifts,
                                              naxCalculateMaximumDepth(side, side), 1,
                                              naxDenoisingUniversal);
    decomposition.GetImageInPixelForm(out.data());
    state.SetIterationTime(Since(t0));
    benchmark::DoNotOptimize(out.data());
    peak = std::max(peak, g_peak.load() - base);
  }
  state.counters["peak_x"] = static_cast<double>(peak) / bytes;
  state.counters["total_x"] = static_cast<double>(peak) / bytes + 2;
}

}  // namespace

BENCHMARK(BM_Denoise)
    ->Args({512, naxWavelet2_2})
    ->Args({2048, naxWavelet2_2})
    ->Args({2048, naxWavelet4_4})
    ->ArgNames({"side", "wavelet"})
    ->Unit(benchmark::kMillisecond)
    ->UseManualTime()
    ->Iterations(3);
BENCHMARK(BM_CycleSpinning)
    ->Args({512, 8})
    ->Args({2048, 8})
    ->ArgNames({"side", "shifts"})
    ->Unit(benchmark::kMillisecond)
    ->UseManualTime()
    ->Iterations(1);

BENCHMARK_MAIN();
