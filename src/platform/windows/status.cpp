// One path on the file system.
#include <direct.h>
#include <errno.h>
#include <io.h>
#include <sys/stat.h>
#include <windows.h>

#include "platform/platform.h"

namespace zv::platform {

namespace {

// A link that leads nowhere has some too, but is nothing.
DWORD attributes_of(const char* path) {
  return lies_at(path) != Kind::none ? GetFileAttributesA(path) : INVALID_FILE_ATTRIBUTES;
}

}  // namespace

const char* native_path(const char* path, PathBuffer&) {
  return path;
}

bool slashed_path(const char* path, PathBuffer& out) {
  const bool whole = out.assign_cut(path);
  if (!whole) errno = ENAMETOOLONG;
  out.replace('\\', '/');
  return whole;
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

Kind lies_at(const char* path) {
  struct _stat64 st;
  if (_stat64(path, &st) != 0) return Kind::none;
  return (st.st_mode & _S_IFMT) == _S_IFDIR ? Kind::folder : Kind::other;
}

bool is_hidden(const char* path) {
  const DWORD attributes = attributes_of(path);
  return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_HIDDEN) != 0;
}

bool set_hidden(const char* path, bool hidden) {
  const DWORD attributes = attributes_of(path);
  if (attributes == INVALID_FILE_ATTRIBUTES) return false;
  const DWORD others = attributes & ~static_cast<DWORD>(FILE_ATTRIBUTE_HIDDEN);
  const DWORD wanted = hidden ? others | FILE_ATTRIBUTE_HIDDEN : others;
  return wanted == attributes || SetFileAttributesA(path, wanted) != 0;
}

}  // namespace zv::platform
