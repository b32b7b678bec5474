// Local time and time that passes.
#include <time.h>
#include <windows.h>

#include "platform/platform.h"

namespace zv::platform {

bool local_time(struct tm& out, int& offset_minutes) {
  _tzset();
  const __time64_t now = _time64(nullptr);
  if (_localtime64_s(&out, &now) != 0) return false;
  // The local clock read as if it were UTC: what it is ahead of UTC now, daylight saving included.
  struct tm clock = out;
  offset_minutes = static_cast<int>((_mkgmtime64(&clock) - now) / 60);
  return true;
}

int64_t monotonic_ms() {
  return static_cast<int64_t>(GetTickCount64());
}

}  // namespace zv::platform
