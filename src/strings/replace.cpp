// Replacement of every occurrence, and brackets around a text.
#include <algorithm>
#include <cstring>

#include "zarvo.h"

namespace {

using Find = const char* (*)(const char* s, const char* needle);

const char* find_exact(const char* s, const char* needle) {
  return std::strstr(s, needle);
}

const char* find_without_case(const char* s, const char* needle) {
  return zv_stristr(s, needle);
}

size_t count_occurrences(const char* found, const char* needle, size_t length, Find find) {
  // Single bytes lie so close together that it takes less time to look at all of them at once.
  if (length == 1 && find == find_exact)
    return static_cast<size_t>(std::count(found, found + std::strlen(found), *needle));
  size_t count = 0;
  for (; found != nullptr; found = find(found + length, needle)) ++count;
  return count;
}

// A text that grows first moves to the end of its room: what is not yet read then never lies in
// front of the place written to, and each byte moves at most twice, however many occurrences.
int replace_all(char* s, const char* needle, const char* repl, Find find) {
  const size_t needle_length = std::strlen(needle);
  const char* found = needle_length != 0 ? find(s, needle) : nullptr;
  if (found == nullptr) return 0;

  const size_t repl_length = std::strlen(repl);
  char* to = s + (found - s);
  if (repl_length > needle_length) {
    const size_t occurrences = count_occurrences(found, needle, needle_length, find);
    char* const moved = to + occurrences * (repl_length - needle_length);
    std::memmove(moved, to, std::strlen(to) + 1);
    found = moved;
  }

  while (found != nullptr) {
    const char* const rest = found + needle_length;
    std::memcpy(to, repl, repl_length);
    to += repl_length;
    found = find(rest, needle);
    const size_t kept =
        found != nullptr ? static_cast<size_t>(found - rest) : std::strlen(rest) + 1;
    if (to != rest) std::memmove(to, rest, kept);
    to += kept;
  }
  return 1;
}

}  // namespace

int zv_strreplstr(char* s, const char* needle, const char* repl) {
  return replace_all(s, needle, repl, find_exact);
}

int zv_strireplstr(char* s, const char* needle, const char* repl) {
  return replace_all(s, needle, repl, find_without_case);
}

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
