// See progress.h.
#include "progress.h"

#include <algorithm>
#include <cstdio>

#include "zarvo.h"

namespace tool {
namespace {

std::string formatted(const char* format, double number, const char* unit) {
  char text[64];
  std::snprintf(text, sizeof text, format, number, unit);
  return text;
}

std::string bytes(double count) {
  if (count < 1e3) return formatted("%.0f %s", count, "B");
  if (count < 1e6) return formatted("%.1f %s", count / 1e3, "kB");
  if (count < 1e9) return formatted("%.1f %s", count / 1e6, "MB");
  return formatted("%.2f %s", count / 1e9, "GB");
}

}  // namespace

Progress::Progress(std::string arriving, int64_t total)
    : arriving_(std::move(arriving)), total_(total), watcher_([this] { watch(); }) {}

Progress::~Progress() {
  {
    const std::lock_guard lock(mutex_);
    end_ = true;
  }
  ended_.notify_one();
  watcher_.join();
}

// A copy that is done at once shows nothing.
void Progress::watch() {
  using std::chrono::milliseconds;
  size_t shown = 0;
  std::unique_lock lock(mutex_);
  for (milliseconds pause(500); !ended_.wait_for(lock, pause, [this] { return end_; });
       pause = milliseconds(200)) {
    const std::string text = line();
    std::fprintf(stderr, "\r%-*s", static_cast<int>(shown), text.c_str());
    std::fflush(stderr);
    shown = std::max(shown, text.size());
  }
  if (shown > 0) std::fprintf(stderr, "\r%*s\r", static_cast<int>(shown), "");
}

std::string Progress::line() const {
  const std::chrono::duration<double> elapsed = std::chrono::steady_clock::now() - begin_;
  const std::string seconds = formatted("%.0f %s", elapsed.count(), "s");
  struct _stat64 status = {};
  if (arriving_.empty() || zv_stat(arriving_.c_str(), &status) != 0)
    return (total_ > 0 ? bytes(static_cast<double>(total_)) + " on their way, " : "") + seconds;
  const auto arrived = static_cast<double>(status.st_size);
  std::string text = bytes(arrived) + ", " + bytes(arrived / elapsed.count()) + "/s, " + seconds;
  if (total_ > 0) text += formatted(", %.0f %s", 100 * arrived / static_cast<double>(total_), "%");
  return text;
}

}  // namespace tool
