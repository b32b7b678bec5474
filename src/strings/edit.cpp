// Edits in place that need nothing but the text: trimming, shifting, a replaced beginning.
#include <cstring>

#include "frame/text_view.h"
#include "zarvo.h"

namespace {

// The length of the text without the white space at its end.
size_t trimmed_length(const char* s, size_t length) {
  while (length > 0 && zv::is_space(s[length - 1])) --length;
  return length;
}

}  // namespace

size_t zv_strltrim(char* s) {
  const char* start = s;
  while (zv::is_space(*start)) ++start;
  const size_t length = std::strlen(start);
  if (start != s) std::memmove(s, start, length + 1);
  return length;
}

size_t zv_strrtrim(char* s) {
  const size_t length = trimmed_length(s, std::strlen(s));
  s[length] = '\0';
  return length;
}

size_t zv_strtrim(char* s) {
  const char* start = s;
  while (zv::is_space(*start)) ++start;
  const size_t length = trimmed_length(start, std::strlen(start));
  if (start != s) std::memmove(s, start, length);
  s[length] = '\0';
  return length;
}

void zv_strlshift(char* s, size_t n) {
  if (n != 0) std::memmove(s, s + n, std::strlen(s + n) + 1);
}

void zv_strrshift(char* s, size_t n) {
  if (n != 0) std::memmove(s + n, s, std::strlen(s) + 1);
}

void zv_strshift(char* s, int n) {
  if (n > 0) {
    zv_strrshift(s, static_cast<size_t>(n));
  } else {
    zv_strlshift(s, 0 - static_cast<size_t>(n));
  }
}

char* zv_strnrepl(char* dst, const char* src, int n) {
  const size_t length = std::strlen(src);
  const char* const rest = dst + n;
  if (dst + length != rest) std::memmove(dst + length, rest, std::strlen(rest) + 1);
  std::memcpy(dst, src, length);
  return dst + length;
}
