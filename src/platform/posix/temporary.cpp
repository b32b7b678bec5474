// A folder of one's own for a short time.
#include <stdlib.h>

#include "platform/platform.h"

namespace zv::platform {

bool make_private_folder(PathBuffer& path) {
  PathBuffer folder = path;
  bool made = false;
  if (!folder.append("zarvo-XXXXXX")) return false;
  folder.edit_shrinking([&made](char* name) { made = mkdtemp(name) != nullptr; });
  if (made) path = folder;
  return made;
}

bool names_a_file(std::string_view name) {
  return !name.empty() && name != "." && name != ".." &&
         name.find_first_of("/\\") == std::string_view::npos;
}

}  // namespace zv::platform
