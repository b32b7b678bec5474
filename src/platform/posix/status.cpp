// One path on the file system. The hidden attribute is bit 2 of the extended attribute
// user.DOSATTRIB, hex text such as "0x2": the form that file servers and Windows emulators share.
#include <dirent.h>
#include <errno.h>
#include <sys/stat.h>
#include <sys/types.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <atomic>
#include <charconv>
#include <cstdint>
#include <cstring>

#include "platform/platform.h"

namespace zv::platform {

namespace {

constexpr char attribute_name[] = "user.DOSATTRIB";
constexpr char hex_prefix[] = "0x";
constexpr unsigned hidden_bit = 2;

using AttributeText = TextBuffer<16>;

bool parse_attributes(const AttributeText& text, unsigned& bits) {
  constexpr size_t prefix = sizeof hex_prefix - 1;
  if (std::strncmp(text.c_str(), hex_prefix, prefix) != 0) return false;
  const char* const end = text.c_str() + text.size();
  const auto parsed = std::from_chars(text.c_str() + prefix, end, bits, 16);
  return parsed.ec == std::errc() && parsed.ptr == end;
}

// `foreign`: never hidden, and not to be made so. That is a value other than plain hex text, which
// belongs to somebody else's scheme, and a path where no attributes are kept.
enum class Attributes { known, foreign, unreadable };

// What `read` gives of the attribute, as getxattr() does. Without it no bit is set.
template <class Read>
Attributes parse_what(Read read, unsigned& bits) {
  bits = 0;
  AttributeText text;
  ssize_t length = -1;
  const bool was_read = text.fill([&](char* room, size_t size) {
    length = read(room, size - 1);
    if (length >= 0) room[length] = '\0';
    return length >= 0;
  });
  if (!was_read && errno == ENODATA) return Attributes::known;
  if (!was_read)
    return errno == ENOTSUP || errno == ERANGE ? Attributes::foreign : Attributes::unreadable;
  const bool whole = text.size() == static_cast<size_t>(length);
  return whole && parse_attributes(text, bits) ? Attributes::known : Attributes::foreign;
}

Attributes read_attributes(const char* path, unsigned& bits) {
  return parse_what(
      [path](char* room, size_t size) { return ::getxattr(path, attribute_name, room, size); },
      bits);
}

// Linux 6.13 reads an attribute of a name in an open folder, which spares it the way along the
// path. The C library has no function for it; its number and its argument are the same on all
// machines.
constexpr long getxattrat = 464;

struct AttributeRoom {
  alignas(8) uint64_t address;
  uint32_t size;
  uint32_t flags;
};

constinit std::atomic<bool> has_getxattrat = true;  // until the system says that it has not

ssize_t read_below(int folder, const char* name, const char* path, char* room, size_t size) {
  if (has_getxattrat.load(std::memory_order_relaxed)) {
    AttributeRoom argument = {reinterpret_cast<uintptr_t>(room), static_cast<uint32_t>(size), 0};
    const long length =
        ::syscall(getxattrat, folder, name, 0, attribute_name, &argument, sizeof argument);
    // A filter of system calls may refuse what it does not know.
    if (length >= 0 || (errno != ENOSYS && errno != EPERM)) return length;
    has_getxattrat.store(false, std::memory_order_relaxed);
  }
  return ::getxattr(path, attribute_name, room, size);
}

bool write_attributes(const char* path, unsigned bits) {
  if (bits == 0) return ::removexattr(path, attribute_name) == 0;
  AttributeText text;
  return text.fill([bits](char* room, size_t size) {
    return std::snprintf(room, size, "0x%x", bits) > 0;
  }) && ::setxattr(path, attribute_name, text.c_str(), text.size(), 0) == 0;
}

// Lets `call` work on the path in the platform's own form; -1 when that does not fit.
template <class Call>
int on_native(const char* path, Call call) {
  PathBuffer room;
  const char* const native = native_path(path, room);
  return native != nullptr ? call(native) : -1;
}

}  // namespace

const char* native_path(const char* path, PathBuffer& room) {
  struct stat st;
  if (std::strchr(path, '\\') == nullptr || ::lstat(path, &st) == 0) return path;
  if (!room.assign_cut(path)) {
    errno = ENAMETOOLONG;
    return nullptr;
  }
  room.replace('\\', '/');
  return room.c_str();
}

bool slashed_path(const char* path, PathBuffer& out) {
  PathBuffer room;
  const char* const native = native_path(path, room);
  if (native != nullptr && out.assign_cut(native)) return true;
  errno = ENAMETOOLONG;
  return false;
}

int access(const char* path, int mode) {
  return on_native(path, [mode](const char* native) { return ::access(native, mode); });
}

int status(const char* path, struct _stat64* st) {
  return on_native(path, [st](const char* native) { return ::stat(native, st); });
}

int make_directory(const char* path) {
  constexpr mode_t for_all = S_IRWXU | S_IRWXG | S_IRWXO;
  return on_native(path, [](const char* native) { return ::mkdir(native, for_all); });
}

Kind lies_at(const char* path) {
  struct stat st;
  if (status(path, &st) != 0) return Kind::none;
  return S_ISDIR(st.st_mode) ? Kind::folder : Kind::other;
}

bool is_hidden(const char* path) {
  return on_native(path, [](const char* native) -> int {
           unsigned bits = 0;
           return read_attributes(native, bits) == Attributes::known && (bits & hidden_bit) != 0;
         }) > 0;
}

Hidden entry_hidden(intptr_t search, const char* name, const char* path) {
  const int folder = ::dirfd(reinterpret_cast<DIR*>(search));
  unsigned bits = 0;
  int error = 0;
  const Attributes attributes = parse_what(
      [=, &error](char* room, size_t size) {
        const ssize_t length = read_below(folder, name, path, room, size);
        error = length < 0 ? errno : 0;
        return length;
      },
      bits);
  if (error == ENOTSUP) return Hidden::never;
  return attributes == Attributes::known && (bits & hidden_bit) != 0 ? Hidden::yes : Hidden::no;
}

bool set_hidden(const char* path, bool hidden) {
  return on_native(path, [hidden](const char* native) -> int {
           unsigned bits = 0;
           const Attributes attributes = read_attributes(native, bits);
           if (attributes != Attributes::known) return attributes == Attributes::foreign && !hidden;
           const unsigned wanted = hidden ? bits | hidden_bit : bits & ~hidden_bit;
           return wanted == bits || write_attributes(native, wanted);
         }) > 0;
}

}  // namespace zv::platform
