// The tool's commands: each adds itself to the program and, when it is the one asked for, runs and
// leaves its exit code.
#ifndef ZV_TOOL_COMMAND_H
#define ZV_TOOL_COMMAND_H

#include <CLI/CLI.hpp>
#include <string>

namespace tool {

// As a shell user expects them; a copy tells which side failed.
enum ExitCode { done = 0, no = 1, wrong_usage = 2, source_failed = 3, destination_failed = 4 };

void add_copy(CLI::App& app, int& exit_code);
void add_info(CLI::App& app, int& exit_code);

// A message for a person, on standard error.
void complain(const std::string& message);

}  // namespace tool

#endif
