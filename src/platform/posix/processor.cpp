// What the machine and the C library can do. Asking the processor traps under most hypervisors, so
// the answer is kept.
#if defined(__x86_64__)
#include <cpuid.h>
#endif

#include <atomic>

#include "platform/platform.h"

namespace zv::platform {

namespace {

#if defined(__x86_64__)

// Whether the system saves the wide registers when it switches between threads.
bool system_keeps_wide_registers() {
  constexpr unsigned sse_and_avx = 6;
  unsigned low = 0;
  unsigned high = 0;
  __asm__("xgetbv" : "=a"(low), "=d"(high) : "c"(0));
  return (low & sse_and_avx) == sse_and_avx;
}

bool ask() {
  unsigned a = 0;
  unsigned b = 0;
  unsigned c = 0;
  unsigned d = 0;
  if (__get_cpuid(1, &a, &b, &c, &d) == 0) return false;
  if ((c & bit_OSXSAVE) == 0 || !system_keeps_wide_registers()) return false;
  return __get_cpuid_count(7, 0, &a, &b, &c, &d) != 0 && (b & bit_AVX2) != 0;
}

#else

bool ask() {
  return false;
}

#endif

}  // namespace

bool has_wide_vectors() {
  enum Answer { unasked, no, yes };
  static std::atomic<Answer> kept = unasked;
  Answer answer = kept.load(std::memory_order_relaxed);
  if (answer == unasked) {
    answer = ask() ? yes : no;
    kept.store(answer, std::memory_order_relaxed);
  }
  return answer == yes;
}

bool has_fast_search() {
  return true;
}

}  // namespace zv::platform
