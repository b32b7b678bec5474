// One path at a time: its access, its status, its making as a directory, its hidden attribute.
#include "platform/platform.h"
#include "zarvo.h"

namespace platform = zv::platform;

int zv_access(const char* path, int mode) {
  constexpr int execute = 1;
  return platform::access(path, mode & ~execute);
}

int zv_stat(const char* path, struct _stat64* st) {
  return platform::status(path, st);
}

int zv_mkdir(const char* path) {
  return platform::make_directory(path);
}

int zv_get_hidden(const char* path) {
  return platform::is_hidden(path);
}

int zv_set_hidden(const char* path, int hidden) {
  return platform::set_hidden(path, hidden != 0);
}
