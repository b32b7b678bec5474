// Removal by path: the C runtime knows no entry relative to an open folder.
#include <direct.h>
#include <stdio.h>
#include <windows.h>

#include "platform/platform.h"

namespace zv::platform {

namespace {

constexpr intptr_t any_folder = 0;

}  // namespace

intptr_t folder_open(const char* path) {
  return entry_kind(path) == EntryKind::directory ? any_folder : no_folder;
}

intptr_t folder_open_below(intptr_t, const char*, const char* path) {
  return folder_open(path);
}

void folder_close(intptr_t) {}

// A link that stands for a folder is removed like one; what it stands for stays.
Removal remove_below(intptr_t, const char*, const char* path) {
  const DWORD attributes = GetFileAttributesA(path);
  if (attributes == INVALID_FILE_ATTRIBUTES) return Removal::gone;
  const bool is_folder = (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
  const bool removed = (is_folder ? _rmdir(path) : std::remove(path)) == 0;
  return removed ? Removal::removed : Removal::failed;
}

bool remove_folder(const char* path) {
  return _rmdir(path) == 0;
}

}  // namespace zv::platform
