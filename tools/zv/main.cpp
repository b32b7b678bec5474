// The program zv: its commands, and what a wrong command line gets.
#include <cstdio>
#include <exception>

#include "command.h"
#include "zarvo.h"

namespace tool {

void complain(const std::string& message) {
  std::fprintf(stderr, "zv: %s\n", message.c_str());
}

namespace {

int run(int argc, char** argv) {
  CLI::App app("Files, paths and plugins, the same on every platform.", "zv");
  int exit_code = done;
  app.allow_windows_style_options(false);  // "/x" is a path here on every platform
  app.set_version_flag("--version", std::string("zv ") + zarvo_version());
  app.require_subcommand(1);
  for (const auto add : {add_copy, add_info}) add(app, exit_code);
  try {
    app.parse(argc, argv);
  } catch (const CLI::Success& wanted) {  // help, or the version
    return app.exit(wanted);
  } catch (const CLI::ParseError& error) {
    complain(std::string(error.what()) + "\nRun zv --help, or zv COMMAND --help, for more.");
    return wrong_usage;
  }
  return exit_code;
}

}  // namespace
}  // namespace tool

int main(int argc, char** argv) {
  try {
    const int exit_code = tool::run(argc, argv);
    if (std::fflush(stdout) == 0 && std::ferror(stdout) == 0) return exit_code;
    tool::complain("the results could not be written");
  } catch (const std::exception& error) {
    tool::complain(error.what());
  }
  return tool::no;
}
