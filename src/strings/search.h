// Search for a text within another, a block of bytes at a time.
#ifndef ZARVO_STRINGS_SEARCH_H
#define ZARVO_STRINGS_SEARCH_H

#include <cstdint>
#include <string_view>

namespace zv {

// The first place of the needle, which is not empty; nullptr when there is none.
const char* find(std::string_view text, std::string_view needle);
// The same where bytes are equal that `lower` maps to the same.
const char* find_without_case(std::string_view text, std::string_view needle, const int32_t* lower);

}  // namespace zv

#endif
