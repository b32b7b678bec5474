// What the machine can do with arrays: compiled for its wide vectors alone.
#include "calls/byteorder_loops.h"

namespace bench {

void reverse_each(uint16_t* data, size_t count) {
  for (size_t i = 0; i < count; ++i) data[i] = __builtin_bswap16(data[i]);
}

void reverse_each(uint32_t* data, size_t count) {
  for (size_t i = 0; i < count; ++i) data[i] = __builtin_bswap32(data[i]);
}

void reverse_each(uint64_t* data, size_t count) {
  for (size_t i = 0; i < count; ++i) data[i] = __builtin_bswap64(data[i]);
}

void pass_over(uint64_t* data, size_t count) {
  for (size_t i = 0; i < count; ++i) data[i] = ~data[i];
}

}  // namespace bench
