// How a case is measured: the library and its peers side by side, on the same task.
#ifndef ZARVO_BENCH_FRAME_MEASURE_H
#define ZARVO_BENCH_FRAME_MEASURE_H

#include <benchmark/benchmark.h>

#include <cstdint>
#include <string>
#include <utility>

namespace bench {

// Defined by each item.
void add_cases();

// Stops the program unless everybody answers a case alike: only then do they do the same task.
void expect_same_answer(const std::string& what, const std::string& who, uint64_t answer);

// The cases of one table.
class Item {
 public:
  explicit Item(std::string name) : name_(std::move(name)) {}

  // Adds what `who` does for a case. `work` gives what it found, or nothing where that cannot be
  // compared. What is told of the measurement, such as UseRealTime(), goes to the result.
  template <class Work>
  benchmark::internal::Benchmark* add(const std::string& what, const std::string& who,
                                      Work work) const {
    if constexpr (std::is_void_v<decltype(work())>) {
      return add_loop(what, who, work);
    } else {
      expect_same_answer(name_ + '/' + what, who, static_cast<uint64_t>(work()));
      return add_loop(what, who, [work] { benchmark::DoNotOptimize(work()); });
    }
  }

 private:
  template <class Work>
  benchmark::internal::Benchmark* add_loop(const std::string& what, const std::string& who,
                                           Work work) const {
    const std::string name = name_ + '/' + what + '/' + who;
    return benchmark::RegisterBenchmark(name.c_str(), [work](benchmark::State& state) mutable {
      for (auto _ : state) {
        work();
        benchmark::ClobberMemory();
      }
    });
  }

  std::string name_;
};

}  // namespace bench

#endif
