// The FTP client: one login, one passive data connection, one file.
#ifndef ZARVO_TRANSFER_FTP_H
#define ZARVO_TRANSFER_FTP_H

#include "platform/platform.h"

namespace zv {

// Retrieves `remote` into the local file, which is made or emptied first. 0, -3 or -4.
int ftp_download(const platform::Address& addr, unsigned port, const char* user,
                 const char* password, const char* remote, const char* local);

// Stores the local file at `remote`. 0, -3 or -4.
int ftp_upload(const platform::Address& addr, unsigned port, const char* user, const char* password,
               const char* local, const char* remote);

}  // namespace zv

#endif
