// Tables of operations and the calls that fail under them; and operations on files and servers.
#ifndef ZARVO_TESTS_FAILURE_OPERATIONS_H
#define ZARVO_TESTS_FAILURE_OPERATIONS_H

#include <functional>
#include <string>
#include <vector>

#include "failures/failing_calls.h"
#include "fixtures/dialogues.h"

namespace failing {

// Something that the library does. `run` also looks at what a failure left, beside the result.
struct Operation {
  std::string name;
  int good;  // the result when nothing fails
  std::function<int(Attempt&)> run;
};

struct Row {
  Operation operation;
  std::string calls;  // one or more, each walked by itself
  int error;          // as of a Fault
  // What comes of it when the first call fails, the second, and so on; the last one stands for all
  // that follow.
  std::vector<int> results;
  bool in_any_order = false;
};

// Walks every row and prints how many points that made: each is an operation and its Nth call.
void walk_all(const char* what, const std::vector<Row>& rows);

extern const Operation make_file;             // zv_mkfile() two folders deep
extern const Operation open_file;             // zv_fopen()
extern const Operation read_folder;           // the iterator, over three entries
extern const Operation scan_tree;             // zv_dir_scan() of five entries
extern const Operation remove_tree;           // zv_rmpath() of the same tree
extern const Operation copy_file;             // between local files, larger than any buffer
extern const Operation copy_made_up;          // of a file that has no size
extern const Operation copy_onto_itself;      // which must leave the file as it is
extern const Operation copy_between_servers;  // through a temporary file
Operation copy_along(const scripted::Dialogue& dialogue);

}  // namespace failing

#endif
