// A folder of one's own for a short time.
#include <stdlib.h>
#include <sys/random.h>

#include "frame/text_view.h"
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

bool random_number(uint64_t& out) {
  return ::getrandom(&out, sizeof out, 0) == sizeof out;
}

}  // namespace zv::platform
