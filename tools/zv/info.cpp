// zv info: the library's version, and what it knows of the user and the machine.
#include <cstdio>

#include "commands.h"
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
  const bool known = query(text.data(), PathText::size()) != 0;
  std::printf("%-7s  %s\n", label, known ? text.c_str() : "none");
}

}  // namespace

int info(const InfoOptions& /*options*/) {
  print_version();
  print_query("user", zv_username);
  print_query("host", zv_hostname);
  print_query("home", zv_homedir);
  print_query("temp", zv_tempdir);
  print_query("current", zv_getcwd);
  return done;
}

}  // namespace tool
