// All plugins of an API: the folder, its candidates, each tried and reported.
#include <cstdio>
#include <cstring>

#include "host/environment.h"
#include "plugin/candidates.h"
#include "plugin/canonical_path.h"
#include "plugin/error_text.h"
#include "plugin/record.h"
#include "strlist/list_owner.h"

namespace {

using BaseName = zv::TextBuffer<48>;

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
  return setting != nullptr && zv::canonical_path(setting.get(), folder) &&
         zv::platform::lies_at(folder.c_str()) != zv::platform::Kind::none;
}

// How many files may be plugins of the API, listed in `names`.
int find_candidates(const zv::PathBuffer& folder, const BaseName& base, char*** names) {
  zv::TextBuffer<BaseName::capacity + sizeof "_*.dll"> pattern;
  if (!pattern.assign(base.view()) || !pattern.append("_*.dll")) return 0;
  dirsel_t selection = {"", pattern.c_str(), nullptr, 0, 0};
  const auto filter = reinterpret_cast<dir_filter_t>(zv_dir_select);
  return zv_dir_scan(folder.c_str(), names, filter, &selection, 0, 0);
}

void report_rejection(const zv::Request& request, int code) {
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

zv::RecordPtr try_candidate(const zv::PathBuffer& folder, const char* name,
                            const zv::Request& request) {
  std::fprintf(stderr, "Testing library %s for %s API...", name, request.api);
  int code = 0;
  zv::RecordPtr record = zv::create_record(folder, name, request, &code);
  if (record != nullptr)
    std::fputs("ok\n", stderr);
  else
    report_rejection(request, code);
  return record;
}

// Tries each name and returns how many were accepted; `array` has room for all of them and a NULL.
int try_candidates(const zv::PathBuffer& folder, const zv::ListOwner& names,
                   const zv::Request& request, bool keep, zv_plugin_t** array) {
  int accepted = 0;
  for (const char* const name : names) {
    zv::RecordPtr record = try_candidate(folder, name, request);
    if (record == nullptr) continue;
    if (!keep) zv_plugin_unload(record.get());
    array[accepted++] = record.release();
  }
  array[accepted] = nullptr;
  return accepted;
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

  // What runs in the plugins never meets an array that is not whole.
  *plugins = nullptr;
  zv_plugin_t** const array =
      tried > 0 ? zv::resize_array(nullptr, static_cast<size_t>(tried)) : nullptr;
  if (array == nullptr) return 0;
  const int accepted = try_candidates(folder, names, {api, min, max}, keep != 0, array);
  zv_plugin_t** const fitting = zv::resize_array(array, static_cast<size_t>(accepted));
  *plugins = fitting != nullptr ? fitting : array;
  return accepted;
}
