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

std::multiset<std::string> read(const std::string& dir, char* name, size_t size) {
  std::multiset<std::string> names;
  const intptr_t handle = zv_dir_readfirst(dir.c_str(), name, size);
  if (handle == -1) return names;
  do names.insert(name);
  while (zv_dir_readnext(handle, name, size) == 1);
  EXPECT_EQ(zv_dir_close(handle), -1);
  return names;
}

TEST(DirectoryIterator, ReportsEveryEntryOnceAsFarAsItFits) {
  const ScratchFolder scratch;
  for (const char* const name : {"a-long-name", ".two", "sub/inner"}) scratch.make_file(name);
  char name[] = "12345678901234";
  for (const std::string& dir : {scratch.path(), scratch.path() + "//"}) {
    EXPECT_EQ(read(dir, name, 4), (std::multiset<std::string>{".", "..", ".tw", "a-l", "sub"}));
    EXPECT_STREQ(name + 4, "5678901234");
  }
  EXPECT_EQ(read(scratch.path(), name, 12).count("a-long-name"), 1u);
}

TEST(DirectoryIterator, NothingToRead) {
  const ScratchFolder scratch;
  char name[8] = "kept";
  for (const std::string& path :
       {scratch.path("missing"), scratch.make_file("file"), std::string(ZV_PATH_MAX, 'x')})
    EXPECT_EQ(zv_dir_readfirst(path.c_str(), name, sizeof name), -1);
  EXPECT_EQ(zv_dir_readnext(-1, name, sizeof name), 0);
  EXPECT_STREQ(name, "kept");
  EXPECT_EQ(zv_dir_close(-1), -1);
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

TEST(DirectoryScan, PathsAreRefusedWhenTooLong) {
  const ScratchFolder scratch;
  std::string dir = scratch.path();
  while (dir.size() < 200) dir += "/nnnnnnnnnnnnnnnnnnnnnnnnnnnnn";
  ASSERT_EQ(zv_mkpath(dir.c_str()), 1);
  const std::string longest = dir + "/" + std::string(ZV_PATH_MAX - 1 - dir.size() - 1, 'x');
  ASSERT_TRUE(std::ofstream(longest));
  EXPECT_EQ(scan(dir, nullptr, nullptr, 1, 0).names, (Names{longest}));
  if (under_wine()) return;  // there, as on Windows, no longer path can be made

  ASSERT_TRUE(std::ofstream(longest + "y"));
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
      {"a.TXT", nullptr, ";;, *.TXT;", ";, ", 0, 1},
      {"a.TXT", nullptr, "*.doc;*.TXT", ";", 0, 1},
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

// Wine shows only links to folders, and takes them away by what they lead to.
TEST(DirectoryScan, LinksAreEntriesAndAreNotFollowed) {
  const ScratchFolder scratch;
  scratch.make_file("outside/kept");
  scratch.make_file("top/file");
  if (!make_link("../outside", scratch.path("top/to-folder"))) GTEST_SKIP() << "no links here";
  make_link("top", scratch.path("to-top"));
  if (!under_wine()) {
    make_link("../outside/kept", scratch.path("top/to-file"));
    make_link("nowhere", scratch.path("top/dangling"));
  }

  const std::string top = scratch.path("to-top");  // the top itself is followed
  const Names with_files = {top + "/dangling", top + "/file", top + "/to-file", top + "/to-folder"};
  EXPECT_EQ(sorted(scan(top, nullptr, nullptr, 0, 1).names),
            under_wine() ? (Names{top + "/file", top + "/to-folder"}) : with_files);
  const dirsel_t folders = {"*", nullptr, nullptr, 1, 0};
  EXPECT_EQ(select(top, folders), (Names{"to-folder"}));

  // A removal does not follow even that, and removes the others themselves.
  EXPECT_EQ(zv_rmpath(top.c_str()), 0);
  EXPECT_EQ(zv_rmpath((top + "/").c_str()), 0);
  EXPECT_TRUE(scratch.exists("top/file"));
  EXPECT_EQ(zv_rmpath(scratch.path("top").c_str()), !under_wine());
  EXPECT_EQ(scratch.exists("top"), under_wine());
  EXPECT_TRUE(scratch.exists("outside/kept"));
}

#ifndef _WIN32
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
