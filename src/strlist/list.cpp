// String lists: a heap array of heap texts, closed by a NULL entry.
#include <algorithm>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <utility>

#include "platform/platform.h"
#include "strlist/list_owner.h"
#include "zarvo.h"

namespace {

int count_of(char** list, int n) {
  return n < 0 ? zv_strlist_len(list) : n;
}

// The list's array with room for so many entries and the NULL; nullptr when memory ran out.
char** resized(char** list, size_t count) {
  return static_cast<char**>(std::realloc(list, (count + 1) * sizeof(char*)));
}

// The same for a list that may grow further: an array that moves gets room to spare, and one that
// has room stays.
char** grown(char** list, int count) {
  const auto needed = static_cast<size_t>(count);
  if (zv::platform::block_size(list) >= (needed + 1) * sizeof(char*)) return list;
  return resized(list, needed + needed / 2);
}

// The end of the piece that starts here: its separator, or its NUL in a zero-separated sequence.
// nullptr when there is no further piece.
const char* piece_end(const char* piece, char separator) {
  if (separator != '\0') return std::strchr(piece, separator);
  return *piece != '\0' ? piece + std::strlen(piece) : nullptr;
}

int count_pieces(const char* text, char separator) {
  size_t count = 0;
  for (const char* end = piece_end(text, separator); end != nullptr;
       end = piece_end(end + 1, separator))
    ++count;
  return static_cast<int>(std::min<size_t>(count, INT_MAX));
}

// The first of the `n` entries, or of all when that is negative, that compares equal.
int find(char** list, int n, const char* s, int (*compare)(const char*, const char*)) {
  for (int i = 0; i != n && list[i] != nullptr; ++i)
    if (compare(list[i], s) == 0) return i;
  return -1;
}

}  // namespace

int zv_strlist(char*** out, const char* text, int sep) {
  const char separator = static_cast<char>(sep);
  if (text == nullptr) text = "";
  *out = nullptr;
  zv::ListOwner list;
  if (!list.reserve(count_pieces(text, separator))) return -1;
  for (const char* end = piece_end(text, separator); end != nullptr;
       end = piece_end(text, separator)) {
    if (!list.append({text, end})) return -1;
    text = end + 1;
  }
  const int count = list.count();
  *out = list.release();
  return count;
}

int zv_strlist_len(char** list) {
  char** end = list;
  while (*end != nullptr) ++end;
  return static_cast<int>(end - list);
}

int zv_strlist_free(char** list, int n) {
  if (list == nullptr) return 0;
  std::for_each_n(list, count_of(list, n), std::free);
  std::free(list);
  return 0;
}

int zv_strlist_insert(char*** list, int n, int pos, const char* s) {
  const int count = count_of(*list, n);
  const int at = pos < 0 ? count : pos;
  zv::HeapPtr<char> copy(static_cast<char*>(zv_dalloc(s, std::strlen(s) + 1)));
  if (copy == nullptr) return 0;
  char** const entries = grown(*list, count + 1);
  if (entries == nullptr) return 0;

  std::move_backward(entries + at, entries + count, entries + count + 1);
  entries[at] = copy.release();
  entries[count + 1] = nullptr;
  *list = entries;
  return 1;
}

char* zv_strlist_remove(char** list, int n, int pos) {
  char* const removed = list[pos];
  if (removed == nullptr) return nullptr;
  char** const last = list + count_of(list, n);
  std::move(list + pos + 1, last + 1, list + pos);
  return removed;
}

int zv_strlist_replace(char** list, int pos, const char* s) {
  char* const copy = zv_strredup(nullptr, s);
  if (copy == nullptr) return 0;
  std::free(std::exchange(list[pos], copy));
  return 1;
}

int zv_strlist_cat(char*** list, int count, char** other, int other_count) {
  const int own = count_of(*list, count);
  const int added = count_of(other, other_count);
  char** const entries = grown(*list, own + added);
  if (entries == nullptr) return -1;
  std::copy_n(other, added, entries + own);
  entries[own + added] = nullptr;
  *list = entries;
  return own + added;
}

int zv_strlist_idx(char** list, int n, const char* s) {
  return find(list, n, s, std::strcmp);
}

int zv_strlist_iidx(char** list, int n, const char* s) {
  return find(list, n, s, zv_stricmp);
}

int zv_strlist_cmp(const char** a, const char** b) {
  const int order = std::strcmp(*a, *b);
  return (order > 0) - (order < 0);
}

int zv_strlist_icmp(const char** a, const char** b) {
  return zv_stricmp(*a, *b);
}

int zv_strlist_reduce(char*** list, int n, int pos) {
  char** const entries = *list;
  const int count = count_of(entries, n);
  std::swap(entries[0], entries[pos]);
  std::for_each(entries + 1, entries + count, std::free);
  entries[1] = nullptr;
  // An array that cannot be cut to its size is as good as one that was.
  char** const cut = resized(entries, 1);
  if (cut != nullptr) *list = cut;
  return 1;
}
