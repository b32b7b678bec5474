// A path in the room that the library's in-place operations need.
#ifndef ZV_TOOL_PATH_TEXT_H
#define ZV_TOOL_PATH_TEXT_H

#include <string>

#include "zarvo.h"

namespace tool {

class PathText {
 public:
  // Says so and gives false when the path is empty or longer than the library works with.
  bool assign(const std::string& path);

  char* data() { return text_; }
  const char* c_str() const { return text_; }
  static constexpr size_t size() { return ZV_PATH_MAX; }

 private:
  char text_[ZV_PATH_MAX + 2] = "";  // zv_split_path() adds two bytes
};

}  // namespace tool

#endif
