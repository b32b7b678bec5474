// What C streams leave out: 64-bit offsets, identity, opening without emptying.
#include <fcntl.h>
#include <io.h>
#include <stdio.h>
#include <sys/stat.h>
#include <windows.h>

#include "platform/platform.h"

namespace zv::platform {

namespace {

HANDLE handle_of(FILE* stream) {
  return reinterpret_cast<HANDLE>(_get_osfhandle(_fileno(stream)));
}

// A device, a pipe or a console has no identity, and is no file of a disk.
bool is_on_disk(FILE* stream) {
  return GetFileType(handle_of(stream)) == FILE_TYPE_DISK;
}

bool identity(FILE* stream, BY_HANDLE_FILE_INFORMATION& out) {
  return GetFileInformationByHandle(handle_of(stream), &out) != 0;
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

FILE* open_unemptied(const char* path) {
  const int descriptor =
      _open(path, _O_WRONLY | _O_CREAT | _O_BINARY | _O_NOINHERIT, _S_IREAD | _S_IWRITE);
  if (descriptor < 0) return nullptr;
  FILE* const stream = _fdopen(descriptor, "wb");
  if (stream == nullptr) _close(descriptor);
  return stream;
}

bool different_files(FILE* a, FILE* b) {
  if (!is_on_disk(a) || !is_on_disk(b)) return true;
  BY_HANDLE_FILE_INFORMATION first;
  BY_HANDLE_FILE_INFORMATION second;
  return identity(a, first) && identity(b, second) &&
         (first.dwVolumeSerialNumber != second.dwVolumeSerialNumber ||
          first.nFileIndexHigh != second.nFileIndexHigh ||
          first.nFileIndexLow != second.nFileIndexLow);
}

bool empty_file(FILE* stream) {
  const int descriptor = _fileno(stream);
  struct _stat64 st;
  if (_fstat64(descriptor, &st) != 0) return false;
  return (st.st_mode & _S_IFMT) != _S_IFREG || _chsize(descriptor, 0) == 0;
}

}  // namespace zv::platform
