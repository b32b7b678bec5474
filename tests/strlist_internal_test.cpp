// Lists when memory runs out, and the owner that lists are built with.
#include <gtest/gtest.h>

#include <string>

#include "failing_allocation.h"
#include "strlist/list_owner.h"

namespace {

TEST(StringListMemory, FailureLeavesTheListAsItWas) {
  char** list = nullptr;
  int result = 0;
  EXPECT_EQ(fail_each_allocation(
                [&] {
                  zv_strlist_free(list, -1);
                  result = zv_strlist(&list, "a;b;", ';');
                },
                [&] {
                  EXPECT_EQ(result, -1);
                  EXPECT_EQ(list, nullptr);
                }),
            3);
  ASSERT_EQ(result, 2);

  const auto unchanged = [&] {
    EXPECT_EQ(result, 0);
    ASSERT_EQ(zv_strlist_len(list), 2);
    EXPECT_STREQ(list[0], "a");
    EXPECT_STREQ(list[1], "b");
  };
  EXPECT_EQ(fail_each_allocation([&] { result = zv_strlist_insert(&list, -1, 0, "x"); }, unchanged),
            2);
  zv_free(zv_strlist_remove(list, 3, 0));
  char* other[] = {nullptr};
  EXPECT_EQ(
      fail_each_allocation([&] { result = zv_strlist_cat(&list, 2, other, 0) + 1; }, unchanged), 1);
  EXPECT_EQ(fail_each_allocation([&] { result = zv_strlist_replace(list, 0, "x"); }, unchanged), 1);
  EXPECT_STREQ(list[0], "x");

  fail_each_allocation([&] { EXPECT_EQ(zv_strlist_reduce(&list, -1, 1), 1); },
                       [&] {
                         EXPECT_STREQ(list[0], "b");
                         EXPECT_EQ(list[1], nullptr);
                         EXPECT_EQ(zv_strlist_insert(&list, 1, 0, "a"), 1);
                       });
  EXPECT_EQ(zv_strlist_free(list, -1), 0);
}

TEST(StringListMemory, SetNeedsNone) {
  std::string text;
  for (int i = 0; i < 300; ++i) text += std::to_string(i % 100) + ';';
  char** list = nullptr;
  ASSERT_EQ(zv_strlist(&list, text.c_str(), ';'), 300);
  const FailingAllocation failing(0);
  EXPECT_EQ(zv_strlist_set(list, -1), 200);
  EXPECT_TRUE(failing.happened());
  EXPECT_EQ(zv_strlist_len(list), 100);
  for (int i = 0; i < 100; ++i) EXPECT_STREQ(list[i], std::to_string(i).c_str());
  zv_strlist_free(list, 100);
}

TEST(ListOwner, BuildsAndHandsOver) {
  zv::ListOwner owner;
  for (int i = 0; i < 100; ++i) ASSERT_TRUE(owner.append(std::to_string(i)));
  EXPECT_EQ(owner.end() - owner.begin(), 100);
  char** const list = owner.release();
  EXPECT_EQ(owner.count(), 0);
  EXPECT_EQ(zv_strlist_len(list), 100);

  zv::ListOwner again(list);
  ASSERT_TRUE(again.append("last"));
  EXPECT_STREQ(again[100], "last");
  EXPECT_EQ(again.end()[0], nullptr);

  zv::ListOwner none;
  char** const empty = none.release();
  ASSERT_NE(empty, nullptr);
  EXPECT_EQ(zv_strlist_len(empty), 0);
  zv_strlist_free(empty, 0);
}

TEST(ListOwner, SurvivesEveryFailure) {
  char** list = nullptr;
  const auto build = [&] {
    zv_strlist_free(list, -1);
    list = nullptr;
    zv::ListOwner owner;
    for (int i = 0; i < 10; ++i)
      if (!owner.append("entry") && owner.count() != i) ADD_FAILURE() << "counted what failed";
    list = owner.release();
  };
  // Ten texts, two arrays and the cut of the last; each failure costs one entry at most.
  EXPECT_EQ(fail_each_allocation(build, [&] { EXPECT_GE(zv_strlist_len(list), 9); }), 13);
  EXPECT_EQ(zv_strlist_len(list), 10);
  zv_strlist_free(list, 10);

  const FailingAllocation failing(0);
  zv::ListOwner none;
  EXPECT_EQ(none.release(), nullptr);
}

}  // namespace
