// The local file that a run copies or sends.
#ifndef ZARVO_TRANSFER_RUN_SOURCE_H
#define ZARVO_TRANSFER_RUN_SOURCE_H

#include <string_view>

#include "frame/owner.h"
#include "platform/platform.h"
#include "transfer/run.h"

namespace zv {

// False, of any function, says that the run has failed.
class RunSource {
 public:
  static constexpr int64_t unknown = -1;

  RunSource(Run& run, size_t block_size) : run_(run), block_size_(block_size) {}

  // A folder is refused. The path outlives this.
  [[nodiscard]] bool open(const char* path);

  const platform::OpenFile& is() const { return is_; }
  int64_t size() const { return is_.is_file ? is_.size : unknown; }
  FILE* file() const { return file_.get(); }  // for what the system reads by itself

  // The next bytes, at most a block; "" at the end. They are valid until the next are read. What
  // comes from a pipe or a device is waited for, and given as it comes.
  [[nodiscard]] bool read(std::string_view& bytes);

  bool fail(std::string_view why);

 private:
  bool fail_system(int error);

  Run& run_;
  size_t block_size_;
  const char* path_ = "";
  StreamPtr file_;
  platform::OpenFile is_;
  HeapPtr<char[]> block_;
};

}  // namespace zv

#endif
