// Libraries by their handles, plugin records and plugin arrays. The plugins are those of
// fixtures/plugins, which tell what happens to them, so that each load is seen to have its release
// and its unload.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <utility>

#include "environment.h"
#include "fixtures/plugins/plugin_folder.h"
#include "zarvo.h"

namespace {

void* const no_library = reinterpret_cast<void*>(intptr_t{-1});

struct Destroy {
  void operator()(zv_plugin_t* record) const { zv_plugin_destroy(record); }
};
using Record = std::unique_ptr<zv_plugin_t, Destroy>;

void destroy_all(zv_plugin_t** plugins) {
  if (plugins == nullptr) return;
  for (zv_plugin_t** record = plugins; *record != nullptr; ++record) zv_plugin_destroy(*record);
  zv_free(plugins);
}

TEST(Library, Open) {
  const PluginFolder folder;
  folder.add("accept", "lib/foo.dll");
  folder.add("accept", "lib/bar.dll.dll");
  folder.make_file("lib/text.dll", "no library");
  const WorkingDirectory inside(folder.path());
  const struct {
    std::string path;
    int has_ext;
    bool opens;
  } cases[] = {
      {"lib\\foo", 0, true},
      {"lib/foo.dll", 1, true},
      {folder.path("lib\\bar.dll"), 0, true},
      {"lib/foo.dll", 0, false},
      {"lib/text", 0, false},
      {"", 1, false},
      {"", 0, false},
#ifndef _WIN32  // the loader there takes no more than 259 characters
      {"./" + std::string(306, '/') + "lib/foo", 0, true},  // 319 characters with the extension
#endif
      {"./" + std::string(307, '/') + "lib/foo", 0, false},
  };
  for (const auto& c : cases) {
    void* const library = zv_dll_open(c.path.c_str(), c.has_ext);
    ASSERT_NE(library, nullptr);
    EXPECT_EQ(library != no_library, c.opens) << c.path;
    EXPECT_EQ(zv_dll_close(library), no_library);
  }
}

#ifndef _WIN32  // what the loader there refuses is its own affair
// As a copy leaves it that is cut short, or that makes room first and fills it later.
TEST(Library, Unfinished) {
  const PluginFolder folder;
  folder.add("accept", "whole.dll");
  const std::string whole = folder.content("whole.dll");
  for (size_t size = 0; size + 64 < whole.size(); size += 211) {
    std::string part(whole, 0, size);
    const std::string cut = folder.make_file("cut.dll", part);
    part.resize(whole.size());
    const std::string zeros = folder.make_file("zeros.dll", part);
    for (const std::string& path : {cut, zeros})
      ASSERT_EQ(zv_dll_open(path.c_str(), 1), no_library) << path << " of " << size;
  }
}
#endif

// What a program takes for the library's filter must be what the library takes for it: only then
// does a scan know that it need not ask again for what it has just read.
TEST(Library, AddressesAreTheLibrarysOwn) {
  void* const library = zv_dll_open(ZARVO_LIBRARY, 1);
  EXPECT_EQ(zv_dll_getptr(library, "zv_dir_select", nullptr),
            reinterpret_cast<void*>(zv_dir_select));
  EXPECT_EQ(zv_dll_close(library), no_library);
}

TEST(Library, SymbolsAndTheirDecoration) {
  const PluginFolder folder;
  take_events();
  void* const library = zv_dll_open(folder.add("accept", "foo.dll").c_str(), 1);
  void* const entry = zv_dll_getptr(library, "zv_plugin", nullptr);
  ASSERT_NE(entry, nullptr);
  using Words = std::pair<std::string, std::string>;  // a name and its decoration
  for (const auto& [name, decoration] : {Words("zv_plugin", ""), Words("zv_plugin", "%s"),
                                         Words("plug", "zv_%sin"), Words("unused", "zv_plugin")})
    EXPECT_EQ(zv_dll_getptr(library, name.c_str(), decoration.c_str()), entry) << decoration;
  for (const auto& [name, decoration] :
       {Words("zv_plugin", "%s%s"), Words("zv_plugin", "%s%n%d"), Words("zv_plugin", "%%s"),
        Words("missing", "%s"), Words(std::string(320, 'z'), "%s"),
        Words("z", std::string(319, 'z') + "%s")})
    EXPECT_EQ(zv_dll_getptr(library, name.c_str(), decoration.c_str()), nullptr) << decoration;
  EXPECT_EQ(zv_dll_getptr(no_library, "zv_plugin", nullptr), nullptr);
  EXPECT_EQ(zv_dll_close(library), no_library);
  EXPECT_EQ(take_events(), "load unload");
}

TEST(Plugin, WhatCannotBeTried) {
  const PluginFolder folder;
  folder.add("accept", "img_a.dll");
  folder.make_folder("img_folder.dll");
  const std::string dir = folder.path();
  const std::string missing = dir + "/missing";
  const std::string deep = dir + "/" + std::string(320, 'x');
  const std::string fits_alone = dir + std::string(310 - dir.size(), '/');
  const std::string long_name(318 - dir.size(), 'x');
  const char* const lib = "img_a.dll";
  const struct {
    const char *dir, *lib, *api;
    int code;
    int min = 1;
  } cases[] = {
      {nullptr, lib, "img", ZV_PLUGIN_E_ARGUMENTS},
      {dir.c_str(), nullptr, "img", ZV_PLUGIN_E_ARGUMENTS},
      {dir.c_str(), lib, nullptr, ZV_PLUGIN_E_ARGUMENTS},
      {dir.c_str(), lib, "img", ZV_PLUGIN_E_ARGUMENTS, -1},
      {dir.c_str(), "../img_a.dll", "img", ZV_PLUGIN_E_ARGUMENTS},
      {dir.c_str(), ".\\img_a.dll", "img", ZV_PLUGIN_E_ARGUMENTS},
      {dir.c_str(), "img_a", "img", ZV_PLUGIN_E_NOT_FOUND},  // no extension is added
      {missing.c_str(), lib, "img", ZV_PLUGIN_E_NOT_FOUND},
      {"/..", lib, "img", ZV_PLUGIN_E_NOT_FOUND},
      {"$ZARVO_NOT_SET", lib, "img", ZV_PLUGIN_E_NOT_FOUND},
      {deep.c_str(), lib, "img", ZV_PLUGIN_E_NOT_FOUND},
      {dir.c_str(), long_name.c_str(), "img", ZV_PLUGIN_E_NOT_FOUND},
      {dir.c_str(), "img_folder.dll", "img", ZV_PLUGIN_E_LOAD},
      {fits_alone.c_str(), lib, "img", 3},
  };
  for (const auto& c : cases) {
    int code = -99;
    const Record record(zv_plugin_create(c.dir, c.lib, c.api, c.min, 5, &code));
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
  EXPECT_EQ(record->refs, 1);
  EXPECT_STREQ(record->formats[0], "PNG image|.png|.apng|");
  EXPECT_EQ(*static_cast<int*>(record->plugin->api_entry), 42);
  EXPECT_NE(zv_dll_getptr(record->module, "zv_plugin", nullptr), nullptr);

  EXPECT_EQ(zv_plugin_load(record), 1);
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
  for (const auto call : {zv_plugin_load, zv_plugin_unload, zv_plugin_destroy})
    EXPECT_EQ(call(nullptr), 0);
}

TEST(Plugin, ALaterLoadMayFail) {
  const PluginFolder folder;
  const auto unloaded = [&folder](const std::string& way) {
    folder.add(way, way + ".dll");
    Record record(
        zv_plugin_create(folder.path().c_str(), (way + ".dll").c_str(), "img", 1, 5, nullptr));
    zv_plugin_unload(record.get());
    take_events();
    return record;
  };
  const Record removed = unloaded("accept");
  const Record refusing = unloaded("later_refusal");
  const Record clinging = unloaded("clings");
  ASSERT_TRUE(removed && refusing && clinging);
  EXPECT_EQ(zv_plugin_load(refusing.get()), 0);
  EXPECT_EQ(take_events(), "load entry(img,3,3,3) unload");
  EXPECT_EQ(refusing->plugin, nullptr);
  EXPECT_EQ(refusing->refs, 0);

  std::filesystem::remove(folder.path("accept.dll"));
  EXPECT_EQ(zv_plugin_load(removed.get()), 0);
  EXPECT_EQ(removed->module, no_library);
  // Its release left a descriptor behind, which no call may reach any more.
  EXPECT_NE(clinging->plugin, nullptr);
}

TEST(PluginArray, LibrariesAreAddedOnce) {
  const PluginFolder folder;
  for (const char* const name : {"a.dll", "b.dll", "else/a.dll"}) folder.add("accept", name);
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
    int code = -99;
    EXPECT_EQ(zv_plugin_add_lib(&plugins, c.path.c_str(), "img", 1, 5, &code, c.keep), c.result);
    EXPECT_EQ(code, c.code) << c.path;
    EXPECT_EQ(take_events(), c.events) << c.path;
    int count = 0;
    while (plugins != nullptr && plugins[count] != nullptr) ++count;
    EXPECT_EQ(count, c.count);
  }
  EXPECT_STREQ(plugins[0]->lib, "a.dll");
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
  EXPECT_EQ(zv_plugin_get_entry_by_lib(nullptr, "b.dll"), nullptr);
  destroy_all(plugins);
}

// A host that its plugins call, and that uses its array then.
zv_plugin_t** held;
std::string to_add;

void meanwhile() {
  for (zv_plugin_t** record = held; record != nullptr && *record != nullptr; ++record)
    EXPECT_EQ((*record)->lib[0], 'i');
  const std::string path = std::exchange(to_add, "");
  if (path.empty()) return;
  EXPECT_EQ(zv_plugin_add_lib(&held, path.c_str(), "img", 1, 5, nullptr, 0), 1);
}

TEST(PluginArray, IsWholeWhilePluginsRun) {
  const PluginFolder folder;
  char address[32];
  std::snprintf(address, sizeof address, "%p", reinterpret_cast<void*>(meanwhile));
  zv_putenv_private("FIXTURE_HOST", address, 0);
  to_add = folder.add("accept", "img_b.dll");
  held = nullptr;
  for (const char* const name : {"img_a.dll", "img_c.dll"})
    EXPECT_EQ(zv_plugin_add_lib(&held, folder.add("accept", name).c_str(), "img", 1, 5, nullptr, 0),
              1);
  for (const char* const name : {"img_b.dll", "img_a.dll", "img_c.dll"})
    EXPECT_NE(zv_plugin_get_entry_by_lib(held, name), nullptr) << name;
  destroy_all(held);

  zv_putenv_private("img", folder.path().c_str(), 0);
  zv_plugin_t* nothing = nullptr;
  held = &nothing;
  ASSERT_EQ(zv_plugin_enumerate(&held, "img", 1, 5, 0), 3);
  destroy_all(held);
  zv_putenv_private(nullptr, nullptr, 0);
}

TEST(Plugin, VersionsThatBothSpeak) {
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

}  // namespace
