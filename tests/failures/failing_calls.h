// Calls below the library that fail when a test wants it: the linker leads them through
// failing_calls.cpp. Only the thread of the attempt is disturbed, so that servers go on beside it.
#ifndef ZARVO_TESTS_FAILING_CALLS_H
#define ZARVO_TESTS_FAILING_CALLS_H

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <string_view>

#include "fixtures/peer.h"

namespace failing {

// What happens to one call.
struct Fault {
  std::string_view call;  // its name, or all_memory
  int error;              // for errno, or one of those below
};

inline constexpr std::string_view all_memory = "memory";  // every call that needs some
inline constexpr int shortened = -1;  // the call moves half of its bytes, and that is no error
inline constexpr int disturbed =
    -2;  // Attempt::meanwhile runs before the call, which then succeeds

// One attempt at something during which one call fails: the first, or the one after `skipped`
// others.
class Attempt {
 public:
  Attempt(const Fault& fault, int skipped);
  ~Attempt();
  Attempt(const Attempt&) = delete;
  Attempt& operator=(const Attempt&) = delete;

  // Runs what is tested; all around it nothing fails.
  template <class Call>
  auto operator()(Call call) {
    const Scope scope;
    return call();
  }

  std::function<void()> meanwhile = [] {};  // what another process does

  // The call that failed; "" as long as none did.
  std::string_view failed() const;
  // Blocks that the tested calls allocated and nobody has freed since.
  int blocks_kept() const;

 private:
  struct Scope {
    Scope();
    ~Scope();
  };
};

// Runs `row(attempt)` again and again, each time with a later call failing, until none does. Each
// run must free what it allocated and close what it opened. Gives the number of failures met.
template <class Row>
int walk(const Fault& fault, Row row) {
  for (int skipped = 0;; ++skipped) {
    SCOPED_TRACE(std::string(fault.call) + " after " + std::to_string(skipped) + ", error " +
                 std::to_string(fault.error));
    const int handles = scripted::open_handles();
    Attempt attempt(fault, skipped);
    row(attempt);
    EXPECT_EQ(attempt.blocks_kept(), 0);
    EXPECT_EQ(scripted::open_handles(), handles);
    if (attempt.failed().empty() || testing::Test::HasFatalFailure()) return skipped;
  }
}

// ---- What the functions in place of others ask ----

// Whether the call fails now; errno is set then.
bool fails(std::string_view call, bool needs_memory = false);

// Whether the call is the one that this attempt is about.
bool is_tested(std::string_view call);

// Whether a call that fails now only moves fewer bytes.
bool is_shortened();

}  // namespace failing

#endif
