// The private environment.
#include <gtest/gtest.h>

#include <string>

#include "fixtures/private_values.h"

namespace {

class Environment : public testing::Test {
 protected:
  void SetUp() override { zv_putenv_private(nullptr, nullptr, 0); }
  void TearDown() override { zv_putenv_private(nullptr, nullptr, 0); }
};

TEST_F(Environment, PutAndGet) {
  EXPECT_EQ(private_values("A"), "none");
  const struct {
    const char* name;
    const char* value;
    int append;
    int result;
    const char* values;  // of the variable afterwards
  } steps[] = {
      {"A", nullptr, 0, 1, "none"},   {"A", "x", 0, 1, "x|"},
      {"a", "y", 1, 1, "x|y|"},       {"A", "x", 1, 1, "x|y|"},
      {"A", "X", 1, 1, "x|y|X|"},     {"A", "x|y", 1, 1, "x|y|X|x|y|"},
      {"AB", "z", 1, 1, "z|"},        {"", "empty name", 0, 1, "empty name|"},
      {"A", "alone", 0, 1, "alone|"}, {"A", "bad\x1E", 1, 0, "alone|"},
      {"A", "\x1E", 0, 0, "alone|"},  {"\x1E", nullptr, 0, 0, "none"},
      {"ab", nullptr, 1, 1, "none"},  {"A", "one more", 1, 1, "alone|one more|"},
  };
  for (const auto& step : steps) {
    SCOPED_TRACE(std::string(step.name) + "=" + (step.value != nullptr ? step.value : "(none)"));
    EXPECT_EQ(zv_putenv_private(step.name, step.value, step.append), step.result);
    EXPECT_EQ(private_values(step.name), step.values);
  }
  EXPECT_EQ(private_values(""), "empty name|");
  EXPECT_EQ(zv_putenv_private(nullptr, "ignored\x1E", 1), 1);
  EXPECT_EQ(private_values("A"), "none");

  for (const char* const value : {"", "", "b"}) zv_putenv_private("A", value, 1);
  char* const block = zv_getenv_private("a");
  zv_putenv_private("A", "changed", 0);
  EXPECT_EQ(std::string(block, 4), std::string("\0b\0\0", 4));
  zv_free(block);
}

TEST_F(Environment, ManyVariables) {
  constexpr int count = 2000;
  const auto name = [](int i) { return "Variable" + std::to_string(i); };
  for (int i = 0; i < count; ++i) zv_putenv_private(name(i).c_str(), name(i).c_str(), 0);
  for (int i = 0; i < count; i += 3) zv_putenv_private(name(i).c_str(), nullptr, 0);
  for (int i = 1; i < count; i += 3) zv_putenv_private(name(i).c_str(), "more", 1);
  for (int i = 0; i < count; ++i) {
    const std::string expected[] = {"none", name(i) + "|more|", name(i) + "|"};
    ASSERT_EQ(private_values("vARIABLE" + std::to_string(i)), expected[i % 3]);
  }
}

}  // namespace
