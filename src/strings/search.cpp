// Search without regard to case, which is the current locale's, byte by byte.
#include <string_view>

#include "frame/byte_map.h"
#include "frame/text_view.h"
#include "platform/platform.h"
#include "strings/find.h"
#include "zarvo.h"

namespace {

// Searches through a window that widens as it moves on, so that what lies far after an early find
// is not even measured. Windows overlap by what a find of `length` bytes may lack in one.
template <class Find>
char* find_in_windows(const char* s, size_t length, Find find) {
  constexpr size_t first_window = 512;
  for (size_t window = first_window + length;; window *= 2) {
    const std::string_view text = zv::bounded(s, window);
    if (const char* const found = find(text); found != nullptr) return const_cast<char*>(found);
    if (text.size() < window) return nullptr;
    s += window - length + 1;
  }
}

char* find_text(const char* s, std::string_view needle, const int32_t* lower) {
  return find_in_windows(s, needle.size(), [=](std::string_view text) {
    return zv::find_without_case(text, needle, lower);
  });
}

}  // namespace

char* zv_strichr(const char* s, int ch) {
  const char wanted = static_cast<char>(ch);
  if (wanted == '\0') return nullptr;
  zv::ByteMap room;
  const int32_t* const lower = zv::platform::lower_map(room);
  if (!zv::is_ascii_letter(wanted) || !zv::agrees(lower, zv::ascii_lower))
    return find_text(s, {&wanted, 1}, lower);
  return find_in_windows(s, 1,
                         [=](std::string_view text) { return zv::find_letter(text, wanted); });
}

char* zv_stristr(const char* s, const char* needle) {
  if (*needle == '\0') return nullptr;
  zv::ByteMap room;
  return find_text(s, needle, zv::platform::lower_map(room));
}
