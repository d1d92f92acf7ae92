// GetArrayNumbers of uniform (10^8) and normal (10^7) doubles for each generator, beside
// std::mt19937_64 with the standard distributions and a raw xorshift128 loop. The numbers
// are drawn in chunks into one cache-resident buffer. Counter ns_per_number.
#include <benchmark/benchmark.h>

#include <random>
#include <vector>

#include "nax/random.h"

namespace {

constexpr int kChunk = 1 << 16;

void PerNumber(benchmark::State& state, double count) {
  state.counters["ns_per_number"] = benchmark::Counter(
      count * state.iterations(), benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

// Arguments: total count, algorithm, distribution.
void BM_NaxGetArrayNumbers(benchmark::State& state) {
  const int64 total = state.range(0);
  CNaxRandom<double> random;
  random.SetAlgorithm(int32(state.range(1)));
  if (state.range(2) == naxRandomDistributionNormal) random.SetNormal(0, 1);
  random.SetXorshift32Seed(1);
  random.SetXorshift64Seed(1);
  random.Initialize();
  std::vector<double> buffer(kChunk);
  for (auto _ : state) {
    for (int64 done = 0; done < total; done += kChunk) {
      random.GetArrayNumbers(kChunk, buffer.data());
      benchmark::DoNotOptimize(buffer.data());
    }
  }
  PerNumber(state, double(total));
}

void NaxArgs(benchmark::internal::Benchmark* b) {
  for (int algorithm = 0; algorithm < 3; ++algorithm) b->Args({100000000, algorithm, 0});
  for (int algorithm = 0; algorithm < 3; ++algorithm) b->Args({10000000, algorithm, 1});
  b->ArgNames({"count", "algorithm", "distribution"})->Unit(benchmark::kMillisecond)->Iterations(2);
}
BENCHMARK(BM_NaxGetArrayNumbers)->Apply(NaxArgs);

void BM_NaxGetNumberLoop(benchmark::State& state) {  // one indirect call per number
  const int64 total = state.range(0);
  CNaxRandom<double> random;
  random.Initialize();
  std::vector<double> buffer(kChunk);
  for (auto _ : state) {
    for (int64 done = 0; done < total; done += kChunk) {
      for (int k = 0; k < kChunk; ++k) buffer[k] = random.GetNumber();
      benchmark::DoNotOptimize(buffer.data());
    }
  }
  PerNumber(state, double(total));
}
BENCHMARK(BM_NaxGetNumberLoop)->Arg(100000000)->Unit(benchmark::kMillisecond)->Iterations(2);

void BM_RawXorshift128(benchmark::State& state) {
  const int64 total = state.range(0);
  uint32 x = 123456789u, y = 362436069u, z = 521288629u, w = 88675123u;
  std::vector<double> buffer(kChunk);
  for (auto _ : state) {
    for (int64 done = 0; done < total; done += kChunk) {
      for (int k = 0; k < kChunk; ++k) {
        const uint32 t = x ^ (x << 11);
        x = y;
        y = z;
        z = w;
        w = w ^ (w >> 19) ^ t ^ (t >> 8);
        buffer[k] = double(w) / 4294967295.0;
      }
      benchmark::DoNotOptimize(buffer.data());
    }
  }
  PerNumber(state, double(total));
}
BENCHMARK(BM_RawXorshift128)->Arg(100000000)->Unit(benchmark::kMillisecond)->Iterations(2);

template <typename Distribution>
void BM_StdMt19937_64(benchmark::State& state) {
  const int64 total = state.range(0);
  std::mt19937_64 gen(1);
  Distribution d;
  std::vector<double> buffer(kChunk);
  for (auto _ : state) {
    for (int64 done = 0; done < total; done += kChunk) {
      for (int k = 0; k < kChunk; ++k) buffer[k] = d(gen);
      benchmark::DoNotOptimize(buffer.data());
    }
  }
  PerNumber(state, double(total));
}
BENCHMARK_TEMPLATE(BM_StdMt19937_64, std::uniform_real_distribution<double>)
    ->Arg(100000000)->Unit(benchmark::kMillisecond)->Iterations(2);
BENCHMARK_TEMPLATE(BM_StdMt19937_64, std::normal_distribution<double>)
    ->Arg(10000000)->Unit(benchmark::kMillisecond)->Iterations(2);

}  // namespace

BENCHMARK_MAIN();
