// The largest heap that one call of the library needs: the program's allocator counts what is in
// use and keeps the most there has been, the C library's own blocks (streams, searches) included.
#include <malloc.h>
#include <zarvo.h>

#include <algorithm>
#include <atomic>
#include <cstdio>
#include <cstring>

#include "folder.h"

extern "C" {
void* __libc_malloc(size_t size);
void* __libc_calloc(size_t count, size_t size);
void* __libc_realloc(void* block, size_t size);
void __libc_free(void* block);
}

namespace {

size_t in_use = 0;
size_t most = 0;

void* counted(void* block) {
  in_use += malloc_usable_size(block);
  most = std::max(most, in_use);
  return block;
}

// What a call adds to what was in use before it.
template <class Call>
void report(const char* what, Call call) {
  const size_t before = most = in_use;
  if (call()) std::printf("%s\t%zu\n", what, most - before);
}

bool scans(const std::string& tree) {
  char** list = nullptr;
  const int count = zv_dir_scan(tree.c_str(), &list, nullptr, nullptr, 1, 1);
  zv_strlist_free(list, count);
  return count > 0;
}

bool enumerates() {
  zv_plugin_t** plugins = nullptr;
  const int count = zv_plugin_enumerate(&plugins, "bench", 1, 5, 0);
  for (int i = 0; i < count; ++i) zv_plugin_destroy(plugins[i]);
  zv_free(plugins);
  return count > 0;
}

}  // namespace

extern "C" {

void* malloc(size_t size) {
  return counted(__libc_malloc(size));
}

void* calloc(size_t count, size_t size) {
  return counted(__libc_calloc(count, size));
}

void* realloc(void* block, size_t size) {
  in_use -= malloc_usable_size(block);
  void* const moved = __libc_realloc(block, size);
  return counted(moved != nullptr || size == 0 ? moved : block);
}

void free(void* block) {
  in_use -= malloc_usable_size(block);
  __libc_free(block);
}

}  // extern "C"

int main() {
  const bench::WorkFolder work;
  const std::string from = work.path("from");
  const std::string to = work.path("to");
  const std::string tree = work.path("tree");
  const std::string plugins = work.path("plugins");
  bench::write_file(from, size_t{64} << 20);
  bench::make_tree(tree, 100'000);
  bench::make_empty(plugins);
  zv_putenv_private("bench", plugins.c_str(), 0);
  for (int i = 0; i < 100; ++i)
    zv_copy(BENCH_PLUGIN, (plugins + "/bench_" + std::to_string(i) + ".dll").c_str());

  report("`zv_copy` of a local file of 64 MiB",
         [&] { return zv_copy(from.c_str(), to.c_str()) == 0; });
  report("`zv_dir_scan` of 100,000 files, the list of their paths included",
         [&] { return scans(tree); });
  report("`zv_rmpath` of them", [&] { return zv_rmpath(tree.c_str()) == 1; });
  report("`zv_plugin_enumerate` of 100 plugins, the loader's own included", enumerates);
  return 0;
}
