// What the strings do below the header: the search in blocks against its definition, the hash.
#include "strings/find.h"

#include <gtest/gtest.h>

#include <array>
#include <memory>
#include <random>
#include <set>
#include <string>

#include "strings/hash.h"

namespace {

using Map = std::array<int32_t, 256>;

Map map_with(std::initializer_list<std::pair<int, int>> changes) {
  Map map;
  for (int byte = 0; byte < 256; ++byte) map[static_cast<size_t>(byte)] = byte;
  for (int byte = 'A'; byte <= 'Z'; ++byte) map[static_cast<size_t>(byte)] = byte + 0x20;
  for (const auto& [from, to] : changes) map[static_cast<size_t>(from)] = to;
  return map;
}

// Case as different locales have it: none above ASCII, some there, and ASCII letters of their own.
const Map maps[] = {
    map_with({}),
    map_with({{0xC9, 0xE9}, {0xC0, 0xE0}}),
    map_with({{'I', 0xFD}, {0xDD, 'i'}}),
    map_with({{0xDD, 'i'}}),
    map_with({{'@', '`'}, {'[', 'a'}}),
};

TEST(Search, AgreesWithItsDefinition) {
  std::mt19937 random(11);
  const auto text_of = [&random](size_t length) {
    constexpr char bytes[] = "aAbBiI[{@`\xC9\xE9\xDD\xFD";
    // Few different bytes make near misses.
    const size_t kinds = 2 + random() % (sizeof bytes - 2);
    std::string made;
    while (made.size() < length) made += bytes[random() % kinds];
    return made;
  };
  int found = 0;
  constexpr int cases = 40000;
  for (int i = 0; i < cases; ++i) {
    // Some needles nearly fit nearly everywhere, which the search notices only after a while.
    const bool hostile = i % 400 == 0;
    const std::string edge = text_of(random() % 40);
    const std::string needle = hostile ? std::string(40, 'a') + edge + std::string(60, 'a')
                                       : text_of(1 + random() % (i % 3 == 0 ? 30 : 5));
    std::string text = text_of(random() % (i % 2 == 0 ? 40 : 200));
    if (hostile)
      text += std::string(3000 + random() % 99, 'a') + needle.substr(i % 800 == 0 ? 1 : 0) + text;
    const Map& lower = maps[random() % std::size(maps)];
    const auto folded = [&](std::string s) {
      for (char& ch : s) ch = static_cast<char>(lower[static_cast<unsigned char>(ch)]);
      return s;
    };
    // Exactly its bytes, so that a sanitizer sees a step beyond them.
    const std::unique_ptr<char[]> bytes(new char[text.size()]);
    text.copy(bytes.get(), text.size());
    const std::string_view view(bytes.get(), text.size());
    const auto position = [&](const char* place) {
      return place != nullptr ? static_cast<size_t>(place - bytes.get()) : std::string::npos;
    };
    const size_t expected = folded(text).find(folded(needle));
    ASSERT_EQ(position(zv::find_letter(view, "aB"[i % 2])),
              text.find_first_of(i % 2 ? "bB" : "aA"));
    ASSERT_EQ(position(zv::find(view, needle)), text.find(needle)) << text << " " << needle;
    ASSERT_EQ(position(zv::find_without_case(view, needle, lower.data())), expected)
        << text << " " << needle;
    found += expected != std::string::npos ? 1 : 0;
  }
  EXPECT_GT(found, cases / 10);
  EXPECT_LT(found, cases * 9 / 10);
}

// Where only the start of a hash depends on its key, flipped bits of one word undo those of another
// whatever the key is.
TEST(Hash, TextsOfOneHashCannotBeChosen) {
  constexpr uint64_t flips[] = {1ULL << 63, 1ULL << 63 | 1ULL << 31};
  std::set<uint64_t> hashes;
  for (unsigned chosen = 0; chosen < 1024; ++chosen) {
    uint64_t words[20] = {};
    for (unsigned i = 0; i < 20; ++i) words[i] = (chosen >> i / 2 & 1) * flips[i % 2];
    const std::string_view text(reinterpret_cast<const char*>(words), sizeof words);
    hashes.insert(zv::hash_of(text, zv::hash_key(), [](uint64_t word) { return word; }));
  }
  EXPECT_EQ(hashes.size(), 1024u);
  EXPECT_EQ(zv::hash_key(), zv::hash_key());
}

}  // namespace
