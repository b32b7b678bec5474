// What C streams leave out: 64-bit offsets, identity, opening in other ways.
#include <fcntl.h>
#include <io.h>
#include <sys/stat.h>
#include <windows.h>

#include <cstdio>

#include "platform/platform.h"

namespace zv::platform {

namespace {

HANDLE handle_of(FILE* stream) {
  return reinterpret_cast<HANDLE>(_get_osfhandle(_fileno(stream)));
}

FILE* uninherited(FILE* stream) {
  if (stream != nullptr) SetHandleInformation(handle_of(stream), HANDLE_FLAG_INHERIT, 0);
  return stream;
}

}  // namespace

void set_binary(FILE* stream) {
  _setmode(_fileno(stream), _O_BINARY);
}

int seek(FILE* stream, int64_t offset, int origin) {
  return _fseeki64(stream, offset, origin);
}

int64_t tell(FILE* stream) {
  return _ftelli64(stream);
}

FILE* open_to_read(const char* path) {
  return uninherited(std::fopen(path, "rb"));
}

FILE* open_to_write(const char* path) {
  return uninherited(std::fopen(path, "wb"));
}

FILE* open_unemptied(const char* path) {
  const int descriptor =
      _open(path, _O_WRONLY | _O_CREAT | _O_BINARY | _O_NOINHERIT, _S_IREAD | _S_IWRITE);
  if (descriptor < 0) return nullptr;
  FILE* const stream = _fdopen(descriptor, "wb");
  if (stream == nullptr) _close(descriptor);
  return stream;
}

bool empty_file(FILE* stream) {
  return _chsize(_fileno(stream), 0) == 0;
}

// A folder is no stream here, and a device, a pipe or a console is no file of a disk.
bool look_at(FILE* stream, OpenFile& out) {
  const HANDLE handle = handle_of(stream);
  BY_HANDLE_FILE_INFORMATION found;
  out = {};
  if (GetFileType(handle) != FILE_TYPE_DISK) return true;
  if (GetFileInformationByHandle(handle, &found) == 0) return false;
  out = {.has_content = (found.nFileSizeHigh | found.nFileSizeLow) != 0,
         .has_identity = true,
         .device = found.dwVolumeSerialNumber,
         .number = uint64_t{found.nFileIndexHigh} << 32 | found.nFileIndexLow};
  return true;
}

}  // namespace zv::platform
