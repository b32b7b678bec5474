// Case in the current locale.
#include <ctype.h>
#include <locale.h>
#include <strings.h>

#include <atomic>

#include "platform/platform.h"

namespace zv::platform {

// The GNU library shows its tables; any other is asked byte by byte.
#if defined(__GLIBC__)

namespace {

// The "C" locale is there once and for ever, so that its tables are known by where they lie.
locale_t c_locale() {
  static std::atomic<locale_t> kept = nullptr;
  locale_t locale = kept.load(std::memory_order_relaxed);
  if (locale == nullptr) {
    locale = ::newlocale(LC_ALL_MASK, "C", nullptr);
    kept.store(locale, std::memory_order_relaxed);
  }
  return locale;
}

}  // namespace

const int32_t* lower_map(ByteMap&) {
  const int32_t* const map = *__ctype_tolower_loc();
  return map == c_locale()->__ctype_tolower ? ascii_lower.data() : map;
}

const int32_t* upper_map(ByteMap&) {
  const int32_t* const map = *__ctype_toupper_loc();
  return map == c_locale()->__ctype_toupper ? ascii_upper.data() : map;
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
