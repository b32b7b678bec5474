// Chains of folders made, trees removed.
#include <gtest/gtest.h>

#include <cerrno>
#include <string>

#include "environment.h"
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
  for (const auto make : {zv_mkpath, zv_mkfile}) {
    errno = 0;
    EXPECT_EQ(make(path.c_str()), 0);
    EXPECT_EQ(errno, ENAMETOOLONG);
  }
  EXPECT_FALSE(scratch.exists("made"));
  // What is said to be made can be seen. Windows opens no path that long, Wine does.
  const std::string file = scratch.path(std::string(200, 'f')) + "/" + std::string(60, 'f');
  const int made = zv_mkfile(file.c_str());
  EXPECT_EQ(made, zv_access(file.c_str(), 0) == 0);
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
  scratch.make_file("topper/kept");
  const std::string top = scratch.path("top") + "/";
  {
    const WorkingDirectory inside(scratch.path("top"));
    for (const std::string& refused :
         {scratch.path("topper/kept"), scratch.path("missing"), std::string(),
          top + std::string(ZV_PATH_MAX, '/'), top + ".", top + "./", top + "a/..", top + "a\\..\\",
          std::string("."), std::string(".."), std::string("./"), std::string("/"),
          std::string("//"), std::string("/."),
          std::filesystem::current_path().root_name().string()})
      EXPECT_EQ(zv_rmpath(refused.c_str()), 0) << refused;
  }
  EXPECT_TRUE(scratch.exists("top/a/b/c/file"));
  EXPECT_EQ(zv_rmpath((scratch.path("top") + "\\a//").c_str()), 1);
  EXPECT_FALSE(scratch.exists("top/a"));
  EXPECT_TRUE(scratch.exists("top/.hidden"));
  EXPECT_EQ(zv_rmpath(scratch.path("top").c_str()), 1);
  EXPECT_FALSE(scratch.exists("top"));
  EXPECT_TRUE(scratch.exists("topper/kept"));
}

#ifdef _WIN32
TEST(RemovePath, NoDriveIsEmptied) {
  const ScratchFolder scratch;
  scratch.make_file("sub/kept");
  // Wine's drives are links beside its drive C.
  const char* const prefix = std::getenv("WINEPREFIX");
  const std::string drives = "Z:" + std::string(prefix != nullptr ? prefix : "") + "/dosdevices";
  if (!make_link("../drive_c" + scratch.path().substr(2), drives + "/q:"))
    GTEST_SKIP() << "no drive Q";
  EXPECT_EQ(zv_access("Q:/sub/kept", 0), 0);
  for (const char* const refused :
       {"Q:", "q:", "Q:/", "Q:\\", "Q:.", "Q:/.", "Q:/...", "Q:/. /", "Q:/sub/..",
        "Q:/.::$INDEX_ALLOCATION", "//./Q:", "//./q:/", "//./Q:/...", "//?/Q:/", "\\\\?\\Q:"})
    EXPECT_EQ(zv_rmpath(refused), 0) << refused;
  EXPECT_TRUE(scratch.exists("sub/kept"));
  EXPECT_EQ(zv_rmpath("Q:sub"), 1);
  on_host(drives, {"rm", "q:"});
}
#else
TEST(Paths, ABackslashMayBePartOfAName) {
  const ScratchFolder scratch;
  scratch.make_file("victim/kept");
  scratch.make_file("n/..\\victim/x");
  scratch.make_file("a/b", "other");
  const std::string name = scratch.make_file("a\\b", "five5");
  char** list = nullptr;
  ASSERT_EQ(zv_dir_scan(scratch.path("n").c_str(), &list, nullptr, nullptr, 1, 0), 1);
  EXPECT_EQ(zv_mkpath(list[0]), 1);
  EXPECT_EQ(zv_rmpath(list[0]), 1);
  zv_strlist_free(list, 1);
  EXPECT_FALSE(scratch.exists("n/..\\victim"));
  EXPECT_TRUE(scratch.exists("victim/kept"));

  struct _stat64 st;
  EXPECT_EQ(zv_stat(name.c_str(), &st), 0);
  EXPECT_EQ(st.st_size, 5);
  zv_set_hidden(name.c_str(), 1);
  EXPECT_EQ(zv_get_hidden(scratch.path("a/b").c_str()), 0);
  EXPECT_EQ(zv_mkfile(name.c_str()), 1);
  EXPECT_EQ(scratch.content("a\\b"), "");
  std::filesystem::remove(name);
  EXPECT_EQ(zv_access(name.c_str(), 0), 0);  // now it is read as the other
  EXPECT_EQ(zv_mkfile(name.c_str()), 1);
  EXPECT_EQ(scratch.content("a/b"), "");

  const WorkingDirectory inside(scratch.make_folder("w\\d"));
  char folder[ZV_PATH_MAX];
  EXPECT_EQ(zv_getcwd(folder, sizeof folder), 1);
  EXPECT_EQ(folder, scratch.path("w\\d"));
}
#endif

}  // namespace
