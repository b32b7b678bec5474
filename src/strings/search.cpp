// Search for a text within another.
//
// A place is worth a closer look where the bytes under the needle's first and last one both fit.
// That much is tested for a whole block of places at once, in vectors that the compiler maps to
// what the machine has.
#include "strings/search.h"

#include <array>
#include <bit>
#include <cstring>

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

// Lets through both forms of an ASCII letter, and every byte above ASCII: only the locale knows
// about those. Where the locale has a case of its own for ASCII, or makes ASCII of the byte, it
// lets every byte through.
class CaselessFilter {
 public:
  CaselessFilter(char ch, const int32_t* lower, bool ascii_case) {
    const int byte = byte_of(ch);
    const bool letter = (byte | 0x20) >= 'a' && (byte | 0x20) <= 'z';
    const bool any = !ascii_case || (byte >= 0x80 && lower[byte] < 0x80);
    value_ = filled(any ? 0xFF : letter ? byte | 0x20 : byte);
    ignored_ = filled(any ? 0xFF : letter ? 0x20 : 0);
  }
  Block operator()(Block bytes) const {
    return reinterpret_cast<Block>((bytes | ignored_) == value_) | bytes;
  }

 private:
  Block value_;
  Block ignored_;  // bits that do not count
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

// The same by a number that stands for as many bytes as the needle has, and moves along with them:
// the time does not depend on how much of the needle fits where.
template <class Fold, class Equals>
const char* search_rolling(std::string_view text, std::string_view needle, Fold fold,
                           Equals equals) {
  constexpr uint64_t base = 0x9e3779b97f4a7c15;
  uint64_t wanted = 0;
  uint64_t here = 0;
  uint64_t leaving = 1;
  for (size_t i = 0; i < needle.size(); ++i) {
    wanted = wanted * base + fold(needle[i]);
    here = here * base + fold(text[i]);
    leaving *= base;
  }
  const char* place = text.data();
  const char* const last = place + (text.size() - needle.size());
  for (; here != wanted || !equals(place); ++place) {
    if (place == last) return nullptr;
    here = here * base + fold(place[needle.size()]) - leaving * fold(*place);
  }
  return place;
}

// The first place in the text where `equals(place)` holds; it is asked of few other places. Bytes
// that it compared in vain are counted: a text that has too many gets the even way.
template <class MakeFilter, class Fold, class Equals>
const char* search(std::string_view text, std::string_view needle, MakeFilter filter, Fold fold,
                   Equals equals) {
  constexpr size_t group = 4 * block_size;
  constexpr size_t patience = 4096;
  const size_t length = needle.size();
  size_t in_vain = 0;
  const auto counted = [&](const char* place) {
    in_vain += length;
    return equals(place);
  };
  const auto first = filter(0);
  const auto middle = filter(length / 2);
  const auto last = filter(length - 1);
  const auto promising = [&](const char* place) {
    return first(load(place)) & middle(load(place + length / 2)) & last(load(place + length - 1));
  };
  const auto found_in = [&](const char* place) {
    const Block places = promising(place);
    return any(places) ? first_of_block(place, places, counted) : nullptr;
  };
  const char* place = text.data();
  const char* const end = place + (text.size() - length + 1);
  while (static_cast<size_t>(end - place) >= group) {
    const char* const group_end = place + group;
    const bool none = !any(promising(place) | promising(place + block_size) |
                           promising(place + 2 * block_size) | promising(place + 3 * block_size));
    if (none) place = group_end;
    for (; place != group_end; place += block_size)
      if (const char* const found = found_in(place); found != nullptr) return found;
    const auto done = static_cast<size_t>(place - text.data());
    if (in_vain > patience + 8 * done && place != end)
      return search_rolling({place, text.size() - done}, needle, fold, equals);
  }
  for (; place != end; place += block_size) {
    // The last block overlaps the one before.
    if (static_cast<size_t>(end - place) < block_size) place = end - block_size;
    if (const char* const found = found_in(place); found != nullptr) return found;
  }
  return nullptr;
}

template <class Equals>
const char* search_each(std::string_view text, size_t length, Equals equals) {
  const char* place = text.data();
  const char* const end = place + (text.size() - length + 1);
  while (place != end && !equals(place)) ++place;
  return place != end ? place : nullptr;
}

constexpr std::array<int32_t, 128> ascii_lower = [] {
  std::array<int32_t, 128> map{};
  for (int32_t byte = 0; byte < 128; ++byte)
    map[static_cast<size_t>(byte)] = byte >= 'A' && byte <= 'Z' ? byte + 0x20 : byte;
  return map;
}();

// Some locales have case of their own even for ASCII.
bool has_ascii_case(const int32_t* lower) {
  return std::memcmp(lower, ascii_lower.data(), sizeof ascii_lower) == 0;
}

}  // namespace

// Whether the places that the needle may be found at fill a block.
bool fill_a_block(std::string_view text, std::string_view needle) {
  return text.size() >= needle.size() + block_size - 1;
}

const char* find(std::string_view text, std::string_view needle) {
  if (needle.size() > text.size()) return nullptr;
  const auto equals = [needle](const char* place) {
    return *place == needle.front() && std::memcmp(place, needle.data(), needle.size()) == 0;
  };
  if (needle.size() == 1)
    return static_cast<const char*>(std::memchr(text.data(), needle.front(), text.size()));
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
  const bool ascii_case = has_ascii_case(lower);
  const auto filter = [needle, lower, ascii_case](size_t i) {
    return CaselessFilter(needle[i], lower, ascii_case);
  };
  const auto fold = [lower](char ch) { return static_cast<uint64_t>(lower[byte_of(ch)]); };
  return search(text, needle, filter, fold, equals);
}

}  // namespace zv
