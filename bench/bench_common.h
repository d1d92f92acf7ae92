// Shared pieces of the benchmark programs: a reporter that prints, after the usual table,
// the ratio of each nax benchmark to its reference, and a main that uses it.
#ifndef NAX_BENCH_COMMON_H
#define NAX_BENCH_COMMON_H

#include <benchmark/benchmark.h>

#include <cstdio>
#include <map>
#include <string>
#include <utility>
#include <vector>

namespace nax::bench {

/// A pair of benchmark run names: the nax one and the reference it is compared with.
struct Comparison {
  std::string nax;
  std::string reference;
};

class RatioReporter : public ::benchmark::ConsoleReporter {
 public:
  explicit RatioReporter(std::vector<Comparison> comparisons) : comparisons_(std::move(comparisons)) {}

  void ReportRuns(const std::vector<Run>& runs) override {
    for (const Run& run : runs)
      if (run.run_type == Run::RT_Iteration) times_[run.benchmark_name()] = run.GetAdjustedRealTime();
    ConsoleReporter::ReportRuns(runs);
  }

  void Finalize() override {
    ConsoleReporter::Finalize();
    std::printf("\n%-48s %-48s %8s\n", "nax", "reference", "ratio");
    for (const Comparison& c : comparisons_) {
      auto a = times_.find(c.nax), b = times_.find(c.reference);
      if (a == times_.end() || b == times_.end()) continue;
      std::printf("%-48s %-48s %8.2f\n", c.nax.c_str(), c.reference.c_str(), a->second / b->second);
    }
  }

 private:
  std::vector<Comparison> comparisons_;
  std::map<std::string, double> times_;
};

/// Runs the registered benchmarks and prints the ratios of the given pairs.
inline int RunWithRatios(int argc, char** argv, std::vector<Comparison> comparisons) {
  ::benchmark::Initialize(&argc, argv);
  if (::benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
  RatioReporter reporter(std::move(comparisons));
  ::benchmark::RunSpecifiedBenchmarks(&reporter);
  ::benchmark::Shutdown();
  return 0;
}

}  // namespace nax::bench

#endif  // NAX_BENCH_COMMON_H
