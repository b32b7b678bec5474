// The body of a transfer: the bytes of one file, moved between a socket and a stream.
#ifndef ZARVO_TRANSFER_BODY_H
#define ZARVO_TRANSFER_BODY_H

#include <cstdint>
#include <cstdio>
#include <span>

#include "platform/platform.h"

namespace zv {

// Receives until exactly `count` bytes are there, of which the block has the first ones already,
// and writes them: 0; -3 when a receive fails, or the peer closes too early or sends too much; -4
// when a write fails. When no more bytes are wanted, the peer must close.
int recv_to_file(platform::Socket socket, FILE* file, std::span<char> block, int64_t count,
                 size_t have = 0);

// Sends the file's next `count` bytes: 0; -3 when the file ends or fails before; -4 when a send
// fails.
int send_from_file(platform::Socket socket, FILE* file, std::span<char> block, int64_t count);

// Sends them as base64 lines of 64 characters, the last one shorter, each ended by CR LF; no
// bytes are one empty line. Results as of send_from_file(). The block has room for a line and its
// 48 bytes at least, which is 114.
int send_base64_file(platform::Socket socket, FILE* file, std::span<char> block, int64_t count);

}  // namespace zv

#endif
