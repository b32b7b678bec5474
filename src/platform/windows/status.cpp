// One path on the file system.
#include <direct.h>
#include <io.h>
#include <sys/stat.h>
#include <windows.h>

#include "platform/platform.h"

namespace zv::platform {

const char* native_path(const char* path, PathBuffer&) {
  return path;
}

int access(const char* path, int mode) {
  return _access(path, mode);
}

int status(const char* path, struct _stat64* st) {
  return _stat64(path, st);
}

int make_directory(const char* path) {
  return _mkdir(path);
}

bool is_hidden(const char* path) {
  const DWORD attributes = GetFileAttributesA(path);
  return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_HIDDEN) != 0;
}

bool set_hidden(const char* path, bool hidden) {
  const DWORD attributes = GetFileAttributesA(path);
  if (attributes == INVALID_FILE_ATTRIBUTES) return false;
  const DWORD others = attributes & ~static_cast<DWORD>(FILE_ATTRIBUTE_HIDDEN);
  const DWORD wanted = hidden ? others | FILE_ATTRIBUTE_HIDDEN : others;
  return wanted == attributes || SetFileAttributesA(path, wanted) != 0;
}

}  // namespace zv::platform
