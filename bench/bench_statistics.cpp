// Median of 10^7 doubles (a sorted copy) beside std::nth_element on a copy, which is the
// lower bound for a selection; and the moving filters on 10^6 samples.
#include <benchmark/benchmark.h>

#include <algorithm>
#include <random>
#include <vector>

#include "nax/statistics.h"

namespace {

const std::vector<double>& Samples(int n) {
  static std::vector<double> data;
  if (int(data.size()) != n) {
    std::mt19937_64 gen(7);
    std::normal_distribution<double> d(0, 1);
    data.resize(n);
    for (auto& x : data) x = d(gen);
  }
  return data;
}

void BM_NaxMedian(benchmark::State& state) {
  const int n = int(state.range(0));
  std::vector<double> samples = Samples(n);
  CNaxStatistics<double> stats(n, samples.data());
  for (auto _ : state) benchmark::DoNotOptimize(stats.Median());
  state.counters["ns_per_element"] = benchmark::Counter(
      double(state.iterations()) * n, benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

void BM_StdNthElementMedian(benchmark::State& state) {
  const int n = int(state.range(0));
  const std::vector<double>& samples = Samples(n);
  std::vector<double> copy(n);
  for (auto _ : state) {
    std::copy(samples.begin(), samples.end(), copy.begin());
    auto middle = copy.begin() + (n - 1) / 2;
    std::nth_element(copy.begin(), middle, copy.end());
    double median = *middle;
    if (n % 2 == 0) median = (median + *std::min_element(middle + 1, copy.end())) / 2;
    benchmark::DoNotOptimize(median);
  }
  state.counters["ns_per_element"] = benchmark::Counter(
      double(state.iterations()) * n, benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

BENCHMARK(BM_NaxMedian)->Arg(10000000)->Unit(benchmark::kMillisecond)->Iterations(3);
BENCHMARK(BM_StdNthElementMedian)->Arg(10000000)->Unit(benchmark::kMillisecond)->Iterations(3);

template <bool kGauss>
void BM_Filtering(benchmark::State& state) {
  const int n = 1000000;
  const int window = int(state.range(0));
  std::vector<double> samples = Samples(n);
  CNaxStatistics<double> stats(n, samples.data());
  for (auto _ : state) {
    if (kGauss) {
      stats.GaussFiltering(window);
    } else {
      stats.AverageFiltering(window);
    }
    benchmark::DoNotOptimize(samples.data());
  }
  state.counters["ns_per_element"] = benchmark::Counter(
      double(state.iterations()) * n, benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}
BENCHMARK_TEMPLATE(BM_Filtering, false)->Arg(5)->Arg(21)->Unit(benchmark::kMillisecond);
BENCHMARK_TEMPLATE(BM_Filtering, true)->Arg(5)->Arg(21)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
