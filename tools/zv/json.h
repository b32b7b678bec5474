// Results as a script reads them: JSON (RFC 8259) on one line.
#ifndef ZV_TOOL_JSON_H
#define ZV_TOOL_JSON_H

#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace tool {

// The text as a JSON string. A byte that is no UTF-8, which a file name may hold, becomes the code
// point 0xDC00 + byte, from which some languages make the byte again.
std::string json_string(std::string_view text);

// Of values that are JSON already.
std::string json_array(const std::vector<std::string>& values);
std::string json_object(const std::vector<std::pair<const char*, std::string>>& members);

}  // namespace tool

#endif
