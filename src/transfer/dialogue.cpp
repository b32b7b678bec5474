// Commands and their replies.
#include "transfer/dialogue.h"

#include "transfer/reply.h"

namespace zv {

int Dialogue::read_reply() const {
  return zv::read_reply(connection_.control.get(), connection_.buffer.room());
}

int Dialogue::send_command(Words command) const {
  LineBuffer line;
  const bool sent = build_line(line, command) && !holds_line_end(line.view()) &&
                    line.append("\r\n") && send_all(connection_.control.get(), line.view());
  return sent ? read_reply() : 0;
}

}  // namespace zv
