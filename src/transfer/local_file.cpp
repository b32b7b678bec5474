// Opening the local file at one end of a transfer.
#include "transfer/local_file.h"

#include "platform/platform.h"

namespace zv {

namespace {

// Whole blocks are read and written: a stream's own buffer would cut each of them in two.
bool take_unbuffered(FILE* opened, StreamPtr& file) {
  file.reset(opened);
  return opened != nullptr && std::setvbuf(opened, nullptr, _IONBF, 0) == 0;
}

}  // namespace

bool open_source(const char* path, StreamPtr& file, int64_t& size) {
  platform::OpenFile source;
  if (!take_unbuffered(platform::open_to_read(path), file) ||
      !platform::look_at(file.get(), source) || source.is_folder)
    return false;
  size = source.size;
  return true;
}

bool open_destination(const char* path, StreamPtr& file) {
  return take_unbuffered(platform::open_to_write(path), file);
}

}  // namespace zv
