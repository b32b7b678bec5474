// Walks a tree with a filter of its own: the files of some patterns, from a size upwards.
#include <algorithm>
#include <cstdio>
#include <cstdlib>

#include <zarvo.hpp>

int main(int argc, char** argv) {
  if (argc != 4) {
    std::fprintf(stderr, "usage: walk FOLDER 'PATTERN;...' BYTES\n");
    return 2;
  }
  if (zv_access(argv[1], 4) != 0) {  // the scan takes a folder that is not there for an empty one
    std::fprintf(stderr, "walk: cannot read %s\n", argv[1]);
    return 1;
  }
  const dirsel_t names = {nullptr, argv[2], ";", 0, 0};
  const long long smallest = std::atoll(argv[3]);
  long long total = 0;
  const auto is_wanted = [&](const char* folder, const char* name) {
    struct _stat64 status;
    if (zv_dir_select(folder, name, &names) == 0) return false;
    const auto path = zarvo::absolute(name, folder);
    if (!path || zv_stat(path->c_str(), &status) != 0 || status.st_size < smallest) return false;
    total += status.st_size;
    return true;
  };
  const auto list = zarvo::dir_scan(argv[1], zarvo::Listed::tree, is_wanted);
  if (!list) {
    std::fprintf(stderr, "walk: cannot examine all of %s\n", argv[1]);
    return 1;
  }
  std::sort(list.begin(), list.end(), [](auto a, auto b) { return zv_stricmp(a, b) < 0; });
  for (const char* path : list) std::puts(path);
  std::printf("%zu files, %lld bytes\n", list.size(), total);
}
