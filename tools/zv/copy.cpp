// zv copy: one file from a location to another.
#include <cstdio>
#include <optional>
#include <string_view>

#include "commands.h"
#include "progress.h"
#include "terminal.h"
#include "zarvo.h"

namespace tool {
namespace {

bool begins_with(const std::string& location, std::string_view scheme) {
  return zv_strnicmp(location.c_str(), scheme.data(), scheme.size()) == 0;
}

bool is_network(const std::string& location) {
  return begins_with(location, "ftp://") || begins_with(location, "http://") ||
         begins_with(location, "smtp://");
}

// The local file that a location names, where its text is that file's path.
std::string local_path(const std::string& location) {
  return is_network(location) || begins_with(location, "file://") ? std::string() : location;
}

int64_t size_of(const std::string& path) {
  struct _stat64 status = {};
  return !path.empty() && zv_stat(path.c_str(), &status) == 0 ? status.st_size : 0;
}

// A failure of a source on the network may be one of the moment, and nothing has been sent on yet:
// the same again does no harm. A destination may have taken what it was given, a mail for one.
int copy_with_retries(const CopyOptions& options) {
  int result = zv_copy(options.from.c_str(), options.to.c_str());
  for (int i = 0;
       i < options.retries && result == ZV_COPY_SOURCE_FAILED && is_network(options.from); ++i)
    result = zv_copy(options.from.c_str(), options.to.c_str());
  return result;
}

// Why a copy between two servers cannot begin: its file rests in the temporary folder meanwhile.
bool lacks_temporary_folder(const CopyOptions& options) {
  char folder[ZV_PATH_MAX];
  return is_network(options.from) && is_network(options.to) &&
         zv_tempdir(folder, sizeof folder) == 0;
}

}  // namespace

int copy(const CopyOptions& options) {
  std::optional<Progress> progress;
  if (!options.quiet && is_terminal(stderr))
    progress.emplace(local_path(options.to), size_of(local_path(options.from)));
  const int result = copy_with_retries(options);
  progress.reset();
  if (result == 0) return done;
  if (result == ZV_COPY_SOURCE_FAILED) {
    if (lacks_temporary_folder(options))
      complain("a copy between two servers needs a temporary folder: set TMP to one");
    complain("cannot get " + options.from);
    return source_failed;
  }
  complain("cannot put " + options.to);
  return destination_failed;
}

}  // namespace tool
