// Folders that the process knows.
#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "platform/platform.h"

namespace zv::platform {

bool working_directory(PathBuffer& out, size_t limit) {
  return out.fill([limit](char* room, size_t size) {
    return ::getcwd(room, std::min(limit, size)) != nullptr;
  });
}

bool drive_directory(int, PathBuffer&) {
  return false;
}

int current_drive() {
  return 0;
}

// There is one form of a name only.
bool long_path(const char* path, PathBuffer& out) {
  return out.assign(path);
}

// An empty variable names nothing.
const char* temp_folder() {
  for (const char* const name : {"TMP", "TEMP", "TMPDIR"}) {
    const char* const value = std::getenv(name);
    if (value != nullptr && *value != '\0') return value;
  }
  return nullptr;
}

// Lists written for either platform are read.
char search_path_separator(const char* search_path) {
  return std::strchr(search_path, ';') != nullptr ? ';' : ':';
}

}  // namespace zv::platform
