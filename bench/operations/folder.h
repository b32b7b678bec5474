// Folders of work files, and the trees and files in them.
#ifndef ZARVO_BENCH_FOLDER_H
#define ZARVO_BENCH_FOLDER_H

#include <string>
#include <string_view>
#include <vector>

namespace bench {

// A fresh folder, in memory or where TMPDIR says, removed with what is in it.
class WorkFolder {
 public:
  WorkFolder();
  ~WorkFolder();
  WorkFolder(const WorkFolder&) = delete;
  WorkFolder& operator=(const WorkFolder&) = delete;

  std::string path(std::string_view name) const { return path_ + "/" + std::string(name); }

 private:
  std::string path_;
};

// Makes `files` empty files, 50 in each folder of one tree: every tenth folder holds the nine
// behind it. One file in five is a picture.
void make_tree(const std::string& top, int files);

void write_file(const std::string& path, size_t size);

// Files of one size in a fresh folder: their names, "file0000" and so on.
std::vector<std::string> write_files(const std::string& folder, int count, size_t size);

// Removes what the folder holds and makes it anew.
void make_empty(const std::string& folder);

}  // namespace bench

#endif
