// Heap accounting for the benchmark programs that report peak memory: replaces the global
// allocation operators so that every allocation carries its size in a 16-byte header.
// Include it in exactly one source file of a program.
#ifndef NAX_BENCH_HEAP_COUNTER_H
#define NAX_BENCH_HEAP_COUNTER_H

#include <atomic>
#include <cstdlib>
#include <new>

namespace {
std::atomic<long long> g_live{0};  // bytes allocated and not yet released
std::atomic<long long> g_peak{0};  // the largest g_live since it was last reset

void* CountedAlloc(std::size_t n) {
  void* p = std::malloc(n + 16);
  if (p == nullptr) throw std::bad_alloc();
  *static_cast<std::size_t*>(p) = n;
  const long long live = g_live.fetch_add(static_cast<long long>(n)) + static_cast<long long>(n);
  long long peak = g_peak.load();
  while (live > peak && !g_peak.compare_exchange_weak(peak, live)) {
  }
  return static_cast<char*>(p) + 16;
}

void CountedFree(void* q) {
  if (q == nullptr) return;
  void* p = static_cast<char*>(q) - 16;
  g_live.fetch_sub(static_cast<long long>(*static_cast<std::size_t*>(p)));
  std::free(p);
}
}  // namespace

void* operator new(std::size_t n) { return CountedAlloc(n); }
void* operator new[](std::size_t n) { return CountedAlloc(n); }
void operator delete(void* p) noexcept { CountedFree(p); }
void operator delete[](void* p) noexcept { CountedFree(p); }
void operator delete(void* p, std::size_t) noexcept { CountedFree(p); }
void operator delete[](void* p, std::size_t) noexcept { CountedFree(p); }

#endif  // NAX_BENCH_HEAP_COUNTER_H
