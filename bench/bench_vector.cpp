// Dot product and Euclidean length of long run-time sized vectors, against Eigen.
#include <random>
#include <vector>

#include "bench_common.h"
#include "nax/vector_n.h"

#ifdef NAX_HAVE_EIGEN
#include <Eigen/Dense>
#endif

namespace {

constexpr int kOperands = 4;  // rotate through several operands so caches don't flatter

std::vector<double> RandomValues(int n, unsigned seed) {
  std::mt19937_64 rng(seed);
  std::uniform_real_distribution<double> u(-1, 1);
  std::vector<double> v(n);
  for (double& x : v) x = u(rng);
  return v;
}

std::vector<CNaxVectorN<double>> NaxOperands(int n) {
  std::vector<CNaxVectorN<double>> v;
  for (int k = 0; k < kOperands + 1; ++k) v.emplace_back(n, RandomValues(n, k).data());
  return v;
}

void NaxDot(benchmark::State& state) {
  const auto v = NaxOperands(state.range(0));
  int k = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(v[k].Dot(v[k + 1]));
    k = (k + 1) % kOperands;
  }
  state.SetBytesProcessed(state.iterations() * state.range(0) * 16);
}

void NaxLength(benchmark::State& state) {
  const auto v = NaxOperands(state.range(0));
  int k = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(v[k].Length());
    k = (k + 1) % kOperands;
  }
  state.SetBytesProcessed(state.iterations() * state.range(0) * 8);
}

BENCHMARK(NaxDot)->Arg(1000000);
BENCHMARK(NaxLength)->Arg(1000000);

#ifdef NAX_HAVE_EIGEN
std::vector<Eigen::VectorXd> EigenOperands(int n) {
  std::vector<Eigen::VectorXd> v;
  for (int k = 0; k < kOperands + 1; ++k) {
    const std::vector<double> values = RandomValues(n, k);
    v.push_back(Eigen::Map<const Eigen::VectorXd>(values.data(), n));
  }
  return v;
}

void EigenDot(benchmark::State& state) {
  const auto v = EigenOperands(state.range(0));
  int k = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(v[k].dot(v[k + 1]));
    k = (k + 1) % kOperands;
  }
  state.SetBytesProcessed(state.iterations() * state.range(0) * 16);
}

void EigenLength(benchmark::State& state) {
  const auto v = EigenOperands(state.range(0));
  int k = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(v[k].norm());
    k = (k + 1) % kOperands;
  }
  state.SetBytesProcessed(state.iterations() * state.range(0) * 8);
}

BENCHMARK(EigenDot)->Arg(1000000);
BENCHMARK(EigenLength)->Arg(1000000);
#endif

}  // namespace

int main(int argc, char** argv) {
  return nax::bench::RunWithRatios(argc, argv,
                                   {{"NaxDot/1000000", "EigenDot/1000000"},
                                    {"NaxLength/1000000", "EigenLength/1000000"}});
}
