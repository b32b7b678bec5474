// Calls below the library that fail when a test wants it. A copy of the static library has the
// names of those calls changed, so that it alone comes here: no test and no server is disturbed.
#ifndef ZARVO_TESTS_FAILING_CALLS_H
#define ZARVO_TESTS_FAILING_CALLS_H

#include <functional>
#include <string_view>

namespace failing {

// What happens to one call.
struct Fault {
  std::string_view call;  // its name, or one of those below
  int error;              // for errno, or one of those below
};

inline constexpr std::string_view all_memory = "memory";  // every call that needs some
inline constexpr std::string_view all_calls = "system";   // every call of the system
inline constexpr int shortened = -1;  // the call moves half of its bytes, and that is no error
inline constexpr int disturbed =
    -2;  // Attempt::meanwhile runs before the call, which then succeeds

// During its life one call fails: the first, or the one after `skipped` others. There is one at a
// time.
class Attempt {
 public:
  Attempt(const Fault& fault, int skipped);
  ~Attempt();
  Attempt(const Attempt&) = delete;
  Attempt& operator=(const Attempt&) = delete;

  // Runs what is tested with nothing failing but in there.
  template <class Call>
  auto operator()(Call call) {
    const Scope scope;
    return call();
  }

  // From here on calls may fail, and from there on not.
  static void begin();
  static void end();

  std::function<void()> meanwhile = [] {};  // what another process does

  std::string_view failed() const;  // the call that failed; "" as long as none did
  int met() const;                  // calls that could have failed, the failed one included

 private:
  struct Scope {
    Scope() { begin(); }
    ~Scope() { end(); }
  };
};

// Blocks that the library allocated and nobody has freed.
int blocks_in_use();

// ---- What the functions in place of others ask ----

enum class Kind { allocation, system_with_memory, system, only_by_name };

// Whether the call fails now; errno is set then.
bool fails(std::string_view call, Kind kind);

// Whether the call is the one that this attempt is about.
bool is_tested(std::string_view call);

// Whether a call that fails now only moves fewer bytes.
bool is_shortened();

}  // namespace failing

#endif
