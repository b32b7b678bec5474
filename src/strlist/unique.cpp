// Duplicates taken out of a list: the first of each stays, in its order.
//
// One pass closes the gaps. What was kept is found again through a hash index; a short list needs
// none, and one for which memory ran out is searched entry by entry, with the same result.
#include <algorithm>
#include <bit>
#include <cstdlib>
#include <cstring>
#include <utility>

#include "frame/owner.h"
#include "platform/platform.h"
#include "zarvo.h"

namespace {

using Compare = int (*)(const char*, const char*);

// FNV-1a of the text's bytes, as `map` has them.
template <class Map>
size_t hash_of(const char* s, Map map) {
  uint64_t hash = 0xcbf29ce484222325;
  for (; *s != '\0'; ++s) hash = (hash ^ map(static_cast<uint8_t>(*s))) * 0x100000001b3;
  return static_cast<size_t>(hash);
}

// The texts seen so far, in an open hash table that is never more than two thirds full.
class Index {
 public:
  // Stays out of use when memory runs out.
  explicit Index(size_t texts)
      : mask_(std::bit_ceil(texts + texts / 2) - 1),
        slots_(static_cast<Slot*>(std::calloc(mask_ + 1, sizeof(Slot)))) {}

  bool usable() const { return slots_ != nullptr; }

  // Whether an equal text was seen before; if not, this one has been from now on.
  bool seen(const char* text, size_t hash, Compare compare) {
    size_t i = hash & mask_;
    for (; slots_[i].text != nullptr; i = (i + 1) & mask_)
      if (slots_[i].hash == hash && compare(slots_[i].text, text) == 0) return true;
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

// Moves every entry that `seen(entry, kept)` knows behind the others and frees it there. Gives how
// many it freed.
template <class Seen>
int keep_unseen(char** list, int count, Seen seen) {
  int kept = 0;
  for (int i = 0; i < count; ++i)
    if (!seen(list[i], kept)) std::swap(list[kept++], list[i]);
  std::for_each(list + kept, list + count, std::free);
  if (kept != count) list[kept] = nullptr;
  return count - kept;
}

template <class Map>
int remove_duplicates(char** list, int n, Compare compare, Map map) {
  constexpr int worth_an_index = 16;
  const int count = n < 0 ? zv_strlist_len(list) : n;
  if (count >= worth_an_index) {
    Index index(static_cast<size_t>(count));
    const auto indexed = [&](const char* text, int) {
      return index.seen(text, hash_of(text, map), compare);
    };
    if (index.usable()) return keep_unseen(list, count, indexed);
  }
  return keep_unseen(list, count, [&](const char* text, int kept) {
    const auto equals = [&](const char* other) { return compare(other, text) == 0; };
    return std::any_of(list, list + kept, equals);
  });
}

}  // namespace

int zv_strlist_set(char** list, int n) {
  return remove_duplicates(list, n, std::strcmp, [](uint8_t byte) { return uint64_t{byte}; });
}

int zv_strlist_iset(char** list, int n) {
  zv::platform::ByteMap room;
  const int32_t* const lower = zv::platform::lower_map(room);
  return remove_duplicates(list, n, zv_stricmp,
                           [lower](uint8_t byte) { return static_cast<uint64_t>(lower[byte]); });
}
