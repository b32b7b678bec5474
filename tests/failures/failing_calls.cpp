// The allocation functions that the linker puts in place of the C library's, and what decides
// whether a call fails.
#include "failures/failing_calls.h"

#include <algorithm>
#include <array>
#include <atomic>
#include <cerrno>
#include <cstdio>

#ifdef _WIN32
#include <windows.h>
#else
#include <pthread.h>
#endif

namespace failing {

namespace {

// Not a thread_local variable, which may need the memory that is to fail.
unsigned long this_thread() {
#ifdef _WIN32
  return GetCurrentThreadId();
#else
  return pthread_self();
#endif
}

// Blocks of the tested calls. The room ends a test that leaks wildly, and no other.
class Blocks {
 public:
  void add(void* block) {
    if (block != nullptr) blocks_.at(count_++) = block;
  }
  void remove(void* block) {
    void** const end = blocks_.data() + count_;
    void** const found = std::find(blocks_.data(), end, block);
    if (found != end) *found = blocks_[--count_];
  }
  void clear() { count_ = 0; }
  size_t count() const { return count_; }

 private:
  std::array<void*, 10000> blocks_;
  size_t count_ = 0;
};

std::atomic<unsigned long> attempting = 0;  // the thread that may be disturbed; 0 for none
Attempt* attempt = nullptr;                 // this and all below are that thread's
bool in_scope = false;
Fault current;
int left = 0;
std::string_view met;
Blocks blocks;

bool is_attempting() {
  return attempting == this_thread();
}

}  // namespace

Attempt::Attempt(const Fault& fault, int skipped) {
  current = fault;
  left = skipped;
  met = {};
  blocks.clear();
  attempt = this;
  attempting = this_thread();
}

Attempt::~Attempt() {
  attempting = 0;
}

std::string_view Attempt::failed() const {
  return met;
}

int Attempt::blocks_kept() const {
  return static_cast<int>(blocks.count());
}

Attempt::Scope::Scope() {
  in_scope = true;
}

Attempt::Scope::~Scope() {
  in_scope = false;
}

bool is_tested(std::string_view call) {
  return is_attempting() && in_scope && current.call == call;
}

bool fails(std::string_view call, bool needs_memory) {
  if (!is_tested(call) && !(needs_memory && is_tested(all_memory))) return false;
  if (!met.empty() || left-- > 0) return false;
  met = call;
  if (current.error == disturbed) {
    in_scope = false;
    attempt->meanwhile();
    in_scope = true;
    return false;
  }
  if (current.error != shortened) errno = current.error;
  return true;
}

bool is_shortened() {
  return current.error == shortened;
}

}  // namespace failing

extern "C" {

void* __real_malloc(size_t size);
void* __real_calloc(size_t count, size_t size);
void* __real_realloc(void* block, size_t size);
void __real_free(void* block);
FILE* __real_fopen(const char* path, const char* mode);

namespace {

void* noted(void* block) {
  if (failing::is_attempting() && failing::in_scope) failing::blocks.add(block);
  return block;
}

void forget(void* block) {
  if (failing::is_attempting()) failing::blocks.remove(block);
}

}  // namespace

void* __wrap_malloc(size_t size) {
  return failing::fails("malloc", true) ? nullptr : noted(__real_malloc(size));
}

void* __wrap_calloc(size_t count, size_t size) {
  return failing::fails("calloc", true) ? nullptr : noted(__real_calloc(count, size));
}

void* __wrap_realloc(void* block, size_t size) {
  if (failing::fails("realloc", true)) return nullptr;
  void* const moved = __real_realloc(block, size);
  if (moved == nullptr) return nullptr;
  forget(block);
  return noted(moved);
}

void __wrap_free(void* block) {
  forget(block);
  __real_free(block);
}

FILE* __wrap_fopen(const char* path, const char* mode) {
  return failing::fails("fopen", true) ? nullptr : __real_fopen(path, mode);
}
}
