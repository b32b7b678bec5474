// Folders read, scanned and selected from; one path, its status and its hidden attribute; chains of
// folders made, trees removed; file streams and byte order.
#include <gtest/gtest.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <limits>
#include <memory>
#include <set>
#include <string>
#include <tuple>
#include <vector>

#include "environment.h"
#include "scratch_folder.h"
#include "zarvo.h"

#ifdef _WIN32
#include <process.h>
#else
#include <sys/xattr.h>
#endif

namespace {

#ifdef _WIN32
bool under_wine() {
  return GetProcAddress(GetModuleHandleA("ntdll.dll"), "wine_get_version") != nullptr;
}

// Lets a program of Wine's host work in a folder, and does not wait for its end.
void on_host(const std::filesystem::path& folder, std::vector<const char*> command) {
  if (!under_wine() || !std::filesystem::exists(folder)) return;
  const WorkingDirectory inside(folder.string());
  command.push_back(nullptr);
  _spawnv(_P_NOWAIT, (std::string("Z:\\bin\\") + command[0]).c_str(), command.data());
}

// Wine makes no links itself.
bool make_link(const std::string& target, const std::filesystem::path& path) {
  const std::string name = path.filename().string();
  on_host(path.parent_path(), {"ln", "-s", target.c_str(), name.c_str()});
  const auto is_there = [&path] {
    return GetFileAttributesA(path.string().c_str()) != INVALID_FILE_ATTRIBUTES;
  };
  for (int tries = under_wine() ? 500 : 0; tries > 0 && !is_there(); --tries) Sleep(10);
  return is_there();
}
#else
bool under_wine() {
  return false;
}

bool make_link(const std::string& target, const std::filesystem::path& path) {
  std::filesystem::create_symlink(target, path);
  return true;
}
#endif

using Names = std::vector<std::string>;

// In a folder of its own.
class File : public testing::Test {
 protected:
  void make_files(const Names& names) const {
    for (const std::string& name : names) scratch.make_file(name);
  }

  const ScratchFolder scratch;
  const WorkingDirectory inside{scratch.path()};
};

// What a scan gives, in order; "failed" alone where it gives no list.
Names scan(const std::string& dir, int full_path, int recursive, dir_filter_t filter = nullptr,
           void* user = nullptr) {
  char** list = reinterpret_cast<char**>(1);
  const int count = zv_dir_scan(dir.c_str(), &list, filter, user, full_path, recursive);
  EXPECT_EQ(count < 0, list == nullptr);
  if (list == nullptr) return {"failed"};
  Names names(list, list + count);
  EXPECT_EQ(list[count], nullptr);
  zv_strlist_free(list, count);
  return names;
}

Names sorted(Names names) {
  std::ranges::sort(names);
  return names;
}

// A scan asks the ready-made filter in another way than a caller does; its answers are the same.
Names select(const std::string& dir, dirsel_t sel) {
  return scan(dir, 0, 0, reinterpret_cast<dir_filter_t>(zv_dir_select), &sel);
}

TEST_F(File, FoldersAreReadAsFarAsNamesFit) {
  make_files({"a-long-name", ".two", "sub/inner"});
  char name[] = "12345678901234";
  for (const char* const dir : {"", ".//"}) {
    const intptr_t handle = zv_dir_readfirst(dir, name, 4);
    ASSERT_NE(handle, -1);
    Names names = {name};
    while (zv_dir_readnext(handle, name, 4) == 1) names.push_back(name);
    EXPECT_EQ(zv_dir_close(handle), -1);
    EXPECT_EQ(sorted(names), (Names{".", "..", ".tw", "a-l", "sub"}));
    EXPECT_STREQ(name + 4, "5678901234");
  }
  std::strcpy(name, "kept");
  std::string no_room = "sub";  // for a name after it
  while (no_room.size() < ZV_PATH_MAX - 2) no_room.insert(0, "./");
  for (const std::string& path : Names{"missing", ".two", no_room})
    EXPECT_EQ(zv_dir_readfirst(path.c_str(), name, sizeof name), -1) << path;
  EXPECT_EQ(zv_dir_readnext(-1, name, sizeof name), 0);
  EXPECT_STREQ(name, "kept");
}

TEST_F(File, ScansGiveNamesPathsAndLevels) {
  make_files({"a", ".b", "d/e/f", "d/g"});
  EXPECT_EQ(sorted(scan("", 0, 0)), (Names{".b", "a", "d"}));
  EXPECT_EQ(sorted(scan(scratch.path("d") + "/", 1, 0)),
            (Names{scratch.path("d/e"), scratch.path("d/g")}));
  // Recursion asks for full paths by itself, and puts each folder in front of what it holds.
  const Names deep = scan(".", 0, 1);
  EXPECT_EQ(sorted(deep), (Names{"./.b", "./a", "./d", "./d/e", "./d/e/f", "./d/g"}));
  const auto place = [&deep](const char* path) { return std::ranges::find(deep, path); };
  EXPECT_LT(place("./d"), place("./d/e"));
  EXPECT_EQ(place("./d/e") + 1, place("./d/e/f"));
  scratch.make_folder("empty");
  for (const int recursive : {0, 1})
    for (const char* const nothing : {"empty", "missing", "a"})
      EXPECT_EQ(scan(nothing, 0, recursive), Names());
  // A filter that rejects a folder still sees its content.
  Names seen;
  const auto filter = [](const char* dir, const char* name, void* dirs) -> int {
    static_cast<Names*>(dirs)->push_back(dir);
    return *name == 'f';
  };
  EXPECT_EQ(scan("d/e/..", 0, 1, filter, &seen), Names{"d/e/../e/f"});
  EXPECT_EQ(sorted(seen), (Names{"d/e/..", "d/e/..", "d/e/../e"}));
}

TEST_F(File, ScansRefusePathsThatAreTooLong) {
  std::string dir = scratch.path();
  while (dir.size() < 200) dir += "/nnnnnnnnnnnnnnnnnnnnnnnnnnnnn";
  ASSERT_EQ(zv_mkpath(dir.c_str()), 1);
  const std::string longest = dir + "/" + std::string(ZV_PATH_MAX - 1 - dir.size() - 1, 'x');
  ASSERT_TRUE(std::ofstream(longest));
  EXPECT_EQ(scan(dir, 1, 0), Names{longest});
  if (under_wine()) return;  // there, as on Windows, no longer path can be made
  ASSERT_TRUE(std::ofstream(longest + "y"));
  EXPECT_EQ(scan(dir, 0, 0).size(), 2u);
  EXPECT_NE(scan(dir, 1, 0), Names{longest});  // which came before, or nothing did
  EXPECT_EQ(scan(scratch.path(), 1, 1), Names{"failed"});
  EXPECT_EQ(zv_rmpath(scratch.path().c_str()), 0);
  EXPECT_EQ(zv_access(longest.c_str(), 0), 0);
}

TEST_F(File, SelectionByPatterns) {
  make_files({"a.TXT", "sub.txt/x"});
  const struct {
    int selected;
    const char *name, *dirs, *files;
    const char* separators = nullptr;
    int match_case = 0;
  } cases[] = {
      {0, "a.TXT", nullptr, "*.txt", nullptr, 1}, {1, "a.TXT", nullptr, "*.txt"},
      {1, "a.TXT", nullptr, "*.TXT", nullptr, 1}, {1, "sub.txt", "S*", nullptr},
      {1, "a.TXT", nullptr, ";;, *.TXT;", ";, "}, {0, "sub.txt", nullptr, "*"},
      {1, "a.TXT", nullptr, "*.doc;*.TXT", ";"},  {0, "missing.txt", "*", "*"},
      {0, "a.TXT", nullptr, "*.doc;*.c", ";"},    {0, "a.TXT", "*", nullptr},
      {1, "a.TXT", nullptr, "x\0*.txt\0", ""},    {0, nullptr, "*", "*"},
      {0, "a.TXT", nullptr, "*.doc;*.TXT"},       {0, "a.TXT", "*", ""},
      {0, "a.TXT", nullptr, "x\0y\0", ""},        {0, "", "*", "*"},
      {0, "a.TXT", nullptr, ";;", ";"},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.files ? c.files : "NULL");
    const dirsel_t sel = {c.dirs, c.files, c.separators, 0, c.match_case};
    EXPECT_EQ(zv_dir_select(scratch.path().c_str(), c.name, &sel), c.selected);
    EXPECT_EQ(std::ranges::count(select("", sel), c.name ? c.name : ""), c.selected);
  }
  EXPECT_EQ(zv_dir_select("nowhere", "missing", nullptr), 1);
  EXPECT_EQ(zv_dir_select("nowhere", "", nullptr), 0);
}

// Wine shows only links to folders, and takes them away by what they lead to.
TEST_F(File, LinksAreEntriesAndAreNotFollowed) {
  make_files({"outside/kept", "top/file"});
  if (!make_link("../outside", scratch.path("top/to-folder"))) GTEST_SKIP() << "no links here";
  make_link("top", scratch.path("to-top"));
  if (!under_wine()) {
    make_link("../outside/kept", scratch.path("top/to-file"));
    make_link("nowhere", scratch.path("top/dangling"));
  }
  const Names all = {"to-top/dangling", "to-top/file", "to-top/to-file", "to-top/to-folder"};
  EXPECT_EQ(sorted(scan("to-top", 0, 1)), under_wine() ? (Names{all[1], all[3]}) : all);
  EXPECT_EQ(select("to-top", {"*", nullptr, nullptr, 1, 0}), Names{"to-folder"});
  // The top itself was followed. A removal does not follow even that, and removes the others
  // themselves.
  for (const char* const refused : {"to-top", "to-top/"}) EXPECT_EQ(zv_rmpath(refused), 0);
  EXPECT_TRUE(scratch.exists("top/file"));
  EXPECT_EQ(zv_rmpath("top"), !under_wine());
  EXPECT_EQ(scratch.exists("top"), under_wine());
  EXPECT_TRUE(scratch.exists("outside/kept"));
}

// Kind and size.
std::pair<int, int64_t> status_of(const std::string& path) {
  struct _stat64 st;
  if (zv_stat(path.c_str(), &st) != 0) return {-1, -1};
  return {st.st_mode & 0xF000, st.st_size};
}

TEST_F(File, KindSizeAndAccess) {
  scratch.make_file("five", "12345");
  for (int mode = 0; mode < 8; ++mode) {  // execution is never tested
    EXPECT_EQ(zv_access("five", mode), 0) << mode;
    EXPECT_EQ(zv_access("missing", mode), -1) << mode;
  }
  EXPECT_EQ(status_of("five"), std::pair(0x8000, int64_t{5}));
  EXPECT_EQ(status_of("missing").first, -1);
  const std::pair<std::string, int> folders[] = {
      {".\\made", 0}, {".\\made", -1}, {".\\made\\no\\parent", -1}, {"made/sub", 0}};
  for (const auto& [path, result] : folders) EXPECT_EQ(zv_mkdir(path.c_str()), result) << path;
  EXPECT_EQ(status_of(".\\made\\sub").first, 0x4000);
  EXPECT_EQ(zv_access(".\\made\\sub", 0), 0);
  EXPECT_EQ(status_of(".\\made\\" + std::string(ZV_PATH_MAX, 'x')).first, -1);
}

TEST_F(File, HiddenOnes) {
  make_files({"file", "folder/x", ".dotted"});
  const dirsel_t shown = {"*", "*", nullptr, 0, 0}, all = {"*", "*", nullptr, 1, 0};
#ifndef _WIN32  // where no attributes are kept
  EXPECT_EQ(zv_get_hidden("/proc/self/stat"), 0);
  EXPECT_EQ(zv_set_hidden("/proc/self/stat", 0), 1);
  EXPECT_EQ(zv_set_hidden("/proc/self/stat", 1), 0);
  EXPECT_GE(select("/proc/self", shown).size(), 10u);
#endif
  EXPECT_EQ(zv_get_hidden("missing"), 0);
  for (const int hidden : {0, 1}) EXPECT_EQ(zv_set_hidden("missing", hidden), 0);
  EXPECT_EQ(zv_get_hidden(".dotted"), under_wine());  // a dot is no attribute, except to Wine
  for (const char* const path : {"file", "folder"}) {
    if (zv_set_hidden(path, 1) == 0) GTEST_SKIP() << "no attributes on this file system";
    for (const int hidden : {0, 0, 5, 1}) {
      EXPECT_EQ(zv_set_hidden(path, hidden), 1);
      EXPECT_EQ(zv_get_hidden(path), hidden != 0) << path;
      EXPECT_EQ(std::ranges::count(select("", shown), path), hidden == 0);
      EXPECT_EQ(zv_dir_select("", path, &shown), hidden == 0);
      EXPECT_EQ(zv_dir_select("", path, &all), 1);
    }
  }
  EXPECT_EQ(select("", all).size(), 3u);
  EXPECT_EQ(scan("", 0, 0).size(), 3u);
}

#ifndef _WIN32
// The attribute as others write it: their bits stay, and so does what is not plain hex text.
TEST_F(File, HiddenAmongOtherAttributes) {
  const auto foreign = [](const std::string& text) { return std::tuple(text, 0, 0, text, text); };
  // The value before, whether that is hidden, whether it can be, and the value then and cleared.
  const std::tuple<std::string, int, int, std::string, std::string> cases[] = {
      {"0x2", 1, 1, "0x2", "none"},
      {"0x22", 1, 1, "0x22", "0x20"},
      {"0xFD", 0, 1, "0xff", "0xfd"},
      foreign("hidden"),
      foreign("2"),
      foreign("0x"),
      foreign("0x2g"),
      foreign("0x" + std::string(20, '0') + "2"),
      foreign({"0x2\0more", 8}),
  };
  make_files({"file"});
  static constexpr char name[] = "user.DOSATTRIB";
  const auto value = [] {
    char room[32] = "";
    const ssize_t size = getxattr("file", name, room, sizeof room);
    return size < 0 ? std::string("none") : std::string(room, static_cast<size_t>(size));
  };
  for (const auto& [before, hidden, can_set, set, cleared] : cases) {
    if (setxattr("file", name, before.data(), before.size(), 0) != 0)
      GTEST_SKIP() << "no attributes on this file system";
    EXPECT_EQ(zv_get_hidden("file"), hidden) << before;
    EXPECT_EQ(zv_set_hidden("file", 1), can_set);
    EXPECT_EQ(value(), set);
    EXPECT_EQ(zv_set_hidden("file", 0), 1);
    EXPECT_EQ(value(), cleared);
  }
}
#endif

TEST_F(File, PathsAreMade) {
  // What ".." passes over is made too, whether or not the platform looks for it.
  for (const char* const path : {"x/y/z", "x/y/z", "x/w/v/", ".\\x\\u\\t", "over/../x", ""})
    EXPECT_EQ(zv_mkpath(path), 1) << path;
  for (const char* const made : {"x/y/z", "x/w/v", "x/u/t", "over"})
    EXPECT_EQ(status_of(made).first, 0x4000) << made;

  EXPECT_EQ(zv_mkfile("d/e/f.txt"), 1);
  EXPECT_TRUE(scratch.exists("d/e/f.txt"));
  EXPECT_EQ(zv_mkfile("d/e"), 0);  // a folder
  scratch.make_file("d/full", "content");
  EXPECT_EQ(zv_mkpath("d/full"), 1);  // what is there needs no making, whatever it is
  for (const char* const below : {"d/full/below", "d/full/below/that"})
    EXPECT_EQ(zv_mkpath(below) + zv_mkfile(below), 0);
  EXPECT_EQ(scratch.content("d/full"), "content");
  EXPECT_EQ(zv_mkfile("d/full"), 1);
  EXPECT_EQ(scratch.content("d/full"), "");
}

TEST_F(File, LongPathsAreRefusedNotCut) {
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
  EXPECT_EQ(zv_rmpath("made"), 1);
}

TEST_F(File, TreesAreRemovedAndNothingElse) {
  make_files({"top/a/b/c/file", "top/a/b2/file", "top/a/b/file", "top/e/file", "top/.hidden",
              "topper/kept"});
  scratch.make_folder("top/empty");
  for (const std::string& refused :
       Names{"topper/kept", "missing", "", "top" + std::string(ZV_PATH_MAX, '/'), "top/.", "top/./",
             "top/a/..", "top/a\\..\\", ".", "..", "./", "/", "//", "/.",
             std::filesystem::current_path().root_name().string()})
    EXPECT_EQ(zv_rmpath(refused.c_str()), 0) << refused;
  EXPECT_TRUE(scratch.exists("top/a/b/c/file"));
  EXPECT_EQ(zv_rmpath("top\\a//"), 1);
  EXPECT_EQ(sorted(scan("top", 0, 0)), (Names{".hidden", "e", "empty"}));
  EXPECT_EQ(zv_rmpath(scratch.path("top").c_str()), 1);
  EXPECT_FALSE(scratch.exists("top"));
  EXPECT_TRUE(scratch.exists("topper/kept"));
}

#ifdef _WIN32
TEST_F(File, NoDriveIsEmptied) {
  make_files({"sub/kept"});
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
TEST_F(File, ABackslashMayBePartOfAName) {
  make_files({"victim/kept", "n/..\\victim/x/y", "a/b", "w\\d/x"});
  scratch.make_file("a\\b", "five5");
  EXPECT_EQ(scan("n", 0, 1), (Names{"n/..\\victim", "n/..\\victim/x", "n/..\\victim/x/y"}));
  EXPECT_EQ(zv_mkpath("n/..\\victim"), 1);
  EXPECT_EQ(zv_rmpath("n/..\\victim"), 1);
  EXPECT_EQ(scan("n", 0, 0), Names());
  EXPECT_TRUE(scratch.exists("victim/kept"));

  EXPECT_EQ(status_of("a\\b").second, 5);
  zv_set_hidden("a\\b", 1);
  EXPECT_EQ(zv_get_hidden("a/b"), 0);
  EXPECT_EQ(zv_mkfile("a\\b"), 1);
  EXPECT_EQ(status_of("a\\b").second, 0);
  std::filesystem::remove("a\\b");
  scratch.make_file("a/b", "other");
  EXPECT_EQ(zv_access("a\\b", 0), 0);  // now it is read as the other
  EXPECT_EQ(zv_mkfile("a\\b"), 1);
  EXPECT_EQ(scratch.content("a/b"), "");

  const WorkingDirectory below("w\\d");
  char folder[ZV_PATH_MAX];
  EXPECT_EQ(zv_getcwd(folder, sizeof folder), 1);
  EXPECT_EQ(folder, scratch.path("w\\d"));
}
#endif

using Stream = std::unique_ptr<FILE, int (*)(FILE*)>;

// At the second try where calls fail on purpose.
Stream open(const std::string& path, const char* mode) {
  FILE* const stream = zv_fopen(path.c_str(), mode, nullptr);
  return {stream != nullptr ? stream : zv_fopen(path.c_str(), mode, nullptr), zv_fclose};
}

TEST_F(File, StreamIsBinaryWhateverTheModeSays) {
  int flag = 7;
  EXPECT_EQ(zv_fopen("missing", "r", &flag), nullptr);
  EXPECT_EQ(flag, 7);
  FILE* const fp = zv_fopen("text", "w", &flag);
  ASSERT_NE(fp, nullptr);
  EXPECT_EQ(flag, 0);
  EXPECT_EQ(zv_fputs("a\n\r\n\x1Az", fp, 0), 0);
  EXPECT_EQ(zv_fclose(fp), 0);
  EXPECT_EQ(zv_fclose(nullptr), 0);
  EXPECT_EQ(scratch.content("text"), "a\n\r\n\x1Az");
  char read[8] = "";
  EXPECT_EQ(zv_fread(read, 1, sizeof read, open("text", "r").get(), 0), 6u);
  EXPECT_STREQ(read, "a\n\r\n\x1Az");
}

TEST_F(File, StreamBlocksInTheOtherByteOrder) {
  char elements[] = "0123abcdxyz";
  {
    const Stream out = open("block", "w");
    EXPECT_EQ(zv_fwrite(elements, 4, 2, out.get(), 1), 2u);
    EXPECT_EQ(zv_fwrite(elements + 8, 1, 3, out.get(), 1), 3u);
  }
  EXPECT_STREQ(elements, "0123abcdxyz");
  EXPECT_EQ(scratch.content("block"), "3210dcbaxyz");
  // Of the third element only three bytes are there: it is neither counted nor turned round.
  const Stream in = open("block", "r");
  char back[13] = "............";
  EXPECT_EQ(zv_fread(back, 4, 3, in.get(), 1), 2u);
  EXPECT_STREQ(back, "0123abcdxyz.");
}

TEST_F(File, StreamOffsetsBeyondFourGigabytes) {
  constexpr int64_t distant = INT64_C(5) << 30;
  Stream fp = open("sparse", "w+");
  ASSERT_TRUE(fp);
  ASSERT_EQ(zv_fseek(fp.get(), distant, SEEK_SET), 0);
  ASSERT_EQ(zv_fputs("end", fp.get(), 0), 0);
  EXPECT_EQ(zv_fseek(fp.get(), -4, SEEK_CUR), 0);
  char read[5] = "....";
  EXPECT_EQ(zv_fread(read, 1, 4, fp.get(), 0), 4u);
  EXPECT_EQ(std::memcmp(read, "\0end", 4), 0);
  EXPECT_EQ(zv_fseek(fp.get(), -1, SEEK_END), 0);
  EXPECT_EQ(zv_ftell(fp.get()), distant + 2);
  EXPECT_NE(zv_fseek(fp.get(), -1, SEEK_SET), 0);
  fp.reset();
  EXPECT_EQ(status_of("sparse").second, distant + 3);
}

TEST_F(File, StreamLinesWithAndWithoutTheirCarriageReturn) {
  const std::tuple<const char*, size_t, const char*, const char*> cases[] = {
      {"abc\r\nd", 16, "abc\r\n", "abc\n"},
      {"\r\n", 16, "\r\n", "\n"},
      {"abc\nd", 16, "abc\n", "abc\n"},
      {"\n", 16, "\n", "\n"},
      {"abc\r", 16, "abc\r", "abc\r"},
      {"abc\r\n", 5, "abc\r", "abc\r"},  // cut between the two
      {"abc\r\n", 6, "abc\r\n", "abc\n"},
  };
  for (const auto& [content, size, kept, stripped] : cases) {
    scratch.make_file("lines", content);
    for (const int strip : {0, 1}) {
      const Stream fp = open("lines", "r");
      char buf[17] = "################";
      ASSERT_EQ(zv_fgets(buf, static_cast<int>(size), fp.get(), strip), buf);
      std::string expected = strip ? stripped : kept;
      expected.resize(size);  // zero to the buffer's end
      EXPECT_EQ(std::string(buf, 16), expected.append(16 - size, '#'));
    }
  }
  char buf[4] = "abc";
  EXPECT_EQ(zv_fgets(buf, 4, open(scratch.make_file("empty"), "r").get(), 1), nullptr);

  const std::pair<const char*, const char*> written[] = {
      {"a\nb", "a\r\nb"}, {"", ""}, {"\n\n", "\r\n\r\n"}, {"a\r\n", "a\r\r\n"}};
  for (const auto& [text, with_both] : written) {
    for (const int crlf : {0, 1}) {
      EXPECT_EQ(zv_fputs(text, open("out", "w").get(), crlf), 0);
      EXPECT_EQ(scratch.content("out"), crlf ? with_both : text);
    }
  }
}

TEST_F(File, StreamSkipsToTheNextLine) {
  const Stream fp = open(scratch.make_file("lines", "abc\n\ndef"), "r");
  const std::pair<int, int64_t> steps[] = {{0, 4}, {0, 5}, {-1, 8}};
  for (const auto& [result, position] : steps) {
    EXPECT_EQ(zv_fskip(fp.get()), result);
    EXPECT_EQ(zv_ftell(fp.get()), position);
  }
  // What came before is forgotten: here the end, and an error.
  scratch.make_file("lines", "abc\n\ndef and more\n");
  EXPECT_EQ(zv_fskip(fp.get()), 0);
  EXPECT_NE(std::fputc('x', fp.get()), 'x');
  EXPECT_EQ(zv_fskip(fp.get()), -1);
  EXPECT_EQ(std::ferror(fp.get()), 0);
  EXPECT_EQ(zv_fskip(nullptr), -1);
  EXPECT_EQ(zv_fskip(open("out", "w").get()), -1);
}

template <class Value>
std::string bytes_of(Value value, bool reversed = false) {
  std::string bytes(reinterpret_cast<const char*>(&value), sizeof value);
  if (reversed) std::reverse(bytes.begin(), bytes.end());
  return bytes;
}

TEST(ByteOrder, SingleValues) {
  const auto check = [](auto swap, auto value) {
    EXPECT_EQ(bytes_of(swap(value)), bytes_of(value, true));
  };
  check(zv_swap_int16, int16_t{-0x0102});
  check(zv_swap_uint16, uint16_t{0xFE01});
  check(zv_swap_int32, -0x01020304);
  check(zv_swap_uint32, 0xF1223344);
  check(zv_swap_int64, int64_t{-0x0102030405060708});
  check(zv_swap_uint64, uint64_t{0x8877665544332211});
  check(zv_swap_float, std::numeric_limits<float>::quiet_NaN());
  check(zv_swap_double, -0.1);
}

// Each count meets another mixture of wide, narrow and single steps; each offset another alignment.
TEST(ByteOrder, ArraysOfEveryCountAndAlignment) {
  constexpr size_t fence = 16;
  for (const size_t size : {0u, 1u, 2u, 3u, 4u, 8u, 16u})
    for (int count = -1; count < 200; ++count)
      for (const size_t offset : {0u, 1u, 8u}) {
        const auto elements = static_cast<size_t>(std::max(count, 0));
        std::string data(offset + elements * size + fence, '\0');
        for (size_t i = 0; i < data.size(); ++i) data[i] = static_cast<char>(i * 7 + i / 256);
        std::string expected = data;
        for (size_t i = 0; i < elements && (size == 2 || size == 4 || size == 8); ++i) {
          char* const element = expected.data() + offset + i * size;
          std::reverse(element, element + size);
        }
        std::string typed = data;
        zv_swapv(data.data() + offset, count, size);
        ASSERT_EQ(data, expected) << size << ' ' << count << ' ' << offset;
        if (offset == 1) continue;  // no array of such values lies there
        void* const values = typed.data() + offset;
        if (size == 2) zv_swapv_16(static_cast<uint16_t*>(values), count);
        if (size == 4) zv_swapv_32(static_cast<uint32_t*>(values), count);
        if (size == 8) zv_swapv_64(static_cast<uint64_t*>(values), count);
        ASSERT_EQ(typed, expected) << size << ' ' << count << ' ' << offset;
      }
}

}  // namespace
