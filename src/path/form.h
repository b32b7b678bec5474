// The forms of a path and its root, told from the text alone. Only '/' separates here.
#ifndef ZARVO_PATH_FORM_H
#define ZARVO_PATH_FORM_H

#include <algorithm>
#include <cstddef>
#include <string_view>

#include "frame/text_buffer.h"
#include "frame/text_view.h"

namespace zv {

// The characters of a path that take part: at most 319.
inline std::string_view path_text(const char* path) {
  return bounded(path, PathBuffer::capacity);
}

// "X:" in front, whatever the character before the colon.
inline bool is_dos(std::string_view path) {
  return path.size() > 1 && path[1] == ':';
}

// The length of the share in a path that begins with two separators; 0 where that is none.
size_t measure_share(std::string_view path);

// The length of "//server/share" in front of a path; 0 when it has no such front.
inline size_t share_size(std::string_view path) {
  return path.size() > 1 && path[0] == '/' && path[1] == '/' ? measure_share(path) : 0;
}

// The length of a path's root piece with the separator that ends it. A drive-relative path has
// none; a bare "//server/share" is all root.
inline size_t root_size(std::string_view path) {
  if (const size_t share = share_size(path); share != 0) return std::min(share + 1, path.size());
  if (is_dos(path) && path.size() > 2 && path[2] == '/') return 3;
  return path.starts_with('/') ? 1 : 0;
}

// "X:/", "/" or "//server/share" with or without one '/' after it, and nothing more.
inline bool is_root(std::string_view path) {
  return !path.empty() && root_size(path) == path.size();
}

// What is left of a path without the separators at its end.
inline std::string_view without_slashes(std::string_view path) {
  while (path.ends_with('/')) path.remove_suffix(1);
  return path;
}

// A root ends with its one separator and any other path with none. Whether the path was a root is
// looked at before anything is cut, as zv_trim_slash() tells. False, and the text as it was, when
// the separator that a share needs does not fit.
template <size_t Size>
[[nodiscard]] bool trim_slash(TextBuffer<Size>& path) {
  if (!is_root(path.view())) {
    path.shorten(without_slashes(path.view()).size());
    return true;
  }
  return path.back() == '/' || path.append('/');
}

}  // namespace zv

#endif
