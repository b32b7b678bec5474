// How a copy goes, shown to a person while it runs.
#ifndef ZV_TOOL_PROGRESS_H
#define ZV_TOOL_PROGRESS_H

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <string>
#include <thread>

namespace tool {

// Keeps one line of standard error up to date, from a thread of its own, until it goes out of
// scope. What arrives can be read off the local file; what leaves cannot.
class Progress {
 public:
  // `arriving`: the local file that the copy writes, or empty. `total`: its size in the end, 0 when
  // nobody knows.
  Progress(std::string arriving, int64_t total);
  ~Progress();
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

 private:
  void watch();
  std::string line() const;

  const std::string arriving_;
  const int64_t total_;
  const std::chrono::steady_clock::time_point begin_ = std::chrono::steady_clock::now();
  std::mutex mutex_;
  std::condition_variable ended_;
  bool end_ = false;
  std::thread watcher_;
};

}  // namespace tool

#endif
