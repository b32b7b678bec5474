// Enumerating a folder of 100 plugins, beside what the loader alone takes for their libraries.
#include <dlfcn.h>
#include <fcntl.h>
#include <gmodule.h>
#include <unistd.h>
#include <zarvo.h>

#include <filesystem>

#include "folder.h"
#include "runner.h"

namespace bench {

namespace {

// Sends what is printed on standard error nowhere: the reports of an enumeration.
class Silence {
 public:
  Silence() : kept_(dup(STDERR_FILENO)) {
    const int nowhere = open("/dev/null", O_WRONLY | O_CLOEXEC);
    dup2(nowhere, STDERR_FILENO);
    close(nowhere);
  }
  ~Silence() {
    dup2(kept_, STDERR_FILENO);
    close(kept_);
  }
  Silence(const Silence&) = delete;
  Silence& operator=(const Silence&) = delete;

 private:
  int kept_;
};

bool enumerate_with_zarvo(int expected) {
  const Silence silence;
  zv_plugin_t** plugins = nullptr;
  const int count = zv_plugin_enumerate(&plugins, "bench", 1, 5, 0);
  for (int i = 0; i < count; ++i) zv_plugin_destroy(plugins[i]);
  zv_free(plugins);
  return count == expected;
}

bool load_with_dlopen(const std::string& path) {
  void* const library = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
  if (library == nullptr) return false;
  const bool found = dlsym(library, "zv_plugin") != nullptr;
  return dlclose(library) == 0 && found;
}

// What an enumeration asks each plugin, and nothing else of it.
bool ask_with_dlopen(const std::string& path) {
  void* const library = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
  if (library == nullptr) return false;
  int version = -1;
  const auto entry = reinterpret_cast<zv_plugin_entry_t>(dlsym(library, "zv_plugin"));
  plugin_t* const plugin = entry("bench", 1, 5, &version);
  const bool has_formats = *plugin->formats() != '\0';
  plugin->release(plugin);
  return dlclose(library) == 0 && has_formats;
}

bool load_with_gmodule(const std::string& path) {
  GModule* const library = g_module_open(path.c_str(), G_MODULE_BIND_LOCAL);
  void* entry = nullptr;
  return library != nullptr && g_module_symbol(library, "zv_plugin", &entry) != FALSE &&
         g_module_close(library) != FALSE;
}

}  // namespace

void measure(Runner& runner) {
  const WorkFolder work;
  const int count = runner.scaled(100);
  std::vector<std::string> paths;
  for (int i = 0; i < count; ++i) {
    paths.push_back(work.path("bench_" + std::to_string(i) + ".dll"));
    std::filesystem::copy_file(BENCH_PLUGIN, paths.back());
  }
  zv_putenv_private("bench", work.path("").c_str(), 0);

  const auto each = [&paths](bool (*load)(const std::string&)) {
    return [&paths, load] {
      for (const std::string& path : paths)
        if (!load(path)) return false;
      return true;
    };
  };
  runner.measure({"enumeration/" + std::to_string(count) + " plugins",
                  {{"zarvo", [count] { return enumerate_with_zarvo(count); }},
                   {"dlopen", each(load_with_dlopen)},
                   {"dlopen and the plugin's functions", each(ask_with_dlopen)},
                   {"gmodule", each(load_with_gmodule)}}});
}

}  // namespace bench
