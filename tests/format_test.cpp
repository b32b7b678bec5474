// Format entries, and files matched to plugins by them. The records are made by hand: nothing here
// needs a library.
#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <string>
#include <vector>

#include "guarded.h"
#include "zarvo.h"

namespace {

using Texts = std::vector<std::string>;

// A string list of its own.
class List {
 public:
  explicit List(const Texts& entries = {}) {
    zv_strlist(&list, nullptr, 0);
    for (const std::string& entry : entries) zv_strlist_insert(&list, -1, -1, entry.c_str());
  }
  ~List() { zv_strlist_free(list, -1); }
  List(const List&) = delete;
  List& operator=(const List&) = delete;

  Texts texts() const { return {list, list + zv_strlist_len(list)}; }

  char** list = nullptr;
};

struct Plugin {
  explicit Plugin(const Texts& entries) : formats(entries) { record.formats = formats.list; }

  bool matches(const std::string& path) { return zv_plugin_match_fmt(&record, path.c_str()) == 1; }

  List formats;
  zv_plugin_t record = {};
};

TEST(Format, FilesMatchByTheirNames) {
  const std::string long_text(330, 'x');
  const struct {
    const char* entry;
    Texts matching, others;
  } cases[] = {
      {"PNG image|.png|.apng|",
       {"a/b/Photo.PNG", "photo.png", ".png", "x.aPnG", "D:/x.png/"},
       {"photo.png.bak", "png", "a.png/b", "photo_png", "", "a.png/.."}},
      {"Archive|*.tar.gz|", {"x.TAR.GZ", "a.b.tar.gz"}, {"x.tar.gz2", "x.gz", "xtar.gz"}},
      {"Notes|readme*|NEWS|[0-9]?.txt|",
       {"README", "readme.md", "news", "7x.TXT"},
       {"my_readme", "news2", "xx.txt"}},
      {"Any|*|", {"x", "x.y", ""}, {}},
      {"No name|||", {"", "a/.."}, {"x"}},
      {"Escaped|\\*.a|*\\*b|", {"*.a", "x*b"}, {"x.a", "xb"}},
      {"Stars|**.c|*.?d|*[x]|", {"a.c", "a.xd", "ax"}, {"a.d", "a"}},
      {"Malformed|[a|x\\|", {}, {"[a", "a", "x\\", "x"}},
      {"Unclosed|.png|.jpg", {"x.png"}, {"x.jpg"}},
      {"PNG image|.png", {}, {"x.png"}},
      {"PNG image", {}, {"x.png", "PNG image"}},
      {".png", {}, {"x.png"}},
      {"|.png|", {"x.png"}, {}},
      {"", {}, {"x", ""}},
      {"Whole|*\xC3\xA9|", {"x\xC3\xA9"}, {"xe"}},
      {"Half a character|*\xA9|", {"\xA9"}, {"x\xC3\xA9"}},
  };
  for (const auto& c : cases) {
    Plugin plugin({c.entry});
    for (const std::string& path : c.matching) EXPECT_TRUE(plugin.matches(path)) << c.entry << path;
    for (const std::string& path : c.others) EXPECT_FALSE(plugin.matches(path)) << c.entry << path;
  }
  Plugin cut({"Long|." + std::string(400, 'x') + "|"});
  EXPECT_TRUE(cut.matches("a." + std::string(317, 'x')));
  EXPECT_FALSE(cut.matches("a." + std::string(316, 'x')));
  Plugin none({});
  EXPECT_FALSE(none.matches("x.png"));
}

std::string lower(std::string text) {
  zv_strlwr(text.data());
  return text;
}

std::string random_text(std::mt19937& random, const std::string& letters) {
  std::string text;
  for (size_t n = random() % 6; text.size() < n;) text += letters[random() % letters.size()];
  return text;
}

TEST(Format, AnyPatternAsTheMatcherSees) {
  std::mt19937 random(11);
  int matched = 0;
  for (int round = 0; round < 100000; ++round) {
    const std::string name = random_text(random, "aB..\xC3\xA9*x");
    if (name.empty() || name == "." || name == "..") continue;
    const std::string pattern = random_text(random, "aAb..**\xC3\xA9?[x]\\");
    const std::string expanded = pattern.starts_with('.') ? '*' + pattern : pattern;
    const bool expected = zv_strpat(lower(name).c_str(), lower(expanded).c_str()) == 1;
    matched += expected;
    Plugin plugin({"x|" + pattern + "|"});
    ASSERT_EQ(plugin.matches("dir/" + name), expected) << name << " and " << pattern;
  }
  EXPECT_GT(matched, 1000);
}

TEST(Format, TheFirstPluginWins) {
  Plugin text({"Text|.txt|", "Notes|.md|.PNG|"});
  Plugin picture({"PNG image|.png|", "JPEG image|.jpg|"});
  zv_plugin_t* plugins[] = {&text.record, &picture.record, nullptr};
  EXPECT_EQ(zv_plugin_get_entry_by_fmt(plugins, "a/photo.png"), &text.record);
  EXPECT_EQ(zv_plugin_get_entry_by_fmt(plugins + 1, "a/photo.png"), &picture.record);
  EXPECT_EQ(zv_plugin_get_entry_by_fmt(plugins, "a/photo.JPG"), &picture.record);
  for (const char* const path : {"photo.gif", "", static_cast<const char*>(nullptr)})
    EXPECT_EQ(zv_plugin_get_entry_by_fmt(plugins, path), nullptr);
  EXPECT_EQ(zv_plugin_get_entry_by_fmt(plugins + 2, "photo.png"), nullptr);

  List all({"kept"});
  EXPECT_EQ(zv_plugin_formats(plugins, &all.list), 4);
  EXPECT_EQ(all.texts(), (Texts{"kept", "Text|.txt|", "Notes|.md|.PNG|", "PNG image|.png|",
                                "JPEG image|.jpg|"}));
  EXPECT_EQ(zv_plugin_formats(nullptr, &all.list), 0);
  EXPECT_EQ(zv_plugin_formats(plugins + 2, &all.list), 0);
  EXPECT_EQ(zv_strlist_len(all.list), 5);

  char** made = nullptr;
  EXPECT_EQ(zv_plugin_formats(plugins + 1, &made), 2);
  EXPECT_STREQ(made[1], "JPEG image|.jpg|");
  zv_strlist_free(made, -1);
  made = nullptr;
  EXPECT_EQ(zv_plugin_formats(nullptr, &made), 0);
  ASSERT_NE(made, nullptr);
  zv_strlist_free(made, -1);
}

TEST(Format, Composite) {
  const struct {
    Texts entries;
    int count;
    const char* description;
    const char* composite;  // nullptr: none
  } cases[] = {
      {{"PNG image|.png|", "JPEG image|.jpg|.jpeg|.JPG|"},
       -1,
       nullptr,
       "All recognized formats|.png|.jpg|.jpeg|"},
      {{"PNG image|.png|", "JPEG image|.jpg|"}, 1, "", "All recognized formats|.png|"},
      {{"PNG image|.png|", "none"}, 0, "Images", "Images|"},
      {{"PNG image|.png|", "none"}, 1, "Images", "Images|.png|"},
      {{"PNG image|.png|", "none"}, 2, "Images", nullptr},
      {{"A|.a|.b", "C|.c|.d"}, -1, "x", "x|.a|.b.c|"},
      {{"A||.a||"}, -1, "x", "x||.a|"},
      {{"A|.a|", "B|.A|"}, -1, ".a", ".a|.a|"},
      {{}, -1, "x", nullptr},
  };
  for (const auto& c : cases) {
    List list(c.entries);
    Texts expected = c.entries;
    if (c.composite != nullptr) expected.emplace_back(c.composite);
    EXPECT_EQ(zv_fmt_composite(&list.list, c.count, c.description), c.composite != nullptr);
    EXPECT_EQ(list.texts(), expected);
  }
  char** absent = nullptr;
  EXPECT_EQ(zv_fmt_composite(nullptr, -1, "x"), 0);
  EXPECT_EQ(zv_fmt_composite(&absent, -1, "x"), 0);
}

TEST(Format, DefaultPattern) {
  const struct {
    const char* entry;
    size_t start, length;
  } cases[] = {
      {"PNG image|.png|.apng|", 10, 4},
      {"PNG image|.png", 10, 4},
      {"PNG image|", 10, 0},
      {"PNG image||.png|", 10, 0},
      {"|a|", 1, 1},
      {"PNG image", 0, 0},
      {"", 0, 0},
  };
  for (const auto& c : cases) {
    const char* pattern = c.entry;
    EXPECT_EQ(zv_fmt_default(c.entry, &pattern), c.length) << c.entry;
    EXPECT_EQ(pattern, c.entry + c.start) << c.entry;
  }
}

TEST(Format, ForcedExtension) {
  const struct {
    const char *entry, *name, *forced;
    int at;  // where in the entry the result points; -1: at the name; -2: nowhere
  } cases[] = {
      {"PNG image|.png|", "picture", "picture.png", -1},
      {"PNG image|.png|", "picture.PNG", "picture.PNG", 10},
      {"PNG image|.png|", "picture.txt", "picture.txt.png", -1},
      {"PNG image|.png|", "a.png/picture", "a.png/picture.png", -1},
      {"PNG image|.apng|.png|", "x.png", "x.png", 16},
      {"see .txt files|.png|", "x.txt", "x.txt", 4},
      {"PNG image||.png|", "picture", "picture", -2},
      {"PNG image", "picture", "picture", -2},
      {"PNG image|.png", "", ".png", -1},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.name);
    Guarded name(c.name, std::string(c.forced).size() - std::string(c.name).size());
    char* const result = zv_fmt_force(c.entry, name.data());
    EXPECT_EQ(result, c.at == -2   ? nullptr
                      : c.at == -1 ? name.data()
                                   : const_cast<char*>(c.entry) + c.at);
    EXPECT_STREQ(name.text(), c.forced);
    EXPECT_TRUE(name.intact());
  }
}

}  // namespace
