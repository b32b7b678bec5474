// Case, and comparison and search without regard to it. Case is the current locale's, byte by byte.
#include <cctype>
#include <cstring>

#include "zarvo.h"

namespace {

int lower(char ch) {
  return std::tolower(static_cast<unsigned char>(ch));
}

}  // namespace

size_t zv_strlwr(char* s) {
  const size_t length = std::strlen(s);
  for (size_t i = 0; i < length; ++i) s[i] = static_cast<char>(lower(s[i]));
  return length;
}

size_t zv_strupr(char* s) {
  const size_t length = std::strlen(s);
  for (size_t i = 0; i < length; ++i)
    s[i] = static_cast<char>(std::toupper(static_cast<unsigned char>(s[i])));
  return length;
}

int zv_stricmp(const char* a, const char* b) {
  return zv_strnicmp(a, b, SIZE_MAX);
}

int zv_strnicmp(const char* a, const char* b, size_t n) {
  for (size_t i = 0; i < n; ++i) {
    const int difference = a[i] == b[i] ? 0 : lower(a[i]) - lower(b[i]);
    if (difference != 0 || a[i] == '\0') return difference;
  }
  return 0;
}

char* zv_strichr(const char* s, int ch) {
  const int wanted = lower(static_cast<char>(ch));
  for (; *s != '\0'; ++s)
    if (lower(*s) == wanted) return const_cast<char*>(s);
  return nullptr;
}

char* zv_stristr(const char* s, const char* needle) {
  const size_t length = std::strlen(needle);
  if (length == 0) return nullptr;
  for (s = zv_strichr(s, needle[0]); s != nullptr; s = zv_strichr(s + 1, needle[0]))
    if (zv_strnicmp(s, needle, length) == 0) return const_cast<char*>(s);
  return nullptr;
}
