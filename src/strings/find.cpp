// Search for a text within another.
//
// A place is worth a closer look where the bytes under the needle's first, middle and last one fit.
// That much is tested for a whole block of places at once, in vectors that the compiler maps to
// what the machine has: many times as fast as std::search, which goes place by place (bench).
#include "strings/find.h"

#include <bit>
#include <cstring>
#include <iterator>

#include "frame/byte_map.h"
#include "strings/two_way.h"

namespace zv {

namespace {

using Block = uint8_t __attribute__((vector_size(16)));
using Words = uint64_t __attribute__((vector_size(16)));

constexpr size_t block_size = sizeof(Block);

uint8_t byte_of(char ch) {
  return static_cast<uint8_t>(ch);
}

Block filled(int byte) {
  return Block{} + static_cast<uint8_t>(byte);
}

Block load(const char* text) {
  Block bytes;
  std::memcpy(&bytes, text, sizeof bytes);
  return bytes;
}

// Both filters set the highest bit of each byte that may equal a given one.
class ExactFilter {
 public:
  explicit ExactFilter(char ch) : value_(filled(byte_of(ch))) {}
  Block operator()(Block bytes) const { return reinterpret_cast<Block>(bytes == value_); }

 private:
  Block value_;
};

// How far the case of a locale differs from that of ASCII.
enum class Case { ascii, beyond_ascii, own };

Case case_of(const int32_t* lower) {
  if (agrees(lower, ascii_lower)) return Case::ascii;
  return agrees(lower, ascii_lower, 128) ? Case::beyond_ascii : Case::own;
}

// Lets through both forms of an ASCII letter. Where the locale has case beyond ASCII, lets through
// every byte there too, and every byte at all where that may be equal to one of ASCII.
class CaselessFilter {
 public:
  CaselessFilter(char ch, const int32_t* lower, Case kind) {
    const int byte = byte_of(ch);
    const bool letter = is_ascii_letter(ch);
    const bool any = kind == Case::own || (byte >= 0x80 && lower[byte] < 0x80);
    value_ = filled(any ? 0xFF : letter ? byte | 0x20 : byte);
    ignored_ = filled(any ? 0xFF : letter ? 0x20 : 0);
    unknown_ = filled(kind == Case::ascii ? 0 : 0x80);
  }
  Block operator()(Block bytes) const {
    return reinterpret_cast<Block>((bytes | ignored_) == value_) | (bytes & unknown_);
  }

 private:
  Block value_;
  Block ignored_;  // bits that do not count
  Block unknown_;  // bits of which one is enough
};

// The first of eight places where `equals(place)` holds, of those whose highest bit is set.
template <class Equals>
const char* first_of_word(const char* places, uint64_t word, Equals equals) {
  if constexpr (std::endian::native == std::endian::big) word = __builtin_bswap64(word);
  for (; word != 0; word &= word - 1) {
    const char* const place = places + std::countr_zero(word) / 8;
    if (equals(place)) return place;
  }
  return nullptr;
}

Words highest_bits(Block places) {
  return reinterpret_cast<Words>(places) & 0x8080808080808080;
}

bool any(Block places) {
  const Words words = highest_bits(places);
  return (words[0] | words[1]) != 0;
}

// The same of a block.
template <class Equals>
const char* first_of_block(const char* block, Block places, Equals equals) {
  const Words words = highest_bits(places);
  const char* const found = first_of_word(block, words[0], equals);
  return found != nullptr ? found : first_of_word(block + 8, words[1], equals);
}

// The first place in the text where `equals(place)` holds, which is asked only of `promising` ones.
// Bytes that it compared in vain are counted: a text that has too many goes on `evenly`, in linear
// time.
template <class Promising, class Equals, class Evenly>
const char* search_blocks(std::string_view text, size_t length, Promising promising, Equals equals,
                          Evenly evenly) {
  constexpr size_t group = 4 * block_size;
  constexpr size_t patience = 4096;
  size_t in_vain = 0;
  const auto counted = [&](const char* place) {
    in_vain += length;
    return equals(place);
  };
  const auto found_in = [&](const char* place, Block places) {
    return any(places) ? first_of_block(place, places, counted) : nullptr;
  };
  const char* place = text.data();
  const char* const end = place + (text.size() - length + 1);
  while (static_cast<size_t>(end - place) >= group) {
    const Block places[] = {promising(place), promising(place + block_size),
                            promising(place + 2 * block_size), promising(place + 3 * block_size)};
    if (any(places[0] | places[1] | places[2] | places[3]))
      for (size_t i = 0; i < std::size(places); ++i)
        if (const char* const found = found_in(place + i * block_size, places[i]); found != nullptr)
          return found;
    place += group;
    const auto done = static_cast<size_t>(place - text.data());
    if (in_vain > patience + 8 * done && place != end) return evenly({place, text.size() - done});
  }
  for (; place != end; place += block_size) {
    // The last block overlaps the one before.
    if (static_cast<size_t>(end - place) < block_size) place = end - block_size;
    if (const char* const found = found_in(place, promising(place)); found != nullptr) return found;
  }
  return nullptr;
}

// Promising is a place where `filter(i)`, the filter of the needle's byte i, fits at the first,
// middle and last byte.
template <class MakeFilter, class Fold, class Equals>
const char* search(std::string_view text, std::string_view needle, MakeFilter filter, Fold fold,
                   Equals equals) {
  const size_t length = needle.size();
  const auto evenly = [=](std::string_view rest) { return find_two_way(rest, needle, fold); };
  const auto first = filter(0);
  const auto middle = filter(length / 2);
  const auto last = filter(length - 1);
  const auto promising = [=](const char* place) {
    return first(load(place)) & middle(load(place + length / 2)) & last(load(place + length - 1));
  };
  return search_blocks(text, length, promising, equals, evenly);
}

template <class Equals>
const char* search_each(std::string_view text, size_t length, Equals equals) {
  const char* place = text.data();
  const char* const end = place + (text.size() - length + 1);
  while (place != end && !equals(place)) ++place;
  return place != end ? place : nullptr;
}

// Whether the places that the needle may be found at fill a block.
bool fill_a_block(std::string_view text, std::string_view needle) {
  return text.size() >= needle.size() + block_size - 1;
}

}  // namespace

const char* find_letter(std::string_view text, char letter) {
  constexpr uint8_t case_bit = 0x20;
  const uint8_t lower = byte_of(letter) | case_bit;
  const char* place = text.data();
  const char* const end = place + text.size();
  for (; static_cast<size_t>(end - place) >= block_size; place += block_size) {
    const auto fits = reinterpret_cast<Block>((load(place) | case_bit) == filled(lower));
    if (any(fits)) return first_of_block(place, fits, [](const char*) { return true; });
  }
  while (place != end && (byte_of(*place) | case_bit) != lower) ++place;
  return place != end ? place : nullptr;
}

const char* find_longer(std::string_view text, std::string_view needle) {
  if (needle.size() > text.size()) return nullptr;
  const auto equals = [needle](const char* place) {
    return *place == needle.front() && std::memcmp(place, needle.data(), needle.size()) == 0;
  };
  if (!fill_a_block(text, needle)) return search_each(text, needle.size(), equals);
  const auto filter = [needle](size_t i) { return ExactFilter(needle[i]); };
  return search(text, needle, filter, byte_of, equals);
}

const char* find_without_case(std::string_view text, std::string_view needle,
                              const int32_t* lower) {
  if (needle.size() > text.size()) return nullptr;
  const int32_t first = lower[byte_of(needle.front())];
  const auto equals = [=](const char* place) {
    if (lower[byte_of(*place)] != first) return false;
    for (size_t i = 1; i < needle.size(); ++i)
      if (lower[byte_of(place[i])] != lower[byte_of(needle[i])]) return false;
    return true;
  };
  if (!fill_a_block(text, needle)) return search_each(text, needle.size(), equals);
  const Case kind = case_of(lower);
  const auto filter = [=](size_t i) { return CaselessFilter(needle[i], lower, kind); };
  const auto fold = [lower](char ch) { return static_cast<uint64_t>(lower[byte_of(ch)]); };
  return search(text, needle, filter, fold, equals);
}

}  // namespace zv
