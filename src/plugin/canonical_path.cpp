// A path made absolute and normalised, as plugins are compared and loaded by it.
#include "plugin/canonical_path.h"

#include <cstring>

namespace zv {

bool canonical_path(const char* path, PathBuffer& out) {
  const bool normal = out.fill([path](char* room, size_t size) {
    if (std::strlen(path) >= size) return false;
    zv_strncpy(room, path, size);
    return zv_normalize_path(room) != 0;
  });
  if (!normal) return false;
  if (zv_ispath_relative(out.c_str()) == 0) return true;
  const PathBuffer relative = out;
  return out.fill([&relative](char* room, size_t size) {
    return zv_absolute(relative.c_str(), nullptr, room, size) != 0;
  });
}

}  // namespace zv
