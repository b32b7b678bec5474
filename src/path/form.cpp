// The forms of a path: DOS, UNC, UNIX and relative, and the three roots.
#include "path/form.h"

#include <algorithm>

#include "zarvo.h"

namespace zv {

bool is_dos(std::string_view path) {
  return path.size() > 1 && path[1] == ':';
}

size_t share_size(std::string_view path) {
  if (path.size() < 5 || path[0] != '/' || path[1] != '/' || path[2] == '/') return 0;
  const size_t share = path.find('/', 2) + 1;  // 0 when there is no separator
  if (share == 0 || share == path.size() || path[share] == '/') return 0;
  return std::min(path.find('/', share), path.size());
}

bool is_root(std::string_view path) {
  if (const size_t share = share_size(path); share != 0) return path.size() - share <= 1;
  if (is_dos(path)) return path.size() == 3 && path[2] == '/';
  return path == "/";
}

size_t root_size(std::string_view path) {
  if (const size_t share = share_size(path); share != 0) return std::min(share + 1, path.size());
  if (is_dos(path) && path.size() > 2 && path[2] == '/') return 3;
  return !path.empty() && path[0] == '/' ? 1 : 0;
}

std::string_view without_slashes(std::string_view path) {
  while (!path.empty() && path.back() == '/') path.remove_suffix(1);
  return path;
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
