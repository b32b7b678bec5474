// Plugin arrays: heap blocks of records that end with NULL.
#include <cstdlib>
#include <cstring>

#include "plugin/canonical_path.h"
#include "plugin/no_library.h"
#include "plugin/record.h"

namespace {

size_t length(zv_plugin_t** plugins) {
  size_t n = 0;
  while (plugins != nullptr && plugins[n] != nullptr) ++n;
  return n;
}

// The library's folder and file name; false when there is no such file.
bool locate(const char* path, zv::PathBuffer& folder, zv::PathBuffer& name) {
  zv::PathBuffer file;
  if (!zv::canonical_path(path, file)) return false;
  if (zv::platform::lies_at(file.c_str()) == zv::platform::Kind::none) return false;
  return folder.fill([&file](char* room, size_t size) {
    zv_extract_directory(file.c_str(), room, size);
    return true;
  }) && name.fill([&file](char* room, size_t size) {
    zv_extract_filename(file.c_str(), room, size);
    return true;
  });
}

int add(zv_plugin_t*** plugins, const char* path, const zv::Request& request, int* code,
        bool keep) {
  *code = ZV_PLUGIN_E_NOT_FOUND;
  zv::PathBuffer folder;
  zv::PathBuffer name;
  if (!locate(path, folder, name)) return 0;
  if (zv_plugin_get_entry_by_lib(*plugins, name.c_str()) != nullptr) return 1;

  zv::RecordPtr record = zv::create_record(folder, name.c_str(), request, code);
  if (record == nullptr) return 0;
  if (!keep) zv_plugin_unload(record.get());
  // The plugin ran, and its host may have changed the array meanwhile.
  const size_t count = length(*plugins);
  zv_plugin_t** const grown = zv::resize_array(*plugins, count + 1);
  if (grown == nullptr) {
    *code = ZV_PLUGIN_E_MEMORY;
    return 0;
  }
  grown[count] = record.release();
  grown[count + 1] = nullptr;
  *plugins = grown;
  return 1;
}

}  // namespace

zv_plugin_t** zv::resize_array(zv_plugin_t** array, size_t records) {
  return static_cast<zv_plugin_t**>(std::realloc(array, (records + 1) * sizeof(zv_plugin_t*)));
}

int zv_plugin_add_lib(zv_plugin_t*** plugins, const char* path, const char* api, int min, int max,
                      int* code, int keep) {
  int unwanted = 0;
  return add(plugins, path, {api, min, max}, code != nullptr ? code : &unwanted, keep != 0);
}

zv_plugin_t* zv_plugin_get_entry_by_lib(zv_plugin_t** plugins, const char* lib) {
  if (plugins == nullptr || lib == nullptr || *lib == '\0') return nullptr;
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
