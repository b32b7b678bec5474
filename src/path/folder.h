// Folders as a platform or a variable names them, brought into canonical form.
#ifndef ZARVO_PATH_FOLDER_H
#define ZARVO_PATH_FOLDER_H

#include <cstddef>

#include "frame/text_buffer.h"

namespace zv {

// False where the result would not fit.
[[nodiscard]] bool tidy_folder(PathBuffer& folder);

// The working directory; `limit` is the size in bytes that the platform is offered for it.
[[nodiscard]] bool working_folder(PathBuffer& out, size_t limit = ZV_PATH_MAX);

}  // namespace zv

#endif
