// What the machine and the C library can do. The system knows the processor, and keeps what it
// knows where every process can read it.
#include <windows.h>

#include "platform/platform.h"

namespace zv::platform {

bool has_wide_vectors() {
  constexpr DWORD avx2_instructions = 40;  // PF_AVX2_INSTRUCTIONS_AVAILABLE
  return IsProcessorFeaturePresent(avx2_instructions) != 0;
}

bool has_fast_search() {
  return false;
}

}  // namespace zv::platform
