// Base64 (RFC 4648), and the two login texts made with it.
#ifndef ZARVO_TRANSFER_BASE64_H
#define ZARVO_TRANSFER_BASE64_H

#include <cstddef>
#include <span>
#include <string_view>

#include "frame/owner.h"

namespace zv {

// Characters that the base64 of so many bytes has, the NUL not counted.
constexpr size_t base64_length(size_t size) {
  return (size + 2) / 3 * 4;
}

// Encodes into `out`, which has room for base64_length() characters and a NUL, or into a new heap
// text when that is nullptr. Gives the text; nullptr when memory ran out.
char* base64_encode(const unsigned char* data, size_t size, char* out);

// The lines of a mail: of 48 bytes each, the last one shorter, and each ended by CR LF. No bytes
// are one empty line. Gives the length of the text.
constexpr size_t base64_line_bytes = 48;
constexpr size_t base64_line_length = base64_length(base64_line_bytes) + 2;
size_t base64_lines(std::span<const char> bytes, char* text);

// A new heap text; nullptr when memory ran out.
HeapPtr<char> base64_text(std::string_view text);

// The value of an "Authorization: Basic" header (RFC 7617), except that without a password it is
// the base64 of the user alone. nullptr for no user or no memory.
HeapPtr<char> basic_credentials(const char* user, const char* password);

// The SASL PLAIN message (RFC 4616); without a password the user's name stands in its place.
// nullptr for no user or no memory.
HeapPtr<char> plain_credentials(const char* user, const char* password);

}  // namespace zv

#endif
