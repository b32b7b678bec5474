// Files matched to plugins by their names. Entries are read where they lie and the name is
// lower-cased once, so that thousands of names meet hundreds of patterns without touching the heap.
#include <algorithm>
#include <array>
#include <cctype>
#include <cstdint>
#include <cstring>
#include <string_view>

#include "frame/text_buffer.h"
#include "zarvo.h"

namespace {

// The file name of a path in lower case.
zv::PathBuffer lower_name(const char* path) {
  zv::PathBuffer name;
  static_cast<void>(name.fill([path](char* room, size_t size) {
    zv_extract_filename(path, room, size);
    zv_strlwr(room);
    return true;
  }));
  return name;
}

// Patterns are nearly always written in lower case; the locale has a say in the rest only.
char lower(char ch) {
  const bool is_ascii = static_cast<unsigned char>(ch) < 0x80;
  if (is_ascii && (ch < 'A' || ch > 'Z')) return ch;
  return static_cast<char>(std::tolower(static_cast<unsigned char>(ch)));
}

// Takes the field in front of the next `|` off `rest`; false when no `|` is left. Patterns are too
// short for a call of strchr() to pay.
bool next_field(const char*& rest, std::string_view& field) {
  const char* end = rest;
  while (*end != '|' && *end != '\0') ++end;
  field = {rest, end};
  if (*end == '\0') return false;
  rest = end + 1;
  return true;
}

bool is_wildcard(char ch) {
  return ch == '*' || ch == '?' || ch == '[' || ch == ']' || ch == '\\';
}

// The name is in lower case already.
bool is_same(char in_pattern, char in_name) {
  return lower(in_pattern) == in_name;
}

bool matches_wildcards(const zv::PathBuffer& name, std::string_view star,
                       std::string_view pattern) {
  zv::PathBuffer text;
  if (!text.append(star)) return false;
  for (const char ch : pattern)
    if (!text.append(lower(ch))) return false;
  return zv_strpat(name.c_str(), text.c_str()) != 0;
}

// As much of a pattern as takes part, its added `*` included.
std::string_view cut(std::string_view pattern) {
  const size_t star = pattern.starts_with('.') ? 1 : 0;
  return {pattern.data(), std::min(pattern.size(), zv::PathBuffer::capacity - star)};
}

// Compares from the end, where nearly every pattern that does not match differs at once. Only what
// has more to it than a `*`, written or meant, and an ending is left to the matcher.
bool matches_pattern(const zv::PathBuffer& name, std::string_view pattern) {
  if (pattern.size() >= zv::PathBuffer::capacity) pattern = cut(pattern);
  const char* const start = name.c_str();
  const char* at = start + name.size();
  std::string_view rest = pattern;
  for (; !rest.empty() && !is_wildcard(rest.back()); rest.remove_suffix(1))
    if (at == start || !is_same(rest.back(), *--at)) return false;

  const bool is_extension = pattern.starts_with('.');
  if (rest.empty() && !is_extension) return at == start;
  // A `*` ends at whole characters only, and an ASCII character is one.
  const bool is_ascii_ending = static_cast<unsigned char>(*at) < 0x80;
  if ((rest.empty() || rest == "*") && is_ascii_ending) return true;
  return matches_wildcards(name, is_extension ? "*" : "", pattern);
}

// What nearly every pattern that does not match differs in: the name's last byte, or its first.
struct Ends {
  char first, last;

  bool may_match(std::string_view pattern) const {
    if (pattern.empty() || pattern.size() >= zv::PathBuffer::capacity) return true;
    if (!is_wildcard(pattern.back())) return is_same(pattern.back(), last);
    const char front = pattern.front();
    return is_wildcard(front) || front == '.' || is_same(front, first);
  }
};

// Sixteen bytes at once, on every processor.
using Bytes [[gnu::vector_size(16)]] = signed char;

Bytes load(const char* from) {
  Bytes bytes;
  std::memcpy(&bytes, from, sizeof bytes);
  return bytes;
}

// Where a `|` follows a byte that may be the last of a match: the name's own, or one that may stand
// for others, as digits and small letters never do.
Bytes possible_ends(const char* at, char last) {
  const Bytes before = load(at - 1);
  const Bytes is_plain = ((before >= '0') & (before <= '9')) | ((before >= 'a') & (before <= 'z'));
  return (load(at) == '|') & ((before == last) | ~is_plain);
}

// Whether any pattern of an entry ends as the name does. Most do not, and take half the time so.
bool may_match(const char* entry, char last) {
  const size_t length = std::strlen(entry);
  if (length <= sizeof(Bytes) || length > zv::PathBuffer::capacity) return true;
  Bytes ends = possible_ends(entry + length - sizeof(Bytes), last);
  for (size_t i = 1; i + sizeof(Bytes) < length; i += sizeof(Bytes))
    ends |= possible_ends(entry + i, last);
  std::array<uint64_t, 2> halves;
  std::memcpy(halves.data(), &ends, sizeof ends);
  return (halves[0] | halves[1]) != 0;
}

bool matches_entry(const zv::PathBuffer& name, const char* entry) {
  const Ends ends = {name[0], name.back()};
  if (!may_match(entry, ends.last)) return false;
  const char* const description_end = std::strchr(entry, '|');
  if (description_end == nullptr) return false;
  const char* rest = description_end + 1;
  std::string_view field;
  while (next_field(rest, field))
    if (ends.may_match(field) && matches_pattern(name, field)) return true;
  return false;
}

bool matches_record(const zv::PathBuffer& name, const zv_plugin_t* record) {
  for (char** entry = record->formats; *entry != nullptr; ++entry)
    if (matches_entry(name, *entry)) return true;
  return false;
}

}  // namespace

zv_plugin_t* zv_plugin_get_entry_by_fmt(zv_plugin_t** plugins, const char* path) {
  if (plugins == nullptr || path == nullptr || *path == '\0') return nullptr;
  const zv::PathBuffer name = lower_name(path);
  for (; *plugins != nullptr; ++plugins)
    if (matches_record(name, *plugins)) return *plugins;
  return nullptr;
}

int zv_plugin_match_fmt(zv_plugin_t* rec, const char* path) {
  return path != nullptr && *path != '\0' && matches_record(lower_name(path), rec);
}
