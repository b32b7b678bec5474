// Format entries, and files matched to plugins by them. The records are made by hand: nothing here
// needs a library.
#include <gtest/gtest.h>

#include <random>
#include <string>
#include <vector>

#include "guarded.h"
#include "string_list.h"

namespace {

using Texts = std::vector<std::string>;

struct Plugin {
  // Its entries have ';' after each.
  explicit Plugin(const std::string& entries) : formats(entries) { record.formats = formats.list; }

  bool matches(const std::string& path) { return zv_plugin_match_fmt(&record, path.c_str()) == 1; }

  List formats;
  zv_plugin_t record = {};
};

TEST(Format, FilesMatchByTheirNames) {
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
      {"No name|||", {"a/.."}, {"", "x"}},
      {"Unclosed|.png|.jpg", {"x.png"}, {"x.jpg"}},
      {"PNG image", {}, {"x.png", "PNG image"}},
      {"|.png|", {"x.png"}, {}},
  };
  for (const auto& c : cases) {
    Plugin plugin(std::string(c.entry) + ';');
    for (const std::string& path : c.matching) EXPECT_TRUE(plugin.matches(path)) << c.entry << path;
    for (const std::string& path : c.others) EXPECT_FALSE(plugin.matches(path)) << c.entry << path;
  }
  Plugin cut("Long|." + std::string(400, 'x') + "|;");
  EXPECT_TRUE(cut.matches("a." + std::string(317, 'x')));
  EXPECT_FALSE(cut.matches("a." + std::string(316, 'x')));
  for (const char* const entries : {"", ";", ".png;", "PNG image|.png;"})
    EXPECT_FALSE(Plugin(entries).matches(".png")) << entries;
}

TEST(Format, AnyPatternAsTheMatcherSees) {
  std::mt19937 random(11);
  const auto text_of = [&random](const std::string& letters) {
    std::string text;
    for (size_t n = random() % 6; text.size() < n;) text += letters[random() % letters.size()];
    return text;
  };
  const auto lower = [](std::string text) {
    zv_strlwr(text.data());
    return text;
  };
  int matched = 0;
  for (int round = 0; round < 100000; ++round) {
    const std::string name = text_of("aB..\xC3\xA9*x");
    if (name.empty() || name == "." || name == "..") continue;
    const std::string pattern = text_of("aAb..**\xC3\xA9?[x]\\");
    const std::string expanded = pattern.starts_with('.') ? '*' + pattern : pattern;
    const bool expected = zv_strpat(lower(name).c_str(), lower(expanded).c_str()) == 1;
    matched += expected;
    const std::string front(random() % 20, 'a'), others = random() % 2 == 0 ? "" : "other7|.no|";
    Plugin plugin(front + '|' + others + pattern + "|;");
    ASSERT_EQ(plugin.matches("dir/" + name), expected) << name << " and " << pattern;
  }
  EXPECT_GT(matched, 1000);
}

TEST(Format, TheFirstPluginWins) {
  Plugin text("Text|.txt|;Notes|.md|.PNG|;");
  Plugin picture("PNG image|.png|;JPEG image|.jpg|;");
  zv_plugin_t* plugins[] = {&text.record, &picture.record, nullptr};
  EXPECT_EQ(zv_plugin_get_entry_by_fmt(plugins, "a/photo.png"), &text.record);
  EXPECT_EQ(zv_plugin_get_entry_by_fmt(plugins + 1, "a/photo.png"), &picture.record);
  EXPECT_EQ(zv_plugin_get_entry_by_fmt(plugins, "a/photo.JPG"), &picture.record);
  for (const char* const path : {"photo.gif", "", static_cast<const char*>(nullptr)})
    EXPECT_EQ(zv_plugin_get_entry_by_fmt(plugins, path), nullptr);
  EXPECT_EQ(zv_plugin_get_entry_by_fmt(nullptr, "a/photo.png"), nullptr);
  EXPECT_EQ(zv_plugin_match_fmt(&text.record, nullptr), 0);

  List all("kept;");
  EXPECT_EQ(zv_plugin_formats(plugins, &all.list), 4);
  EXPECT_EQ(all.text(), "kept;Text|.txt|;Notes|.md|.PNG|;PNG image|.png|;JPEG image|.jpg|;");
  EXPECT_EQ(zv_plugin_formats(nullptr, &all.list), 0);
  char** made = nullptr;
  EXPECT_EQ(zv_plugin_formats(plugins + 2, &made), 0);
  EXPECT_EQ(joined(made), "");
  zv_strlist_free(made, -1);
}

TEST(Format, Composite) {
  const struct {
    const char* entries;
    int count;
    const char *description, *composite;
  } cases[] = {
      {"PNG image|.png|;JPEG image|.jpg|.jpeg|.JPG|;", -1, nullptr,
       "All recognized formats|.png|.jpg|.jpeg|;"},
      {"PNG image|.png|;none;", 1, "", "All recognized formats|.png|;"},
      {"PNG image|.png|;none;", 0, "Images", "Images|;"},
      {"PNG image|.png|;none;", 2, "Images", ""},
      {"A|.a|;", 9, "x", "x|.a|;"},
      {"A|.a|.b;C|.c|.d;", -1, "x", "x|.a|.b.c|;"},
      {"A||.a||;", -1, "x", "x||.a|;"},
      {"A|.a|;B|.A|;", -1, ".a", ".a|.a|;"},
      {"A|.a|;B|.b|;", 3, "x", "x|.a|.b|;"},
      {"", -1, "x", ""},
  };
  for (const auto& c : cases) {
    List list(c.entries);
    EXPECT_EQ(zv_fmt_composite(&list.list, c.count, c.description), *c.composite != '\0');
    EXPECT_EQ(list.text(), std::string(c.entries) + c.composite);
  }
  char** absent = nullptr;
  EXPECT_EQ(zv_fmt_composite(nullptr, -1, "x"), 0);
  EXPECT_EQ(zv_fmt_composite(&absent, -1, "x"), 0);
}

TEST(Format, DefaultAndForcedExtension) {
  const char* const entry = "PNG image|.png|.apng|";
  const char* pattern = nullptr;
  EXPECT_EQ(zv_fmt_default(entry, &pattern), 4u);
  EXPECT_EQ(pattern, entry + 10);
  EXPECT_EQ(zv_fmt_default("PNG image", &pattern), 0u);
  EXPECT_EQ(pattern, entry + 10);

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
    Guarded name(c.name, std::string(c.forced).size() - std::string(c.name).size());
    char* const result = zv_fmt_force(c.entry, name.data());
    EXPECT_EQ(result, c.at == -2   ? nullptr
                      : c.at == -1 ? name.data()
                                   : const_cast<char*>(c.entry) + c.at);
    EXPECT_STREQ(name.text(), c.forced);
  }
}

}  // namespace
