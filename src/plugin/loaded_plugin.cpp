// From a library's file to the descriptor of its plugin.
#include "plugin/loaded_plugin.h"

#include <cstring>

namespace zv {

namespace {

constexpr const char* entry_name = "zv_plugin";

}  // namespace

bool canonical_path(const char* path, PathBuffer& out) {
  const bool normal = out.fill([path](char* room, size_t size) {
    if (std::strlen(path) >= size) return false;
    zv_strncpy(room, path, size);
    return zv_normalize_path(room) != 0;
  });
  if (!normal) return false;
  if (zv_ispath_relative(out.c_str()) == 0) return true;
  const PathBuffer relative = out;
  return out.fill([&relative](char* room, size_t size) {
    return zv_absolute(relative.c_str(), nullptr, room, size) != 0;
  });
}

bool library_file(const char* folder, const char* library, PathBuffer& out) {
  return out.assign(folder) && (out.back() == '/' || out.append('/')) && out.append(library);
}

LoadedPlugin open_plugin(const char* file, const char* api, int min, int max, int* answer,
                         int* code) {
  LoadedPlugin plugin;
  *code = ZV_PLUGIN_E_LOAD;
  plugin.library.reset(platform::load_library(file));
  if (plugin.library == nullptr) return {};

  *code = ZV_PLUGIN_E_ENTRY;
  const auto entry = reinterpret_cast<zv_plugin_entry_t>(
      platform::library_symbol(plugin.library.get(), entry_name));
  if (entry == nullptr) return {};

  plugin_t* const descriptor = entry(api, min, max, answer);
  *code = *answer;
  if (descriptor == nullptr) return {};

  *code = ZV_PLUGIN_E_DESCRIPTOR;
  if (descriptor->release == nullptr) return {};
  plugin.descriptor.reset(descriptor);
  if (descriptor->formats == nullptr || descriptor->api_entry == nullptr) return {};
  *code = *answer;
  return plugin;
}

}  // namespace zv
