// zv info: the library's version, and what it knows of the user and the machine.
#include <cstdio>
#include <optional>

#include "commands.h"
#include "json.h"
#include "path_text.h"

namespace tool {
namespace {

struct Row {
  const char* label;
  std::optional<std::string> text;
};

// What a query finds that fills a buffer, and gives 0 where there is nothing to tell.
template <class Query>
std::optional<std::string> found_by(Query query) {
  PathText text;
  if (query(text.data(), PathText::size()) == 0) return std::nullopt;
  return text.c_str();
}

std::string release() {
  char name[12] = "";
  zv_split_version(zarvo_version(), nullptr, nullptr, nullptr, name);
  return name;
}

}  // namespace

int info(const InfoOptions& options) {
  const Row rows[] = {
      {"version", zarvo_version()},     {"release", release()},
      {"user", found_by(zv_username)},  {"host", found_by(zv_hostname)},
      {"home", found_by(zv_homedir)},   {"temp", found_by(zv_tempdir)},
      {"current", found_by(zv_getcwd)},
  };
  std::vector<std::pair<const char*, std::string>> members;
  for (const Row& row : rows) {
    if (options.json)
      members.emplace_back(row.label, row.text ? json_string(*row.text) : "null");
    else
      std::printf("%-7s  %s\n", row.label, row.text.value_or("none").c_str());
  }
  if (options.json) std::puts(json_object(members).c_str());
  return done;
}

}  // namespace tool
