// Wildcard patterns: a table, and the matcher against its definition written out.
#include <gtest/gtest.h>

#include <chrono>
#include <cstring>
#include <random>
#include <string>

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

// The definition of a match: recursive, with its rule for giving up.
class Definition {
 public:
  static bool matches(const std::string& text, const std::string& pattern) {
    if (pattern == "*") return true;
    const char* const p = pattern.c_str();
    return match(text.c_str(), p, p + pattern.size() - 1) == Outcome::yes;
  }

 private:
  enum class Outcome { yes, no, give_up };

  static unsigned long long decode(const char* p, const char* last, const char** next) {
    const auto byte = static_cast<unsigned char>(*p);
    int ones = 0;
    while (ones < 8 && (byte & (0x80 >> ones)) != 0) ++ones;
    *next = p + 1;
    if (ones < 2 || ones > 6) return byte;
    unsigned long long value = byte & ((1U << (7 - ones)) - 1);
    for (int i = 1; i < ones; ++i) {
      if (p + i > last || (static_cast<unsigned char>(p[i]) & 0xC0) != 0x80) return byte;
      value = value * 64 + (static_cast<unsigned char>(p[i]) & 0x3F);
    }
    *next = p + ones;
    return value;
  }

  static const char* step(const char* text) {
    const char* next;
    decode(text, text + std::strlen(text), &next);
    return next;
  }

  static bool belongs(unsigned long long value, const char* first, const char* last) {
    const bool negated = *first == '^';
    if (negated) ++first;
    const char* const start = first;
    bool after_single = false;
    unsigned long long previous = 0;
    while (first <= last) {
      if (*first == '-' && first != start && after_single && first != last) {
        const unsigned long long end = decode(first + 1, last, &first);
        if (previous <= value && value <= end) return !negated;
        after_single = false;
      } else {
        previous = decode(first, last, &first);
        if (previous == value) return !negated;
        after_single = true;
      }
    }
    return negated;
  }

  static Outcome match(const char* text, const char* p, const char* last) {
    if (p > last) return *text == '\0' ? Outcome::yes : Outcome::no;
    for (; p <= last; ++p) {
      if (*text == '\0' && *p != '*') return Outcome::give_up;
      switch (*p) {
        case '*':
          return match_star(text, p, last);
        case '?':
          text = step(text);
          break;
        case '[': {
          const char* close = p + (p[1] == '^' ? 3 : 2);
          if (close > last) return Outcome::give_up;
          while (close <= last && *close != ']') ++close;
          if (close > last) return Outcome::give_up;
          const unsigned long long value = decode(text, text + std::strlen(text), &text);
          if (!belongs(value, p + 1, close - 1)) return Outcome::no;
          p = close;
          break;
        }
        case '\\':
          if (*++p == '\0') return Outcome::give_up;
          [[fallthrough]];
        default:
          if (*text != *p) return Outcome::no;
          ++text;
      }
    }
    return *text == '\0' ? Outcome::yes : Outcome::no;
  }

  static Outcome match_star(const char* text, const char* p, const char* last) {
    while (p <= last && *p == '*') ++p;
    if (p > last) return Outcome::yes;
    if (*p == '[' || *p == '\\' || *p == '?') {
      for (; *text != '\0'; text = step(text)) {
        const Outcome outcome = match(text, p, last);
        if (outcome != Outcome::no) return outcome;
      }
      return Outcome::give_up;
    }
    for (;;) {
      while (*text != '\0' && *text != *p) text = step(text);
      if (*text == '\0') return Outcome::give_up;
      const Outcome outcome = match(++text, p + 1, last);
      if (outcome != Outcome::no) return outcome;
      if (*text == '\0') return Outcome::give_up;
    }
  }
};

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
    const bool expected = Definition::matches(text, pattern);
    matched += expected ? 1 : 0;
    ASSERT_EQ(zv_strpat(text.c_str(), pattern.c_str()), expected ? 1 : 0)
        << testing::PrintToString(text) << " against " << testing::PrintToString(pattern);
  }
  EXPECT_GT(matched, cases / 10);
  EXPECT_LT(matched, cases * 9 / 10);
}

TEST(Wildcard, NoPatternTakesLong) {
  const std::string text(10000, 'a');
  std::string stars, sets;
  for (int i = 0; i < 2000; ++i) {
    stars += "*a";
    sets += "*[ab]";
  }
  const auto start = std::chrono::steady_clock::now();
  EXPECT_EQ(zv_strpat(text.c_str(), "*a*a*a*a*b"), 0);
  EXPECT_EQ(zv_strpat(text.c_str(), (stars + "*b*").c_str()), 0);
  EXPECT_EQ(zv_strpat(text.c_str(), (sets + "*[^a]").c_str()), 0);
  EXPECT_EQ(zv_strpat(text.c_str(), (stars + sets).c_str()), 1);
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(1));
}

}  // namespace
