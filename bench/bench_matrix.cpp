// Benchmarks of the run-time sized matrices: the general product, the singular value
// decomposition, the symmetric Jacobi eigensolver and the inverse, against Eigen and
// LAPACK where they are present, and against plain loops on raw arrays.
#include <benchmark/benchmark.h>

#include <cmath>
#include <random>
#include <vector>

#include "nax/matrix_n.h"

#ifdef NAX_HAVE_EIGEN
#include <Eigen/Dense>
#endif
#ifdef NAX_HAVE_LAPACKE
#include <lapacke.h>
#endif

namespace {

// Enough distinct operands that the largest ones do not all stay in cache between runs.
constexpr int kOperands = 4;

std::vector<double> RandomArray(int count, unsigned seed) {
  std::mt19937 generator(seed);
  std::uniform_real_distribution<double> uniform(-1.0, 1.0);
  std::vector<double> values(count);
  for (double& x : values) x = uniform(generator);
  return values;
}

// Random matrices; symmetric ones are (B + B^T) / 2, well-conditioned ones have n added on
// the diagonal.
std::vector<std::vector<double>> Operands(int n, bool symmetric, bool dominant) {
  std::vector<std::vector<double>> all;
  for (int k = 0; k < kOperands; ++k) {
    std::vector<double> a = RandomArray(n * n, 17u + k);
    if (symmetric)
      for (int i = 0; i < n; ++i)
        for (int j = 0; j < i; ++j) a[i * n + j] = a[j * n + i] = 0.5 * (a[i * n + j] + a[j * n + i]);
    if (dominant)
      for (int i = 0; i < n; ++i) a[i * n + i] += n;
    all.push_back(std::move(a));
  }
  return all;
}

// ---- Product --------------------------------------------------------------------------

void BM_ProductNax(benchmark::State& state) {
  const int n = static_cast<int>(state.range(0));
  const auto arrays = Operands(n, false, false);
  std::vector<CNaxMatrixMN<double>> m;
  for (const auto& a : arrays) m.emplace_back(n, n, a.data());
  int k = 0;
  for (auto _ : state) {
    CNaxBaseMatrix<double> c = m[k % kOperands] * m[(k + 1) % kOperands];
    benchmark::DoNotOptimize(&c(0, 0));
    ++k;
  }
  state.counters["GFlops"] = benchmark::Counter(2.0 * n * n * n, benchmark::Counter::kIsIterationInvariantRate, benchmark::Counter::kIs1000);
}
BENCHMARK(BM_ProductNax)->Arg(512)->Unit(benchmark::kMillisecond);

// The plain i-k-j loop on raw arrays, with the same order of additions per element.
void BM_ProductPlainIKJ(benchmark::State& state) {
  const int n = static_cast<int>(state.range(0));
  const auto arrays = Operands(n, false, false);
  std::vector<double> c(n * n);
  int k = 0;
  for (auto _ : state) {
    const double* a = arrays[k % kOperands].data();
    const double* b = arrays[(k + 1) % kOperands].data();
    for (int i = 0; i < n; ++i) {
      double* ci = c.data() + i * n;
      for (int j = 0; j < n; ++j) ci[j] = 0.0;
      for (int p = 0; p < n; ++p) {
        const double aip = a[i * n + p];
        const double* bp = b + p * n;
        for (int j = 0; j < n; ++j) ci[j] += aip * bp[j];
      }
    }
    benchmark::DoNotOptimize(c.data());
    ++k;
  }
  state.counters["GFlops"] = benchmark::Counter(2.0 * n * n * n, benchmark::Counter::kIsIterationInvariantRate, benchmark::Counter::kIs1000);
}
BENCHMARK(BM_ProductPlainIKJ)->Arg(512)->Unit(benchmark::kMillisecond);

#ifdef NAX_HAVE_EIGEN
using EigenMatrix = Eigen::Matrix<double, Eigen::Dynamic, Eigen::Dynamic, Eigen::RowMajor>;

std::vector<EigenMatrix> EigenOperands(int n, bool symmetric, bool dominant) {
  std::vector<EigenMatrix> all;
  for (const auto& a : Operands(n, symmetric, dominant))
    all.push_back(Eigen::Map<const EigenMatrix>(a.data(), n, n));
  return all;
}

void BM_ProductEigen(benchmark::State& state) {
  const int n = static_cast<int>(state.range(0));
  const auto m = EigenOperands(n, false, false);
  EigenMatrix c(n, n);
  int k = 0;
  for (auto _ : state) {
    c.noalias() = m[k % kOperands] * m[(k + 1) % kOperands];
    benchmark::DoNotOptimize(c.data());
    ++k;
  }
  state.counters["GFlops"] = benchmark::Counter(2.0 * n * n * n, benchmark::Counter::kIsIterationInvariantRate, benchmark::Counter::kIs1000);
}
BENCHMARK(BM_ProductEigen)->Arg(512)->Unit(benchmark::kMillisecond);
#endif

// ---- Singular value decomposition -------------------------------------------------------

void BM_SvdNax(benchmark::State& state) {
  const int n = static_cast<int>(state.range(0));
  const auto arrays = Operands(n, false, false);
  std::vector<CNaxMatrixMN<double>> m;
  for (const auto& a : arrays) m.emplace_back(n, n, a.data());
  CNaxMatrixMN<double> u(n, n), v(n, n);
  CNaxVectorN<double> w(n);
  int k = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(m[k % kOperands].SV_Decomposition(u, v, w, 1e-9));
    ++k;
  }
}
BENCHMARK(BM_SvdNax)->Arg(100)->Arg(300)->Unit(benchmark::kMillisecond);

#ifdef NAX_HAVE_LAPACKE
void BM_SvdLapackDgesvd(benchmark::State& state) {
  const int n = static_cast<int>(state.range(0));
  const auto arrays = Operands(n, false, false);
  std::vector<double> a(n * n), u(n * n), vt(n * n), s(n), superb(n);
  int k = 0;
  for (auto _ : state) {
    a = arrays[k % kOperands];
    benchmark::DoNotOptimize(LAPACKE_dgesvd(LAPACK_ROW_MAJOR, 'A', 'A', n, n, a.data(), n, s.data(),
                                            u.data(), n, vt.data(), n, superb.data()));
    ++k;
  }
}
BENCHMARK(BM_SvdLapackDgesvd)->Arg(100)->Arg(300)->Unit(benchmark::kMillisecond);
#endif

#ifdef NAX_HAVE_EIGEN
void BM_SvdEigenJacobi(benchmark::State& state) {
  const int n = static_cast<int>(state.range(0));
  const auto m = EigenOperands(n, false, false);
  int k = 0;
  for (auto _ : state) {
    Eigen::JacobiSVD<EigenMatrix> svd(m[k % kOperands], Eigen::ComputeFullU | Eigen::ComputeFullV);
    benchmark::DoNotOptimize(svd.singularValues().data());
    ++k;
  }
}
BENCHMARK(BM_SvdEigenJacobi)->Arg(100)->Arg(300)->Unit(benchmark::kMillisecond);
#endif

// ---- Symmetric eigenproblem -------------------------------------------------------------

void BM_EigenNax(benchmark::State& state) {
  const int n = static_cast<int>(state.range(0));
  const auto arrays = Operands(n, true, false);
  std::vector<CNaxMatrixN<double>> m;
  for (const auto& a : arrays) m.emplace_back(n, a.data());
  CNaxMatrixN<double> vectors(n);
  CNaxVectorN<double> values(n);
  int k = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(m[k % kOperands].SymmetricEigensolve(values, vectors, 1e-9));
    ++k;
  }
}
BENCHMARK(BM_EigenNax)->Arg(100)->Arg(300)->Unit(benchmark::kMillisecond);

// The textbook cyclic Jacobi method with threshold on raw arrays (eigenvectors in columns).
void TextbookJacobi(int n, double* a, double* d, double* v) {
  std::vector<double> b(n), z(n, 0.0);
  for (int i = 0; i < n; ++i) {
    for (int j = 0; j < n; ++j) v[i * n + j] = i == j;
    b[i] = d[i] = a[i * n + i];
  }
  auto rotate = [](double& x, double& y, double s, double tau) {
    const double g = x, h = y;
    x = g - s * (h + g * tau);
    y = h + s * (g - h * tau);
  };
  for (int sweep = 1; sweep <= 50; ++sweep) {
    double sum = 0.0;
    for (int p = 0; p < n - 1; ++p)
      for (int q = p + 1; q < n; ++q) sum += std::fabs(a[p * n + q]);
    if (sum < 1e-9) return;
    const double threshold = sweep < 4 ? 0.2 * sum / (n * n) : 0.0;
    for (int p = 0; p < n - 1; ++p) {
      for (int q = p + 1; q < n; ++q) {
        const double g = 100.0 * std::fabs(a[p * n + q]);
        if (sweep > 4 && std::fabs(d[p]) + g == std::fabs(d[p]) && std::fabs(d[q]) + g == std::fabs(d[q])) {
          a[p * n + q] = 0.0;
        } else if (std::fabs(a[p * n + q]) > threshold) {
          double h = d[q] - d[p], t;
          if (std::fabs(h) + g == std::fabs(h)) {
            t = a[p * n + q] / h;
          } else {
            const double theta = 0.5 * h / a[p * n + q];
            t = 1.0 / (std::fabs(theta) + std::sqrt(1.0 + theta * theta));
            if (theta < 0.0) t = -t;
          }
          const double c = 1.0 / std::sqrt(1 + t * t), s = t * c, tau = s / (1.0 + c);
          h = t * a[p * n + q];
          z[p] -= h;
          z[q] += h;
          d[p] -= h;
          d[q] += h;
          a[p * n + q] = 0.0;
          for (int j = 0; j < p; ++j) rotate(a[j * n + p], a[j * n + q], s, tau);
          for (int j = p + 1; j < q; ++j) rotate(a[p * n + j], a[j * n + q], s, tau);
          for (int j = q + 1; j < n; ++j) rotate(a[p * n + j], a[q * n + j], s, tau);
          for (int j = 0; j < n; ++j) rotate(v[j * n + p], v[j * n + q], s, tau);
        }
      }
    }
    for (int i = 0; i < n; ++i) {
      b[i] += z[i];
      d[i] = b[i];
      z[i] = 0.0;
    }
  }
}

void BM_EigenTextbookJacobi(benchmark::State& state) {
  const int n = static_cast<int>(state.range(0));
  const auto arrays = Operands(n, true, false);
  std::vector<double> a(n * n), d(n), v(n * n);
  int k = 0;
  for (auto _ : state) {
    a = arrays[k % kOperands];
    TextbookJacobi(n, a.data(), d.data(), v.data());
    benchmark::DoNotOptimize(d.data());
    ++k;
  }
}
BENCHMARK(BM_EigenTextbookJacobi)->Arg(100)->Arg(300)->Unit(benchmark::kMillisecond);

#ifdef NAX_HAVE_EIGEN
void BM_EigenSelfAdjoint(benchmark::State& state) {
  const int n = static_cast<int>(state.range(0));
  const auto m = EigenOperands(n, true, false);
  int k = 0;
  for (auto _ : state) {
    Eigen::SelfAdjointEigenSolver<EigenMatrix> solver(m[k % kOperands]);
    benchmark::DoNotOptimize(solver.eigenvalues().data());
    ++k;
  }
}
BENCHMARK(BM_EigenSelfAdjoint)->Arg(100)->Arg(300)->Unit(benchmark::kMillisecond);
#endif

// ---- Inverse ----------------------------------------------------------------------------

void BM_InverseNax(benchmark::State& state) {
  const int n = static_cast<int>(state.range(0));
  const auto arrays = Operands(n, false, true);
  std::vector<CNaxMatrixN<double>> m;
  for (const auto& a : arrays) m.emplace_back(n, a.data());
  CNaxMatrixN<double> inverse(n);
  int k = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(m[k % kOperands].Inverse(inverse, 1e-9));
    ++k;
  }
}
BENCHMARK(BM_InverseNax)->Arg(300)->Unit(benchmark::kMillisecond);

#ifdef NAX_HAVE_EIGEN
void BM_InverseEigenPartialPivLU(benchmark::State& state) {
  const int n = static_cast<int>(state.range(0));
  const auto m = EigenOperands(n, false, true);
  EigenMatrix inverse(n, n);
  int k = 0;
  for (auto _ : state) {
    inverse = Eigen::PartialPivLU<EigenMatrix>(m[k % kOperands]).inverse();
    benchmark::DoNotOptimize(inverse.data());
    ++k;
  }
}
BENCHMARK(BM_InverseEigenPartialPivLU)->Arg(300)->Unit(benchmark::kMillisecond);
#endif

}  // namespace

BENCHMARK_MAIN();
