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

// What this thread has used of the processor: other programs' turns do not count.
double cpu_seconds();

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

  // The same for work that changes its input. Out of the measured time, `prepare` makes that anew
  // and `answer` tells what has become of it.
  template <class Prepare, class Work, class Answer>
  benchmark::internal::Benchmark* add_prepared(const std::string& what, const std::string& who,
                                               Prepare prepare, Work work, Answer answer) const {
    auto input = prepare();
    work(input);
    expect_same_answer(name_ + '/' + what, who, static_cast<uint64_t>(answer(input)));
    const std::string name = name_ + '/' + what + '/' + who;
    const auto measured = [prepare, work](benchmark::State& state) {
      for (auto _ : state) {
        auto fresh = prepare();
        const double start = cpu_seconds();
        work(fresh);
        benchmark::ClobberMemory();
        state.SetIterationTime(cpu_seconds() - start);
      }
    };
    return benchmark::RegisterBenchmark(name.c_str(), measured)->UseManualTime();
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
