// Listing a tree: every path below a folder, or those of the pictures in it, as a list.
#include <apr_file_info.h>
#include <apr_fnmatch.h>
#include <apr_strings.h>
#include <dirent.h>
#include <fnmatch.h>
#include <fts.h>
#include <ftw.h>
#include <zarvo.h>

#include <cstring>
#include <filesystem>

#include "folder.h"
#include "program.h"
#include "runner.h"

namespace bench {

namespace {

using Paths = std::vector<std::string>;

// What is looked for: "" for everything.
struct Wanted {
  const char* pattern;
  bool usual = false;  // as selections usually are: in any case, and hidden files left out
  bool matches(const char* name) const {
    return *pattern == '\0' || fnmatch(pattern, name, 0) == 0;
  }
};

size_t list_with_zarvo(const std::string& top, Wanted wanted) {
  const dirsel_t selection = {"", wanted.pattern, nullptr, !wanted.usual, !wanted.usual};
  const bool all = *wanted.pattern == '\0';
  char** list = nullptr;
  const int count =
      zv_dir_scan(top.c_str(), &list, all ? nullptr : reinterpret_cast<dir_filter_t>(zv_dir_select),
                  const_cast<dirsel_t*>(&selection), 1, 1);
  zv_strlist_free(list, count);
  return static_cast<size_t>(count);
}

size_t list_with_fts(const std::string& top, Wanted wanted) {
  Paths paths;
  char* const tops[] = {const_cast<char*>(top.c_str()), nullptr};
  FTS* const walk = fts_open(tops, FTS_PHYSICAL | FTS_NOSTAT | FTS_NOCHDIR, nullptr);
  while (const FTSENT* const entry = fts_read(walk))
    if (entry->fts_level > 0 && entry->fts_info != FTS_DP && wanted.matches(entry->fts_name))
      paths.emplace_back(entry->fts_path);
  fts_close(walk);
  return paths.size();
}

// nftw() hands its callback nothing of the caller's.
struct NftwState {
  Paths paths;
  Wanted wanted;
} nftw_state;

size_t list_with_nftw(const std::string& top, Wanted wanted) {
  nftw_state = {{}, wanted};
  const auto visit = [](const char* path, const struct stat*, int, FTW* place) {
    if (place->level > 0 && nftw_state.wanted.matches(path + place->base))
      nftw_state.paths.emplace_back(path);
    return 0;
  };
  nftw(top.c_str(), visit, 64, FTW_PHYS);
  return nftw_state.paths.size();
}

size_t list_with_filesystem(const std::string& top, Wanted wanted) {
  Paths paths;
  for (const auto& entry : std::filesystem::recursive_directory_iterator(top))
    if (*wanted.pattern == '\0' || wanted.matches(entry.path().filename().c_str()))
      paths.push_back(entry.path().native());
  return paths.size();
}

void list_with_apr(const std::string& top, Wanted wanted, Paths& paths, apr_pool_t* parent) {
  apr_pool_t* pool = nullptr;
  apr_dir_t* folder = nullptr;
  apr_finfo_t entry;
  apr_pool_create(&pool, parent);
  if (apr_dir_open(&folder, top.c_str(), pool) == APR_SUCCESS) {
    while (apr_dir_read(&entry, APR_FINFO_NAME | APR_FINFO_TYPE, folder) == APR_SUCCESS) {
      if (std::strcmp(entry.name, ".") == 0 || std::strcmp(entry.name, "..") == 0) continue;
      const std::string path = top + "/" + entry.name;
      if (*wanted.pattern == '\0' || apr_fnmatch(wanted.pattern, entry.name, 0) == APR_SUCCESS)
        paths.push_back(path);
      if (entry.filetype == APR_DIR) list_with_apr(path, wanted, paths, pool);
    }
  }
  apr_pool_destroy(pool);
}

size_t list_with_apr(const std::string& top, Wanted wanted) {
  Paths paths;
  list_with_apr(top, wanted, paths, nullptr);
  return paths.size();
}

// The program's own start is part of it.
size_t list_with_find(const std::string& top, Wanted wanted) {
  Command command = {"find", top, "-mindepth", "1"};
  if (*wanted.pattern != '\0') command.insert(command.end(), {"-name", wanted.pattern});
  std::string output;
  if (!read_program(command, output)) return 0;
  Paths paths;
  for (size_t at = 0, end = 0; (end = output.find('\n', at)) != std::string::npos; at = end + 1)
    paths.emplace_back(output, at, end - at);
  return paths.size();
}

Row scan_row(const std::string& name, const std::string& top, Wanted wanted) {
  using List = size_t (*)(const std::string&, Wanted);
  const size_t expected = list_with_fts(top, wanted);
  Row row = {.name = name, .contenders = {}};
  const std::pair<const char*, List> lists[] = {
      {"zarvo", list_with_zarvo}, {"fts", list_with_fts},
      {"nftw", list_with_nftw},   {"std::filesystem", list_with_filesystem},
      {"apr", list_with_apr},     {"find", list_with_find},
  };
  for (const auto& [who, list] : lists)
    row.contenders.push_back(
        {who, [list = list, top, wanted, expected] { return list(top, wanted) == expected; }});
  return row;
}

}  // namespace

void measure(Runner& runner) {
  const WorkFolder work;
  for (const int files : {1000, 10000, 100000}) {
    const std::string top = work.path("tree" + std::to_string(files));
    make_tree(top, runner.scaled(files));
    runner.measure(scan_row("scan/all files @" + std::to_string(files), top, {""}));
    runner.measure(scan_row("scan/`*.png` among @" + std::to_string(files), top, {"*.png"}));
    runner.measure(scan_row("scan/`*.png` in any case, none hidden @" + std::to_string(files), top,
                            {"*.png", true}));
  }
}

}  // namespace bench
