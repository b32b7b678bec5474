// zv plugins: which libraries of a folder serve an API, and why the others do not.
#include <cstdio>
#include <memory>

#include "commands.h"
#include "folder.h"

namespace tool {
namespace {

struct Destroy {
  void operator()(zv_plugin_t* plugin) const { zv_plugin_destroy(plugin); }
};

using PluginPtr = std::unique_ptr<zv_plugin_t, Destroy>;

std::string reason(int code, const PluginsOptions& options) {
  switch (code) {
    case -9:
      return "no memory";
    case -8:
      return "wrong version range";
    case -7:
      return "not found";
    case -6:
      return "cannot be loaded";
    case -5:
      return "exports no zv_plugin";
    case -4:
      return "does not serve this API";
    case -2:
      return "its descriptor is not complete";
    case -1:
      return "refused without a reason";
    default:
      break;
  }
  const std::string number = std::to_string(code);
  if (code >= 0 && code < options.oldest) return "too old: version " + number;
  if (code > options.newest) return "too new: version " + number;
  return "refused with code " + number;
}

std::string formats_of(const zv_plugin_t& plugin) {
  std::string formats;
  for (char** entry = plugin.formats; *entry != nullptr; ++entry)
    formats += (formats.empty() ? "" : "; ") + std::string(*entry);
  return formats;
}

// One line of the table; true when the library was accepted.
bool try_library(const PluginsOptions& options, const char* name) {
  int code = 0;
  const PluginPtr plugin(zv_plugin_create(options.folder.c_str(), name, options.api.c_str(),
                                          options.oldest, options.newest, &code));
  if (plugin == nullptr) {
    std::printf("%-24s rejected  %s\n", name, reason(code, options).c_str());
    return false;
  }
  std::printf("%-24s accepted  version %d  %s\n", name, code, formats_of(*plugin).c_str());
  return true;
}

// The library passes over img_ad.dll, a debug build, where img_a.dll lies beside it.
const char* original_of(const char* name, const Listing& candidates) {
  for (const char* const other : candidates.names()) {
    std::string variant = other;
    variant.insert(variant.rfind('.'), 1, 'd');
    if (zv_stricmp(variant.c_str(), name) == 0) return other;
  }
  return nullptr;
}

}  // namespace

int plugins(const PluginsOptions& options) {
  const std::string pattern = options.api.substr(0, options.api.find('.')) + "_*.dll";
  dirsel_t selection = {};
  selection.file_patterns = pattern.c_str();
  Listing candidates;
  if (!is_folder(options.folder) || !candidates.scan(options.folder, &selection, false)) return no;
  bool any = false;
  for (const char* const name : candidates.names()) {
    if (const char* const original = original_of(name, candidates))
      std::printf("%-24s skipped   variant of %s\n", name, original);
    else
      any = try_library(options, name) || any;
  }
  if (candidates.names().empty()) complain("no " + pattern + " in " + options.folder);
  return any ? done : no;
}

}  // namespace tool
