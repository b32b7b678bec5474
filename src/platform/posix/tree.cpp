// Removal relative to folders that are held open: a folder swapped for a link cannot lead it away.
#include <errno.h>
#include <fcntl.h>
#include <unistd.h>

#include "platform/platform.h"

namespace zv::platform {

namespace {

// A place to remove from, which takes no right to read it.
constexpr int folder_flags = O_PATH | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC;

int descriptor_of(intptr_t folder) {
  return static_cast<int>(folder);
}

}  // namespace

intptr_t folder_open(const char* path) {
  return ::open(path, folder_flags);
}

intptr_t folder_open_below(intptr_t folder, const char* name, const char*) {
  return ::openat(descriptor_of(folder), name, folder_flags);
}

void folder_close(intptr_t folder) {
  ::close(descriptor_of(folder));
}

Removal remove_below(intptr_t folder, const char* name, const char*) {
  const int descriptor = descriptor_of(folder);
  if (::unlinkat(descriptor, name, 0) == 0) return Removal::removed;
  const bool is_folder = errno == EISDIR;
  if (is_folder && ::unlinkat(descriptor, name, AT_REMOVEDIR) == 0) return Removal::removed;
  return errno == ENOENT ? Removal::gone : Removal::failed;
}

bool remove_folder(const char* path) {
  return ::rmdir(path) == 0;
}

}  // namespace zv::platform
