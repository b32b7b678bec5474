// Duplicates taken out of a list: the first of each stays, in its order.
//
// One pass closes the gaps. What was kept is found again through a hash index; a short list needs
// none, and one for which memory ran out is searched entry by entry, with the same result.
#include <algorithm>
#include <bit>
#include <cstdlib>
#include <cstring>
#include <string_view>
#include <utility>

#include "frame/owner.h"
#include "platform/platform.h"
#include "zarvo.h"

namespace {

using Compare = int (*)(const char*, const char*);

// The first bytes of a text, each as `byte` has it, as one number.
template <class Byte>
uint64_t word_of(std::string_view text, size_t size, Byte byte) {
  uint64_t word = 0;
  for (size_t i = 0; i < size; ++i) word |= byte(text[i]) << (8 * i);
  return word;
}

// Multiplied and folded, eight bytes at a time.
template <class Byte>
uint32_t hash_of(std::string_view text, Byte byte) {
  uint64_t hash = text.size();
  const auto add = [&hash](uint64_t word) {
    hash = (hash ^ word) * 0x9e3779b97f4a7c15;
    hash ^= hash >> 32;
  };
  for (; text.size() >= 8; text.remove_prefix(8)) add(word_of(text, 8, byte));
  add(word_of(text, text.size(), byte));
  return static_cast<uint32_t>(hash);
}

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
    for (; slots_[i].behind != 0; i = (i + 1) & mask_)
      if (slots_[i].hash == hash && compare(list[slots_[i].behind - 1], text) == 0) return true;
    slots_[i] = {hash, place + 1};
    return false;
  }

 private:
  struct Slot {
    uint32_t hash;
    int behind;  // one more than the place; 0 in a free slot
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

template <class Byte>
int remove_duplicates(char** list, int n, Compare compare, Byte byte) {
  constexpr int worth_an_index = 16;
  const int count = n < 0 ? zv_strlist_len(list) : n;
  if (count >= worth_an_index) {
    Index index(static_cast<size_t>(count));
    const auto indexed = [&](const char* text, int kept) {
      return index.seen(text, hash_of(text, byte), list, kept, compare);
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
  return remove_duplicates(list, n, std::strcmp,
                           [](char ch) -> uint64_t { return static_cast<uint8_t>(ch); });
}

int zv_strlist_iset(char** list, int n) {
  zv::platform::ByteMap room;
  const int32_t* const lower = zv::platform::lower_map(room);
  return remove_duplicates(list, n, zv_stricmp, [lower](char ch) {
    return static_cast<uint64_t>(lower[static_cast<uint8_t>(ch)]);
  });
}
