// The path map and the search path.
#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "environment.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

// What a search rewrites its path to; "none" when it finds nothing and leaves the path alone.
std::string search(int (*locate)(char*), const std::string& path) {
  char buffer[ZV_PATH_MAX];
  zv_strncpy(buffer, path.c_str(), sizeof buffer);
  if (locate(buffer) == 1) return buffer;
  EXPECT_EQ(buffer, path);
  return "none";
}

class PathMap : public testing::Test {
 protected:
  void TearDown() override { zv_pathmap_clear(); }

  std::string at(const std::string& below) const { return scratch_.path(below); }
  int map(const std::string& from, const std::string& to) const {
    return zv_pathmap(at(from).c_str(), at(to).c_str());
  }
  // Where a path below the scratch folder is found, told from there; "none" when it is not.
  std::string locate(const std::string& below) const {
    const std::string found = search(zv_pathmap_locate, at(below));
    return found == "none" ? found : found.substr(at("").size() + 1);
  }

  const ScratchFolder scratch_;
};

TEST_F(PathMap, Records) {
  EXPECT_EQ(map("a/f", "a/g"), 0);
  EXPECT_EQ(map("a/f", "b/f"), 1);
  EXPECT_EQ(map("a/other", "b/"), 1);  // the parent is meant
  EXPECT_EQ(map("a/f", "b/f"), 1);
  EXPECT_EQ(map("a/", "b/f"), 1);
  EXPECT_EQ(map("a/f", "b/g"), 0);
  EXPECT_EQ(map("A/f", "b/f"), 1);  // another record: byte for byte
  EXPECT_EQ(map("A/f", "b/f"), 0);
}

TEST_F(PathMap, Locates) {
  scratch_.make_file("new/f");
  scratch_.make_file("new/sub/x.dat");
  scratch_.make_file("side/y");
  scratch_.make_file("old/there");
  EXPECT_EQ(locate("old/f"), "none");
  EXPECT_EQ(map("old/f", "new/f"), 1);

  EXPECT_EQ(locate("old/there"), "old/there");
  EXPECT_EQ(locate("old/f"), "new/f");
  EXPECT_EQ(locate("OLD/sub/x.dat"), "new/sub/x.dat");
  EXPECT_EQ(locate("old/missing"), "none");
  EXPECT_EQ(search(zv_pathmap_locate, "no-such-name"), "none");
  EXPECT_EQ(search(zv_pathmap_locate, "//srv/sh/f"), "none");

  // The record also moves what lies beside the former folder.
  EXPECT_EQ(map("old/deep/f", "side/y"), 1);
  EXPECT_EQ(locate("old/y"), "none");
  EXPECT_EQ(locate("old/deep/y"), "side/y");
  EXPECT_EQ(map("old/f", "elsewhere/f"), 1);
  EXPECT_EQ(locate("old/side/y"), "side/y");

  zv_pathmap_clear();
  EXPECT_EQ(locate("old/f"), "none");
  zv_pathmap_clear();
}

TEST_F(PathMap, OldestRecordWinsAndItsTargetCanChange) {
  for (const char* const file : {"one/f", "two/f", "three/f"}) scratch_.make_file(file);
  EXPECT_EQ(map("old/f", "nowhere/f"), 1);
  EXPECT_EQ(map("Old/f", "one/f"), 1);
  EXPECT_EQ(map("oLd/f", "two/f"), 1);
  EXPECT_EQ(locate("old/f"), "one/f");
  EXPECT_EQ(map("old/f", "three/f"), 1);
  EXPECT_EQ(locate("old/f"), "three/f");
}

TEST_F(PathMap, LoneNames) {
  scratch_.make_file("work/f");
  {
    const WorkingDirectory inside(at("work"));
    EXPECT_EQ(zv_pathmap(at("old/f").c_str(), "name"), 1);
    EXPECT_EQ(zv_pathmap("name", at("work/f").c_str()), 1);
  }
  EXPECT_EQ(locate("old/f"), "work/f");
  EXPECT_EQ(search(zv_pathmap_locate, "f"), "none");
}

TEST_F(PathMap, CandidatesThatDoNotFitArePassedOver) {
  const std::string name(ZV_PATH_MAX - at("old").size() - 2, 'n');  // fits there, and just so
  scratch_.make_file("fit/f");
  EXPECT_EQ(map("old/f", "long/f"), 1);
  EXPECT_EQ(map("Old/f", "fit/f"), 1);
  EXPECT_EQ(locate("old/" + name), "none");
  EXPECT_EQ(locate("old/f"), "fit/f");
}

}  // namespace
