// Plugin records: made once, loaded and unloaded as their holder needs them.
#include "plugin/record.h"

#include <cstring>
#include <utility>

#include "plugin/canonical_path.h"
#include "plugin/no_library.h"

namespace {

using zv::RecordPtr;

void hold(zv_plugin_t* record, zv::LoadedPlugin plugin) {
  record->plugin = plugin.descriptor.release();
  record->module = plugin.library.release();
  record->refs = 1;
}

// nullptr when memory runs out; the plugin is let go then.
RecordPtr make_record(zv::LoadedPlugin plugin, const zv::PathBuffer& folder, const char* lib,
                      const char* api) {
  RecordPtr record(static_cast<zv_plugin_t*>(zv_calloc(sizeof(zv_plugin_t))));
  if (record == nullptr) return nullptr;
  hold(record.get(), std::move(plugin));
  record->dir = zv_strredup(nullptr, folder.c_str());
  record->lib = zv_strredup(nullptr, lib);
  record->api = zv_strredup(nullptr, api);
  const bool texts = record->dir != nullptr && record->lib != nullptr && record->api != nullptr;
  if (!texts || zv_strlist(&record->formats, record->plugin->formats(), '\0') < 0) return nullptr;
  return record;
}

bool may_be_asked(const char* lib, const zv::Request& request) {
  return lib != nullptr && std::strpbrk(lib, "/\\") == nullptr && request.api != nullptr &&
         request.min >= 0 && request.max >= request.min;
}

RecordPtr create(const char* dir, const char* lib, const zv::Request& request, int* code) {
  *code = ZV_PLUGIN_E_ARGUMENTS;
  if (dir == nullptr || !may_be_asked(lib, request)) return nullptr;
  *code = ZV_PLUGIN_E_NOT_FOUND;
  zv::PathBuffer folder;
  if (!zv::canonical_path(dir, folder)) return nullptr;
  return zv::create_record(folder, lib, request, code);
}

}  // namespace

zv::RecordPtr zv::create_record(const PathBuffer& folder, const char* lib, const Request& request,
                                int* code) {
  *code = ZV_PLUGIN_E_ARGUMENTS;
  if (!may_be_asked(lib, request)) return nullptr;
  *code = ZV_PLUGIN_E_NOT_FOUND;
  PathBuffer file;
  // Windows would go on to look for a name without an extension under another one.
  if (!library_file(folder.c_str(), lib, file) ||
      platform::lies_at(file.c_str()) == platform::Kind::none)
    return nullptr;

  int version = ZV_PLUGIN_E_SILENT;
  LoadedPlugin plugin = open_plugin(file.c_str(), request, &version, code);
  if (plugin.descriptor == nullptr) return nullptr;

  RecordPtr record = make_record(std::move(plugin), folder, lib, request.api);
  if (record == nullptr) {
    *code = ZV_PLUGIN_E_MEMORY;
    return nullptr;
  }
  record->version = version;
  return record;
}

zv_plugin_t* zv_plugin_create(const char* dir, const char* lib, const char* api, int min, int max,
                              int* code) {
  int result = 0;
  RecordPtr record = create(dir, lib, {api, min, max}, &result);
  if (code != nullptr) *code = result;
  return record.release();
}

int zv_plugin_destroy(zv_plugin_t* rec) {
  if (rec == nullptr) return 0;
  // A descriptor that outlived its library is never called, whatever its plugin left behind.
  if (rec->plugin != nullptr && rec->refs > 0) {
    rec->refs = 1;
    zv_plugin_unload(rec);
  }
  zv_strlist_free(rec->formats, -1);
  zv_free(rec->dir);
  zv_free(rec->lib);
  zv_free(rec->api);
  return zv_free(rec);
}

int zv_plugin_load(zv_plugin_t* rec) {
  if (rec == nullptr) return 0;
  if (rec->refs != 0) {
    ++rec->refs;
    return 1;
  }
  zv::PathBuffer file;
  if (!zv::library_file(rec->dir, rec->lib, file)) return 0;
  int code = 0;
  const int agreed = rec->version;
  zv::LoadedPlugin plugin =
      zv::open_plugin(file.c_str(), {rec->api, agreed, agreed}, &rec->version, &code);
  rec->plugin = nullptr;
  if (plugin.descriptor == nullptr) return 0;
  hold(rec, std::move(plugin));
  return 1;
}

int zv_plugin_unload(zv_plugin_t* rec) {
  if (rec == nullptr) return 0;
  if (rec->refs == 1) {
    rec->plugin = rec->plugin->release(rec->plugin);
    rec->module = zv_dll_close(rec->module);
  }
  --rec->refs;
  return 1;
}
