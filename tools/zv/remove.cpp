// zv rm: a folder and everything in it, after a question.
#include <cerrno>
#include <cstdio>

#include "commands.h"
#include "folder.h"
#include "path_text.h"
#include "system.h"

namespace tool {
namespace {

// A root, or a folder named only by where one stands, has no name: a mistake more often than a
// wish.
bool has_name(const std::string& folder) {
  PathText path;
  char name[ZV_PATH_MAX] = "";
  return path.assign(folder) && zv_normalize_path(path.data()) != 0 &&
         zv_extract_filename(path.c_str(), name, sizeof name) != 0;
}

bool person_agrees(const std::string& folder) {
  Listing inside;
  if (!inside.scan(folder, nullptr, true)) return false;
  std::printf("Remove %s and the %zu entries in it? [y/N] ", folder.c_str(), inside.names().size());
  std::fflush(stdout);
  char answer[8] = "";
  return std::fgets(answer, sizeof answer, stdin) != nullptr &&
         (answer[0] == 'y' || answer[0] == 'Y');
}

}  // namespace

int remove(const RemoveOptions& options) {
  const std::string& folder = options.folder;
  if (!is_folder(folder)) return no;
  if (!has_name(folder)) {
    complain("neither a root nor . or .. is removed: " + folder);
    return no;
  }
  if (!options.agreed && !is_terminal(stdin)) {
    complain("nobody here to ask; --yes removes " + folder + " without a question");
    return no;
  }
  if (!options.agreed && !person_agrees(folder)) return no;
  errno = 0;
  if (zv_rmpath(folder.c_str()) != 0) return done;
  const int error = errno;
  const char* const why = error == 0 ? ": the path of an entry has more than 319 characters" : "";
  complain("cannot remove all of " + folder + why, error);
  return no;
}

}  // namespace tool
