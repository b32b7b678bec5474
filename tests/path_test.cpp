// The forms of a path and its pieces.
#include <gtest/gtest.h>

#include <cstring>
#include <string>

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
  char text[64];
  std::memset(text, '?', sizeof text);
  std::strcpy(text, path);
  zv_split_path(text);
  std::string pieces;
  for (const char* piece = text; *piece != '\0'; piece += std::strlen(piece) + 1)
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

}  // namespace
