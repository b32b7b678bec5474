// What all parts of a running transfer share: its options, its limits, the watch, the progress, and
// the failure that ends it.
#ifndef ZARVO_TRANSFER_RUN_H
#define ZARVO_TRANSFER_RUN_H

#include <array>
#include <atomic>
#include <cstdint>

#include "frame/text_buffer.h"
#include "transfer/heap_text.h"
#include "transfer/line.h"
#include "transfer/trust.h"
#include "zarvo.h"

namespace zv {

struct Options {
  static constexpr int64_t unset = -1;

  int64_t silence = unset;  // ms; unset: what the protocol asks for
  int64_t time = 0;         // ms; 0: for ever
  int64_t speed = 1;        // bytes a second
  int64_t size = unset;     // unset: no limit
  bool in_place = false;
  bool keep = false;
  bool sync = false;
};

struct Watch {
  transfer_watch_t call = nullptr;
  void* context = nullptr;
};

// What other threads and signal handlers read and change while a run goes on.
struct Signals {
  std::atomic<bool> running = false;
  std::atomic<bool> cancelled = false;
  std::atomic<int64_t> done = 0;
  std::atomic<int64_t> total = -1;
};
static_assert(std::atomic<int64_t>::is_always_lock_free);  // a signal handler must not wait

using Reason = TextBuffer<1024>;

struct Failure {
  int code = 0;  // of the run: 0, -3 or -4
  int cause = ZV_CAUSE_NONE;
  int number = 0;
  Reason reason;
};

class Run {
 public:
  // Encrypted connections need `trust`.
  Run(const Options& options, Watch watch, Signals& signals, Trust* trust = nullptr);

  const Options& options() const { return options_; }
  Trust* trust() const { return trust_; }
  void use(const Options& options) { options_ = options; }  // from now on

  // Calls the watch when that is due, and looks whether the run was cancelled or is out of time:
  // false then, and ever after; the failure is charged to the side `code`. Cheap enough to be asked
  // for each block that moves; a wait asks it every 200 ms.
  [[nodiscard]] bool may_go_on(int code);

  // The payload of one file, from its first byte to its last. `total` is -1 while it is not known.
  void begin_body(int64_t total);
  void advance(int64_t bytes) { signals_.done.fetch_add(bytes, std::memory_order_relaxed); }
  void end_body();  // once all of it has moved: the watch sees the final count

  // Whether a file of so many bytes may be downloaded; the run fails otherwise.
  [[nodiscard]] bool allows(int64_t size);

  // Stores why the run fails, unless it has failed before, and gives the code of what failed first.
  // The words are joined to the reason; their control characters become '?'.
  int fail(int code, int cause, int number, Words words);

  // The same for an error of the system, errno's number: the step that met it, ": ", the error's
  // words. The cause is `cause`, or what the error means by itself: a full disk, no memory.
  int fail_system(int code, int cause, int number, Words step);

  // Adds to the reason of a run that has failed.
  void explain(Words words);

  // What a server said, for a reason; its code alone, up to the first blank, where it holds a
  // secret that was told here.
  [[nodiscard]] bool keep_secret(std::string_view secret);
  std::string_view shown(std::string_view said) const;

  bool failed() const { return failure_.code != 0; }
  const Failure& failure() const { return failure_; }

 private:
  bool call_watch(int64_t now);
  void add_to_reason(Words words);

  Options options_;
  Watch watch_;
  Signals& signals_;
  Trust* trust_;
  Failure failure_;
  std::array<HeapText, 6> secrets_;
  size_t secret_count_ = 0;
  int64_t begin_;    // of the run, on the monotonic clock
  int64_t watched_;  // when the watch was called last
};

// "30 s", "0.35 s".
using Duration = TextBuffer<32>;
Duration duration(int64_t milliseconds);

}  // namespace zv

#endif
