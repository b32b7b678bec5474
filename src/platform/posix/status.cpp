// One path on the file system. The hidden attribute is bit 2 of the extended attribute
// user.DOSATTRIB, hex text such as "0x2": the form that file servers and Windows emulators share.
#include <errno.h>
#include <sys/stat.h>
#include <sys/types.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <charconv>
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

// A path without the attribute has no bit set.
Attributes read_attributes(const char* path, unsigned& bits) {
  bits = 0;
  AttributeText text;
  ssize_t length = -1;
  const bool read = text.fill([&](char* room, size_t size) {
    length = ::getxattr(path, attribute_name, room, size - 1);
    if (length >= 0) room[length] = '\0';
    return length >= 0;
  });
  if (!read && errno == ENODATA) return Attributes::known;
  if (!read)
    return errno == ENOTSUP || errno == ERANGE ? Attributes::foreign : Attributes::unreadable;
  const bool whole = text.size() == static_cast<size_t>(length);
  return whole && parse_attributes(text, bits) ? Attributes::known : Attributes::foreign;
}

bool write_attributes(const char* path, unsigned bits) {
  if (bits == 0) return ::removexattr(path, attribute_name) == 0;
  AttributeText text;
  return text.fill([bits](char* room, size_t size) {
    return std::snprintf(room, size, "0x%x", bits) > 0;
  }) && ::setxattr(path, attribute_name, text.c_str(), text.size(), 0) == 0;
}

}  // namespace

const char* native_path(const char* path, PathBuffer& room) {
  if (std::strchr(path, '\\') == nullptr) return path;
  if (!room.assign_cut(path)) {
    errno = ENAMETOOLONG;
    return nullptr;
  }
  room.replace('\\', '/');
  return room.c_str();
}

int access(const char* path, int mode) {
  return ::access(path, mode);
}

int status(const char* path, struct _stat64* st) {
  return ::stat(path, st);
}

int make_directory(const char* path) {
  return ::mkdir(path, S_IRWXU | S_IRWXG | S_IRWXO);
}

bool is_hidden(const char* path) {
  unsigned bits = 0;
  return read_attributes(path, bits) == Attributes::known && (bits & hidden_bit) != 0;
}

bool set_hidden(const char* path, bool hidden) {
  unsigned bits = 0;
  const Attributes attributes = read_attributes(path, bits);
  if (attributes != Attributes::known) return attributes == Attributes::foreign && !hidden;
  const unsigned wanted = hidden ? bits | hidden_bit : bits & ~hidden_bit;
  return wanted == bits || write_attributes(path, wanted);
}

}  // namespace zv::platform
