// Wildcard patterns: a table, and the matcher against its definition written out.
#include <gtest/gtest.h>

#include <random>
#include <sstream>
#include <string>
#include <vector>

#include "wildcard_definition.h"
#include "zarvo.h"

namespace {

using Texts = std::vector<std::string>;

TEST(Wildcard, Table) {
  const struct {
    const char* pattern;
    Texts matching, others;
  } cases[] = {
      {"", {""}, {"a"}},
      {"*", {"", "any"}, {}},
      {"**", {"", "any"}, {}},
      {"a*", {"a", "abx"}, {"", "ba"}},
      {"*b*", {"abx"}, {"ax"}},
      {"a?x", {"abx"}, {"ax"}},
      {"a**x", {"abx", "ax"}, {"a"}},
      {"?", {"\xC3\xA9", "\xE9"}, {"", "\xFE\x80"}},
      {"??", {"ab"}, {"\xC3\xA9"}},
      {"*.txt", {"file.txt", ".txt"}, {"file.TXT", "txt"}},
      {"ab*b", {"abb"}, {"ab"}},  // the end may not be used twice
      {"a*bd", {"abxbd"}, {}},
      {"[a-d]", {"b"}, {"e"}},
      {"[^a-d]", {"e"}, {"b"}},
      {"[]]", {"]"}, {}},
      {"[^]a]", {"b"}, {"a", "]"}},
      {"[a-]", {"-"}, {"b"}},
      {"[-a]", {"-"}, {"b"}},
      {"[!a]", {"!", "a"}, {}},
      {"[a^]", {"^"}, {}},
      {"[a-d-f]", {"b", "f", "-"}, {"e"}},
      {"[a-d--9]", {"5"}, {}},  // a to d, then - to 9
      {"[d-a]", {"d"}, {"a", "c"}},
      {"[\\]", {"\\"}, {}},
      {"\\*", {"*"}, {"a"}},
      {"*\\.b", {"a.b"}, {"a-b"}},
      {"\\", {}, {"a", "\\"}},
      {"a\\", {}, {"a", "a\\"}},
      {"*[a", {}, {"a", "[a"}},
      {"[a*b", {}, {"ab"}},
      {"[]", {}, {"a", "[]"}},
      {"[^]", {}, {"a"}},
      {"[", {}, {"a", "["}},
      {"[^", {}, {"a"}},
      {"[\xC3\xA0-\xC3\xAA]", {"\xC3\xA9"}, {"\xC3\xAB"}},
      {"[\xC3\xA9]", {"\xE9"}, {}},  // the same value
      {"?z", {"\xE9z"}, {}},
      {"\xC3*\xA9", {"\xC3\xA9"}, {}},
      {"*\xA9", {"x\xA9"}, {"\xC3\xA9"}},  // inside a character
      {"[\xFD\x80\x80\x80\x80\x80-\xFD\x80\x80\x80\x80\x82]", {"\xFD\x80\x80\x80\x80\x81"}, {}},
      {"*\xE2??", {}, {"\xE2\xE2\x82\xAC"}},  // the text ended at the first place: given up
  };
  for (const auto& c : cases) {
    for (const std::string& text : c.matching) EXPECT_EQ(zv_strpat(text.c_str(), c.pattern), 1);
    for (const std::string& text : c.others)
      EXPECT_EQ(zv_strpat(text.c_str(), c.pattern), 0) << text << " against " << c.pattern;
  }
}

class Generator {
 public:
  Generator() {
    std::istringstream words(
        "a a b b c - ] ^ [ * ? \\ \xC3\xA9 \xC3\xA0 \xE2\x82\xAC \xC3 \xA9 \x80 \xE2\x82 "
        "\xF8\x88\x80\x80\x81 \xFC\x84\x80\x80\x80\x81 \xFE \xFF");
    for (std::string word; words >> word;) pieces_.push_back(word);
  }

  size_t below(size_t limit) { return random_() % limit; }

  std::string text(size_t length) {
    std::string made;
    while (length-- > 0) made += pieces_[below(pieces_.size())];
    return made;
  }

  // A pattern that often matches the text: some of its pieces, and wild ones instead of others.
  std::string pattern_for(const std::string& text) {
    std::string made;
    for (size_t at = 0; at < text.size();) {
      const std::string piece = text.substr(at, 1 + below(2) * below(4));
      const std::string ways[] = {piece,       piece, piece, '\\' + piece, "*",
                                  "*" + piece, "?",   set(), this->text(1)};
      made += ways[below(std::size(ways))];
      at += piece.size();
    }
    return below(8) == 0 ? made + "*\\"[below(2)] : made;
  }

 private:
  std::string set() {
    std::string made = below(3) == 0 ? "[^" : "[";
    for (size_t members = 1 + below(3); members > 0; --members)
      made += text(1) + (below(2) == 0 ? '-' + text(1) : "");
    return below(10) == 0 ? made : made + ']';
  }

  std::vector<std::string> pieces_;
  std::mt19937 random_{20240601};
};

TEST(Wildcard, AgreesWithItsDefinition) {
  Generator generate;
  int matched = 0;
  constexpr int cases = 200000;
  for (int i = 0; i < cases; ++i) {
    std::string text = generate.text(generate.below(12));
    std::string pattern = generate.pattern_for(text);
    // In a long text the end is looked at first.
    if (i % 4 == 0) {
      text.insert(0, 64, 'a');
      pattern.insert(0, "*");
    }
    const bool expected = WildcardDefinition::matches(text, pattern);
    matched += expected ? 1 : 0;
    ASSERT_EQ(zv_strpat(text.c_str(), pattern.c_str()), expected ? 1 : 0)
        << testing::PrintToString(text) << " against " << testing::PrintToString(pattern);
  }
  EXPECT_GT(matched, cases / 10);
  EXPECT_LT(matched, cases * 9 / 10);
}

// Exponential work would not end within the time that a run of the tests has.
TEST(Wildcard, NoPatternTakesLong) {
  const std::string text(10000, 'a');
  std::string stars, sets;
  for (int i = 0; i < 2000; ++i) {
    stars += "*a";
    sets += "*[ab]";
  }
  EXPECT_EQ(zv_strpat(text.c_str(), "*a*a*a*a*b"), 0);
  EXPECT_EQ(zv_strpat(text.c_str(), (stars + "*b*").c_str()), 0);
  EXPECT_EQ(zv_strpat(text.c_str(), (sets + "*[^a]").c_str()), 0);
  EXPECT_EQ(zv_strpat(text.c_str(), (stars + sets).c_str()), 1);
}

}  // namespace
