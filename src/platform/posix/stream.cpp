// What C streams leave out: 64-bit offsets, identity, opening without emptying.
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

FILE* open_unemptied(const char* path) {
  constexpr mode_t for_all = S_IRUSR | S_IWUSR | S_IRGRP | S_IWGRP | S_IROTH | S_IWOTH;
  const int descriptor = ::open(path, O_WRONLY | O_CREAT | O_CLOEXEC, for_all);
  if (descriptor < 0) return nullptr;
  FILE* const stream = ::fdopen(descriptor, "wb");
  if (stream == nullptr) ::close(descriptor);
  return stream;
}

bool different_files(FILE* a, FILE* b) {
  struct stat first;
  struct stat second;
  return ::fstat(::fileno(a), &first) == 0 && ::fstat(::fileno(b), &second) == 0 &&
         (first.st_dev != second.st_dev || first.st_ino != second.st_ino);
}

bool empty_file(FILE* stream) {
  struct stat st;
  if (::fstat(::fileno(stream), &st) != 0) return false;
  // Some file systems write a file out at its close once it was truncated, even from no bytes.
  if (!S_ISREG(st.st_mode) || st.st_size == 0) return true;
  return ::ftruncate(::fileno(stream), 0) == 0;
}

}  // namespace zv::platform
