#include "transfer/relay.h"

#include <cstdio>

#include "platform/platform.h"
#include "transfer/result.h"

namespace zv {

namespace {

// A file of a given name in a fresh folder of its own, both gone when it goes out of scope.
class TemporaryFile {
 public:
  TemporaryFile() = default;
  ~TemporaryFile();
  TemporaryFile(const TemporaryFile&) = delete;
  TemporaryFile& operator=(const TemporaryFile&) = delete;

  // Makes the folder; the file is for others to make.
  [[nodiscard]] bool prepare(std::string_view name);
  const char* path() const { return path_.c_str(); }

 private:
  PathBuffer folder_;  // empty until it is made
  PathBuffer path_;
};

bool TemporaryFile::prepare(std::string_view name) {
  PathBuffer folder;
  if (!folder.fill([](char* room, size_t size) { return zv_tempdir(room, size) != 0; }))
    return false;
  if (folder.back() != '/' && !folder.append('/')) return false;
  if (!platform::make_private_folder(folder)) return false;

  folder_ = folder;
  // The path must also pass as a location text, which is shorter by one.
  return path_.assign(folder.view()) && path_.append('/') && path_.append(name) &&
         path_.size() < PathBuffer::capacity;
}

TemporaryFile::~TemporaryFile() {
  if (folder_.empty()) return;
  std::remove(path_.c_str());
  platform::remove_folder(folder_.c_str());
}

}  // namespace

int copy_through_temporary(const char* from, const char* source_path, const char* to) {
  PathBuffer name;
  const bool named = name.fill([source_path](char* room, size_t size) {
    return zv_extract_filename(source_path, room, size) != 0;
  });
  if (!named || !platform::names_a_file(name.view())) return source_failed;

  TemporaryFile file;
  if (!file.prepare(name.view())) return source_failed;
  const int result = zv_copy(from, file.path());
  return result == copied ? zv_copy(file.path(), to) : result;
}

}  // namespace zv
