// The roads between a local file and a network location.
#ifndef ZARVO_TRANSFER_ROUTES_H
#define ZARVO_TRANSFER_ROUTES_H

#include "transfer/location.h"

namespace zv {

// Fetches from FTP or HTTP into the local file. 0, -3 or -4.
int download(const Location& source, const char* local);

// Sends the local file by FTP, HTTP or mail. 0, -3 or -4.
int upload(const char* local, const Location& destination);

}  // namespace zv

#endif
