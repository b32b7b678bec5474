// What the tool asks of the system; system_posix.cpp and system_windows.cpp answer.
#ifndef ZV_TOOL_SYSTEM_H
#define ZV_TOOL_SYSTEM_H

#include <cstdio>
#include <functional>
#include <string>

namespace tool {

// Whether a person sits at this end of the program.
bool is_terminal(std::FILE* stream);

// Lets a console show the texts of the program as they are meant, until it ends.
void prepare_console();

// What `speak` writes to standard error, where nothing of it appears.
std::string messages_of(const std::function<void()>& speak);

// Why the last library could not be loaded, in the loader's words; asked once, they are gone.
std::string loader_words();

}  // namespace tool

#endif
