// What the tool asks of the terminal; terminal_posix.cpp and terminal_windows.cpp answer.
#ifndef ZV_TOOL_TERMINAL_H
#define ZV_TOOL_TERMINAL_H

#include <cstdio>

namespace tool {

// Whether a person sits at this end of the program.
bool is_terminal(std::FILE* stream);

}  // namespace tool

#endif
