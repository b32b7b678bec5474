// zv info: the library's version, and what it knows of the user and the machine.
#include <cstdio>

#include "command.h"
#include "path_text.h"

namespace tool {
namespace {

void print_version() {
  char release[12] = "";
  zv_split_version(zarvo_version(), nullptr, nullptr, nullptr, release);
  std::printf("version  %s (%s)\n", zarvo_version(), release);
}

// One line for a query that fills a buffer and gives 0 where there is nothing to tell.
template <class Query>
void print_query(const char* label, Query query) {
  PathText text;
  const bool known = query(text.data(), text.size()) != 0;
  std::printf("%-7s  %s\n", label, known ? text.c_str() : "none");
}

}  // namespace

void add_info(CLI::App& app, int& exit_code) {
  CLI::App* const command = app.add_subcommand("info", "Print the version, user, host and folders");
  command->callback([&exit_code] {
    print_version();
    print_query("user", zv_username);
    print_query("host", zv_hostname);
    print_query("home", zv_homedir);
    print_query("temp", zv_tempdir);
    print_query("current", zv_getcwd);
    exit_code = done;
  });
}

}  // namespace tool
