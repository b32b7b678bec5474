// Texts turned into upper or lower case, as the current locale has it, byte by byte.
#include <cstring>

#include "platform/platform.h"
#include "zarvo.h"

namespace {

size_t convert(char* s, const int32_t* map) {
  const size_t length = std::strlen(s);
  for (size_t i = 0; i < length; ++i)
    s[i] = static_cast<char>(map[static_cast<unsigned char>(s[i])]);
  return length;
}

}  // namespace

size_t zv_strlwr(char* s) {
  zv::platform::ByteMap room;
  return convert(s, zv::platform::lower_map(room));
}

size_t zv_strupr(char* s) {
  zv::platform::ByteMap room;
  return convert(s, zv::platform::upper_map(room));
}
