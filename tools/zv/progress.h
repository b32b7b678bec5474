// How a copy goes, shown to a person while it runs.
#ifndef ZV_TOOL_PROGRESS_H
#define ZV_TOOL_PROGRESS_H

#include <chrono>
#include <cstdint>
#include <string>

#include "zarvo.h"

namespace tool {

// Keeps one line of standard error up to date until it goes out of scope.
class Progress {
 public:
  explicit Progress(zv_transfer_t* transfer);
  ~Progress();
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

 private:
  using Clock = std::chrono::steady_clock;

  static int watch(void* progress, int64_t done, int64_t total);
  void show(int64_t done, int64_t total);

  zv_transfer_t* const transfer_;
  Clock::time_point begin_ = Clock::now();
  Clock::time_point next_ = begin_ + std::chrono::milliseconds(500);
  int64_t done_ = 0;
  size_t shown_ = 0;
};

}  // namespace tool

#endif
