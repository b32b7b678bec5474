// Local time.
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

}  // namespace zv::platform
