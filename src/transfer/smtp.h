// The mail sender: one file, to one recipient, as a MIME attachment.
#ifndef ZARVO_TRANSFER_SMTP_H
#define ZARVO_TRANSFER_SMTP_H

#include "platform/platform.h"

namespace zv {

// Mails the local file to the recipient's address. 0, -3 or -4.
int smtp_send_file(const platform::Address& addr, unsigned port, const char* user,
                   const char* password, const char* local, const char* recipient);

}  // namespace zv

#endif
