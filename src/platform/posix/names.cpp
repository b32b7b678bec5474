// Names of files.
#include "platform/platform.h"

namespace zv::platform {

bool names_a_file(std::string_view name) {
  return !name.empty() && !is_dot_or_dots(name) &&
         name.find_first_of("/\\") == std::string_view::npos;
}

bool utf8_name(const char* name, Utf8Name& out) {
  return out.assign_cut(name);
}

}  // namespace zv::platform
