// What a library costs a program that only loads it: the program from its start to its end, and the
// addresses that the loader has to fill in.
#include <dlfcn.h>
#include <link.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "frame/measure.h"

namespace {

// The programs loads_NAME lie beside this one.
std::string beside_this(const std::string& name) {
  char path[4096] = {};
  if (readlink("/proc/self/exe", path, sizeof path - 1) < 0) return name;
  return std::string(path, std::strrchr(path, '/') + 1) + name;
}

double seconds(const timeval& time) {
  return static_cast<double>(time.tv_sec) + 1e-6 * static_cast<double>(time.tv_usec);
}

// The processor's time for the program, the system's share included; negative when it fails.
double run(const std::string& program) {
  char* const arguments[] = {const_cast<char*>(program.c_str()), nullptr};
  pid_t child = 0;
  if (posix_spawn(&child, program.c_str(), nullptr, nullptr, arguments, environ) != 0) return -1;
  int status = -1;
  rusage usage{};
  if (wait4(child, &status, 0, &usage) != child || status != 0) return -1;
  return seconds(usage.ru_utime) + seconds(usage.ru_stime);
}

size_t relocations(const link_map* library) {
  size_t bytes = 0;
  for (const ElfW(Dyn)* entry = library->l_ld; entry->d_tag != DT_NULL; ++entry)
    if (entry->d_tag == DT_RELASZ || entry->d_tag == DT_PLTRELSZ) bytes += entry->d_un.d_val;
  return bytes / sizeof(ElfW(Rela));
}

// Of the library and of those that only it brought along. Looked at in a fresh process: the
// libraries that this one has loaded itself are not counted.
size_t count_relocations(const char* library) {
  void* const self = dlopen(nullptr, RTLD_NOW);
  link_map* own = nullptr;
  dlinfo(self, RTLD_DI_LINKMAP, &own);
  while (own->l_next != nullptr) own = own->l_next;
  void* const handle = dlopen(library, RTLD_NOW);
  if (handle == nullptr) {
    std::fprintf(stderr, "%s\n", dlerror());
    std::exit(1);
  }
  size_t count = 0;
  for (const link_map* added = own->l_next; added != nullptr; added = added->l_next)
    count += relocations(added);
  dlclose(handle);
  dlclose(self);
  return count;
}

template <class Time>
void add_timed(const char* what, const char* who, Time time) {
  const std::string name = std::string("loading/") + what + '/' + who;
  const auto measured = [time](benchmark::State& state) {
    for (auto _ : state) {
      const double seconds = time();
      if (seconds < 0) return state.SkipWithError("it does not run");
      state.SetIterationTime(seconds);
    }
  };
  benchmark::RegisterBenchmark(name.c_str(), measured)->UseManualTime();
}

void add(const char* who, const char* program, const char* library) {
  add_timed("a program that is linked with it, start to end", who,
            [path = beside_this(program)] { return run(path); });
  if (library == nullptr) return;
  const double count = static_cast<double>(count_relocations(library));
  add_timed("number of relocations", who, [count] { return count * 1e-6; });
}

}  // namespace

void bench::add_cases() {
  add("zarvo", "loads_zarvo", ZARVO_LIBRARY);
  add("APR", "loads_apr", "libapr-1.so.0");
  add("GLib", "loads_glib", "libglib-2.0.so.0");
  add("limit libc alone", "loads_libc", nullptr);
}
