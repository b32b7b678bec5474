// Locations as the tool reads and shows them.
#ifndef ZV_TOOL_LOCATION_TEXT_H
#define ZV_TOOL_LOCATION_TEXT_H

#include <string>

namespace tool {

bool is_network(const std::string& location);
bool is_mail(const std::string& location);

// A message's text with the user and password taken out of every location in it.
std::string without_logins(const std::string& text);

// Where a copy goes: `to` itself or, where that is a local folder, the source's own name in it.
// Throws std::runtime_error where the source has no name that a file could have.
std::string destination(const std::string& from, const std::string& to);

}  // namespace tool

#endif
