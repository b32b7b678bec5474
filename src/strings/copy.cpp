// The bounded copy behind every sized output, and zero-separated sequences.
#include <cstring>

#include "zarvo.h"

size_t zv_strncpy(char* dst, const char* src, size_t size) {
  if (size == 0) return 0;
  const void* const end = std::memchr(src, '\0', size);
  const size_t length =
      end != nullptr ? static_cast<size_t>(static_cast<const char*>(end) - src) : size - 1;
  std::memcpy(dst, src, length);
  dst[length] = '\0';
  return length;
}
