// The HTTP/1.0 client: one connection, one request, one response.
#ifndef ZARVO_TRANSFER_HTTP_H
#define ZARVO_TRANSFER_HTTP_H

#include "platform/platform.h"

namespace zv {

// Fetches `remote` into the local file, which is made or emptied first. 0, -3 or -4.
int http_get(const platform::Address& addr, unsigned port, const char* user, const char* password,
             const char* remote, const char* local);

// Stores the local file at `remote`. 0, -3 or -4.
int http_put(const platform::Address& addr, unsigned port, const char* user, const char* password,
             const char* local, const char* remote);

}  // namespace zv

#endif
