// Streams below the header: a destination is known by identity before it is emptied.
#include <gtest/gtest.h>

#include <cstdio>
#include <string>

#include "frame/owner.h"
#include "platform/platform.h"
#include "scratch_folder.h"

namespace {

TEST(FileIdentity, IsLookedAtBeforeTheFileIsEmptied) {
  const ScratchFolder scratch;
  const std::string kept = scratch.make_file("folder/kept", "content");
  const std::string again = scratch.path("folder/../folder/kept");
  {
    const zv::StreamPtr source(std::fopen(kept.c_str(), "rb"));
    const zv::StreamPtr same(zv::platform::open_unemptied(again.c_str()));
    const zv::StreamPtr made(zv::platform::open_unemptied(scratch.path("made").c_str()));
    ASSERT_TRUE(source && same && made);
    EXPECT_TRUE(zv::platform::same_file(source.get(), same.get()));
    EXPECT_FALSE(zv::platform::same_file(source.get(), made.get()));
  }
  EXPECT_EQ(scratch.content("folder/kept"), "content");

  zv::StreamPtr emptied(zv::platform::open_unemptied(kept.c_str()));
  EXPECT_TRUE(zv::platform::empty_file(emptied.get()));
  std::fputs("new", emptied.get());
  EXPECT_TRUE(zv::close_stream(emptied));
  EXPECT_EQ(scratch.content("folder/kept"), "new");

  EXPECT_FALSE(zv::StreamPtr(zv::platform::open_unemptied(scratch.path("folder").c_str())));
}

}  // namespace
