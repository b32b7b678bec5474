// The lock of a table that the whole process shares.
#ifndef ZARVO_FRAME_LOCK_H
#define ZARVO_FRAME_LOCK_H

#include <pthread.h>

namespace zv {

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
