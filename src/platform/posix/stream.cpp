// What C streams leave out: 64-bit offsets, identity, opening in other ways.
#include <errno.h>
#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

#include "platform/platform.h"
#include "platform/posix/open_file.h"

namespace zv::platform {

namespace {

FILE* open_native(const char* path, const char* mode) {
  PathBuffer room;
  const char* const native = native_path(path, room);
  return native != nullptr ? ::fopen(native, mode) : nullptr;
}

}  // namespace

void set_binary(FILE*) {}  // every stream is

int seek(FILE* stream, int64_t offset, int origin) {
  return ::fseeko(stream, offset, origin);
}

int64_t tell(FILE* stream) {
  return ::ftello(stream);
}

FILE* open_to_read(const char* path) {
  return open_native(path, "rbe");
}

FILE* open_to_write(const char* path) {
  return open_native(path, "wbe");
}

FILE* open_unemptied(const char* path) {
  constexpr mode_t for_all = S_IRUSR | S_IWUSR | S_IRGRP | S_IWGRP | S_IROTH | S_IWOTH;
  PathBuffer room;
  const char* const native = native_path(path, room);
  if (native == nullptr) return nullptr;
  const int descriptor = ::open(native, O_WRONLY | O_CREAT | O_CLOEXEC, for_all);
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
  out = open_file(st);
  return true;
}

int64_t read_some(FILE* stream, char* room, size_t size) {
  return ::read(::fileno(stream), room, size);
}

bool wait_to_read(FILE* stream, int milliseconds) {
  pollfd wait = {::fileno(stream), POLLIN, 0};
  const int ready = ::poll(&wait, 1, milliseconds);
  return ready > 0 || (ready < 0 && errno != EINTR);
}

}  // namespace zv::platform
