// Owners: each releases its resource when it goes out of scope.
#ifndef ZARVO_FRAME_OWNER_H
#define ZARVO_FRAME_OWNER_H

#include <pthread.h>

#include <cstdio>
#include <cstdlib>
#include <memory>

namespace zv {

struct FreeBlock {
  void operator()(void* block) const { std::free(block); }
};

// A block of the C heap: HeapPtr<char> a text, HeapPtr<char[]> a buffer.
template <class T>
using HeapPtr = std::unique_ptr<T, FreeBlock>;

struct CloseStream {
  void operator()(FILE* stream) const { std::fclose(stream); }
};

using StreamPtr = std::unique_ptr<FILE, CloseStream>;

// Closes a stream that was written to: only a close that succeeds makes the writes count.
inline bool close_stream(StreamPtr& stream) {
  return std::fclose(stream.release()) == 0;
}

// Holds a mutex for a scope. A platform may need memory to lock one for the first time: when it
// runs out, nobody has ever held the mutex, and what it guards is as it was at the start.
class LockGuard {
 public:
  explicit LockGuard(pthread_mutex_t& mutex)
      : mutex_(mutex), held_(pthread_mutex_lock(&mutex) == 0) {}
  ~LockGuard() {
    if (held_) pthread_mutex_unlock(&mutex_);
  }
  LockGuard(const LockGuard&) = delete;
  LockGuard& operator=(const LockGuard&) = delete;

  bool held() const { return held_; }

 private:
  pthread_mutex_t& mutex_;
  bool held_;
};

}  // namespace zv

#endif
