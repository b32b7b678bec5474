// All plugins of an API: the folder, its candidates, each tried and reported.
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "host/environment.h"
#include "plugin/answer.h"
#include "plugin/candidates.h"
#include "plugin/loaded_plugin.h"
#include "strlist/list_owner.h"

namespace {

using BaseName = zv::TextBuffer<48>;

// What one enumeration asks every plugin for.
struct Request {
  const char* folder;
  const char* api;
  int min;
  int max;
};

bool base_name(const char* api, BaseName& base) {
  return base.assign({api, std::strcspn(api, ".")}) && !base.empty();
}

// The first variable that is set. Where memory for its value is short, no other stands in: that
// would load what lies in another folder.
zv::HeapPtr<char> folder_setting(const BaseName& base) {
  zv::HeapPtr<char> value;
  for (const char* const variable : {base.c_str(), "PLG", "LIB"})
    if (!zv::get_private(variable, value) || value != nullptr) break;
  return value;
}

bool plugin_folder(const BaseName& base, zv::PathBuffer& folder) {
  const zv::HeapPtr<char> setting = folder_setting(base);
  struct _stat64 st;
  return setting != nullptr && zv::canonical_path(setting.get(), folder) &&
         zv_stat(folder.c_str(), &st) == 0;
}

// How many files may be plugins of the API, listed in `names`.
int find_candidates(const zv::PathBuffer& folder, const BaseName& base, char*** names) {
  zv::TextBuffer<BaseName::capacity + sizeof "_*.dll"> pattern;
  if (!pattern.assign(base.view()) || !pattern.append("_*.dll")) return 0;
  dirsel_t selection = {"", pattern.c_str(), nullptr, 0, 0};
  const auto filter = reinterpret_cast<dir_filter_t>(zv_dir_select);
  return zv_dir_scan(folder.c_str(), names, filter, &selection, 0, 0);
}

void report_rejection(const Request& request, int code) {
  std::fputs("\n\trejected: ", stderr);
  if (const char* const text = zv::plugin_error_text(code))
    std::fprintf(stderr, "%s\n", text);
  else if (code >= 0 && code < request.min)
    std::fprintf(stderr, "outdated version %d\n", code);
  else if (code > request.max)
    std::fprintf(stderr, "unsupported version %d\n", code);
  else
    std::fprintf(stderr, "error code %d\n", code);
}

zv_plugin_t* try_candidate(const Request& request, const char* name) {
  std::fprintf(stderr, "Testing library %s for %s API...", name, request.api);
  int code = 0;
  zv_plugin_t* const record =
      zv_plugin_create(request.folder, name, request.api, request.min, request.max, &code);
  if (record != nullptr)
    std::fputs("ok\n", stderr);
  else
    report_rejection(request, code);
  return record;
}

// Tries each name and returns how many were accepted; `array` has room for all of them and a NULL.
int try_candidates(const Request& request, const zv::ListOwner& names, bool keep,
                   zv_plugin_t** array) {
  int accepted = 0;
  for (const char* const name : names) {
    zv_plugin_t* const record = try_candidate(request, name);
    if (record == nullptr) continue;
    if (!keep) zv_plugin_unload(record);
    array[accepted++] = record;
  }
  return accepted;
}

zv_plugin_t** resize(zv_plugin_t** array, int records) {
  const size_t slots = static_cast<size_t>(records) + 1;
  return static_cast<zv_plugin_t**>(std::realloc(array, slots * sizeof(zv_plugin_t*)));
}

}  // namespace

int zv_plugin_enumerate(zv_plugin_t*** plugins, const char* api, int min, int max, int keep) {
  BaseName base;
  zv::PathBuffer folder;
  if (!base_name(api, base) || !plugin_folder(base, folder)) return 0;
  char** list = nullptr;
  const int found = find_candidates(folder, base, &list);
  const int tried = found > 0 ? zv::drop_variants(list, found) : 0;
  const zv::ListOwner names(list);
  if (found <= 0) return 0;

  zv_plugin_t** array = tried > 0 ? resize(nullptr, tried) : nullptr;
  *plugins = array;
  if (array == nullptr) return 0;

  const Request request = {folder.c_str(), api, min, max};
  const int accepted = try_candidates(request, names, keep != 0, array);
  array[accepted] = nullptr;
  zv_plugin_t** const fitting = resize(array, accepted);
  *plugins = fitting != nullptr ? fitting : array;
  return accepted;
}
