// Duplicates taken out of a list: the first of each stays, in its order.
//
// One pass closes the gaps. What was kept is found again through a hash index; a short list needs
// none, and one for which memory ran out is searched entry by entry, with the same result.
#include <algorithm>
#include <bit>
#include <cctype>
#include <cstdlib>
#include <cstring>

#include "frame/owner.h"
#include "zarvo.h"

namespace {

struct Equality {
  size_t (*hash)(const char*);
  int (*compare)(const char*, const char*);
};

template <class Fold>
size_t fnv1a(const char* s, Fold fold) {
  uint64_t hash = 0xcbf29ce484222325;
  for (; *s != '\0'; ++s) hash = (hash ^ fold(static_cast<unsigned char>(*s))) * 0x100000001b3;
  return static_cast<size_t>(hash);
}

size_t hash_exact(const char* s) {
  return fnv1a(s, [](unsigned char ch) { return ch; });
}

size_t hash_without_case(const char* s) {
  return fnv1a(s, [](unsigned char ch) { return static_cast<unsigned char>(std::tolower(ch)); });
}

constexpr Equality exact{hash_exact, std::strcmp};
constexpr Equality without_case{hash_without_case, zv_stricmp};

// The texts seen so far, in an open hash table that is never more than two thirds full.
class Index {
 public:
  // Stays out of use when memory runs out.
  explicit Index(size_t texts)
      : mask_(std::bit_ceil(texts + texts / 2) - 1),
        slots_(static_cast<Slot*>(std::calloc(mask_ + 1, sizeof(Slot)))) {}

  bool usable() const { return slots_ != nullptr; }

  // Whether an equal text was seen before; if not, this one has been from now on.
  bool seen(const char* text, const Equality& equality) {
    const size_t hash = equality.hash(text);
    size_t i = hash & mask_;
    for (; slots_[i].text != nullptr; i = (i + 1) & mask_)
      if (slots_[i].hash == hash && equality.compare(slots_[i].text, text) == 0) return true;
    slots_[i] = {text, hash};
    return false;
  }

 private:
  struct Slot {
    const char* text;
    size_t hash;
  };

  size_t mask_;
  zv::HeapPtr<Slot[]> slots_;
};

// Frees every entry that `seen(entry, kept)` knows and moves the others up. Gives how many it
// freed.
template <class Seen>
int keep_unseen(char** list, int count, Seen seen) {
  int kept = 0;
  for (int i = 0; i < count; ++i) {
    if (seen(list[i], kept)) {
      std::free(list[i]);
    } else {
      list[kept++] = list[i];
    }
  }
  if (kept != count) list[kept] = nullptr;
  return count - kept;
}

int remove_duplicates(char** list, int n, const Equality& equality) {
  constexpr int worth_an_index = 16;
  const int count = n < 0 ? zv_strlist_len(list) : n;
  if (count >= worth_an_index) {
    Index index(static_cast<size_t>(count));
    const auto indexed = [&](const char* text, int) { return index.seen(text, equality); };
    if (index.usable()) return keep_unseen(list, count, indexed);
  }
  return keep_unseen(list, count, [&](const char* text, int kept) {
    return std::any_of(list, list + kept,
                       [&](const char* other) { return equality.compare(other, text) == 0; });
  });
}

}  // namespace

int zv_strlist_set(char** list, int n) {
  return remove_duplicates(list, n, exact);
}

int zv_strlist_iset(char** list, int n) {
  return remove_duplicates(list, n, without_case);
}
