// A folder's names handed to a caller one after another.
#include "file/search.h"
#include "frame/text_view.h"
#include "platform/platform.h"
#include "zarvo.h"

namespace platform = zv::platform;

intptr_t zv_dir_readfirst(const char* dir, char* name, size_t size) {
  platform::Entry entry;
  const intptr_t search = zv::search_named_folder(dir, entry);
  if (search != platform::no_search) zv::put(entry.name, name, size);
  return search;
}

int zv_dir_readnext(intptr_t handle, char* name, size_t size) {
  platform::Entry entry;
  if (handle == platform::no_search || !platform::search_next(handle, entry)) return 0;
  zv::put(entry.name, name, size);
  return 1;
}

intptr_t zv_dir_close(intptr_t handle) {
  if (handle != platform::no_search) platform::search_close(handle);
  return platform::no_search;
}
