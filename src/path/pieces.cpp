// The pieces of a path: its last separator, its extension, its folder and name, its components.
#include "path/pieces.h"

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

namespace zv {

void folder_of(const char* path, PathBuffer& out) {
  out.assign_cut(path);
  if (!trim_slash(out) || !cut_to_folder(out)) out.clear();
}

void file_name(const char* path, PathBuffer& out) {
  out.assign_cut(path);
  if (!trim_slash(out) || is_root(out.view())) out.clear();
  const std::string_view name = last_component(out.view());
  if (is_dot_or_dots(name) || !out.assign(name)) out.clear();
}

bool append_name(PathBuffer& folder, std::string_view name) {
  if (!folder.empty() && folder.back() != '/' && !folder.append('/')) return false;
  return folder.append(name);
}

}  // namespace zv

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
  zv::folder_of(path, folder);
  return zv::put(folder.view(), out, size);
}

int zv_extract_filename(const char* path, char* out, size_t size) {
  zv::PathBuffer name;
  zv::file_name(path, name);
  return zv::put(name.view(), out, size);
}

int zv_extract_extension(const char* path, char* out, size_t size) {
  return zv::put(zv_dot(path), out, size);
}
