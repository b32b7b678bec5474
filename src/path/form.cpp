// The forms of a path: DOS, UNC, UNIX and relative, and the three roots.
#include "path/form.h"

#include <algorithm>

#include "zarvo.h"

namespace zv {

size_t measure_share(std::string_view path) {
  if (path.size() < 5 || path[2] == '/') return 0;
  const size_t share = path.find('/', 2) + 1;  // 0 when there is no separator
  if (share == 0 || share == path.size() || path[share] == '/') return 0;
  return std::min(path.find('/', share), path.size());
}

}  // namespace zv

int zv_ispath_DOS(const char* path) {
  return path[0] != '\0' && path[1] == ':';
}

int zv_ispath_UNC(const char* path) {
  return zv::share_size(path) != 0;
}

int zv_ispath_UNIX(const char* path) {
  return path[0] == '/' && path[1] != '/';
}

int zv_ispath_relative(const char* path) {
  return path[0] != '/' && zv_ispath_DOS(path) == 0;
}

int zv_ispath_root(const char* path) {
  return zv::is_root(path);
}
