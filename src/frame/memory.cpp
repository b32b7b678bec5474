// The heap as callers see it: a size of 0 is never passed on, and a failed resize keeps the block.
#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "zarvo.h"

namespace {

// Every successful call yields a real block that can be freed.
size_t at_least_one(size_t size) {
  return std::max<size_t>(size, 1);
}

}  // namespace

void* zv_malloc(size_t size) {
  return std::malloc(at_least_one(size));
}

void* zv_calloc(size_t size) {
  return std::calloc(at_least_one(size), 1);
}

void* zv_realloc(void* block, size_t size, int* ok) {
  void* const moved = std::realloc(block, at_least_one(size));
  *ok = moved != nullptr;
  return moved != nullptr ? moved : block;
}

int zv_free(void* block) {
  std::free(block);
  return 0;
}

void* zv_dalloc(const void* src, size_t size) {
  void* const copy = zv_malloc(size);
  if (copy != nullptr && src != nullptr) std::memcpy(copy, src, at_least_one(size));
  return copy;
}
