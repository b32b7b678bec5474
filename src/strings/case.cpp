// Texts turned into upper or lower case, as the current locale has it, byte by byte.
#include <cstring>

#include "frame/byte_map.h"
#include "platform/platform.h"
#include "zarvo.h"

namespace {

// Turns the letters of ASCII from `first` on into their other form. Needing no table, it is done
// for many bytes at once.
void turn_letters(char* s, size_t length, char first) {
  for (size_t i = 0; i < length; ++i) {
    const bool letter = static_cast<unsigned char>(s[i] - first) < 26;
    s[i] = static_cast<char>(letter ? s[i] ^ ('a' ^ 'A') : s[i]);
  }
}

void look_up(char* s, size_t length, const int32_t* map) {
  for (size_t i = 0; i < length; ++i)
    s[i] = static_cast<char>(map[static_cast<unsigned char>(s[i])]);
}

size_t convert(char* s, const int32_t* map, const zv::ByteMap& ascii, char first) {
  constexpr size_t worth_a_look = 64;  // at the whole map
  const size_t length = std::strlen(s);
  if (length >= worth_a_look && zv::agrees(map, ascii))
    turn_letters(s, length, first);
  else
    look_up(s, length, map);
  return length;
}

}  // namespace

size_t zv_strlwr(char* s) {
  zv::ByteMap room;
  return convert(s, zv::platform::lower_map(room), zv::ascii_lower, 'A');
}

size_t zv_strupr(char* s) {
  zv::ByteMap room;
  return convert(s, zv::platform::upper_map(room), zv::ascii_upper, 'a');
}
