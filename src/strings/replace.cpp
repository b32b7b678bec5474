// Replacement of every occurrence: of a character, and of a text within another.
#include <algorithm>
#include <climits>
#include <cstring>
#include <string_view>
#include <type_traits>

#include "frame/byte_map.h"
#include "platform/platform.h"
#include "strings/find.h"
#include "zarvo.h"

namespace {

// The C library's own search is the best there is on one platform, and on another goes place by
// place. The texts end with NUL.
const char* find_exact(std::string_view text, std::string_view needle) {
  return zv::platform::has_fast_search() ? std::strstr(text.data(), needle.data())
                                         : zv::find(text, needle);
}

template <class Find>
size_t count_occurrences(const char* found, const char* end, std::string_view needle, Find find) {
  // Single bytes lie so close together that it takes less time to look at all of them at once.
  if constexpr (std::is_same_v<Find, decltype(&find_exact)>)
    if (needle.size() == 1) return static_cast<size_t>(std::count(found, end, needle.front()));
  size_t count = 0;
  for (; found != nullptr; found = find({found + needle.size(), end}, needle)) ++count;
  return count;
}

// A text that grows first moves to the end of its room: what is not yet read then never lies in
// front of the place written to, and each byte moves at most twice, however many occurrences.
template <class Find>
int replace_all(char* s, std::string_view needle, std::string_view repl, Find find) {
  if (needle.empty()) return 0;
  const std::string_view text = s;
  const char* found = find(text, needle);
  if (found == nullptr) return 0;

  char* to = s + (found - s);
  const char* end = s + text.size();
  if (repl.size() > needle.size()) {
    const size_t more = repl.size() - needle.size();
    const size_t moved = count_occurrences(found, end, needle, find) * more;
    std::memmove(to + moved, found, static_cast<size_t>(end - found) + 1);
    found += moved;
    end += moved;
  }

  while (found != nullptr) {
    const char* const rest = found + needle.size();
    std::memcpy(to, repl.data(), repl.size());
    to += repl.size();
    found = find({rest, end}, needle);
    const auto kept = static_cast<size_t>((found != nullptr ? found : end + 1) - rest);
    if (to != rest) std::memmove(to, rest, kept);
    to += kept;
  }
  return 1;
}

}  // namespace

void zv_strreplchr(char* s, int from, char to) {
  if (from < SCHAR_MIN || from > SCHAR_MAX) return;  // no character has that value
  const char found = static_cast<char>(from);
  const size_t length = std::strlen(s);
  // Writing every byte lets the compiler do many at once.
  for (size_t i = 0; i < length; ++i) s[i] = s[i] == found ? to : s[i];
}

int zv_strreplstr(char* s, const char* needle, const char* repl) {
  return replace_all(s, needle, repl, find_exact);
}

int zv_strireplstr(char* s, const char* needle, const char* repl) {
  zv::ByteMap room;
  const int32_t* const lower = zv::platform::lower_map(room);
  return replace_all(s, needle, repl, [lower](std::string_view text, std::string_view wanted) {
    return zv::find_without_case(text, wanted, lower);
  });
}
