// The pieces of a path inside the library.
#ifndef ZARVO_PATH_PIECES_H
#define ZARVO_PATH_PIECES_H

#include <string_view>

#include "frame/text_buffer.h"

namespace zv {

inline std::string_view last_component(std::string_view path) {
  const size_t slash = path.rfind('/');  // npos + 1 is 0: the whole of it
  path.remove_prefix(slash + 1);
  return path;
}

// What zv_extract_directory() and zv_extract_filename() take out.
void folder_of(const char* path, PathBuffer& out);
std::string_view file_name(const char* path);  // a part of it

}  // namespace zv

#endif
