// The allocation functions that the linker puts in place of the C library's.
#include "failing_allocation.h"

#include <cstddef>

namespace {

constexpr int never = -1;
constexpr int done = -2;
int before_failure = never;

bool fails() {
  if (before_failure < 0) return false;
  if (before_failure > 0) {
    --before_failure;
    return false;
  }
  before_failure = done;
  return true;
}

}  // namespace

FailingAllocation::FailingAllocation(int skipped) {
  before_failure = skipped;
}

FailingAllocation::~FailingAllocation() {
  before_failure = never;
}

bool FailingAllocation::happened() const {
  return before_failure == done;
}

extern "C" {

void* __real_malloc(size_t size);
void* __real_calloc(size_t count, size_t size);
void* __real_realloc(void* block, size_t size);

void* __wrap_malloc(size_t size) {
  return fails() ? nullptr : __real_malloc(size);
}

void* __wrap_calloc(size_t count, size_t size) {
  return fails() ? nullptr : __real_calloc(count, size);
}

void* __wrap_realloc(void* block, size_t size) {
  return fails() ? nullptr : __real_realloc(block, size);
}
}
