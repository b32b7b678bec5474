// What a test changes for its own process, put back when the test ends: variables of the process
// environment, the working directory, and the folder that the platform calls home.
#ifndef ZARVO_TESTS_ENVIRONMENT_H
#define ZARVO_TESTS_ENVIRONMENT_H

#include <cstdlib>
#include <filesystem>
#include <optional>
#include <string>

#ifdef _WIN32
#include <windows.h>
#endif

class Variable {
 public:
  // No value: the variable is not set. An empty one is of a kind that Windows only inherits.
  Variable(std::string name, const std::optional<std::string>& value) : name_(std::move(name)) {
    if (const char* const old = std::getenv(name_.c_str())) old_ = old;
    set(value);
  }
  ~Variable() { set(old_); }
  Variable(const Variable&) = delete;
  Variable& operator=(const Variable&) = delete;

  void set(const std::optional<std::string>& value) {
#ifdef _WIN32
    const bool empty = value && value->empty();
    _putenv_s(name_.c_str(), empty ? "x" : value.value_or("").c_str());
    if (!empty) return;
    *std::getenv(name_.c_str()) = '\0';
    SetEnvironmentVariableA(name_.c_str(), "");  // from where Wine takes them anew
#else
    if (!value) unsetenv(name_.c_str());
    if (value) setenv(name_.c_str(), value->c_str(), 1);
#endif
  }

 private:
  std::string name_;
  std::optional<std::string> old_;
};

class WorkingDirectory {
 public:
  explicit WorkingDirectory(const std::string& path) : old_(std::filesystem::current_path()) {
    std::filesystem::current_path(path);
  }
  ~WorkingDirectory() { std::filesystem::current_path(old_); }
  WorkingDirectory(const WorkingDirectory&) = delete;
  WorkingDirectory& operator=(const WorkingDirectory&) = delete;

 private:
  std::filesystem::path old_;
};

#ifdef _WIN32
// Names a home folder in a registry tree of its own, which stands in for the user's.
class Home {
 public:
  explicit Home(const std::optional<std::string>& folder)
      : name_("Software\\zarvo-test-" + std::to_string(GetCurrentProcessId())) {
    user_ = made(HKEY_CURRENT_USER, name_.c_str());
    folders_ = made(user_, "Software\\Microsoft\\Windows\\CurrentVersion\\Explorer\\Shell Folders");
    RegOverridePredefKey(HKEY_CURRENT_USER, user_);
    set(folder);
  }
  ~Home() {
    RegOverridePredefKey(HKEY_CURRENT_USER, nullptr);
    RegCloseKey(folders_);
    RegDeleteTreeA(user_, nullptr);
    RegCloseKey(user_);
    RegDeleteKeyA(HKEY_CURRENT_USER, name_.c_str());
  }
  Home(const Home&) = delete;
  Home& operator=(const Home&) = delete;

  void set(const std::optional<std::string>& folder) {
    RegDeleteValueA(folders_, "Personal");
    if (folder)
      RegSetValueExA(folders_, "Personal", 0, REG_SZ,
                     reinterpret_cast<const BYTE*>(folder->c_str()),
                     static_cast<DWORD>(folder->size() + 1));
  }

 private:
  static HKEY made(HKEY above, const char* name) {
    HKEY key = nullptr;
    RegCreateKeyExA(above, name, 0, nullptr, REG_OPTION_VOLATILE, KEY_ALL_ACCESS, nullptr, &key,
                    nullptr);
    return key;
  }

  std::string name_;
  HKEY user_, folders_;
};
#else
class Home : public Variable {
 public:
  explicit Home(const std::optional<std::string>& folder) : Variable("HOME", folder) {}
};
#endif

#endif
