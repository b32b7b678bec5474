// String lists.
#include <gtest/gtest.h>

#include <string>
#include <tuple>

#include "string_list.h"

namespace {

TEST(StringList, Split) {
  const std::tuple<const char*, int, int, const char*> cases[] = {
      {"a\xE9z\xE9", '\xE9', 2, "a;z;"}, {"a;b;", ';', 2, "a;b;"}, {"abc", ';', 0, ""},
      {"a\0xy\0", 256, 2, "a;xy;"},      {"a;b", ';', 1, "a;"},    {";", ';', 1, ";"},
      {"a;;b;", ';', 3, "a;;b;"},        {"\0x\0", 0, 0, ""},      {nullptr, ';', 0, ""},
  };
  for (const auto& [text, sep, count, entries] : cases) {
    char** list = nullptr;
    EXPECT_EQ(zv_strlist(&list, text, sep), count);
    EXPECT_EQ(joined(list), entries);
    EXPECT_EQ(zv_strlist_free(list, count), 0);
  }
  EXPECT_EQ(zv_strlist_free(nullptr, -1), 0);
}

TEST(StringList, InsertAndRemove) {
  const std::tuple<int, int, const char*, const char*, const char*> cases[] = {
      {-1, 0, "x;a;b;", "a", "b;"},
      {2, 1, "a;x;b;", "b", "a;"},
      {2, 2, "a;b;x;", nullptr, "a;b;"},
      {-1, -1, "a;b;x;", nullptr, nullptr},
  };
  for (const auto& [n, pos, with, expected, without] : cases) {
    List longer("a;b;"), shorter("a;b;");
    EXPECT_EQ(zv_strlist_insert(&longer.list, n, pos, "x"), 1);
    EXPECT_EQ(longer.text(), with);
    if (pos < 0) continue;
    char* const removed = zv_strlist_remove(shorter.list, n, pos);
    EXPECT_STREQ(removed, expected);
    EXPECT_EQ(shorter.text(), without);
    zv_free(removed);
  }
  List own("a;b;");
  EXPECT_EQ(zv_strlist_insert(&own.list, -1, 0, own.list[1]), 1);
  EXPECT_EQ(own.text(), "b;a;b;");
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

TEST(StringList, ReplaceReduceAndCat) {
  List list("a;b;d;");
  EXPECT_EQ(zv_strlist_replace(list.list, 1, "longer"), 1);
  EXPECT_EQ(zv_strlist_replace(list.list, 2, list.list[2]), 1);
  EXPECT_EQ(list.text(), "a;longer;d;");
  EXPECT_EQ(zv_strlist_reduce(&list.list, -1, 1), 1);
  EXPECT_EQ(list.text(), "longer;");

  char** fresh = nullptr;
  char** other = nullptr;
  ASSERT_EQ(zv_strlist_insert(&fresh, 0, 0, "x"), 1);
  ASSERT_EQ(zv_strlist(&other, "d;e;", ';'), 2);
  ASSERT_EQ(zv_strlist_cat(&fresh, 1, other, -1), 3);
  EXPECT_EQ(joined(fresh), "x;d;e;");
  EXPECT_EQ(fresh[1], other[0]);  // moved, not copied
  other[0] = nullptr;
  EXPECT_EQ(zv_strlist_cat(&fresh, -1, other, 0), 3);
  zv_free(other);
  zv_strlist_free(fresh, 3);
}

TEST(StringList, FindAndCompare) {
  const List list("a;b;B;b;");
  EXPECT_EQ(zv_strlist_idx(list.list, -1, "b"), 1);
  EXPECT_EQ(zv_strlist_idx(list.list, 4, "B"), 2);
  EXPECT_EQ(zv_strlist_iidx(list.list, -1, "B"), 1);
  EXPECT_EQ(zv_strlist_idx(list.list, 1, "b"), -1);
  EXPECT_EQ(zv_strlist_idx(list.list, -1, "x"), -1);
  EXPECT_EQ(zv_strlist_iidx(nullptr, 0, "x"), -1);

  const std::tuple<const char*, const char*, int, int> cases[] = {
      {"z", "\xE9", -1, -1}, {"\xE9", "z", 1, 1}, {"ab", "ab", 0, 0}, {"ab", "AB", 1, 0}};
  for (auto [a, b, order, order_without_case] : cases) {
    EXPECT_EQ(zv_strlist_cmp(&a, &b), order);
    const int found = zv_strlist_icmp(&a, &b);
    EXPECT_EQ((found > 0) - (found < 0), order_without_case);
  }
}

// A third of the entries are distinct, and two thirds of those by case only.
TEST(StringList, SetKeepsTheFirst) {
  for (const unsigned count : {0u, 1u, 2u, 15u, 16u, 1000u}) {
    for (const bool nocase : {false, true}) {
      List list(""), kept("");
      for (unsigned i = 0; i < count; ++i) {
        const unsigned number = i * 2654435761U % (count / 3 + 1);
        const char* const names[] = {"name.", "Name.", "NAME."};
        const std::string text = names[number % 3] + std::to_string(number / 3);
        ASSERT_EQ(zv_strlist_insert(&list.list, -1, -1, text.c_str()), 1);
        if ((nocase ? zv_strlist_iidx : zv_strlist_idx)(kept.list, -1, text.c_str()) == -1) {
          ASSERT_EQ(zv_strlist_insert(&kept.list, -1, -1, text.c_str()), 1);
        }
      }
      const int n = nocase ? static_cast<int>(count) : -1;
      const int removed = (nocase ? zv_strlist_iset : zv_strlist_set)(list.list, n);
      EXPECT_EQ(list.text(), kept.text());
      EXPECT_EQ(zv_strlist_len(list.list) + removed, static_cast<int>(count));
    }
  }
}

}  // namespace
