// Dynamic libraries by their handles. The libraries are the plugins of fixtures/plugins, which tell
// when they are loaded and unloaded.
#include <gtest/gtest.h>

#include <string>

#include "environment.h"
#include "fixtures/plugins/plugin_folder.h"
#include "zarvo.h"

namespace {

void* const no_library = reinterpret_cast<void*>(intptr_t{-1});

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
      {"lib/foo", 0, true},
      {"lib\\foo", 0, true},
      {"lib/foo.dll", 1, true},
      {folder.path("lib/foo"), 0, true},
      {folder.path("lib\\bar.dll"), 0, true},
      {"lib/foo.dll", 0, false},
      {"lib/missing", 0, false},
      {"lib/text", 0, false},
      {"", 1, false},
      {"", 0, false},
#ifndef _WIN32  // the loader there takes no more than 259 characters
      {"./" + std::string(306, '/') + "lib/foo", 0, true},  // 319 characters with the extension
#endif
      {"./" + std::string(307, '/') + "lib/foo", 0, false},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.path);
    void* const library = zv_dll_open(c.path.c_str(), c.has_ext);
    ASSERT_NE(library, nullptr);
    EXPECT_EQ(library != no_library, c.opens);
    EXPECT_EQ(zv_dll_close(library), no_library);
  }
}

TEST(Library, SymbolsAndTheirDecoration) {
  const PluginFolder folder;
  take_events();
  void* const library = zv_dll_open(folder.add("accept", "foo.dll").c_str(), 1);
  void* const entry = zv_dll_getptr(library, "zv_plugin", nullptr);
  ASSERT_NE(entry, nullptr);
  const struct {
    std::string name;
    std::string decoration;
    bool found;
  } cases[] = {
      {"zv_plugin", "", true},
      {"zv_plugin", "%s", true},
      {"plug", "zv_%sin", true},
      {"unused", "zv_plugin", true},
      {"zv_plugin", "%s%s", false},
      {"zv_plugin", "%s%n%d", false},
      {"zv_plugin", "%%s", false},
      {"missing", "%s", false},
      {std::string(320, 'z'), "%s", false},
      {"z", std::string(319, 'z') + "%s", false},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.decoration + " of " + c.name);
    EXPECT_EQ(zv_dll_getptr(library, c.name.c_str(), c.decoration.c_str()),
              c.found ? entry : nullptr);
  }
  EXPECT_EQ(zv_dll_getptr(no_library, "zv_plugin", nullptr), nullptr);
  EXPECT_EQ(zv_dll_close(library), no_library);
  EXPECT_EQ(take_events(), "load unload");
}

}  // namespace
