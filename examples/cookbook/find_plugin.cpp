// Finds the plugin that reads a file: asks each library of a folder, then goes by the file's name.
#include <cstdio>
#include <cstring>

#include <zarvo.hpp>

int main(int argc, char** argv) {
  if (argc != 3) {
    std::fprintf(stderr, "usage: find_plugin FOLDER FILE\n");
    return 2;
  }
  // Plugins of the API "img" are img_*.dll in the folder that this variable names. Each is reported
  // on standard error, and unloaded again: its record keeps what it told of its formats.
  zv_putenv_private("img", argv[1], 0);
  const zarvo::Plugins plugins("img", 1, 5);
  zv_plugin_t* const plugin = plugins.for_file(argv[2]);
  if (plugin == nullptr) {
    std::fprintf(stderr, "find_plugin: no plugin in %s reads %s\n", argv[1], argv[2]);
    return 1;
  }
  // Loaded as long as this lives, with its functions at `loaded.api<...>()`.
  const zarvo::Loaded loaded(plugin);
  if (!loaded) {
    std::fprintf(stderr, "find_plugin: %s cannot be loaded any more\n", plugin->lib);
    return 1;
  }
  std::printf("%s, version %d: %.*s\n", plugin->lib, plugin->version,
              static_cast<int>(std::strcspn(plugin->formats[0], "|")),
              plugin->formats[0]);  // its description
}
