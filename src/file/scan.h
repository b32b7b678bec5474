// The scan through a folder and, where asked, through all folders below it.
#ifndef ZARVO_FILE_SCAN_H
#define ZARVO_FILE_SCAN_H

#include "strlist/list_owner.h"
#include "zarvo.h"

namespace zv {

struct ScanOptions {
  dir_filter_t filter = nullptr;  // nullptr keeps every entry
  void* user = nullptr;
  const dirsel_t* selection = nullptr;  // asked where there is no filter
  bool full_path = false;
  bool recursive = false;  // asks for full paths too
};

// Appends what the scan finds, each folder in front of its content. False when memory ran out, a
// path does not fit or an entry cannot be examined; a folder that cannot be searched holds nothing.
[[nodiscard]] bool scan(const char* dir, const ScanOptions& options, ListOwner& list);

}  // namespace zv

#endif
