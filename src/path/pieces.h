// The pieces of a path inside the library.
#ifndef ZARVO_PATH_PIECES_H
#define ZARVO_PATH_PIECES_H

#include <string_view>

#include "frame/text_buffer.h"

namespace zv {

// What zv_extract_directory() and zv_extract_filename() take out.
void folder_of(const char* path, PathBuffer& out);
std::string_view file_name(const char* path);  // a part of it

// Puts a name behind a folder, which may be empty. False when it does not fit.
[[nodiscard]] bool append_name(PathBuffer& folder, std::string_view name);

}  // namespace zv

#endif
