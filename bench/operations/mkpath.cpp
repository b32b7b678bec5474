// Making a path of many folders, and finding that it is there already.
#include <apr_file_io.h>
#include <glib.h>
#include <zarvo.h>

#include <filesystem>

#include "folder.h"
#include "runner.h"

namespace bench {

namespace {

bool make_with_apr(const std::string& path) {
  apr_pool_t* pool = nullptr;
  apr_pool_create(&pool, nullptr);
  const bool made = apr_dir_make_recursive(path.c_str(), APR_FPROT_OS_DEFAULT, pool) == APR_SUCCESS;
  apr_pool_destroy(pool);
  return made;
}

using Make = bool (*)(const std::string&);

Row make_row(const std::string& name, const std::vector<std::string>& paths) {
  const std::pair<const char*, Make> makers[] = {
      {"zarvo", [](const std::string& path) { return zv_mkpath(path.c_str()) != 0; }},
      {"std::filesystem",
       [](const std::string& path) {
         std::error_code error;
         std::filesystem::create_directories(path, error);
         return !error;
       }},
      {"glib",
       [](const std::string& path) { return g_mkdir_with_parents(path.c_str(), 0777) == 0; }},
      {"apr", make_with_apr},
  };
  Row row = {name, {}};
  for (const auto& [who, make] : makers)
    row.contenders.push_back({who, [make = make, paths] {
                                for (const std::string& path : paths)
                                  if (!make(path)) return false;
                                return true;
                              }});
  row.calls = static_cast<int>(paths.size());
  return row;
}

}  // namespace

void measure(Runner& runner) {
  constexpr int folders = 20;
  const WorkFolder work;
  std::string deep;
  for (int i = 0; i < folders; ++i) deep += "/folder" + std::to_string(i);

  std::vector<std::string> paths;
  for (int i = 0; i < runner.scaled(200); ++i)
    paths.push_back(work.path("new/" + std::to_string(i)) + deep);
  Row made = make_row("mkpath/20 new folders", paths);
  made.before = [&work] { make_empty(work.path("new")); };
  runner.measure(made);

  const std::string existing = work.path("there") + deep;
  std::filesystem::create_directories(existing);
  runner.measure(
      make_row("mkpath/20 existing folders",
               std::vector<std::string>(static_cast<size_t>(runner.scaled(10000)), existing)));
}

}  // namespace bench
