// Copies, sequences, edits in place, comparison without regard to case, replacement.
#include <gtest/gtest.h>

#include <clocale>
#include <cstring>
#include <random>
#include <string>

#include "environment.h"
#include "guarded.h"
#include "zarvo.h"

using namespace std::string_literals;

namespace {

int sign(int value) {
  return (value > 0) - (value < 0);
}

TEST(Copy, KeepsWhatFits) {
  const struct {
    const char* src;
    size_t size;
    size_t result;
    std::string buffer;
  } cases[] = {
      {"abc", 4, 3, "abc\0"s}, {"abcd", 4, 3, "abc\0"s}, {"", 4, 0, "\0###"s},
      {"ab", 4, 2, "ab\0#"s},  {"abc", 1, 0, "\0"s},     {"abc", 0, 0, ""s},
  };
  for (const auto& c : cases) {
    Guarded buffer = Guarded::buffer("", c.size);
    EXPECT_EQ(zv_strncpy(buffer.data(), c.src, c.size), c.result) << c.src;
    EXPECT_EQ(buffer.all(), c.buffer);
  }
}

TEST(Copy, ReplacesAHeapText) {
  char* text = zv_strredup(nullptr, "x");
  ASSERT_STREQ(text, "x");
  text = zv_strredup(text, "longer");
  ASSERT_STREQ(text, "longer");
  EXPECT_EQ(zv_strredup(text, nullptr), nullptr);
  EXPECT_EQ(zv_strredup(nullptr, nullptr), nullptr);
}

TEST(Sequence, BoundedCopyAndAppend) {
  const std::string src = "a\0xy\0\0"s;
  EXPECT_EQ(zv_strnulllen(src.c_str()), 5u);
  const struct {
    std::string before;
    size_t size;
    size_t result;
    std::string after;
  } cases[] = {
      {"\0"s, 6, 5, "a\0xy\0\0"s},        {"\0"s, 7, 5, "a\0xy\0\0#"s},
      {"\0"s, 5, 4, "a\0xy\0"s},          {"\0"s, 1, 0, "\0"s},
      {"q\0\0"s, 8, 5, "q\0a\0xy\0\0"s},  {"q\0\0"s, 6, 3, "q\0a\0x\0"s},
      {"q\0\0"s, 4, 1, "q\0a\0"s},        {"q\0\0"s, 3, 0, "q\0\0"s},
      {"qr\0s\0\0"s, 6, 0, "qr\0s\0\0"s},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(testing::PrintToString(c.before) + " in " + std::to_string(c.size));
    Guarded buffer = Guarded::buffer(c.before, c.size);
    EXPECT_EQ(zv_strnnullcat(buffer.data(), src.c_str(), c.size), c.result);
    EXPECT_EQ(buffer.all(), c.after);
    if (c.before.size() > 1) continue;
    Guarded copy = Guarded::buffer("", c.size);
    EXPECT_EQ(zv_strnnullcpy(copy.data(), src.c_str(), c.size), c.result);
    EXPECT_EQ(copy.all(), c.after);
  }

  Guarded whole = Guarded::buffer("q\0\0"s, 3);
  EXPECT_EQ(zv_strnnullcat(whole.data(), "", 3), 0u);
  EXPECT_EQ(zv_strnnullcat(whole.data(), "x\0", 2), 0u);  // a size below what is there
  EXPECT_EQ(zv_strnnullcat(whole.data(), "x\0", 0), 0u);
  EXPECT_EQ(zv_strnnullcpy(whole.data(), "x\0", 0), 0u);
  EXPECT_EQ(whole.all(), "q\0\0"s);
}

TEST(Edit, Characters) {
  const auto replace = [](int from, char to) {
    return [=](char* s) { return zv_strreplchr(s, from, to), 0; };
  };
  const auto close = [](char* s) { return zv_strnull(s), 0; };
  const auto join = [](char* s) { return zv_strnullrepl(s, ';'), 0; };
  expect_edit("D:\\dir\\f", replace('\\', '/'), 0, "D:/dir/f");
  expect_edit("a;b;", replace(';', '\0'), 0, "a\0b\0"s);
  expect_edit("a\xE9z", replace(-23, '.'), 0, "a.z");
  expect_edit("a\xE9z", replace(0xE9, '.'), 0, "a\xE9z");  // not the value of any character
  expect_edit("abc", replace('\0', '.'), 0, "abc");        // the closing NUL is not replaced
  expect_edit("ab", close, 0, "ab\0"s);
  expect_edit("", close, 0, "\0"s);
  expect_edit("a\0xy\0"s, join, 0, "a;xy;");
  expect_edit("\0"s, join, 0, "\0"s);
}

TEST(Edit, ShiftAndReplacedBeginning) {
  const auto shift = [](int by) { return [=](char* s) { return zv_strshift(s, by), 0; }; };
  const auto left = [](size_t by) { return [=](char* s) { return zv_strlshift(s, by), 0; }; };
  const auto right = [](size_t by) { return [=](char* s) { return zv_strrshift(s, by), 0; }; };
  expect_edit("abcd", shift(-2), 0, "cd");
  expect_edit("abcd", shift(0), 0, "abcd");
  expect_edit("abc", shift(2), 0, "ababc");
  expect_edit("abcd", left(4), 0, "");
  expect_edit("abc", right(0), 0, "abc");
  expect_edit("abc", right(5), 0, "abc\0#abc"s);  // between both places nothing is written
  expect_edit("", right(1), 0, "\0"s);

  const auto begin = [](const char* with, int n) {
    return [=](char* s) { return zv_strnrepl(s, with, n) - s; };
  };
  expect_edit("hello world", begin("HEY", 5), 3, "HEY world");
  expect_edit("abc", begin("", 2), 0, "c");
  expect_edit("abc", begin("12", 0), 2, "12abc");
  expect_edit("abc", begin("123", 3), 3, "123");
  expect_edit("", begin("ab", 0), 2, "ab");
}

TEST(Edit, Trim) {
  const struct {
    const char *text, *left, *right, *both;
  } cases[] = {
      {" ab ", "ab ", " ab", "ab"},
      {"   ", "", "", ""},
      {"", "", "", ""},
      {"a b", "a b", "a b", "a b"},
      {"\v\f\r x\t\n", "x\t\n", "\v\f\r x", "x"},
      {"\xA0x\x85", "\xA0x\x85", "\xA0x\x85", "\xA0x\x85"},
  };
  const auto length = [](const char* text) { return static_cast<int64_t>(std::strlen(text)); };
  for (const auto& c : cases) {
    expect_edit(c.text, zv_strltrim, length(c.left), c.left);
    expect_edit(c.text, zv_strrtrim, length(c.right), c.right);
    expect_edit(c.text, zv_strtrim, length(c.both), c.both);
  }
}

TEST(Edit, Case) {
  std::string every, lower, upper;
  for (int i = 1; i <= 255; ++i) {
    every += static_cast<char>(i);
    lower += static_cast<char>(i >= 'A' && i <= 'Z' ? i + 0x20 : i);
    upper += static_cast<char>(i >= 'a' && i <= 'z' ? i - 0x20 : i);
  }
  for (const char* const locale : {"C", "C.UTF-8"}) {
    std::setlocale(LC_CTYPE, locale);
    for (size_t length : {0u, 1u, 15u, 100u, 255u}) {
      const auto result = static_cast<int64_t>(length);
      expect_edit(every.substr(0, length), zv_strlwr, result, lower.substr(0, length));
      expect_edit(every.substr(0, length), zv_strupr, result, upper.substr(0, length));
    }
  }
  std::setlocale(LC_CTYPE, "C");
}

TEST(NoCase, Compare) {
  const struct {
    const char *a, *b;
    size_t n;
    int expected;
  } cases[] = {
      {"Path", "pATH", SIZE_MAX, 0}, {"", "", SIZE_MAX, 0},
      {"", "a", SIZE_MAX, -1},       {"a_", "aB", SIZE_MAX, -1},
      {"[", "a", SIZE_MAX, -1},      {"{", "[", SIZE_MAX, 1},
      {"z", "\xE9", SIZE_MAX, -1},   {"\xE9", "\xC9", SIZE_MAX, 1},
      {"ab", "abc", SIZE_MAX, -1},   {"B", "a", SIZE_MAX, 1},
      {"HTTP/1.0", "http/2", 5, 0},  {"@", "`", SIZE_MAX, -1},
      {"abc", "ABD", 3, -1},         {"abc", "abd", 2, 0},
      {"ab\0x", "AB\0y", 4, 0},      {"a", "b", 0, 0},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(std::string(c.a) + " and " + c.b);
    EXPECT_EQ(sign(zv_strnicmp(c.a, c.b, c.n)), c.expected);
    EXPECT_EQ(sign(zv_strnicmp(c.b, c.a, c.n)), -c.expected);
    if (c.n != SIZE_MAX) continue;
    EXPECT_EQ(sign(zv_stricmp(c.a, c.b)), c.expected);
    EXPECT_EQ(sign(zv_stricmp(c.b, c.a)), -c.expected);
  }
}

// A needle of one character is searched for as such too; an empty one is the NUL then.
TEST(NoCase, Search) {
  const struct {
    const char *text, *needle;
    int at;
  } cases[] = {
      {"Content-Length: 5", "content-length:", 0},
      {"xxAbAbC", "aBaBc", 2},
      {"aaab", "AAB", 1},
      {"abc", "abcd", -1},
      {"abc", "", -1},
      {"", "", -1},
      {"", "a", -1},
      {"a Path", "P", 2},
      {"a Path", "T", 4},
      {"a Path", "x", -1},
      {"ab\xE9", "\xE9", 2},
      {"ab\xE9", "\xC9", -1},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.needle);
    const char* const expected = c.at < 0 ? nullptr : c.text + c.at;
    EXPECT_EQ(zv_stristr(c.text, c.needle), expected);
    if (std::strlen(c.needle) > 1) continue;
    EXPECT_EQ(zv_strichr(c.text, *c.needle), expected);
    EXPECT_EQ(zv_strichr(c.text, static_cast<unsigned char>(*c.needle)), expected);
  }
}

// A find far behind others that nearly are one, in every place around the search's windows.
TEST(NoCase, SearchOfALongText) {
  for (size_t before = 480; before < 1600; before += 7) {
    Guarded text(std::string(before, 'n') + "Needle, nEEDLE");
    EXPECT_EQ(zv_stristr(text.data(), "nEEdle"), text.data() + before);
    EXPECT_EQ(zv_stristr(text.data(), "needle, needles"), nullptr);
    EXPECT_EQ(zv_strichr(text.data(), 'L'), text.data() + before + 4);
  }
}

// With a code page on Windows; on Linux with a locale that the build has made.
TEST(NoCase, FollowsTheLocale) {
  const Variable folder("LOCPATH", ZARVO_LOCALES);
  if (!std::setlocale(LC_CTYPE, ".1252") && !std::setlocale(LC_CTYPE, "latin1"))
    GTEST_SKIP() << "no 8-bit locale here";
  const char name[] = "caf\xC9 X";
  EXPECT_EQ(zv_stricmp(name, "CAF\xE9 x"), 0);
  EXPECT_EQ(sign(zv_strnicmp(name, "CAF\xE8", 4)), 1);
  EXPECT_EQ(zv_stristr(name, "\xE9 x"), name + 3);
  EXPECT_EQ(zv_strichr(name, 0xE9), name + 3);
  expect_edit(name, zv_strlwr, 6, "caf\xE9 x");
  expect_edit("caf\xE9 x", zv_strupr, 6, "CAF\xC9 X");
  expect_edit(std::string(100, '\xC9'), zv_strlwr, 100, std::string(100, '\xE9'));
  zv_putenv_private(name, "v", 0);
  char* const values = zv_getenv_private("Caf\xE9 x");
  EXPECT_STREQ(values, "v");
  zv_free(values);
  zv_putenv_private(nullptr, nullptr, 0);
  std::setlocale(LC_CTYPE, "C");
}

auto replacing(const std::string& needle, const std::string& repl) {
  return [=](char* s) { return zv_strreplstr(s, needle.c_str(), repl.c_str()); };
}

auto replacing_any_case(const std::string& needle, const std::string& repl) {
  return [=](char* s) { return zv_strireplstr(s, needle.c_str(), repl.c_str()); };
}

// One occurrence after the other, the search going on behind what was put in.
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
    const bool found = before.find(needle) != std::string::npos;
    std::string after = before;
    size_t at = 0;
    for (; (at = after.find(needle, at)) != std::string::npos; at += repl.size())
      after.replace(at, needle.size(), repl);
    SCOPED_TRACE("'" + needle + "' by '" + repl + "'");
    expect_edit(before, replacing(needle, repl), found, after);
  }
}

TEST(Replace, CaseAndManyOccurrences) {
  expect_edit("abc", replacing("", "x"), 0, "abc");
  expect_edit("aXa", replacing("x", "y"), 0, "aXa");
  expect_edit("one", replacing_any_case("", "x"), 0, "one");
  expect_edit("One ONE one", replacing_any_case("oNE", "Three"), 1, "Three Three Three");
  std::string before, after;
  for (int i = 0; i < 5000; ++i) {
    before += "xa";
    after += "xyz";
  }
  expect_edit(before, replacing_any_case("A", "yz"), 1, after);
  expect_edit(after, replacing_any_case("YZ", "a"), 1, before);
}

TEST(Replace, Brackets) {
  const auto put = [](char* s) { return zv_strbrkt(s, '(', '\xE9'); };
  const auto take = [](char* s) { return zv_strubrkt(s, '(', -23); };
  for (const std::string inside : {"abc", "", "("}) {
    expect_edit(inside, put, 2, "(" + inside + "\xE9");
    expect_edit("(" + inside + "\xE9", take, 2, inside);
  }
  for (const char* const kept : {"(abc", "abc\xE9", "(", "\xE9", "", "a(\xE9"})
    expect_edit(kept, take, 0, kept);
  expect_edit(
      "(\xE9", [](char* s) { return zv_strubrkt(s, '(', 0xE9); }, 0, "(\xE9");
  expect_edit(
      "\"", [](char* s) { return zv_strubrkt(s, '"', '"'); }, 0, "\"");
}

TEST(Synch, Table) {
  const struct {
    const char *before, *model, *after;
  } cases[] = {
      {"dir/readme.txt", "NOTES.DOC", "dir/README.TXT"},
      {"Data/FILE.TXT", "Report.Doc", "Data/File.Txt"},
      {"File.TXT", "readme", "file.txt"},
      {"file", "README.TXT", "FILE"},
      {"a/b.q", "x9.TXT", "a/b.Q"},
      {"FILE.TXT", "aBc.tX", "FILE.TXT"},
      {"FILE.TXT", "aBc.Tx", "FILE.Txt"},
      {"FILE.TXT", "a.D", "FILE.TXT"},  // one letter shows no style
      {"FILE.TXT", "name.9x", "file.TXT"},
      {"dir/", "Name.Txt", "dir/"},
      {"FILE.TXT", "dir/", "FILE.TXT"},
      {"DIR.X/.PROFILE", "dir.y/.Px", "DIR.X/.PROFILE"},
      {"A.B/FILE.", "a.b/name.txt", "A.B/file."},
      {"a_b.c_d", "AA.AA", "A_B.C_D"},
      {"", "AA.AA", ""},
  };
  for (const auto& c : cases)
    expect_edit(
        c.before, [&c](char* s) { return zv_strsynch(s, c.model); },
        std::strcmp(c.before, c.after) != 0, c.after);
}

TEST(Wide, BytesAndUnits) {
  const char text[] = "a\xE9\x80\x7F";
  const uint16_t expected[] = {'a', 0xFFE9, 0xFF80, 0x7F, 0};
  uint16_t units[5] = {1, 1, 1, 1, 1};
  EXPECT_EQ(zv_strtowcs(units, text), 4u);
  EXPECT_EQ(std::memcmp(units, expected, sizeof expected), 0);
  Guarded back = Guarded::buffer("", 5);
  EXPECT_EQ(zv_wcstostr(back.data(), units), 4u);
  EXPECT_STREQ(back.text(), text);

  const uint16_t wide[] = {0x0141, 0x0100, 'z', 0};
  EXPECT_EQ(zv_wcstostr(back.data(), wide), 3u);
  EXPECT_EQ(back.all().substr(0, 4), "A\0z\0"s);
}

}  // namespace
