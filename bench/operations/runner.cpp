#include "runner.h"

#include <sys/resource.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <iomanip>
#include <iostream>
#include <ranges>
#include <regex>
#include <thread>

namespace bench {

namespace {

double seconds(const timeval& time) {
  return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) * 1e-6;
}

// Of this process and of the programs that it has waited for.
double cpu_seconds() {
  rusage self = {};
  rusage children = {};
  getrusage(RUSAGE_SELF, &self);
  getrusage(RUSAGE_CHILDREN, &children);
  return seconds(self.ru_utime) + seconds(self.ru_stime) + seconds(children.ru_utime) +
         seconds(children.ru_stime);
}

template <class Time>
double median(std::vector<Time> times, double Time::*which) {
  std::ranges::sort(times, {}, which);
  const size_t middle = times.size() / 2;
  const double upper = times[middle].*which;
  return times.size() % 2 != 0 ? upper : (upper + times[middle - 1].*which) / 2;
}

}  // namespace

int Runner::scaled(int count) const {
  return std::max(1, static_cast<int>(count * settings_.scale));
}

bool Runner::run_once(const Row& row, const Contender& contender, std::vector<Time>* times) {
  using Clock = std::chrono::steady_clock;
  row.before();
  const double cpu = cpu_seconds();
  const Clock::time_point begin = Clock::now();
  const bool good = contender.run();
  const std::chrono::duration<double, std::nano> real = Clock::now() - begin;
  if (times != nullptr)
    times->push_back({real.count() / row.calls, (cpu_seconds() - cpu) * 1e9 / row.calls});
  row.after();
  if (!good) std::cerr << row.name << '/' << contender.who << ": failed\n";
  return good;
}

void Runner::measure(const Row& row) {
  if (!std::regex_search(row.name, std::regex(settings_.filter))) return;
  const size_t first = results_.size();
  const size_t count = row.contenders.size();
  for (const Contender& contender : row.contenders)
    results_.push_back({row.name + "/" + contender.who, row.clock ? "/real_time" : "", {}});
  for (int round = -1; round < settings_.rounds; ++round) {
    for (size_t turn = 0; turn < count; ++turn) {
      const size_t i = (turn + static_cast<size_t>(round + 1)) % count;
      std::vector<Time>* const times = round < 0 ? nullptr : &results_[first + i].times;
      if (run_once(row, row.contenders[i], times)) continue;
      failed_ = true;
      results_.resize(first);
      return;
    }
  }
  report(first, row.clock ? &Time::real : &Time::cpu);
}

void Runner::report(size_t first, double Time::*which) const {
  const double ours = median(results_[first].times, which);
  for (size_t i = first; i < results_.size(); ++i) {
    const std::vector<Time>& times = results_[i].times;
    std::cerr << std::left << std::setw(44) << results_[i].name << std::right << std::fixed
              << std::setprecision(3) << std::setw(12) << median(times, &Time::real) / 1e6 << " ms"
              << std::setw(12) << median(times, &Time::cpu) / 1e6 << " ms of the CPU"
              << std::setprecision(2) << std::setw(8) << median(times, which) / ours << '\n';
  }
}

void Runner::write_json(std::ostream& out) const {
  out << "{\n  \"context\": {\"num_cpus\": " << std::thread::hardware_concurrency()
      << "},\n  \"benchmarks\": [";
  const char* separator = "\n";
  for (const Result& result : results_) {
    for (size_t i = 0; i < result.times.size(); ++i, separator = ",\n") {
      const Time& time = result.times[i];
      out << separator << R"(    {"name": ")" << result.name << result.how << R"(", "run_name": ")"
          << result.name << result.how << R"(", "run_type": "iteration", "repetitions": )"
          << result.times.size() << R"(, "repetition_index": )" << i
          << R"(, "threads": 1, "iterations": 1, "real_time": )" << time.real << R"(, "cpu_time": )"
          << time.cpu << R"(, "time_unit": "ns"})";
    }
  }
  out << "\n  ]\n}\n";
}

}  // namespace bench
