// Searches through one folder, and the iterator that hands them to callers.
#include "file/search.h"

#include "path/form.h"
#include "zarvo.h"

namespace platform = zv::platform;

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

intptr_t zv_dir_readfirst(const char* dir, char* name, size_t size) {
  platform::Entry entry;
  const intptr_t search = zv::search_named_folder(dir, entry);
  if (search != platform::no_search) zv_strncpy(name, entry.name, size);
  return search;
}

int zv_dir_readnext(intptr_t handle, char* name, size_t size) {
  platform::Entry entry;
  if (handle == platform::no_search || !platform::search_next(handle, entry)) return 0;
  zv_strncpy(name, entry.name, size);
  return 1;
}

intptr_t zv_dir_close(intptr_t handle) {
  if (handle != platform::no_search) platform::search_close(handle);
  return platform::no_search;
}
