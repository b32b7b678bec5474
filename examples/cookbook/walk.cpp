// Walks a tree with a filter of its own: the files of some patterns, from a size upwards.
#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <memory>

#include <zarvo.h>

namespace {

struct FreeList {
  void operator()(char** list) const { zv_strlist_free(list, -1); }
};

struct Wanted {
  dirsel_t names;
  long long smallest;
  long long total;
};

// Called by the library for each entry, so nothing may be thrown here.
int is_wanted(const char* folder, const char* name, void* user) {
  auto& wanted = *static_cast<Wanted*>(user);
  char path[ZV_PATH_MAX];
  struct _stat64 status;
  if (zv_dir_select(folder, name, &wanted.names) == 0) return 0;
  if (zv_absolute(name, folder, path, sizeof path) == 0 || zv_stat(path, &status) != 0) return 0;
  if (status.st_size < wanted.smallest) return 0;
  wanted.total += status.st_size;
  return 1;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 4) {
    std::fprintf(stderr, "usage: walk FOLDER 'PATTERN;...' BYTES\n");
    return 2;
  }
  if (zv_access(argv[1], 4) != 0) {  // the scan takes a folder that is not there for an empty one
    std::fprintf(stderr, "walk: cannot read %s\n", argv[1]);
    return 1;
  }
  Wanted wanted = {{nullptr, argv[2], ";", 0, 0}, std::atoll(argv[3]), 0};
  char** list = nullptr;
  const int count = zv_dir_scan(argv[1], &list, is_wanted, &wanted, 1, 1);
  const std::unique_ptr<char*[], FreeList> owner(list);
  if (count < 0) {
    std::fprintf(stderr, "walk: cannot examine all of %s\n", argv[1]);
    return 1;
  }
  std::sort(list, list + count, [](auto a, auto b) { return zv_stricmp(a, b) < 0; });
  for (int i = 0; i < count; ++i) std::puts(list[i]);
  std::printf("%d files, %lld bytes\n", count, wanted.total);
}
