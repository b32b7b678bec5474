// The fast path of normalisation, held to the full way.
#include "path/normalize.h"

#include <gtest/gtest.h>

#include <string>

namespace {

TEST(Normalize, TheFastPathAgreesWithTheFullWay) {
  const std::string letters = "a./\\:~";
  int fast = 0;
  for (int number = 0; number < 7 * 7 * 7 * 7 * 7 * 7 * 7; ++number) {
    std::string path;
    for (int rest = number; rest % 7 != 0; rest /= 7)
      path += letters[static_cast<size_t>(rest % 7) - 1];
    zv::PathBuffer text;
    char out[ZV_PATH_MAX];
    if (!text.assign(path) || !zv::normalize_fast(text, out)) continue;
    ++fast;
    zv::JoinedPath full;
    ASSERT_TRUE(zv::normalize_fully(text, full)) << path;
    ASSERT_EQ(full.view(), out) << path;
  }
  EXPECT_GT(fast, 10000);
}

}  // namespace
