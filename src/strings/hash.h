// A hash of texts, for tables in memory. Its key is random, so that nobody can choose texts that
// meet in one place of a table.
#ifndef ZARVO_STRINGS_HASH_H
#define ZARVO_STRINGS_HASH_H

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string_view>

namespace zv {

// The key of every table of this process: odd, and always the same.
uint64_t hash_key();

// Takes in words, each by a multiplication with the key whose halves are folded: what a change of
// one word does to the hash depends on every bit of the key.
class Hash {
 public:
  // The key is odd. The size keeps texts apart that differ in zeros at the end.
  Hash(uint64_t key, size_t size) : key_(key), state_(key + size) {}

  void add(uint64_t word) {
    __extension__ using Product = unsigned __int128;
    const Product product = static_cast<Product>(state_ ^ word) * key_;
    state_ = static_cast<uint64_t>(product) ^ static_cast<uint64_t>(product >> 64);
  }

  uint64_t value() const { return state_; }

 private:
  uint64_t key_;
  uint64_t state_;
};

template <class Word>
uint64_t load_word(const char* bytes) {
  Word word;
  std::memcpy(&word, bytes, sizeof word);
  return word;
}

// A text of at most eight bytes as one number; bytes in the middle may stand in it twice.
inline uint64_t load_short(std::string_view text) {
  const char* const last = text.data() + text.size();
  if (text.size() >= 4)
    return load_word<uint32_t>(text.data()) | load_word<uint32_t>(last - 4) << 32;
  if (text.empty()) return 0;
  return load_word<uint8_t>(text.data()) | load_word<uint8_t>(text.data() + text.size() / 2) << 8 |
         load_word<uint8_t>(last - 1) << 16;
}

// The hash of a text, of whose words `fold` makes what counts of them.
template <class Fold>
uint64_t hash_of(std::string_view text, uint64_t key, Fold fold) {
  Hash hash(key, text.size());
  for (; text.size() > 8; text.remove_prefix(8)) hash.add(fold(load_word<uint64_t>(text.data())));
  hash.add(fold(load_short(text)));
  return hash.value();
}

}  // namespace zv

#endif
