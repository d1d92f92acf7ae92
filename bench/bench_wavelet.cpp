// Two-dimensional wavelet transform at maximum depth and back (the round trip), against
// GSL's non-standard 2-D transform with the B-spline 202 wavelet where GSL is present.
//
// Counters: ns_px is the round-trip time per pixel; x_memcpy the ratio of the round trip to
// one memcpy of the same buffer; peak_x the largest heap footprint of the round trip
// (the input channel included) over the image size; tree_x the footprint of the finished
// decomposition over the image size.
#include <benchmark/benchmark.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <map>
#include <memory>
#include <new>
#include <random>
#include <vector>

#include "nax/channel.h"

#ifdef NAX_HAVE_GSL
#include <gsl/gsl_wavelet.h>
#include <gsl/gsl_wavelet2d.h>
#endif

#include "heap_counter.h"

namespace {

using Clock = std::chrono::steady_clock;

// Best of several copies of `bytes` between two touched buffers, in seconds.
double MemcpySeconds(std::size_t bytes) {
  static std::map<std::size_t, double> cache;
  auto it = cache.find(bytes);
  if (it != cache.end()) return it->second;
  std::vector<char> a(bytes, 1), b(bytes, 2);
  double best = 1e30;
  for (int k = 0; k < 7; ++k) {
    const auto t0 = Clock::now();
    std::memcpy(b.data(), a.data(), bytes);
    benchmark::DoNotOptimize(b.data());
    best = std::min(best, std::chrono::duration<double>(Clock::now() - t0).count());
  }
  cache[bytes] = best;
  return best;
}

// Enough distinct images that the caches hold none of them between iterations.
int32 OperandCount(std::size_t bytes) {
  return static_cast<int32>(std::clamp<std::size_t>((128u << 20) / bytes, 2, 16));
}

template <typename T>
std::vector<std::vector<T>> MakeImages(int32 n, int32 count) {
  std::mt19937 rng(17);
  std::uniform_real_distribution<double> u(0, 255);
  std::vector<std::vector<T>> images(count, std::vector<T>(static_cast<std::size_t>(n) * n));
  for (auto& image : images)
    for (auto& v : image) v = T(u(rng));
  return images;
}

void Report(benchmark::State& state, double seconds, std::size_t pixels, std::size_t bytes,
            long long peak, long long tree) {
  const double iterations = static_cast<double>(state.iterations());
  state.counters["ns_px"] = seconds / iterations / static_cast<double>(pixels) * 1e9;
  state.counters["x_memcpy"] = seconds / iterations / MemcpySeconds(bytes);
  state.counters["peak_x"] = static_cast<double>(peak) / static_cast<double>(bytes);
  state.counters["tree_x"] = static_cast<double>(tree) / static_cast<double>(bytes);
}

// Args: image side, wavelet type.
template <typename T>
void BM_NaxRoundTrip(benchmark::State& state) {
  const int32 n = static_cast<int32>(state.range(0));
  const auto wavelet = static_cast<naxWaveletType>(state.range(1));
  const std::size_t pixels = static_cast<std::size_t>(n) * n, bytes = pixels * sizeof(T);
  const int32 depth = naxCalculateMaximumDepth(n, n);
  const auto images = MakeImages<T>(n, OperandCount(bytes));
  CNaxWaveletFilter<T> filter(wavelet);
  double seconds = 0;
  long long peak = 0, tree = 0;
  std::size_t next = 0;
  for (auto _ : state) {
    const std::vector<T>& image = images[next++ % images.size()];
    const long long base = g_live.load();
    g_peak.store(base);
    // The input channel is the caller's copy of the image; the transform consumes it.
    auto* raw = new CNaxChannel<T>(n, n, image.data(), 0, 0);
    const auto t0 = Clock::now();
    CNaxChannel<T>* decomposition = raw->FWT(&filter, naxChannel2D, depth);
    const long long held = g_live.load() - base;
    CNaxChannel<T>* back = decomposition->IFWT();
    const double dt = std::chrono::duration<double>(Clock::now() - t0).count();
    state.SetIterationTime(dt);
    seconds += dt;
    peak = std::max(peak, g_peak.load() - base);
    tree = std::max(tree, held);
    benchmark::DoNotOptimize(back->GetData());
    delete back;
    delete decomposition;
    delete raw;
  }
  Report(state, seconds, pixels, bytes, peak, tree);
}

// Args: image side (a power of 2).
#ifdef NAX_HAVE_GSL
void BM_GslRoundTrip(benchmark::State& state) {
  const int32 n = static_cast<int32>(state.range(0));
  const std::size_t pixels = static_cast<std::size_t>(n) * n, bytes = pixels * sizeof(double);
  const auto images = MakeImages<double>(n, OperandCount(bytes));
  gsl_wavelet* w = gsl_wavelet_alloc(gsl_wavelet_bspline, 202);
  gsl_wavelet_workspace* work = gsl_wavelet_workspace_alloc(static_cast<std::size_t>(n));
  std::vector<double> data(pixels);
  double seconds = 0;
  std::size_t next = 0;
  for (auto _ : state) {
    const std::vector<double>& image = images[next++ % images.size()];
    std::memcpy(data.data(), image.data(), bytes);
    const auto t0 = Clock::now();
    gsl_wavelet2d_nstransform_forward(w, data.data(), n, n, n, work);
    gsl_wavelet2d_nstransform_inverse(w, data.data(), n, n, n, work);
    const double dt = std::chrono::duration<double>(Clock::now() - t0).count();
    state.SetIterationTime(dt);
    seconds += dt;
    benchmark::DoNotOptimize(data.data());
  }
  // In place: the image itself and a workspace of one line.
  Report(state, seconds, pixels, bytes, static_cast<long long>(bytes + n * sizeof(double)),
         static_cast<long long>(bytes));
  gsl_wavelet_workspace_free(work);
  gsl_wavelet_free(w);
}
#endif

// The floor: one memcpy of the image, in the same units.
template <typename T>
void BM_Memcpy(benchmark::State& state) {
  const int32 n = static_cast<int32>(state.range(0));
  const std::size_t pixels = static_cast<std::size_t>(n) * n, bytes = pixels * sizeof(T);
  std::vector<T> a(pixels, T(1)), b(pixels, T(2));
  double seconds = 0;
  for (auto _ : state) {
    const auto t0 = Clock::now();
    std::memcpy(b.data(), a.data(), bytes);
    benchmark::DoNotOptimize(b.data());
    seconds += std::chrono::duration<double>(Clock::now() - t0).count();
  }
  state.counters["ns_px"] = seconds / static_cast<double>(state.iterations()) /
                            static_cast<double>(pixels) * 1e9;
}

void NaxArgs(benchmark::internal::Benchmark* b) {
  for (int64_t side : {1024, 4096})
    for (int64_t wavelet : {naxWavelet2_2, naxWavelet4_4}) b->Args({side, wavelet});
  b->ArgNames({"side", "wavelet"})->Unit(benchmark::kMillisecond)->UseManualTime();
}

}  // namespace

BENCHMARK(BM_NaxRoundTrip<float>)->Apply(NaxArgs);
BENCHMARK(BM_NaxRoundTrip<double>)->Apply(NaxArgs);
#ifdef NAX_HAVE_GSL
BENCHMARK(BM_GslRoundTrip)->Arg(1024)->Arg(4096)->ArgName("side")->Unit(benchmark::kMillisecond)
    ->UseManualTime();
#endif
BENCHMARK(BM_Memcpy<float>)->Arg(1024)->Arg(4096)->ArgName("side")->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Memcpy<double>)->Arg(1024)->Arg(4096)->ArgName("side")->Unit(benchmark::kMillisecond);

BENCHMARK_MAIN();
