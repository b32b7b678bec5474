// String lists.
#include "string_list.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

using namespace std::string_literals;

namespace {

TEST(StringList, Split) {
  const struct {
    std::string text;
    int sep, count;
    const char* entries;
  } cases[] = {
      {"a;b;", ';', 2, "a;b;"},    {"a;b", ';', 1, "a;"}, {"a;;b;", ';', 3, "a;;b;"},
      {"abc", ';', 0, ""},         {"", ';', 0, ""},      {";", ';', 1, ";"},
      {"a\0xy\0"s, 0, 2, "a;xy;"}, {"\0x\0"s, 0, 0, ""},  {"a\xE9z\xE9", '\xE9', 2, "a;z;"},
  };
  for (const auto& c : cases) {
    char** list = nullptr;
    EXPECT_EQ(zv_strlist(&list, c.text.c_str(), c.sep), c.count);
    EXPECT_EQ(joined(list), c.entries);
    EXPECT_EQ(zv_strlist_free(list, c.count), 0);
  }
  char** none = nullptr;
  EXPECT_EQ(zv_strlist(&none, nullptr, ';'), 0);
  EXPECT_EQ(joined(none), "");
  EXPECT_EQ(zv_strlist_free(none, 0), 0);
  EXPECT_EQ(zv_strlist_free(nullptr, -1), 0);
}

TEST(StringList, InsertAndRemove) {
  const struct {
    int n, pos;
    const char *with, *removed, *without;
  } cases[] = {
      {-1, 0, "x;a;b;", "a", "b;"},
      {2, 1, "a;x;b;", "b", "a;"},
      {2, 2, "a;b;x;", nullptr, "a;b;"},
      {-1, -1, "a;b;x;", nullptr, nullptr},
  };
  for (const auto& c : cases) {
    List longer("a;b;"), shorter("a;b;");
    EXPECT_EQ(zv_strlist_insert(&longer.list, c.n, c.pos, "x"), 1);
    EXPECT_EQ(longer.text(), c.with);
    if (c.pos < 0) continue;
    char* const removed = zv_strlist_remove(shorter.list, c.n, c.pos);
    EXPECT_STREQ(removed, c.removed);
    EXPECT_EQ(shorter.text(), c.without);
    zv_free(removed);
  }
  List own("a;b;");
  EXPECT_EQ(zv_strlist_insert(&own.list, -1, 0, own.list[1]), 1);
  EXPECT_EQ(own.text(), "b;a;b;");
  char** fresh = nullptr;
  EXPECT_EQ(zv_strlist_insert(&fresh, 0, 0, "x"), 1);
  EXPECT_EQ(joined(fresh), "x;");
  zv_strlist_free(fresh, 1);
}

// The list ends after that many entries, and those after it stay as they are.
TEST(StringList, CountBelowTheRealOne) {
  List list("a;b;a;d;");
  char* const after[] = {list.list[2], list.list[3]};
  EXPECT_EQ(zv_strlist_set(list.list, 2), 0);
  EXPECT_EQ(zv_strlist_remove(list.list, 2, 2), nullptr);
  zv_free(zv_strlist_remove(list.list, 2, 0));
  EXPECT_EQ(list.text(), "b;");
  EXPECT_EQ(list.list[2], after[0]);
  ASSERT_EQ(zv_strlist_insert(&list.list, 1, 0, "b"), 1);
  EXPECT_EQ(list.list[3], after[1]);
  list.list[2] = after[0];
  EXPECT_EQ(zv_strlist_set(list.list, 2), 1);
  EXPECT_EQ(list.text(), "b;");
  EXPECT_EQ(list.list[2], after[0]);
  for (char* const text : after) zv_free(text);
}

TEST(StringList, ReplaceAndReduce) {
  List list("a;b;d;");
  EXPECT_EQ(zv_strlist_replace(list.list, 1, "longer"), 1);
  EXPECT_EQ(zv_strlist_replace(list.list, 2, list.list[2]), 1);
  EXPECT_EQ(list.text(), "a;longer;d;");
  EXPECT_EQ(zv_strlist_reduce(&list.list, -1, 1), 1);
  EXPECT_EQ(list.text(), "longer;");
  EXPECT_EQ(zv_strlist_reduce(&list.list, 1, 0), 1);
  EXPECT_EQ(list.text(), "longer;");
}

TEST(StringList, CatMovesTheTexts) {
  List list("a;b;");
  char** other = nullptr;
  ASSERT_EQ(zv_strlist(&other, "d;e;", ';'), 2);
  ASSERT_EQ(zv_strlist_cat(&list.list, -1, other, -1), 4);
  EXPECT_EQ(list.text(), "a;b;d;e;");
  EXPECT_EQ(list.list[2], other[0]);
  other[0] = nullptr;
  EXPECT_EQ(zv_strlist_cat(&list.list, 4, other, 0), 4);
  zv_free(other);

  char** fresh = nullptr;
  ASSERT_EQ(zv_strlist(&other, "d;", ';'), 1);
  ASSERT_EQ(zv_strlist_cat(&fresh, 0, other, 1), 1);
  EXPECT_EQ(joined(fresh), "d;");
  zv_free(other);
  zv_strlist_free(fresh, 1);
}

TEST(StringList, FindAndCompare) {
  const List list("a;b;B;b;");
  EXPECT_EQ(zv_strlist_idx(list.list, -1, "b"), 1);
  EXPECT_EQ(zv_strlist_idx(list.list, 4, "B"), 2);
  EXPECT_EQ(zv_strlist_iidx(list.list, -1, "B"), 1);
  EXPECT_EQ(zv_strlist_idx(list.list, 1, "b"), -1);
  EXPECT_EQ(zv_strlist_idx(list.list, -1, "x"), -1);
  EXPECT_EQ(zv_strlist_iidx(nullptr, 0, "x"), -1);

  const char* texts[] = {"z", "\xE9", "ab", "AB"};
  EXPECT_EQ(zv_strlist_cmp(texts, texts + 1), -1);
  EXPECT_EQ(zv_strlist_cmp(texts + 1, texts), 1);
  EXPECT_EQ(zv_strlist_cmp(texts + 2, texts + 2), 0);
  EXPECT_EQ(zv_strlist_cmp(texts + 2, texts + 3), 1);
  EXPECT_EQ(zv_strlist_icmp(texts + 2, texts + 3), 0);
  EXPECT_GT(zv_strlist_icmp(texts + 1, texts), 0);
}

// The entries of which none before is equal.
std::string without_duplicates(const std::vector<std::string>& before, bool nocase) {
  List kept;
  for (const std::string& text : before)
    if ((nocase ? zv_strlist_iidx : zv_strlist_idx)(kept.list, -1, text.c_str()) == -1)
      zv_strlist_insert(&kept.list, -1, -1, text.c_str());
  return kept.text();
}

// A third of the entries are distinct, and two thirds of those by case only.
TEST(StringList, SetKeepsTheFirst) {
  for (const unsigned count : {0u, 1u, 2u, 5u, 15u, 16u, 17u, 1000u}) {
    std::vector<std::string> before;
    List exact, nocase;
    for (unsigned i = 0; i < count; ++i) {
      const unsigned number = i * 2654435761U % (count / 3 + 1);
      const char* const names[] = {"name.", "Name.", "NAME."};
      before.push_back(names[number % 3] + std::to_string(number / 3));
      for (List* const list : {&exact, &nocase})
        ASSERT_EQ(zv_strlist_insert(&list->list, -1, -1, before.back().c_str()), 1);
    }
    const int removed = zv_strlist_set(exact.list, -1);
    EXPECT_EQ(exact.text(), without_duplicates(before, false));
    EXPECT_EQ(zv_strlist_len(exact.list) + removed, static_cast<int>(count));
    zv_strlist_iset(nocase.list, static_cast<int>(count));
    EXPECT_EQ(nocase.text(), without_duplicates(before, true));
  }
  List list(";Txt;TXT;;txt;");
  EXPECT_EQ(zv_strlist_set(list.list, -1), 1);
  EXPECT_EQ(zv_strlist_iset(list.list, 4), 2);
  EXPECT_EQ(list.text(), ";Txt;");
}

}  // namespace
