// Folders held open below the header, where another process swaps one for a link.
#include <gtest/gtest.h>

#include <filesystem>
#include <string>

#include "platform/platform.h"
#include "scratch_folder.h"

namespace {

#ifndef _WIN32
// The Windows build works by paths, over the stand-in of tree_swap_test.cpp; Wine knows no links.
TEST(FolderHeldOpen, IsNotLedAwayByALinkInItsPlace) {
  namespace platform = zv::platform;
  const ScratchFolder scratch;
  scratch.make_file("outside/file", "kept");
  scratch.make_file("top/d/file");
  const intptr_t top = platform::folder_open(scratch.path("top").c_str());
  const intptr_t held = platform::folder_open_below(top, "d", "");
  ASSERT_NE(held, platform::no_folder);

  std::filesystem::rename(scratch.path("top/d"), scratch.path("top/moved"));
  std::filesystem::create_symlink("../outside", scratch.path("top/d"));
  EXPECT_EQ(platform::folder_open_below(top, "d", ""), platform::no_folder);
  EXPECT_EQ(platform::remove_below(held, "file", ""), platform::Removal::removed);
  EXPECT_EQ(platform::remove_below(held, "file", ""), platform::Removal::gone);
  EXPECT_EQ(platform::remove_below(top, "d", ""), platform::Removal::removed);
  EXPECT_EQ(platform::remove_below(top, "moved", ""), platform::Removal::removed);
  platform::folder_close(held);
  platform::folder_close(top);
  EXPECT_EQ(scratch.content("outside/file"), "kept");
}
#endif

}  // namespace
