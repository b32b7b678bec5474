// Blocks of the C heap.
#include <malloc.h>

#include "platform/platform.h"

namespace zv::platform {

size_t block_size(void* block) {
  return block != nullptr ? ::_msize(block) : 0;
}

}  // namespace zv::platform
