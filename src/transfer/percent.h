// Percent-encoding (RFC 3986 2.1).
#ifndef ZARVO_TRANSFER_PERCENT_H
#define ZARVO_TRANSFER_PERCENT_H

#include <cstddef>

namespace zv {

inline int hex_value(char ch) {
  if (ch >= '0' && ch <= '9') return ch - '0';
  if (ch >= 'a' && ch <= 'f') return ch - 'a' + 10;
  if (ch >= 'A' && ch <= 'F') return ch - 'A' + 10;
  return -1;
}

// Replaces each "%" and the two hexadecimal digits after it by the byte they give, in the first
// `size` characters of a NUL-terminated text; gives their new number. A "%" that begins no such
// escape stays.
inline size_t percent_decode(char* text, size_t size) {
  const char* const end = text + size;
  char* out = text;
  for (const char* in = text; in < end; ++in, ++out) {
    const int high = *in == '%' ? hex_value(in[1]) : -1;
    const int low = high >= 0 ? hex_value(in[2]) : -1;
    *out = low >= 0 ? static_cast<char>(high * 16 + low) : *in;
    if (low >= 0) in += 2;
  }
  *out = '\0';
  return static_cast<size_t>(out - text);
}

}  // namespace zv

#endif
