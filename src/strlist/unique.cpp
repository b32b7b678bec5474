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
#include "strings/hash.h"
#include "zarvo.h"

namespace {

using Compare = int (*)(const char*, const char*);

// Where the texts kept so far lie in the list, in an open hash table that is never more than two
// thirds full.
class Index {
 public:
  // Stays out of use when memory runs out.
  explicit Index(size_t texts)
      : mask_(std::bit_ceil(texts + texts / 2) - 1),
        slots_(static_cast<Slot*>(std::calloc(mask_ + 1, sizeof(Slot)))) {}

  bool usable() const { return slots_ != nullptr; }

  // Whether an equal text was seen before; if not, this one has been from now on, and will be kept
  // at `place`.
  bool seen(const char* text, uint32_t hash, char** list, int place, Compare compare) {
    size_t i = hash & mask_;
    for (; slots_[i].next != 0; i = (i + 1) & mask_)
      if (slots_[i].hash == hash && compare(list[slots_[i].next - 1], text) == 0) return true;
    slots_[i] = {hash, place + 1};
    return false;
  }

 private:
  struct Slot {
    uint32_t hash;
    int next;  // the place after the text's; 0 in a free slot
  };

  size_t mask_;
  zv::HeapPtr<Slot[]> slots_;
};

// Moves every entry that `seen(entry, kept)` knows after the others and frees it there. Gives how
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

template <class Fold>
int remove_duplicates(char** list, int n, Compare compare, Fold fold) {
  constexpr int worth_an_index = 16;
  const int count = n < 0 ? zv_strlist_len(list) : n;
  if (count >= worth_an_index) {
    Index index(static_cast<size_t>(count));
    const uint64_t key = zv::hash_key();
    const auto indexed = [&](const char* text, int kept) {
      const auto hash = static_cast<uint32_t>(zv::hash_of(text, key, fold));
      return index.seen(text, hash, list, kept, compare);
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
  return remove_duplicates(list, n, std::strcmp, [](uint64_t word) { return word; });
}

int zv_strlist_iset(char** list, int n) {
  zv::ByteMap room;
  const int32_t* const lower = zv::platform::lower_map(room);
  return remove_duplicates(list, n, zv_stricmp, [lower](uint64_t word) {
    uint64_t folded = 0;
    for (unsigned shift = 0; shift < 64; shift += 8)
      folded |= static_cast<uint64_t>(lower[word >> shift & 0xFF]) << shift;
    return folded;
  });
}
