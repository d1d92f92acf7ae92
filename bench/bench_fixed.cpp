// Fixed-size matrices and the 3 x 3 solver against Eigen's fixed-size types: products,
// inverses, determinants, matrix times vector, Solve3x3System and rotations from Euler
// angles, in float and double. Every benchmark also counts heap allocations made inside its
// timed loop (the counter "allocs" per iteration), which must be 0.
#include <atomic>
#include <cstdlib>
#include <new>
#include <random>
#include <vector>

#include "bench_common.h"
#include "nax/algebra.h"
#include "nax/matrix3.h"
#include "nax/matrix4.h"

#ifdef NAX_HAVE_EIGEN
#include <Eigen/Dense>
#endif

namespace {
std::atomic<long> g_allocations{0};
}  // namespace

// Counting replacements of the global allocation functions of this program. GCC takes the
// malloc/free pairing of the replacements for a mismatch, hence the pragma.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wmismatched-new-delete"
void* operator new(std::size_t size) {
  g_allocations.fetch_add(1, std::memory_order_relaxed);
  if (void* p = std::malloc(size ? size : 1)) return p;
  throw std::bad_alloc();
}
void* operator new[](std::size_t size) { return operator new(size); }
void operator delete(void* p) noexcept { std::free(p); }
void operator delete[](void* p) noexcept { std::free(p); }
void operator delete(void* p, std::size_t) noexcept { std::free(p); }
void operator delete[](void* p, std::size_t) noexcept { std::free(p); }
#pragma GCC diagnostic pop

namespace {

constexpr int kOperands = 1024;  // rotate through many operands so caches don't flatter

template <typename T>
std::vector<T> RandomValues(int n, unsigned seed) {
  std::mt19937_64 rng(seed);
  std::uniform_real_distribution<T> u(-1, 1);
  std::vector<T> v(n);
  for (T& x : v) x = u(rng);
  return v;
}

// Runs body(k) over the operands and reports the allocations per iteration.
template <typename Body>
void Run(benchmark::State& state, Body body) {
  int k = 0;
  const long before = g_allocations.load();
  for (auto _ : state) {
    body(k);
    k = (k + 1) & (kOperands - 1);
  }
  state.counters["allocs"] = double(g_allocations.load() - before) / double(state.iterations());
}

template <typename M, int N>
std::vector<M> NaxMatrices(unsigned seed) {
  const auto v = RandomValues<typename std::remove_reference_t<decltype(M()[0])>>(kOperands * N * N, seed);
  std::vector<M> m;
  for (int k = 0; k < kOperands; ++k) {
    m.emplace_back(v.data() + k * N * N);
    for (int i = 0; i < N; ++i) m.back()(i, i) += 2;  // well conditioned
  }
  return m;
}

template <typename T>
void NaxProduct3(benchmark::State& state) {
  const auto a = NaxMatrices<CNaxMatrix3<T>, 3>(1), b = NaxMatrices<CNaxMatrix3<T>, 3>(2);
  Run(state, [&](int k) { benchmark::DoNotOptimize(a[k] * b[k]); });
}
template <typename T>
void NaxProduct4(benchmark::State& state) {
  const auto a = NaxMatrices<CNaxMatrix4<T>, 4>(1), b = NaxMatrices<CNaxMatrix4<T>, 4>(2);
  Run(state, [&](int k) { benchmark::DoNotOptimize(a[k] * b[k]); });
}
template <typename T>
void NaxInverse3(benchmark::State& state) {
  const auto a = NaxMatrices<CNaxMatrix3<T>, 3>(3);
  CNaxMatrix3<T> r;
  Run(state, [&](int k) {
    benchmark::DoNotOptimize(a[k].Inverse(r, T(1e-6)));
    benchmark::DoNotOptimize(r);
  });
}
template <typename T>
void NaxInverse4(benchmark::State& state) {
  const auto a = NaxMatrices<CNaxMatrix4<T>, 4>(3);
  CNaxMatrix4<T> r;
  Run(state, [&](int k) {
    benchmark::DoNotOptimize(a[k].Inverse(r, T(1e-6)));
    benchmark::DoNotOptimize(r);
  });
}
template <typename T>
void NaxDet3(benchmark::State& state) {
  const auto a = NaxMatrices<CNaxMatrix3<T>, 3>(4);
  Run(state, [&](int k) { benchmark::DoNotOptimize(a[k].Det()); });
}
template <typename T>
void NaxDet4(benchmark::State& state) {
  const auto a = NaxMatrices<CNaxMatrix4<T>, 4>(4);
  Run(state, [&](int k) { benchmark::DoNotOptimize(a[k].Det()); });
}
template <typename T>
void NaxMatVec3(benchmark::State& state) {
  const auto a = NaxMatrices<CNaxMatrix3<T>, 3>(5);
  const auto v = RandomValues<T>(kOperands * 3, 6);
  std::vector<CNaxVector3<T>> x;
  for (int k = 0; k < kOperands; ++k) x.emplace_back(v.data() + 3 * k);
  Run(state, [&](int k) { benchmark::DoNotOptimize(a[k] * x[k]); });
}
template <typename T>
void NaxMatVec4(benchmark::State& state) {
  const auto a = NaxMatrices<CNaxMatrix4<T>, 4>(5);
  const auto v = RandomValues<T>(kOperands * 4, 6);
  std::vector<CNaxVector4<T>> x;
  for (int k = 0; k < kOperands; ++k) x.emplace_back(v.data() + 4 * k);
  Run(state, [&](int k) { benchmark::DoNotOptimize(a[k] * x[k]); });
}
template <typename T>
void NaxSolve3x3(benchmark::State& state) {
  const auto m = NaxMatrices<CNaxMatrix3<T>, 3>(7);
  const auto r = RandomValues<T>(kOperands * 3, 8);
  Run(state, [&](int k) {
    const CNaxMatrix3<T>& a = m[k];
    const T* b = r.data() + 3 * k;
    T x, y, z;
    int32 quality;
    benchmark::DoNotOptimize(CNaxAlgebra::Solve3x3System(a[0], a[1], a[2], a[3], a[4], a[5], a[6], a[7], a[8], b[0],
                                                         b[1], b[2], x, y, z, quality, T(1e-6)));
    benchmark::DoNotOptimize(x);
    benchmark::DoNotOptimize(y);
    benchmark::DoNotOptimize(z);
  });
}
template <typename T>
void NaxEuler(benchmark::State& state) {
  const auto angles = RandomValues<T>(kOperands * 3, 9);
  CNaxMatrix3<T> m;
  Run(state, [&](int k) {
    const T* a = angles.data() + 3 * k;
    m.SetRotationByEulerAngles(a[0] * T(170), a[1] * T(80), a[2] * T(170), naxRotationsOrderXYZ);
    benchmark::DoNotOptimize(m);
  });
}

#define NAX_BENCH_BOTH(name)    \
  BENCHMARK_TEMPLATE(name, float); \
  BENCHMARK_TEMPLATE(name, double);
NAX_BENCH_BOTH(NaxProduct3)
NAX_BENCH_BOTH(NaxProduct4)
NAX_BENCH_BOTH(NaxInverse3)
NAX_BENCH_BOTH(NaxInverse4)
NAX_BENCH_BOTH(NaxDet3)
NAX_BENCH_BOTH(NaxDet4)
NAX_BENCH_BOTH(NaxMatVec3)
NAX_BENCH_BOTH(NaxMatVec4)
NAX_BENCH_BOTH(NaxSolve3x3)
NAX_BENCH_BOTH(NaxEuler)

#ifdef NAX_HAVE_EIGEN
template <typename M>
std::vector<M> EigenMatrices(unsigned seed) {
  using T = typename M::Scalar;
  constexpr int N = M::RowsAtCompileTime;
  const auto v = RandomValues<T>(kOperands * N * N, seed);
  std::vector<M> m(kOperands);
  for (int k = 0; k < kOperands; ++k) {
    m[k] = Eigen::Map<const Eigen::Matrix<T, N, N, Eigen::RowMajor>>(v.data() + k * N * N);
    m[k].diagonal().array() += 2;
  }
  return m;
}
template <typename T>
using E3 = Eigen::Matrix<T, 3, 3>;
template <typename T>
using E4 = Eigen::Matrix<T, 4, 4>;

template <typename T>
void EigenProduct3(benchmark::State& state) {
  const auto a = EigenMatrices<E3<T>>(1), b = EigenMatrices<E3<T>>(2);
  Run(state, [&](int k) { benchmark::DoNotOptimize(E3<T>(a[k] * b[k])); });
}
template <typename T>
void EigenProduct4(benchmark::State& state) {
  const auto a = EigenMatrices<E4<T>>(1), b = EigenMatrices<E4<T>>(2);
  Run(state, [&](int k) { benchmark::DoNotOptimize(E4<T>(a[k] * b[k])); });
}
template <typename T>
void EigenInverse3(benchmark::State& state) {
  const auto a = EigenMatrices<E3<T>>(3);
  Run(state, [&](int k) { benchmark::DoNotOptimize(E3<T>(a[k].inverse())); });
}
template <typename T>
void EigenInverse4(benchmark::State& state) {
  const auto a = EigenMatrices<E4<T>>(3);
  Run(state, [&](int k) { benchmark::DoNotOptimize(E4<T>(a[k].inverse())); });
}
template <typename T>
void EigenDet3(benchmark::State& state) {
  const auto a = EigenMatrices<E3<T>>(4);
  Run(state, [&](int k) { benchmark::DoNotOptimize(a[k].determinant()); });
}
template <typename T>
void EigenDet4(benchmark::State& state) {
  const auto a = EigenMatrices<E4<T>>(4);
  Run(state, [&](int k) { benchmark::DoNotOptimize(a[k].determinant()); });
}
template <typename T>
void EigenMatVec3(benchmark::State& state) {
  const auto a = EigenMatrices<E3<T>>(5);
  const auto v = RandomValues<T>(kOperands * 3, 6);
  std::vector<Eigen::Matrix<T, 3, 1>> x(kOperands);
  for (int k = 0; k < kOperands; ++k) x[k] = Eigen::Map<const Eigen::Matrix<T, 3, 1>>(v.data() + 3 * k);
  Run(state, [&](int k) { benchmark::DoNotOptimize(Eigen::Matrix<T, 3, 1>(a[k] * x[k])); });
}
template <typename T>
void EigenMatVec4(benchmark::State& state) {
  const auto a = EigenMatrices<E4<T>>(5);
  const auto v = RandomValues<T>(kOperands * 4, 6);
  std::vector<Eigen::Matrix<T, 4, 1>> x(kOperands);
  for (int k = 0; k < kOperands; ++k) x[k] = Eigen::Map<const Eigen::Matrix<T, 4, 1>>(v.data() + 4 * k);
  Run(state, [&](int k) { benchmark::DoNotOptimize(Eigen::Matrix<T, 4, 1>(a[k] * x[k])); });
}
template <typename T>
void EigenSolve3x3(benchmark::State& state) {
  const auto m = EigenMatrices<E3<T>>(7);
  const auto r = RandomValues<T>(kOperands * 3, 8);
  Run(state, [&](int k) {
    const Eigen::Map<const Eigen::Matrix<T, 3, 1>> b(r.data() + 3 * k);
    benchmark::DoNotOptimize(Eigen::Matrix<T, 3, 1>(m[k].inverse() * b));
  });
}
template <typename T>
void EigenEuler(benchmark::State& state) {
  const auto angles = RandomValues<T>(kOperands * 3, 9);
  const T toRad = T(3.14159265358979323846 / 180);
  E3<T> m;
  Run(state, [&](int k) {
    const T* a = angles.data() + 3 * k;
    m = (Eigen::AngleAxis<T>(a[2] * T(170) * toRad, Eigen::Matrix<T, 3, 1>::UnitZ()) *
         Eigen::AngleAxis<T>(a[1] * T(80) * toRad, Eigen::Matrix<T, 3, 1>::UnitY()) *
         Eigen::AngleAxis<T>(a[0] * T(170) * toRad, Eigen::Matrix<T, 3, 1>::UnitX()))
            .toRotationMatrix();
    benchmark::DoNotOptimize(m);
  });
}

NAX_BENCH_BOTH(EigenProduct3)
NAX_BENCH_BOTH(EigenProduct4)
NAX_BENCH_BOTH(EigenInverse3)
NAX_BENCH_BOTH(EigenInverse4)
NAX_BENCH_BOTH(EigenDet3)
NAX_BENCH_BOTH(EigenDet4)
NAX_BENCH_BOTH(EigenMatVec3)
NAX_BENCH_BOTH(EigenMatVec4)
NAX_BENCH_BOTH(EigenSolve3x3)
NAX_BENCH_BOTH(EigenEuler)
#endif

}  // namespace

int main(int argc, char** argv) {
  std::vector<nax::bench::Comparison> pairs;
  for (const char* op : {"Product3", "Product4", "Inverse3", "Inverse4", "Det3", "Det4", "MatVec3", "MatVec4",
                         "Solve3x3", "Euler"})
    for (const char* type : {"float", "double"})
      pairs.push_back({std::string("Nax") + op + "<" + type + ">", std::string("Eigen") + op + "<" + type + ">"});
  return nax::bench::RunWithRatios(argc, argv, pairs);
}
