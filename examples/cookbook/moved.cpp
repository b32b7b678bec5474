// Moves a folder, and finds documents in it by the paths that they had before.
#include <cstdio>
#include <optional>
#include <string>

#include <zarvo.hpp>

namespace {

// A path as somebody wrote it, in the form that the path map compares.
std::optional<std::string> canonical(const char* written) {
  const auto path = zarvo::normalize_path(written);
  return path && zv_ispath_relative(path->c_str()) ? zarvo::absolute(*path) : path;
}

bool move_folder(const std::optional<std::string>& from, const std::optional<std::string>& to) {
  if (!from || from->empty() || !to || to->empty()) return false;
  if (std::rename(from->c_str(), to->c_str()) != 0) return false;
  // The path map goes by the folders that files lie in: any name stands for all of them.
  return zv_pathmap((*from + "/any").c_str(), (*to + "/any").c_str()) != 0;
}

bool print_place(const char* document) {
  auto place = canonical(document);
  if (place) place = zarvo::pathmap_locate(*place);
  std::printf("%s: %s\n", document, place.value_or("not found").c_str());
  return place.has_value();
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
