// The library's own words for the system's errors: strerror() has others on each platform and in
// each locale, and may keep them where other threads write.
#include "transfer/error_words.h"

#include <cerrno>
#include <cstdio>

namespace zv {

namespace {

struct Error {
  int number;
  std::string_view words;
};

constexpr Error errors[] = {
    {EPERM, "Operation not permitted"},
    {ENOENT, "No such file or directory"},
    {EINTR, "Interrupted"},
    {EIO, "Input/output error"},
    {ENXIO, "No such device or address"},
    {EBADF, "Bad file descriptor"},
    {EAGAIN, "Resource temporarily unavailable"},
    {ENOMEM, "Out of memory"},
    {EACCES, "Permission denied"},
    {EBUSY, "Device or resource busy"},
    {EEXIST, "File exists"},
    {EXDEV, "Other file system"},
    {ENODEV, "No such device"},
    {ENOTDIR, "Not a directory"},
    {EISDIR, "Is a directory"},
    {EINVAL, "Invalid argument"},
    {ENFILE, "Too many open files in the system"},
    {EMFILE, "Too many open files"},
    {EFBIG, "File too large"},
    {ENOSPC, "No space left on device"},
    {ESPIPE, "Illegal seek"},
    {EROFS, "Read-only file system"},
    {EPIPE, "Broken pipe"},
    {ENAMETOOLONG, "File name too long"},
    {ENOSYS, "Not supported by the system"},
    {ENOTEMPTY, "Directory not empty"},
    {ELOOP, "Too many levels of symbolic links"},
    {EOVERFLOW, "Value too large"},
    {EOPNOTSUPP, "Operation not supported"},
    {EAFNOSUPPORT, "Address family not supported"},
    {EADDRNOTAVAIL, "Address not available"},
    {ENETDOWN, "Network is down"},
    {ENETUNREACH, "Network is unreachable"},
    {ECONNABORTED, "Connection aborted"},
    {ECONNRESET, "Connection reset by peer"},
    {ENOBUFS, "No buffer space available"},
    {ETIMEDOUT, "Connection timed out"},
    {ECONNREFUSED, "Connection refused"},
    {EHOSTUNREACH, "No route to host"},
#ifdef EDQUOT
    {EDQUOT, "Disk quota exceeded"},
#endif
#ifdef ESTALE
    {ESTALE, "Stale file handle"},
#endif
};

}  // namespace

ErrorWords error_words(int number) {
  ErrorWords words;
  for (const Error& error : errors)
    if (error.number == number && words.assign(error.words)) return words;
  (void)words.fill([number](char* room, size_t size) {
    return std::snprintf(room, size, "error %d", number) > 0;
  });
  return words;
}

}  // namespace zv
