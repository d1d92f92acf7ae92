// Bilinear resampling of a large float array, enlarged (general path) and halved (the
// averaging path), against a plain per-sample bilinear loop with the same sample mapping.
// Reported in nanoseconds per output sample.
#include <cmath>
#include <random>
#include <vector>

#include "bench_common.h"
#include "nax/interpolation.h"

namespace {

std::vector<float> RandomImage(int rows, int columns) {
  std::mt19937 rng(11);
  std::uniform_real_distribution<float> u(0, 255);
  std::vector<float> v(size_t(rows) * columns);
  for (float& x : v) x = u(rng);
  return v;
}

void ReportPerSample(benchmark::State& state, int64_t samples) {
  state.counters["time_per_sample"] =
      benchmark::Counter(double(state.iterations()) * double(samples),
                         benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

// Source size range(0) squared, target size range(1) squared.
void NaxBilinear(benchmark::State& state) {
  const int n = int(state.range(0)), m = int(state.range(1));
  const std::vector<float> src = RandomImage(n, n);
  std::vector<float> dst(size_t(m) * m);
  for (auto _ : state) {
    CNaxInterpolation::InterpolateData2DBilinear(n, n, m, m, src.data(), dst.data());
    benchmark::DoNotOptimize(dst.data());
    benchmark::ClobberMemory();
  }
  ReportPerSample(state, int64_t(m) * m);
}

// Position of target sample i on a source axis, sample centres aligned and clamped.
inline float SourcePosition(int i, int from, int to) {
  float p = (i + 0.5f) * float(from) / float(to) - 0.5f;
  if (p < 0) p = 0;
  if (p > from - 1) p = float(from - 1);
  return p;
}

// The straightforward loop: per target sample, the four neighbours and their weights.
void PlainBilinear(benchmark::State& state) {
  const int n = int(state.range(0)), m = int(state.range(1));
  const std::vector<float> src = RandomImage(n, n);
  std::vector<float> dst(size_t(m) * m);
  for (auto _ : state) {
    for (int r = 0; r < m; ++r) {
      const float py = SourcePosition(r, n, m);
      const int y0 = int(py), y1 = y0 + 1 < n ? y0 + 1 : y0;
      const float fy = py - y0;
      for (int c = 0; c < m; ++c) {
        const float px = SourcePosition(c, n, m);
        const int x0 = int(px), x1 = x0 + 1 < n ? x0 + 1 : x0;
        const float fx = px - x0;
        const float top = src[size_t(y0) * n + x0] * (1 - fx) + src[size_t(y0) * n + x1] * fx;
        const float bottom = src[size_t(y1) * n + x0] * (1 - fx) + src[size_t(y1) * n + x1] * fx;
        dst[size_t(r) * m + c] = top * (1 - fy) + bottom * fy;
      }
    }
    benchmark::DoNotOptimize(dst.data());
    benchmark::ClobberMemory();
  }
  ReportPerSample(state, int64_t(m) * m);
}

BENCHMARK(NaxBilinear)->Args({2048, 3000})->Args({2048, 1024})->Unit(benchmark::kMillisecond);
BENCHMARK(PlainBilinear)->Args({2048, 3000})->Args({2048, 1024})->Unit(benchmark::kMillisecond);

}  // namespace

int main(int argc, char** argv) {
  return nax::bench::RunWithRatios(argc, argv,
                                   {{"NaxBilinear/2048/3000", "PlainBilinear/2048/3000"},
                                    {"NaxBilinear/2048/1024", "PlainBilinear/2048/1024"}});
}
