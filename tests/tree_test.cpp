// Chains of folders made, trees removed.
#include <gtest/gtest.h>

#include <algorithm>
#include <string>

#include "scratch_folder.h"
#include "wine.h"
#include "zarvo.h"

namespace {

TEST(MakePath, EveryFolderThatIsMissing) {
  const ScratchFolder scratch;
  EXPECT_EQ(zv_mkpath(scratch.path("x/y/z").c_str()), 1);
  EXPECT_EQ(zv_mkpath(scratch.path("x/y/z").c_str()), 1);
  EXPECT_EQ(zv_mkpath((scratch.path("x/w/v") + "/").c_str()), 1);
  std::string backslashes = scratch.path("x") + "\\u\\t";
  EXPECT_EQ(zv_mkpath(backslashes.c_str()), 1);
  for (const char* made : {"x/y/z", "x/w/v", "x/u/t"})
    EXPECT_TRUE(std::filesystem::is_directory(scratch.path(made))) << made;
  EXPECT_EQ(zv_mkpath(""), 1);

  // What ".." passes over is made too, whether or not the platform looks for it.
  EXPECT_EQ(zv_mkpath((scratch.path("over") + "/../x").c_str()), 1);
  EXPECT_TRUE(scratch.exists("over"));
}

TEST(MakePath, ALongPathIsRefusedNotCut) {
  const ScratchFolder scratch;
  std::string path = scratch.path("made");
  while (path.size() < ZV_PATH_MAX) path += "/nnnnnnnnnnnnnnnnnnnnnnnnnnnnn";
  EXPECT_EQ(zv_mkpath(path.c_str()), 0);
  EXPECT_EQ(zv_mkfile(path.c_str()), 0);
  EXPECT_FALSE(scratch.exists("made"));
  path.resize(under_wine() ? 240 : ZV_PATH_MAX - 1);  // Windows makes none beyond 247 characters
  EXPECT_EQ(zv_mkpath(path.c_str()), 1);
  EXPECT_EQ(zv_rmpath(path.c_str()), 1);
  EXPECT_NE(zv_access(path.c_str(), 0), 0);
  EXPECT_EQ(zv_mkpath(path.c_str()), 1);
  EXPECT_EQ(zv_rmpath(scratch.path("made").c_str()), 1);
}

TEST(MakeFile, WithItsFoldersAndEmpty) {
  const ScratchFolder scratch;
  EXPECT_EQ(zv_mkfile(scratch.path("d/e/f.txt").c_str()), 1);
  EXPECT_TRUE(scratch.exists("d/e/f.txt"));
  EXPECT_EQ(zv_mkfile(scratch.path("d/e").c_str()), 0);  // a folder

  const std::string full = scratch.make_file("d/full", "content");
  EXPECT_EQ(zv_mkpath(full.c_str()), 1);  // what is there needs no making, whatever it is
  for (const char* const below : {"/below", "/below/that"}) {
    EXPECT_EQ(zv_mkpath((full + below).c_str()), 0);
    EXPECT_EQ(zv_mkfile((full + below).c_str()), 0);
  }
  EXPECT_EQ(scratch.content("d/full"), "content");
  EXPECT_EQ(zv_mkfile(full.c_str()), 1);
  EXPECT_EQ(scratch.content("d/full"), "");
}

TEST(RemovePath, AWholeTreeAndNothingElse) {
  const ScratchFolder scratch;
  scratch.make_file("top/a/b/c/file");
  scratch.make_file("top/a/b2/file");
  scratch.make_file("top/a/b/file");
  scratch.make_file("top/e/file");
  scratch.make_file("top/.hidden");
  scratch.make_folder("top/empty");
  const std::string kept = scratch.make_file("topper/kept");
  EXPECT_EQ(zv_rmpath(kept.c_str()), 0);
  EXPECT_EQ(zv_rmpath(scratch.path("missing").c_str()), 0);
  EXPECT_EQ(zv_rmpath(""), 0);
  EXPECT_EQ(zv_rmpath((scratch.path("top") + std::string(ZV_PATH_MAX, '/')).c_str()), 0);
  EXPECT_TRUE(scratch.exists("top/a/b/c/file"));
  EXPECT_EQ(zv_rmpath((scratch.path("top") + "\\a//").c_str()), 1);
  EXPECT_FALSE(scratch.exists("top/a"));
  EXPECT_TRUE(scratch.exists("top/.hidden"));
  EXPECT_EQ(zv_rmpath(scratch.path("top").c_str()), 1);
  EXPECT_FALSE(scratch.exists("top"));
  EXPECT_TRUE(scratch.exists("topper/kept"));
}

}  // namespace
