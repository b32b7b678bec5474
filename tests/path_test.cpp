// Paths: their forms and pieces, absolute and relative ones, as somebody wrote them in canonical
// form; the path map and the search path.
#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "environment.h"
#include "guarded.h"
#include "scratch_folder.h"
#include "string_list.h"

namespace {

// Which of these hold, a letter each.
std::string forms(const char* path) {
  int (*const questions[])(const char*) = {zv_ispath_DOS, zv_ispath_UNC, zv_ispath_UNIX,
                                           zv_ispath_relative, zv_ispath_root};
  std::string all;
  for (size_t i = 0; i < std::size(questions); ++i)
    if (questions[i](path) == 1) all += "dnxrR"[i];
  return all;
}

// The piece where it fits, where it does not, and in the path's own buffer.
void expect_piece(int (*extract)(const char*, char*, size_t), const std::string& path,
                  const std::string& piece) {
  for (const size_t size : {piece.size() + 1, std::max<size_t>(piece.size(), 1)}) {
    Guarded out("", size);
    EXPECT_EQ(extract(path.c_str(), out.data(), size), !piece.empty() && size > 1);
    EXPECT_EQ(out.text(), piece.substr(0, size - 1));
  }
  const size_t room = std::max(path.size(), piece.size()) + 1;
  const auto own = [extract, room](char* s) { return extract(s, s, room); };
  expect_edit(path, !piece.empty(), piece, own);
}

TEST(Path, FormsAndPieces) {
  const struct {
    std::string path;
    const char *forms, *trimmed, *split, *folder, *name, *extension;
  } cases[] = {
      {"", "r", "", "", "", "", ""},
      {"a.tar.gz", "r", "a.tar.gz", "a.tar.gz|", "", "a.tar.gz", ".gz"},
      {"name.", "r", "name.", "name.|", "", "name.", ""},
      {"dir/.profile", "r", "dir/.profile", "dir|.profile|", "dir", ".profile", ""},
      {"a.b/x//", "r", "a.b/x", "a.b|x|", "a.b", "x", ""},
      {"a//b", "r", "a//b", "a|", "a", "b", ""},
      {".\\", "r", ".\\", ".\\|", "", ".\\", ""},
      {"..", "r", "..", "..|", "..", "", ""},
      {"a/./", "r", "a/.", "a|.|", "a/.", "", ""},
      {"D:", "d", "D:", "D:|", "", "D:", ""},
      {"D:/a", "d", "D:/a", "D:/|a|", "D:/", "a", ""},
      {"D://", "d", "D:", "D:|", "", "D:", ""},
      {"D://a", "d", "D://a", "D:/|", "D:", "a", ""},
      {"D:a/b/", "d", "D:a/b", "D:a|b|", "D:a", "b", ""},
      {"::/", "dR", "::/", "::/|", "::/", "", ""},
      {"/:", "dx", "/:", "/|:|", "/", ":", ""},
      {"/", "xR", "/", "/|", "/", "", ""},
      {"/usr/x.y/", "x", "/usr/x.y", "/|usr|x.y|", "/usr", "x.y", ""},
      {"//", "", "", "", "", "", ""},
      {"//x", "", "//x", "/|", "", "x", ""},
      {"//srv//sh", "", "//srv//sh", "/|", "//srv", "sh", ""},
      {"//s/h", "nR", "//s/h/", "//s/h/|", "//s/h/", "", ""},
      {"//s/h/", "nR", "//s/h/", "//s/h/|", "//s/h/", "", ""},
      {"//s/h//", "n", "//s/h", "//s/h/|", "//s/h", "", ""},
      {"//s/h/f.c", "n", "//s/h/f.c", "//s/h/|f.c|", "//s/h/", "f.c", ".c"},
  };
  for (const auto& c : cases) {
    const char* const path = c.path.c_str();
    SCOPED_TRACE(path);
    EXPECT_EQ(forms(path), c.forms);
    const auto change = static_cast<int>(c.path.size()) - static_cast<int>(std::strlen(c.trimmed));
    expect_edit(c.path, std::abs(change), c.trimmed, zv_trim_slash);
    const bool grows = !c.path.empty() && !c.path.ends_with('/');
    expect_edit(c.path, grows, c.path + (grows ? "/" : ""), zv_add_slash);
    Guarded pieces(c.path + '\0', c.path.size() + 3);  // two characters more at most
    zv_split_path(pieces.data());
    EXPECT_EQ(barred(pieces.text()), c.split);
    expect_piece(zv_extract_directory, c.path, c.folder);
    expect_piece(zv_extract_filename, c.path, c.name);
    expect_piece(zv_extract_extension, c.path, c.extension);
    EXPECT_STREQ(zv_dot(path), c.extension);
    EXPECT_STREQ(zv_slash(path), path + std::min(c.path.rfind('/'), c.path.size()));
  }
}

struct ResolveCase {
  const char *path, *base;
  int result;
  const char* out;
};

// Also with `out` being the path's own buffer.
template <class Resolve>
void expect_resolved(Resolve resolve, const ResolveCase& c) {
  SCOPED_TRACE(c.path + std::string(" against ") + c.base);
  for (const bool own : {false, true}) {
    char out[64] = "kept";
    if (own) std::strcpy(out, c.path);
    EXPECT_EQ(resolve(own ? out : c.path, c.base, out, sizeof out), c.result);
    EXPECT_STREQ(out, own && std::strcmp(c.out, "kept") == 0 ? c.path : c.out);
  }
}

// Nothing tests for a relative path.
TEST(Path, Absolute) {
  const ResolveCase cases[] = {
      {"a/./b/../d", "w", 1, "w/a/./b/../d"}, {".", "D:/w/", 1, "D:/w"},
      {"../x", "D:/app/bin", 1, "D:/app/x"},  {"../x", "a/b", 1, "a/x"},
      {"..", "//srv/sh/a", 1, "//srv/sh/"},   {"x", "//", 0, "kept"},
      {".././a", "D:/w/v", 1, "D:/w/./a"},    {"a/", "/", 1, "/a"},
      {"a//lost", "/w//lost", 1, "/w/a"},     {"../x", "a", 0, ""},
      {"./././a", "D:/w", 1, "D:/w/a"},       {"", "D:", 1, "D:/"},
      {"../..", "//srv/sh/a", 0, ""},         {"x", "", 0, "kept"},
      {"/x", "D:/w", 1, "D:/w//x"},
  };
  for (const ResolveCase& c : cases) expect_resolved(zv_absolute, c);
}

// What is left may be a root once it is joined.
TEST(Path, Relative) {
  const ResolveCase cases[] = {
      {"D:/a/b/f", "D:/a", 1, "b/f"},
      {"D:/a/x", "D:/a/b/e", 1, "../../x"},
      {"D:/A/b", "d:/a", 1, "b"},
      {"D:/a", "D:/a/", 1, ""},
      {"D:/", "D:/a", 1, ".."},
      {"D:/ab", "D:/a", 1, "../ab"},
      {"/x/D:", "/x", 1, "D:/"},
      {"//s/a/x", "//S/b/y", 1, "../../a/x"},
      {"//s/a/", "//s/A", 1, ""},
      {"//srv/a", "//srw/a", 0, "//srv/a"},
      {"//srv/a", "//sr/a", 0, "//srv/a"},
      {"//srv/a", "/srv/a", 0, "//srv/a"},
      {"D:/a/", "/a", 0, "D:/a/"},
      {"a/b", "a/e", 1, "../b"},
      {"x", "y", 0, "x"},
      {"", "D:/a", 0, ""},
      {"x", "", 0, "x"},
  };
  for (const ResolveCase& c : cases) expect_resolved(zv_relative, c);
  const ScratchFolder scratch;
  const WorkingDirectory inside(scratch.make_folder("a/b"));
  char out[ZV_PATH_MAX];
  EXPECT_EQ(zv_absolute("../x", nullptr, out, sizeof out), 1);
  EXPECT_EQ(out, scratch.path("a/x"));
  EXPECT_EQ(zv_relative(out, nullptr, out, sizeof out), 1);
  EXPECT_STREQ(out, "../x");
}

TEST(Path, LongOnesAreCutOrRefused) {
  const std::string base = '/' + std::string(299, 'b');
  char out[400];
  EXPECT_EQ(zv_extract_filename((base + "/" + std::string(99, 'n')).c_str(), out, 400), 1);
  EXPECT_EQ(out, std::string(18, 'n'));
  EXPECT_EQ(zv_extract_directory((std::string(350, 'd') + "/n").c_str(), out, 400), 0);
  const std::string bare_share = "//s/" + std::string(315, 'h');  // has no room for its separator
  EXPECT_EQ(zv_extract_directory(bare_share.c_str(), out, 400), 0);
  EXPECT_STREQ(out, "");
  EXPECT_EQ(zv_absolute("lib", "/usr/local", out, 8), 1);
  EXPECT_STREQ(out, "/usr/lo");
  EXPECT_EQ(zv_relative("/usr/local", "D:/", out, 5), 0);
  EXPECT_STREQ(out, "/usr");
  EXPECT_EQ(zv_absolute("lib", "/usr", out, 1), 0);
  // 319 characters fit and one more does not, whether it comes from a name or from climbing.
  for (const bool fits : {true, false}) {
    const std::string name(fits ? 18 : 19, 'n');
    std::strcpy(out, "kept");
    EXPECT_EQ(zv_absolute(name.c_str(), base.c_str(), out, sizeof out), fits);
    EXPECT_EQ(out, fits ? base + "/" + name : "kept");
    std::string deep;
    for (int i = 0; i < (fits ? 106 : 107); ++i) deep += "/d";
    EXPECT_EQ(zv_relative("/x", deep.c_str(), out, sizeof out), fits);
    EXPECT_EQ(std::strlen(out), fits ? 319u : 2u);
  }
  // The longest list of components there is.
  std::string most = "a";
  while (most.size() < 319) most += "/a";
  EXPECT_EQ(zv_relative((most + "/cut").c_str(), "a", out, sizeof out), 1);
  EXPECT_EQ(out, most.substr(2));
}

// The current drive, such as "C:"; nothing where there are no drives.
std::string drive() {
  return std::filesystem::current_path().root_name().string();
}

// '@' in front is the current drive; "refused" is where there is none and nothing is left of the
// path either.
void expect_normal(const std::string& path, const std::string& normal) {
  char buffer[ZV_PATH_MAX];
  zv_strncpy(buffer, path.c_str(), sizeof buffer);
  std::string result = zv_normalize_path(buffer) == 1 ? "" : "refused";
  result += buffer;
  EXPECT_EQ(result, normal.starts_with('@') ? drive() + normal.substr(1) : normal) << path;
}

TEST(Normalize, Text) {
  const char* const cases[][2] = {
      {"//srv/sh//a/./b", "//srv/sh/a/b"}, {"a/../../b", "../b"}, {"a/././/.", "a"},
      {"D:\\a\\.\\b\\..\\d\\", "D:/a/d"},  {"/x//y/", "@/x/y"},   {"//srv/./", "/"},
      {"\\\\srv\\sh\\x", "//srv/sh/x"},    {"  a b\n", "a b"},    {"a/D:", "a/D:"},
      {"//srv/sh/a/../..", "refused"},     {"D://.//", "D:/"},    {"./..", ".."},
      {".a/..b/c.", ".a/..b/c."},          {"/..", "refused"},    {"...", "..."},
      {"a/b/../d/../../e", "e"},           {"//srv", "@/srv"},    {"///", "@/"},
      {"D:/a/../..", "refused"},           {"1:x", "refused"},    {"/.", "@/"},
      {"//srv/sh", "//srv/sh/"},           {"/:x", "refused"},    {"a/..", ""},
      {"//srv//sh", "@/srv/sh"},           {"a/../D:", "D:/"},    {"./", "."},
      {"///srv/sh", "@/srv/sh"},           {".//./a", "./a"},     {"", ""},
  };
  for (const auto& [path, normal] : cases) expect_normal(path, normal);
}

TEST(Normalize, VariablesAndHome) {
  const ScratchFolder scratch;
  Home home(scratch.path());
  const Variable folder("ZV_DIR", "D:\\v\\w\\"), dots("ZV_DOTS", "./../.."), root("ZV_ROOT", "D:/"),
      share("ZV_SHARE", "\\\\srv\\sh"), unset("ZV_UNSET", std::nullopt);
  const std::string cases[][2] = {
      {"a/b/%ZV_UNSET%/c", "refuseda/b/"}, {"$ZV_SHARE", "//srv/sh/"}, {"~name", "~name"},
      {"~/docs/../x", scratch.path("x")},  {"a$ZV_DIR", "a$ZV_DIR"},   {"%%", "refused"},
      {"../../$ZV_DIR", "../../D:/v/w"},   {"%ZV_ROOT%/x", "D:/x"},    {"$", "refused"},
      {"a/$ZV_DOTS/b", "a/./../../b"},     {"$ZV_DIR%", "refused"},    {"~/../x", "x"},
      {"%ZV_DIR%/log", "D:/v/w/log"},      {"%ZV_DIR%/../x", "x"},     {"a/~", "a/~"},
      {"x/$ZV_DIR/y", "x/D:/v/w/y"},       {"$ZV_DIR", "D:/v/w"},      {"%A", "%A"},
      {"./../$ZV_DIR", "../D:/v/w"},       {"~", scratch.path()},      {"%", "%"},
      {"$ZV_SHARE/x", "//srv/sh/x"},       {"%ZV_ROOT%", "D:/"},
  };
  for (const auto& [path, normal] : cases) expect_normal(path, normal);
  home.set(scratch.path("missing"));
  expect_normal("~/x", "refused");
#ifndef _WIN32  // where an empty variable cannot exist
  const Variable empty("ZV_EMPTY", "");
  expect_normal("a/$ZV_EMPTY/b", "a/b");
  expect_normal("$ZV_EMPTY", "");
#endif
}

TEST(Normalize, RelativeToADrive) {
#ifndef _WIN32
  for (const char* const path : {"D:", "D:x", "c:x/y"}) expect_normal(path, "refused");
#else
  const ScratchFolder scratch;
  const WorkingDirectory inside(scratch.make_folder("sub"));
  const std::string sub = scratch.path("sub");
  std::string lower = drive();
  zv_strlwr(lower.data());
  expect_normal(drive(), sub);
  expect_normal(lower + "x\\y\\\\", sub + "/x/y");
  expect_normal(drive() + "../x", scratch.path("x"));
  expect_normal(drive() + "./x", sub + "/./x");  // this "." has no separator before it
  expect_normal(drive() + std::string(ZV_PATH_MAX - sub.size(), 'x'), "refused");
  const WorkingDirectory at_root(drive() + "/");
  expect_normal(drive(), "@/");
  expect_normal(drive() + "x", "@/x");
  std::string other;
  for (char letter = 'A'; letter <= 'Z'; ++letter) {
    const std::string name = {letter, ':'};
    std::error_code ignored;
    const bool there = std::filesystem::is_directory(name + "/", ignored);
    if (!there) expect_normal(name + "x", "refused");
    if (there && name != drive()) other = name;
  }
  if (other.empty()) GTEST_SKIP() << "there is one drive only";
  expect_normal(other + "x", other + "/x");
  for (const auto& entry : std::filesystem::directory_iterator(other + "/")) {
    if (!entry.is_directory()) continue;
    // As Windows remembers it when the process leaves the drive.
    SetEnvironmentVariableA(("=" + other).c_str(), entry.path().string().c_str());
    expect_normal(other + "x", entry.path().generic_string() + "/x");
    SetEnvironmentVariableA(("=" + other).c_str(), nullptr);
    break;
  }
#endif
}

TEST(Normalize, WhatDoesNotFitIsRefused) {
  const std::string text(310, 'x'), rooted = "/" + std::string(318, 'y');
  const Variable variable("ZV_LONG", text), longer("ZV_LONGER", text + text);
  expect_normal("$ZV_LONG/12345678", text + "/12345678");
  for (const char* const path : {"a/$ZV_LONG/1234567", "$ZV_LONG/$ZV_LONG"})
    expect_normal(path, "refused");
  expect_normal("$ZV_LONGER", (text + text).substr(0, 319));
  expect_normal(rooted, !drive().empty() ? "refused" : rooted);
  expect_normal(" //s/" + std::string(314, 'y'), "//s/" + std::string(314, 'y') + "/");
  expect_normal("//s/" + std::string(315, 'y'), "refused");
}

// What a search rewrites its path to; "none" when it finds nothing and leaves the path alone.
std::string search(int (*locate)(char*), const std::string& path) {
  char buffer[ZV_PATH_MAX];
  zv_strncpy(buffer, path.c_str(), sizeof buffer);
  if (locate(buffer) == 1) return buffer;
  EXPECT_EQ(buffer, path);
  return "none";
}

// In a folder of its own.
class PathMap : public testing::Test {
 protected:
  ~PathMap() override { zv_pathmap_clear(); }

  static std::string locate(const std::string& path) { return search(zv_pathmap_locate, path); }

  const ScratchFolder scratch;
  const WorkingDirectory inside{scratch.path()};
};

TEST_F(PathMap, RecordsAndLocates) {
  for (const char* const file : {"new/f", "new/sub/x.dat", "in/side/y", "old/there", "work/f"})
    scratch.make_file(file);
  EXPECT_EQ(locate("old/f"), "none");
  EXPECT_EQ(zv_pathmap("old/f", "old/g"), 0);
  EXPECT_EQ(zv_pathmap("old/f", "new/"), 1);  // the parent is meant
  EXPECT_EQ(zv_pathmap("old/f", "new/f"), 1);
  EXPECT_EQ(zv_pathmap("old/other", "new/g"), 0);
  const char* const cases[][2] = {{"old/there", "old/there"},
                                  {"old/f", "new/f"},
                                  {"OLD/sub/x.dat", "new/sub/x.dat"},
                                  {"old/missing", "none"},
                                  {"//srv/sh/f", "none"}};
  for (const auto& [path, found] : cases) EXPECT_EQ(locate(path), found);
  // The record also moves what lies beside the former folder.
  EXPECT_EQ(zv_pathmap("old/deep/f", "in/side/y"), 1);
  EXPECT_EQ(locate("old/y"), "none");
  EXPECT_EQ(locate("old/deep/y"), "in/side/y");
  EXPECT_EQ(zv_pathmap("old/f", "elsewhere/f"), 1);
  EXPECT_EQ(locate("old/side/y"), "in/side/y");
  zv_pathmap_clear();
  EXPECT_EQ(locate("old/deep/y"), "none");
  // A name alone lies in the working directory where it is the target, and nowhere as the source.
  EXPECT_EQ(zv_pathmap(scratch.path("old/new/f").c_str(), "name"), 1);
  EXPECT_EQ(locate(scratch.path("old/new/new/f")), scratch.path("new/f"));
  EXPECT_EQ(zv_pathmap("name", scratch.path("work/f").c_str()), 1);
  EXPECT_EQ(locate("f"), "none");
}

TEST_F(PathMap, OldestRecordWinsAndItsTargetCanChange) {
  for (const char* const file : {"one/f", "two/f", "three/f"}) scratch.make_file(file);
  EXPECT_EQ(zv_pathmap("old/f", "nowhere/f"), 1);
  EXPECT_EQ(zv_pathmap("Old/f", "one/f"), 1);  // another record: byte for byte
  EXPECT_EQ(zv_pathmap("oLd/f", "two/f"), 1);
  EXPECT_EQ(locate("old/f"), "one/f");
  EXPECT_EQ(zv_pathmap("old/f", "three/f"), 1);
  EXPECT_EQ(locate("old/f"), "three/f");
  EXPECT_EQ(locate("old/" + std::string(ZV_PATH_MAX - 5, 'n')), "none");  // fits there, just so
}

TEST(SearchPath, FoldersAndWhatLiesInThem) {
  const ScratchFolder scratch;
  for (const char* const file : {"one/tool", "two/tool", "two/only", "two/folder/x"})
    scratch.make_file(file);
  const std::string too_long(400, 'x'), one = scratch.path("one"), two = scratch.path("two");
  Variable path("PATH", std::nullopt);
  const std::pair<std::optional<std::string>, std::string> cases[] = {
      {std::nullopt, "none"},
      {one + ";" + one + "\\;", one + ";" + one + "/;;"},
      {"Q:\\no\\such;;x", "Q:/no/such;;x;"},
      {too_long + "\\;y", too_long + "/;y;"},
#ifndef _WIN32
      {"", "none"},
      {"/no/such:" + one + ":", "/no/such;" + one + ";;"},
      {"/a:b;c", "/a:b;c;"},
#endif
  };
  for (const auto& [value, folders] : cases) {
    path.set(value);
    char** list = nullptr;
    const int count = zv_pathlist(&list);
    EXPECT_EQ(joined(list), folders);
    EXPECT_EQ(count, list != nullptr ? zv_strlist_len(list) : 0);
    zv_strlist_free(list, count);
  }
  // An empty element is the working directory.
  const std::string all = two + "/no;" + std::string(318, 'x') + ";" + one + "/;" + two;
  const std::string searches[][3] = {
      {all, "any/where/tool", one + "/tool"},
      {all, "only", two + "/only"},
      {all, "folder/", two + "/folder"},
      {all, "any/x", "none"},
      {all, std::string(319, 'n'), "none"},
      {one, "/", one},
      {one, "only", "none"},
      {one + ";", "only", "only"},
  };
  path.set(std::nullopt);
  EXPECT_EQ(search(zv_path_locate, "tool"), "none");
  const WorkingDirectory inside(two);
  for (const auto& [value, name, found] : searches) {
    path.set(value);
    EXPECT_EQ(search(zv_path_locate, name), found);
  }
}

}  // namespace
