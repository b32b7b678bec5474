// The frame around an item: its cases are compared, then measured.
#include "frame/measure.h"

#include <time.h>

#include <cstdio>
#include <cstdlib>
#include <map>

namespace bench {

void expect_same_answer(const std::string& what, const std::string& who, uint64_t answer) {
  static std::map<std::string, uint64_t> answers;
  const auto [first, is_new] = answers.emplace(what, answer);
  if (is_new || first->second == answer) return;
  std::fprintf(stderr, "%s: %s answers %llu, the others %llu\n", what.c_str(), who.c_str(),
               static_cast<unsigned long long>(answer),
               static_cast<unsigned long long>(first->second));
  std::exit(1);
}

// Windows counts a thread's time in steps of 16 ms: there it is the clock's.
#ifdef _WIN32
constexpr clockid_t measured_clock = CLOCK_MONOTONIC;
#else
constexpr clockid_t measured_clock = CLOCK_THREAD_CPUTIME_ID;
#endif

double cpu_seconds() {
  timespec now{};
  clock_gettime(measured_clock, &now);
  return static_cast<double>(now.tv_sec) + 1e-9 * static_cast<double>(now.tv_nsec);
}

}  // namespace bench

int main(int argc, char** argv) {
  benchmark::Initialize(&argc, argv);
  if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
  bench::add_cases();
  benchmark::RunSpecifiedBenchmarks();
  return 0;
}
