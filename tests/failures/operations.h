// Tables of what the library does and the calls that fail under it.
#ifndef ZARVO_TESTS_FAILURE_OPERATIONS_H
#define ZARVO_TESTS_FAILURE_OPERATIONS_H

#include <functional>
#include <string>
#include <vector>

#include "failures/failing_calls.h"

namespace failing {

struct Failing {
  std::string calls;  // one or more, each walked by itself
  int error;          // as of a Fault
  // What comes of it when the first call fails, the second, and so on; the last one stands for all
  // that follow.
  std::vector<int> results;
  bool in_any_order = false;
};

// `run` also looks at what a failure left, beside the result.
struct Operation {
  std::string name;
  int good;  // the result when nothing fails
  std::function<int(Attempt&)> run;
  std::vector<Failing> failures;
};

inline Operation row(const std::string& name, int good, int (*run)(Attempt&),
                     std::vector<Failing> failures) {
  return {name, good, run, std::move(failures)};
}

inline Failing out_of_memory(std::vector<int> results, bool in_any_order = false) {
  return {std::string(all_memory), ENOMEM, std::move(results), in_any_order};
}

std::vector<Operation> memory_operations();   // blocks, lists, environment, plugins, the host
std::vector<Operation> file_operations();     // files, folders, streams
std::vector<Operation> network_operations();  // copies along every dialogue

}  // namespace failing

#endif
