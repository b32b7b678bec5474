// zv plugins: which libraries of a folder serve an API, and why the others do not.
#include <cstdio>
#include <memory>

#include "commands.h"
#include "folder.h"
#include "json.h"

namespace tool {
namespace {

struct Destroy {
  void operator()(zv_plugin_t* plugin) const { zv_plugin_destroy(plugin); }
};

using PluginPtr = std::unique_ptr<zv_plugin_t, Destroy>;

std::string reason(int code, const PluginsOptions& options) {
  switch (code) {
    case ZV_PLUGIN_E_MEMORY:
      return "no memory";
    case ZV_PLUGIN_E_ARGUMENTS:
      return "wrong version range";
    case ZV_PLUGIN_E_NOT_FOUND:
      return "not found";
    case ZV_PLUGIN_E_LOAD:
      return "cannot be loaded";
    case ZV_PLUGIN_E_ENTRY:
      return "exports no zv_plugin";
    case ZV_PLUGIN_E_API:
      return "does not serve this API";
    case ZV_PLUGIN_E_DESCRIPTOR:
      return "its descriptor is not complete";
    case ZV_PLUGIN_E_SILENT:
      return "refused without a reason";
    default:
      break;
  }
  const std::string number = std::to_string(code);
  if (code >= 0 && code < options.oldest) return "too old: version " + number;
  if (code > options.newest) return "too new: version " + number;
  return "refused with code " + number;
}

// What became of one library.
struct Verdict {
  std::string library;
  const char* status;  // accepted, rejected or skipped
  std::string reason;  // empty where it was accepted
  int version = 0;     // as agreed
  std::vector<std::string> formats{};
};

Verdict try_library(const PluginsOptions& options, const char* name) {
  int code = 0;
  const PluginPtr plugin(zv_plugin_create(options.folder.c_str(), name, options.api.c_str(),
                                          options.oldest, options.newest, &code));
  if (plugin == nullptr) return {name, "rejected", reason(code, options)};
  Verdict verdict = {name, "accepted", "", code};
  for (char** entry = plugin->formats; *entry != nullptr; ++entry)
    verdict.formats.emplace_back(*entry);
  return verdict;
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

Verdict verdict_on(const PluginsOptions& options, const char* name, const Listing& candidates) {
  const char* const original = original_of(name, candidates);
  if (original == nullptr) return try_library(options, name);
  return {name, "skipped", std::string("variant of ") + original};
}

void print_line(const Verdict& verdict) {
  std::string text = verdict.reason;
  if (text.empty()) text = "version " + std::to_string(verdict.version) + "  ";
  for (const std::string& entry : verdict.formats)
    text += (&entry == verdict.formats.data() ? "" : "; ") + entry;
  std::printf("%-24s %-8s  %s\n", verdict.library.c_str(), verdict.status, text.c_str());
}

std::string as_json(const Verdict& verdict) {
  std::vector<std::pair<const char*, std::string>> members = {
      {"library", json_string(verdict.library)}, {"status", json_string(verdict.status)}};
  if (!verdict.reason.empty()) {
    members.emplace_back("reason", json_string(verdict.reason));
    return json_object(members);
  }
  std::vector<std::string> formats;
  for (const std::string& entry : verdict.formats) formats.push_back(json_string(entry));
  members.emplace_back("version", std::to_string(verdict.version));
  members.emplace_back("formats", json_array(formats));
  return json_object(members);
}

}  // namespace

int plugins(const PluginsOptions& options) {
  const std::string pattern = options.api.substr(0, options.api.find('.')) + "_*.dll";
  dirsel_t selection = {};
  selection.file_patterns = pattern.c_str();
  Listing candidates;
  if (!is_folder(options.folder) || !candidates.scan(options.folder, &selection, false)) return no;
  int exit_code = no;
  std::vector<std::string> values;
  for (const char* const name : candidates.names()) {
    const Verdict verdict = verdict_on(options, name, candidates);
    if (verdict.reason.empty()) exit_code = done;
    if (options.json)
      values.push_back(as_json(verdict));
    else
      print_line(verdict);
  }
  if (options.json) std::puts(json_array(values).c_str());
  if (candidates.names().empty()) complain("no " + pattern + " in " + options.folder);
  return exit_code;
}

}  // namespace tool
