// How a copy goes, in one line that is written over again, on a terminal only.
#include "progress.h"

#include <algorithm>
#include <cstdio>

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

std::string line(int64_t done, int64_t total, double seconds) {
  const auto moved = static_cast<double>(done);
  std::string text = bytes(moved);
  if (total > 0) {
    text += " of " + bytes(static_cast<double>(total)) + ", ";
    text += formatted("%.0f %s", 100 * moved / static_cast<double>(total), "%");
  }
  if (seconds > 0) text += ", " + bytes(moved / seconds) + "/s";
  return text + ", " + formatted("%.0f %s", seconds, "s");
}

}  // namespace

Progress::Progress(zv_transfer_t* transfer) : transfer_(transfer) {
  zv_transfer_watch(transfer, watch, this);
}

Progress::~Progress() {
  zv_transfer_watch(transfer_, nullptr, nullptr);
  if (shown_ > 0) std::fprintf(stderr, "\r%*s\r", static_cast<int>(shown_), "");
}

int Progress::watch(void* progress, int64_t done, int64_t total) {
  static_cast<Progress*>(progress)->show(done, total);
  return 0;
}

// A copy that is done at once shows nothing. A count that begins again has its own speed.
void Progress::show(int64_t done, int64_t total) {
  const Clock::time_point now = Clock::now();
  if (done < done_) begin_ = now;
  done_ = done;
  if (now < next_) return;
  next_ = now + std::chrono::milliseconds(200);
  const std::string text = line(done, total, std::chrono::duration<double>(now - begin_).count());
  std::fprintf(stderr, "\r%-*s", static_cast<int>(shown_), text.c_str());
  std::fflush(stderr);
  shown_ = std::max(shown_, text.size());
}

}  // namespace tool
