// From a library's file to the descriptor of its plugin.
#include "plugin/loaded_plugin.h"

namespace zv {

namespace {

constexpr const char* entry_name = "zv_plugin";

}  // namespace

bool library_file(const char* folder, const char* library, PathBuffer& out) {
  return out.assign(folder) && (out.back() == '/' || out.append('/')) && out.append(library);
}

LoadedPlugin open_plugin(const char* file, const Request& request, int* answer, int* code) {
  LoadedPlugin plugin;
  *code = ZV_PLUGIN_E_LOAD;
  plugin.library.reset(platform::load_library(file));
  if (plugin.library == nullptr) return {};

  *code = ZV_PLUGIN_E_ENTRY;
  const auto entry = reinterpret_cast<zv_plugin_entry_t>(
      platform::library_symbol(plugin.library.get(), entry_name));
  if (entry == nullptr) return {};

  plugin_t* const descriptor = entry(request.api, request.min, request.max, answer);
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
