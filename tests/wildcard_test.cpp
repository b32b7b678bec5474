// Wildcard patterns: a table, and the matcher against its definition written out.
#include <gtest/gtest.h>

#include <cstring>
#include <random>
#include <string>

#include "wildcard_definition.h"
#include "zarvo.h"

namespace {

TEST(Wildcard, Table) {
  const struct {
    const char *text, *pattern;
    int expected;
  } cases[] = {
      {"", "*", 1},
      {"any", "*", 1},
      {"", "", 1},
      {"a", "", 0},
      {"abx", "a*", 1},
      {"abx", "*x", 1},
      {"abx", "a?x", 1},
      {"abx", "a**x", 1},
      {"abx", "*b*", 1},
      {"abx", "*b", 0},
      {"ax", "a?x", 0},
      {"", "?", 0},
      {"", "**", 1},
      {"file.TXT", "*.txt", 0},
      {"file.txt", "*.txt", 1},
      {".txt", "*.txt", 1},
      {"txt", "*.txt", 0},
      {"ab", "ab*b", 0},  // the end may not be used twice
      {"abxbd", "a*bd", 1},
      {"b", "[a-d]", 1},
      {"b", "[^a-d]", 0},
      {"]", "[]]", 1},
      {"a", "[^]a]", 0},
      {"b", "[^]a]", 1},
      {"-", "[a-]", 1},
      {"-", "[-a]", 1},
      {"!", "[!a]", 1},
      {"^", "[a^]", 1},
      {"e", "[a-d-f]", 0},
      {"f", "[a-d-f]", 1},
      {"-", "[a-d-f]", 1},
      {"5", "[a-d--9]", 1},  // a to d, then - to 9
      {"d", "[d-a]", 1},
      {"a", "[d-a]", 0},
      {"c", "[d-a]", 0},
      {"\\", "[\\]", 1},
      {"*", "\\*", 1},
      {"a", "\\*", 0},
      {"a.b", "*\\.b", 1},
      {"a", "\\", 0},
      {"a\\", "a\\", 0},
      {"a", "[a", 0},
      {"a", "[]", 0},
      {"a", "[^]", 0},
      {"a", "[", 0},
      {"a", "[^", 0},
      {"a", "*[a", 0},
      {"ab", "[a*b", 0},
      {"\xC3\xA9", "?", 1},
      {"\xC3\xA9", "??", 0},
      {"\xC3\xA9", "[\xC3\xA0-\xC3\xAA]", 1},
      {"\xE9", "[\xC3\xA9]", 1},  // the same value
      {"\xE9", "?", 1},
      {"\xE9z", "?z", 1},
      {"\xC3\xA9", "\xC3*\xA9", 1},
      {"\xC3\xA9", "*\xA9", 0},  // inside a character
      {"x\xA9", "*\xA9", 1},
      {"\xFD\x80\x80\x80\x80\x81", "[\xFD\x80\x80\x80\x80\x80-\xFD\x80\x80\x80\x80\x82]", 1},
      {"\xFE\x80", "?", 0},
      {"\xE2\xE2\x82\xAC", "*\xE2??", 0},  // the text ended at the first place: given up
  };
  for (const auto& c : cases)
    EXPECT_EQ(zv_strpat(c.text, c.pattern), c.expected) << c.text << " against " << c.pattern;
}

class Generator {
 public:
  explicit Generator(unsigned seed) : random_(seed) {}

  size_t below(size_t limit) { return random_() % limit; }

  std::string text(size_t length) {
    static const char* const pieces[] = {"a",
                                         "a",
                                         "b",
                                         "b",
                                         "c",
                                         "-",
                                         "]",
                                         "^",
                                         "[",
                                         "*",
                                         "?",
                                         "\\",
                                         "\xC3\xA9",
                                         "\xC3\xA0",
                                         "\xE2\x82\xAC",
                                         "\xC3",
                                         "\xA9",
                                         "\x80",
                                         "\xE2\x82",
                                         "\xF8\x88\x80\x80\x81",
                                         "\xFC\x84\x80\x80\x80\x81",
                                         "\xFE",
                                         "\xFF"};
    std::string made;
    while (length-- > 0) made += pieces[below(std::size(pieces))];
    return made;
  }

  // A pattern that often matches the text: some of its pieces, and wild ones instead of others.
  std::string pattern_for(const std::string& text) {
    std::string made;
    for (const char* p = text.c_str(); *p != '\0';) {
      const size_t length = std::min(1 + below(4), std::strlen(p));
      switch (below(8)) {
        case 0:
          made += "*";
          p += length;
          break;
        case 1:
          made += "*";
          break;
        case 2:
          made += "?";
          ++p;
          break;
        case 3:
          made += set();
          ++p;
          break;
        case 4:
          made += this->text(1);
          break;
        case 5:
          made += '\\';
          [[fallthrough]];
        default:
          made.append(p, length);
          p += length;
      }
    }
    if (below(8) == 0) made += below(2) == 0 ? "*" : "\\";
    return made;
  }

 private:
  std::string set() {
    std::string made = below(3) == 0 ? "[^" : "[";
    for (size_t members = 1 + below(3); members-- > 0;) {
      made += text(1);
      if (below(2) == 0) made.append("-").append(text(1));
    }
    return below(10) == 0 ? made : made + ']';
  }

  std::mt19937 random_;
};

TEST(Wildcard, AgreesWithItsDefinition) {
  Generator generate(20240601);
  int matched = 0;
  constexpr int cases = 200000;
  for (int i = 0; i < cases; ++i) {
    const std::string text = generate.text(generate.below(12));
    const std::string pattern = generate.pattern_for(text);
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
