// zv path: the path algebra, one operation a subcommand.
#include <cstdio>
#include <cstring>

#include "commands.h"
#include "json.h"
#include "path_text.h"

namespace tool {
namespace {

const char* base_of(const PathOptions& options) {
  return options.base.empty() ? nullptr : options.base.c_str();
}

// Where nothing is left of a path, it is the folder that one stands in.
void print(const PathOptions& options, const char* path) {
  if (*path == '\0') path = ".";
  std::puts(options.json ? json_string(path).c_str() : path);
}

}  // namespace

int path_normalize(const PathOptions& options) {
  PathText path;
  if (!path.assign(options.path)) return no;
  if (zv_normalize_path(path.data()) == 0) {
    // What stands in front of a variable that is not set is kept.
    complain(
        "cannot normalise " + options.path +
        (*path.c_str() != '\0'
             ? ": no value for the variable after " + std::string(path.c_str())
             : ": it climbs above its root, grows too long, or names a drive, a home folder or "
               "a variable that is not there"));
    return no;
  }
  print(options, path.c_str());
  return done;
}

int path_absolute(const PathOptions& options) {
  PathText path;
  if (!path.assign(options.path)) return no;
  if (zv_ispath_relative(path.c_str()) != 0 &&
      zv_absolute(path.c_str(), base_of(options), path.data(), PathText::size()) == 0) {
    complain("cannot make " + options.path +
             " absolute: it climbs above the base's root or grows too long");
    return no;
  }
  print(options, path.c_str());
  return done;
}

int path_relative(const PathOptions& options) {
  PathText path;
  if (!path.assign(options.path)) return no;
  if (zv_relative(path.c_str(), base_of(options), path.data(), PathText::size()) == 0) {
    complain("cannot make " + options.path + " relative: it has no root in common with the base");
    return no;
  }
  print(options, path.c_str());
  return done;
}

int path_split(const PathOptions& options) {
  PathText path;
  if (!path.assign(options.path)) return no;
  zv_split_path(path.data());
  std::vector<std::string> pieces;
  for (const char* piece = path.c_str(); *piece != '\0'; piece += std::strlen(piece) + 1) {
    if (options.json)
      pieces.push_back(json_string(piece));
    else
      std::puts(piece);
  }
  if (options.json) std::puts(json_array(pieces).c_str());
  return done;
}

int path_locate(const PathOptions& options) {
  PathText path;
  if (!path.assign(options.path)) return no;
  if (zv_path_locate(path.data()) == 0) {
    complain("no folder of PATH has " + options.path);
    return no;
  }
  print(options, path.c_str());
  return done;
}

}  // namespace tool
