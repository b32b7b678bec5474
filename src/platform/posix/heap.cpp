// Blocks of the C heap.
#include <malloc.h>

#include "platform/platform.h"

namespace zv::platform {

size_t block_size(void* block) {
  return ::malloc_usable_size(block);
}

}  // namespace zv::platform
