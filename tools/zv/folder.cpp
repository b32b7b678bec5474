// Folders as the commands look at them: whether one can be looked into, and what it holds.
#include "folder.h"

#include <algorithm>
#include <cerrno>
#include <string_view>

#include "commands.h"
#include "path_text.h"

namespace tool {

bool is_folder(const std::string& path) {
  struct _stat64 status = {};
  PathText folder;
  if (!folder.assign(path)) return false;
  zv_trim_slash(folder.data());  // Windows finds nothing under a name that ends with one
  if (zv_stat(folder.c_str(), &status) != 0)
    complain("cannot find the folder " + path, errno);
  else if ((status.st_mode & S_IFMT) != S_IFDIR)
    complain("cannot look into " + path, ENOTDIR);
  else if (zv_access(folder.c_str(), 4) != 0)
    complain("cannot look into " + path, errno);
  else
    return true;
  return false;
}

bool Listing::scan(const std::string& folder, dirsel_t* selection, bool recursive) {
  const auto select = reinterpret_cast<dir_filter_t>(zv_dir_select);
  errno = 0;
  const int count = zv_dir_scan(folder.c_str(), &list_, select, selection, recursive, recursive);
  if (count < 0) {
    complain("cannot examine an entry below " + folder, errno);
    return false;
  }
  count_ = static_cast<size_t>(count);
  std::ranges::sort(names(), {}, [](const char* name) { return std::string_view(name); });
  return true;
}

}  // namespace tool
