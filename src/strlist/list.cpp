// String lists: a heap array of heap texts, closed by a NULL entry.
#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <utility>

#include "frame/null_ended.h"
#include "strlist/list_owner.h"
#include "zarvo.h"

namespace {

int count_of(char** list, int n) {
  return n < 0 ? zv_strlist_len(list) : n;
}

// The end of the piece that starts here: its separator, or its NUL in a zero-separated sequence.
// nullptr when there is no further piece.
const char* piece_end(const char* piece, char separator) {
  if (separator != '\0') return std::strchr(piece, separator);
  return *piece != '\0' ? piece + std::strlen(piece) : nullptr;
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
  for (const char* end = piece_end(text, separator); end != nullptr;
       end = piece_end(text, separator)) {
    if (!list.append({text, end})) return -1;
    text = end + 1;
  }
  const int count = list.count();
  *out = list.release();
  return *out != nullptr ? count : -1;
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
  if (!zv::grow_array(*list, static_cast<size_t>(count) + 1)) return 0;

  char** const entries = *list;
  std::move_backward(entries + at, entries + count, entries + count + 1);
  entries[at] = copy.release();
  entries[count + 1] = nullptr;
  return 1;
}

char* zv_strlist_remove(char** list, int n, int pos) {
  char** const end = list + count_of(list, n);
  char** const entry = list + pos;
  if (entry >= end || *entry == nullptr) return nullptr;
  char* const removed = *entry;
  *std::move(entry + 1, end, entry) = nullptr;
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
  if (!zv::grow_array(*list, static_cast<size_t>(own) + static_cast<size_t>(added))) return -1;
  *std::copy_n(other, added, *list + own) = nullptr;
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
  static_cast<void>(zv::resize_array(*list, 1));
  return 1;
}
