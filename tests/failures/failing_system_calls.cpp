// The system's calls that fail. Linux alone: on Windows the library calls them through its import
// table.
#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <netdb.h>
#include <poll.h>
#include <pwd.h>
#include <sys/random.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <ctime>

#include "failures/failing_calls.h"

using failing::fails;
using failing::is_shortened;
using failing::Kind;

namespace {

// What a shortened transfer is asked for: half of it, but not nothing.
size_t half(size_t size) {
  return (size + 1) / 2;
}

// For calls that do what they are for even when they fail.
int done_but_failed(int result, int error) {
  errno = error;
  return result;
}

// A connection that was reset stays so.
int lost(int fd) {
  const int error = errno;
  if (error == ECONNRESET) shutdown(fd, SHUT_RDWR);
  return done_but_failed(-1, error);
}

FILE* broken_stream = nullptr;  // what a failing fread() leaves with its error mark

}  // namespace

extern "C" {

// A call that gives `failure` when it is to fail.
#define ZV_FAILING_CALL(kind, result, name, failure, parameters, arguments) \
  result failing_##name parameters {                                        \
    return fails(#name, kind) ? failure : name arguments;                   \
  }
#define ZV_FAILING(...) ZV_FAILING_CALL(Kind::system, __VA_ARGS__)
#define ZV_NEEDING_MEMORY(...) ZV_FAILING_CALL(Kind::system_with_memory, __VA_ARGS__)
// A call that does what it is for even when it fails.
#define ZV_FAILING_AFTER(name, failure, argument)             \
  int failing_##name(argument it) {                           \
    const bool failed = fails(#name, Kind::system);           \
    const int error = errno;                                  \
    const int result = name(it);                              \
    return failed ? done_but_failed(failure, error) : result; \
  }

ZV_FAILING(int, stat, -1, (const char* path, struct stat* st), (path, st))
ZV_FAILING(int, lstat, -1, (const char* path, struct stat* st), (path, st))
ZV_FAILING(int, fstat, -1, (int fd, struct stat* st), (fd, st))
ZV_FAILING(int, access, -1, (const char* path, int mode), (path, mode))
ZV_FAILING(int, mkdir, -1, (const char* path, mode_t mode), (path, mode))
ZV_FAILING(int, rmdir, -1, (const char* path), (path))
ZV_FAILING(int, remove, -1, (const char* path), (path))
ZV_FAILING(int, unlinkat, -1, (int fd, const char* path, int flags), (fd, path, flags))
ZV_FAILING(int, open, -1, (const char* path, int flags, mode_t mode), (path, flags, mode))
ZV_FAILING(int, openat, -1, (int fd, const char* path, int flags, mode_t mode),
           (fd, path, flags, mode))
ZV_FAILING(int, fstatat, -1, (int fd, const char* path, struct stat* st, int flags),
           (fd, path, st, flags))
ZV_FAILING(int, statx, -1, (int fd, const char* path, int flags, unsigned mask, struct statx* st),
           (fd, path, flags, mask, st))
ZV_FAILING(int, faccessat, -1, (int fd, const char* path, int mode, int flags),
           (fd, path, mode, flags))
ZV_FAILING(ssize_t, readlinkat, -1, (int fd, const char* path, char* room, size_t size),
           (fd, path, room, size))
ZV_FAILING(int, renameat, -1, (int from_fd, const char* from, int to_fd, const char* to),
           (from_fd, from, to_fd, to))
ZV_FAILING(int, fsync, -1, (int fd), (fd))
ZV_FAILING(int, fchown, -1, (int fd, uid_t user, gid_t group), (fd, user, group))
ZV_FAILING(int, fchmod, -1, (int fd, mode_t mode), (fd, mode))
ZV_FAILING(ssize_t, fgetxattr, -1, (int fd, const char* name, void* value, size_t size),
           (fd, name, value, size))
ZV_FAILING(int, fremovexattr, -1, (int fd, const char* name), (fd, name))
ZV_FAILING(ssize_t, getrandom, -1, (void* room, size_t size, unsigned flags), (room, size, flags))
ZV_FAILING(ssize_t, read, -1, (int fd, void* room, size_t size), (fd, room, size))
ZV_FAILING(int, ftruncate, -1, (int fd, off_t size), (fd, size))
ZV_FAILING(char*, getcwd, nullptr, (char* room, size_t size), (room, size))
ZV_FAILING(char*, mkdtemp, nullptr, (char* name), (name))
ZV_FAILING(struct dirent*, readdir, nullptr, (DIR * stream), (stream))
ZV_FAILING(ssize_t, getxattr, -1, (const char* path, const char* name, void* value, size_t size),
           (path, name, value, size))
ZV_FAILING(long, syscall, -1, (long number, long a, long b, long c, long d, long e, long f),
           (number, a, b, c, d, e, f))
ZV_FAILING(int, setxattr, -1,
           (const char* path, const char* name, const void* value, size_t size, int flags),
           (path, name, value, size, flags))
ZV_FAILING(int, removexattr, -1, (const char* path, const char* name), (path, name))
ZV_FAILING(void*, dlsym, nullptr, (void* library, const char* name), (library, name))
ZV_FAILING(struct tm*, localtime_r, nullptr, (const time_t* time, struct tm* out), (time, out))
ZV_FAILING(int, getpwuid_r, errno,
           (uid_t user, struct passwd* out, char* room, size_t size, struct passwd** found),
           (user, out, room, size, found))
ZV_FAILING(int, gethostname, -1, (char* room, size_t size), (room, size))
ZV_FAILING(int, socket, -1, (int domain, int type, int protocol), (domain, type, protocol))
ZV_FAILING(int, setsockopt, -1, (int fd, int level, int name, const void* value, socklen_t size),
           (fd, level, name, value, size))
ZV_FAILING(int, getsockopt, -1, (int fd, int level, int name, void* value, socklen_t* size),
           (fd, level, name, value, size))
ZV_FAILING(int, poll, -1, (struct pollfd * fds, nfds_t count, int timeout), (fds, count, timeout))
ZV_FAILING(int, fseeko, -1, (FILE * stream, off_t offset, int origin), (stream, offset, origin))
ZV_FAILING(off_t, ftello, -1, (FILE * stream), (stream))

ZV_NEEDING_MEMORY(FILE*, fdopen, nullptr, (int fd, const char* mode), (fd, mode))
ZV_NEEDING_MEMORY(DIR*, opendir, nullptr, (const char* path), (path))
ZV_NEEDING_MEMORY(DIR*, fdopendir, nullptr, (int fd), (fd))
ZV_NEEDING_MEMORY(void*, dlopen, nullptr, (const char* path, int flags), (path, flags))
ZV_NEEDING_MEMORY(int, getaddrinfo, EAI_MEMORY,
                  (const char* host, const char* service, const addrinfo* hints, addrinfo** list),
                  (host, service, hints, list))

ZV_FAILING_AFTER(close, -1, int)
ZV_FAILING_AFTER(closedir, -1, DIR*)
ZV_FAILING_AFTER(fclose, EOF, FILE*)

// A connect that a signal interrupts goes on by itself, as this one does before it is told. A wait
// for it only happens then.
int failing_connect(int fd, const struct sockaddr* address, socklen_t size) {
  const bool failed = fails("connect", Kind::system);
  if (failed && errno != EINTR) return -1;
  const int result = connect(fd, address, size);
  return failed || failing::is_tested("poll") ? done_but_failed(-1, EINTR) : result;
}

// The ways of taking a free name, each of which is only gone once the one before it failed.
int failing_renameat2(int from_fd, const char* from, int to_fd, const char* to, unsigned flags) {
  if (failing::is_tested("linkat") || failing::is_tested("renameat"))
    return done_but_failed(-1, EINVAL);
  return fails("renameat2", Kind::system) ? -1 : renameat2(from_fd, from, to_fd, to, flags);
}

int failing_linkat(int from_fd, const char* from, int to_fd, const char* to, int flags) {
  if (failing::is_tested("renameat")) return done_but_failed(-1, EPERM);
  return fails("linkat", Kind::system) ? -1 : linkat(from_fd, from, to_fd, to, flags);
}

// A call that moves bytes, or `less` of them when that is all it is to do.
#define ZV_MOVING(name, failure, less, parameters, arguments) \
  ssize_t failing_##name parameters {                         \
    const bool failed = fails(#name, Kind::system);           \
    if (failed && !is_shortened()) return failure;            \
    if (failed) size = less;                                  \
    return name arguments;                                    \
  }

ZV_MOVING(send, lost(fd), half(size), (int fd, const void* data, size_t size, int flags),
          (fd, data, size, flags))
ZV_MOVING(recv, lost(fd), 1, (int fd, void* room, size_t size, int flags), (fd, room, size, flags))
ZV_MOVING(pread, -1, half(size), (int fd, void* room, size_t size, off_t offset),
          (fd, room, size, offset))
ZV_MOVING(copy_file_range, -1, 1000,
          (int in, off_t* from, int out, off_t* to, size_t size, unsigned flags),
          (in, from, out, to, size, flags))

// Streams move half before they fail.
size_t failing_fread(void* room, size_t size, size_t count, FILE* stream) {
  const bool failed = fails("fread", Kind::system);
  broken_stream = failed ? stream : nullptr;
  return fread(room, size, failed ? count / 2 : count, stream);
}

int failing_ferror(FILE* stream) {
  return stream == broken_stream || ferror(stream) != 0;
}

size_t failing_fwrite(const void* data, size_t size, size_t count, FILE* stream) {
  const bool failed = count != 0 && fails("fwrite", Kind::system);
  return fwrite(data, size, failed ? count / 2 : count, stream);
}
}
