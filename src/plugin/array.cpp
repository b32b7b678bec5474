// Plugin arrays: heap blocks of records that end with NULL.
#include <cstdlib>
#include <cstring>

#include "plugin/loaded_plugin.h"
#include "plugin/no_library.h"

namespace {

size_t length(zv_plugin_t** plugins) {
  size_t n = 0;
  while (plugins != nullptr && plugins[n] != nullptr) ++n;
  return n;
}

// The library's folder and file name; false when there is no such file.
bool locate(const char* path, zv::PathBuffer& folder, zv::PathBuffer& name) {
  zv::PathBuffer file;
  struct _stat64 st;
  if (!zv::canonical_path(path, file) || zv_stat(file.c_str(), &st) != 0) return false;
  return folder.fill([&file](char* room, size_t size) {
    zv_extract_directory(file.c_str(), room, size);
    return true;
  }) && name.fill([&file](char* room, size_t size) {
    zv_extract_filename(file.c_str(), room, size);
    return true;
  });
}

int add(zv_plugin_t*** plugins, const char* path, const char* api, int min, int max, int* code,
        int keep) {
  *code = ZV_PLUGIN_E_NOT_FOUND;
  zv::PathBuffer folder;
  zv::PathBuffer name;
  if (!locate(path, folder, name)) return 0;
  const size_t count = length(*plugins);
  if (count != 0 && zv_plugin_get_entry_by_lib(*plugins, name.c_str()) != nullptr) return 1;

  zv_plugin_t* const record = zv_plugin_create(folder.c_str(), name.c_str(), api, min, max, code);
  if (record == nullptr) return 0;
  void* const grown = std::realloc(*plugins, (count + 2) * sizeof(zv_plugin_t*));
  if (grown == nullptr) {
    *code = ZV_PLUGIN_E_MEMORY;
    zv_plugin_destroy(record);
    return 0;
  }
  if (keep == 0) zv_plugin_unload(record);
  *plugins = static_cast<zv_plugin_t**>(grown);
  (*plugins)[count] = record;
  (*plugins)[count + 1] = nullptr;
  return 1;
}

}  // namespace

int zv_plugin_add_lib(zv_plugin_t*** plugins, const char* path, const char* api, int min, int max,
                      int* code, int keep) {
  int unwanted = 0;
  return add(plugins, path, api, min, max, code != nullptr ? code : &unwanted, keep);
}

zv_plugin_t* zv_plugin_get_entry_by_lib(zv_plugin_t** plugins, const char* lib) {
  if (lib == nullptr || *lib == '\0') return nullptr;
  for (; *plugins != nullptr; ++plugins)
    if (std::strcmp((*plugins)->lib, lib) == 0) return *plugins;
  return nullptr;
}

size_t zv_plugin_get_lib(zv_plugin_t** entry, char* buf, int size) {
  if (static_cast<void*>(entry) == zv::no_library()) return 0;
  const char* const lib = (*entry)->lib;
  if (buf == nullptr) return std::strlen(lib);
  return zv_strncpy(buf, lib, size > 0 ? static_cast<size_t>(size) : 0);
}
