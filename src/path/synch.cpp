// The letter case of one file name given to another.
#include <cctype>
#include <cstring>
#include <string_view>

#include "zarvo.h"

namespace {

enum class Style { none, upper, lower, capitalised };

// Where the name of a path and its extension lie; the dot is the end where there is no extension.
struct Parts {
  explicit Parts(const char* path)
      : name(path + (std::string_view(path).rfind('/') + 1)),  // npos + 1 is 0: the whole of it
        dot(zv_dot(path)),
        end(dot + std::strlen(dot)) {}

  bool has_extension() const { return dot != end; }

  const char* name;
  const char* dot;
  const char* end;
};

int upper(char ch) {
  return std::toupper(static_cast<unsigned char>(ch));
}

int lower(char ch) {
  return std::tolower(static_cast<unsigned char>(ch));
}

// The style that a part's first two characters show. The second may be the dot or NUL after it.
Style style_of(const char* part) {
  const auto first = static_cast<unsigned char>(part[0]);
  const auto second = static_cast<unsigned char>(part[1]);
  if (std::isupper(first) != 0 && std::isupper(second) != 0) return Style::upper;
  if (std::islower(first) != 0 && std::islower(second) != 0) return Style::lower;
  if (std::isupper(first) != 0 && std::islower(second) != 0) return Style::capitalised;
  return Style::none;
}

// Tells whether a character changed.
bool apply(Style style, char* first, const char* end) {
  if (style == Style::none) return false;
  bool changed = false;
  for (char* p = first; p != end; ++p) {
    const bool up = style == Style::upper || (style == Style::capitalised && p == first);
    const char ch = static_cast<char>(up ? upper(*p) : lower(*p));
    changed |= ch != *p;
    *p = ch;
  }
  return changed;
}

}  // namespace

int zv_strsynch(char* s, const char* model) {
  const Parts own(s);
  const Parts shown(model);
  const bool both_extended = own.has_extension() && shown.has_extension();
  // Without an extension in the model, the whole file name follows the model's name.
  const char* const name_end = shown.has_extension() ? own.dot : own.end;

  bool changed = false;
  if (shown.name != shown.dot) changed |= apply(style_of(shown.name), s + (own.name - s), name_end);
  if (both_extended) changed |= apply(style_of(shown.dot + 1), s + (own.dot + 1 - s), own.end);
  return changed ? 1 : 0;
}
