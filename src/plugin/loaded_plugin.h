// A plugin while its library is loaded, and the way there.
#ifndef ZARVO_PLUGIN_LOADED_PLUGIN_H
#define ZARVO_PLUGIN_LOADED_PLUGIN_H

#include <memory>

#include "frame/text_buffer.h"
#include "platform/platform.h"
#include "zarvo.h"

namespace zv {

struct UnloadLibrary {
  void operator()(void* library) const { platform::unload_library(library); }
};

struct ReleasePlugin {
  void operator()(plugin_t* plugin) const { plugin->release(plugin); }
};

// Lets go in reverse order: the plugin is released before its library is closed.
struct LoadedPlugin {
  std::unique_ptr<void, UnloadLibrary> library;
  std::unique_ptr<plugin_t, ReleasePlugin> descriptor;
};

// The file of a library in its folder; false when the whole does not fit.
bool library_file(const char* folder, const char* library, PathBuffer& out);

// What a host asks a plugin for.
struct Request {
  const char* api;
  int min;
  int max;
};

// Loads the library and asks its plugin, which answers in `answer`. `code` receives that answer, or
// why there was none; without a descriptor nothing stays loaded.
LoadedPlugin open_plugin(const char* file, const Request& request, int* answer, int* code);

}  // namespace zv

#endif
