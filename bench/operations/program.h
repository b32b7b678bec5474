// Other programs, run without a shell.
#ifndef ZARVO_BENCH_PROGRAM_H
#define ZARVO_BENCH_PROGRAM_H

#include <string>
#include <vector>

namespace bench {

using Command = std::vector<std::string>;

// Runs a program to its end; false when it fails.
bool run_program(const Command& command);

// The same, with what it prints in `output`.
bool read_program(const Command& command, std::string& output);

}  // namespace bench

#endif
