// Reads the local file that a run copies or sends.
#include "transfer/run_source.h"

#include <cerrno>

#include "transfer/result.h"

namespace zv {

bool RunSource::fail(std::string_view why) {
  run_.fail(source_failed, ZV_CAUSE_LOCAL, 0, {"read ", path_, ": ", why});
  return false;
}

bool RunSource::fail_system(int error) {
  run_.fail_system(source_failed, ZV_CAUSE_LOCAL, error, {"read ", path_});
  return false;
}

bool RunSource::open(const char* path) {
  path_ = path;
  block_.reset(static_cast<char*>(std::malloc(block_size_)));
  if (block_ == nullptr) return fail_system(ENOMEM);
  file_.reset(platform::open_to_read(path));
  const bool open = file_ != nullptr && platform::look_at(file_.get(), is_);
  const int error = open ? 0 : errno;
  // Where a folder cannot be opened at all, the platform gives another reason for it.
  if (is_.is_folder || (!open && platform::lies_at(path) == platform::Kind::folder))
    return fail_system(EISDIR);
  return open || fail_system(error);
}

bool RunSource::read(std::string_view& bytes) {
  constexpr int a_while_ms = 200;
  for (;;) {
    if (!run_.may_go_on(source_failed)) return false;
    if (!is_.is_file && !platform::wait_to_read(file_.get(), a_while_ms)) continue;
    const int64_t got = platform::read_some(file_.get(), block_.get(), block_size_);
    if (got >= 0) {
      bytes = {block_.get(), static_cast<size_t>(got)};
      return true;
    }
    if (errno != EINTR) return fail_system(errno);
  }
}

}  // namespace zv
