#include "transfer/dialogue.h"

#include "transfer/reply.h"

namespace zv {

int Dialogue::hear() const {
  return read_reply(connection_.control.get(), connection_.buffer.room());
}

int Dialogue::ask(Pieces command) const {
  LineBuffer line;
  const bool sent = build_line(line, command) && !holds_line_end(line.view()) &&
                    line.append("\r\n") && send_all(connection_.control.get(), line.view());
  return sent ? hear() : 0;
}

}  // namespace zv
