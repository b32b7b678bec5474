// Copies, sequences, edits in place, comparison without regard to case, replacement, wildcards.
#include <gtest/gtest.h>

#include <clocale>
#include <cstring>
#include <random>
#include <string>
#include <tuple>
#include <vector>

#include "../fuzz/wildcard_definition.h"
#include "environment.h"
#include "guarded.h"
#include "zarvo.h"

using namespace std::string_literals;

namespace {

int sign(int value) {
  return (value > 0) - (value < 0);
}

TEST(Copy, KeepsWhatFits) {
  const std::tuple<const char*, size_t, size_t, std::string> cases[] = {
      {"abc", 4, 3, "abc\0"s}, {"abcd", 4, 3, "abc\0"s}, {"", 4, 0, "\0###"s},
      {"ab", 4, 2, "ab\0#"s},  {"abc", 1, 0, "\0"s},     {"abc", 0, 0, ""s},
  };
  for (const auto& [src, size, result, after] : cases) {
    Guarded buffer("", size);
    EXPECT_EQ(zv_strncpy(buffer.data(), src, size), result) << src;
    EXPECT_EQ(buffer.all(), after);
  }
  char* text = zv_strredup(nullptr, "x");
  ASSERT_STREQ(text, "x");
  text = zv_strredup(text, "longer");
  ASSERT_STREQ(text, "longer");
  EXPECT_EQ(zv_strredup(text, nullptr), nullptr);
}

// Copied where there is nothing yet, else appended. A size may be below what is there.
TEST(Sequence, BoundedCopyAndAppend) {
  const std::string src = "a\0xy\0\0"s;
  EXPECT_EQ(zv_strnulllen(src.c_str()), 5u);
  const std::tuple<std::string, size_t, size_t, std::string> cases[] = {
      {"\0"s, 6, 5, "a\0xy\0\0"s}, {"\0"s, 7, 5, "a\0xy\0\0#"s},       {"\0"s, 5, 4, "a\0xy\0"s},
      {"\0"s, 1, 0, "\0"s},        {"q\0\0"s, 8, 5, "q\0a\0xy\0\0"s},  {"q\0\0"s, 4, 1, "q\0a\0"s},
      {"q\0\0"s, 3, 0, "q\0\0"s},  {"qr\0s\0\0"s, 2, 0, "qr\0s\0\0"s}, {"\0"s, 0, 0, "\0"s},
  };
  for (const auto& [before, size, result, after] : cases)
    for (const auto call : {zv_strnnullcat, zv_strnnullcpy}) {
      if (call == zv_strnnullcpy && before.size() > 1) continue;
      Guarded buffer(before, std::max(size, before.size()));
      EXPECT_EQ(call(buffer.data(), src.c_str(), size), result) << size;
      EXPECT_EQ(buffer.all(), after);
    }
}

TEST(Edit, CharactersAndBeginnings) {
  expect_edit("D:\\dir\\f", 0, "D:/dir/f", zv_strreplchr, '\\', '/');
  expect_edit("a;b;", 0, "a\0b\0"s, zv_strreplchr, ';', '\0');
  expect_edit("a\xE9z", 0, "a.z", zv_strreplchr, -23, '.');
  expect_edit("a\xE9z", 0, "a\xE9z", zv_strreplchr, 0xE9, '.');  // not the value of any character
  expect_edit("abc", 0, "abc", zv_strreplchr, '\0', '.');        // the closing NUL stays
  expect_edit("ab", 0, "ab\0"s, zv_strnull);
  expect_edit("", 0, "\0"s, zv_strnull);
  expect_edit("a\0xy\0"s, 0, "a;xy;", zv_strnullrepl, ';');
  expect_edit("abcd", 0, "cd", zv_strshift, -2);
  expect_edit("abcd", 0, "abcd", zv_strshift, 0);
  expect_edit("abc", 0, "ababc", zv_strshift, 2);
  expect_edit("abc", 0, "abc\0#abc"s, zv_strshift, 5);  // between both places nothing is written
  expect_edit("hello world", 3, "HEY world", zv_strnrepl, "HEY", 5);
  expect_edit("abc", 2, "12abc", zv_strnrepl, "12", 0);
  expect_edit("abc", 3, "123", zv_strnrepl, "123", 3);
}

TEST(Edit, Trim) {
  const std::string cases[][4] = {
      {" ab ", "ab ", " ab", "ab"},         {"   ", "", "", ""},
      {"a b", "a b", "a b", "a b"},         {"\v\f\r x\t\n", "x\t\n", "\v\f\r x", "x"},
      {"\xA0x", "\xA0x", "\xA0x", "\xA0x"},
  };
  for (const auto& [text, left, right, both] : cases) {
    expect_edit(text, std::ssize(left), left, zv_strltrim);
    expect_edit(text, std::ssize(right), right, zv_strrtrim);
    expect_edit(text, std::ssize(both), both, zv_strtrim);
  }
}

TEST(Edit, Case) {
  std::string every, lower, upper;
  for (int i = 1; i <= 255; ++i) {
    every += static_cast<char>(i);
    lower += static_cast<char>(i >= 'A' && i <= 'Z' ? i + 0x20 : i);
    upper += static_cast<char>(i >= 'a' && i <= 'z' ? i - 0x20 : i);
  }
  // A long text is turned at once.
  for (const char* const locale : {"C.UTF-8", "C"})
    for (const size_t size : {0u, 15u, 100u, 255u}) {
      std::setlocale(LC_CTYPE, locale);
      const auto result = static_cast<int64_t>(size);
      expect_edit(every.substr(0, size), result, lower.substr(0, size), zv_strlwr);
      expect_edit(every.substr(0, size), result, upper.substr(0, size), zv_strupr);
    }
}

TEST(NoCase, Compare) {
  const std::tuple<const char*, const char*, size_t, int> cases[] = {
      {"ab\0x", "AB\0y", 4, 0}, {"a_", "aB", 9, -1}, {"Path", "pATH", 9, 0}, {"[", "a", 9, -1},
      {"\xE9", "\xC9", 9, 1},   {"@", "`", 9, -1},   {"abc", "ABD", 3, -1},  {"", "a", 9, -1},
      {"z", "\xE9", 9, -1},     {"{", "[", 9, 1},    {"ab", "abc", 9, -1},   {"a", "b", 0, 0},
      {"abc", "abd", 2, 0},
  };
  for (const auto& [a, b, n, expected] : cases) {
    SCOPED_TRACE(a + " and "s + b);
    EXPECT_EQ(sign(zv_strnicmp(a, b, n)), expected);
    EXPECT_EQ(sign(zv_strnicmp(b, a, n)), -expected);
    EXPECT_EQ(sign(zv_stricmp(a, b)), n == 9 ? expected : sign(zv_strnicmp(a, b, SIZE_MAX)));
  }
}

// A needle of one character is searched for as such too; an empty one is the NUL then.
TEST(NoCase, Search) {
  const std::tuple<const char*, const char*, int> cases[] = {
      {"xxAbAbC", "aBaBc", 2}, {"aaab", "AAB", 1},    {"abc", "abcd", -1},
      {"abc", "", -1},         {"", "a", -1},         {"a Path", "T", 4},
      {"a Path", "x", -1},     {"ab\xE9", "\xE9", 2}, {"ab\xE9", "\xC9", -1},
  };
  for (const auto& [text, needle, at] : cases) {
    SCOPED_TRACE(needle);
    const char* const expected = at < 0 ? nullptr : text + at;
    EXPECT_EQ(zv_stristr(text, needle), expected);
    if (std::strlen(needle) > 1) continue;
    EXPECT_EQ(zv_strichr(text, *needle), expected);
    EXPECT_EQ(zv_strichr(text, static_cast<unsigned char>(*needle)), expected);
  }
  // Far behind others that nearly are one, in every place around the search's windows.
  for (size_t before = 480; before < 1600; before += 7) {
    const std::string text = std::string(before, 'n') + "Needle, nEEDLE";
    EXPECT_EQ(zv_stristr(text.c_str(), "nEEdle"), text.c_str() + before);
    EXPECT_EQ(zv_stristr(text.c_str(), "needle, needles"), nullptr);
    EXPECT_EQ(zv_strichr(text.c_str(), 'L'), text.c_str() + before + 4);
  }
}

// With a code page on Windows; on Linux with a locale that the build has made. Variables keep the
// case of the locale that the first of them was made under.
TEST(NoCase, FollowsTheLocale) {
  const Variable folder("LOCPATH", ZARVO_LOCALES);
  if (!std::setlocale(LC_CTYPE, ".1252") && !std::setlocale(LC_CTYPE, "latin1"))
    GTEST_SKIP() << "no 8-bit locale here";
  const char name[] = "caf\xC9 X";
#if !defined(__SANITIZE_ADDRESS__) && !defined(__SANITIZE_THREAD__)  // which know one locale only
  EXPECT_EQ(zv_stricmp(name, "CAF\xE9 x"), 0);
  EXPECT_EQ(sign(zv_strnicmp(name, "CAF\xE8", 4)), 1);
#endif
  EXPECT_EQ(zv_stristr(name, "\xE9 x"), name + 3);
  EXPECT_EQ(zv_strichr(name, 0xE9), name + 3);
  expect_edit("caf\xE9 x", 6, "CAF\xC9 X", zv_strupr);
  for (const size_t size : {3u, 100u})
    expect_edit(std::string(size, '\xC9'), static_cast<int>(size), std::string(size, '\xE9'),
                zv_strlwr);
  zv_putenv_private(name, "v", 0);
  std::setlocale(LC_CTYPE, "C");
  char* const values = zv_getenv_private("Caf\xE9 x");
  EXPECT_STREQ(values, "v");
  zv_free(values);
  zv_putenv_private(nullptr, nullptr, 0);
}

// One occurrence after the other, the search going on after what was put in.
TEST(Replace, AgreesWithItsDefinition) {
  std::mt19937 random(7);
  const auto text_of = [&](size_t length) {
    std::string text;
    while (length-- > 0) text += random() % 3 != 0 ? 'a' : 'b';
    return text;
  };
  for (int i = 0; i < 20000 && !HasFailure(); ++i) {
    const std::string before = text_of(random() % 24);
    const std::string needle = text_of(1 + random() % 3);
    const std::string repl = text_of(random() % 5);
    std::string after = before;
    bool found = false;
    for (size_t at = 0; (at = after.find(needle, at)) != after.npos; at += repl.size()) {
      after.replace(at, needle.size(), repl);
      found = true;
    }
    SCOPED_TRACE("'" + needle + "' by '" + repl + "'");
    expect_edit(before, found, after, zv_strreplstr, needle.c_str(), repl.c_str());
  }
  std::string before, after;
  for (int i = 0; i < 5000; ++i) {
    before += "xa";
    after += "xyz";
  }
  expect_edit(before, 1, after, zv_strireplstr, "A", "yz");
  expect_edit(after, 1, before, zv_strireplstr, "YZ", "a");
  expect_edit("aXa", 0, "aXa", zv_strreplstr, "x", "y");
  expect_edit("abc", 0, "abc", zv_strreplstr, "", "x");
  expect_edit("one", 0, "one", zv_strireplstr, "", "x");
}

TEST(Replace, Brackets) {
  for (const std::string inside : {"abc", "", "("}) {
    expect_edit(inside, 2, "(" + inside + "\xE9", zv_strbrkt, '(', '\xE9');
    expect_edit("(" + inside + "\xE9", 2, inside, zv_strubrkt, '(', -23);
  }
  for (const char* const kept : {"(abc", "abc\xE9", "(", "", "a(\xE9"})
    expect_edit(kept, 0, kept, zv_strubrkt, '(', -23);
  expect_edit("(\xE9", 0, "(\xE9", zv_strubrkt, '(', 0xE9);
  expect_edit("\"", 0, "\"", zv_strubrkt, '"', '"');
}

// One letter shows no style.
TEST(Synch, GivesTheCaseOfAModel) {
  const char* const cases[][3] = {
      {"d/readme.txt", "NOTES.DOC", "d/README.TXT"},
      {"D/FILE.TXT", "Rep.Doc", "D/File.Txt"},
      {"File.TXT", "readme", "file.txt"},
      {"file", "README.TXT", "FILE"},
      {"a/b.q", "x9.TXT", "a/b.Q"},
      {"FILE.TXT", "aBc.tX", "FILE.TXT"},
      {"FILE.TXT", "a.D", "FILE.TXT"},
      {"FILE.TXT", "name.9x", "file.TXT"},
      {"FILE.TXT", "dir/", "FILE.TXT"},
      {"D.X/.PROFILE", "d.y/.Px", "D.X/.PROFILE"},
      {"A.B/FILE.", "a.b/name.txt", "A.B/file."},
      {"", "AA.AA", ""},
  };
  for (const auto& [before, model, after] : cases)
    expect_edit(before, std::strcmp(before, after) != 0, after, zv_strsynch, model);
}

TEST(Wide, BytesAndUnits) {
  const uint16_t expected[] = {'a', 0xFFE9, 0xFF80, 0x7F, 0};
  uint16_t units[5] = {1, 1, 1, 1, 1};
  EXPECT_EQ(zv_strtowcs(units, "a\xE9\x80\x7F"), 4u);
  EXPECT_EQ(std::memcmp(units, expected, sizeof expected), 0);
  Guarded back("", 5);
  EXPECT_EQ(zv_wcstostr(back.data(), units), 4u);
  EXPECT_STREQ(back.text(), "a\xE9\x80\x7F");
  const uint16_t wide[] = {0x0141, 0x0100, 'z', 0};
  EXPECT_EQ(zv_wcstostr(back.data(), wide), 3u);
  EXPECT_EQ(back.all().substr(0, 4), "A\0z\0"s);
}

TEST(Wildcard, Table) {
  using Texts = std::vector<std::string>;
  const std::tuple<const char*, Texts, Texts> cases[] = {
      {"", {""}, {"a"}},
      {"?", {"\xC3\xA9", "\xE9"}, {"", "\xFE\x80"}},
      {"*.txt", {"file.txt", ".txt"}, {"file.TXT", "txt"}},
      {"ab*b", {"abb"}, {"ab"}},  // the end may not be used twice
      {"[^]a]", {"b"}, {"a", "]"}},
      {"[!a]", {"!", "a"}, {}},
      {"[a-d-f]", {"b", "f", "-"}, {"e"}},
      {"[a-d--9-]", {"5", "-"}, {}},  // a to d, then - to 9
      {"[d-a]", {"d"}, {"a", "c"}},
      {"[\\]", {"\\"}, {}},
      {"a\\", {}, {"a", "a\\"}},
      {"[]", {}, {"a", "[]"}},
      {"[\xC3\xA0-\xC3\xAA]", {"\xC3\xA9", "\xE9"}, {"\xC3\xAB"}},  // or the same value
      {"*\xA9", {"x\xA9"}, {"\xC3\xA9"}},                           // inside a character
      {"[\xFD\x80\x80\x80\x80\x80-\xFD\x80\x80\x80\x80\x82]", {"\xFD\x80\x80\x80\x80\x81"}, {}},
      {"*\xE2??", {}, {"\xE2\xE2\x82\xAC"}},  // the text ended at the first place: given up
  };
  for (const auto& [pattern, matching, others] : cases) {
    for (const std::string& text : matching) EXPECT_EQ(zv_strpat(text.c_str(), pattern), 1);
    for (const std::string& text : others)
      EXPECT_EQ(zv_strpat(text.c_str(), pattern), 0) << text << " against " << pattern;
  }
}

TEST(Wildcard, AgreesWithItsDefinition) {
  std::mt19937 random(20240601);
  WildcardGenerator generate([&random](size_t limit) { return random() % limit; });
  int matched = 0;
  constexpr int cases = 200000;
  for (int i = 0; i < cases; ++i) {
    std::string text = generate.text(random() % 12);
    std::string pattern = generate.pattern_for(text);
    // In a long text the end is looked at first.
    if (i % 4 == 0) {
      text.insert(0, 64, 'a');
      pattern.insert(0, "*");
    }
    const bool expected = WildcardDefinition::matches(text, pattern);
    matched += expected;
    ASSERT_EQ(zv_strpat(text.c_str(), pattern.c_str()), expected)
        << testing::PrintToString(text) << " against " << testing::PrintToString(pattern);
  }
  EXPECT_NEAR(matched, cases / 2, cases * 2 / 5);
}

// Exponential work would not end within the time that a run of the tests has.
TEST(Wildcard, NoPatternTakesLong) {
  const std::string text(10000, 'a');
  std::string stars, sets;
  for (int i = 0; i < 2000; ++i) {
    stars += "*a";
    sets += "*[ab]";
  }
  EXPECT_EQ(zv_strpat(text.c_str(), (stars + "*b*").c_str()), 0);
  EXPECT_EQ(zv_strpat(text.c_str(), (sets + "*[^a]").c_str()), 0);
  EXPECT_EQ(zv_strpat(text.c_str(), (stars + sets).c_str()), 1);
}

}  // namespace
