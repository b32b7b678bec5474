// What C streams leave out: 64-bit offsets, identity, opening in other ways.
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "platform/platform.h"

namespace zv::platform {

void set_binary(FILE*) {}  // every stream is

int seek(FILE* stream, int64_t offset, int origin) {
  return ::fseeko(stream, offset, origin);
}

int64_t tell(FILE* stream) {
  return ::ftello(stream);
}

FILE* open_to_read(const char* path) {
  return ::fopen(path, "rbe");
}

FILE* open_to_write(const char* path) {
  return ::fopen(path, "wbe");
}

FILE* open_unemptied(const char* path) {
  constexpr mode_t for_all = S_IRUSR | S_IWUSR | S_IRGRP | S_IWGRP | S_IROTH | S_IWOTH;
  const int descriptor = ::open(path, O_WRONLY | O_CREAT | O_CLOEXEC, for_all);
  if (descriptor < 0) return nullptr;
  FILE* const stream = ::fdopen(descriptor, "wb");
  if (stream == nullptr) ::close(descriptor);
  return stream;
}

bool empty_file(FILE* stream) {
  return ::ftruncate(::fileno(stream), 0) == 0;
}

bool look_at(FILE* stream, OpenFile& out) {
  struct stat st;
  if (::fstat(::fileno(stream), &st) != 0) return false;
  out = {.is_folder = S_ISDIR(st.st_mode),
         .has_content = S_ISREG(st.st_mode) && st.st_size != 0,
         .has_identity = true,
         .device = st.st_dev,
         .number = st.st_ino};
  return true;
}

}  // namespace zv::platform
