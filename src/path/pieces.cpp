// The pieces of a path: its last separator, its extension, its folder and name, its components.
#include <algorithm>
#include <cstring>

#include "path/form.h"
#include "path/output.h"
#include "zarvo.h"

namespace {

bool is_dot_or_dots(std::string_view name) {
  return name == "." || name == "..";
}

std::string_view last_component(std::string_view path) {
  const size_t slash = path.rfind('/');  // npos + 1 is 0: the whole of it
  path.remove_prefix(slash + 1);
  return path;
}

// Cuts a trimmed path down to its folder.
[[nodiscard]] bool cut_to_folder(zv::PathBuffer& path) {
  const std::string_view name = last_component(path.view());
  const bool whole = is_dot_or_dots(name) || zv::is_root(path.view());
  if (whole) return true;
  path.shorten(path.size() - name.size());
  return zv::trim_slash(path);
}

}  // namespace

char* zv_slash(const char* path) {
  const char* const slash = std::strrchr(path, '/');
  return const_cast<char*>(slash != nullptr ? slash : path + std::strlen(path));
}

char* zv_dot(const char* path) {
  const char* const end = path + std::strlen(path);
  const char* dot = end;
  while (dot != path && *dot != '.' && *dot != '/') --dot;
  const bool starts_extension = *dot == '.' && dot != path && dot[-1] != '/' && dot + 1 != end;
  return const_cast<char*>(starts_extension ? dot : end);
}

int zv_add_slash(char* path) {
  const size_t size = std::strlen(path);
  if (size == 0 || path[size - 1] == '/') return 0;
  std::memcpy(path + size, "/", 2);
  return 1;
}

int zv_trim_slash(char* path) {
  const std::string_view text = path;
  if (zv::is_root(text)) return zv_add_slash(path);
  const size_t kept = zv::without_slashes(text).size();
  path[kept] = '\0';
  return static_cast<int>(text.size() - kept);
}

void zv_split_path(char* path) {
  zv_trim_slash(path);
  zv_trim_slash(path);  // "//server/share//" has become a root, which ends with its separator
  const size_t size = std::strlen(path);
  const size_t root = zv::root_size({path, size});
  char* rest = path + root;
  char* end = path + size;
  // A root alone is closed where it ends: a share that got its separator has no room for more.
  if (root != 0 && root != size) {
    std::memmove(rest + 1, rest, size - root);
    *rest++ = '\0';
    ++end;
  }
  std::replace(rest, end, '/', '\0');
  end[0] = end[1] = '\0';
}

int zv_extract_directory(const char* path, char* out, size_t size) {
  zv::PathBuffer folder;
  folder.assign_cut(path);
  if (!zv::trim_slash(folder) || !cut_to_folder(folder)) folder.clear();
  return zv_strncpy(out, folder.c_str(), size) != 0;
}

int zv_extract_filename(const char* path, char* out, size_t size) {
  zv::PathBuffer text;
  text.assign_cut(path);
  if (!zv::trim_slash(text) || zv::is_root(text.view())) text.clear();
  const std::string_view name = last_component(text.view());
  return zv_strncpy(out, is_dot_or_dots(name) ? "" : name.data(), size) != 0;
}

int zv_extract_extension(const char* path, char* out, size_t size) {
  return zv::put(zv_dot(path), out, size);
}
