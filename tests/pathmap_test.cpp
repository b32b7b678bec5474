// The path map and the search path.
#include <gtest/gtest.h>

#include <string>

#include "environment.h"
#include "scratch_folder.h"
#include "string_list.h"

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
  EXPECT_EQ(map("a/", "b/f"), 1);
  EXPECT_EQ(map("a/f", "b/f"), 1);
  EXPECT_EQ(map("a/f", "b/g"), 0);
  EXPECT_EQ(map("A/f", "b/f"), 1);  // another record: byte for byte
}

TEST_F(PathMap, Locates) {
  for (const char* const file : {"new/f", "new/sub/x.dat", "side/y", "old/there"})
    scratch_.make_file(file);
  EXPECT_EQ(locate("old/f"), "none");
  EXPECT_EQ(map("old/f", "new/f"), 1);
  EXPECT_EQ(locate("old/there"), "old/there");
  EXPECT_EQ(locate("old/f"), "new/f");
  EXPECT_EQ(locate("OLD/sub/x.dat"), "new/sub/x.dat");
  EXPECT_EQ(locate("old/missing"), "none");
  EXPECT_EQ(search(zv_pathmap_locate, "//srv/sh/f"), "none");

  // The record also moves what lies beside the former folder.
  EXPECT_EQ(map("old/deep/f", "side/y"), 1);
  EXPECT_EQ(locate("old/y"), "none");
  EXPECT_EQ(locate("old/deep/y"), "side/y");
  EXPECT_EQ(map("old/f", "elsewhere/f"), 1);
  EXPECT_EQ(locate("old/side/y"), "side/y");

  zv_pathmap_clear();
  EXPECT_EQ(locate("old/deep/y"), "none");
}

TEST_F(PathMap, OldestRecordWinsAndItsTargetCanChange) {
  for (const char* const file : {"one/f", "two/f", "three/f"}) scratch_.make_file(file);
  EXPECT_EQ(map("old/f", "nowhere/f"), 1);
  EXPECT_EQ(map("Old/f", "one/f"), 1);
  EXPECT_EQ(map("oLd/f", "two/f"), 1);
  EXPECT_EQ(locate("old/f"), "one/f");
  EXPECT_EQ(map("old/f", "three/f"), 1);
  EXPECT_EQ(locate("old/f"), "three/f");
  const std::string name(ZV_PATH_MAX - at("old").size() - 2, 'n');  // fits there, and just so
  EXPECT_EQ(locate("old/" + name), "none");
}

// A name alone lies in the working directory where it is the target, and nowhere as the source.
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

std::string folders() {
  char** list = nullptr;
  const int count = zv_pathlist(&list);
  EXPECT_EQ(count, list != nullptr ? zv_strlist_len(list) : 0);
  const std::string text = joined(list);
  zv_strlist_free(list, count);
  return text;
}

TEST(SearchPath, Folders) {
  const ScratchFolder scratch;
  const std::string folder = scratch.path();
  const std::string too_long(400, 'x');
  Variable path("PATH", std::nullopt);
  EXPECT_EQ(folders(), "none");
  const struct {
    std::string value;
    std::string folders;
  } cases[] = {
      {folder + ";" + folder + "\\;", folder + ";" + folder + "/;;"},
      {"Q:\\no\\such;;x", "Q:/no/such;;x;"},
      {";", ";;"},
      {too_long + "\\;y", too_long + "/;y;"},
#ifndef _WIN32
      {"", "none"},
      {"/no/such:" + folder + ":", "/no/such;" + folder + ";;"},
      {"/a:b;c", "/a:b;c;"},
#endif
  };
  for (const auto& c : cases) {
    path.set(c.value);
    EXPECT_EQ(folders(), c.folders) << c.value;
  }
}

TEST(SearchPath, Locates) {
  const ScratchFolder scratch;
  const auto locate = [](const std::string& name) { return search(zv_path_locate, name); };
  for (const char* const file : {"one/tool", "two/tool", "two/only", "two/folder/x"})
    scratch.make_file(file);
  Variable path("PATH", scratch.path("missing") + ";" + std::string(318, 'x') + ";" +
                            scratch.path("one") + "/;" + scratch.path("two"));
  EXPECT_EQ(locate("any/where/tool"), scratch.path("one/tool"));
  EXPECT_EQ(locate("only"), scratch.path("two/only"));
  EXPECT_EQ(locate("folder/"), scratch.path("two/folder"));
  EXPECT_EQ(locate("any/x"), "none");
  EXPECT_EQ(locate(std::string(319, 'n')), "none");
  {
    const WorkingDirectory inside(scratch.path("two"));
    path.set(scratch.path("one"));
    EXPECT_EQ(locate("/"), scratch.path("one"));
    EXPECT_EQ(locate("only"), "none");
    path.set(scratch.path("one") + ";");
    EXPECT_EQ(locate("only"), "only");  // an empty element is the working directory
  }
  path.set(std::nullopt);
  EXPECT_EQ(locate("tool"), "none");
}

}  // namespace
