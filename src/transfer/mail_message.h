// The mail that carries a file: who sends it, and the lines around the file byte for byte.
#ifndef ZARVO_TRANSFER_MAIL_MESSAGE_H
#define ZARVO_TRANSFER_MAIL_MESSAGE_H

#include "frame/text_buffer.h"
#include "transfer/line.h"

namespace zv {

// Lines that leave in one send.
class Lines {
 public:
  // Adds one line made of the words, and its line end. One that holds a line end itself would be
  // two; it spoils them all, as one that does not fit.
  void add(Words words);

  bool good() const { return good_; }
  std::string_view view() const { return text_.view(); }

 private:
  TextBuffer<4096> text_;
  bool good_ = true;
};

struct MailMessage {
  TextBuffer<256> host;  // the local machine's official name
  PathBuffer sender;
  Lines head;  // the message up to the attached file's first byte
  Lines tail;  // what follows its last, up to the line that ends the message
};

// The user itself when it is an address, else the login at the host's domain. False when it is too
// long.
[[nodiscard]] bool build_sender(std::string_view user, std::string_view login,
                                std::string_view host, PathBuffer& sender);

// False when the local machine has no name, or a line cannot be built.
[[nodiscard]] bool write_message(const char* user, const char* local, const char* recipient,
                                 MailMessage& message);

}  // namespace zv

#endif
