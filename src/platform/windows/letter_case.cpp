// Case in the current locale.
#include <ctype.h>
#include <locale.h>

#include "platform/platform.h"

namespace zv::platform {

namespace {

// Most programs never leave the "C" locale, the one without a code page.
bool has_ascii_case() {
  return ::___lc_codepage_func() == 0;
}

const int32_t* map_of(int (*convert)(int), const ByteMap& ascii, ByteMap& room) {
  if (has_ascii_case()) return ascii.data();
  for (int byte = 0; byte < 256; ++byte) room[static_cast<size_t>(byte)] = convert(byte);
  return room.data();
}

}  // namespace

const int32_t* lower_map(ByteMap& room) {
  return map_of(::tolower, ascii_lower, room);
}

const int32_t* upper_map(ByteMap& room) {
  return map_of(::toupper, ascii_upper, room);
}

int compare_without_case(const char* a, const char* b) {
  return compare_without_case(a, b, SIZE_MAX);
}

// _strnicmp() itself takes no more than INT_MAX bytes, and Wine's orders bytes above 0x7F as
// signed. What is equal as it stands, most of a text, is not asked for its case.
int compare_without_case(const char* a, const char* b, size_t n) {
  const bool ascii = has_ascii_case();
  const auto lower = [ascii](char ch) {
    const auto byte = static_cast<unsigned char>(ch);
    return ascii ? ascii_lower[byte] : ::tolower(byte);
  };
  for (size_t i = 0; i < n; ++i) {
    if (a[i] != b[i]) {
      const int difference = lower(a[i]) - lower(b[i]);
      if (difference != 0) return difference;
    } else if (a[i] == '\0') {
      return 0;
    }
  }
  return 0;
}

}  // namespace zv::platform
