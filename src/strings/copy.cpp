// The bounded copy behind every sized output, the replaced heap copy and the replaced character.
#include <climits>
#include <cstdlib>
#include <cstring>

#include "zarvo.h"

size_t zv_strncpy(char* dst, const char* src, size_t size) {
  if (size == 0) return 0;
  const void* const end = std::memchr(src, '\0', size);
  const size_t length =
      end != nullptr ? static_cast<size_t>(static_cast<const char*>(end) - src) : size - 1;
  std::memcpy(dst, src, length);
  dst[length] = '\0';
  return length;
}

char* zv_strredup(char* old, const char* s) {
  std::free(old);
  return s != nullptr ? static_cast<char*>(zv_dalloc(s, std::strlen(s) + 1)) : nullptr;
}

void zv_strreplchr(char* s, int from, char to) {
  if (from < SCHAR_MIN || from > SCHAR_MAX) return;  // no character has that value
  const char found = static_cast<char>(from);
  const size_t length = std::strlen(s);
  // Writing every byte lets the compiler do many at once.
  for (size_t i = 0; i < length; ++i) s[i] = s[i] == found ? to : s[i];
}
