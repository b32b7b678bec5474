// Texts of 8-bit bytes and of 16-bit units, one for one.
#include "zarvo.h"

size_t zv_strtowcs(uint16_t* dst, const char* src) {
  size_t length = 0;
  for (; src[length] != '\0'; ++length)
    // A byte is widened as a signed value: that is the contract.
    // NOLINTNEXTLINE(bugprone-signed-char-misuse,cert-str34-c)
    dst[length] = static_cast<uint16_t>(static_cast<signed char>(src[length]));
  dst[length] = 0;
  return length;
}

size_t zv_wcstostr(char* dst, const uint16_t* src) {
  size_t length = 0;
  for (; src[length] != 0; ++length) dst[length] = static_cast<char>(src[length] & 0xFF);
  dst[length] = '\0';
  return length;
}
