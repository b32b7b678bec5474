// Removing a tree of empty files.
#include <ftw.h>
#include <zarvo.h>

#include <cstdio>
#include <filesystem>

#include "folder.h"
#include "program.h"
#include "runner.h"

namespace bench {

namespace {

bool remove_with_nftw(const std::string& top) {
  const auto visit = [](const char* path, const struct stat*, int, FTW*) {
    return std::remove(path);
  };
  return nftw(top.c_str(), visit, 64, FTW_PHYS | FTW_DEPTH) == 0;
}

}  // namespace

void measure(Runner& runner) {
  const WorkFolder work;
  const std::string top = work.path("tree");
  for (const int files : {1000, 10000, 100000}) {
    Row row = {"remove/files @" + std::to_string(files),
               {{"zarvo", [top] { return zv_rmpath(top.c_str()) != 0; }},
                {"rm -rf",
                 [top] {
                   return run_program({"rm", "-rf", top});
                 }},
                {"std::filesystem", [top] { return std::filesystem::remove_all(top) > 0; }},
                {"nftw", [top] { return remove_with_nftw(top); }}}};
    row.before = [&runner, top, files] { make_tree(top, runner.scaled(files)); };
    runner.measure(row);
  }
}

}  // namespace bench
