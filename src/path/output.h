// Results handed to a caller's sized output.
#ifndef ZARVO_PATH_OUTPUT_H
#define ZARVO_PATH_OUTPUT_H

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <string_view>

namespace zv {

// Writes as zv_strncpy() does, and tells whether anything was written. The text may lie in `out`.
inline bool put(std::string_view text, char* out, size_t size) {
  if (size == 0) return false;
  const size_t kept = std::min(text.size(), size - 1);
  if (kept != 0) std::memmove(out, text.data(), kept);
  out[kept] = '\0';
  return kept != 0;
}

}  // namespace zv

#endif
