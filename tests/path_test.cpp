// The forms of a path and its pieces.
#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "environment.h"
#include "guarded.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

struct FormCase {
  const char* path;
  const char* forms;  // of "dnxrR": DOS, UNC, UNIX, relative, root
  int trim_result;
  const char* trimmed;
};

TEST(Path, FormsAndTrimming) {
  const FormCase cases[] = {
      {"", "r", 0, ""},
      {"D:", "d", 0, "D:"},
      {"D:/", "dR", 0, "D:/"},
      {"D:/x", "d", 0, "D:/x"},
      {"D:x/", "d", 1, "D:x"},
      {"D://", "d", 2, "D:"},
      {"::/", "dR", 0, "::/"},
      {"/:", "dx", 0, "/:"},
      {":a", "r", 0, ":a"},
      {"/", "xR", 0, "/"},
      {"//", "", 2, ""},
      {"///", "", 3, ""},
      {"/a/", "x", 1, "/a"},
      {"//srv", "", 0, "//srv"},
      {"//srv/", "", 1, "//srv"},
      {"//srv//sh", "", 0, "//srv//sh"},
      {"///srv/sh", "", 0, "///srv/sh"},
      {"//s/h", "nR", 1, "//s/h/"},
      {"//srv/sh/", "nR", 0, "//srv/sh/"},
      {"//srv/sh//", "n", 2, "//srv/sh"},
      {"//srv/sh/dir/", "n", 1, "//srv/sh/dir"},
      {"a/b//", "r", 2, "a/b"},
      {"a\\", "r", 0, "a\\"},
      {"a", "r", 0, "a"},
  };
  for (const FormCase& c : cases) {
    SCOPED_TRACE(c.path);
    std::string forms;
    if (zv_ispath_DOS(c.path) == 1) forms += 'd';
    if (zv_ispath_UNC(c.path) == 1) forms += 'n';
    if (zv_ispath_UNIX(c.path) == 1) forms += 'x';
    if (zv_ispath_relative(c.path) == 1) forms += 'r';
    if (zv_ispath_root(c.path) == 1) forms += 'R';
    EXPECT_EQ(forms, c.forms);

    char text[32];
    std::strcpy(text, c.path);
    EXPECT_EQ(zv_trim_slash(text), c.trim_result);
    EXPECT_STREQ(text, c.trimmed);

    const bool grows = *c.path != '\0' && c.path[std::strlen(c.path) - 1] != '/';
    std::strcpy(text, c.path);
    EXPECT_EQ(zv_add_slash(text), grows);
    EXPECT_EQ(text, std::string(c.path) + (grows ? "/" : ""));
  }
}

struct PieceCase {
  const char* path;
  const char* split;  // '|' behind each piece
  const char* folder;
  const char* name;
  const char* extension;
};

std::string split(const char* path) {
  Guarded text(path, 2);  // the room for two characters more that splitting may take
  zv_split_path(text.data());
  EXPECT_TRUE(text.intact()) << path;
  std::string pieces;
  for (const char* piece = text.text(); *piece != '\0'; piece += std::strlen(piece) + 1)
    pieces += std::string(piece) + '|';
  return pieces;
}

TEST(Path, Pieces) {
  const PieceCase cases[] = {
      {"", "", "", "", ""},
      {"name", "name|", "", "name", ""},
      {"a.txt", "a.txt|", "", "a.txt", ".txt"},
      {"a.tar.gz", "a.tar.gz|", "", "a.tar.gz", ".gz"},
      {"name.", "name.|", "", "name.", ""},
      {".profile", ".profile|", "", ".profile", ""},
      {"dir/.profile", "dir|.profile|", "dir", ".profile", ""},
      {"dir/a.b", "dir|a.b|", "dir", "a.b", ".b"},
      {"a.b/x", "a.b|x|", "a.b", "x", ""},
      {"a/b/", "a|b|", "a", "b", ""},
      {"a//b", "a|", "a", "b", ""},
      {".", ".|", ".", "", ""},
      {"..", "..|", "..", "", ""},
      {"a/..", "a|..|", "a/..", "", ""},
      {"a/./", "a|.|", "a/.", "", ""},
      {"D:/a/b.txt", "D:/|a|b.txt|", "D:/a", "b.txt", ".txt"},
      {"D:/a", "D:/|a|", "D:/", "a", ""},
      {"D:/", "D:/|", "D:/", "", ""},
      {"D://a", "D:/|", "D:", "a", ""},
      {"D:", "D:|", "", "D:", ""},
      {"D:a/b", "D:a|b|", "D:a", "b", ""},
      {"/", "/|", "/", "", ""},
      {"/x", "/|x|", "/", "x", ""},
      {"/usr/x.y/", "/|usr|x.y|", "/usr", "x.y", ""},
      {"//x", "/|", "", "x", ""},
      {"//srv/sh", "//srv/sh/|", "//srv/sh/", "", ""},
      {"//srv/sh//", "//srv/sh/|", "//srv/sh", "", ""},
      {"//srv/sh/f.c", "//srv/sh/|f.c|", "//srv/sh/", "f.c", ".c"},
      {"//srv/sh/a/b", "//srv/sh/|a|b|", "//srv/sh/a", "b", ""},
  };
  for (const PieceCase& c : cases) {
    SCOPED_TRACE(c.path);
    EXPECT_EQ(split(c.path), c.split);
    char out[32];
    EXPECT_EQ(zv_extract_directory(c.path, out, sizeof out), *c.folder != '\0');
    EXPECT_STREQ(out, c.folder);
    EXPECT_EQ(zv_extract_filename(c.path, out, sizeof out), *c.name != '\0');
    EXPECT_STREQ(out, c.name);
    EXPECT_EQ(zv_extract_extension(c.path, out, sizeof out), *c.extension != '\0');
    EXPECT_STREQ(out, c.extension);
    EXPECT_STREQ(zv_dot(c.path), *c.extension != '\0' ? c.extension : "");
  }
  const char* const path = "a/b/c";
  EXPECT_EQ(zv_slash(path), path + 3);
  EXPECT_EQ(zv_slash("abc")[0], '\0');
}

using Extract = int (*)(const char* path, char* out, size_t size);

TEST(Path, OutputIsCutAndMayBeThePathItself) {
  const struct {
    Extract extract;
    const char* whole;
    const char* cut;
  } cases[] = {{zv_extract_directory, "dir/sub", "dir"},
               {zv_extract_filename, "name.text", "nam"},
               {zv_extract_extension, ".text", ".te"}};
  for (const auto& c : cases) {
    char text[] = "dir/sub/name.text";
    char out[4] = "xyz";
    EXPECT_EQ(c.extract(text, out, sizeof out), 1);
    EXPECT_STREQ(out, c.cut);
    EXPECT_EQ(c.extract(text, out, 1), 0);
    EXPECT_STREQ(out, "");
    EXPECT_EQ(c.extract(text, text, sizeof text), 1);
    EXPECT_STREQ(text, c.whole);
  }
}

TEST(Path, LongPathsAreCut) {
  const std::string folder(300, 'd');
  char out[400];
  EXPECT_EQ(zv_extract_filename((folder + "/" + std::string(99, 'n')).c_str(), out, 400), 1);
  EXPECT_EQ(out, std::string(18, 'n'));
  EXPECT_EQ(zv_extract_directory((folder + std::string(50, 'd') + "/n").c_str(), out, 400), 0);

  const std::string bare_share = "//s/" + std::string(315, 'h');  // has no room for its separator
  EXPECT_EQ(zv_extract_directory(bare_share.c_str(), out, 400), 0);
  EXPECT_STREQ(out, "");
}

struct ResolveCase {
  const char* path;
  const char* base;
  int result;
  const char* out;
};

using Resolve = int (*)(const char* path, const char* base, char* out, size_t size);

// Also with `out` being the path's own buffer.
void expect_resolved(Resolve resolve, const ResolveCase& c) {
  SCOPED_TRACE(std::string(c.path) + " against " + c.base);
  char out[64] = "untouched";
  EXPECT_EQ(resolve(c.path, c.base, out, sizeof out), c.result);
  EXPECT_STREQ(out, c.out);
  if (std::strcmp(c.out, "untouched") == 0) return;
  std::strcpy(out, c.path);
  EXPECT_EQ(resolve(out, c.base, out, sizeof out), c.result);
  EXPECT_STREQ(out, c.out);
}

TEST(Path, Absolute) {
  const ResolveCase cases[] = {
      {"../lib/x.dll", "D:/app/bin", 1, "D:/app/lib/x.dll"},
      {"./a/b", "D:/w", 1, "D:/w/a/b"},
      {"", "D:/w", 1, "D:/w"},
      {".", "D:/w/", 1, "D:/w"},
      {"x", "//srv/sh", 1, "//srv/sh/x"},
      {"..", "//srv/sh/a", 1, "//srv/sh/"},
      {"../..", "//srv/sh/a", 0, ""},
      {"a", "D:/", 1, "D:/a"},
      {"a/", "/", 1, "/a"},
      {"../x", "D:/", 0, ""},
      {"./././a", "D:/w", 1, "D:/w/a"},
      {"a/./b/../d", "D:/w", 1, "D:/w/a/./b/../d"},
      {".././a", "D:/w/v", 1, "D:/w/./a"},
      {"../..", "D:/a/b", 1, "D:/"},
      {"../../..", "D:/a/b", 0, ""},
      {"../x", "a/b", 1, "a/x"},
      {"../x", "a", 0, ""},
      {"/x", "D:/w", 1, "D:/w//x"},  // nothing tests for a relative path
      {"x", "D:", 1, "D:/x"},
      {"", "D:", 1, "D:/"},
      {"a//lost", "/w//lost", 1, "/w/a"},
      {"x", "", 0, "untouched"},
      {"x", "//", 0, "untouched"},
  };
  for (const ResolveCase& c : cases) expect_resolved(zv_absolute, c);
}

TEST(Path, Relative) {
  const ResolveCase cases[] = {
      {"D:/a/b/f.txt", "D:/a", 1, "b/f.txt"},
      {"D:/a/x", "D:/a/b/e", 1, "../../x"},
      {"D:/a/b", "D:/a/b/e", 1, ".."},
      {"D:/A/b", "d:/a", 1, "b"},
      {"D:/a", "D:/a/", 1, ""},
      {"D:/", "D:/a", 1, ".."},
      {"D:/ab", "D:/a", 1, "../ab"},
      {"/x", "/", 1, "x"},
      {"/", "/", 1, ""},
      {"/x/D:", "/x", 1, "D:/"},  // what is left is a root once it is joined
      {"//srv/a/x", "//SRV/b/y", 1, "../../a/x"},
      {"//srv/a", "//srv/b", 1, "../a"},
      {"//srv/a/", "//srv/A", 1, ""},
      {"//srv/a/x", "//srv/a", 1, "x"},
      {"//srv/a", "//srw/a", 0, "//srv/a"},
      {"//srv/a", "//sr/a", 0, "//srv/a"},
      {"//srv/a", "/srv/a", 0, "//srv/a"},
      {"D:/a", "E:/a", 0, "D:/a"},
      {"D:/a/", "/a", 0, "D:/a/"},
      {"a/b", "a/e", 1, "../b"},
      {"a/b", "/a", 0, "a/b"},
      {"x", "y", 0, "x"},
      {"", "D:/a", 0, ""},
      {"x", "", 0, "x"},
  };
  for (const ResolveCase& c : cases) expect_resolved(zv_relative, c);
}

TEST(Path, ResolvedAgainstTheWorkingDirectory) {
  const ScratchFolder scratch;
  const WorkingDirectory inside(scratch.make_folder("a/b"));
  char out[ZV_PATH_MAX];
  EXPECT_EQ(zv_absolute("../x", nullptr, out, sizeof out), 1);
  EXPECT_EQ(out, scratch.path("a/x"));
  EXPECT_EQ(zv_relative(out, nullptr, out, sizeof out), 1);
  EXPECT_STREQ(out, "../x");
}

TEST(Path, ResolvedResultsAreCutOrRefused) {
  char out[8] = "";
  EXPECT_EQ(zv_absolute("lib", "/usr/local", out, sizeof out), 1);
  EXPECT_STREQ(out, "/usr/lo");
  EXPECT_EQ(zv_relative("/usr/local", "/usr/local/lib/x", out, 3), 1);
  EXPECT_STREQ(out, "..");
  EXPECT_EQ(zv_relative("/usr/local", "D:/", out, 5), 0);
  EXPECT_STREQ(out, "/usr");
  EXPECT_EQ(zv_absolute("lib", "/usr", out, 1), 0);

  // 319 characters fit and one more does not, whether it comes from a name or from climbing.
  std::string base(300, 'b');
  base[0] = '/';
  for (const bool fits : {true, false}) {
    const std::string name(fits ? 18 : 19, 'n');
    char whole[400] = "untouched";
    EXPECT_EQ(zv_absolute(name.c_str(), base.c_str(), whole, sizeof whole), fits);
    EXPECT_EQ(whole, fits ? base + "/" + name : "untouched");

    std::string deep;
    for (int i = 0; i < (fits ? 106 : 107); ++i) deep += "/d";
    const std::string path = fits ? "/x" : "/y";
    EXPECT_EQ(zv_relative(path.c_str(), deep.c_str(), whole, sizeof whole), fits);
    EXPECT_EQ(std::strlen(whole), fits ? 319u : 2u);
  }

  // The longest list of components there is.
  std::string most = "a";
  while (most.size() < 319) most += "/a";
  char whole[400];
  EXPECT_EQ(zv_relative((most + "/cut").c_str(), "a", whole, sizeof whole), 1);
  EXPECT_EQ(whole, most.substr(2));
}

}  // namespace
