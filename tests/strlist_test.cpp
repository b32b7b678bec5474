// String lists.
#include <gtest/gtest.h>

#include <cstdlib>
#include <string>
#include <vector>

#include "zarvo.h"

using namespace std::string_literals;

namespace {

using Texts = std::vector<std::string>;

// A list for one test, with its entries in view.
class List {
 public:
  List(const Texts& texts = {}) {
    EXPECT_EQ(zv_strlist(&list, nullptr, 0), 0);
    for (const std::string& text : texts)
      EXPECT_EQ(zv_strlist_insert(&list, -1, -1, text.c_str()), 1);
  }
  ~List() { EXPECT_EQ(zv_strlist_free(list, -1), 0); }
  List(const List&) = delete;

  Texts texts() const { return {list, list + zv_strlist_len(list)}; }
  int count() const { return zv_strlist_len(list); }

  char** list = nullptr;
};

TEST(StringList, Split) {
  const struct {
    std::string text;
    int sep;
    Texts entries;
  } cases[] = {
      {"a;b;", ';', {"a", "b"}},
      {"a;b", ';', {"a"}},
      {"a;;b;", ';', {"a", "", "b"}},
      {"abc", ';', {}},
      {"", ';', {}},
      {";", ';', {""}},
      {"a\0xy\0"s, 0, {"a", "xy"}},
      {"\0x\0"s, 0, {}},
      {"a\xE9z\xE9", '\xE9', {"a", "z"}},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.text);
    char** list = nullptr;
    EXPECT_EQ(zv_strlist(&list, c.text.c_str(), c.sep), static_cast<int>(c.entries.size()));
    ASSERT_NE(list, nullptr);
    EXPECT_EQ(Texts(list, list + zv_strlist_len(list)), c.entries);
    zv_strlist_free(list, static_cast<int>(c.entries.size()));
  }

  char** none = nullptr;
  EXPECT_EQ(zv_strlist(&none, nullptr, ';'), 0);
  ASSERT_NE(none, nullptr);
  EXPECT_EQ(none[0], nullptr);
  zv_strlist_free(none, 0);
  EXPECT_EQ(zv_strlist_free(nullptr, -1), 0);
}

TEST(StringList, Insert) {
  const struct {
    int n, pos;
    Texts entries;
  } cases[] = {
      {-1, -1, {"a", "b", "x"}}, {2, -1, {"a", "b", "x"}}, {2, 2, {"a", "b", "x"}},
      {-1, 0, {"x", "a", "b"}},  {2, 1, {"a", "x", "b"}},
  };
  for (const auto& c : cases) {
    List list({"a", "b"});
    EXPECT_EQ(zv_strlist_insert(&list.list, c.n, c.pos, "x"), 1);
    EXPECT_EQ(list.texts(), c.entries);
  }

  List own({"a", "b"});
  EXPECT_EQ(zv_strlist_insert(&own.list, -1, 0, own.list[1]), 1);
  EXPECT_EQ(own.texts(), Texts({"b", "a", "b"}));

  char** fresh = nullptr;
  EXPECT_EQ(zv_strlist_insert(&fresh, 0, 0, "x"), 1);
  EXPECT_EQ(zv_strlist_len(fresh), 1);
  zv_strlist_free(fresh, 1);
}

TEST(StringList, Remove) {
  const struct {
    int n, pos;
    const char* removed;
    Texts entries;
  } cases[] = {
      {-1, 0, "a", {"b", "d"}},
      {3, 1, "b", {"a", "d"}},
      {-1, 2, "d", {"a", "b"}},
      {3, 3, nullptr, {"a", "b", "d"}},
  };
  for (const auto& c : cases) {
    List list({"a", "b", "d"});
    char* const removed = zv_strlist_remove(list.list, c.n, c.pos);
    EXPECT_STREQ(removed, c.removed);
    EXPECT_EQ(list.texts(), c.entries);
    zv_free(removed);
  }
}

TEST(StringList, ReplaceAndReduce) {
  List list({"a", "b", "d"});
  EXPECT_EQ(zv_strlist_replace(list.list, 1, "longer"), 1);
  EXPECT_EQ(zv_strlist_replace(list.list, 2, list.list[2]), 1);
  EXPECT_EQ(list.texts(), Texts({"a", "longer", "d"}));

  EXPECT_EQ(zv_strlist_reduce(&list.list, -1, 1), 1);
  EXPECT_EQ(list.texts(), Texts({"longer"}));
  EXPECT_EQ(zv_strlist_reduce(&list.list, 1, 0), 1);
  EXPECT_EQ(list.texts(), Texts({"longer"}));

  List pair({"a", "b"});
  EXPECT_EQ(zv_strlist_reduce(&pair.list, 2, 1), 1);
  EXPECT_EQ(pair.texts(), Texts({"b"}));
}

TEST(StringList, CatMovesTheTexts) {
  List list({"a", "b"});
  char** other = nullptr;
  ASSERT_EQ(zv_strlist(&other, "d;e;", ';'), 2);
  EXPECT_EQ(zv_strlist_cat(&list.list, -1, other, -1), 4);
  EXPECT_EQ(list.texts(), Texts({"a", "b", "d", "e"}));
  EXPECT_EQ(list.list[2], other[0]);
  zv_free(other);

  List empty;
  EXPECT_EQ(zv_strlist_cat(&list.list, 4, empty.list, 0), 4);
  EXPECT_EQ(list.count(), 4);

  char** fresh = nullptr;
  ASSERT_EQ(zv_strlist(&other, "d;", ';'), 1);
  EXPECT_EQ(zv_strlist_cat(&fresh, 0, other, 1), 1);
  EXPECT_STREQ(fresh[0], "d");
  EXPECT_EQ(fresh[1], nullptr);
  zv_free(other);
  zv_strlist_free(fresh, 1);
}

TEST(StringList, FindAndCompare) {
  List list({"a", "b", "B", "b"});
  EXPECT_EQ(zv_strlist_idx(list.list, -1, "b"), 1);
  EXPECT_EQ(zv_strlist_idx(list.list, 4, "B"), 2);
  EXPECT_EQ(zv_strlist_iidx(list.list, -1, "B"), 1);
  EXPECT_EQ(zv_strlist_idx(list.list, 1, "b"), -1);
  EXPECT_EQ(zv_strlist_idx(list.list, -1, "x"), -1);
  EXPECT_EQ(zv_strlist_iidx(nullptr, 0, "x"), -1);
  EXPECT_EQ(zv_strlist_idx(List().list, -1, ""), -1);

  const char* const texts[] = {"z", "\xE9", "ab", "AB"};
  const char** const pair = const_cast<const char**>(texts);
  EXPECT_EQ(zv_strlist_cmp(pair, pair + 1), -1);
  EXPECT_EQ(zv_strlist_cmp(pair + 1, pair), 1);
  EXPECT_EQ(zv_strlist_cmp(pair + 2, pair + 2), 0);
  EXPECT_EQ(zv_strlist_cmp(pair + 2, pair + 3), 1);
  EXPECT_EQ(zv_strlist_icmp(pair + 2, pair + 3), 0);
  EXPECT_GT(zv_strlist_icmp(pair + 1, pair), 0);
}

TEST(StringList, SetKeepsTheFirst) {
  const struct {
    Texts before, exact, nocase;
  } cases[] = {
      {{"a", "a", "a", "b", "a"}, {"a", "b"}, {"a", "b"}},
      {{"Txt", "TXT", "txt"}, {"Txt", "TXT", "txt"}, {"Txt"}},
      {{"", "x", ""}, {"", "x"}, {"", "x"}},
      {{"a"}, {"a"}, {"a"}},
      {{}, {}, {}},
  };
  for (const auto& c : cases) {
    List exact(c.before), nocase(c.before);
    EXPECT_EQ(zv_strlist_set(exact.list, -1), static_cast<int>(c.before.size() - c.exact.size()));
    EXPECT_EQ(zv_strlist_iset(nocase.list, nocase.count()),
              static_cast<int>(c.before.size() - c.nocase.size()));
    EXPECT_EQ(exact.texts(), c.exact);
    EXPECT_EQ(nocase.texts(), c.nocase);
  }
}

// A list of `count` entries of which a third are distinct, and two thirds of those by case only.
Texts repeating(unsigned count) {
  Texts texts;
  for (unsigned i = 0; i < count; ++i) {
    const unsigned number = i * 2654435761U % (count / 3 + 1);
    const char* const names[] = {"name.", "Name.", "NAME."};
    texts.push_back(names[number % 3] + std::to_string(number / 3));
  }
  return texts;
}

// The definition, entry by entry.
Texts without_duplicates(const Texts& before, bool nocase) {
  Texts kept;
  for (const std::string& text : before) {
    bool seen = false;
    for (const std::string& other : kept)
      seen |= nocase ? zv_stricmp(other.c_str(), text.c_str()) == 0 : other == text;
    if (!seen) kept.push_back(text);
  }
  return kept;
}

TEST(StringList, LargeSetIsTheSame) {
  for (unsigned count : {15u, 16u, 17u, 1000u}) {
    const Texts before = repeating(count);
    List exact(before), nocase(before);
    EXPECT_GT(zv_strlist_set(exact.list, -1), 0);
    EXPECT_GT(zv_strlist_iset(nocase.list, -1), 0);
    EXPECT_EQ(exact.texts(), without_duplicates(before, false));
    EXPECT_EQ(nocase.texts(), without_duplicates(before, true));
  }
}

}  // namespace
