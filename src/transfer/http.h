// The HTTP/1.0 client: one connection, one request, one response.
#ifndef ZARVO_TRANSFER_HTTP_H
#define ZARVO_TRANSFER_HTTP_H

#include "transfer/location.h"

namespace zv {

// Fetches the source into the local file, which is made or emptied first. 0, -3 or -4.
int http_get(const Location& source, const char* local);

// Stores the local file at the destination. 0, -3 or -4.
int http_put(const char* local, const Location& destination);

}  // namespace zv

#endif
