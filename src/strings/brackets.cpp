// A pair of characters put around a text, and taken off it.
#include <cstring>

#include "zarvo.h"

int zv_strbrkt(char* s, char open, char close) {
  const size_t length = std::strlen(s);
  std::memmove(s + 1, s, length);
  s[0] = open;
  s[length + 1] = close;
  s[length + 2] = '\0';
  return 2;
}

int zv_strubrkt(char* s, int open, int close) {
  const size_t length = std::strlen(s);
  if (length < 2 || static_cast<signed char>(s[0]) != open ||
      static_cast<signed char>(s[length - 1]) != close)
    return 0;
  std::memmove(s, s + 1, length - 2);
  s[length - 2] = '\0';
  return 2;
}
