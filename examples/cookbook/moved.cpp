// Moves a folder, and finds documents in it by the paths that they had before.
#include <cstdio>
#include <filesystem>
#include <string>

#include <zarvo.h>

namespace {

// A path as somebody wrote it, in the form that the path map compares; empty when it leads nowhere.
std::string canonical(const char* written) {
  char path[ZV_PATH_MAX];
  if (zv_strncpy(path, written, sizeof path) == sizeof path - 1) return "";  // perhaps cut
  if (zv_normalize_path(path) == 0) return "";
  if (zv_ispath_relative(path) && !zv_absolute(path, nullptr, path, sizeof path)) return "";
  return path;
}

bool move_folder(const std::string& from, const std::string& to) {
  std::error_code error;
  if (from.empty() || to.empty()) return false;
  std::filesystem::rename(from, to, error);
  // The path map goes by the folders that files lie in: any name stands for all of them.
  return !error && zv_pathmap((from + "/any").c_str(), (to + "/any").c_str()) != 0;
}

bool print_place(const char* document) {
  char path[ZV_PATH_MAX];
  zv_strncpy(path, canonical(document).c_str(), sizeof path);
  const bool found = zv_pathmap_locate(path) != 0;
  std::printf("%s: %s\n", document, found ? path : "not found");
  return found;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc < 3) {
    std::fprintf(stderr, "usage: moved FROM TO [DOCUMENT...]\n");
    return 2;
  }
  if (!move_folder(canonical(argv[1]), canonical(argv[2]))) {
    std::fprintf(stderr, "moved: cannot move %s to %s\n", argv[1], argv[2]);
    return 1;
  }
  bool all_found = true;
  for (int i = 3; i < argc; ++i) all_found = print_place(argv[i]) && all_found;
  return all_found ? 0 : 1;
}
