// What decides whether a call fails, and the calls that fail on both platforms.
#include "failures/failing_calls.h"

#include <pthread.h>

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <mutex>

namespace failing {

namespace {

std::mutex mutex;  // a test may call the library on many threads
Attempt* attempt = nullptr;
bool in_scope = false;
Fault current;
int left = 0;
int calls = 0;
std::string_view failure;
std::atomic<int> blocks = 0;

}  // namespace

Attempt::Attempt(const Fault& fault, int skipped) {
  current = fault;
  left = skipped;
  calls = 0;
  failure = {};
  attempt = this;
}

Attempt::~Attempt() {
  attempt = nullptr;
}

std::string_view Attempt::failed() const {
  return failure;
}

int Attempt::met() const {
  return calls;
}

void Attempt::begin() {
  in_scope = true;
}

void Attempt::end() {
  in_scope = false;
}

int blocks_in_use() {
  return blocks;
}

bool is_tested(std::string_view call) {
  return attempt != nullptr && in_scope && current.call == call;
}

bool fails(std::string_view call, Kind kind) {
  const std::lock_guard<std::mutex> lock(mutex);
  const bool is_memory = kind == Kind::allocation || kind == Kind::system_with_memory;
  const bool is_system = kind == Kind::system || kind == Kind::system_with_memory;
  if (!is_tested(call) && !(is_memory && is_tested(all_memory)) &&
      !(is_system && is_tested(all_calls)))
    return false;
  ++calls;
  if (!failure.empty() || left-- > 0) return false;
  failure = call;
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

using failing::fails;
using failing::Kind;

void* failing_malloc(size_t size) {
  void* const block = fails("malloc", Kind::allocation) ? nullptr : malloc(size);
  failing::blocks += block != nullptr;
  return block;
}

void* failing_calloc(size_t count, size_t size) {
  void* const block = fails("calloc", Kind::allocation) ? nullptr : calloc(count, size);
  failing::blocks += block != nullptr;
  return block;
}

void* failing_realloc(void* block, size_t size) {
  void* const moved = fails("realloc", Kind::allocation) ? nullptr : realloc(block, size);
  failing::blocks += block == nullptr && moved != nullptr;
  return moved;
}

void failing_free(void* block) {
  failing::blocks -= block != nullptr;
  free(block);
}

FILE* failing_fopen(const char* path, const char* mode) {
  return fails("fopen", Kind::system_with_memory) ? nullptr : fopen(path, mode);
}

// Only where it is named: it can only fail when it is the first.
int failing_pthread_mutex_lock(pthread_mutex_t* mutex) {
  return fails("pthread_mutex_lock", Kind::only_by_name) ? ENOMEM : pthread_mutex_lock(mutex);
}
}
