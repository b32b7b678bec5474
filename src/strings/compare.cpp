// Comparison without regard to case, which is the current locale's, byte by byte.
#include "platform/platform.h"
#include "zarvo.h"

int zv_stricmp(const char* a, const char* b) {
  return zv::platform::compare_without_case(a, b);
}

int zv_strnicmp(const char* a, const char* b, size_t n) {
  return zv::platform::compare_without_case(a, b, n);
}
