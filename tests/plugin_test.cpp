// Plugin records and plugin arrays. The plugins are those of fixtures/plugins,
// which tell what happens to them, so that each load is seen to have its release and its unload.
#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "environment.h"
#include "fixtures/plugins/plugin_folder.h"
#include "zarvo.h"

namespace {

void* const no_library = reinterpret_cast<void*>(intptr_t{-1});

struct Destroy {
  void operator()(zv_plugin_t* record) const { zv_plugin_destroy(record); }
};
using Record = std::unique_ptr<zv_plugin_t, Destroy>;

TEST(Plugin, EachAnswerLeavesNothingLoaded) {
  const struct {
    const char* way;
    int min, max, code;
    const char* events;
    int formats;  // -1: refused
  } cases[] = {
      {"accept", 1, 5, 3, "load entry(img.a,1,5,-1) formats release unload", 2},
      {"accept", 0, 2, 2, "load entry(img.a,0,2,-1) formats release unload", 2},
      {"accept", 0, 0, 1, "load entry(img.a,0,0,-1) unload", -1},
      {"accept", 4, 5, 3, "load entry(img.a,4,5,-1) unload", -1},
      {"null_formats", 1, 5, 3, "load entry(img.a,1,5,-1) formats release unload", 0},
      {"empty_formats", 1, 5, 3, "load entry(img.a,1,5,-1) formats release unload", 0},
      {"malformed_formats", 1, 5, 3, "load entry(img.a,1,5,-1) formats release unload", 4},
      {"silent", 1, 5, ZV_PLUGIN_E_SILENT, "load entry(img.a,1,5,-1) unload", -1},
      {"other_api", 1, 5, ZV_PLUGIN_E_API, "load entry(img.a,1,5,-1) unload", -1},
      {"third_code", 1, 5, -3, "load entry(img.a,1,5,-1) unload", -1},
      {"version_0", 1, 5, 0, "load entry(img.a,1,5,-1) unload", -1},
      {"version_9", 1, 5, 9, "load entry(img.a,1,5,-1) unload", -1},
      {"no_entry", 1, 5, ZV_PLUGIN_E_ENTRY, "load unload", -1},
      {"no_release", 1, 5, ZV_PLUGIN_E_DESCRIPTOR, "load entry(img.a,1,5,-1) unload", -1},
      {"no_formats", 1, 5, ZV_PLUGIN_E_DESCRIPTOR, "load entry(img.a,1,5,-1) release unload", -1},
      {"no_api_entry", 1, 5, ZV_PLUGIN_E_DESCRIPTOR, "load entry(img.a,1,5,-1) release unload", -1},
  };
  const PluginFolder folder;
  for (const auto& c : cases) {
    SCOPED_TRACE(std::string(c.way) + ' ' + std::to_string(c.min));
    const std::string name = "img_" + std::string(c.way) + std::to_string(c.min) + ".dll";
    folder.add(c.way, name);
    int code = -99;
    zv_plugin_t* const record =
        zv_plugin_create(folder.path().c_str(), name.c_str(), "img.a", c.min, c.max, &code);
    EXPECT_EQ(record == nullptr ? -1 : zv_strlist_len(record->formats), c.formats);
    EXPECT_EQ(code, c.code);
    EXPECT_EQ(zv_plugin_destroy(record), 0);
    EXPECT_EQ(take_events(), c.events);
  }
}

TEST(Plugin, WhatCannotBeTried) {
  const PluginFolder folder;
  folder.add("accept", "img_a.dll");
  folder.make_file("img_text.dll", "no library");
  folder.make_file("img_empty.dll");
  folder.make_folder("img_folder.dll");
  const std::string dir = folder.path();
  const std::string missing = dir + "/missing";
  const std::string deep = dir + "/" + std::string(320, 'x');
  const std::string fits_alone = dir + std::string(310 - dir.size(), '/');
  const std::string long_name(318 - dir.size(), 'x');
  const struct {
    const char *dir, *lib, *api;
    int min, max, code;
  } cases[] = {
      {nullptr, "img_a.dll", "img", 1, 5, ZV_PLUGIN_E_ARGUMENTS},
      {dir.c_str(), nullptr, "img", 1, 5, ZV_PLUGIN_E_ARGUMENTS},
      {dir.c_str(), "img_a.dll", nullptr, 1, 5, ZV_PLUGIN_E_ARGUMENTS},
      {dir.c_str(), "img_a.dll", "img", -1, 5, ZV_PLUGIN_E_ARGUMENTS},
      {dir.c_str(), "img_a.dll", "img", 3, 2, ZV_PLUGIN_E_ARGUMENTS},
      {dir.c_str(), "../img_a.dll", "img", 1, 5, ZV_PLUGIN_E_ARGUMENTS},
      {dir.c_str(), ".\\img_a.dll", "img", 1, 5, ZV_PLUGIN_E_ARGUMENTS},
      {dir.c_str(), "img_b.dll", "img", 1, 5, ZV_PLUGIN_E_NOT_FOUND},
      {missing.c_str(), "img_a.dll", "img", 1, 5, ZV_PLUGIN_E_NOT_FOUND},
      {"/..", "img_a.dll", "img", 1, 5, ZV_PLUGIN_E_NOT_FOUND},
      {"$ZARVO_NOT_SET", "img_a.dll", "img", 1, 5, ZV_PLUGIN_E_NOT_FOUND},
      {deep.c_str(), "img_a.dll", "img", 1, 5, ZV_PLUGIN_E_NOT_FOUND},
      {dir.c_str(), long_name.c_str(), "img", 1, 5, ZV_PLUGIN_E_NOT_FOUND},
      {dir.c_str(), "img_text.dll", "img", 1, 5, ZV_PLUGIN_E_LOAD},
      {dir.c_str(), "img_empty.dll", "img", 1, 5, ZV_PLUGIN_E_LOAD},
      {dir.c_str(), "img_folder.dll", "img", 1, 5, ZV_PLUGIN_E_LOAD},
      {fits_alone.c_str(), "img_a.dll", "img", 1, 5, 3},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.lib != nullptr ? c.lib : "no library");
    int code = -99;
    const Record record(zv_plugin_create(c.dir, c.lib, c.api, c.min, c.max, &code));
    EXPECT_EQ(record != nullptr, c.code >= 0);
    EXPECT_EQ(code, c.code);
  }
  EXPECT_EQ(zv_plugin_create(nullptr, nullptr, nullptr, 1, 5, nullptr), nullptr);
  EXPECT_EQ(take_events(), "load entry(img,1,5,-1) formats release unload");
}

TEST(Plugin, LoadsAreCounted) {
  const PluginFolder folder;
  folder.add("accept", "sub/img_a.dll");
  const WorkingDirectory inside(folder.path());
  int code = -99;
  zv_plugin_t* const record = zv_plugin_create("x/../sub/", "img_a.dll", "img", 1, 5, &code);
  ASSERT_NE(record, nullptr);
  char absolute[ZV_PATH_MAX];
  ASSERT_EQ(zv_absolute("sub", nullptr, absolute, sizeof absolute), 1);
  EXPECT_STREQ(record->dir, absolute);
  EXPECT_STREQ(record->lib, "img_a.dll");
  EXPECT_STREQ(record->api, "img");
  EXPECT_EQ(record->version, 3);
  EXPECT_EQ(code, 3);
  EXPECT_EQ(record->refs, 1);
  EXPECT_STREQ(record->formats[0], "PNG image|.png|.apng|");
  EXPECT_EQ(*static_cast<int*>(record->plugin->api_entry), 42);
  EXPECT_NE(zv_dll_getptr(record->module, "zv_plugin", nullptr), nullptr);

  EXPECT_EQ(zv_plugin_load(record), 1);
  EXPECT_EQ(record->refs, 2);
  EXPECT_EQ(zv_plugin_unload(record), 1);
  EXPECT_EQ(take_events(), "load entry(img,1,5,-1) formats");
  EXPECT_EQ(zv_plugin_unload(record), 1);
  EXPECT_EQ(record->refs, 0);
  EXPECT_EQ(record->module, no_library);
  EXPECT_EQ(record->plugin, nullptr);
  EXPECT_STREQ(record->formats[1], "JPEG image|.jpg|");
  EXPECT_EQ(take_events(), "release unload");

  for (int i = 0; i < 3; ++i) EXPECT_EQ(zv_plugin_load(record), 1);
  EXPECT_EQ(record->refs, 3);
  EXPECT_EQ(zv_plugin_destroy(record), 0);
  EXPECT_EQ(take_events(), "load entry(img,3,3,3) release unload");

  EXPECT_EQ(zv_plugin_load(nullptr), 0);
  EXPECT_EQ(zv_plugin_unload(nullptr), 0);
  EXPECT_EQ(zv_plugin_destroy(nullptr), 0);
}

TEST(Plugin, ALaterLoadMayFail) {
  const PluginFolder folder;
  folder.add("later_refusal", "img_a.dll");
  folder.add("accept", "img_b.dll");
  folder.add("clings", "img_c.dll");
  const std::string dir = folder.path();
  const Record refusing(zv_plugin_create(dir.c_str(), "img_a.dll", "img", 1, 5, nullptr));
  const Record removed(zv_plugin_create(dir.c_str(), "img_b.dll", "img", 1, 5, nullptr));
  const Record clinging(zv_plugin_create(dir.c_str(), "img_c.dll", "img", 1, 5, nullptr));
  for (const Record* record : {&refusing, &removed, &clinging}) {
    ASSERT_NE(*record, nullptr);
    zv_plugin_unload(record->get());
  }
  std::filesystem::remove(folder.path("img_b.dll"));
  take_events();

  EXPECT_EQ(zv_plugin_load(refusing.get()), 0);
  EXPECT_EQ(take_events(), "load entry(img,3,3,3) unload");
  EXPECT_EQ(refusing->plugin, nullptr);
  EXPECT_EQ(refusing->refs, 0);
  EXPECT_EQ(zv_plugin_load(removed.get()), 0);
  EXPECT_EQ(removed->module, no_library);
  // Its release left a descriptor behind, which no call may reach any more.
  EXPECT_NE(clinging->plugin, nullptr);
}

TEST(PluginArray, LibrariesAreAddedOnce) {
  const PluginFolder folder;
  folder.add("accept", "a.dll");
  folder.add("accept", "b.dll");
  folder.add("accept", "else/a.dll");
  folder.add("version_9", "nine.dll");
  const WorkingDirectory inside(folder.path());
  const struct {
    std::string path;
    int keep, result, code;
    const char* events;
    int count;
  } cases[] = {
      {"missing.dll", 1, 0, ZV_PLUGIN_E_NOT_FOUND, "", 0},
      {"nine.dll", 1, 0, 9, "load entry(img,1,5,-1) unload", 0},
      {"a.dll", 1, 1, 3, "load entry(img,1,5,-1) formats", 1},
      {folder.path("else/../a.dll"), 1, 1, ZV_PLUGIN_E_NOT_FOUND, "", 1},
      {"else/a.dll", 1, 1, ZV_PLUGIN_E_NOT_FOUND, "", 1},
      {"nine.dll", 1, 0, 9, "load entry(img,1,5,-1) unload", 1},
      {folder.path("b.dll"), 0, 1, 3, "load entry(img,1,5,-1) formats release unload", 2},
      {".", 0, 0, ZV_PLUGIN_E_LOAD, "", 2},
      {folder.path(std::string(320, 'x')), 0, 0, ZV_PLUGIN_E_NOT_FOUND, "", 2},
  };
  zv_plugin_t** plugins = nullptr;
  for (const auto& c : cases) {
    SCOPED_TRACE(c.path);
    int code = -99;
    EXPECT_EQ(zv_plugin_add_lib(&plugins, c.path.c_str(), "img", 1, 5, &code, c.keep), c.result);
    EXPECT_EQ(code, c.code);
    EXPECT_EQ(take_events(), c.events);
    int count = 0;
    while (plugins != nullptr && plugins[count] != nullptr) ++count;
    EXPECT_EQ(count, c.count);
  }
  ASSERT_NE(plugins, nullptr);
  EXPECT_STREQ(plugins[0]->lib, "a.dll");
  EXPECT_EQ(plugins[0]->refs, 1);
  EXPECT_EQ(plugins[1]->refs, 0);
  EXPECT_EQ(zv_plugin_add_lib(&plugins, "b.dll", "img", 1, 5, nullptr, 0), 1);

  EXPECT_EQ(zv_plugin_get_entry_by_lib(plugins, "b.dll"), plugins[1]);
  for (const char* const unknown : {"B.dll", "else/a.dll", "", static_cast<const char*>(nullptr)})
    EXPECT_EQ(zv_plugin_get_entry_by_lib(plugins, unknown), nullptr);
  char name[4] = "";
  EXPECT_EQ(zv_plugin_get_lib(&plugins[1], nullptr, 0), 5u);
  EXPECT_EQ(zv_plugin_get_lib(&plugins[1], name, sizeof name), 3u);
  EXPECT_STREQ(name, "b.d");
  EXPECT_EQ(zv_plugin_get_lib(&plugins[1], name, 0), 0u);
  EXPECT_EQ(zv_plugin_get_lib(static_cast<zv_plugin_t**>(no_library), name, 4), 0u);

  for (zv_plugin_t** record = plugins; *record != nullptr; ++record) zv_plugin_destroy(*record);
  zv_free(plugins);
}

TEST(Plugin, VersionsThatBothSpeak) {
  const struct {
    int min, max, oldest, newest, result, version;
  } cases[] = {
      {2, 5, 1, 3, 1, 3}, {2, 5, 6, 9, 0, 6}, {4, 5, 1, 3, 0, 3}, {2, 5, 1, 9, 1, 5},
      {2, 5, 5, 9, 1, 5}, {2, 5, 1, 2, 1, 2}, {2, 5, 3, 4, 1, 4}, {0, 0, 0, 0, 1, 0},
  };
  for (const auto& c : cases) {
    int version = -99;
    EXPECT_EQ(zv_plugin_match_vers(c.min, c.max, c.oldest, c.newest, &version), c.result);
    EXPECT_EQ(version, c.version);
  }
}

}  // namespace
