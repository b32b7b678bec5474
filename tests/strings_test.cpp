// Copies, sequences, edits in place, comparison without regard to case, replacement.
#include <gtest/gtest.h>

#include <clocale>
#include <cstring>
#include <random>
#include <string>

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
    SCOPED_TRACE(c.src);
    Guarded buffer = Guarded::buffer("", c.size);
    EXPECT_EQ(zv_strncpy(buffer.data(), c.src, c.size), c.result);
    EXPECT_EQ(buffer.all(), c.buffer);
    EXPECT_TRUE(buffer.intact());
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

TEST(Copy, ReplacesACharacter) {
  const struct {
    std::string before;
    int from;
    char to;
    std::string after;
  } cases[] = {
      {"D:\\dir\\f", '\\', '/', "D:/dir/f"},
      {"a;b;", ';', '\0', "a\0b\0"s},
      {"", 'a', 'b', ""},
      {"a\xE9z", -23, '.', "a.z"},
      {"a\xE9z", 0xE9, '.', "a\xE9z"},  // not the value of any character
      {"abc", 0, '.', "abc"},           // the closing NUL is not replaced
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.before);
    Guarded text(c.before);
    zv_strreplchr(text.data(), c.from, c.to);
    EXPECT_EQ(text.all(), c.after + '\0');
    EXPECT_TRUE(text.intact());
  }
}

TEST(Sequence, LengthAndConversions) {
  EXPECT_EQ(zv_strnulllen("a\0xy\0"), 5u);
  EXPECT_EQ(zv_strnulllen("\0x"), 0u);

  Guarded one("ab", 1);
  zv_strnull(one.data());
  EXPECT_EQ(one.all(), "ab\0\0"s);
  Guarded none("", 1);
  zv_strnull(none.data());
  EXPECT_EQ(none.all(), "\0\0"s);
  zv_strnullrepl(none.data(), ';');
  EXPECT_EQ(none.all(), "\0\0"s);
  EXPECT_TRUE(one.intact() && none.intact());

  Guarded joined = Guarded::buffer("a\0xy\0\0"s, 6);
  zv_strnullrepl(joined.data(), ';');
  EXPECT_EQ(joined.all(), "a;xy;\0"s);
  EXPECT_TRUE(joined.intact());
}

TEST(Sequence, BoundedCopyAndAppend) {
  const std::string src = "a\0xy\0\0"s;
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
    EXPECT_TRUE(buffer.intact());
    if (c.before.size() > 1) continue;
    Guarded copy = Guarded::buffer("", c.size);
    EXPECT_EQ(zv_strnnullcpy(copy.data(), src.c_str(), c.size), c.result);
    EXPECT_EQ(copy.all(), c.after);
    EXPECT_TRUE(copy.intact());
  }

  Guarded whole = Guarded::buffer("q\0\0"s, 3);
  EXPECT_EQ(zv_strnnullcat(whole.data(), "", 3), 0u);
  EXPECT_EQ(zv_strnnullcat(whole.data(), "x\0", 2), 0u);  // a size below what is there
  EXPECT_EQ(zv_strnnullcat(whole.data(), "x\0", 0), 0u);
  EXPECT_EQ(zv_strnnullcpy(whole.data(), "x\0", 0), 0u);
  EXPECT_EQ(whole.all(), "q\0\0"s);
}

TEST(Edit, Trim) {
  const struct {
    const char *text, *left, *right, *both;
  } cases[] = {
      {"  ab", "ab", "  ab", "ab"},
      {"ab \t\n", "ab \t\n", "ab", "ab"},
      {" ab ", "ab ", " ab", "ab"},
      {"   ", "", "", ""},
      {"", "", "", ""},
      {"a b", "a b", "a b", "a b"},
      {"\v\f\r x", "x", "\v\f\r x", "x"},
      {"\xA0x\x85", "\xA0x\x85", "\xA0x\x85", "\xA0x\x85"},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(testing::PrintToString(c.text));
    const struct {
      size_t (*trim)(char*);
      const char* expected;
    } trims[] = {{zv_strltrim, c.left}, {zv_strrtrim, c.right}, {zv_strtrim, c.both}};
    for (const auto& t : trims) {
      Guarded text(c.text);
      EXPECT_EQ(t.trim(text.data()), std::strlen(t.expected));
      EXPECT_STREQ(text.text(), t.expected);
      EXPECT_TRUE(text.intact());
    }
  }
}

TEST(Edit, Case) {
  std::string every(255, '\0'), lower = every, upper = every;
  for (size_t i = 0; i < every.size(); ++i) {
    const char ch = static_cast<char>(i + 1);
    every[i] = lower[i] = upper[i] = ch;
    if (ch >= 'A' && ch <= 'Z') lower[i] = static_cast<char>(ch - 'A' + 'a');
    if (ch >= 'a' && ch <= 'z') upper[i] = static_cast<char>(ch - 'a' + 'A');
  }
  for (size_t length : {0u, 1u, 15u, 100u, 255u}) {
    Guarded down(every.substr(0, length)), up(every.substr(0, length));
    EXPECT_EQ(zv_strlwr(down.data()), length);
    EXPECT_EQ(zv_strupr(up.data()), length);
    EXPECT_EQ(down.text(), lower.substr(0, length));
    EXPECT_EQ(up.text(), upper.substr(0, length));
    EXPECT_TRUE(down.intact() && up.intact());
  }
}

TEST(Edit, Shift) {
  const struct {
    const char* before;
    int by;
    const char* after;
  } cases[] = {
      {"abcd", -2, "cd"},  {"abcd", -4, ""},  {"abcd", 0, "abcd"},
      {"abc", 2, "ababc"}, {"abc", 5, "abc"}, {"", 1, ""},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.before);
    Guarded text(c.before, static_cast<size_t>(std::max(c.by, 0)));
    Guarded same = text;
    zv_strshift(text.data(), c.by);
    if (c.by < 0) {
      zv_strlshift(same.data(), static_cast<size_t>(-c.by));
    } else {
      zv_strrshift(same.data(), static_cast<size_t>(c.by));
    }
    EXPECT_STREQ(text.text(), c.after);
    EXPECT_EQ(same.all(), text.all());
    EXPECT_TRUE(text.intact() && same.intact());
  }
}

TEST(Edit, ReplacedBeginning) {
  const struct {
    const char *before, *src;
    int n;
    const char* after;
  } cases[] = {
      {"hello world", "HEY", 5, "HEY world"},
      {"xyzw", "ab", 3, "abw"},
      {"abc", "", 2, "c"},
      {"abc", "12", 0, "12abc"},
      {"abc", "123", 3, "123"},
      {"", "ab", 0, "ab"},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.before);
    const size_t length = std::strlen(c.src);
    const size_t n = static_cast<size_t>(c.n);
    Guarded text(c.before, length > n ? length - n : 0);
    EXPECT_EQ(zv_strnrepl(text.data(), c.src, c.n), text.data() + length);
    EXPECT_STREQ(text.text(), c.after);
    EXPECT_TRUE(text.intact());
  }
}

TEST(NoCase, Compare) {
  const struct {
    const char *a, *b;
    size_t n;
    int expected;
  } cases[] = {
      {"Path", "pATH", SIZE_MAX, 0}, {"", "", SIZE_MAX, 0},
      {"", "a", SIZE_MAX, -1},       {"a_", "aB", SIZE_MAX, -1},
      {"a_", "ab", SIZE_MAX, -1},    {"[", "a", SIZE_MAX, -1},
      {"z", "\xE9", SIZE_MAX, -1},   {"\xE9", "\xC9", SIZE_MAX, 1},
      {"ab", "abc", SIZE_MAX, -1},   {"B", "a", SIZE_MAX, 1},
      {"HTTP/1.0", "http/2", 5, 0},  {"abc", "abd", 2, 0},
      {"abc", "ABD", 3, -1},         {"a", "b", 0, 0},
      {"ab\0x", "AB\0y", 4, 0},      {"@", "`", SIZE_MAX, -1},
      {"{", "[", SIZE_MAX, 1},
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

TEST(NoCase, Search) {
  const struct {
    const char *text, *needle;
    int at;
  } cases[] = {
      {"Content-Length: 5", "content-length:", 0},
      {"abc", "", -1},
      {"", "", -1},
      {"", "a", -1},
      {"xxAbAbC", "aBaBc", 2},
      {"aaab", "AAB", 1},
      {"abc", "abcd", -1},
      {"ab\xE9", "\xE9", 2},
      {"ab\xE9", "\xC9", -1},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.needle);
    const char* const expected = c.at < 0 ? nullptr : c.text + c.at;
    EXPECT_EQ(zv_stristr(c.text, c.needle), expected);
  }

  const char path[] = "a Path\xE9";
  EXPECT_EQ(zv_strichr(path, 'P'), path + 2);
  EXPECT_EQ(zv_strichr(path, 'A'), path);
  EXPECT_EQ(zv_strichr(path, 't'), path + 4);
  EXPECT_EQ(zv_strichr(path, '\xE9'), path + 6);
  EXPECT_EQ(zv_strichr(path, 0xE9), path + 6);
  EXPECT_EQ(zv_strichr(path, '\0'), nullptr);
  EXPECT_EQ(zv_strichr(path, 'x'), nullptr);
  EXPECT_EQ(zv_strichr("", 'x'), nullptr);
}

// A find far behind others that nearly are one, in every place around the search's windows.
TEST(NoCase, SearchOfALongText) {
  for (size_t before = 480; before < 1600; before += 7) {
    const std::string text = std::string(before, 'n') + "Needle, nEEDLE";
    Guarded guarded(text);
    EXPECT_EQ(zv_stristr(guarded.data(), "nEEdle"), guarded.data() + before);
    EXPECT_EQ(zv_stristr(guarded.data(), "needle, needles"), nullptr);
    EXPECT_EQ(zv_strichr(guarded.data(), 'L'), guarded.data() + before + 4);
  }
}

// With a code page on Windows; on Linux where such a locale is installed.
TEST(NoCase, FollowsTheLocale) {
  const char* const names[] = {".1252", "de_DE.ISO-8859-1", "en_US.ISO-8859-1"};
  const char* locale = nullptr;
  for (const char* name : names)
    if (locale == nullptr) locale = std::setlocale(LC_CTYPE, name);
  if (locale == nullptr) GTEST_SKIP() << "no 8-bit locale here";
  Guarded name("caf\xC9 X");
  EXPECT_EQ(zv_stricmp(name.data(), "CAF\xE9 x"), 0);
  EXPECT_EQ(sign(zv_strnicmp(name.data(), "CAF\xE8", 4)), 1);
  EXPECT_EQ(zv_stristr(name.data(), "\xE9 x"), name.data() + 3);
  EXPECT_EQ(zv_strichr(name.data(), 0xE9), name.data() + 3);
  zv_strlwr(name.data());
  EXPECT_STREQ(name.text(), "caf\xE9 x");
  zv_strupr(name.data());
  EXPECT_STREQ(name.text(), "CAF\xC9 X");
  std::setlocale(LC_CTYPE, "C");
}

struct Replacement {
  std::string before, needle, repl, after;
};

void expect_replacement(int (*replace)(char*, const char*, const char*), const Replacement& c) {
  SCOPED_TRACE("'" + c.before + "': '" + c.needle + "' by '" + c.repl + "'");
  const size_t grows = c.after.size() - std::min(c.after.size(), c.before.size());
  Guarded text(c.before, grows);
  EXPECT_EQ(replace(text.data(), c.needle.c_str(), c.repl.c_str()), c.before != c.after ? 1 : 0);
  EXPECT_EQ(text.text(), c.after);
  EXPECT_TRUE(text.intact());
}

TEST(Replace, Table) {
  const Replacement exact[] = {
      {"a-b-d", "-", "--", "a--b--d"},
      {"a-b-d", "x", "y", "a-b-d"},
      {"aaa", "a", "aa", "aaaaaa"},
      {"aaaaa", "aa", "b", "bba"},
      {"aaaaa", "aa", "aaab", "aaabaaaba"},
      {"abab", "ab", "", ""},
      {"a//b////d", "//", "/", "a/b//d"},
      {"abc", "", "x", "abc"},
      {"", "a", "b", ""},
      {"abc", "abcd", "x", "abc"},
      {"xabx", "ab", "ba", "xbax"},
      {"aXa", "x", "y", "aXa"},
  };
  for (const Replacement& c : exact) expect_replacement(zv_strreplstr, c);
  const Replacement nocase[] = {
      {"One ONE one", "one", "2", "2 2 2"},
      {"One ONE one", "oNE", "Three", "Three Three Three"},
      {"one", "", "x", "one"},
  };
  for (const Replacement& c : nocase) expect_replacement(zv_strireplstr, c);

  Guarded same("aXa");
  EXPECT_EQ(zv_strreplstr(same.data(), "X", "X"), 1);
}

// The definition: one occurrence after the other, the search going on behind what was put in.
std::string replaced(std::string text, const std::string& needle, const std::string& repl) {
  for (size_t at = 0; (at = text.find(needle, at)) != std::string::npos; at += repl.size())
    text.replace(at, needle.size(), repl);
  return text;
}

TEST(Replace, AgreesWithItsDefinition) {
  std::mt19937 random(7);
  const auto text_of = [&](size_t length) {
    std::string text;
    while (length-- > 0) text += random() % 3 != 0 ? 'a' : 'b';
    return text;
  };
  for (int i = 0; i < 20000; ++i) {
    const std::string before = text_of(random() % 24);
    const std::string needle = text_of(1 + random() % 3);
    const std::string repl = text_of(random() % 5);
    if (needle == repl) continue;
    expect_replacement(zv_strreplstr, {before, needle, repl, replaced(before, needle, repl)});
    if (HasFailure()) return;
  }
}

TEST(Replace, ManyOccurrences) {
  std::string before, after;
  for (int i = 0; i < 5000; ++i) {
    before += "xa";
    after += "xyz";
  }
  expect_replacement(zv_strireplstr, {before, "A", "yz", after});
  expect_replacement(zv_strireplstr, {after, "YZ", "a", before});
}

TEST(Replace, Brackets) {
  for (const char* inside : {"abc", "", "("}) {
    Guarded text(inside, 2);
    EXPECT_EQ(zv_strbrkt(text.data(), '(', '\xE9'), 2);
    EXPECT_EQ(text.text(), std::string("(") + inside + "\xE9");
    EXPECT_EQ(zv_strubrkt(text.data(), '(', 0xE9), 0);  // not the value of any character
    EXPECT_EQ(zv_strubrkt(text.data(), '(', -23), 2);
    EXPECT_STREQ(text.text(), inside);
    EXPECT_TRUE(text.intact());
  }
  for (const char* kept : {"(abc", "abc)", "(", ")", "", "a()"}) {
    Guarded text(kept);
    EXPECT_EQ(zv_strubrkt(text.data(), '(', ')'), 0);
    EXPECT_STREQ(text.text(), kept);
  }
  Guarded quote("\"");
  EXPECT_EQ(zv_strubrkt(quote.data(), '"', '"'), 0);
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
  for (const auto& c : cases) {
    SCOPED_TRACE(std::string(c.before) + " after " + c.model);
    Guarded path(c.before);
    EXPECT_EQ(zv_strsynch(path.data(), c.model), std::strcmp(c.before, c.after) != 0 ? 1 : 0);
    EXPECT_STREQ(path.text(), c.after);
    EXPECT_TRUE(path.intact());
  }
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
  EXPECT_EQ(zv_wcstostr(back.data(), wide + 3), 0u);
  EXPECT_TRUE(back.intact());
}

}  // namespace
