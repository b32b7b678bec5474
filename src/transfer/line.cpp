// Building and sending lines.
#include "transfer/line.h"

namespace zv {

bool build_line(LineBuffer& line, Words words) {
  line.clear();
  for (const std::string_view word : words)
    if (!line.append(word)) return false;
  return true;
}

bool send_all(platform::Socket socket, std::string_view bytes) {
  while (!bytes.empty()) {
    const int64_t sent = platform::socket_send(socket, bytes.data(), bytes.size());
    if (sent <= 0) return false;
    bytes.remove_prefix(static_cast<size_t>(sent));
  }
  return true;
}

}  // namespace zv
