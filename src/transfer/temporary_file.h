// The file between two network locations.
#ifndef ZARVO_TRANSFER_TEMPORARY_FILE_H
#define ZARVO_TRANSFER_TEMPORARY_FILE_H

#include "frame/text_buffer.h"

namespace zv {

// A file of a given name in a fresh private folder of its own, both gone when it goes out of scope.
class TemporaryFile {
 public:
  TemporaryFile() = default;
  ~TemporaryFile();
  TemporaryFile(const TemporaryFile&) = delete;
  TemporaryFile& operator=(const TemporaryFile&) = delete;

  // Makes the folder, for a file of the name that a server's path ends in; the file is for others
  // to make. False where no folder can be made, or the name is none that a local file can have.
  [[nodiscard]] bool prepare(const char* server_path);
  const char* path() const { return path_.c_str(); }

 private:
  PathBuffer folder_;  // empty until it is made
  PathBuffer path_;
};

}  // namespace zv

#endif
