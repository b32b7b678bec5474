// Dynamic libraries: LoadLibrary() and its kin.
#include <windows.h>

#include "platform/platform.h"

namespace zv::platform {

namespace {

// While it lives, a file that is no sound library is a failed call on this thread and not a message
// box that waits for somebody to close it.
class QuietLoading {
 public:
  QuietLoading() { SetThreadErrorMode(SEM_FAILCRITICALERRORS, &mode_before_); }
  ~QuietLoading() { SetThreadErrorMode(mode_before_, nullptr); }
  QuietLoading(const QuietLoading&) = delete;
  QuietLoading& operator=(const QuietLoading&) = delete;

 private:
  DWORD mode_before_ = 0;
};

bool is_absolute(const PathBuffer& path) {
  return (path[1] == ':' && path[2] == '\\') || (path[0] == '\\' && path[1] == '\\');
}

}  // namespace

void* load_library(const char* path) {
  PathBuffer native;
  if (!native.assign(path)) return nullptr;
  native.replace('/', '\\');
  const QuietLoading quiet;
  // The altered search path finds libraries beside this one, and is defined for absolute paths
  // only.
  if (is_absolute(native))
    return LoadLibraryExA(native.c_str(), nullptr, LOAD_WITH_ALTERED_SEARCH_PATH);
  return LoadLibraryA(native.c_str());
}

void* library_symbol(void* library, const char* name) {
  return reinterpret_cast<void*>(GetProcAddress(static_cast<HMODULE>(library), name));
}

void unload_library(void* library) {
  FreeLibrary(static_cast<HMODULE>(library));
}

}  // namespace zv::platform
