// A conversation of numbered replies: a line is sent, a reply is read, its code is compared.
#ifndef ZARVO_TRANSFER_DIALOGUE_H
#define ZARVO_TRANSFER_DIALOGUE_H

#include "transfer/connection.h"
#include "transfer/line.h"

namespace zv {

// The clients' side of FTP and SMTP over an open control connection. Code 0, which no step of a
// dialogue accepts, stands for every failure: a line that cannot be sent, a reply that cannot be
// read.
class Dialogue {
 public:
  explicit Dialogue(const Connection& connection) : connection_(connection) {}

  // Reads the next reply and gives its code.
  [[nodiscard]] int read_reply() const;

  // Sends the command and its line end, then reads the reply. A command that holds a line end
  // itself would be two, and is not sent.
  [[nodiscard]] int send_command(Words command) const;

  // The last line of the reply that was read last.
  const char* reply() const { return connection_.buffer.room().data(); }

 private:
  const Connection& connection_;
};

}  // namespace zv

#endif
