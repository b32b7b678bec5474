// Tables of operations and the calls that fail under them.
#ifndef ZARVO_TESTS_FAILURE_TABLE_H
#define ZARVO_TESTS_FAILURE_TABLE_H

#include <functional>
#include <string>
#include <vector>

#include "failures/failing_calls.h"

namespace failing {

// Something that the library does. `run` also looks at what a failure left, beside the result.
struct Operation {
  std::string name;
  int good;  // the result when nothing fails
  std::function<int(Attempt&)> run;
};

struct Row {
  Operation operation;
  Fault fault;
  // What comes of it when the first call fails, the second, and so on; the last one stands for all
  // that follow.
  std::vector<int> results;
  bool in_any_order = false;
};

// Walks every row and prints how many points that made: each is an operation and its Nth call.
void walk_all(const char* what, const std::vector<Row>& rows);

}  // namespace failing

#endif
