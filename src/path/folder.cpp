// Folders as a platform or a variable names them, brought into canonical form.
#include "path/folder.h"

#include "path/form.h"
#include "platform/platform.h"

namespace zv {

bool tidy_folder(PathBuffer& folder) {
  folder.replace('\\', '/');
  return trim_slash(folder);
}

bool working_folder(PathBuffer& out, size_t limit) {
  return platform::working_directory(out, limit) && tidy_folder(out);
}

}  // namespace zv
