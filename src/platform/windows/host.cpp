// The user and the machine.
#include <windows.h>

#include <cstring>

#include "platform/platform.h"

namespace zv::platform {

namespace {

class RegistryKey {
 public:
  RegistryKey(HKEY parent, const char* name)
      : open_(RegOpenKeyExA(parent, name, 0, KEY_QUERY_VALUE, &key_) == ERROR_SUCCESS) {}
  ~RegistryKey() {
    if (open_) RegCloseKey(key_);
  }
  RegistryKey(const RegistryKey&) = delete;
  RegistryKey& operator=(const RegistryKey&) = delete;

  // A stored text need not end with a NUL.
  bool read(const char* name, PathBuffer& out) const {
    return open_ && out.fill([this, name](char* room, size_t size) {
      std::memset(room, '\0', size);
      DWORD length = static_cast<DWORD>(size);
      return RegQueryValueExA(key_, name, nullptr, nullptr, reinterpret_cast<BYTE*>(room),
                              &length) == ERROR_SUCCESS;
    });
  }

 private:
  HKEY key_ = nullptr;
  bool open_;
};

}  // namespace

bool user_name(TextBuffer<257>& out) {
  return out.fill([](char* room, size_t size) {
    DWORD length = static_cast<DWORD>(size);
    return GetUserNameA(room, &length) != 0;
  });
}

bool host_name(TextBuffer<16>& out) {
  return out.fill([](char* room, size_t size) {
    DWORD length = static_cast<DWORD>(size);
    return GetComputerNameA(room, &length) != 0;
  });
}

// The user's documents folder.
bool home_folder(PathBuffer& out) {
  const RegistryKey folders(HKEY_CURRENT_USER,
                            R"(Software\Microsoft\Windows\CurrentVersion\Explorer\Shell Folders)");
  return folders.read("Personal", out);
}

}  // namespace zv::platform
