// Comparison and search without regard to case. Case is the current locale's, byte by byte.
#include <cstring>
#include <string_view>

#include "platform/platform.h"
#include "strings/search.h"
#include "zarvo.h"

namespace {

// Searches through a window that widens as it moves on, so that what lies far behind an early find
// is not even measured.
char* find_in_windows(const char* s, std::string_view needle) {
  constexpr size_t first_window = 512;
  zv::platform::ByteMap room;
  const int32_t* const lower = zv::platform::lower_map(room);
  for (size_t window = first_window + needle.size();; window *= 2) {
    const void* const nul = std::memchr(s, '\0', window);
    const size_t length =
        nul != nullptr ? static_cast<size_t>(static_cast<const char*>(nul) - s) : window;
    const char* const found = zv::find_without_case({s, length}, needle, lower);
    if (found != nullptr) return const_cast<char*>(found);
    if (nul != nullptr) return nullptr;
    s += length - needle.size() + 1;
  }
}

}  // namespace

int zv_stricmp(const char* a, const char* b) {
  return zv::platform::compare_without_case(a, b);
}

int zv_strnicmp(const char* a, const char* b, size_t n) {
  return zv::platform::compare_without_case(a, b, n);
}

char* zv_strichr(const char* s, int ch) {
  const char wanted = static_cast<char>(ch);
  return wanted != '\0' ? find_in_windows(s, {&wanted, 1}) : nullptr;
}

char* zv_stristr(const char* s, const char* needle) {
  return *needle != '\0' ? find_in_windows(s, needle) : nullptr;
}
