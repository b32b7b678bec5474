// A folder of a test's own in the system's temporary folder, or in a shorter one where that leaves
// no room for the tests' long paths; removed with all it holds at the end.
#ifndef ZARVO_TESTS_SCRATCH_FOLDER_H
#define ZARVO_TESTS_SCRATCH_FOLDER_H

#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <string>

class ScratchFolder {
 public:
  ScratchFolder() {
    std::filesystem::path base = std::filesystem::canonical(std::filesystem::temp_directory_path());
    for (const char* const shorter : {"/var/tmp", "/tmp"})
      if (base.string().size() > 60 && std::filesystem::exists(shorter)) base = shorter;
    std::random_device random;
    do {
      path_ = base / ("zarvo-test-" + std::to_string(random()));
    } while (!std::filesystem::create_directory(path_));
  }
  ~ScratchFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(path_, ignored);
  }
  ScratchFolder(const ScratchFolder&) = delete;
  ScratchFolder& operator=(const ScratchFolder&) = delete;

  // The folder, or a path below it, with `/` as the separator.
  std::string path(const std::string& below = "") const {
    return (below.empty() ? path_ : path_ / below).generic_string();
  }

  // Makes a file, and the folders it needs; gives its path.
  std::string make_file(const std::string& below, const std::string& content = "") const {
    std::filesystem::create_directories((path_ / below).parent_path());
    std::ofstream(path_ / below, std::ios::binary) << content;
    return path(below);
  }

  std::string make_folder(const std::string& below) const {
    std::filesystem::create_directories(path_ / below);
    return path(below);
  }

  bool exists(const std::string& below) const {
    return std::filesystem::exists(std::filesystem::symlink_status(path_ / below));
  }

  std::string content(const std::string& below) const {
    std::ifstream file(path_ / below, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
  }

 private:
  std::filesystem::path path_;
};

#endif
