// What the platform tells about the user and the machine: standard folders and names.
#include <algorithm>

#include "path/folder.h"
#include "platform/platform.h"
#include "zarvo.h"

namespace platform = zv::platform;

namespace {

bool is_rw_dir(const char* path) {
  constexpr int read_write_execute = 7;
  struct _stat64 st;
  if (zv_stat(path, &st) != 0 || (st.st_mode & 0xF000) != 0x4000) return false;
  return zv_access(path, read_write_execute) == 0;
}

// Hands out what fits of a folder. Its length, or 0 unless what stands in `buf` is a usable folder.
size_t give_folder(zv::PathBuffer& folder, char* buf, size_t size) {
  if (size == 0) return 0;
  folder.shorten(size - 1);
  if (!zv::tidy_folder(folder)) return 0;
  const size_t length = zv_strncpy(buf, folder.c_str(), size);
  return length != 0 && is_rw_dir(buf) ? length : 0;
}

}  // namespace

size_t zv_homedir(char* buf, size_t size) {
  zv::PathBuffer folder;
  return platform::home_folder(folder) ? give_folder(folder, buf, size) : 0;
}

size_t zv_tempdir(char* buf, size_t size) {
  const char* const value = platform::temp_folder();
  if (value == nullptr) return 0;
  zv::PathBuffer folder;
  if (!platform::long_path(value, folder)) folder.assign_cut(value);
  return give_folder(folder, buf, size);
}

int zv_getcwd(char* buf, size_t size) {
  if (size == 0) return 0;
  zv::PathBuffer folder;
  const bool known = zv::working_folder(folder, std::min<size_t>(size, ZV_PATH_MAX));
  zv_strncpy(buf, known ? folder.c_str() : "", size);
  return known;
}

size_t zv_username(char* buf, size_t size) {
  zv::TextBuffer<257> name;
  return zv_strncpy(buf, platform::user_name(name) ? name.c_str() : "nobody", size);
}

size_t zv_hostname(char* buf, size_t size) {
  zv::TextBuffer<16> name;
  return zv_strncpy(buf, platform::host_name(name) ? name.c_str() : "localhost", size);
}
