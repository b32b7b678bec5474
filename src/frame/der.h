// The outermost element of DER, ITU-T X.690.
#ifndef ZARVO_FRAME_DER_H
#define ZARVO_FRAME_DER_H

#include <cstddef>

namespace zv {

// How many bytes a sequence at the beginning of `size` bytes has, its head included; 0 where there
// is none, or it does not end within them.
inline size_t sequence_size(const unsigned char* bytes, size_t size) {
  if (size < 2 || bytes[0] != 0x30) return 0;
  const size_t more = bytes[1] < 0x80 ? 0 : bytes[1] - 0x80U;  // bytes of the length
  if (bytes[1] == 0x80 || more > 3 || size < 2 + more) return 0;
  size_t length = more == 0 ? bytes[1] : 0;
  for (size_t i = 0; i < more; ++i) length = length << 8 | bytes[2 + i];
  return length <= size - 2 - more ? 2 + more + length : 0;
}

}  // namespace zv

#endif
