// Zero-separated sequences: non-empty texts end to end, each with its NUL, closed by one more NUL.
#include <algorithm>
#include <cstring>

#include "zarvo.h"

size_t zv_strnulllen(const char* seq) {
  const char* end = seq;
  while (*end != '\0') end += std::strlen(end) + 1;
  return static_cast<size_t>(end - seq);
}

void zv_strnull(char* s) {
  s[std::strlen(s) + 1] = '\0';
}

void zv_strnullrepl(char* seq, char sep) {
  while (*seq != '\0') {
    seq += std::strlen(seq);
    *seq++ = sep;
  }
}

size_t zv_strnnullcpy(char* dst, const char* src, size_t size) {
  if (size == 0) return 0;
  const size_t length = std::min(zv_strnulllen(src), size - 1);
  std::memcpy(dst, src, length);
  dst[length] = '\0';
  return length;
}

size_t zv_strnnullcat(char* dst, const char* src, size_t size) {
  const size_t used = zv_strnulllen(dst);
  return used < size ? zv_strnnullcpy(dst + used, src, size - used) : 0;
}
