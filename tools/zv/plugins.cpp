// zv plugins: which libraries of a folder serve an API, and why the others do not.
#include <cstdio>
#include <memory>
#include <set>

#include "commands.h"
#include "folder.h"
#include "json.h"
#include "system.h"

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
      return "cannot be loaded: " + loader_words();
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
  loader_words();  // what an earlier one left
  const PluginPtr plugin(zv_plugin_create(options.folder.c_str(), name, options.api.c_str(),
                                          options.oldest, options.newest, &code));
  if (plugin == nullptr) return {name, "rejected", reason(code, options)};
  Verdict verdict = {name, "accepted", "", code};
  for (char** entry = plugin->formats; *entry != nullptr; ++entry)
    verdict.formats.emplace_back(*entry);
  return verdict;
}

// Which files the library would try, in its own words: asked for a range of versions that cannot
// be, it reports each and runs none.
std::set<std::string> names_to_try(const PluginsOptions& options, const std::string& base) {
  const std::string head = "Testing library ";
  const std::string tail = " for " + options.api + " API...";
  zv_plugin_t** none = nullptr;
  zv_putenv_private(base.c_str(), options.folder.c_str(), 0);
  const std::string report =
      messages_of([&] { zv_plugin_enumerate(&none, options.api.c_str(), 1, 0, 0); });
  zv_free(none);
  std::set<std::string> names;
  for (size_t at = 0; (at = report.find(head, at)) != std::string::npos;) {
    at += head.size();
    names.insert(report.substr(at, report.find(tail, at) - at));
  }
  return names;
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
  const std::string base = options.api.substr(0, options.api.find('.'));
  const std::string pattern = base + "_*.dll";
  dirsel_t selection = {};
  selection.file_patterns = pattern.c_str();
  Listing files;
  if (!is_folder(options.folder) || !files.scan(options.folder, &selection, false)) return no;
  const std::set<std::string> to_try = names_to_try(options, base);
  if (to_try.empty()) complain("no plugin of " + options.api + " to try in " + options.folder);
  int exit_code = no;
  std::vector<std::string> values;
  for (const char* const name : to_try.empty() ? std::span<char*>() : files.names()) {
    const Verdict verdict = to_try.contains(name)
                                ? try_library(options, name)
                                : Verdict{name, "skipped", "a variant of another"};
    if (verdict.reason.empty()) exit_code = done;
    if (options.json)
      values.push_back(as_json(verdict));
    else
      print_line(verdict);
  }
  if (options.json) std::puts(json_array(values).c_str());
  return exit_code;
}

}  // namespace tool
