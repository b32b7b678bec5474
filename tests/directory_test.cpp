// Directories read, scanned and selected from.
#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <string>
#include <vector>

#include "scratch_folder.h"
#include "wine.h"
#include "zarvo.h"

namespace {

using Names = std::vector<std::string>;

struct Scanned {
  int count;
  Names names;
};

Scanned scan(const std::string& dir, dir_filter_t filter, void* user, int full_path,
             int recursive) {
  char** list = reinterpret_cast<char**>(1);
  Scanned out = {zv_dir_scan(dir.c_str(), &list, filter, user, full_path, recursive), {}};
  if (out.count < 0) {
    EXPECT_EQ(list, nullptr);
    return out;
  }
  out.names.assign(list, list + out.count);
  EXPECT_EQ(list[out.count], nullptr);
  zv_strlist_free(list, out.count);
  return out;
}

Names sorted(Names names) {
  std::sort(names.begin(), names.end());
  return names;
}

TEST(DirectoryIterator, ReportsEveryEntryOnce) {
  const ScratchFolder scratch;
  scratch.make_file("one");
  scratch.make_file(".two");
  scratch.make_file("sub/inner");
  for (const std::string& dir : {scratch.path(), scratch.path() + "//"}) {
    char name[ZV_PATH_MAX] = "";
    std::multiset<std::string> names;
    intptr_t handle = zv_dir_readfirst(dir.c_str(), name, sizeof name);
    ASSERT_NE(handle, -1);
    do {
      names.insert(name);
    } while (zv_dir_readnext(handle, name, sizeof name) == 1);
    handle = zv_dir_close(handle);
    EXPECT_EQ(handle, -1);
    EXPECT_EQ(names, (std::multiset<std::string>{".", "..", ".two", "one", "sub"}));
  }
}

TEST(DirectoryIterator, NothingToRead) {
  const ScratchFolder scratch;
  const std::string file = scratch.make_file("file");
  char name[8] = "kept";
  EXPECT_EQ(zv_dir_readfirst(scratch.path("missing").c_str(), name, sizeof name), -1);
  EXPECT_EQ(zv_dir_readfirst(file.c_str(), name, sizeof name), -1);
  EXPECT_EQ(zv_dir_readfirst(std::string(ZV_PATH_MAX, 'x').c_str(), name, sizeof name), -1);
  EXPECT_EQ(zv_dir_readnext(-1, name, sizeof name), 0);
  EXPECT_STREQ(name, "kept");
  EXPECT_EQ(zv_dir_close(-1), -1);
}

TEST(DirectoryIterator, CutsNamesToTheBuffer) {
  const ScratchFolder scratch;
  scratch.make_file("a-long-name");
  char name[] = "12345678";
  intptr_t handle = zv_dir_readfirst(scratch.path().c_str(), name, 4);
  ASSERT_NE(handle, -1);
  bool seen = false;
  do {
    seen = seen || std::string(name) == "a-l";
  } while (zv_dir_readnext(handle, name, 4) == 1);
  zv_dir_close(handle);
  EXPECT_TRUE(seen);
  EXPECT_STREQ(name + 4, "5678");
}

TEST(DirectoryScan, NamesPathsAndLevels) {
  const ScratchFolder scratch;
  scratch.make_file("a");
  scratch.make_file(".b");
  scratch.make_file("d/e/f");
  scratch.make_file("d/g");
  const std::string top = scratch.path();

  EXPECT_EQ(sorted(scan(top, nullptr, nullptr, 0, 0).names), (Names{".b", "a", "d"}));
  const Names full = {top + "/.b", top + "/a", top + "/d"};
  EXPECT_EQ(sorted(scan(top, nullptr, nullptr, 1, 0).names), full);
  EXPECT_EQ(sorted(scan(top + "/", nullptr, nullptr, 1, 0).names), full);

  // Recursion asks for full paths by itself, and puts each folder in front of what it holds.
  const Scanned deep = scan(top, nullptr, nullptr, 0, 1);
  EXPECT_EQ(sorted(deep.names), (Names{top + "/.b", top + "/a", top + "/d", top + "/d/e",
                                       top + "/d/e/f", top + "/d/g"}));
  const auto place = [&deep, &top](const char* below) {
    return std::find(deep.names.begin(), deep.names.end(), top + below);
  };
  EXPECT_LT(place("/d"), place("/d/e"));
  EXPECT_EQ(place("/d/e") + 1, place("/d/e/f"));
}

TEST(DirectoryScan, NothingFoundIsAnEmptyList) {
  const ScratchFolder scratch;
  for (const int recursive : {0, 1}) {
    EXPECT_EQ(scan(scratch.path(), nullptr, nullptr, 0, recursive).count, 0);
    EXPECT_EQ(scan(scratch.path("missing"), nullptr, nullptr, 0, recursive).count, 0);
    EXPECT_EQ(scan(scratch.make_file("file"), nullptr, nullptr, 0, recursive).names.size(), 0u);
    std::filesystem::remove(scratch.path("file"));
  }
}

struct Seen {
  Names dirs;
  std::string kept;
};

int keep_one(const char* dir, const char* name, void* user) {
  Seen& seen = *static_cast<Seen*>(user);
  seen.dirs.push_back(dir);
  return seen.kept == name;
}

TEST(DirectoryScan, AFilterThatRejectsAFolderStillSeesItsContent) {
  const ScratchFolder scratch;
  scratch.make_file("d/e/found");
  Seen seen = {{}, "found"};
  const std::string top = scratch.path() + "/";
  EXPECT_EQ(scan(top, keep_one, &seen, 0, 1).names, (Names{top + "d/e/found"}));
  EXPECT_EQ(seen.dirs, (Names{top, top + "d", top + "d/e"}));
}

// A folder below the scratch folder whose path has `length` characters.
std::string deep_folder(const ScratchFolder& scratch, size_t length) {
  std::string path = scratch.path();
  while (path.size() < length) {
    size_t name = std::min<size_t>(60, length - path.size() - 1);
    if (length - path.size() - 1 - name == 1) --name;  // what is left must hold a name
    path += "/" + std::string(name, 'n');
    EXPECT_EQ(zv_mkdir(path.c_str()), 0);
  }
  return path;
}

TEST(DirectoryScan, PathsAreRefusedWhenTooLong) {
  const ScratchFolder scratch;
  const std::string dir = deep_folder(scratch, 250);
  const std::string longest = dir + "/" + std::string(ZV_PATH_MAX - 1 - dir.size() - 1, 'x');
  FILE* fp = fopen(longest.c_str(), "wb");
  ASSERT_NE(fp, nullptr);
  fclose(fp);
  EXPECT_EQ(scan(dir, nullptr, nullptr, 1, 0).names, (Names{longest}));
  if (under_wine()) return;  // there, as on Windows, no longer path can be made

  fp = fopen((longest + "y").c_str(), "wb");
  ASSERT_NE(fp, nullptr);
  fclose(fp);
  EXPECT_EQ(scan(dir, nullptr, nullptr, 0, 0).count, 2);
  EXPECT_LE(scan(dir, nullptr, nullptr, 1, 0).count, 0);  // 0: nothing was stored before it
  EXPECT_EQ(scan(scratch.path(), nullptr, nullptr, 1, 1).count, -1);
  EXPECT_EQ(zv_rmpath(scratch.path().c_str()), 0);
  EXPECT_EQ(zv_access(longest.c_str(), 0), 0);
}

// A scan asks the ready-made filter in another way than a caller does; its answers are the same.
Names select(const std::string& dir, const dirsel_t& sel) {
  const auto filter = reinterpret_cast<dir_filter_t>(zv_dir_select);
  return scan(dir, filter, const_cast<dirsel_t*>(&sel), 0, 0).names;
}

struct SelectCase {
  const char* name;
  const char* dirs;
  const char* files;
  const char* separators;
  int match_case;
  int selected;
};

TEST(DirectorySelect, Patterns) {
  const ScratchFolder scratch;
  scratch.make_file("a.TXT");
  scratch.make_folder("sub.txt");
  const char sequence[] = "x\0*.txt\0";
  const SelectCase cases[] = {
      {"a.TXT", nullptr, "*.txt", nullptr, 0, 1},
      {"a.TXT", nullptr, "*.txt", nullptr, 1, 0},
      {"a.TXT", nullptr, "*.TXT", nullptr, 1, 1},
      {"a.TXT", "*", nullptr, nullptr, 0, 0},
      {"a.TXT", "*", "", nullptr, 0, 0},
      {"a.TXT", nullptr, "*.doc;*.TXT", ";", 0, 1},
      {"a.TXT", nullptr, ";;, *.TXT;", ";, ", 0, 1},
      {"a.TXT", nullptr, "*.doc;*.TXT", nullptr, 0, 0},
      {"a.TXT", nullptr, ";;", ";", 0, 0},
      {"a.TXT", nullptr, sequence, "", 0, 1},
      {"sub.txt", "S*", nullptr, nullptr, 0, 1},
      {"sub.txt", nullptr, "*", nullptr, 0, 0},
      {"missing.txt", "*", "*", nullptr, 0, 0},
      {"", "*", "*", nullptr, 0, 0},
      {nullptr, "*", "*", nullptr, 0, 0},
  };
  for (const SelectCase& c : cases) {
    SCOPED_TRACE(testing::Message()
                 << (c.name ? c.name : "NULL") << " files " << (c.files ? c.files : "NULL"));
    const dirsel_t sel = {c.dirs, c.files, c.separators, 0, c.match_case};
    EXPECT_EQ(zv_dir_select(scratch.path().c_str(), c.name, &sel), c.selected);
    const Names names = select(scratch.path(), sel);
    EXPECT_EQ(std::count(names.begin(), names.end(), c.name ? c.name : ""), c.selected);
  }
  EXPECT_EQ(zv_dir_select("nowhere", "missing", nullptr), 1);
  EXPECT_EQ(zv_dir_select("nowhere", "", nullptr), 0);
}

TEST(DirectorySelect, HiddenEntries) {
  const ScratchFolder scratch;
  const std::string file = scratch.make_file("kept");
  if (zv_set_hidden(file.c_str(), 1) == 0) GTEST_SKIP() << "no attributes on this file system";
  dirsel_t sel = {nullptr, "*", nullptr, 0, 0};
  EXPECT_EQ(zv_dir_select(scratch.path().c_str(), "kept", &sel), 0);
  EXPECT_EQ(select(scratch.path(), sel), Names());
  sel.show_hidden = 1;
  EXPECT_EQ(zv_dir_select(scratch.path().c_str(), "kept", &sel), 1);
  EXPECT_EQ(scan(scratch.path(), nullptr, nullptr, 0, 0).names, (Names{"kept"}));
}

#ifndef _WIN32
// Wine shows links to the Windows build as what they lead to, so their rules are shown here alone.
TEST(DirectoryScan, LinksAreEntriesAndAreNotFollowed) {
  const ScratchFolder scratch;
  scratch.make_file("outside/secret");
  scratch.make_file("top/file");
  std::filesystem::create_symlink("../outside", scratch.path("top/to-folder"));
  std::filesystem::create_symlink("file", scratch.path("top/to-file"));
  std::filesystem::create_symlink("nowhere", scratch.path("top/dangling"));
  std::filesystem::create_symlink("top", scratch.path("to-top"));

  const std::string top = scratch.path("to-top");  // the top itself is followed
  EXPECT_EQ(sorted(scan(top, nullptr, nullptr, 0, 1).names),
            (Names{top + "/dangling", top + "/file", top + "/to-file", top + "/to-folder"}));
  const dirsel_t folders = {"*", nullptr, nullptr, 1, 0};
  EXPECT_EQ(select(top, folders), (Names{"to-folder"}));
}

int swap_for_a_link(const char* dir, const char* name, void* outside) {
  const std::string path = std::string(dir) + "/" + name;
  if (std::string(name) == "folder") {
    std::filesystem::rename(path, path + "-moved");
    std::filesystem::create_symlink(static_cast<const char*>(outside), path);
  }
  return 1;
}

TEST(DirectoryScan, AFolderSwappedForALinkIsNotEntered) {
  const ScratchFolder scratch;
  scratch.make_file("outside/secret");
  scratch.make_file("top/sub/folder/inner");
  const std::string top = scratch.path("top");
  const std::string outside = scratch.path("outside");
  const Names found = scan(top, swap_for_a_link, const_cast<char*>(outside.c_str()), 1, 1).names;
  EXPECT_EQ(std::count(found.begin(), found.end(), top + "/sub/folder"), 1);
  EXPECT_EQ(std::count(found.begin(), found.end(), top + "/sub/folder/secret"), 0);
}

TEST(DirectoryScan, NamesWithABackslashAreTakenAsTheyAre) {
  const ScratchFolder scratch;
  scratch.make_file("top/a\\b/inner");
  const std::string top = scratch.path("top");
  EXPECT_EQ(scan(top, nullptr, nullptr, 0, 1).names, (Names{top + "/a\\b", top + "/a\\b/inner"}));
  EXPECT_EQ(zv_rmpath(top.c_str()), 1);
  EXPECT_FALSE(scratch.exists("top"));
}
#endif

}  // namespace
