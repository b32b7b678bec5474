// All plugins of an API: where they are looked for, which files are tried, what is reported. The
// plugins are those of fixtures/plugins, which tell what happens to them, so that each load is seen
// to have its release and its unload.
#include <gtest/gtest.h>

#include <map>
#include <string>

#include "environment.h"
#include "fixtures/plugins/plugin_folder.h"
#include "string_list.h"

#ifndef _WIN32
#include <sys/stat.h>
#endif

namespace {

class Enumerate : public testing::Test {
 protected:
  Enumerate() { use(folder.path()); }
  ~Enumerate() override { zv_putenv_private(nullptr, nullptr, 0); }

  static void use(const std::string& path) { zv_putenv_private("img", path.c_str(), 0); }

  // Enumerates into `plugins`; gives the count.
  int run(const std::string& api = "img", int min = 1, int max = 5, int keep = 0) {
    testing::internal::CaptureStderr();
    const int count = zv_plugin_enumerate(&plugins, api.c_str(), min, max, keep);
    report = testing::internal::GetCapturedStderr();
    return count;
  }

  // The records' file names, ';' after each; gives the records back.
  std::string take_names() {
    std::string names;
    for (zv_plugin_t** record = plugins; record != nullptr && *record != nullptr; ++record) {
      names.append((*record)->lib).append(";");
      zv_plugin_destroy(*record);
    }
    zv_free(plugins);
    plugins = nullptr;
    return names;
  }

  const PluginFolder folder;
  zv_plugin_t** plugins = nullptr;
  std::string report;
};

TEST_F(Enumerate, FolderComesFromThePrivateEnvironment) {
  const WorkingDirectory inside(folder.path());
  for (const char* const name : {"own/img_own.dll", "plg/img_plg.dll", "lib/img_lib.dll"})
    folder.add("accept", name);
  zv_putenv_private("img", nullptr, 0);
  EXPECT_EQ(run(), 0);
  zv_putenv_private("LIB", folder.path("lib").c_str(), 0);
  EXPECT_EQ(run(), 1);
  EXPECT_EQ(take_names(), "img_lib.dll;");
  zv_putenv_private("PLG", "own/../plg/", 0);
  EXPECT_EQ(run(), 1);
  EXPECT_EQ(take_names(), "img_plg.dll;");
  use("own");
  zv_putenv_private("img", "plg", 1);
  EXPECT_EQ(run("img.reader"), 1);
  EXPECT_EQ(take_names(), "img_own.dll;");
  EXPECT_EQ(report, "Testing library img_own.dll for img.reader API...ok\n");

  zv_plugin_t* nothing = nullptr;
  plugins = &nothing;
  folder.make_folder("empty");
  for (const char* const useless : {"empty", "missing", "/..", "own/img_own.dll"}) {
    use(useless);
    ASSERT_EQ(run(), 0) << useless;
    ASSERT_EQ(plugins, &nothing);
    EXPECT_EQ(report, "");
  }
}

TEST_F(Enumerate, NameOfAnApi) {
  const std::string longest(47, 'a');
  for (const std::string& base : {longest, longest + "a", std::string()})
    folder.add("accept", base + "_x.dll");
  zv_putenv_private("PLG", folder.path().c_str(), 0);
  for (const std::string& api : {std::string(), std::string(".img"), longest + "a.reader"})
    EXPECT_EQ(run(api), 0) << api;
  EXPECT_EQ(run(longest + ".reader"), 1);
  EXPECT_EQ(take_names(), longest + "_x.dll;");
}

TEST_F(Enumerate, CandidatesAndTheirReports) {
  struct Outcome {
    const char* way;  // none: the file is no library
    const char* reason;
    const char* events;
    int formats = -1;  // of an accepted plugin
  };
  const char* const taken = "load entry(img,1,5,-1) formats release unload ";
  const char* const refused = "load entry(img,1,5,-1) unload ";
  const char* const released = "load entry(img,1,5,-1) release unload ";
  const char* const incompatible = "plugin is not compatible with plugin_t";
  const std::map<std::string, Outcome> outcomes = {
      {"img_accept.dll", {"accept", "", taken, 2}},
      {"IMG_B.DLL", {"accept", "", taken, 2}},
      {"img_clings.dll", {"clings", "", taken, 2}},
      {"img_null.dll", {"null_formats", "", taken, 0}},
      {"img_none.dll", {"empty_formats", "", taken, 0}},
      {"img_malformed.dll", {"malformed_formats", "", taken, 4}},
      {"img_.dll", {"silent", "plugin did not set an error code", refused}},
      {"img_api.dll", {"other_api", "plugin does not support requested api", refused}},
      {"img_third.dll", {"third_code", "error code -3", refused}},
      {"img_zero.dll", {"version_0", "outdated version 0", refused}},
      {"img_nine.dll", {"version_9", "unsupported version 9", refused}},
      {"img_release.dll", {"no_release", incompatible, refused}},
      {"img_formats.dll", {"no_formats", incompatible, released}},
      {"img_half.dll", {"no_api_entry", incompatible, released}},
      {"img_entry.dll",
       {"no_entry", "library does not export an zv_plugin function", "load unload "}},
      {"img_text.dll", {nullptr, "library could not be loaded", ""}},
  };
  for (const auto& [name, outcome] : outcomes)
    if (outcome.way != nullptr) folder.add(outcome.way, name);
  folder.make_file("img_text.dll", "no library");
  for (const char* const passed_over :
       {"img.dll", "img_a.dll.bak", "imgx_a.dll", "img_h.dll", "img_nined.dll", "IMG_BD.dll"})
    folder.add("accept", passed_over);
  folder.make_folder("img_c.dll");
  ASSERT_EQ(zv_set_hidden(folder.path("img_h.dll").c_str(), 1), 1);

  std::string reports, events, accepted;
  List listed;  // in the platform's order
  zv_strlist_free(listed.list, -1);
  zv_dir_scan(folder.path().c_str(), &listed.list, nullptr, nullptr, 0, 0);
  ASSERT_NE(listed.list, nullptr);
  for (char** name = listed.list; *name != nullptr; ++name) {
    const auto found = outcomes.find(*name);
    if (found == outcomes.end()) continue;
    const Outcome& outcome = found->second;
    events += outcome.events;
    reports += "Testing library " + found->first + " for img API...";
    reports +=
        *outcome.reason == '\0' ? "ok\n" : std::string("\n\trejected: ") + outcome.reason + '\n';
    if (outcome.formats >= 0) accepted += found->first + ';';
  }
  ASSERT_EQ(run(), 6);
  EXPECT_EQ(report, reports);
  for (int i = 0; i < 6; ++i) {
    EXPECT_EQ(plugins[i]->refs, 0);
    EXPECT_EQ(zv_strlist_len(plugins[i]->formats), outcomes.at(plugins[i]->lib).formats);
  }
  EXPECT_EQ(take_names(), accepted);
  EXPECT_EQ(take_events() + ' ', events);
}

TEST_F(Enumerate, RangeAndKeepReachThePlugins) {
  folder.add("accept", "img_a.dll");
  ASSERT_EQ(run("img.x", 2, 9, 1), 1);
  EXPECT_EQ(plugins[0]->refs, 1);
  EXPECT_EQ(take_events(), "load entry(img.x,2,9,-1) formats");
  EXPECT_EQ(take_names(), "img_a.dll;");
  EXPECT_EQ(take_events(), "release unload");

  const struct {
    int min, max;
    const char* reason;
  } cases[] = {
      {3, 2, "invalid function arguments"},
      {0, 0, "unsupported version 1"},
      {4, 5, "outdated version 3"},
  };
  for (const auto& c : cases) {
    EXPECT_EQ(run("img", c.min, c.max), 0);
    EXPECT_EQ(report, std::string("Testing library img_a.dll for img API...\n\trejected: ") +
                          c.reason + "\n");
    ASSERT_NE(plugins, nullptr);
    EXPECT_EQ(take_names(), "");
  }
}

#ifndef _WIN32
// Windows has no such files in its folders.
TEST_F(Enumerate, APipeIsNotWaitedFor) {
  ASSERT_EQ(mkfifo(folder.path("img_pipe.dll").c_str(), 0600), 0);
  EXPECT_EQ(run(), 0);
  EXPECT_TRUE(report.ends_with("rejected: library could not be loaded\n")) << report;
  take_names();
}
#endif

}  // namespace
