// Case in the current locale.
#include <ctype.h>
#include <locale.h>

#include "platform/platform.h"

namespace zv::platform {

namespace {

// Most programs never leave the "C" locale, the one without a code page.
const int32_t* map_of(int (*convert)(int), const ByteMap& ascii, ByteMap& room) {
  if (::___lc_codepage_func() == 0) return ascii.data();
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
// signed.
int compare_without_case(const char* a, const char* b, size_t n) {
  for (size_t i = 0; i < n; ++i) {
    const int difference =
        ::tolower(static_cast<unsigned char>(a[i])) - ::tolower(static_cast<unsigned char>(b[i]));
    if (difference != 0 || a[i] == '\0') return difference;
  }
  return 0;
}

}  // namespace zv::platform
