// Folders that the process knows.
#include <direct.h>
#include <windows.h>

#include <algorithm>
#include <cstdlib>

#include "platform/platform.h"

namespace zv::platform {

bool working_directory(PathBuffer& out, size_t limit) {
  const bool known = out.fill([limit](char* room, size_t size) {
    return _getcwd(room, static_cast<int>(std::min(limit, size))) != nullptr;
  });
  out.replace('\\', '/');
  return known;
}

// Some runtimes end the program when they are asked about a drive that is not there.
bool drive_directory(int drive, PathBuffer& out) {
  const DWORD drives = GetLogicalDrives();
  if (drive < 1 || drive > 26 || (drives >> (drive - 1) & 1) == 0) return false;
  const bool known = out.fill([drive](char* room, size_t size) {
    return _getdcwd(drive, room, static_cast<int>(size)) != nullptr;
  });
  out.replace('\\', '/');
  return known;
}

int current_drive() {
  return _getdrive();
}

bool long_path(const char* path, PathBuffer& out) {
  return out.fill([path](char* room, size_t size) {
    const DWORD length = GetLongPathNameA(path, room, static_cast<DWORD>(size));
    return length != 0 && length < size;  // a longer one is only measured
  });
}

// An empty variable, which a process can inherit, names nothing.
const char* temp_folder() {
  for (const char* const name : {"TMP", "TEMP"}) {
    const char* const value = std::getenv(name);
    if (value != nullptr && *value != '\0') return value;
  }
  return nullptr;
}

char search_path_separator(const char*) {
  return ';';
}

}  // namespace zv::platform
