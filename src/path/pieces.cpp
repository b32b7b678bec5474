// The pieces of a path: its last separator, its extension, its folder and name, its components.
#include "path/pieces.h"

#include <algorithm>
#include <cstring>

#include "frame/text_view.h"
#include "path/form.h"
#include "zarvo.h"

namespace {

// The folder of a path: a part of its text, but a bare share in `room`, where it gets the separator
// of a root if that fits.
std::string_view folder_text(const char* path, zv::PathBuffer& room) {
  std::string_view text = zv::path_text(path);
  if (zv::is_root(text)) {
    if (text.ends_with('/')) return text;
    return room.assign(text) && room.append('/') ? room.view() : std::string_view();
  }
  text = zv::without_slashes(text);
  const std::string_view name = zv::last_component(text);
  if (zv::is_dot_or_dots(name) || zv::is_root(text)) return text;
  text.remove_suffix(name.size());
  return zv::is_root(text) ? text : zv::without_slashes(text);
}

// From the dot on; empty, at the end of the path, where there is none.
std::string_view extension_of(const char* path) {
  const char* const end = path + std::strlen(path);
  const char* dot = end;
  while (dot != path && *dot != '.' && *dot != '/') --dot;
  const bool starts_extension = *dot == '.' && dot != path && dot[-1] != '/' && dot + 1 != end;
  return {starts_extension ? dot : end, end};
}

}  // namespace

namespace zv {

void folder_of(const char* path, PathBuffer& out) {
  if (!out.assign(folder_text(path, out))) out.clear();
}

std::string_view file_name(const char* path) {
  std::string_view text = path_text(path);
  if (!is_root(text)) text = without_slashes(text);
  const std::string_view name = last_component(text);
  return is_root(text) || is_dot_or_dots(name) ? std::string_view() : name;
}

}  // namespace zv

char* zv_slash(const char* path) {
  const char* const slash = std::strrchr(path, '/');
  return const_cast<char*>(slash != nullptr ? slash : path + std::strlen(path));
}

char* zv_dot(const char* path) {
  return const_cast<char*>(extension_of(path).data());
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
  zv::PathBuffer room;
  return zv::put(folder_text(path, room), out, size) != 0;
}

int zv_extract_filename(const char* path, char* out, size_t size) {
  return zv::put(zv::file_name(path), out, size) != 0;
}

int zv_extract_extension(const char* path, char* out, size_t size) {
  return zv::put(extension_of(path), out, size) != 0;
}
