// Formats the Date line.
#include "transfer/date_line.h"

#include <cstdio>

#include "platform/platform.h"

namespace zv {

namespace {

constexpr const char* days[] = {"Sun", "Mon", "Tue", "Wed", "Thu", "Fri", "Sat"};
constexpr const char* months[] = {"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                  "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};

template <size_t Count>
const char* name_of(const char* const (&names)[Count], int number) {
  return number >= 0 && number < static_cast<int>(Count) ? names[number] : nullptr;
}

// Hours and minutes as one number: 330 minutes read +0530.
int zone_number(int offset_minutes) {
  return offset_minutes / 60 * 100 + offset_minutes % 60;
}

}  // namespace

bool format_date_line(const struct tm& local, int offset_minutes, DateLine& line) {
  const char* const day = name_of(days, local.tm_wday);
  const char* const month = name_of(months, local.tm_mon);
  return day != nullptr && month != nullptr && line.fill([&](char* room, size_t size) {
    const int length = std::snprintf(room, size, "Date: %s, %02d %s %d %02d:%02d:%02d %+.4d", day,
                                     local.tm_mday, month, local.tm_year + 1900, local.tm_hour,
                                     local.tm_min, local.tm_sec, zone_number(offset_minutes));
    return length > 0 && static_cast<size_t>(length) < size;
  });
}

bool format_date_line(DateLine& line) {
  struct tm local;
  int offset_minutes = 0;
  return platform::local_time(local, offset_minutes) &&
         format_date_line(local, offset_minutes, line);
}

}  // namespace zv
