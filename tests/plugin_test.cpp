// Libraries by their handles, plugin records and arrays, all plugins of an API, their formats. The
// plugins are those of fixtures/plugins, which tell what happens to them, so that each load is seen
// to have its release and its unload.
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <random>
#include <span>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "environment.h"
#include "fixtures/plugins/plugin_folder.h"
#include "guarded.h"
#include "string_list.h"

#ifndef _WIN32
#include <dlfcn.h>
#include <sys/stat.h>
#endif

namespace {

void* const no_library = reinterpret_cast<void*>(intptr_t{-1});
const std::string taken = "load entry(img,1,5,-1) formats",
                  refused = "load entry(img,1,5,-1) unload",
                  released = "load entry(img,1,5,-1) release unload",
                  used = taken + " release unload";

// In a folder of plugins, with an array of them.
class Plugin : public testing::Test {
 protected:
  ~Plugin() override {
    take_names();
    zv_putenv_private(nullptr, nullptr, 0);
  }

  int add_lib(const std::string& path, int keep, int* code = nullptr) {
    return zv_plugin_add_lib(&plugins, path.c_str(), "img", 1, 5, code, keep);
  }

  // Says what was reported.
  std::string enumerate(const std::string& api = "img", int min = 1, int max = 5, int keep = 0) {
    testing::internal::CaptureStderr();
    const int count = zv_plugin_enumerate(&plugins, api.c_str(), min, max, keep);
    EXPECT_EQ(count, plugins == nullptr ? 0 : std::ranges::distance(records()));
    return testing::internal::GetCapturedStderr();
  }

  std::span<zv_plugin_t*> records() const {
    size_t count = 0;
    while (plugins != nullptr && plugins[count] != nullptr) ++count;
    return {plugins, count};
  }

  // The records' file names, ';' after each. The array is given back.
  std::string take_names() {
    std::string names;
    for (zv_plugin_t* const record : records()) {
      names.append(record->lib).append(";");
      zv_plugin_destroy(record);
    }
    zv_free(std::exchange(plugins, nullptr));
    return names;
  }

  const PluginFolder folder;
  const WorkingDirectory inside{folder.path()};
  zv_plugin_t** plugins = nullptr;
};

TEST_F(Plugin, LibrariesOpen) {
  folder.add("accept", "lib/foo.dll");
  folder.add("accept", "lib/bar.dll.dll");
  folder.make_file("lib/text.dll", "no library");
  const std::tuple<std::string, int, bool> cases[] = {
      {"lib\\foo", 0, true},
      {"lib/foo.dll", 1, true},
      {folder.path("lib\\bar.dll"), 0, true},
      {"lib/foo.dll", 0, false},
      {"lib/text", 0, false},
      {"", 1, false},
#ifndef _WIN32  // the loader there takes no more than 259 characters
      {"./" + std::string(306, '/') + "lib/foo", 0, true},  // 319 characters with the extension
#endif
      {"./" + std::string(307, '/') + "lib/foo", 0, false},
  };
  for (const auto& [path, has_ext, opens] : cases) {
    void* const library = zv_dll_open(path.c_str(), has_ext);
    ASSERT_NE(library, nullptr);
    EXPECT_EQ(library != no_library, opens) << path;
    EXPECT_EQ(zv_dll_close(library), no_library);
  }
#ifndef _WIN32  // what the loader there refuses is its own affair
  // As a copy leaves it that is cut short, or that makes room first and fills it later.
  const std::string whole = folder.content("lib/foo.dll");
  for (size_t size = 0; size + 64 < whole.size(); size += 211) {
    std::string part(whole, 0, size);
    for (const char* const name : {"cut.dll", "zeros.dll"}) {
      ASSERT_EQ(zv_dll_open(folder.make_file(name, part).c_str(), 1), no_library) << size;
      part.resize(whole.size());
    }
  }
#endif
}

TEST_F(Plugin, SymbolsAndTheirDecoration) {
  void* const library = zv_dll_open(folder.add("accept", "foo.dll").c_str(), 1);
  void* const entry = zv_dll_getptr(library, "zv_plugin", nullptr);
  ASSERT_NE(entry, nullptr);
  const std::string fits(317, 'z'),
      cases[][2] = {{"zv_plugin", ""},       {"zv_plugin", "%s"},   {"plug", "zv_%sin"},
                    {"unused", "zv_plugin"}, {"zv_plugin", "%s%s"}, {"zv_plugin", "%s%n%d"},
                    {"zv_plugin", "%%s"},    {"missing", "%s"},     {fits + "zzz", "%s"},
                    {"z", fits + "zz%s"}};
  for (size_t i = 0; i < std::size(cases); ++i)  // four are found
    EXPECT_EQ(zv_dll_getptr(library, cases[i][0].c_str(), cases[i][1].c_str()),
              i < 4 ? entry : nullptr)
        << i;
  EXPECT_EQ(zv_dll_getptr(no_library, "zv_plugin", nullptr), nullptr);
#ifndef _WIN32  // its names are its own, and no other library finds them
  EXPECT_EQ(dlsym(RTLD_DEFAULT, "zv_plugin"), nullptr);
#endif
  EXPECT_EQ(zv_dll_close(library), no_library);
  EXPECT_EQ(take_events(), "load unload");
}

// What a program takes for the library's filter must be what the library takes for it: only then
// does a scan know that it need not ask again for what it has just read.
TEST(Library, AddressesAreItsOwn) {
  void* const own = zv_dll_open(ZARVO_LIBRARY, 1);
  EXPECT_EQ(zv_dll_getptr(own, "zv_dir_select", nullptr), reinterpret_cast<void*>(zv_dir_select));
  zv_dll_close(own);
}

TEST_F(Plugin, WhatCannotBeTried) {
  folder.add("accept", "img_a.dll");
  folder.make_folder("img_folder.dll");
  const char* const lib = "img_a.dll";
  const std::string long_name(318 - folder.path().size(), 'x'),
      fits_alone = "./" + std::string(308, '/'), too_long = fits_alone + std::string(10, '/');
  const struct {
    int code;
    const char *dir, *lib;
    const char* api = "img";
    int min = 1;
  } cases[] = {
      {ZV_PLUGIN_E_ARGUMENTS, nullptr, lib},
      {ZV_PLUGIN_E_ARGUMENTS, ".", nullptr},
      {ZV_PLUGIN_E_ARGUMENTS, ".", lib, nullptr},
      {ZV_PLUGIN_E_ARGUMENTS, ".", lib, "img", -1},
      {ZV_PLUGIN_E_ARGUMENTS, ".", "../img_a.dll"},
      {ZV_PLUGIN_E_ARGUMENTS, ".", ".\\img_a.dll"},
      {ZV_PLUGIN_E_NOT_FOUND, ".", "img_a"},  // no extension is added
      {ZV_PLUGIN_E_NOT_FOUND, "missing", lib},
      {ZV_PLUGIN_E_NOT_FOUND, "/..", lib},
      {ZV_PLUGIN_E_NOT_FOUND, "$ZARVO_NOT_SET", lib},
      {ZV_PLUGIN_E_NOT_FOUND, too_long.c_str(), lib},
      {ZV_PLUGIN_E_NOT_FOUND, ".", long_name.c_str()},
      {ZV_PLUGIN_E_LOAD, ".", "img_folder.dll"},
      {3, fits_alone.c_str(), lib},
  };
  for (const auto& c : cases) {
    int code = -99;
    zv_plugin_t* const record = zv_plugin_create(c.dir, c.lib, c.api, c.min, 5, &code);
    EXPECT_EQ(record != nullptr, c.code >= 0);
    EXPECT_EQ(code, c.code);
    zv_plugin_destroy(record);
  }
  EXPECT_EQ(take_events(), used);
}

TEST_F(Plugin, LoadsAreCounted) {
  folder.add("accept", "sub/img_a.dll");
  zv_plugin_t* const record = zv_plugin_create("x/../sub/", "img_a.dll", "img", 1, 5, nullptr);
  ASSERT_NE(record, nullptr);
  char absolute[ZV_PATH_MAX];
  ASSERT_EQ(zv_absolute("sub", nullptr, absolute, sizeof absolute), 1);
  EXPECT_STREQ(record->dir, absolute);
  EXPECT_STREQ(record->lib, "img_a.dll");
  EXPECT_STREQ(record->api, "img");
  EXPECT_EQ(record->version, 3);
  EXPECT_EQ(record->refs, 1);
  EXPECT_EQ(*static_cast<int*>(record->plugin->api_entry), 42);
  EXPECT_NE(zv_dll_getptr(record->module, "zv_plugin", nullptr), nullptr);

  EXPECT_EQ(zv_plugin_load(record) + zv_plugin_unload(record), 2);
  EXPECT_EQ(take_events(), taken);
  EXPECT_EQ(zv_plugin_unload(record), 1);
  EXPECT_EQ(record->refs, 0);
  EXPECT_EQ(record->module, no_library);
  EXPECT_EQ(record->plugin, nullptr);
  EXPECT_EQ(joined(record->formats), "PNG image|.png|.apng|;JPEG image|.jpg|;");
  EXPECT_EQ(take_events(), "release unload");

  for (int i = 0; i < 3; ++i) EXPECT_EQ(zv_plugin_load(record), 1);
  EXPECT_EQ(record->refs, 3);
  EXPECT_EQ(zv_plugin_destroy(record), 0);
  EXPECT_EQ(take_events(), "load entry(img,3,3,3) release unload");
  for (const auto call : {zv_plugin_load, zv_plugin_unload, zv_plugin_destroy})
    EXPECT_EQ(call(nullptr), 0);
}

TEST_F(Plugin, ALaterLoadMayFail) {
  for (const char* const way : {"accept", "later_refusal", "clings"})
    EXPECT_EQ(add_lib(folder.add(way, std::string(way) + ".dll"), 0), 1);
  ASSERT_EQ(records().size(), 3u);
  zv_plugin_t &removed = *plugins[0], &refusing = *plugins[1], &clinging = *plugins[2];
  take_events();
  EXPECT_EQ(zv_plugin_load(&refusing), 0);
  EXPECT_EQ(take_events(), "load entry(img,3,3,3) unload");
  EXPECT_EQ(refusing.plugin, nullptr);
  EXPECT_EQ(refusing.refs, 0);
  std::filesystem::remove("accept.dll");
  EXPECT_EQ(zv_plugin_load(&removed), 0);
  EXPECT_EQ(removed.module, no_library);
  // Its release left a descriptor, which no call may reach any more.
  EXPECT_NE(clinging.plugin, nullptr);
}

TEST_F(Plugin, LibrariesAreAddedOnce) {
  for (const char* const name : {"a.dll", "b.dll", "else/a.dll"}) folder.add("accept", name);
  folder.add("version_9", "nine.dll");
  // The result, the code, the path, whether it is kept, and the records then.
  const std::tuple<int, int, std::string, int, std::string, size_t> cases[] = {
      {0, ZV_PLUGIN_E_NOT_FOUND, "missing.dll", 1, "", 0},
      {0, 9, "nine.dll", 1, refused, 0},
      {1, 3, "a.dll", 1, taken, 1},
      {1, ZV_PLUGIN_E_NOT_FOUND, folder.path("else/../a.dll"), 1, "", 1},
      {1, ZV_PLUGIN_E_NOT_FOUND, "else/a.dll", 1, "", 1},
      {0, 9, "nine.dll", 1, refused, 1},
      {1, 3, folder.path("b.dll"), 0, used, 2},
      {0, ZV_PLUGIN_E_LOAD, ".", 0, "", 2},
      {0, ZV_PLUGIN_E_NOT_FOUND, folder.path(std::string(320, 'x')), 0, "", 2},
  };
  for (const auto& [result, expected, path, keep, events, count] : cases) {
    int code = -99;
    EXPECT_EQ(add_lib(path, keep, &code), result);
    EXPECT_EQ(code, expected) << path;
    EXPECT_EQ(take_events(), events) << path;
    ASSERT_EQ(records().size(), count);
  }
  EXPECT_EQ(add_lib("b.dll", 0), 1);  // which needs no code
  EXPECT_EQ(zv_plugin_get_entry_by_lib(plugins, "b.dll"), plugins[1]);
  for (const char* const unknown : {"B.dll", "else/a.dll", "", static_cast<const char*>(nullptr)})
    EXPECT_EQ(zv_plugin_get_entry_by_lib(plugins, unknown), nullptr);
  EXPECT_EQ(zv_plugin_get_entry_by_lib(nullptr, "b.dll"), nullptr);
  char name[4] = "";
  EXPECT_EQ(zv_plugin_get_lib(&plugins[1], nullptr, 0), 5u);
  EXPECT_EQ(zv_plugin_get_lib(&plugins[1], name, sizeof name), 3u);
  EXPECT_STREQ(name, "b.d");
  EXPECT_EQ(zv_plugin_get_lib(static_cast<zv_plugin_t**>(no_library), name, 4), 0u);
  EXPECT_EQ(take_names(), "a.dll;b.dll;");
}

// A host that its plugins call, and that uses its array then.
zv_plugin_t*** held;
std::string to_add;

void meanwhile() {
  for (zv_plugin_t** record = *held; record != nullptr && *record != nullptr; ++record)
    EXPECT_EQ((*record)->lib[0], 'i');
  const std::string path = std::exchange(to_add, "");
  if (path.empty()) return;
  EXPECT_EQ(zv_plugin_add_lib(held, path.c_str(), "img", 1, 5, nullptr, 0), 1);
}

TEST_F(Plugin, AnArrayIsWholeWhilePluginsRun) {
  char address[32];
  std::snprintf(address, sizeof address, "%p", reinterpret_cast<void*>(meanwhile));
  zv_putenv_private("FIXTURE_HOST", address, 0);
  held = &plugins;
  to_add = folder.add("accept", "img_b.dll");
  for (const char* const name : {"img_a.dll", "img_c.dll"})
    EXPECT_EQ(add_lib(folder.add("accept", name), 0), 1);
  EXPECT_EQ(take_names(), "img_b.dll;img_a.dll;img_c.dll;");
  zv_putenv_private("img", ".", 0);
  char name[] = "stale";  // what the caller's variable held before, no plugin sees
  zv_plugin_t stale = {};
  stale.lib = name;
  zv_plugin_t* before[] = {&stale, nullptr};
  plugins = before;
  enumerate();
  if (plugins == before) plugins = nullptr;
  EXPECT_EQ(records().size(), 3u);
}

TEST_F(Plugin, VersionsThatBothSpeak) {
  const int cases[][6] = {
      // min, max, oldest, newest, result, version
      {2, 5, 1, 3, 1, 3}, {2, 5, 6, 9, 0, 6}, {4, 5, 1, 3, 0, 3}, {2, 5, 1, 9, 1, 5},
      {2, 5, 5, 9, 1, 5}, {2, 5, 1, 2, 1, 2}, {2, 5, 3, 4, 1, 4}, {0, 0, 0, 0, 1, 0},
  };
  for (const auto& [min, max, oldest, newest, result, agreed] : cases) {
    int version = -99;
    EXPECT_EQ(zv_plugin_match_vers(min, max, oldest, newest, &version), result);
    EXPECT_EQ(version, agreed);
  }
}

TEST_F(Plugin, FolderComesFromThePrivateEnvironment) {
  for (const char* const name : {"own/img_own.dll", "plg/img_plg.dll", "lib/img_lib.dll"})
    folder.add("accept", name);
  EXPECT_EQ(enumerate(), "");
  const std::tuple<const char*, std::string, int, std::string> cases[] = {
      {"LIB", folder.path("lib"), 0, "img_lib.dll"},
      {"PLG", "own/../plg/", 0, "img_plg.dll"},
      {"img", "own", 0, "img_own.dll"},
      {"img", "plg", 1, "img_own.dll"},
  };
  for (const auto& [variable, value, append, found] : cases) {
    zv_putenv_private(variable, value.c_str(), append);
    EXPECT_EQ(enumerate("img.a"), "Testing library " + found + " for img.a API...ok\n");
    EXPECT_EQ(take_names(), found + ";");
  }
  zv_plugin_t* nothing = nullptr;
  plugins = &nothing;
  const std::string too_long = "own" + std::string(317, '/');
  for (const std::string& useless :
       {folder.make_folder("empty"), folder.path("missing"), std::string("/.."),
        folder.path("own/img_own.dll"), too_long}) {
    zv_putenv_private("img", useless.c_str(), 0);
    EXPECT_EQ(enumerate(), "") << useless;
    ASSERT_EQ(plugins, &nothing);
  }
  plugins = nullptr;
}

TEST_F(Plugin, NameOfAnApi) {
  const std::string longest(47, 'a');
  for (const std::string& base : {longest, longest + "a", std::string()})
    folder.add("accept", base + "_x.dll");
  zv_putenv_private("PLG", ".", 0);
  for (const std::string& api : {std::string(), std::string(".img"), longest + "a.reader"})
    EXPECT_EQ(enumerate(api), "");
  enumerate(longest + ".reader");
  EXPECT_EQ(take_names(), longest + "_x.dll;");
}

TEST_F(Plugin, CandidatesAndTheirReports) {
  constexpr char incompatible[] = "plugin is not compatible with plugin_t";
  struct Outcome {
    const char* way;
    std::string events = used;
    const char* reason = nullptr;  // for its rejection
    int formats = 2;
  };
  const std::map<std::string, Outcome> outcomes = {
      {"img_accept.dll", {"accept"}},
      {"IMG_B.DLL", {"accept"}},
      {"img_clings.dll", {"clings"}},
      {"img_null.dll", {"null_formats", used, nullptr, 0}},
      {"img_none.dll", {"empty_formats", used, nullptr, 0}},
      {"img_malformed.dll", {"malformed_formats", used, nullptr, 4}},
      {"img_.dll", {"silent", refused, "plugin did not set an error code"}},
      {"img_api.dll", {"other_api", refused, "plugin does not support requested api"}},
      {"img_third.dll", {"third_code", refused, "error code -3"}},
      {"img_zero.dll", {"version_0", refused, "outdated version 0"}},
      {"img_nine.dll", {"version_9", refused, "unsupported version 9"}},
      {"img_release.dll", {"no_release", refused, incompatible}},
      {"img_formats.dll", {"no_formats", released, incompatible}},
      {"img_half.dll", {"no_api_entry", released, incompatible}},
      {"img_e.dll", {"no_entry", "load unload", "library does not export an zv_plugin function"}},
      {"img_text.dll", {"", "", "library could not be loaded"}},
  };
  for (const auto& [name, outcome] : outcomes)
    *outcome.way != '\0' ? folder.add(outcome.way, name) : folder.make_file(name, "no library");
  for (const char* const passed_over :
       {"img.dll", "img_a.dll.bak", "imgx_a.dll", "img_h.dll", "img_nined.dll", "IMG_BD.dll"})
    folder.add("accept", passed_over);
  folder.make_folder("img_c.dll");
  if (zv_set_hidden("img_h.dll", 1) == 0) std::filesystem::remove("img_h.dll");

  std::string reports, events, accepted;
  List listed;  // in the platform's order
  zv_dir_scan("", &listed.list, nullptr, nullptr, 0, 0);
  ASSERT_NE(listed.list, nullptr);
  for (char** name = listed.list; *name != nullptr; ++name) {
    const auto found = outcomes.find(*name);
    if (found == outcomes.end()) continue;
    const auto& [way, happened, reason, formats] = found->second;
    events += happened + (happened.empty() ? "" : " ");
    reports += std::string("Testing library ") + *name + " for img API...";
    reports += reason == nullptr ? "ok\n" : std::string("\n\trejected: ") + reason + '\n';
    if (reason == nullptr) accepted += std::string(*name) + ';';
  }
  zv_putenv_private("img", ".", 0);
  EXPECT_EQ(enumerate(), reports);
  EXPECT_EQ(take_events() + ' ', events);
  for (const zv_plugin_t* const record : records()) {
    EXPECT_EQ(record->refs, 0);
    EXPECT_EQ(zv_strlist_len(record->formats), outcomes.at(record->lib).formats) << record->lib;
  }
  EXPECT_EQ(take_names(), accepted);
}

TEST_F(Plugin, RangeAndKeepReachThePlugins) {
  folder.add("accept", "img_a.dll");
  zv_putenv_private("img", ".", 0);
  enumerate("img.x", 2, 9, 1);
  EXPECT_EQ(take_events(), "load entry(img.x,2,9,-1) formats");
  EXPECT_EQ(take_names(), "img_a.dll;");
  EXPECT_EQ(take_events(), "release unload");
  const std::string begin = "Testing library img_a.dll for img API...\n\trejected: ";
  EXPECT_EQ(enumerate("img", 3, 2), begin + "invalid function arguments\n");
  EXPECT_EQ(take_names(), "");
  EXPECT_EQ(enumerate("img", 0, 0), begin + "unsupported version 1\n");
  EXPECT_EQ(take_names(), "");
  EXPECT_EQ(enumerate("img", 4, 5), begin + "outdated version 3\n");
#ifndef _WIN32  // Windows has no pipes in its folders; one is not waited for
  std::filesystem::remove("img_a.dll");
  ASSERT_EQ(mkfifo("img_a.dll", 0600), 0);
  EXPECT_EQ(take_names(), "");
  EXPECT_EQ(enumerate(), begin + "library could not be loaded\n");
#endif
}

struct Formats {
  // Its entries have ';' after each.
  explicit Formats(const std::string& entries) : formats(entries) { record.formats = formats.list; }

  bool matches(const std::string& path) { return zv_plugin_match_fmt(&record, path.c_str()) == 1; }

  List formats;
  zv_plugin_t record = {};
};

TEST(Format, FilesMatchByTheirNames) {
  using Texts = std::vector<std::string>;
  const std::tuple<std::string, Texts, Texts> cases[] = {
      {"PNG image|.png|.apng|;",
       {"a/b/Photo.PNG", "photo.png", ".png", "x.aPnG", "D:/x.png/"},
       {"photo.png.bak", "png", "a.png/b", "photo_png", "", "a.png/.."}},
      {"Archive|*.tar.gz|;", {"x.TAR.GZ", "a.b.tar.gz"}, {"x.tar.gz2", "x.gz", "xtar.gz"}},
      {"Notes|readme*|NEWS|[0-9]?.txt|;", {"README", "news", "7x.TXT"}, {"my_readme", "xx.txt"}},
      {"No name|||;", {"a/.."}, {"", "x"}},
      {"Unclosed|.png|.jpg;", {"x.png"}, {"x.jpg"}},
      {"PNG image;", {}, {"x.png", "PNG image"}},
      {"|.png|;", {"x.png"}, {}},
      {";", {}, {".png"}},
      {".png;PNG image|.png;", {}, {".png"}},
      {"Long|." + std::string(400, 'x') + "|;",
       {"a." + std::string(317, 'x')},
       {"a." + std::string(316, 'x')}},
  };
  for (const auto& [entries, matching, others] : cases) {
    Formats plugin(entries);
    for (const std::string& path : matching) EXPECT_TRUE(plugin.matches(path)) << entries << path;
    for (const std::string& path : others) EXPECT_FALSE(plugin.matches(path)) << entries << path;
  }
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
    Formats plugin(front + '|' + others + pattern + "|;");
    ASSERT_EQ(plugin.matches("dir/" + name), expected) << name << " and " << pattern;
  }
  EXPECT_GT(matched, 1000);
}

TEST(Format, TheFirstPluginWins) {
  Formats text("Text|.txt|;Notes|.md|.PNG|;");
  Formats picture("PNG image|.png|;JPEG image|.jpg|;");
  zv_plugin_t* plugins[] = {&text.record, &picture.record, nullptr};
  EXPECT_EQ(zv_plugin_get_entry_by_fmt(plugins, "a/photo.png"), &text.record);
  EXPECT_EQ(zv_plugin_get_entry_by_fmt(plugins, "a/photo.JPG"), &picture.record);
  for (const char* const path : {"photo.gif", "", static_cast<const char*>(nullptr)})
    EXPECT_EQ(zv_plugin_get_entry_by_fmt(plugins, path), nullptr);
  EXPECT_EQ(zv_plugin_get_entry_by_fmt(nullptr, "a/photo.png"), nullptr);
  EXPECT_EQ(zv_plugin_match_fmt(&text.record, nullptr), 0);

  List all("kept;");
  EXPECT_EQ(zv_plugin_formats(plugins, &all.list), 4);
  EXPECT_EQ(all.text(), "kept;Text|.txt|;Notes|.md|.PNG|;PNG image|.png|;JPEG image|.jpg|;");
  char** made = nullptr;
  EXPECT_EQ(zv_plugin_formats(nullptr, &made), 0);
  EXPECT_EQ(joined(made), "");
  zv_strlist_free(made, -1);
}

TEST(Format, Composite) {
  const std::tuple<std::string, int, const char*, std::string> cases[] = {
      {"PNG image|.png|;JPEG image|.jpg|.jpeg|.JPG|;", -1, nullptr,
       "All recognized formats|.png|.jpg|.jpeg|;"},
      {"PNG image|.png|;none;", 1, "", "All recognized formats|.png|;"},
      {"PNG image|.png|;none;", 0, "Images", "Images|;"},
      {"PNG image|.png|;none;", 2, "Images", ""},
      {"A|.a|.b;C|.c|.d;", 9, "x", "x|.a|.b.c|;"},
      {"A||.a||;", -1, "x", "x||.a|;"},
      {"A|.a|;B|.A|;", -1, ".a", ".a|.a|;"},
      {"", -1, "x", ""},
  };
  for (const auto& [entries, count, description, composite] : cases) {
    List list(entries);
    EXPECT_EQ(zv_fmt_composite(&list.list, count, description), !composite.empty());
    EXPECT_EQ(list.text(), entries + composite);
  }
  char** absent = nullptr;
  EXPECT_EQ(zv_fmt_composite(nullptr, -1, "x") + zv_fmt_composite(&absent, -1, "x"), 0);
}

TEST(Format, DefaultAndForcedExtension) {
  const char* const entry = "PNG image|.png|.apng|";
  const char* pattern = nullptr;
  EXPECT_EQ(zv_fmt_default(entry, &pattern), 4u);
  EXPECT_EQ(zv_fmt_default("PNG image", &pattern), 0u);
  EXPECT_EQ(pattern, entry + 10);

  // Where in the entry the result points; -1: at the name; -2: nowhere.
  const std::tuple<const char*, std::string, std::string, int> cases[] = {
      {"PNG image|.png|", "picture", "picture.png", -1},
      {"PNG image|.png|", "picture.PNG", "picture.PNG", 10},
      {"PNG image|.png|", "picture.txt", "picture.txt.png", -1},
      {"PNG image|.png|", "a.png/picture", "a.png/picture.png", -1},
      {"see .txt files|.png|", "x.txt", "x.txt", 4},
      {"PNG image||.png|", "picture", "picture", -2},
      {"PNG image", "picture", "picture", -2},
      {"PNG image|.png", "", ".png", -1},
  };
  for (const auto& [formats, before, forced, at] : cases) {
    Guarded name(before + '\0', forced.size() + 1);
    const char* const result = zv_fmt_force(formats, name.data());
    EXPECT_EQ(result, at == -2 ? nullptr : at == -1 ? name.data() : formats + at);
    EXPECT_EQ(name.text(), forced);
  }
}

}  // namespace
