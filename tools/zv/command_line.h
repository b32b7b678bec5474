// The command line of the tool.
#ifndef ZV_TOOL_COMMAND_LINE_H
#define ZV_TOOL_COMMAND_LINE_H

namespace tool {

// Reads it, runs the command that it asks for and gives the exit code.
int run_command_line(int argc, char** argv);

}  // namespace tool

#endif
