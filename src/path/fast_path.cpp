// The fast path of normalisation, for what nearly every path is: components are copied one by one,
// each with a separator in front of it unless it is the first, and a ".." takes the one before it
// back. What it buys is most of the time; a test holds it to the full way.
#include "path/normalize.h"

#include <array>
#include <cstdint>
#include <string_view>

#include "frame/text_view.h"
#include "path/form.h"
#include "platform/platform.h"

namespace zv {

namespace {

enum Kind : uint8_t { ordinary, dot, sign, separator, nul };

// Looked up, because every character is asked. A component that begins with a sign may stand for
// something else, or be read as a drive.
constexpr std::array<Kind, 256> kinds = [] {
  std::array<Kind, 256> map{};
  map['.'] = dot;
  map['~'] = map['%'] = map['$'] = map[':'] = sign;
  map['/'] = map['\\'] = separator;
  map['\0'] = nul;
  return map;
}();

Kind kind_of(char ch) {
  return kinds[static_cast<unsigned char>(ch)];
}

bool is_separator(char ch) {
  return kind_of(ch) == separator;
}

bool is_end(char ch) {
  return kind_of(ch) >= separator;
}

// Writes the root, which takes as much room as it does in the text. False where the full way is
// needed.
bool write_root(const PathBuffer& text, char* out, size_t& size) {
  if (is_dos(text.view())) {
    size = 3;
    out[0] = text[0];
    out[1] = ':';
    out[2] = '/';
    return is_separator(text[2]) && !is_separator(text[0]) && kind_of(text[0]) != sign;
  }
  size = is_separator(text[0]) ? 1 : 0;
  out[0] = '/';
  return size == 0 || (!is_separator(text[1]) && platform::current_drive() == 0);
}

// Takes back the component that a ".." after it cancels; false where the ".." stays.
bool take_back(char* start, char*& end) {
  char* last = end;
  while (last != start && last[-1] != '/') --last;
  const std::string_view name(last, static_cast<size_t>(end - last));
  if (name == ".") end = start;  // it stands in front of all, and the ".." in its place
  if (name.empty() || name == "." || name == "..") return false;
  end = last == start ? start : last - 1;
  return true;
}

// The size of a component of dots that is gone with this; 0 where it stays, or is a name.
size_t take_dots(const char* component, bool has_front, char* start, char*& end) {
  if (is_end(component[1])) return has_front ? 1 : 0;
  const bool is_dots = component[1] == '.' && is_end(component[2]);
  return is_dots && take_back(start, end) ? 2 : 0;
}

bool begins_with_dots(const char* start, const char* end) {
  const std::string_view path(start, static_cast<size_t>(end - start));
  return path == ".." || has_front(path, "../");
}

}  // namespace

bool normalize_fast(const PathBuffer& text, char* out) {
  size_t root = 0;
  if (!write_root(text, out, root)) return false;
  const char* const first = text.c_str() + root;
  char* const start = out + root;
  char* end = start;
  for (const char* from = first; *from != '\0';) {
    const Kind kind = kind_of(*from);
    if (kind == sign) return false;
    if (kind == separator) {
      ++from;
      continue;
    }
    if (kind == dot) {
      const size_t size = take_dots(from, root != 0 || from != first, start, end);
      from += size;
      if (size != 0) continue;
    }
    if (end != start) *end++ = '/';
    for (; !is_end(*from); ++from) *end++ = *from;
  }
  if (root != 0 && begins_with_dots(start, end)) return false;
  if (end - out == 2 && out[1] == ':') *end++ = '/';  // alone, it reads as a drive
  *end = '\0';
  return true;
}

}  // namespace zv
