// One path at a time: its access, its status, its making as a directory, its hidden attribute.
#include "platform/platform.h"
#include "zarvo.h"

namespace platform = zv::platform;

namespace {

// Lets `call` work on the path in the platform's own form; -1 when that does not fit.
template <class Call>
int on_native(const char* path, Call call) {
  zv::PathBuffer room;
  const char* const native = platform::native_path(path, room);
  return native != nullptr ? call(native) : -1;
}

bool exists(const char* native) {
  struct _stat64 st;
  return platform::status(native, &st) == 0;
}

}  // namespace

int zv_access(const char* path, int mode) {
  constexpr int execute = 1;
  return on_native(
      path, [mode](const char* native) { return platform::access(native, mode & ~execute); });
}

int zv_stat(const char* path, struct _stat64* st) {
  return on_native(path, [st](const char* native) { return platform::status(native, st); });
}

int zv_mkdir(const char* path) {
  return on_native(path, platform::make_directory);
}

int zv_get_hidden(const char* path) {
  return on_native(path, [](const char* native) -> int {
           return exists(native) && platform::is_hidden(native);
         }) > 0;
}

int zv_set_hidden(const char* path, int hidden) {
  const bool wanted = hidden != 0;
  return on_native(path, [wanted](const char* native) -> int {
           return exists(native) && platform::set_hidden(native, wanted);
         }) > 0;
}
