// One path: access, status, making a directory, the hidden attribute.
#include <gtest/gtest.h>

#include <algorithm>
#include <string>

#include "scratch_folder.h"
#include "wine.h"
#include "zarvo.h"

#ifndef _WIN32
#include <sys/xattr.h>
#endif

namespace {

int kind_of(const std::string& path) {
  struct _stat64 st;
  return zv_stat(path.c_str(), &st) == 0 ? st.st_mode & 0xF000 : -1;
}

TEST(Status, AccessNeverTestsExecution) {
  const ScratchFolder scratch;
  const std::string file = scratch.make_file("plain.txt", "x");
  for (int mode = 0; mode < 8; ++mode) {
    EXPECT_EQ(zv_access(file.c_str(), mode), 0) << mode;
    EXPECT_EQ(zv_access(scratch.path("missing").c_str(), mode), -1) << mode;
  }
}

TEST(Status, KindSizeAndEitherSeparator) {
  const ScratchFolder scratch;
  const std::string file = scratch.make_file("five", "12345");
  struct _stat64 st;
  ASSERT_EQ(zv_stat(file.c_str(), &st), 0);
  EXPECT_EQ(st.st_size, 5);
  EXPECT_EQ(kind_of(file), 0x8000);
  EXPECT_EQ(kind_of(scratch.path("missing")), -1);

  std::string sub = scratch.path("made");
  std::replace(sub.begin(), sub.end(), '/', '\\');
  EXPECT_EQ(zv_mkdir(sub.c_str()), 0);
  EXPECT_EQ(zv_mkdir(sub.c_str()), -1);
  EXPECT_EQ(kind_of(sub), 0x4000);
  EXPECT_EQ(zv_access(sub.c_str(), 0), 0);
  EXPECT_TRUE(scratch.exists("made"));
  EXPECT_EQ(zv_mkdir((sub + "\\no\\parent").c_str()), -1);
  EXPECT_EQ(kind_of(sub + "\\" + std::string(ZV_PATH_MAX, 'x')), -1);
}

TEST(Status, Hidden) {
  const ScratchFolder scratch;
  const std::string folder = scratch.make_folder("folder");
  const std::string file = scratch.make_file("file");
  if (zv_set_hidden(file.c_str(), 1) == 0) GTEST_SKIP() << "no attributes on this file system";

  for (const std::string& path : {folder, file}) {
    for (const int hidden : {0, 0, 5, 1, 0}) {
      EXPECT_EQ(zv_set_hidden(path.c_str(), hidden), 1);
      EXPECT_EQ(zv_get_hidden(path.c_str()), hidden != 0) << path;
    }
  }
  // A dot is no attribute, except to Wine.
  EXPECT_EQ(zv_get_hidden(scratch.make_file(".dotted").c_str()), under_wine());
  EXPECT_EQ(zv_get_hidden(scratch.path("missing").c_str()), 0);
  EXPECT_EQ(zv_set_hidden(scratch.path("missing").c_str(), 0), 0);
  EXPECT_EQ(zv_set_hidden(scratch.path("missing").c_str(), 1), 0);
}

#ifndef _WIN32
// The attribute as others write it: their bits stay, and so does what is not plain hex text.
TEST(Status, HiddenAmongOtherAttributes) {
  struct Case {
    std::string before;
    int hidden, can_set;
    std::string set, cleared;  // the value after each
  };
  const std::string stranger("0x2\0more", 8);
  const Case cases[] = {
      {"0x2", 1, 1, "0x2", "none"},
      {"0x22", 1, 1, "0x22", "0x20"},
      {"0x20", 0, 1, "0x22", "0x20"},
      {"0xFD", 0, 1, "0xff", "0xfd"},
      {"hidden", 0, 0, "hidden", "hidden"},
      {"2", 0, 0, "2", "2"},
      {"0x", 0, 0, "0x", "0x"},
      {"0x2g", 0, 0, "0x2g", "0x2g"},
      {stranger, 0, 0, stranger, stranger},
  };
  const ScratchFolder scratch;
  const std::string file = scratch.make_file("file");
  if (zv_set_hidden(file.c_str(), 1) == 0) GTEST_SKIP() << "no attributes on this file system";
  const char* const name = "user.DOSATTRIB";
  const auto value = [&] {
    char room[32] = "";
    const ssize_t size = getxattr(file.c_str(), name, room, sizeof room);
    return size < 0 ? std::string("none") : std::string(room, static_cast<size_t>(size));
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.before);
    ASSERT_EQ(setxattr(file.c_str(), name, c.before.data(), c.before.size(), 0), 0);
    EXPECT_EQ(zv_get_hidden(file.c_str()), c.hidden);
    EXPECT_EQ(zv_set_hidden(file.c_str(), 1), c.can_set);
    EXPECT_EQ(value(), c.set);
    EXPECT_EQ(zv_set_hidden(file.c_str(), 0), 1);
    EXPECT_EQ(value(), c.cleared);
  }
}
#endif

}  // namespace
