// Local time and time that passes.
#include <ctime>

#include "platform/platform.h"

namespace zv::platform {

bool local_time(struct tm& out, int& offset_minutes) {
  tzset();
  const time_t now = time(nullptr);
  if (localtime_r(&now, &out) == nullptr) return false;
  offset_minutes = static_cast<int>(out.tm_gmtoff / 60);
  return true;
}

int64_t monotonic_ms() {
  struct timespec now;
  clock_gettime(CLOCK_MONOTONIC, &now);
  return int64_t{now.tv_sec} * 1000 + now.tv_nsec / 1000000;
}

}  // namespace zv::platform
