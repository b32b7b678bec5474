// The Date line of a mail (RFC 5322).
#ifndef ZARVO_TRANSFER_DATE_LINE_H
#define ZARVO_TRANSFER_DATE_LINE_H

#include <ctime>

#include "frame/text_buffer.h"

namespace zv {

using DateLine = TextBuffer<80>;

// "Date: Mon, 16 Nov 2026 21:05:00 +0100" without a line end, in English whatever the locale, for a
// local time and its offset from UTC. False for a time that has no such form.
bool format_date_line(const struct tm& local, int offset_minutes, DateLine& line);

// The same for now.
bool format_date_line(DateLine& line);

}  // namespace zv

#endif
