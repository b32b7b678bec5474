// Calls below the library that fail when a test wants it. A copy of the static library has the
// names of those calls changed, so that it alone comes here: no test and no server is disturbed.
#ifndef ZARVO_TESTS_FAILING_CALLS_H
#define ZARVO_TESTS_FAILING_CALLS_H

#include <functional>
#include <string_view>

namespace failing {

inline constexpr std::string_view all_memory = "memory";  // every call that needs some
inline constexpr std::string_view all_calls = "system";   // every call of the system
inline constexpr int shortened = -1;  // the call moves half of its bytes, and that is no error
inline constexpr int disturbed = -2;  // `meanwhile` runs before the call, which then succeeds

// During its life one call fails: the first, or the one after `skipped` others. There is one at a
// time.
struct Attempt {
  // The call's name, or one of those above; and a number for errno, or one of those above.
  Attempt(std::string_view its_call, int its_error, int skipped)
      : call(its_call), error(its_error), left(skipped) {
    current = this;
  }
  ~Attempt() { current = nullptr; }
  Attempt(const Attempt&) = delete;
  Attempt& operator=(const Attempt&) = delete;

  // Runs what is tested: calls fail in there alone.
  template <class Call>
  auto operator()(Call tested) {
    in_scope = true;
    const auto result = tested();
    in_scope = false;
    return result;
  }

  inline static Attempt* current = nullptr;
  const std::string_view call;
  const int error;
  int left;
  bool in_scope = false;
  std::function<void()> meanwhile = [] {};  // what another process does
  std::string_view failed;                  // the call that failed; "" as long as none did
  int met = 0;                              // calls that could have failed, the failed one included
};

// Blocks that the library allocated and nobody has freed.
int blocks_in_use();

}  // namespace failing

#endif
