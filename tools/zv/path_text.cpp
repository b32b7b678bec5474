// A path in the room that the library's in-place operations need.
#include "path_text.h"

#include "commands.h"

bool tool::PathText::assign(const std::string& path) {
  if (path.empty()) {
    complain("an empty path names nothing");
    return false;
  }
  if (path.size() >= ZV_PATH_MAX) {
    complain("a path has at most " + std::to_string(ZV_PATH_MAX - 1) + " characters: " + path);
    return false;
  }
  zv_strncpy(text_, path.c_str(), ZV_PATH_MAX);
  return true;
}
