// Rows of whole operations: each row has contenders that do the same work, run in turns.
#ifndef ZARVO_BENCH_RUNNER_H
#define ZARVO_BENCH_RUNNER_H

#include <functional>
#include <iosfwd>
#include <string>
#include <vector>

namespace bench {

struct Contender {
  std::string who;
  std::function<bool()> run;  // the timed work; false ends the row
};

// "item/case", and what its contenders need around each timed run.
struct Row {
  std::string name;
  std::vector<Contender> contenders;
  std::function<void()> before = [] {};
  std::function<void()> after = [] {};
  int calls = 1;       // operations that one run makes; times are those of one
  bool clock = false;  // the clock's time counts, where others work too, and not the CPU's
};

struct Settings {
  int rounds = 7;
  double scale = 1;    // of the numbers of files, for a quick look
  std::string filter;  // measures the rows whose name matches; "" for all
};

class Runner {
 public:
  explicit Runner(const Settings& settings) : settings_(settings) {}

  // Runs every contender once a round, each round beginning with another one, after a round that
  // does not count.
  void measure(const Row& row);

  int scaled(int count) const;
  bool failed() const { return failed_; }
  // As Google Benchmark writes its own, every time by itself.
  void write_json(std::ostream& out) const;

 private:
  struct Time {
    double real, cpu;  // nanoseconds for one call
  };
  struct Result {
    std::string name;
    std::string how;  // as Google Benchmark ends a name
    std::vector<Time> times;
  };

  void report(size_t first, double Time::*which) const;
  bool run_once(const Row& row, const Contender& contender, std::vector<Time>* times);

  const Settings settings_;
  std::vector<Result> results_;
  bool failed_ = false;
};

// What one program of this folder measures: an item, defined in the file of its name.
void measure(Runner& runner);

}  // namespace bench

#endif
