// Commands and numbered replies in a run: what FTP and mail have in common. Replies are read as a
// stream, several in one receive are taken one by one.
#ifndef ZARVO_TRANSFER_COMMANDS_H
#define ZARVO_TRANSFER_COMMANDS_H

#include <string_view>

#include "transfer/line.h"
#include "transfer/wire.h"

namespace zv {

// The code of a reply's line, "550 No such file"; 0 for a line that begins with none. `goes_on`
// tells that others follow, "550-No such".
int reply_code(std::string_view line, bool& goes_on);

class Commands {
 public:
  explicit Commands(Wire& wire) : wire_(wire) {}

  // Reads the next reply and gives its code; 0 when the run has failed. The clock of the reply must
  // have been started.
  [[nodiscard]] int read_reply();

  // Sends the command and reads its reply. Reasons show the command, or `shown` in its place where
  // it holds a secret.
  [[nodiscard]] int send(Words command, std::string_view shown = {},
                         int64_t silence = Wire::standard_silence);

  // Fails the run by the reply that was read last: a 4yz is worth another try, a 5yz is not, and
  // `cause` says more of it; every other breaks the protocol. Always false.
  bool refuse(int cause = ZV_CAUSE_REFUSED);

  // The last line of the reply that was read last.
  std::string_view reply() const { return reply_.view(); }

 private:
  Wire& wire_;
  int code_ = 0;
  TextBuffer<8200> reply_;
};

}  // namespace zv

#endif
