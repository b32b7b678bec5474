// Removal by path: the C runtime knows no entry relative to an open folder.
#include <direct.h>
#include <stdio.h>
#include <windows.h>

#include "platform/platform.h"

namespace zv::platform {

namespace {

constexpr intptr_t any_folder = 0;

// A name of dots and spaces alone is left out of a path, which leaves the folder above; a colon
// asks for a stream, which may be a folder's own.
bool names_an_entry(std::string_view path) {
  if (path.size() > 1 && path[1] == ':') path.remove_prefix(2);
  path.remove_prefix(path.rfind('/') + 1);  // npos + 1 is 0: the whole of it
  return path.find_first_not_of(". ") != std::string_view::npos &&
         path.find(':') == std::string_view::npos;
}

}  // namespace

intptr_t folder_open(const char* path) {
  return names_an_entry(path) && entry_kind(path) == Kind::folder ? any_folder : no_folder;
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
