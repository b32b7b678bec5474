// The standard folders, and folders as a platform or a variable names them, in canonical form.
#include "path/folder.h"

#include "path/form.h"
#include "platform/platform.h"

namespace zv {

bool tidy_folder(PathBuffer& folder) {
  folder.replace('\\', '/');
  return trim_slash(folder);
}

bool make_usable(PathBuffer& folder) {
  constexpr int read_and_write = 6;
  return tidy_folder(folder) && platform::lies_at(folder.c_str()) == platform::Kind::folder &&
         platform::access(folder.c_str(), read_and_write) == 0;
}

bool working_folder(PathBuffer& out, size_t limit) {
  return platform::working_directory(out, limit) && trim_slash(out);
}

bool home_folder(PathBuffer& out) {
  return platform::home_folder(out);
}

// Its long form, or where that cannot be had the value as it is written. A value that is too long
// names nothing: cut, it might name its parent.
bool temporary_folder(PathBuffer& out) {
  const char* const value = platform::temp_folder();
  PathBuffer written;
  if (value == nullptr || !written.assign_cut(value)) return false;
  if (!platform::long_path(value, out)) out = written;
  return true;
}

}  // namespace zv
