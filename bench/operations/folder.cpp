#include "folder.h"

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <random>

namespace fs = std::filesystem;

namespace bench {

namespace {

[[noreturn]] void give_up(const std::string& path) {
  std::perror(path.c_str());
  std::exit(1);
}

std::string numbered(const char* name, int number) {
  std::string digits = std::to_string(number);
  return name + std::string(digits.size() < 4 ? 4 - digits.size() : 0, '0') + digits;
}

// A disk's own moods would hide what is measured: files lie in memory unless TMPDIR tells another
// place.
std::string files_folder() {
  const char* const told = std::getenv("TMPDIR");
  return told != nullptr && *told != '\0' ? told : "/dev/shm";
}

}  // namespace

WorkFolder::WorkFolder() : path_(files_folder() + "/zarvo-bench-XXXXXX") {
  if (mkdtemp(path_.data()) == nullptr) give_up(path_);
}

WorkFolder::~WorkFolder() {
  std::error_code ignored;
  fs::remove_all(path_, ignored);
}

void make_tree(const std::string& top, int files) {
  constexpr int files_in_folder = 50;
  constexpr int folders_in_branch = 10;
  const char* const endings[] = {".png", ".txt", ".cpp", ".h", ".html"};
  std::string branch;
  for (int file = 0; file < files; ++file) {
    const int number = file / files_in_folder;
    if (number % folders_in_branch == 0) branch = top + "/" + numbered("branch", number);
    const std::string folder =
        number % folders_in_branch == 0 ? branch : branch + "/" + numbered("folder", number);
    if (file % files_in_folder == 0) fs::create_directories(folder);
    write_file(folder + "/" + numbered("file", file) + endings[file % 5], 0);
  }
}

void write_file(const std::string& path, size_t size) {
  constexpr size_t block = size_t{1} << 20;
  static const std::vector<char> bytes = [] {
    std::minstd_rand random;
    std::vector<char> made(block);
    for (char& byte : made) byte = static_cast<char>(random() >> 8);
    return made;
  }();
  FILE* const file = std::fopen(path.c_str(), "wb");
  if (file == nullptr) give_up(path);
  for (; size > 0; size -= std::min(size, block))
    if (std::fwrite(bytes.data(), 1, std::min(size, block), file) == 0) give_up(path);
  if (std::fclose(file) != 0) give_up(path);
}

std::vector<std::string> write_files(const std::string& folder, int count, size_t size) {
  make_empty(folder);
  std::vector<std::string> names;
  for (int i = 0; i < count; ++i) {
    names.push_back(numbered("file", i));
    write_file(folder + "/" + names.back(), size);
  }
  return names;
}

void make_empty(const std::string& folder) {
  fs::remove_all(folder);
  fs::create_directories(folder);
}

}  // namespace bench
