// The owner that lists are built with.
#include <gtest/gtest.h>

#include <string>

#include "strlist/list_owner.h"

namespace {

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

}  // namespace
