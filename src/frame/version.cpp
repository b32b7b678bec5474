// The library's version, and version texts taken apart.
#include <cctype>
#include <cstdlib>
#include <cstring>

#include "frame/text_buffer.h"
#include "frame/text_view.h"
#include "zarvo.h"

namespace {

constexpr size_t release_size = sizeof "Educational";

const char* release_name(char letter) {
  switch (letter) {
    case 'a':
      return "Alpha";
    case 'b':
      return "Beta";
    case 'c':
      return "Custom";
    case 'd':
      return "Demo";
    case 'e':
      return "Educational";
    default:
      return "Release";
  }
}

// The number at the start of a field and, through `field`, what follows the field's dot.
int next_number(const char** field) {
  if (*field == nullptr) return 0;
  const int number = std::atoi(*field);
  const char* const dot = std::strchr(*field, '.');
  *field = dot != nullptr ? dot + 1 : nullptr;
  return number;
}

void store(int* out, int value) {
  if (out != nullptr) *out = value;
}

}  // namespace

const char* zarvo_version() {
  return "1.0.0b";
}

int zv_split_version(const char* version, int* major, int* minor, int* patch, char* release) {
  zv::TextBuffer<32> text;
  text.assign_cut(version);
  if (text.empty()) return 0;

  const char last = text.back();
  if (release != nullptr) zv::put(release_name(last), release, release_size);
  if (std::isalpha(static_cast<unsigned char>(last)) != 0) text.shorten(text.size() - 1);

  const char* field = text.c_str();
  store(major, next_number(&field));
  store(minor, next_number(&field));
  store(patch, next_number(&field));
  return 1;
}
