// The program zv: it fails, too, when its results could not be written.
#include <cstdio>
#include <exception>

#include "command_line.h"
#include "commands.h"

void tool::complain(const std::string& message) {
  std::fprintf(stderr, "zv: %s\n", message.c_str());
}

int main(int argc, char** argv) {
  try {
    const int exit_code = tool::run_command_line(argc, argv);
    if (std::fflush(stdout) == 0 && std::ferror(stdout) == 0) return exit_code;
    tool::complain("the results could not be written");
  } catch (const std::exception& error) {
    tool::complain(error.what());
  }
  return tool::no;
}
