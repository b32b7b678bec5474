// The program zv: it fails, too, when its results could not be written.
#include <cstdio>
#include <exception>
#include <system_error>

#include "command_line.h"
#include "commands.h"
#include "system.h"

void tool::complain(const std::string& message, int error) {
  const std::string words = error == 0 ? "" : ": " + std::generic_category().message(error);
  std::fprintf(stderr, "zv: %s%s\n", message.c_str(), words.c_str());
}

int main(int argc, char** argv) {
  try {
    tool::prepare_console();
    const int exit_code = tool::run_command_line(argc, argv);
    if (std::fflush(stdout) == 0 && std::ferror(stdout) == 0) return exit_code;
    tool::complain("the results could not be written");
  } catch (const std::exception& error) {
    tool::complain(error.what());
  }
  return tool::no;
}
