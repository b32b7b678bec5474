// The bounded text that everything inside works in.
#include "frame/text_buffer.h"

#include <gtest/gtest.h>

namespace {

TEST(TextBuffer, HoldsWhatFits) {
  zv::TextBuffer<4> text;
  EXPECT_TRUE(text.assign("abc"));
  EXPECT_FALSE(text.assign("abcd") || text.append('d') || text.append("d"));
  text.shorten(9);
  EXPECT_STREQ(text.c_str(), "abc");
  text.shorten(1);
  EXPECT_TRUE(text.append("xy"));
  EXPECT_STREQ(text.c_str(), "axy");

  EXPECT_TRUE(text.assign_cut("uvw"));
  EXPECT_FALSE(text.assign_cut("abcd"));  // keeps what fits
  EXPECT_EQ(text.view(), "abc");

  const auto filled_with = [&text](const char* bytes) {
    return text.fill([bytes](char* room, size_t size) { return std::memcpy(room, bytes, size); });
  };
  EXPECT_TRUE(filled_with("k\0##"));
  EXPECT_EQ(text.view(), "k");
  EXPECT_FALSE(filled_with("####"));  // without an end
  EXPECT_TRUE(text.empty() && text.back() == '\0');
}

}  // namespace
