// What decides whether a call fails, and the calls in place of others.
#include "failures/failing_calls.h"

#include <pthread.h>

#include <atomic>
#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <mutex>

#ifndef _WIN32
#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <netdb.h>
#include <poll.h>
#include <pwd.h>
#include <sys/random.h>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <ctime>
#endif

namespace failing {

namespace {

constexpr int by_name = 0;  // only where it is named
constexpr int memory = 1;
constexpr int system = 2;

std::mutex mutex;  // a test may call the library on many threads
std::atomic<int> blocks = 0;

bool is_tested(std::string_view call) {
  const Attempt* const attempt = Attempt::current;
  return attempt != nullptr && attempt->in_scope && attempt->call == call;
}

// Whether the call, which belongs to those groups, fails now; errno is set then.
bool fails(std::string_view call, int groups) {
  const std::lock_guard<std::mutex> lock(mutex);
  if (!is_tested(call) && !((groups & memory) != 0 && is_tested(all_memory)) &&
      !((groups & system) != 0 && is_tested(all_calls)))
    return false;
  Attempt& attempt = *Attempt::current;
  ++attempt.met;
  if (!attempt.failed.empty() || attempt.left-- > 0) return false;
  attempt.failed = call;
  if (attempt.error == disturbed) {
    attempt.in_scope = false;
    attempt.meanwhile();
    attempt.in_scope = true;
    return false;
  }
  if (attempt.error != shortened) errno = attempt.error;
  return true;
}

}  // namespace

int blocks_in_use() {
  return blocks;
}

extern "C" {

void* failing_malloc(size_t size) {
  void* const block = fails("malloc", memory) ? nullptr : malloc(size);
  blocks += block != nullptr;
  return block;
}

void* failing_calloc(size_t count, size_t size) {
  void* const block = fails("calloc", memory) ? nullptr : calloc(count, size);
  blocks += block != nullptr;
  return block;
}

void* failing_realloc(void* block, size_t size) {
  void* const moved = fails("realloc", memory) ? nullptr : realloc(block, size);
  blocks += block == nullptr && moved != nullptr;
  return moved;
}

void failing_free(void* block) {
  blocks -= block != nullptr;
  free(block);
}

// The others take and give numbers and pointers, which every processor hands on alike as words; the
// words after a call's last argument are nobody's.
using Word = intptr_t;
#define ZV_WORDS Word a, Word b, Word c, Word d, Word e, Word f, Word g
#define ZV_CALL(name) \
  reinterpret_cast<Word (*)(ZV_WORDS)>(reinterpret_cast<void*>(&::name))(a, b, c, d, e, f, g)
#define ZV_FAILING(name, groups, failure)                    \
  Word failing_##name(ZV_WORDS) {                            \
    return fails(#name, groups) ? (failure) : ZV_CALL(name); \
  }

ZV_FAILING(pthread_mutex_lock, by_name, ENOMEM)  // it can only fail when it is the first
ZV_FAILING(fopen, memory | system, 0)

// Those of the system. Linux alone: on Windows the library calls them through its import table.
#ifndef _WIN32
ZV_FAILING(fdopen, memory | system, 0)
ZV_FAILING(opendir, memory | system, 0)
ZV_FAILING(fdopendir, memory | system, 0)
ZV_FAILING(dlopen, memory | system, 0)
ZV_FAILING(getaddrinfo, memory | system, EAI_MEMORY)
ZV_FAILING(getpwuid_r, system, errno)

#define ZV_GIVING_NOTHING(X) X(dlsym) X(getcwd) X(localtime_r) X(mkdtemp) X(readdir)
// clang-format off
#define ZV_GIVING_MINUS_ONE(X) \
  X(access) X(faccessat) X(fchmod) X(fchown) X(fgetxattr) X(fremovexattr) X(fseeko) X(fstat) \
  X(fstatat) X(fsync) X(ftello) X(ftruncate) X(gethostname) X(getrandom) X(getsockopt) \
  X(getxattr) X(lstat) X(mkdir) X(open) X(openat) X(poll) X(read) X(readlinkat) X(remove) \
  X(removexattr) X(renameat) X(rmdir) X(setsockopt) X(setxattr) X(socket) X(stat) X(statx) \
  X(syscall) X(unlinkat)
// clang-format on
#define ZV_NOTHING(name) ZV_FAILING(name, system, 0)
#define ZV_MINUS_ONE(name) ZV_FAILING(name, system, -1)
ZV_GIVING_NOTHING(ZV_NOTHING)
ZV_GIVING_MINUS_ONE(ZV_MINUS_ONE)

static Word told(Word result, int error) {
  errno = error;
  return result;
}

// A call that does what it is for even when it fails.
#define ZV_FAILING_AFTER(name)                \
  Word failing_##name(ZV_WORDS) {             \
    const bool failed = fails(#name, system); \
    const int error = errno;                  \
    const Word result = ZV_CALL(name);        \
    return failed ? told(-1, error) : result; \
  }
ZV_FAILING_AFTER(close)
ZV_FAILING_AFTER(closedir)
ZV_FAILING_AFTER(fclose)

// A connect that a signal interrupts goes on by itself. A wait for it only happens then.
int failing_connect(int fd, const struct sockaddr* address, socklen_t size) {
  const bool failed = fails("connect", system);
  if (failed && errno != EINTR) return -1;
  if (!failed && !is_tested("poll")) return connect(fd, address, size);
  const int flags = fcntl(fd, F_GETFL);
  fcntl(fd, F_SETFL, flags | O_NONBLOCK);
  connect(fd, address, size);
  fcntl(fd, F_SETFL, flags);
  return static_cast<int>(told(-1, EINTR));
}

// The ways of taking a free name, each of which is only gone once the one before it failed.
Word failing_renameat2(ZV_WORDS) {
  if (is_tested("linkat") || is_tested("renameat")) return told(-1, EINVAL);
  return fails("renameat2", system) ? -1 : ZV_CALL(renameat2);
}

Word failing_linkat(ZV_WORDS) {
  if (is_tested("renameat")) return told(-1, EPERM);
  return fails("linkat", system) ? -1 : ZV_CALL(linkat);
}

// A call that moves bytes, or `less` of them when that is all it is to do. A connection that was
// reset stays so.
#define ZV_MOVING(name, size, less)                                                                \
  Word failing_##name(ZV_WORDS) {                                                                  \
    const bool failed = fails(#name, system);                                                      \
    if (failed && Attempt::current->error == ECONNRESET) shutdown(static_cast<int>(a), SHUT_RDWR); \
    if (failed && Attempt::current->error != shortened) return told(-1, Attempt::current->error);  \
    if (failed) size = less;                                                                       \
    return ZV_CALL(name);                                                                          \
  }
ZV_MOVING(send, c, (c + 1) / 2)
ZV_MOVING(recv, c, 1)
ZV_MOVING(pread, c, (c + 1) / 2)
ZV_MOVING(copy_file_range, e, 1000)

// Streams move half before they fail, and one that is read takes a write as an error of its own.
size_t failing_fread(void* room, size_t size, size_t count, FILE* stream) {
  const bool failed = fails("fread", system);
  const size_t got = fread(room, size, failed ? count / 2 : count, stream);
  if (failed) fputc('\0', stream);
  return got;
}

size_t failing_fwrite(const void* data, size_t size, size_t count, FILE* stream) {
  const bool failed = count != 0 && fails("fwrite", system);
  return fwrite(data, size, failed ? count / 2 : count, stream);
}
#endif
}

}  // namespace failing
