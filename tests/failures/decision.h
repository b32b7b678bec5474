// What each function that the linker puts in place of another asks.
#ifndef ZARVO_TESTS_DECISION_H
#define ZARVO_TESTS_DECISION_H

#include <string_view>

namespace failing {

// Whether the call fails now; errno is set then.
bool fails(std::string_view call, bool needs_memory = false);

// Whether the call is the one that this attempt is about.
bool is_tested(std::string_view call);

// Whether a call that fails now only moves fewer bytes.
bool is_shortened();

}  // namespace failing

#endif
