// All plugins of an API: where they are looked for, which files are tried, what is reported.
#include <gtest/gtest.h>

#include <map>
#include <string>
#include <vector>

#include "environment.h"
#include "fixtures/plugins/plugin_folder.h"
#include "zarvo.h"

#ifndef _WIN32
#include <sys/stat.h>
#endif

namespace {

class Enumerate : public testing::Test {
 protected:
  ~Enumerate() override { zv_putenv_private(nullptr, nullptr, 0); }

  // Enumerates into `plugins`; gives the count.
  int run(const char* api = "img", int min = 1, int max = 5, int keep = 0) {
    testing::internal::CaptureStderr();
    const int count = zv_plugin_enumerate(&plugins, api, min, max, keep);
    report = testing::internal::GetCapturedStderr();
    return count;
  }

  // The files tried, in order, and the records' names; gives all back.
  std::vector<std::string> take_names() {
    std::vector<std::string> names;
    for (zv_plugin_t** record = plugins; record != nullptr && *record != nullptr; ++record) {
      names.emplace_back((*record)->lib);
      zv_plugin_destroy(*record);
    }
    zv_free(plugins);
    plugins = nullptr;
    return names;
  }

  // Names in the order in which the platform lists them.
  std::vector<std::string> listed() const {
    char** names = nullptr;
    zv_dir_scan(folder.path().c_str(), &names, nullptr, nullptr, 0, 0);
    std::vector<std::string> all;
    for (char** name = names; *name != nullptr; ++name) all.emplace_back(*name);
    zv_strlist_free(names, -1);
    return all;
  }

  const PluginFolder folder;
  zv_plugin_t** plugins = nullptr;
  std::string report;
};

TEST_F(Enumerate, FolderComesFromThePrivateEnvironment) {
  const WorkingDirectory inside(folder.path());
  for (const char* const name : {"own/img_own.dll", "plg/img_plg.dll", "lib/img_lib.dll"})
    folder.add("accept", name);
  zv_plugin_t* nothing = nullptr;
  plugins = &nothing;
  EXPECT_EQ(run(), 0);
  EXPECT_EQ(plugins, &nothing);
  plugins = nullptr;

  using Names = std::vector<std::string>;
  zv_putenv_private("LIB", folder.path("lib").c_str(), 0);
  EXPECT_EQ(run(), 1);
  EXPECT_EQ(take_names(), Names{"img_lib.dll"});
  zv_putenv_private("PLG", "own/../plg/", 0);
  EXPECT_EQ(run(), 1);
  EXPECT_EQ(take_names(), Names{"img_plg.dll"});
  zv_putenv_private("img", "own", 0);
  zv_putenv_private("img", "plg", 1);
  EXPECT_EQ(run("img.reader"), 1);
  EXPECT_EQ(take_names(), Names{"img_own.dll"});
  EXPECT_EQ(report, "Testing library img_own.dll for img.reader API...ok\n");

  for (const char* const useless : {"empty", "missing", "/..", "own/img_own.dll"}) {
    folder.make_folder("empty");
    zv_putenv_private("img", useless, 0);
    plugins = &nothing;
    EXPECT_EQ(run(), 0) << useless;
    EXPECT_EQ(plugins, &nothing);
    EXPECT_EQ(report, "");
  }
  plugins = nullptr;
}

TEST_F(Enumerate, NameOfAnApi) {
  const std::string longest(47, 'a');
  folder.add("accept", longest + "_x.dll");
  folder.add("accept", longest + "a_x.dll");
  folder.add("accept", "_x.dll");
  zv_putenv_private("PLG", folder.path().c_str(), 0);
  for (const std::string& api : {std::string(), std::string(".img"), longest + "a.reader"})
    EXPECT_EQ(run(api.c_str()), 0) << api;
  EXPECT_EQ(run((longest + ".reader").c_str()), 1);
  EXPECT_EQ(take_names(), std::vector<std::string>{longest + "_x.dll"});
}

TEST_F(Enumerate, CandidatesAndTheirReports) {
  const std::map<std::string, std::pair<std::string, std::string>> outcomes = {
      {"img_accept.dll", {"accept", ""}},
      {"IMG_B.DLL", {"accept", ""}},
      {"img_clings.dll", {"clings", ""}},
      {"img_null.dll", {"null_formats", ""}},
      {"img_malformed.dll", {"malformed_formats", ""}},
      {"img_.dll", {"silent", "plugin did not set an error code"}},
      {"img_api.dll", {"other_api", "plugin does not support requested api"}},
      {"img_third.dll", {"third_code", "error code -3"}},
      {"img_zero.dll", {"version_0", "outdated version 0"}},
      {"img_nine.dll", {"version_9", "unsupported version 9"}},
      {"img_half.dll", {"no_formats", "plugin is not compatible with plugin_t"}},
      {"img_entry.dll", {"no_entry", "library does not export an zv_plugin function"}},
      {"img_text.dll", {"", "library could not be loaded"}},
      {"img_empty.dll", {"", "library could not be loaded"}},
  };
  for (const auto& [name, outcome] : outcomes)
    if (!outcome.first.empty()) folder.add(outcome.first, name);
  folder.make_file("img_text.dll", "no library");
  folder.make_file("img_empty.dll");
  for (const char* const passed_over : {"img.dll", "img_a.dll.bak", "imgx_a.dll", "img_h.dll"})
    folder.add("accept", passed_over);
  folder.make_folder("img_c.dll");
  ASSERT_EQ(zv_set_hidden(folder.path("img_h.dll").c_str(), 1), 1);

  std::string expected;
  std::vector<std::string> accepted;
  for (const std::string& name : listed()) {
    const auto found = outcomes.find(name);
    if (found == outcomes.end()) continue;
    const std::string& reason = found->second.second;
    expected += "Testing library " + name + " for img API...";
    expected += reason.empty() ? "ok\n" : "\n\trejected: " + reason + "\n";
    if (reason.empty()) accepted.push_back(name);
  }
  zv_putenv_private("img", folder.path().c_str(), 0);
  EXPECT_EQ(run(), 5);
  EXPECT_EQ(report, expected);
  for (int i = 0; i < 5; ++i) {
    EXPECT_EQ(plugins[i]->refs, 0);
    EXPECT_EQ(plugins[i]->module, reinterpret_cast<void*>(intptr_t{-1}));
  }
  EXPECT_EQ(take_names(), accepted);
}

TEST_F(Enumerate, RangeAndKeepReachThePlugins) {
  folder.add("accept", "img_a.dll");
  zv_putenv_private("img", folder.path().c_str(), 0);
  EXPECT_EQ(run("img.x", 2, 9, 1), 1);
  ASSERT_NE(plugins, nullptr);
  EXPECT_EQ(plugins[0]->refs, 1);
  EXPECT_EQ(plugins[0]->version, 3);
  EXPECT_EQ(plugins[1], nullptr);
  EXPECT_EQ(take_events(), "load entry(img.x,2,9,-1) formats");
  take_names();
  EXPECT_EQ(take_events(), "release unload");

  EXPECT_EQ(run("img", 3, 2), 0);
  EXPECT_EQ(report,
            "Testing library img_a.dll for img API...\n"
            "\trejected: invalid function arguments\n");
  ASSERT_NE(plugins, nullptr);
  EXPECT_EQ(take_names(), std::vector<std::string>{});
  EXPECT_EQ(run("img", 0, 0), 0);
  EXPECT_EQ(report,
            "Testing library img_a.dll for img API...\n"
            "\trejected: unsupported version 1\n");
  take_names();
}

TEST_F(Enumerate, VariantsAreNotTried) {
  for (const char* const name : {"img_a.dll", "IMG_AD.DLL", "img_d.dll", "img_bd.dll", "img_.dll"})
    folder.add("accept", name);
  zv_putenv_private("img", folder.path().c_str(), 0);
  EXPECT_EQ(run(), 3);
  std::vector<std::string> names = take_names();
  std::sort(names.begin(), names.end());
  EXPECT_EQ(names, (std::vector<std::string>{"img_.dll", "img_a.dll", "img_bd.dll"}));
}

TEST_F(Enumerate, AThousandTimesLeavesNothingBehind) {
  folder.add("accept", "img_a.dll");
  folder.add("no_formats", "img_b.dll");
  zv_putenv_private("img", folder.path().c_str(), 0);
  for (int i = 0; i < 1000; ++i) {
    ASSERT_EQ(run("img", 1, 5, i % 2), 1);
    take_names();
    const std::string events = take_events();
    ASSERT_TRUE(events.ends_with(" release unload")) << events;
  }
}

#ifndef _WIN32
// Windows has no such files in its folders.
TEST_F(Enumerate, APipeIsNotWaitedFor) {
  ASSERT_EQ(mkfifo(folder.path("img_pipe.dll").c_str(), 0600), 0);
  zv_putenv_private("img", folder.path().c_str(), 0);
  EXPECT_EQ(run(), 0);
  EXPECT_EQ(report,
            "Testing library img_pipe.dll for img API...\n"
            "\trejected: library could not be loaded\n");
  take_names();
}
#endif

}  // namespace
