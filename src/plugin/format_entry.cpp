// Format entries by themselves: collected, joined, their default pattern.
#include <cstdlib>
#include <cstring>

#include "strlist/list_owner.h"

namespace {

constexpr char separator = '|';
constexpr const char* default_description = "All recognized formats";

// After the entry's description and its `|`; nullptr when there is none.
const char* patterns(const char* entry) {
  const char* const end = std::strchr(entry, separator);
  return end != nullptr ? end + 1 : nullptr;
}

// The room that the composite of the entries needs; 0 when one of them has no patterns.
size_t composite_size(char** entries, int count, const char* description) {
  size_t size = std::strlen(description) + sizeof "|";
  for (int i = 0; i < count; ++i) {
    const char* const from = patterns(entries[i]);
    if (from == nullptr) return 0;
    size += std::strlen(from);
  }
  return size;
}

// Writes at `end` and returns the new end.
char* put(char* end, const char* text) {
  const size_t length = std::strlen(text);
  std::memcpy(end, text, length + 1);
  return end + length;
}

// Takes out the patterns that occurred before, ignoring case; false when memory runs out.
bool drop_repeated(char* text) {
  char** list = nullptr;
  if (zv_strlist(&list, text, separator) < 0) return false;
  zv_strlist_iset(list + 1, -1);
  const zv::ListOwner fields(list);
  char* end = text;
  for (const char* const field : fields) {
    end = put(end, field);
    *end++ = separator;
  }
  *end = '\0';
  return true;
}

}  // namespace

int zv_plugin_formats(zv_plugin_t** plugins, char*** list) {
  if (*list == nullptr && zv_strlist(list, nullptr, 0) < 0) return 0;
  if (plugins == nullptr) return 0;
  int n = zv_strlist_len(*list);
  int count = 0;
  for (; *plugins != nullptr; ++plugins)
    for (char** entry = (*plugins)->formats; *entry != nullptr; ++entry, ++count)
      n += zv_strlist_insert(list, n, n, *entry);
  return count;
}

int zv_fmt_composite(char*** list, int count, const char* description) {
  if (list == nullptr || *list == nullptr || **list == nullptr) return 0;
  if (description == nullptr || *description == '\0') description = default_description;
  const int all = zv_strlist_len(*list);
  if (count < 0 || count > all) count = all;
  const size_t size = composite_size(*list, count, description);
  if (size == 0) return 0;

  const zv::HeapPtr<char> text(static_cast<char*>(std::malloc(size)));
  if (text == nullptr) return 0;
  char* end = put(text.get(), description);
  end = put(end, "|");
  for (int i = 0; i < count; ++i) end = put(end, patterns((*list)[i]));
  return drop_repeated(text.get()) ? zv_strlist_insert(list, -1, -1, text.get()) : 0;
}

size_t zv_fmt_default(const char* entry, const char** pattern) {
  const char* const from = patterns(entry);
  if (from == nullptr) return 0;
  *pattern = from;
  return std::strcspn(from, "|");
}

char* zv_fmt_force(const char* entry, char* name) {
  const char* const extension = zv_dot(name);
  if (*extension != '\0')
    if (char* const known = zv_stristr(entry, extension)) return known;
  const char* pattern = nullptr;
  const size_t length = zv_fmt_default(entry, &pattern);
  if (length == 0) return nullptr;
  char* const end = name + std::strlen(name);
  std::memcpy(end, pattern, length);
  end[length] = '\0';
  return name;
}
