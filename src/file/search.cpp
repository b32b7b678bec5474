// The start of a search through a folder that a caller names.
#include "file/search.h"

#include "path/form.h"

namespace zv {

intptr_t search_named_folder(const char* dir, platform::Entry& entry) {
  constexpr size_t room = sizeof "/*" - 1;
  PathBuffer folder;
  folder.assign_cut(dir);
  if (!trim_slash(folder) || folder.size() + room > PathBuffer::capacity)
    return platform::no_search;
  return platform::search_first(folder.c_str(), entry);
}

}  // namespace zv
