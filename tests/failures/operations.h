// Operations on files and servers, for the tables of failing calls.
#ifndef ZARVO_TESTS_FAILURE_OPERATIONS_H
#define ZARVO_TESTS_FAILURE_OPERATIONS_H

#include "failures/table.h"
#include "fixtures/dialogues.h"

namespace failing {

extern const Operation make_file;             // zv_mkfile() two folders deep
extern const Operation open_file;             // zv_fopen()
extern const Operation read_folder;           // the iterator, over three entries
extern const Operation scan_tree;             // zv_dir_scan() of five entries
extern const Operation remove_tree;           // zv_rmpath() of the same tree
extern const Operation copy_file;             // between local files, larger than any buffer
extern const Operation copy_onto_itself;      // which must leave the file as it is
extern const Operation copy_between_servers;  // through a temporary file
Operation copy_along(const scripted::Dialogue& dialogue);

}  // namespace failing

#endif
