// What differs where the Windows build runs on Wine, and symbolic links on each platform.
#ifndef ZARVO_TESTS_WINE_H
#define ZARVO_TESTS_WINE_H

#include <filesystem>
#include <string>
#include <vector>

#ifdef _WIN32
#include <process.h>
#include <windows.h>

inline bool under_wine() {
  return GetProcAddress(GetModuleHandleA("ntdll.dll"), "wine_get_version") != nullptr;
}

// Lets a program of Wine's host work in a folder, and does not wait for its end.
inline void on_host(const std::filesystem::path& folder, std::vector<const char*> command) {
  const std::filesystem::path old = std::filesystem::current_path();
  std::error_code missing;
  std::filesystem::current_path(folder, missing);
  if (missing || !under_wine()) return;
  const std::string program = std::string("Z:\\bin\\") + command[0];
  command.push_back(nullptr);
  _spawnv(_P_NOWAIT, program.c_str(), command.data());
  std::filesystem::current_path(old);
}

// Wine makes no links itself.
inline bool make_link(const std::string& target, const std::filesystem::path& path) {
  const std::string name = path.filename().string();
  on_host(path.parent_path(), {"ln", "-s", target.c_str(), name.c_str()});
  const auto is_there = [&] {
    return GetFileAttributesA(path.string().c_str()) != INVALID_FILE_ATTRIBUTES;
  };
  for (int tries = under_wine() ? 500 : 0; tries > 0 && !is_there(); --tries) Sleep(10);
  return is_there();
}
#else
inline bool under_wine() {
  return false;
}

inline bool make_link(const std::string& target, const std::filesystem::path& path) {
  std::filesystem::create_symlink(target, path);
  return true;
}
#endif

#endif
