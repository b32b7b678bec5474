// Command and header lines: built whole in a bounded buffer, then sent.
#ifndef ZARVO_TRANSFER_LINE_H
#define ZARVO_TRANSFER_LINE_H

#include <initializer_list>
#include <string_view>

#include "frame/text_buffer.h"
#include "platform/platform.h"

namespace zv {

// Holds the longest line, or whole HTTP request, that a location's path and credentials can give.
using LineBuffer = TextBuffer<2048>;

using Words = std::initializer_list<std::string_view>;

// False when the line does not fit.
[[nodiscard]] bool build_line(LineBuffer& line, Words words);

// What no line and no text that goes into one may hold.
inline bool holds_line_end(std::string_view text) {
  return text.find_first_of("\r\n") != std::string_view::npos;
}

// Sends all of it: a send that a signal cut short goes on where it stopped.
[[nodiscard]] bool send_all(platform::Socket socket, std::string_view bytes);

}  // namespace zv

#endif
