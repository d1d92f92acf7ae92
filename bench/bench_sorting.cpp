// Quicksort of the sorting family against std::sort, on 10^7 random, sorted and
// all-equal doubles and random int32, and the index form against sorting (value, index)
// pairs. Counter ns_per_element; compare the nax and std rows of the same arguments.
#include <benchmark/benchmark.h>

#include <algorithm>
#include <cstring>
#include <random>
#include <utility>
#include <vector>

#include "nax/sorting.h"

namespace {

enum Input { kRandom = 0, kSorted = 1, kEqual = 2 };

template <typename T>
const std::vector<T>& Source(int n, int kind) {
  static std::vector<T> data;
  static int cachedN = -1, cachedKind = -1;
  if (cachedN != n || cachedKind != kind) {
    std::mt19937_64 gen(42);
    data.resize(n);
    for (auto& x : data) {
      if constexpr (std::is_floating_point_v<T>) {
        x = T(std::uniform_real_distribution<double>(-1e6, 1e6)(gen));
      } else {
        x = T(gen());
      }
    }
    if (kind == kSorted) std::sort(data.begin(), data.end());
    if (kind == kEqual) std::fill(data.begin(), data.end(), T(3));
    cachedN = n;
    cachedKind = kind;
  }
  return data;
}

void PerElement(benchmark::State& state, int n) {
  state.counters["ns_per_element"] = benchmark::Counter(
      double(state.iterations()) * n,
      benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

template <typename T, bool kNax>
void BM_Sort(benchmark::State& state) {
  const int n = int(state.range(0));
  const auto& source = Source<T>(n, int(state.range(1)));
  std::vector<T> work(n);
  for (auto _ : state) {
    state.PauseTiming();
    std::memcpy(work.data(), source.data(), n * sizeof(T));
    state.ResumeTiming();
    if constexpr (kNax) {
      CNaxSorting<T> sorting(n, work.data(), 1, 1, 0);
      sorting.Sort();
    } else {
      std::sort(work.begin(), work.end());
    }
    benchmark::DoNotOptimize(work.data());
  }
  PerElement(state, n);
}

void SortArgs(benchmark::internal::Benchmark* b) {
  for (int kind : {kRandom, kSorted, kEqual}) b->Args({10000000, kind});
  b->Unit(benchmark::kMillisecond)->Iterations(3);
}

BENCHMARK_TEMPLATE(BM_Sort, double, true)->Apply(SortArgs);
BENCHMARK_TEMPLATE(BM_Sort, double, false)->Apply(SortArgs);
BENCHMARK_TEMPLATE(BM_Sort, int32, true)->Args({10000000, kRandom})->Unit(benchmark::kMillisecond)->Iterations(3);
BENCHMARK_TEMPLATE(BM_Sort, int32, false)->Args({10000000, kRandom})->Unit(benchmark::kMillisecond)->Iterations(3);

void BM_NaxSortWithIndices(benchmark::State& state) {
  const int n = int(state.range(0));
  const auto& source = Source<double>(n, kRandom);
  std::vector<double> values(n);
  std::vector<int32> indices(n);
  for (auto _ : state) {
    naxSort(n, source.data(), values.data(), indices.data(), 1, 0);
    benchmark::DoNotOptimize(indices.data());
  }
  PerElement(state, n);
}

void BM_StdSortPairs(benchmark::State& state) {
  const int n = int(state.range(0));
  const auto& source = Source<double>(n, kRandom);
  std::vector<std::pair<double, int32>> pairs(n);
  std::vector<double> values(n);
  std::vector<int32> indices(n);
  for (auto _ : state) {
    for (int k = 0; k < n; ++k) pairs[k] = {source[k], k};
    std::sort(pairs.begin(), pairs.end(),
              [](const auto& a, const auto& b) { return a.first < b.first; });
    for (int k = 0; k < n; ++k) {
      values[k] = pairs[k].first;
      indices[k] = pairs[k].second;
    }
    benchmark::DoNotOptimize(indices.data());
  }
  PerElement(state, n);
}

BENCHMARK(BM_NaxSortWithIndices)->Arg(10000000)->Unit(benchmark::kMillisecond)->Iterations(2);
BENCHMARK(BM_StdSortPairs)->Arg(10000000)->Unit(benchmark::kMillisecond)->Iterations(2);

}  // namespace

BENCHMARK_MAIN();
