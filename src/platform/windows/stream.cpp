// What C streams leave out: 64-bit offsets, identity, opening in other ways.
#include <errno.h>
#include <fcntl.h>
#include <io.h>
#include <sys/stat.h>
#include <windows.h>

#include <cstdio>
#include <cstring>

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

// Wine opens a file of a path so long that no other call sees it there; Windows opens none.
bool is_within_reach(const char* path) {
  if (std::strlen(path) < MAX_PATH || GetFileAttributesA(path) != INVALID_FILE_ATTRIBUTES ||
      GetLastError() == ERROR_FILE_NOT_FOUND)
    return true;
  errno = ENAMETOOLONG;
  return false;
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
  return is_within_reach(path) ? uninherited(std::fopen(path, "wb")) : nullptr;
}

FILE* open_unemptied(const char* path) {
  if (!is_within_reach(path)) return nullptr;
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
  out = {.is_file = true,
         .size = int64_t{found.nFileSizeHigh} << 32 | found.nFileSizeLow,
         .bits = (found.dwFileAttributes & FILE_ATTRIBUTE_READONLY) != 0 ? 0444U : 0666U,
         .has_identity = true,
         .device = found.dwVolumeSerialNumber,
         .number = uint64_t{found.nFileIndexHigh} << 32 | found.nFileIndexLow};
  return true;
}

int64_t read_some(FILE* stream, char* room, size_t size) {
  return _read(_fileno(stream), room, static_cast<unsigned>(size));
}

bool wait_to_read(FILE*, int) {
  return true;
}

}  // namespace zv::platform
