// zv scan: the entries of a folder that match.
#include <cstdio>

#include "commands.h"
#include "folder.h"
#include "json.h"

namespace tool {
namespace {

void print_json(std::span<char*> names) {
  std::vector<std::string> values;
  for (const char* const name : names) values.push_back(json_string(name));
  std::puts(json_array(values).c_str());
}

}  // namespace

int scan(const ScanOptions& options) {
  const bool everything = options.files.empty() && options.folders.empty();
  dirsel_t selection = {};
  selection.dir_patterns = everything ? "*" : options.folders.c_str();
  selection.file_patterns = everything ? "*" : options.files.c_str();
  selection.separators = ";";
  selection.show_hidden = options.hidden;
  selection.match_case = options.match_case;
  Listing found;
  if (!is_folder(options.folder) || !found.scan(options.folder, &selection, options.recursive))
    return no;
  if (options.json)
    print_json(found.names());
  else
    for (const char* const name : found.names()) std::puts(name);
  return done;
}

}  // namespace tool
