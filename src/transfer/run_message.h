// The mail of a run: its two addresses, and the lines before and after the file. Every line is
// 7-bit and has 78 characters at most, except for an address that is longer.
#ifndef ZARVO_TRANSFER_RUN_MESSAGE_H
#define ZARVO_TRANSFER_RUN_MESSAGE_H

#include "transfer/mail_words.h"
#include "transfer/run.h"

namespace zv {

using MailAddress = TextBuffer<255>;  // RFC 5321 4.5.3.1.3

struct RunMessage {
  static constexpr std::string_view tail = "--===ZV_BOUNDARY_QM===--\r\n.\r\n";

  TextBuffer<256> host;  // the local machine's official name; empty when it has none
  MailAddress sender;
  MailAddress recipient;
  MailText head;
};

// `user` is the sender when it is an address. False when the run has failed.
[[nodiscard]] bool write_run_message(Run& run, const char* local, std::string_view user,
                                     std::string_view recipient, RunMessage& message);

}  // namespace zv

#endif
