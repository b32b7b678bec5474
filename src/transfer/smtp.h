// The mail sender: one file, to one recipient, as a MIME attachment.
#ifndef ZARVO_TRANSFER_SMTP_H
#define ZARVO_TRANSFER_SMTP_H

#include "transfer/location.h"

namespace zv {

// Mails the local file to the address that the destination's path is, its slash left out. 0, -3 or
// -4.
int smtp_send_file(const char* local, const Location& destination);

}  // namespace zv

#endif
