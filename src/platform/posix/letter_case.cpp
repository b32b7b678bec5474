// Case in the current locale.
#include <ctype.h>
#include <strings.h>

#include "platform/platform.h"

namespace zv::platform {

// The GNU library shows its tables; any other is asked byte by byte.
#if defined(__GLIBC__)

const int32_t* lower_map(ByteMap&) {
  return *__ctype_tolower_loc();
}

const int32_t* upper_map(ByteMap&) {
  return *__ctype_toupper_loc();
}

#else

const int32_t* lower_map(ByteMap& room) {
  for (size_t byte = 0; byte < room.size(); ++byte) room[byte] = ::tolower(static_cast<int>(byte));
  return room.data();
}

const int32_t* upper_map(ByteMap& room) {
  for (size_t byte = 0; byte < room.size(); ++byte) room[byte] = ::toupper(static_cast<int>(byte));
  return room.data();
}

#endif

int compare_without_case(const char* a, const char* b) {
  return ::strcasecmp(a, b);
}

int compare_without_case(const char* a, const char* b, size_t n) {
  return ::strncasecmp(a, b, n);
}

}  // namespace zv::platform
