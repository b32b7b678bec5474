// The bounded text that everything inside works in.
#include "frame/text_buffer.h"

#include <gtest/gtest.h>

#include <string>

namespace {

TEST(TextBuffer, RefusesWhatDoesNotFit) {
  zv::TextBuffer<4> text;
  EXPECT_TRUE(text.assign("abc"));
  EXPECT_FALSE(text.assign("abcd"));
  EXPECT_FALSE(text.append('d'));
  EXPECT_TRUE(text.append(""));
  EXPECT_STREQ(text.c_str(), "abc");

  text.shorten(1);
  EXPECT_TRUE(text.append("xy"));
  EXPECT_EQ(text.view(), "axy");
  text.shorten(9);
  EXPECT_EQ(text.size(), 3u);
}

TEST(TextBuffer, CutsOnlyWhenAsked) {
  zv::TextBuffer<4> text;
  EXPECT_TRUE(text.assign_cut("abc"));
  EXPECT_FALSE(text.assign_cut("abcd"));
  EXPECT_STREQ(text.c_str(), "abc");
  EXPECT_TRUE(text.assign_cut(""));
  EXPECT_TRUE(text.empty());
  EXPECT_EQ(text.back(), '\0');
}

TEST(TextBuffer, FillIsMeasuredAndBounded) {
  zv::TextBuffer<4> text;
  EXPECT_TRUE(text.fill([](char* room, size_t size) {
    EXPECT_EQ(size, 4u);
    room[0] = 'k';
    room[1] = '\0';
    return true;
  }));
  EXPECT_EQ(text.view(), "k");
  EXPECT_FALSE(text.fill([](char* room, size_t size) {
    std::memset(room, 'x', size);
    return true;
  }));
  EXPECT_TRUE(text.empty());
}

}  // namespace
