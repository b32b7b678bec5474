// The FTP client: one login, one passive data connection, one file.
#ifndef ZARVO_TRANSFER_FTP_H
#define ZARVO_TRANSFER_FTP_H

#include "transfer/location.h"

namespace zv {

// Retrieves the source into the local file, which is made or emptied first. 0, -3 or -4.
int ftp_download(const Location& source, const char* local);

// Stores the local file at the destination. 0, -3 or -4.
int ftp_upload(const char* local, const Location& destination);

}  // namespace zv

#endif
