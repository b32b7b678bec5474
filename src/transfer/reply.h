// The readers of what a server answers.
#ifndef ZARVO_TRANSFER_REPLY_H
#define ZARVO_TRANSFER_REPLY_H

#include <cstdint>
#include <span>

#include "platform/platform.h"

namespace zv {

// Reads a numbered reply of FTP or SMTP up to its last line, which is left at the start of the room
// as a NUL-terminated text, its CR included. Gives that line's number; 0 when the connection ended
// or failed, or the line does not begin with a number. Of what one receive brings only the last
// line counts.
int read_reply(platform::Socket socket, std::span<char> room);

// What is known of an HTTP response once its header is read.
struct HttpHeader {
  int status = 0;              // 0: unreadable
  int64_t content_length = 0;  // 0: none announced
  int64_t body_bytes = 0;      // of the body, received along with the header
};

// Reads a response header, which must arrive whole in one receive. The bytes of the body that came
// with it are left at the start of the room.
HttpHeader read_http_header(platform::Socket socket, std::span<char> room);

// Reads the address and port of an FTP 227 reply: "(h1,h2,h3,h4,p1,p2". False leaves both as they
// were.
bool parse_pasv(const char* reply, platform::Address& address, unsigned& port);

}  // namespace zv

#endif
