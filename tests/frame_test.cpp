// Memory operations and version texts.
#include <gtest/gtest.h>

#include <cstring>

#include "zarvo.h"

namespace {

TEST(Memory, SizeZeroIsARealBlock) {
  int ok = -1;
  void* const blocks[] = {zv_malloc(0), zv_calloc(0), zv_realloc(nullptr, 0, &ok),
                          zv_dalloc("ab", 0), zv_dalloc(nullptr, 16)};
  for (void* const block : blocks) ASSERT_NE(block, nullptr);
  EXPECT_EQ(ok, 1);
  EXPECT_EQ(*static_cast<char*>(blocks[1]), '\0');
  EXPECT_EQ(*static_cast<char*>(blocks[3]), 'a');
  std::memset(blocks[4], 1, 16);
  for (void* const block : blocks) {
    *static_cast<char*>(block) = 'x';
    EXPECT_EQ(zv_free(block), 0);
  }
  EXPECT_EQ(zv_free(nullptr), 0);
}

TEST(Memory, FailedResizeKeepsTheBlock) {
  int ok = -1;
  char* const block = static_cast<char*>(zv_dalloc("kept", 5));
  volatile size_t too_much = SIZE_MAX / 2;
  EXPECT_EQ(zv_realloc(block, too_much, &ok), block);
  EXPECT_EQ(ok, 0);
  EXPECT_STREQ(block, "kept");
  zv_free(block);
}

TEST(Version, Split) {
  const struct {
    const char* text;
    int major, minor, patch;
    const char* release;
  } cases[] = {
      {"1.0.0b", 1, 0, 0, "Beta"},
      {"2.5", 2, 5, 0, "Release"},
      {"1.2.3.4", 1, 2, 3, "Release"},
      {"4.1e", 4, 1, 0, "Educational"},
      {"1.0.0B", 1, 0, 0, "Release"},
      {"b", 0, 0, 0, "Beta"},
      {"1.0.0rc", 1, 0, 0, "Custom"},
      {"1..3", 1, 0, 3, "Release"},
      {" -7.x9.2a", -7, 0, 2, "Alpha"},
      {"1.2.000000000000000000000000000d", 1, 2, 0, "Release"},  // the letter is the 32nd character
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.text);
    int major = -9, minor = -9, patch = -9;
    char release[12] = "";
    EXPECT_EQ(zv_split_version(c.text, &major, &minor, &patch, release), 1);
    EXPECT_EQ(major, c.major);
    EXPECT_EQ(minor, c.minor);
    EXPECT_EQ(patch, c.patch);
    EXPECT_STREQ(release, c.release);
    EXPECT_EQ(zv_split_version(c.text, nullptr, nullptr, nullptr, nullptr), 1);
  }
  int major = -9;
  char release[12] = "kept";
  EXPECT_EQ(zv_split_version("", &major, nullptr, nullptr, release), 0);
  EXPECT_EQ(major, -9);
  EXPECT_STREQ(release, "kept");
  EXPECT_STREQ(zarvo_version(), "1.0.0b");
}

}  // namespace
