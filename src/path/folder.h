// The standard folders, and folders as a platform or a variable names them, in canonical form.
#ifndef ZARVO_PATH_FOLDER_H
#define ZARVO_PATH_FOLDER_H

#include <cstddef>

#include "frame/text_buffer.h"

namespace zv {

// Brings a folder into canonical form. False where that would not fit.
[[nodiscard]] bool tidy_folder(PathBuffer& folder);

// The same, and whether it is a folder that may be read and written.
[[nodiscard]] bool make_usable(PathBuffer& folder);

// The working directory; `limit` is the size in bytes that the platform is offered for it.
[[nodiscard]] bool working_folder(PathBuffer& out, size_t limit = ZV_PATH_MAX);

// What the platform and its variables name, as it is named there. False where nothing is named.
[[nodiscard]] bool home_folder(PathBuffer& out);
[[nodiscard]] bool temporary_folder(PathBuffer& out);

}  // namespace zv

#endif
