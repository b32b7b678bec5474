// Search for a text within another, a block of bytes at a time.
#ifndef ZARVO_STRINGS_FIND_H
#define ZARVO_STRINGS_FIND_H

#include <cstdint>
#include <cstring>
#include <string_view>

namespace zv {

const char* find_longer(std::string_view text, std::string_view needle);

// The first place of the needle, which is not empty; nullptr when there is none.
inline const char* find(std::string_view text, std::string_view needle) {
  if (needle.size() != 1) return find_longer(text, needle);
  return static_cast<const char*>(std::memchr(text.data(), needle.front(), text.size()));
}

inline bool is_ascii_letter(char ch) {
  return (ch | 0x20) >= 'a' && (ch | 0x20) <= 'z';
}

// The first place of a letter of ASCII in either form.
const char* find_letter(std::string_view text, char letter);

// The first place of the needle where bytes are equal that `lower` maps to the same.
const char* find_without_case(std::string_view text, std::string_view needle, const int32_t* lower);

}  // namespace zv

#endif
