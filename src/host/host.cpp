// What the platform tells about the user and the machine: standard folders and names.
#include <algorithm>

#include "frame/text_view.h"
#include "path/folder.h"
#include "platform/platform.h"
#include "zarvo.h"

namespace platform = zv::platform;

namespace {

// Hands out what fits of a folder. Its length, or 0 unless what stands in `buf` is a usable folder.
size_t give_folder(zv::PathBuffer& folder, char* buf, size_t size) {
  if (size == 0) return 0;
  folder.shorten(size - 1);
  const bool usable = zv::make_usable(folder);
  const size_t length = zv::put(folder.view(), buf, size);
  return usable ? length : 0;
}

}  // namespace

size_t zv_homedir(char* buf, size_t size) {
  zv::PathBuffer folder;
  return zv::home_folder(folder) ? give_folder(folder, buf, size) : 0;
}

size_t zv_tempdir(char* buf, size_t size) {
  zv::PathBuffer folder;
  return zv::temporary_folder(folder) ? give_folder(folder, buf, size) : 0;
}

int zv_getcwd(char* buf, size_t size) {
  if (size == 0) return 0;
  zv::PathBuffer folder;
  const bool known = zv::working_folder(folder, std::min<size_t>(size, ZV_PATH_MAX));
  zv::put(folder.view(), buf, size);
  return known;
}

size_t zv_username(char* buf, size_t size) {
  zv::TextBuffer<257> name;
  return zv::put(platform::user_name(name) ? name.view() : "nobody", buf, size);
}

size_t zv_hostname(char* buf, size_t size) {
  zv::TextBuffer<16> name;
  return zv::put(platform::host_name(name) ? name.view() : "localhost", buf, size);
}
