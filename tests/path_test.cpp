// The forms of a path and its pieces.
#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "environment.h"
#include "guarded.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

// Which of these hold, a letter each: DOS, UNC, UNIX, relative, root.
std::string forms(const char* path) {
  const struct {
    int (*holds)(const char*);
    char letter;
  } questions[] = {{zv_ispath_DOS, 'd'},
                   {zv_ispath_UNC, 'n'},
                   {zv_ispath_UNIX, 'x'},
                   {zv_ispath_relative, 'r'},
                   {zv_ispath_root, 'R'}};
  std::string all;
  for (const auto& question : questions)
    if (question.holds(path) == 1) all += question.letter;
  return all;
}

// The pieces, '|' behind each.
std::string split(const char* path) {
  Guarded text(path, 2);  // the room for two characters more that splitting may take
  zv_split_path(text.data());
  std::string pieces;
  for (const char* piece = text.text(); *piece != '\0'; piece += std::strlen(piece) + 1)
    pieces += std::string(piece) + '|';
  return pieces;
}

// The piece where it fits, where it does not, and in the path's own buffer.
void expect_piece(int (*extract)(const char*, char*, size_t), const char* path,
                  const std::string& piece) {
  for (const size_t size : {piece.size() + 1, std::max<size_t>(piece.size(), 1), size_t{1}}) {
    Guarded out = Guarded::buffer("", size);
    EXPECT_EQ(extract(path, out.data(), size), !piece.empty() && size > 1);
    EXPECT_EQ(out.text(), piece.substr(0, size - 1));
  }
  const auto in_place = [&](char* s) { return extract(s, s, std::strlen(s) + 2); };
  Guarded own(path, 1);
  EXPECT_EQ(in_place(own.data()), !piece.empty());
  EXPECT_EQ(own.text(), piece);
}

TEST(Path, FormsAndPieces) {
  const struct {
    const char *path, *forms, *trimmed, *split, *folder, *name, *extension;
  } cases[] = {
      {"", "r", "", "", "", "", ""},
      {"a.tar.gz", "r", "a.tar.gz", "a.tar.gz|", "", "a.tar.gz", ".gz"},
      {"name.", "r", "name.", "name.|", "", "name.", ""},
      {".profile", "r", ".profile", ".profile|", "", ".profile", ""},
      {"dir/.profile", "r", "dir/.profile", "dir|.profile|", "dir", ".profile", ""},
      {"dir/a.b", "r", "dir/a.b", "dir|a.b|", "dir", "a.b", ".b"},
      {"a.b/x//", "r", "a.b/x", "a.b|x|", "a.b", "x", ""},
      {"a//b", "r", "a//b", "a|", "a", "b", ""},
      {"a\\", "r", "a\\", "a\\|", "", "a\\", ""},
      {"..", "r", "..", "..|", "..", "", ""},
      {"a/..", "r", "a/..", "a|..|", "a/..", "", ""},
      {"a/./", "r", "a/.", "a|.|", "a/.", "", ""},
      {"D:", "d", "D:", "D:|", "", "D:", ""},
      {"D:/", "dR", "D:/", "D:/|", "D:/", "", ""},
      {"D:/a", "d", "D:/a", "D:/|a|", "D:/", "a", ""},
      {"D://", "d", "D:", "D:|", "", "D:", ""},
      {"D://a", "d", "D://a", "D:/|", "D:", "a", ""},
      {"D:a/b/", "d", "D:a/b", "D:a|b|", "D:a", "b", ""},
      {"::/", "dR", "::/", "::/|", "::/", "", ""},
      {"/:", "dx", "/:", "/|:|", "/", ":", ""},
      {":a", "r", ":a", ":a|", "", ":a", ""},
      {"/", "xR", "/", "/|", "/", "", ""},
      {"/x", "x", "/x", "/|x|", "/", "x", ""},
      {"/usr/x.y/", "x", "/usr/x.y", "/|usr|x.y|", "/usr", "x.y", ""},
      {"//", "", "", "", "", "", ""},
      {"//x", "", "//x", "/|", "", "x", ""},
      {"//srv/", "", "//srv", "/|", "", "srv", ""},
      {"//srv//sh", "", "//srv//sh", "/|", "//srv", "sh", ""},
      {"//s/h", "nR", "//s/h/", "//s/h/|", "//s/h/", "", ""},
      {"//srv/sh/", "nR", "//srv/sh/", "//srv/sh/|", "//srv/sh/", "", ""},
      {"//srv/sh//", "n", "//srv/sh", "//srv/sh/|", "//srv/sh", "", ""},
      {"//srv/sh/f.c", "n", "//srv/sh/f.c", "//srv/sh/|f.c|", "//srv/sh/", "f.c", ".c"},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.path);
    const std::string path = c.path;
    EXPECT_EQ(forms(c.path), c.forms);
    const auto change = static_cast<int>(path.size()) - static_cast<int>(std::strlen(c.trimmed));
    expect_edit(path, zv_trim_slash, std::abs(change), c.trimmed);
    const bool grows = !path.empty() && !path.ends_with('/');
    expect_edit(path, zv_add_slash, grows, path + (grows ? "/" : ""));

    EXPECT_EQ(split(c.path), c.split);
    expect_piece(zv_extract_directory, c.path, c.folder);
    expect_piece(zv_extract_filename, c.path, c.name);
    expect_piece(zv_extract_extension, c.path, c.extension);
    EXPECT_STREQ(zv_dot(c.path), c.extension);
    EXPECT_STREQ(zv_slash(c.path), c.path + std::min(path.rfind('/'), path.size()));
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
  const char *path, *base;
  int result;
  const char* out;
};

// Also with `out` being the path's own buffer.
void expect_resolved(int (*resolve)(const char*, const char*, char*, size_t),
                     const ResolveCase& c) {
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
      {"", "D:/w", 1, "D:/w"},
      {".", "D:/w/", 1, "D:/w"},
      {"..", "//srv/sh/a", 1, "//srv/sh/"},
      {"../..", "//srv/sh/a", 0, ""},
      {"a", "D:/", 1, "D:/a"},
      {"a/", "/", 1, "/a"},
      {"../x", "D:/", 0, ""},
      {"./././a", "D:/w", 1, "D:/w/a"},
      {"a/./b/../d", "D:/w", 1, "D:/w/a/./b/../d"},
      {".././a", "D:/w/v", 1, "D:/w/./a"},
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
      {"/", "/", 1, ""},
      {"/x/D:", "/x", 1, "D:/"},  // what is left is a root once it is joined
      {"//srv/a/x", "//SRV/b/y", 1, "../../a/x"},
      {"//srv/a", "//srv/b", 1, "../a"},
      {"//srv/a/", "//srv/A", 1, ""},
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
  char out[400] = "";
  EXPECT_EQ(zv_absolute("lib", "/usr/local", out, 8), 1);
  EXPECT_STREQ(out, "/usr/lo");
  EXPECT_EQ(zv_relative("/usr/local", "/usr/local/lib/x", out, 3), 1);
  EXPECT_STREQ(out, "..");
  EXPECT_EQ(zv_relative("/usr/local", "D:/", out, 5), 0);
  EXPECT_STREQ(out, "/usr");
  EXPECT_EQ(zv_absolute("lib", "/usr", out, 1), 0);

  // 319 characters fit and one more does not, whether it comes from a name or from climbing.
  const std::string base = '/' + std::string(299, 'b');
  for (const bool fits : {true, false}) {
    const std::string name(fits ? 18 : 19, 'n');
    std::strcpy(out, "untouched");
    EXPECT_EQ(zv_absolute(name.c_str(), base.c_str(), out, sizeof out), fits);
    EXPECT_EQ(out, fits ? base + "/" + name : "untouched");

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

}  // namespace
